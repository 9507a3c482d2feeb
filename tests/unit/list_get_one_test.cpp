// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// recGetOne: the statement, what is merged into the output, and every failure.

#include "support/record_calls.h"

namespace {

class GetOne : public RecordsTest {};

// Kept: without a LIMIT of its own.
TEST_F(GetOne, CopiesTheFirstRow)
{
    const struct {
        const char* szRequest;
        const char* szTail;
        char cId;
    } cases[] = {
        {R"({"id":2})", " WHERE  (id=2 );", '2'},
        {R"({"id":1})", " WHERE  (id=1 );", '1'},
        {R"({"vornSqlWhereFilter":"id > 1"})", " WHERE  ( id > 1  );", '2'},
        {R"({"limit":1,"offset":2})", " LIMIT 1 OFFSET 2;", '3'},
        {R"({"vornSqlWhereFilter":"1) order by (id) desc limit (9"})",
         " WHERE  ( 1) order by (id) desc limit (9  );", '3'},
        {"null", ";", '1'},
        {"{}", ";", '1'},
    };
    for (const auto& row : cases)
        for (const char* szOut : {"null", "{}"})
            expectOutput(get(row.szRequest, szOut), 1, select(row.szTail), record(row.cId));
}

TEST_F(GetOne, ReadsEveryMatchAndDropsAllButTheFirst)
{
    Json::ArrayIndex nRows = 0;
    prepare_ = [&] {
        doubles::state().exec = [&](sqlite3* pDb, const char* szSql, doubles::RowCallback callback,
                                    void* arg, char** errText) {
            const int iStatus = doubles::realExec(pDb, szSql, callback, arg, errText);
            nRows = static_cast<Json::Value*>(arg)->size();
            return iStatus;
        };
    };
    expectOutput(get("null"), 1, select(";"), record('1'));
    EXPECT_EQ(3U, nRows);
}

TEST_F(GetOne, LeavesTheOutputAloneWhenNothingMatches)
{
    for (const char* szOut : {"null", "{}", R"({"id":7})", "[1]", R"("x")", "5", "true"})
        expectOutput(get(R"({"id":9})", szOut), 0, select(" WHERE  (id=9 );"), szOut);
}

TEST_F(GetOne, OverwritesMembersButKeepsThoseThatTheRowLacks)
{
    const char szOut[] = R"({"data":{"k":5,"m":6},"flag":"mine","mine":[1],"tags":"mine"})";
    expectOutput(get(R"({"id":1})", szOut), 1, select(" WHERE  (id=1 );"),
                 R"({"data":{"k":1},"flag":true,"id":1,"mine":[1],"name":"Ann","tags":[1]})");
    expectOutput(
        get(R"({"id":2})", szOut), 1, select(" WHERE  (id=2 );"),
        R"({"data":{"k":5,"m":6},"flag":false,"id":2,"mine":[1],"name":"Bob","tags":"mine"})");
}

TEST_F(GetOne, TakesTheRequestItselfAsTheOutput)
{
    const struct {
        const char* szBoth;
        int iResult;
        const char* szAfter;
    } cases[] = {
        {R"({"id":2,"limit":1})", 1, R"({"flag":false,"id":2,"limit":1,"name":"Bob"})"},
        {R"({"limit":1,"offset":1})", 1,
         R"({"flag":false,"id":2,"limit":1,"name":"Bob","offset":1})"},
        {"null", 1, record('1')},
        {"{}", 1, record('1')},
        {R"({"id":9})", 0, R"({"id":9})"},
        {R"({"tags":[]})", -1, R"({"tags":[]})"},
        {"[1]", -1, "[1]"},
        {R"("x")", -1, R"("x")"},
    };
    for (const auto& row : cases) {
        Json::Value jBoth = json(row.szBoth);
        EXPECT_EQ(row.iResult, table_.api.recGetOne(jBoth, jBoth)) << row.szBoth;
        EXPECT_EQ(row.szAfter, text(jBoth)) << row.szBoth;
        EXPECT_EQ(-1 == row.iResult, !takeLog().empty()) << row.szBoth;
    }
}

// Changing the record does not affect any later one.
TEST_F(GetOne, GivesAnIndependentRecord)
{
    Json::Value jRequest = json(R"({"id":2})");
    Json::Value jFirst;
    EXPECT_EQ(1, table_.api.recGetOne(jRequest, jFirst));
    jFirst["name"] = "changed";
    jFirst.removeMember("flag");
    jFirst["new"] = 1;
    takeStatements();
    expectOutput(get(R"({"id":2})"), 1, select(" WHERE  (id=2 );"), record('2'));
    EXPECT_EQ(R"({"id":2,"name":"changed","new":1})", text(jFirst));
}

TEST_F(GetOne, LeavesTheOutputAloneForARowOfNulls)
{
    Table table(database_, R"({"a":{"cpptype":"string"}})", "a");
    pTable_ = &table;
    database_.run("insert into " + table.strName + " values (NULL)");
    for (const char* szOut : {"null", R"({"mine":1})"})
        expectOutput(get("null", szOut), 1, "SELECT a FROM $ ;", szOut);
    database_.run("insert into " + table.strName + " values ('x')");
    expectOutput(get("null"), 1, "SELECT a FROM $ ;", "null");
}

TEST_F(GetOne, RefusesAnOutputOfTheWrongKindAfterTheListing)
{
    Outcome outcome{-1, select(" WHERE  (id=2 );")};
    outcome.causes = {
        utilFailed("jIn.type() != Json::nullValue && jIn.type() != Json::objectValue"),
        failed("0 > jsonCopyMember(jRecOut, jRecArray[0], true)")};
    for (const char* szOut : {R"("x")", "[1]", "[]", "5", "1.5", "true"})
        expect(get(R"({"id":2})", szOut), outcome);
}

TEST_F(GetOne, FailsWhenTheListingFails)
{
    for (const char* szRequest : {R"("x")", "[]", "[1]", "5", "true"})
        expectFailure(get(szRequest, R"({"id":7})"), {kNoObjectOrNull}, 0);
    expectSqlFailure(get(R"({"tags":[]})", R"({"id":7})"), select(" WHERE  ( );"),
                     kNearParenthesis);
    for (const char* szRequest : {R"({"sort_by":5})", R"({"flag":"x"})", R"({"name":{}})"})
        expectThrow(get(szRequest, R"({"id":7})"));
}

}  // namespace
