// SPDX-License-Identifier: MIT
// Updating by a condition text.

#include "support/records.h"

namespace {

const std::string kNoSetList =
    failed("0 > SqlExpandMemberList(jColumnList, strSql2, VORN_SQL_WHERE_TYPE_COMMA)");
const std::string kNotRun = failed("0 > runSqlEx(strSql, NULL, NULL)");

class UpdateByWhere : public RecordsTest {
protected:
    int update(const std::string& strRecord, std::string strWhere)
    {
        jRecord_ = json(strRecord);
        const std::string strBefore = strWhere;
        const int iResult = table_.api.recUpdateByWhere(jRecord_, strWhere);
        EXPECT_EQ(strBefore, strWhere);
        EXPECT_EQ(json(strRecord), jRecord_) << "the record was changed";
        return iResult;
    }

    std::string statement(const std::string& strTail) const
    {
        return "UPDATE " + table_.strName + " SET " + strTail;
    }

    Json::Value jRecord_;
};

TEST_F(UpdateByWhere, ComposesOneStatement)
{
    const struct {
        const char* szRecord;
        const char* szWhere;
        const char* szTail;
        const char* szContents;
    } cases[] = {
        {R"({"name":"Eve"})", "id=1", "name='Eve' WHERE id=1;", "1Eve1,2Bob0,3O'Brien1"},
        {R"({"name":"O'Neil"})", "id=1", "name='O''Neil' WHERE id=1;", "1O'Neil1,2Bob0,3O'Brien1"},
        {R"({"flag":true,"name":"Eve"})", "id=2", "flag=1 , name='Eve' WHERE id=2;",
         "1Ann1,2Eve1,3O'Brien1"},
        {R"({"flag":false,"id":9,"name":"Eve"})", " id = 2 ",
         "flag=0 , id=9 , name='Eve' WHERE  id = 2 ;", "1Ann1,3O'Brien1,9Eve0"},
        {R"({"id":"8"})", "id=2", "id=8 WHERE id=2;", "1Ann1,3O'Brien1,8Bob0"},
        {R"({"flag":1})", "1", "flag=1 WHERE 1;", "1Ann1,2Bob1,3O'Brien1"},
        {R"({"name":5})", "id=2", "name='5' WHERE id=2;", "1Ann1,250,3O'Brien1"},
        {R"({"name":null})", "id=2", "name='' WHERE id=2;", "1Ann1,20,3O'Brien1"},
        {R"({"flag":null})", "id=1", "flag=0 WHERE id=1;", "1Ann0,2Bob0,3O'Brien1"},
        {R"({"flag":true,"undeclared":5})", "id=2", "flag=1 WHERE id=2;", "1Ann1,2Bob1,3O'Brien1"},
        // A raw filter beside the values is no column, of whatever kind it is.
        {R"({"flag":true,"vornSqlWhereFilter":"id=3"})", "id=2", "flag=1 WHERE id=2;",
         "1Ann1,2Bob1,3O'Brien1"},
        {R"({"flag":true,"vornSqlWhereFilter":5})", "id=2", "flag=1 WHERE id=2;",
         "1Ann1,2Bob1,3O'Brien1"},
        // Kept: the condition is taken as it stands.
        {R"({"flag":true})", "id=2 or name='nobody'", "flag=1 WHERE id=2 or name='nobody';",
         "1Ann1,2Bob1,3O'Brien1"},
        {R"({"flag":false})", "id=9", "flag=0 WHERE id=9;", "1Ann1,2Bob0,3O'Brien1"},
    };
    for (const auto& row : cases) {
        database_.run("begin");
        EXPECT_EQ(0, update(row.szRecord, row.szWhere)) << row.szRecord;
        EXPECT_EQ(Lines{statement(row.szTail)}, takeStatements()) << row.szRecord;
        EXPECT_EQ(Lines(), takeLog()) << row.szRecord;
        EXPECT_EQ(row.szContents, contents()) << row.szRecord;
        database_.run("rollback");
    }
}

TEST_F(UpdateByWhere, WritesObjectsAsText)
{
    EXPECT_EQ(0, update(R"({"data":{"k":"it's"}})", "id=2"));
    EXPECT_EQ(Lines{statement(R"(data='{"k":"it''s"}' WHERE id=2;)")}, takeStatements());
    Json::Value jRequest = json(R"({"id":2})");
    Json::Value jOut;
    EXPECT_EQ(1, table_.api.recGetOne(jRequest, jOut));
    EXPECT_EQ(R"({"data":{"k":"it's"},"flag":false,"id":2,"name":"Bob"})", text(jOut));
    // An array member takes anything but an array.
    takeStatements();
    EXPECT_EQ(0, update(R"({"tags":null})", "id=2"));
    EXPECT_EQ(0, update(R"({"tags":{"a":1}})", "id=2"));
    EXPECT_EQ(
        (Lines{statement("tags='null' WHERE id=2;"), statement(R"(tags='{"a":1}' WHERE id=2;)")}),
        takeStatements());
}

TEST_F(UpdateByWhere, GivesNoCount)
{
    EXPECT_EQ(0, update(R"({"flag":true})", "id > 0"));
    EXPECT_EQ("1Ann1,2Bob1,3O'Brien1", contents());
    doubles::state().changes = [] { return 12; };
    EXPECT_EQ(0, update(R"({"flag":true})", "id > 0"));
    EXPECT_EQ(Lines(), takeLog());
}

TEST_F(UpdateByWhere, RefusesAnEmptyCondition)
{
    // It is looked at before the record.
    for (const char* szRecord : {R"({"flag":true})", "null", "{}", "[]", "[1]", R"("x")", "5"}) {
        EXPECT_EQ(-1, update(szRecord, "")) << szRecord;
        EXPECT_EQ((Lines{failed("strSqlWhere.empty()"), plain(std::string("jRecIn=") + szRecord)}),
                  takeLog());
    }
    EXPECT_EQ(Lines(), takeStatements());
    EXPECT_EQ("1Ann1,2Bob0,3O'Brien1", contents());
}

TEST_F(UpdateByWhere, RefusesAnEmptyRecord)
{
    for (const char* szRecord : {"null", "{}", "[]"}) {
        EXPECT_EQ(-1, update(szRecord, "id=1")) << szRecord;
        EXPECT_EQ((Lines{failed("jRecIn.empty()"), plain(std::string("jRecIn=") + szRecord)}),
                  takeLog());
    }
    EXPECT_EQ(Lines(), takeStatements());
}

TEST_F(UpdateByWhere, RefusesARecordOfAnotherKind)
{
    for (const char* szRecord :
         {R"("x")", R"("")", "[1]", R"([{"flag":true}])", "5", "0", "1.5", "true", "false"}) {
        EXPECT_EQ(-1, update(szRecord, "id=1")) << szRecord;
        EXPECT_EQ((Lines{kNoObjectOrNull, kNoSetList, plain(std::string("jRecIn=") + szRecord)}),
                  takeLog());
    }
    EXPECT_EQ(Lines(), takeStatements());
}

TEST_F(UpdateByWhere, FailsWhereMemoryRunsOutInATerm)
{
    doubles::state().iFailMprintf = 2;
    const std::string strRecord = R"({"id":1,"name":"Eve"})";
    EXPECT_EQ(-1, update(strRecord, "id=1"));
    EXPECT_EQ((Lines{kNoMemoryForText, kNoMatchTerm, kNoSetList, plain("jRecIn=" + strRecord)}),
              takeLog());
    EXPECT_EQ(Lines(), takeStatements());
}

TEST_F(UpdateByWhere, FailsWhereSqliteRefuses)
{
    const std::string strUnique = "UNIQUE constraint failed: " + table_.strName;
    const struct {
        const char* szRecord;
        const char* szWhere;
        const char* szTail;
        std::string strError;
    } cases[] = {
        // Nothing is left to set.
        {R"({"vornSqlWhereFilter":"id=1"})", "id=1", " WHERE id=1;", kNearWhere},
        {R"({"vornSqlWhereFilter":5})", "id=1", " WHERE id=1;", kNearWhere},
        {R"({"undeclared":1})", "id=1", " WHERE id=1;", kNearWhere},
        {R"({"flag":true})", " ", "flag=1 WHERE  ;", R"(near ";": syntax error)"},
        {R"({"flag":true})", "absent=1", "flag=1 WHERE absent=1;", "no such column: absent"},
        {R"({"id":null})", "id=1", "id= WHERE id=1;", kNearWhere},
        // Kept: an array becomes a membership term, which no SET list takes.
        {R"({"tags":[1]})", "id=1", "tags in ('1' ) WHERE id=1;", R"(near "in": syntax error)"},
        {R"({"name":["Eve"]})", "id=1", "name in ('Eve' ) WHERE id=1;",
         R"(near "in": syntax error)"},
        {R"({"name":"Eve","tags":[]})", "id=1", "name='Eve' ,  WHERE id=1;", kNearWhere},
        {R"({"name":"Bob"})", "id=1", "name='Bob' WHERE id=1;", strUnique + ".name"},
        {R"({"name":"same"})", "1", "name='same' WHERE 1;", strUnique + ".name"},
        {R"({"id":2})", "id=1", "id=2 WHERE id=1;", strUnique + ".id"},
    };
    for (const auto& row : cases) {
        EXPECT_EQ(-1, update(row.szRecord, row.szWhere)) << row.szRecord;
        const std::string strSql = statement(row.szTail);
        EXPECT_EQ(Lines{strSql}, takeStatements());
        EXPECT_EQ(
            (Lines{runFailed(row.strError, strSql), kNotRun,
                   plain(std::string("jRecIn=") + row.szRecord), sqlError(row.strError, strSql)}),
            takeLog());
    }
    EXPECT_EQ("1Ann1,2Bob0,3O'Brien1", contents());
    // Only the update by filter tells the host of a duplicate.
    EXPECT_EQ("", table_.api.getErrMsg());
}

TEST_F(UpdateByWhere, LogsTheStatementAsFarAsItWasComposedBesideAnEarlierErrorText)
{
    makeStale();
    EXPECT_EQ(-1, update(R"({"flag":true})", ""));
    EXPECT_EQ((Lines{failed("strSqlWhere.empty()"), plain(R"(jRecIn={"flag":true})"),
                     sqlError(kStale, "")}),
              takeLog());
    EXPECT_EQ(-1, update("{}", "id=1"));
    EXPECT_EQ((Lines{failed("jRecIn.empty()"), plain("jRecIn={}"), sqlError(kStale, "")}),
              takeLog());
    EXPECT_EQ(-1, update("[1]", "id=1"));
    EXPECT_EQ(
        (Lines{kNoObjectOrNull, kNoSetList, plain("jRecIn=[1]"), sqlError(kStale, statement(""))}),
        takeLog());
    EXPECT_EQ(0, update(R"({"flag":true})", "id=1"));
    EXPECT_EQ(-1, update("{}", "id=1"));
    EXPECT_EQ((Lines{failed("jRecIn.empty()"), plain("jRecIn={}")}), takeLog());
}

TEST_F(UpdateByWhere, WhatAnAccessorThrowsReachesTheHost)
{
    for (const char* szRecord : {R"({"flag":"x"})", R"({"flag":{}})", R"({"id":{}})",
                                 R"({"name":{}})", R"({"name":[{}]})"}) {
        EXPECT_THROW(update(szRecord, "id=1"), Json::LogicError) << szRecord;
        EXPECT_EQ(szRecord, text(jRecord_));
        EXPECT_EQ(Lines(), takeLog()) << szRecord;
        EXPECT_EQ(Lines(), takeStatements()) << szRecord;
    }
    EXPECT_EQ(0, update(R"({"flag":false})", "id=1"));
    EXPECT_EQ("1Ann0,2Bob0,3O'Brien1", contents());
}

TEST_F(UpdateByWhere, ANegativeCountIsAFailureAlthoughTheRowIsWritten)
{
    doubles::state().changes = [] { return -7; };
    EXPECT_EQ(-1, update(R"({"name":"Eve"})", "id=1"));
    const std::string strSql = statement("name='Eve' WHERE id=1;");
    EXPECT_EQ((Lines{runFailed("Unknow Error!!", strSql), kNotRun,
                     plain(R"(jRecIn={"name":"Eve"})"), sqlError("Unknow Error!!", strSql)}),
              takeLog());
    EXPECT_EQ("1Eve1,2Bob0,3O'Brien1", contents());
}

TEST_F(UpdateByWhere, WaitsForALock)
{
    lock(2);
    EXPECT_EQ(0, update(R"({"name":"Eve"})", "id=1"));
    EXPECT_EQ(Lines(3, statement("name='Eve' WHERE id=1;")), takeStatements());
    EXPECT_EQ(Lines(), takeLog());
    EXPECT_EQ("1Eve1,2Bob0,3O'Brien1", contents());
}

TEST_F(UpdateByWhere, TracesNothingOfItsOwn)
{
    blDebugOutput = true;
    blLogToStdout = true;
    EXPECT_EQ(0, update(R"({"name":"Eve"})", "id=1"));
    EXPECT_EQ(Lines(), takeLog());
    EXPECT_EQ(-1, update(R"({"undeclared":1})", "id=1"));
    const std::string strSql = statement(" WHERE id=1;");
    EXPECT_EQ(
        (Lines{runFailed(kNearWhere, strSql), plain(std::string("run sql fail, err=") + kNearWhere),
               kNotRun, plain(R"(jRecIn={"undeclared":1})"), sqlError(kNearWhere, strSql)}),
        takeLog());
}

class UpdateLocked : public RecordsInFileTest {};

TEST_F(UpdateLocked, GivesUpAfterEveryAttempt)
{
    Json::Value jRecord = json(R"({"name":"Eve"})");
    std::string strWhere = "id=1";
    EXPECT_EQ(-1, table_.api.recUpdateByWhere(jRecord, strWhere));
    const std::string strSql = "UPDATE " + table_.strName + " SET name='Eve' WHERE id=1;";
    EXPECT_EQ((Lines{runFailed("database is locked", strSql, 500), kNotRun,
                     plain(R"(jRecIn={"name":"Eve"})"), sqlError("database is locked", strSql)}),
              takeLog());
    expectEveryAttempt(strSql);
    other("commit");
    EXPECT_EQ("1Ann1,2Bob0,3O'Brien1", contents());
}

}  // namespace
