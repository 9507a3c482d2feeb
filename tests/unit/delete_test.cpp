// SPDX-License-Identifier: MIT
// Deleting by a condition object, and everything.

#include "support/records.h"

namespace {

const std::string kNoObject = failed("jRecParam.type() != Json::objectValue");
const std::string kNoConditions =
    failed("0 > SqlExpandMemberList(jRecParam, strSql, VORN_SQL_WHERE_TYPE_AND)");
const std::string kNotRun = failed("0 > (err = runSqlEx(strSqlRun))");

class Delete : public RecordsTest {
protected:
    int remove(const std::string& strRequest, bool blDeleteAll = false)
    {
        jRequest_ = json(strRequest);
        const int iResult = table_.api.recDelete(jRequest_, blDeleteAll);
        EXPECT_EQ(json(strRequest), jRequest_) << "the request was changed";
        return iResult;
    }

    std::string statement(const std::string& strTail) const
    {
        return "DELETE FROM " + table_.strName + " " + strTail;
    }

    static Lines refused(const std::string& strError, const std::string& strSql)
    {
        return {runFailed(strError, strSql), kNotRun, sqlError(strError, strSql)};
    }

    Json::Value jRequest_;
};

TEST_F(Delete, ComposesOneStatementAndCounts)
{
    const struct {
        const char* szRequest;
        const char* szTail;
        int iResult;
        const char* szContents;
    } cases[] = {
        {R"({"id":1})", " WHERE  (id=1 );", 1, "2Bob0,3O'Brien1"},
        {R"({"id":9})", " WHERE  (id=9 );", 0, "1Ann1,2Bob0,3O'Brien1"},
        {R"({"flag":true})", " WHERE  (flag=1 );", 2, "2Bob0"},
        {R"({"flag":true,"id":3})", " WHERE  (flag=1 and id=3 );", 1, "1Ann1,2Bob0"},
        {R"({"name":"O'Brien"})", " WHERE  (name='O''Brien' );", 1, "1Ann1,2Bob0"},
        {R"({"name":["Bob"]})", " WHERE  (name in ('Bob' ) );", 1, "1Ann1,3O'Brien1"},
        {R"({"id":[1]})", " WHERE  (id in (1 ) );", 1, "2Bob0,3O'Brien1"},
        {R"({"name":["Ann","Bob"]})", " WHERE  (name in ('Ann''Bob' ) );", 0,
         "1Ann1,2Bob0,3O'Brien1"},
        {R"({"data":{"k":1}})", R"( WHERE  (data='{"k":1}' );)", 1, "2Bob0,3O'Brien1"},
        {R"({"vornSqlWhereFilter":"id > 1"})", " WHERE  ( id > 1  );", 2, "1Ann1"},
        {R"({"vornSqlWhereFilter":"1"})", " WHERE  ( 1  );", 3, ""},
        // Kept: sorting and paging do not count here.
        {R"({"flag":true,"limit":1,"offset":1,"sort_by":5})", " WHERE  (flag=1 );", 2, "2Bob0"},
        {R"({"id":2,"undeclared":1})", " WHERE  (id=2 );", 1, "1Ann1,3O'Brien1"},
    };
    // A condition counts whatever the flag says.
    for (const bool blDeleteAll : {false, true}) {
        for (const auto& row : cases) {
            database_.run("begin");
            EXPECT_EQ(row.iResult, remove(row.szRequest, blDeleteAll)) << row.szRequest;
            EXPECT_EQ(Lines{statement(row.szTail)}, takeStatements()) << row.szRequest;
            EXPECT_EQ(Lines(), takeLog()) << row.szRequest;
            EXPECT_EQ(row.szContents, contents()) << row.szRequest;
            database_.run("rollback");
        }
    }
}

TEST_F(Delete, RefusesARequestThatSelectsByNothing)
{
    for (const char* szRequest : {"{}", R"({"undeclared":1})", R"({"limit":1,"sort_by":"id"})"}) {
        EXPECT_EQ(-1, remove(szRequest)) << szRequest;
        EXPECT_EQ(Lines{failed("strSql.empty()")}, takeLog()) << szRequest;
    }
    EXPECT_EQ(Lines(), takeStatements());
    EXPECT_EQ("1Ann1,2Bob0,3O'Brien1", contents());
}

TEST_F(Delete, DeletesEverythingByARequestThatSelectsByNothingWhenAllowed)
{
    for (const char* szRequest : {"{}", R"({"undeclared":1})", R"({"limit":1,"sort_by":"id"})"}) {
        database_.run("begin");
        EXPECT_EQ(3, remove(szRequest, true)) << szRequest;
        EXPECT_EQ(Lines{statement(";")}, takeStatements());
        EXPECT_EQ("", contents());
        EXPECT_EQ(0, remove(szRequest, true)) << szRequest;
        EXPECT_EQ(Lines{statement(";")}, takeStatements());
        EXPECT_EQ(Lines(), takeLog());
        database_.run("rollback");
    }
}

TEST_F(Delete, DeletesAllOnlyThroughTheOperationOfThatName)
{
    EXPECT_EQ(-1, remove("{}"));
    EXPECT_EQ(Lines{failed("strSql.empty()")}, takeLog());
    EXPECT_EQ(3, table_.api.recDeleteAll());
    EXPECT_EQ(Lines{statement(";")}, takeStatements());
    EXPECT_EQ("", contents());
    EXPECT_EQ(0, table_.api.recDeleteAll());
    EXPECT_EQ(Lines(), takeLog());
}

TEST_F(Delete, RefusesARequestOfAnotherKind)
{
    for (const bool blDeleteAll : {false, true}) {
        for (const char* szRequest : {"null", R"("x")", R"("")", "[]", "[1]", R"([{"id":1}])", "5",
                                      "0", "1.5", "true", "false"}) {
            EXPECT_EQ(-1, remove(szRequest, blDeleteAll)) << szRequest;
            EXPECT_EQ(Lines{kNoObject}, takeLog()) << szRequest;
        }
    }
    EXPECT_EQ(Lines(), takeStatements());
    EXPECT_EQ("1Ann1,2Bob0,3O'Brien1", contents());
}

TEST_F(Delete, FailsWhereTheConditionsDo)
{
    for (const bool blDeleteAll : {false, true}) {
        for (const char* szFilter : {"5", "null", "[]", "{}", "true"}) {
            const std::string strRequest =
                std::string(R"({"vornSqlWhereFilter":)") + szFilter + "}";
            EXPECT_EQ(-1, remove(strRequest, blDeleteAll));
            EXPECT_EQ((Lines{kFilterIsNoText, kNoConditions}), takeLog());
        }
        doubles::state().iFailMprintf = 1;
        EXPECT_EQ(-1, remove(R"({"name":"Ann"})", blDeleteAll));
        EXPECT_EQ((Lines{kNoMemoryForText, kNoMatchTerm, kNoConditions}), takeLog());
    }
    EXPECT_EQ(Lines(), takeStatements());
    EXPECT_EQ("1Ann1,2Bob0,3O'Brien1", contents());
}

TEST_F(Delete, FailsWhereSqliteRefuses)
{
    const struct {
        const char* szRequest;
        const char* szTail;
        const char* szError;
    } cases[] = {
        {R"({"tags":[]})", " WHERE  ( );", kNearParenthesis},
        {R"({"id":1,"tags":[]})", " WHERE  (id=1 and  );", kNearParenthesis},
        {R"({"vornSqlWhereFilter":""})", " WHERE  (   );", kNearParenthesis},
        {R"({"id":null})", " WHERE  (id= );", kNearParenthesis},
        {R"({"vornSqlWhereFilter":"absent"})", " WHERE  ( absent  );", "no such column: absent"},
    };
    for (const auto& row : cases) {
        EXPECT_EQ(-1, remove(row.szRequest, true)) << row.szRequest;
        EXPECT_EQ(refused(row.szError, statement(row.szTail)), takeLog());
        EXPECT_EQ(Lines{statement(row.szTail)}, takeStatements());
    }
    EXPECT_EQ("1Ann1,2Bob0,3O'Brien1", contents());
}

TEST_F(Delete, FailsOnATableThatIsGone)
{
    database_.run("drop table " + table_.strName);
    const std::string strError = "no such table: " + table_.strName;
    EXPECT_EQ(-1, remove(R"({"id":1})"));
    EXPECT_EQ(refused(strError, statement(" WHERE  (id=1 );")), takeLog());
    EXPECT_EQ(-1, table_.api.recDeleteAll());
    EXPECT_EQ(refused(strError, statement(";")), takeLog());
}

TEST_F(Delete, AConstraintKeepsEveryRowAndSetsNoMessage)
{
    database_.run("create trigger keep before delete on " + table_.strName +
                  " when old.id = 3 begin select raise(abort, 'UNIQUE constraint failed'); end");
    EXPECT_EQ(-1, table_.api.recDeleteAll());
    EXPECT_EQ(refused("UNIQUE constraint failed", statement(";")), takeLog());
    EXPECT_EQ("1Ann1,2Bob0,3O'Brien1", contents());
    // The words are those of a duplicate, but a delete tells the host nothing.
    EXPECT_EQ("", table_.api.getErrMsg());
}

TEST_F(Delete, RepeatsAnEarlierErrorTextUntilAStatementSucceeds)
{
    makeStale();
    EXPECT_EQ(-1, remove("null"));
    EXPECT_EQ((Lines{kNoObject, sqlError(kStale, "")}), takeLog());
    EXPECT_EQ(-1, remove(R"({"vornSqlWhereFilter":5})"));
    EXPECT_EQ((Lines{kFilterIsNoText, kNoConditions, sqlError(kStale, "")}), takeLog());
    EXPECT_EQ(-1, remove("{}"));
    EXPECT_EQ((Lines{failed("strSql.empty()"), sqlError(kStale, "")}), takeLog());
    EXPECT_EQ(0, remove(R"({"id":9})"));
    EXPECT_EQ(-1, remove("{}"));
    EXPECT_EQ(Lines{failed("strSql.empty()")}, takeLog());
}

TEST_F(Delete, SetsNoMessageBesideAnEarlierDuplicate)
{
    makeStaleDuplicate();
    EXPECT_EQ(-1, remove("{}"));
    EXPECT_EQ("", table_.api.getErrMsg());
}

TEST_F(Delete, WhatAnAccessorThrowsReachesTheHost)
{
    for (const char* szRequest : {R"({"flag":"x"})", R"({"flag":[{}]})", R"({"name":{}})",
                                  R"({"id":{}})", R"({"id":[[]],"name":[{}]})"}) {
        EXPECT_THROW(remove(szRequest, true), Json::LogicError) << szRequest;
        EXPECT_EQ(szRequest, text(jRequest_));
        EXPECT_EQ(Lines(), takeLog()) << szRequest;
        EXPECT_EQ(Lines(), takeStatements()) << szRequest;
    }
    EXPECT_EQ(1, remove(R"({"id":1})"));
    EXPECT_EQ("2Bob0,3O'Brien1", contents());
}

TEST_F(Delete, TracesTheNumberOfRows)
{
    for (const bool blStdout : {false, true}) {
        blDebugOutput = true;
        blLogToStdout = blStdout;
        database_.run("begin");
        EXPECT_EQ(0, remove(R"({"id":9})"));
        EXPECT_EQ(Lines{plain("delete rec number=0")}, takeLog());
        EXPECT_EQ(2, remove(R"({"flag":true})"));
        EXPECT_EQ(Lines{plain("delete rec number=2")}, takeLog());
        EXPECT_EQ(1, table_.api.recDeleteAll());
        EXPECT_EQ(Lines{plain("delete rec number=1")}, takeLog());
        // A failure has no such line.
        EXPECT_EQ(-1, remove("{}"));
        EXPECT_EQ(Lines{failed("strSql.empty()")}, takeLog());
        database_.run("rollback");
        blDebugOutput = false;
        EXPECT_EQ(0, remove(R"({"id":9})"));
        EXPECT_EQ(Lines(), takeLog());
    }
}

TEST_F(Delete, GivesTheCountThatSqliteReports)
{
    blDebugOutput = true;
    doubles::state().changes = [] { return 2147483647; };
    EXPECT_EQ(2147483647, remove(R"({"id":9})"));
    EXPECT_EQ(Lines{plain("delete rec number=2147483647")}, takeLog());
}

TEST_F(Delete, ANegativeCountIsAFailureAlthoughTheRowIsGone)
{
    doubles::state().changes = [] { return -7; };
    EXPECT_EQ(-1, remove(R"({"id":1})"));
    EXPECT_EQ(refused("Unknow Error!!", statement(" WHERE  (id=1 );")), takeLog());
    EXPECT_EQ("2Bob0,3O'Brien1", contents());
    EXPECT_EQ(-1, table_.api.recDeleteAll());
    EXPECT_EQ(refused("Unknow Error!!", statement(";")), takeLog());
    EXPECT_EQ("", contents());
}

TEST_F(Delete, WaitsForALock)
{
    lock(499);
    EXPECT_EQ(3, table_.api.recDeleteAll());
    EXPECT_EQ(Lines(500, statement(";")), takeStatements());
    EXPECT_EQ(499U, doubles::state().sleeps.size());
    EXPECT_EQ(Lines(), takeLog());
}

class DeleteLocked : public RecordsInFileTest {};

TEST_F(DeleteLocked, GivesUpAfterEveryAttempt)
{
    EXPECT_EQ(-1, table_.api.recDeleteAll());
    const std::string strSql = "DELETE FROM " + table_.strName + " ;";
    EXPECT_EQ((Lines{runFailed("database is locked", strSql, 500), kNotRun,
                     sqlError("database is locked", strSql)}),
              takeLog());
    expectEveryAttempt(strSql);
    other("commit");
    EXPECT_EQ("1Ann1,2Bob0,3O'Brien1", contents());
    EXPECT_EQ(3, table_.api.recDeleteAll());
}

}  // namespace
