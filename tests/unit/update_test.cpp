// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// Updates by a condition text and by a filter object.

#include "support/record_calls.h"
#include "support/rows.h"

#include <utility>

namespace {

const std::string kNoSetList =
    failed("0 > SqlExpandMemberList(jColumnList, strSql2, VORN_SQL_WHERE_TYPE_COMMA)");
const std::string kNoConditions =
    failed("0 > SqlExpandMemberList(jFilterIn, strSql, VORN_SQL_WHERE_TYPE_AND)");
const char* const kOtherKinds[] = {R"("x")", R"("")", "[1]",  R"([{"flag":true}])", "5", "0",
                                   "1.5",    "true",  "false"};

class UpdateByWhere : public RecordsTest {};

TEST_F(UpdateByWhere, ComposesOneStatement)
{
    const struct {
        const char* szRecord;
        const char* szWhere;
        const char* szSet;
        const char* szContents;
    } cases[] = {
        {R"({"name":"Eve"})", "id=1", "name='Eve'", "1Eve1,2Bob0,3O'Brien1"},
        {R"({"name":"O'Neil"})", "id=1", "name='O''Neil'", "1O'Neil1,2Bob0,3O'Brien1"},
        {R"({"flag":true,"name":"Eve"})", "id=2", "flag=1 , name='Eve'", "1Ann1,2Eve1,3O'Brien1"},
        {R"({"flag":false,"id":9,"name":"Eve"})", " id = 2 ", "flag=0 , id=9 , name='Eve'",
         "1Ann1,3O'Brien1,9Eve0"},
        {R"({"id":"8"})", "id=2", "id=8", "1Ann1,3O'Brien1,8Bob0"},
        {R"({"flag":1})", "1", "flag=1", "1Ann1,2Bob1,3O'Brien1"},
        {R"({"name":5})", "id=2", "name='5'", "1Ann1,250,3O'Brien1"},
        {R"({"name":null})", "id=2", "name=''", "1Ann1,20,3O'Brien1"},
        {R"({"flag":null})", "id=1", "flag=0", "1Ann0,2Bob0,3O'Brien1"},
        {R"({"flag":true,"undeclared":5})", "id=2", "flag=1", "1Ann1,2Bob1,3O'Brien1"},
        // A raw filter among the values is not a column, whatever its kind.
        {R"({"flag":true,"vornSqlWhereFilter":"id=3"})", "id=2", "flag=1", "1Ann1,2Bob1,3O'Brien1"},
        {R"({"flag":true,"vornSqlWhereFilter":5})", "id=2", "flag=1", "1Ann1,2Bob1,3O'Brien1"},
        // Kept: the condition is taken unchanged.
        {R"({"flag":true})", "id=2 or name='nobody'", "flag=1", "1Ann1,2Bob1,3O'Brien1"},
        {R"({"flag":false})", "id=9", "flag=0", kBefore},
        {R"({"data":{"k":"it's"}})", "id=2", R"(data='{"k":"it''s"}')", kBefore},
        // An array member takes anything but an array.
        {R"({"tags":null})", "id=2", "tags='null'", kBefore},
        {R"({"tags":{"a":1}})", "id=2", R"(tags='{"a":1}')", kBefore},
    };
    for (const auto& row : cases)
        expectContents(updateByWhere(row.szRecord, row.szWhere), 0,
                       std::string("UPDATE $ SET ") + row.szSet + " WHERE " + row.szWhere + ";",
                       row.szContents);
}

TEST_F(UpdateByWhere, RefusesAnEmptyConditionBeforeTheRecord)
{
    for (const char* szRecord : {R"({"flag":true})", "null", "{}", "[]", "[1]", R"("x")", "5"})
        expectFailure(updateByWhere(szRecord, ""), {failed("strSqlWhere.empty()")});
}

TEST_F(UpdateByWhere, RefusesARecordThatIsEmptyOrOfTheWrongKind)
{
    for (const char* szRecord : {"null", "{}", "[]"})
        expectFailure(updateByWhere(szRecord, "id=1"), {failed("jRecIn.empty()")});
    for (const char* szRecord : kOtherKinds)
        expectFailure(updateByWhere(szRecord, "id=1"), {kNoObjectOrNull, kNoSetList}, 0,
                      "UPDATE $ SET ");
}

TEST_F(UpdateByWhere, FailsWhenMemoryRunsOutInATerm)
{
    prepare_ = [] { doubles::state().iFailMprintf = 2; };
    expectFailure(updateByWhere(R"({"id":1,"name":"Eve"})", "id=1"),
                  kNoMemoryForText + Lines{kNoSetList}, 0, "UPDATE $ SET ");
}

TEST_F(UpdateByWhere, FailsWhenSqliteRefuses)
{
    const struct {
        const char* szRecord;
        const char* szWhere;
        const char* szSet;
        const char* szError;
    } cases[] = {
        // Nothing is left to set.
        {R"({"vornSqlWhereFilter":"id=1"})", "id=1", "", kNearWhere},
        {R"({"vornSqlWhereFilter":5})", "id=1", "", kNearWhere},
        {R"({"undeclared":1})", "id=1", "", kNearWhere},
        {R"({"flag":true})", " ", "flag=1", R"(near ";": syntax error)"},
        {R"({"flag":true})", "absent=1", "flag=1", "no such column: absent"},
        {R"({"id":null})", "id=1", "id=", kNearWhere},
        // Kept: an array becomes a membership term, which no SET list takes.
        {R"({"tags":[1]})", "id=1", "tags in ('1' )", R"(near "in": syntax error)"},
        {R"({"name":["Eve"]})", "id=1", "name in ('Eve' )", R"(near "in": syntax error)"},
        {R"({"name":"Eve","tags":[]})", "id=1", "name='Eve' , ", kNearWhere},
        {R"({"name":"Bob"})", "id=1", "name='Bob'", "UNIQUE constraint failed: $.name"},
        {R"({"name":"same"})", "1", "name='same'", "UNIQUE constraint failed: $.name"},
        {R"({"id":2})", "id=1", "id=2", "UNIQUE constraint failed: $.id"},
    };
    for (const auto& row : cases)
        expectSqlFailure(updateByWhere(row.szRecord, row.szWhere),
                         std::string("UPDATE $ SET ") + row.szSet + " WHERE " + row.szWhere + ";",
                         row.szError);
}

TEST_F(UpdateByWhere, PassesOnWhatAnAccessorThrows)
{
    for (const char* szRecord : {R"({"flag":"x"})", R"({"flag":{}})", R"({"id":{}})",
                                 R"({"name":{}})", R"({"name":[{}]})"})
        expectThrow(updateByWhere(szRecord, "id=1"));
}

class UpdateByFilter : public RecordsTest {
protected:
    static std::string update(const std::string& strSet, const std::string& strTerms)
    {
        return "UPDATE $ SET " + strSet + " WHERE  (" + strTerms + " );";
    }
};

TEST_F(UpdateByFilter, ComposesOneStatement)
{
    const struct {
        const char* szFilter;
        const char* szValues;
        const char* szSet;
        const char* szTerms;
        const char* szContents;
    } cases[] = {
        {R"({"id":1})", R"({"name":"Eve"})", "name='Eve'", "id=1", "1Eve1,2Bob0,3O'Brien1"},
        {R"({"name":"O'Brien"})", R"({"name":"O'Neil"})", "name='O''Neil'", "name='O''Brien'",
         "1Ann1,2Bob0,3O'Neil1"},
        {R"({"flag":true,"id":3})", R"({"flag":false,"name":"Eve"})", "flag=0 , name='Eve'",
         "flag=1 and id=3", "1Ann1,2Bob0,3Eve0"},
        {R"({"name":["Ann"]})", R"({"id":7})", "id=7", "name in ('Ann' )", "2Bob0,3O'Brien1,7Ann1"},
        {R"({"vornSqlWhereFilter":"id > 1"})", R"({"flag":false})", "flag=0", " id > 1 ",
         "1Ann1,2Bob0,3O'Brien0"},
        // Kept: sorting and paging are ignored here.
        {R"({"flag":true,"limit":1,"sort_by":"id"})", R"({"flag":false})", "flag=0", "flag=1",
         "1Ann0,2Bob0,3O'Brien0"},
        {R"({"id":9})", R"({"flag":false})", "flag=0", "id=9", kBefore},
        {R"({"id":2,"undeclared":5})", R"({"flag":true,"undeclared":5})", "flag=1", "id=2",
         "1Ann1,2Bob1,3O'Brien1"},
        {R"({"id":2})", R"({"flag":true,"vornSqlWhereFilter":"id=3"})", "flag=1", "id=2",
         "1Ann1,2Bob1,3O'Brien1"},
        {R"({"id":2})", R"({"data":{"k":2}})", R"(data='{"k":2}')", "id=2", kBefore},
    };
    for (const auto& row : cases)
        expectContents(updateByFilter(row.szFilter, row.szValues), 0,
                       update(row.szSet, row.szTerms), row.szContents);
}

TEST_F(UpdateByFilter, RefusesAFilterOfTheWrongKindBeforeTheValues)
{
    for (const char* szValues : {R"({"flag":true})", "[1]", "null"}) {
        for (const char* szFilter : {"null", "{}", "[]"})
            expectFailure(updateByFilter(szFilter, szValues), {failed("jFilterIn.empty()")});
        for (const char* szFilter : kOtherKinds)
            expectFailure(updateByFilter(szFilter, szValues),
                          {failed("jFilterIn.type() != Json::objectValue")});
    }
}

TEST_F(UpdateByFilter, RefusesValuesOfTheWrongKindBeforeReadingTheConditions)
{
    for (const char* szFilter :
         {R"({"id":1})", R"({"vornSqlWhereFilter":5})", R"({"undeclared":1})"})
        for (const char* szValues :
             {"null", "[]", "[1]", R"([{"flag":true}])", R"("x")", "5", "1.5", "true"})
            expectFailure(updateByFilter(szFilter, szValues),
                          {failed("jParamIn.type() != Json::objectValue")});
}

TEST_F(UpdateByFilter, ReportsABadFilterBeforeBadValues)
{
    const std::string strBadValues = R"({"id":"x"})";
    expectFailure(updateByFilter(R"({"vornSqlWhereFilter":5})", strBadValues),
                  {kFilterIsNoText, kNoConditions});
    for (const char* szFilter : {R"({"undeclared":1})", R"({"limit":1,"offset":2})"})
        expectFailure(updateByFilter(szFilter, strBadValues), {failed("strSql.empty()")});
    for (const char* szFilter : {R"({"flag":"x"})", R"({"flag":{}})", R"({"name":{}})",
                                 R"({"name":[{}]})", R"({"id":{}})"})
        expectThrow(updateByFilter(szFilter, strBadValues));
    prepare_ = [] { doubles::state().iFailMprintf = 1; };
    expectFailure(updateByFilter(R"({"name":"Ann"})", strBadValues),
                  kNoMemoryForText + Lines{kNoConditions});
}

TEST_F(UpdateByFilter, RefusesValuesOfTheWrongType)
{
    const auto expectRefused = [&](const std::string& strLine, const char* szValues) {
        expectFailure(updateByFilter(R"({"id":1})", szValues),
                      {error(strLine), failed("0 > checkJsonType(jParamIn)")});
    };
    for (const auto& [szKey, szValues] : {std::pair{"id", R"({"id":"5"})"},
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
                                          {"flag", R"({"flag":0,"id":"5"})"}})
        expectRefused(std::string("type failed, strKey=") + szKey + ", jRecParam=" + szValues,
                      szValues);

    Table table(database_, R"({"d":{"cpptype":"double"},"id":{"cpptype":"unsigned int"}})", "d,id");
    pTable_ = &table;
    expectRefused("type not found!!, key=d", R"({"d":1})");
    expectRefused("type not found!!, key=id", R"({"id":1})");
}

TEST_F(UpdateByFilter, RefusesEmptyValuesInTheInnerUpdate)
{
    expectFailure(updateByFilter(R"({"id":1})", "{}"), {failed("jRecIn.empty()")}, 0);
}

TEST_F(UpdateByFilter, FailsWhenSqliteRefuses)
{
    const struct {
        const char* szFilter;
        const char* szValues;
        std::string strSql;
        const char* szError;
    } cases[] = {
        {R"({"tags":[]})", R"({"flag":true})", update("flag=1", ""), kNearParenthesis},
        {R"({"vornSqlWhereFilter":""})", R"({"flag":true})", update("flag=1", "  "),
         kNearParenthesis},
        {R"({"id":1})", R"({"undeclared":true})", update("", "id=1"), kNearWhere},
        {R"({"id":1})", R"({"vornSqlWhereFilter":"id=2"})", update("", "id=1"), kNearWhere},
        // Kept: an array becomes a membership term, which no SET list takes.
        {R"({"id":1})", R"({"tags":[1,2]})", update("tags in ('1''2' )", "id=1"),
         R"(near "in": syntax error)"},
        {R"({"id":1})", R"({"name":"Bob"})", update("name='Bob'", "id=1"),
         "UNIQUE constraint failed: $.name"},
        {R"({"id":1})", R"({"id":2})", update("id=2", "id=1"), "UNIQUE constraint failed: $.id"},
    };
    for (const auto& row : cases)
        expectSqlFailure(updateByFilter(row.szFilter, row.szValues), row.strSql, row.szError);
    prepare_ = [] {
        doubles::state().exec = execOfStatus(SQLITE_CONSTRAINT, "CHECK constraint failed: t");
    };
    expectSqlFailure(updateByFilter(R"({"id":1})", R"({"id":9})"), update("id=9", "id=1"),
                     "CHECK constraint failed: t");
}

}  // namespace
