// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// recList: the composed statement, what is appended, and every failure.

#include "support/record_calls.h"

namespace {

const std::string kNoArray =
    failed("jRecArrayOut.type() != Json::nullValue && jRecArrayOut.type() != Json::arrayValue");
const std::string kNoPaging = failed("0 > SqlFilterConditionFromJson(jRecParam, strSqlLimit)");

class List : public RecordsTest {};

TEST_F(List, ComposesOneStatement)
{
    const struct {
        const char* szRequest;
        const char* szTail;
        const char* szIds;
    } cases[] = {
        {"null", ";", "123"},
        {"{}", ";", "123"},
        {R"({"undeclared":1})", ";", "123"},
        {R"({"id":2})", " WHERE  (id=2 );", "2"},
        {R"({"id":"2"})", " WHERE  (id=2 );", "2"},
        {R"({"id":[3]})", " WHERE  (id in (3 ) );", "3"},
        {R"({"id":9})", " WHERE  (id=9 );", ""},
        {R"({"flag":true})", " WHERE  (flag=1 );", "13"},
        {R"({"flag":[true]})", " WHERE  (flag in (true ) );", "13"},
        {R"({"name":"O'Brien"})", " WHERE  (name='O''Brien' );", "3"},
        {R"({"name":["O'Brien"]})", " WHERE  (name in ('O''Brien' ) );", "3"},
        {R"({"name":["Ann","Bob"]})", " WHERE  (name in ('Ann''Bob' ) );", ""},
        {R"({"name":null})", " WHERE  (name='' );", ""},
        {R"({"data":{"k":1}})", R"( WHERE  (data='{"k":1}' );)", "1"},
        {R"({"tags":[[1]]})", " WHERE  (tags in ('[1]' ) );", "1"},
        {R"({"id":1,"flag":true,"undeclared":5})", " WHERE  (flag=1 and id=1 );", "1"},
        {R"({"vornSqlWhereFilter":"id > 1"})", " WHERE  ( id > 1  );", "23"},
        {R"({"vornSqlWhereFilter":"id > 1","flag":true})", " WHERE  (flag=1 and  id > 1  );", "3"},
        {R"({"vornSqlWhereFilter":"id > 1","zz":1})", " WHERE  ( id > 1  );", "23"},
        {R"({"limit":2})", " LIMIT 2;", "12"},
        {R"({"limit":2,"offset":1})", " LIMIT 2 OFFSET 1;", "23"},
        {R"({"limit":0})", " LIMIT 0;", ""},
        {R"({"limit":-1,"offset":2})", " LIMIT -1 OFFSET 2;", "3"},
        {R"({"offset":1})", ";", "123"},
        {R"({"sort_direction":"desc"})", ";", "123"},
        {R"({"sort_direction":{}})", ";", "123"},
        {R"({"sort_by":"name"})", " order by 'name';", "123"},
        {R"({"sort_by":"id","sort_direction":null})", " order by 'id' ASC;", "123"},
        // Kept: the key is a text literal, so the rows keep their order.
        {R"({"sort_by":"id","sort_direction":"desc"})", " order by 'id' DESC;", "123"},
        {R"({"sort_by":"a'b","sort_direction":"DESC"})", " order by 'a''b' ASC;", "123"},
        {R"({"flag":true,"limit":1,"offset":1,"sort_by":"id","sort_direction":"asc"})",
         " WHERE  (flag=1 ) order by 'id' ASC LIMIT 1 OFFSET 1;", "3"},
        {R"({"id":2,"vornSqlWhereFilter":"1) or (1"})", " WHERE  (id=2 and  1) or (1  );", "123"},
    };
    for (const auto& row : cases)
        expectOutput(list(row.szRequest), 0, select(row.szTail), listed(row.szIds));
}

TEST_F(List, TreatsADeclaredMemberOffsetAsConditionAndPaging)
{
    Table table(database_, R"({"offset":{"cpptype":"int"}})", "offset integer");
    pTable_ = &table;
    database_.run("insert into " + table.strName + " values (1),(1),(2)");
    expectOutput(list(R"({"offset":1})"), 0, "SELECT offset FROM $  WHERE  (offset=1 );",
                 R"([7,{"offset":1},{"offset":1}])");
    expectOutput(list(R"({"limit":5,"offset":1})"), 0,
                 "SELECT offset FROM $  WHERE  (offset=1 ) LIMIT 5 OFFSET 1;",
                 R"([7,{"offset":1}])");
}

TEST_F(List, TurnsNullIntoAnArrayAtTheFirstRow)
{
    expectOutput(list(R"({"id":9})", "null"), 0, select(" WHERE  (id=9 );"), "null");
    expectOutput(list(R"({"id":9})", "[]"), 0, select(" WHERE  (id=9 );"), "[]");
    expectOutput(list(R"({"id":2})", "null"), 0, select(" WHERE  (id=2 );"),
                 std::string("[") + record('2') + "]");
}

TEST_F(List, RefusesARequestOfTheWrongKindBeforeTheOutput)
{
    for (const char* szRequest :
         {R"("x")", R"("")", "[]", "[1]", R"([{"id":1}])", "5", "0", "1.5", "true", "false"})
        for (const char* szArray : {"[7]", "{}"})
            expectFailure(list(szRequest, szArray), {kNoObjectOrNull});
}

TEST_F(List, RefusesAnOutputOfTheWrongKindBeforeReadingTheRequest)
{
    for (const char* szArray : {R"("x")", "{}", R"({"id":1})", "5", "1.5", "true", "false"})
        expectFailure(list(R"({"sort_by":5,"vornSqlWhereFilter":5})", szArray), {kNoArray});
}

TEST_F(List, PassesOnWhatAnAccessorThrows)
{
    for (const char* szRequest :
         {R"({"sort_by":5})", R"({"sort_by":null})", R"({"sort_by":{}})", R"({"sort_by":["id"]})",
          R"({"sort_by":"id","sort_direction":[]})", R"({"sort_by":"id","sort_direction":{}})",
          R"({"flag":"x"})", R"({"flag":{}})", R"({"flag":1e10})", R"({"name":{}})",
          R"({"name":[{}]})", R"({"id":{}})", R"({"id":[[1]]})"})
        expectThrow(list(szRequest));
}

TEST_F(List, RefusesARawFilterOfTheWrongKindBeforeThePaging)
{
    for (const char* szFilter : {"5", "null", "true", "1.5", "[]", R"(["id=1"])", "{}"})
        expectFailure(list(std::string(R"({"sort_by":5,"vornSqlWhereFilter":)") + szFilter + "}"),
                      {kFilterIsNoText, kNoRequestConditions});
}

TEST_F(List, FailsWhenMemoryRunsOut)
{
    prepare_ = [] { doubles::state().iFailMprintf = 1; };
    expectFailure(list(R"({"name":"Ann"})"), kNoMemoryForText + Lines{kNoRequestConditions});
    expectFailure(list(R"({"name":["Ann"]})"), kNoMemoryForItem + Lines{kNoRequestConditions});
    expectFailure(list(R"({"sort_by":"id"})"), {failed("!szSql"), kNoPaging});
    prepare_ = [] { doubles::state().iFailMprintf = 2; };
    expectFailure(list(R"({"name":"Ann","sort_by":"id"})"), {failed("!szSql"), kNoPaging});
}

TEST_F(List, FailsWhenSqliteRefuses)
{
    const struct {
        const char* szRequest;
        const char* szTail;
        const char* szError;
    } cases[] = {
        {R"({"tags":[]})", " WHERE  ( );", kNearParenthesis},
        {R"({"name":"x","tags":[]})", " WHERE  (name='x' and  );", kNearParenthesis},
        {R"({"vornSqlWhereFilter":""})", " WHERE  (   );", kNearParenthesis},
        {R"({"vornSqlWhereFilter":"absent = 1"})", " WHERE  ( absent = 1  );",
         "no such column: absent"},
        {R"({"id":""})", " WHERE  (id= );", kNearParenthesis},
        {R"({"limit":null})", " LIMIT null;", "datatype mismatch"},
        {R"({"limit":1.5})", " LIMIT 1.5;", "datatype mismatch"},
        {R"({"limit":[]})", " LIMIT [];", "no such column: "},
        {R"({"limit":1,"offset":{}})", " LIMIT 1 OFFSET {};", R"(unrecognized token: "{")"},
    };
    for (const auto& row : cases)
        expectSqlFailure(list(row.szRequest), select(row.szTail), row.szError);
}

// A member of a word that cannot be read back does no harm while it is NULL.
TEST_F(List, KeepsTheRowsBeforeTheBadOne)
{
    Table table(database_, R"({"id":{"cpptype":"int"},"real":{"cpptype":"double"}})", "id, real");
    pTable_ = &table;
    database_.run("insert into " + table.strName + " values (NULL,NULL),(1,NULL),(2,2.5)");
    const std::string strError = sqlite3_errstr(SQLITE_ABORT);
    const Lines causes = rowRefused(fieldFailed(error("type error, strType=double")),
                                    {plain("column_name[1]=real"), plain("column_value[1]=2.5")});
    const std::string strSelect = "SELECT id,real FROM $ ";
    expect(list("null", "[7]"),
           {-1, strSelect + ";", R"([7,{},{"id":1}])", nullptr, strError, causes, 0});
    expect(list("null", "null"),
           {-1, strSelect + ";", R"([{},{"id":1}])", nullptr, strError, causes, 0});
    expectSqlFailure(list(R"({"id":2})", "null"), strSelect + " WHERE  (id=2 );", strError, causes);
    expectSqlFailure(get("null"), strSelect + ";", strError, causes);
    expectOutput(get(R"({"limit":1,"offset":1})"), 1, strSelect + " LIMIT 1 OFFSET 1;",
                 R"({"id":1})");
}

}  // namespace
