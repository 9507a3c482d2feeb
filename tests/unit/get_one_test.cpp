// SPDX-License-Identifier: MIT
// Fetching one record.

#include "support/records.h"

namespace {

const std::string kNoList = failed("0 > recList(jRecParam, jRecArray)");
const std::string kNotRun = failed("0 > runSqlEx(strSqlRun, DbCallBackFillList, &jRecArrayOut)");

class GetOne : public RecordsTest {
protected:
    int get(const std::string& strRequest)
    {
        jRequest_ = json(strRequest);
        return table_.api.recGetOne(jRequest_, jOut_);
    }

    Json::Value jRequest_;
    Json::Value jOut_;
};

TEST_F(GetOne, CopiesTheFirstRow)
{
    const struct {
        const char* szRequest;
        const char* szTail;
        const char* szRecord;
    } cases[] = {
        {R"({"id":2})", " WHERE  (id=2 );", R"({"flag":false,"id":2,"name":"Bob"})"},
        {R"({"id":1})", " WHERE  (id=1 );",
         R"({"data":{"k":1},"flag":true,"id":1,"name":"Ann","tags":[1]})"},
        {R"({"vornSqlWhereFilter":"id > 1"})", " WHERE  ( id > 1  );",
         R"({"flag":false,"id":2,"name":"Bob"})"},
        {R"({"limit":1,"offset":2})", " LIMIT 1 OFFSET 2;",
         R"({"flag":true,"id":3,"name":"O'Brien"})"},
        {R"({"vornSqlWhereFilter":"1) order by (id) desc limit (9"})",
         " WHERE  ( 1) order by (id) desc limit (9  );",
         R"({"flag":true,"id":3,"name":"O'Brien"})"},
        {"null", ";", R"({"data":{"k":1},"flag":true,"id":1,"name":"Ann","tags":[1]})"},
        {"{}", ";", R"({"data":{"k":1},"flag":true,"id":1,"name":"Ann","tags":[1]})"},
    };
    for (const auto& row : cases) {
        jOut_ = Json::nullValue;
        EXPECT_EQ(1, get(row.szRequest)) << row.szRequest;
        EXPECT_EQ(row.szRecord, text(jOut_)) << row.szRequest;
        EXPECT_EQ(row.szRequest, text(jRequest_));
        // Kept: no LIMIT of its own.
        EXPECT_EQ(Lines{select(row.szTail)}, takeStatements()) << row.szRequest;
        EXPECT_EQ(Lines(), takeLog()) << row.szRequest;
    }
}

TEST_F(GetOne, ReadsEveryMatchAndDropsAllButTheFirst)
{
    int iRows = 0;
    doubles::state().exec = [&](sqlite3* pDb, const char* szSql, doubles::RowCallback callback,
                                void* arg, char** errText) {
        const int iStatus = doubles::realExec(pDb, szSql, callback, arg, errText);
        iRows = static_cast<int>(static_cast<Json::Value*>(arg)->size());
        return iStatus;
    };
    EXPECT_EQ(1, get("null"));
    EXPECT_EQ(3, iRows);
    EXPECT_EQ(1, jOut_["id"].asInt());
}

TEST_F(GetOne, LeavesTheOutputWhereNothingMatches)
{
    for (const char* szOut : {"null", "{}", R"({"id":7})", "[1]", R"("x")", "5", "true"}) {
        jOut_ = json(szOut);
        EXPECT_EQ(0, get(R"({"id":9})")) << szOut;
        EXPECT_EQ(szOut, text(jOut_));
        EXPECT_EQ(Lines(), takeLog()) << szOut;
    }
}

TEST_F(GetOne, OverwritesMembersAndKeepsTheOthers)
{
    jOut_ = json(R"({"data":{"k":5,"m":6},"flag":"mine","mine":[1],"tags":"mine"})");
    EXPECT_EQ(1, get(R"({"id":1})"));
    EXPECT_EQ(R"({"data":{"k":1},"flag":true,"id":1,"mine":[1],"name":"Ann","tags":[1]})",
              text(jOut_));
    // What is NULL in the row stays as it was.
    EXPECT_EQ(1, get(R"({"id":2})"));
    EXPECT_EQ(R"({"data":{"k":1},"flag":false,"id":2,"mine":[1],"name":"Bob","tags":[1]})",
              text(jOut_));
}

TEST_F(GetOne, MayTakeTheRequestItselfAsTheOutput)
{
    const struct {
        const char* szBoth;
        int iResult;
        const char* szAfter;
    } cases[] = {
        {R"({"id":2,"limit":1})", 1, R"({"flag":false,"id":2,"limit":1,"name":"Bob"})"},
        {R"({"limit":1,"offset":1})", 1,
         R"({"flag":false,"id":2,"limit":1,"name":"Bob","offset":1})"},
        {"null", 1, R"({"data":{"k":1},"flag":true,"id":1,"name":"Ann","tags":[1]})"},
        {"{}", 1, R"({"data":{"k":1},"flag":true,"id":1,"name":"Ann","tags":[1]})"},
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

// The record is the host's own: what becomes of it touches no later one.
TEST_F(GetOne, GivesARecordOfItsOwn)
{
    EXPECT_EQ(1, get(R"({"id":2})"));
    Json::Value jFirst = jOut_;
    jFirst["name"] = "changed";
    jFirst.removeMember("flag");
    jFirst["new"] = 1;
    jOut_ = Json::nullValue;
    EXPECT_EQ(1, get(R"({"id":2})"));
    EXPECT_EQ(R"({"flag":false,"id":2,"name":"Bob"})", text(jOut_));
    EXPECT_EQ(R"({"id":2,"name":"changed","new":1})", text(jFirst));
}

TEST_F(GetOne, ARowOfNullsLeavesANullOutput)
{
    Table table(database_, R"({"a":{"cpptype":"string"}})", "a");
    database_.run("insert into " + table.strName + " values (NULL)");
    EXPECT_EQ(1, table.api.recGetOne(jRequest_, jOut_));
    EXPECT_TRUE(jOut_.isNull());
    jOut_ = json(R"({"mine":1})");
    EXPECT_EQ(1, table.api.recGetOne(jRequest_, jOut_));
    EXPECT_EQ(R"({"mine":1})", text(jOut_));

    // The rows behind it make no difference.
    database_.run("insert into " + table.strName + " values ('x')");
    jOut_ = Json::nullValue;
    EXPECT_EQ(1, table.api.recGetOne(jRequest_, jOut_));
    EXPECT_TRUE(jOut_.isNull());
}

TEST_F(GetOne, RefusesAnOutputOfAnotherKindAfterTheListing)
{
    for (const char* szOut : {R"("x")", "[1]", "[]", "5", "1.5", "true"}) {
        jOut_ = json(szOut);
        EXPECT_EQ(-1, get(R"({"id":2})")) << szOut;
        EXPECT_EQ(szOut, text(jOut_));
        EXPECT_EQ(Lines{select(" WHERE  (id=2 );")}, takeStatements()) << szOut;
        EXPECT_EQ(
            (Lines{utilFailed("jIn.type() != Json::nullValue && jIn.type() != Json::objectValue"),
                   failed("0 > jsonCopyMember(jRecOut, jRecArray[0], true)")}),
            takeLog());
    }
}

TEST_F(GetOne, RefusesARequestOfAnotherKind)
{
    jOut_ = json(R"({"id":7})");
    for (const char* szRequest : {R"("x")", "[]", "[1]", "5", "true"}) {
        EXPECT_EQ(-1, get(szRequest)) << szRequest;
        EXPECT_EQ((Lines{kNoObjectOrNull, plain(std::string("jRecParam=") + szRequest), kNoList}),
                  takeLog());
        EXPECT_EQ(R"({"id":7})", text(jOut_));
    }
    EXPECT_EQ(Lines(), takeStatements());
}

TEST_F(GetOne, LogsTheLinesOfTheListingFirst)
{
    jOut_ = json(R"({"id":7})");
    EXPECT_EQ(-1, get(R"({"tags":[]})"));
    const std::string strSql = select(" WHERE  ( );");
    EXPECT_EQ(
        (Lines{runFailed(kNearParenthesis, strSql), kNotRun, plain(R"(jRecParam={"tags":[]})"),
               sqlError(kNearParenthesis, strSql), kNoList}),
        takeLog());
    // The text stays for the next failure.
    EXPECT_EQ(-1, get("[1]"));
    EXPECT_EQ(
        (Lines{kNoObjectOrNull, plain("jRecParam=[1]"), sqlError(kNearParenthesis, ""), kNoList}),
        takeLog());
    EXPECT_EQ(R"({"id":7})", text(jOut_));
}

TEST_F(GetOne, FailsWhereALaterRowIsBad)
{
    Table table(database_, R"({"id":{"cpptype":"int"},"real":{"cpptype":"double"}})",
                "id integer primary key, real real");
    database_.run("insert into " + table.strName + " values (1,NULL),(2,2.5)");
    EXPECT_EQ(-1, table.api.recGetOne(jRequest_, jOut_));
    EXPECT_TRUE(jOut_.isNull());
    const Lines lines = takeLog();
    ASSERT_EQ(10U, lines.size());
    EXPECT_EQ(error("type error, strType=double"), lines.front());
    EXPECT_EQ(kNoList, lines.back());

    jRequest_["limit"] = 1;
    EXPECT_EQ(1, table.api.recGetOne(jRequest_, jOut_));
    EXPECT_EQ(R"({"id":1})", text(jOut_));
}

TEST_F(GetOne, WhatAnAccessorThrowsReachesTheHost)
{
    jOut_ = json(R"({"id":7})");
    for (const char* szRequest : {R"({"sort_by":5})", R"({"flag":"x"})", R"({"name":{}})"}) {
        EXPECT_THROW(get(szRequest), Json::LogicError) << szRequest;
        EXPECT_EQ(szRequest, text(jRequest_));
        EXPECT_EQ(R"({"id":7})", text(jOut_));
        EXPECT_EQ(Lines(), takeLog());
        EXPECT_EQ(Lines(), takeStatements());
    }
    EXPECT_EQ(1, get(R"({"id":2})"));
}

TEST_F(GetOne, WaitsForALockAndTakesTheFirstRowOfAll)
{
    lock(3);
    EXPECT_EQ(1, get(R"({"id":3})"));
    EXPECT_EQ("O'Brien", jOut_["name"].asString());
    EXPECT_EQ(4U, takeStatements().size());
    EXPECT_EQ(3U, doubles::state().sleeps.size());
    EXPECT_EQ(Lines(), takeLog());
}

class GetOneLocked : public RecordsInFileTest {};

TEST_F(GetOneLocked, GivesUpAfterEveryAttempt)
{
    Json::Value jRequest;
    Json::Value jOut = "mine";
    EXPECT_EQ(-1, table_.api.recGetOne(jRequest, jOut));
    EXPECT_EQ(
        (Lines{runFailed("database is locked", select(";"), 500), kNotRun, plain("jRecParam=null"),
               sqlError("database is locked", select(";")), kNoList}),
        takeLog());
    expectEveryAttempt(select(";"));
    EXPECT_EQ("mine", jOut.asString());
}

}  // namespace
