// SPDX-License-Identifier: MIT
// Updating by a filter object.

#include "support/filter_update.h"

namespace {

const std::string kNoConditions =
    failed("0 > SqlExpandMemberList(jFilterIn, strSql, VORN_SQL_WHERE_TYPE_AND)");
const std::string kBadTypes = failed("0 > checkJsonType(jParamIn)");

class UpdateByFilter : public UpdateByFilterTest {};

TEST_F(UpdateByFilter, ComposesOneStatement)
{
    const struct {
        const char* szFilter;
        const char* szValues;
        const char* szTail;
        const char* szContents;
    } cases[] = {
        {R"({"id":1})", R"({"name":"Eve"})", "name='Eve' WHERE  (id=1 );", "1Eve1,2Bob0,3O'Brien1"},
        {R"({"name":"O'Brien"})", R"({"name":"O'Neil"})",
         "name='O''Neil' WHERE  (name='O''Brien' );", "1Ann1,2Bob0,3O'Neil1"},
        {R"({"flag":true,"id":3})", R"({"flag":false,"name":"Eve"})",
         "flag=0 , name='Eve' WHERE  (flag=1 and id=3 );", "1Ann1,2Bob0,3Eve0"},
        {R"({"name":["Ann"]})", R"({"id":7})", "id=7 WHERE  (name in ('Ann' ) );",
         "2Bob0,3O'Brien1,7Ann1"},
        {R"({"vornSqlWhereFilter":"id > 1"})", R"({"flag":false})", "flag=0 WHERE  ( id > 1  );",
         "1Ann1,2Bob0,3O'Brien0"},
        // Kept: sorting and paging do not count here.
        {R"({"flag":true,"limit":1,"sort_by":"id"})", R"({"flag":false})",
         "flag=0 WHERE  (flag=1 );", "1Ann0,2Bob0,3O'Brien0"},
        {R"({"id":9})", R"({"flag":false})", "flag=0 WHERE  (id=9 );", "1Ann1,2Bob0,3O'Brien1"},
        {R"({"id":2,"undeclared":5})", R"({"flag":true,"undeclared":5})", "flag=1 WHERE  (id=2 );",
         "1Ann1,2Bob1,3O'Brien1"},
        {R"({"id":2})", R"({"flag":true,"vornSqlWhereFilter":"id=3"})", "flag=1 WHERE  (id=2 );",
         "1Ann1,2Bob1,3O'Brien1"},
        {R"({"id":2})", R"({"data":{"k":2}})", R"(data='{"k":2}' WHERE  (id=2 );)",
         "1Ann1,2Bob0,3O'Brien1"},
    };
    for (const auto& row : cases) {
        database_.run("begin");
        EXPECT_EQ(0, update(row.szFilter, row.szValues)) << row.szFilter;
        EXPECT_EQ(Lines{statement(row.szTail)}, takeStatements()) << row.szFilter;
        EXPECT_EQ(Lines(), takeLog()) << row.szFilter;
        EXPECT_EQ(row.szContents, contents()) << row.szFilter;
        database_.run("rollback");
    }
}

TEST_F(UpdateByFilter, RefusesAFilterByItsKindBeforeTheValues)
{
    const struct {
        const char* szFilter;
        const char* szCondition;
    } cases[] = {
        {"null", "jFilterIn.empty()"},
        {"{}", "jFilterIn.empty()"},
        {"[]", "jFilterIn.empty()"},
        {"[1]", "jFilterIn.type() != Json::objectValue"},
        {R"([{"id":1}])", "jFilterIn.type() != Json::objectValue"},
        {R"("x")", "jFilterIn.type() != Json::objectValue"},
        {R"("")", "jFilterIn.type() != Json::objectValue"},
        {"5", "jFilterIn.type() != Json::objectValue"},
        {"0", "jFilterIn.type() != Json::objectValue"},
        {"1.5", "jFilterIn.type() != Json::objectValue"},
        {"true", "jFilterIn.type() != Json::objectValue"},
        {"false", "jFilterIn.type() != Json::objectValue"},
    };
    for (const auto& row : cases) {
        for (const char* szValues : {R"({"flag":true})", "[1]", "null"}) {
            EXPECT_EQ(-1, update(row.szFilter, szValues)) << row.szFilter;
            EXPECT_EQ((Lines{failed(row.szCondition), summary(szValues)}), takeLog())
                << row.szFilter;
        }
    }
    EXPECT_EQ(Lines(), takeStatements());
    EXPECT_EQ("", table_.api.getErrMsg());
}

TEST_F(UpdateByFilter, RefusesValuesOfAnotherKindBeforeTheConditionsAreLookedAt)
{
    for (const char* szValues :
         {"null", "[]", "[1]", R"([{"flag":true}])", R"("x")", "5", "1.5", "true"}) {
        for (const char* szFilter :
             {R"({"id":1})", R"({"vornSqlWhereFilter":5})", R"({"undeclared":1})"}) {
            EXPECT_EQ(-1, update(szFilter, szValues)) << szValues;
            EXPECT_EQ((Lines{failed("jParamIn.type() != Json::objectValue"), summary(szValues)}),
                      takeLog());
        }
    }
    EXPECT_EQ(Lines(), takeStatements());
}

TEST_F(UpdateByFilter, ReportsAFaultOfTheFilterBeforeOneOfTheValues)
{
    const std::string strBadValues = R"({"id":"x"})";
    EXPECT_EQ(-1, update(R"({"vornSqlWhereFilter":5})", strBadValues));
    EXPECT_EQ((Lines{kFilterIsNoText, kNoConditions, summary(strBadValues)}), takeLog());

    for (const char* szFilter : {R"({"undeclared":1})", R"({"limit":1,"offset":2})"}) {
        EXPECT_EQ(-1, update(szFilter, strBadValues));
        EXPECT_EQ((Lines{failed("strSql.empty()"), summary(strBadValues)}), takeLog());
    }

    doubles::state().iFailMprintf = 1;
    EXPECT_EQ(-1, update(R"({"name":"Ann"})", strBadValues));
    EXPECT_EQ((Lines{kNoMemoryForText, kNoMatchTerm, kNoConditions, summary(strBadValues)}),
              takeLog());
    EXPECT_EQ(Lines(), takeStatements());
}

TEST_F(UpdateByFilter, RefusesValuesOfTheWrongType)
{
    const struct {
        const char* szKey;
        const char* szValues;
    } cases[] = {
        {"id", R"({"id":"5"})"},
        {"id", R"({"id":null})"},
        {"id", R"({"id":1.5})"},
        {"name", R"({"name":5})"},
        {"name", R"({"name":null})"},
        {"flag", R"({"flag":1})"},
        {"flag", R"({"flag":"true"})"},
        {"data", R"({"data":[1]})"},
        {"data", R"({"data":"{}"})"},
        {"tags", R"({"tags":{"a":1}})"},
        {"id", R"({"flag":true,"id":"5"})"},
        {"flag", R"({"flag":0,"id":"5"})"},
    };
    for (const auto& row : cases) {
        const std::string strValues = row.szValues;
        EXPECT_EQ(-1, update(R"({"id":1})", strValues)) << strValues;
        EXPECT_EQ((Lines{error(std::string("type failed, strKey=") + row.szKey +
                               ", jRecParam=" + strValues),
                         kBadTypes, summary(strValues)}),
                  takeLog());
    }
    EXPECT_EQ(Lines(), takeStatements());
    EXPECT_EQ("1Ann1,2Bob0,3O'Brien1", contents());
}

TEST_F(UpdateByFilter, RefusesAMemberWhoseWordTheTypeCheckDoesNotKnow)
{
    Table table(database_, R"({"d":{"cpptype":"double"},"u":{"cpptype":"unsigned int"}})",
                "d real, u integer");
    for (const char* szKey : {"d", "u"}) {
        jFilter_ = json(R"({"u":1})");
        jValues_ = Json::nullValue;
        jValues_[szKey] = 1;
        EXPECT_EQ(-1, table.api.recUpdateByFilter(jFilter_, jValues_));
        EXPECT_EQ((Lines{error(std::string("type not found!!, key=") + szKey), kBadTypes,
                         summary(text(jValues_))}),
                  takeLog());
    }
    EXPECT_EQ(Lines(), takeStatements());
}

TEST_F(UpdateByFilter, RefusesEmptyValuesOneLevelBelow)
{
    EXPECT_EQ(-1, update(R"({"id":1})", "{}"));
    EXPECT_EQ((Lines{failed("jRecIn.empty()"), plain("jRecIn={}"), kNoUpdate, summary("{}")}),
              takeLog());
    EXPECT_EQ(Lines(), takeStatements());
}

TEST_F(UpdateByFilter, FailsWhereSqliteRefuses)
{
    const struct {
        const char* szFilter;
        const char* szValues;
        const char* szTail;
        const char* szError;
    } cases[] = {
        {R"({"tags":[]})", R"({"flag":true})", "flag=1 WHERE  ( );", kNearParenthesis},
        {R"({"vornSqlWhereFilter":""})", R"({"flag":true})", "flag=1 WHERE  (   );",
         kNearParenthesis},
        {R"({"id":1})", R"({"undeclared":true})", " WHERE  (id=1 );", kNearWhere},
        {R"({"id":1})", R"({"vornSqlWhereFilter":"id=2"})", " WHERE  (id=1 );", kNearWhere},
        // Kept: an array becomes a membership term, which no SET list takes.
        {R"({"id":1})", R"({"tags":[1,2]})", "tags in ('1''2' ) WHERE  (id=1 );",
         R"(near "in": syntax error)"},
    };
    for (const auto& row : cases) {
        EXPECT_EQ(-1, update(row.szFilter, row.szValues)) << row.szFilter;
        const std::string strSql = statement(row.szTail);
        EXPECT_EQ(refused(row.szError, strSql, row.szValues), takeLog());
        EXPECT_EQ(Lines{strSql}, takeStatements());
    }
    EXPECT_EQ("1Ann1,2Bob0,3O'Brien1", contents());
    EXPECT_EQ("", table_.api.getErrMsg());
}

TEST_F(UpdateByFilter, WhatAnAccessorThrowsReachesTheHost)
{
    // The filter is rendered before the values are checked.
    for (const char* szFilter : {R"({"flag":"x"})", R"({"flag":{}})", R"({"name":{}})",
                                 R"({"name":[{}]})", R"({"id":{}})"}) {
        EXPECT_THROW(update(szFilter, R"({"id":"x"})"), Json::LogicError) << szFilter;
        EXPECT_EQ(szFilter, text(jFilter_));
        EXPECT_EQ(R"({"id":"x"})", text(jValues_));
        EXPECT_EQ(Lines(), takeLog()) << szFilter;
        EXPECT_EQ(Lines(), takeStatements()) << szFilter;
    }
    EXPECT_EQ(0, update(R"({"id":1})", R"({"flag":false})"));
    EXPECT_EQ("1Ann0,2Bob0,3O'Brien1", contents());
}

TEST_F(UpdateByFilter, TracesTheTextOfSqliteWhenAsked)
{
    blDebugOutput = true;
    EXPECT_EQ(-1, update(R"({"id":1})", R"({"name":"Bob"})"));
    const std::string strError = "UNIQUE constraint failed: " + table_.strName + ".name";
    Lines expected =
        refused(strError, statement("name='Bob' WHERE  (id=1 );"), R"({"name":"Bob"})");
    expected.insert(expected.begin() + 1, plain("run sql fail, err=" + strError));
    EXPECT_EQ(expected, takeLog());
}

class UpdateByFilterLocked : public RecordsInFileTest {};

TEST_F(UpdateByFilterLocked, GivesUpAfterEveryAttempt)
{
    Json::Value jFilter = json(R"({"id":1})");
    Json::Value jValues = json(R"({"flag":false})");
    EXPECT_EQ(-1, table_.api.recUpdateByFilter(jFilter, jValues));
    const std::string strSql = "UPDATE " + table_.strName + " SET flag=0 WHERE  (id=1 );";
    EXPECT_EQ((Lines{runFailed("database is locked", strSql, 500),
                     failed("0 > runSqlEx(strSql, NULL, NULL)"), plain(R"(jRecIn={"flag":false})"),
                     sqlError("database is locked", strSql),
                     failed("0 > recUpdateByWhere(jParamIn, strSql)"),
                     plain(R"(recUpdateByFilter failed, jParamIn={"flag":false})")}),
              takeLog());
    expectEveryAttempt(strSql);
    other("commit");
    EXPECT_EQ(0, table_.api.recUpdateByFilter(jFilter, jValues));
    EXPECT_EQ("1Ann0,2Bob0,3O'Brien1", contents());
}

}  // namespace
