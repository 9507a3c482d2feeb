// SPDX-License-Identifier: MIT
// runSqlEx: results, error texts, log lines and callbacks. Waiting stands in retry_test.cpp.

#include "support/rows.h"

#include <cerrno>

namespace {

using doubles::state;

class Execution : public TableTest {
protected:
    Execution() { database_.run("insert into " + table_.strName + " values(1),(2),(3)"); }

    int run(const std::string& strSql) { return table_.api.runSqlEx(strSql); }

    std::string in(std::string strSql) const
    {
        const std::size_t n = strSql.find('$');
        return std::string::npos == n ? strSql : in(strSql.replace(n, 1, table_.strName));
    }

    Table table_{database_, std::string(R"({"a":{"cpptype":"int"},)") + kUnsavable + "}", "a"};
};

// The failure line of a statement that was not retried.
std::string failureLine(const std::string& strError, const std::string& strSql)
{
    return plain("i=0,errno=?, run sql failed, error=" + strError + ", sql=" + strSql);
}

struct Counted {
    const char* szSql;
    int iResult;
};

TEST_F(Execution, GivesTheNumberOfChangedRows)
{
    // In this order: what changes nothing itself leaves the count of the statement before.
    for (const Counted& row : {Counted{"update $ set a=a+1", 3},
                               {"select * from $", 3},
                               {"create table if not exists $ (a)", 3},
                               {"update $ set a=0 where a>100", 0},
                               {"insert into $ values(9)", 1},
                               {"update $ set a=1; delete from $ where a=7", 0},
                               {"delete from $ where a=7; update $ set a=1", 4},
                               {"update $ set a=2; select a from $; ", 4},
                               {"-- nothing at all", 4},
                               {"delete from $", 4}}) {
        EXPECT_EQ(row.iResult, run(in(row.szSql))) << row.szSql;
        EXPECT_EQ(std::vector<std::string>{in(row.szSql)}, takeStatements());
    }
    EXPECT_EQ(Lines(), takeLog());
}

int countRow(void* arg, int, char**, char**)
{
    ++*static_cast<int*>(arg);
    return 0;
}

TEST_F(Execution, GivesZeroWithACallbackWhateverTheRows)
{
    int iRows = 0;
    bool blAsked = false;
    state().changes = [&] {
        blAsked = true;
        return 5;
    };
    EXPECT_EQ(0, table_.api.runSqlEx(in("select * from $"), countRow, &iRows));
    EXPECT_EQ(3, iRows);
    EXPECT_EQ(0, table_.api.runSqlEx(in("select * from $ where a=7"), countRow, &iRows));
    EXPECT_EQ(0, table_.api.runSqlEx(in("update $ set a=1"), countRow, &iRows));
    EXPECT_EQ(3, iRows);
    EXPECT_FALSE(blAsked);
    EXPECT_EQ(Lines(), takeLog());
}

int collectNames(void* arg, int nColumns, char** values, char** names)
{
    auto& strOut = *static_cast<std::string*>(arg);
    for (int i = 0; i < nColumns; ++i)
        strOut.append(names[i]).append("=").append(values[i] ? values[i] : "NULL").append(";");
    return 0;
}

TEST_F(Execution, HandsTheRowsOfAllStatementsToTheHost)
{
    std::string strRows;
    EXPECT_EQ(0, table_.api.runSqlEx("select 1 as x, null as y; select 'z' as z", collectNames,
                                     &strRows));
    EXPECT_EQ("x=1;y=NULL;z=z;", strRows);
}

TEST_F(Execution, PassesCallbackAndArgumentUnchanged)
{
    int iArgument = 0;
    struct Passed {
        doubles::RowCallback callback;
        void* arg;
    };
    for (const Passed& passed : {Passed{countRow, &iArgument},
                                 {countRow, nullptr},
                                 {nullptr, &iArgument},
                                 {nullptr, nullptr}}) {
        int iCalls = 0;
        state().exec = [&](sqlite3* pDb, const char* szSql, doubles::RowCallback callback,
                           void* arg, char** errText) {
            ++iCalls;
            EXPECT_EQ(database_.get(), pDb);
            EXPECT_STREQ("any text", szSql);
            EXPECT_EQ(passed.callback, callback);
            EXPECT_EQ(passed.arg, arg);
            EXPECT_NE(nullptr, errText);
            EXPECT_EQ(nullptr, *errText);
            return SQLITE_OK;
        };
        table_.api.runSqlEx("any text", passed.callback, passed.arg);
        EXPECT_EQ(1, iCalls);
    }
    EXPECT_EQ(0, iArgument);
}

TEST_F(Execution, StopsWhereTheCallbackOfTheHostStops)
{
    const auto stop = [](void* arg, int, char**, char**) {
        ++*static_cast<int*>(arg);
        return 1;
    };
    int iRows = 0;
    const std::string strSql = in("select * from $");
    EXPECT_EQ(-1, table_.api.runSqlEx(strSql, stop, &iRows));
    EXPECT_EQ(1, iRows);
    EXPECT_EQ(Lines{failureLine("query aborted", strSql)}, takeLog());
}

TEST_F(Execution, ReportsAnEmptyTextWithoutRunningIt)
{
    EXPECT_EQ(-1, run(""));
    EXPECT_EQ((Lines{failed("0 >= strSql.length()"), failureLine("Unknow Error!!", "")}),
              takeLog());
    EXPECT_EQ(std::vector<std::string>(), takeStatements());
    EXPECT_EQ("Unknow Error!!", lastSqlError(table_));
    int iRows = 0;
    blDebugOutput = true;
    EXPECT_EQ(-1, table_.api.runSqlEx("", countRow, &iRows));
    EXPECT_EQ((Lines{failed("0 >= strSql.length()"), failureLine("Unknow Error!!", ""),
                     plain("run sql fail, err=(null)")}),
              takeLog());
}

TEST_F(Execution, ShowsTheErrnoItFoundForAnEmptyText)
{
    errno = EACCES;
    EXPECT_EQ(-1, run(""));
    ASSERT_EQ(2U, state().log.size());
    EXPECT_NE(std::string::npos, state().log[1].strText.find("i=0,errno=13, run sql failed"));
}

struct Failure {
    int iStatus;
    const char* szError;
    const char* szShown;
};

TEST_F(Execution, ReportsAFailureOnce)
{
    for (const Failure& row :
         {Failure{SQLITE_ERROR, "some error", "some error"},
          {SQLITE_ERROR, nullptr, "Unknow Error!!"},
          {SQLITE_BUSY, nullptr, "Unknow Error!!"},
          {SQLITE_ERROR, "", ""},
          {SQLITE_BUSY, "Database is locked", "Database is locked"},
          {SQLITE_LOCKED, "database table is locked", "database table is locked"},
          {-1, "database is  locked", "database is  locked"},
          {SQLITE_BUSY, "database is locke", "database is locke"},
          {SQLITE_ERROR, "%n%s%d", "%n%s%d"}}) {
        for (bool blDebug : {false, true}) {
            SCOPED_TRACE(row.szShown);
            blDebugOutput = blDebug;
            state().exec = execOfStatus(row.iStatus, row.szError);
            EXPECT_EQ(-1, run("a text"));
            Lines lines = {failureLine(row.szShown, "a text")};
            if (blDebug)
                lines.push_back(plain(std::string("run sql fail, err=") +
                                      (row.szError ? row.szError : "(null)")));
            EXPECT_EQ(lines, takeLog());
            EXPECT_EQ(1U, takeStatements().size());
            EXPECT_EQ(row.szShown, lastSqlError(table_));
        }
    }
    EXPECT_TRUE(state().sleeps.empty());
}

TEST_F(Execution, RunsATextOfOneCharacter)
{
    EXPECT_EQ(0, table_.api.runSqlEx(";", countRow, nullptr));
    EXPECT_EQ(std::vector<std::string>{";"}, takeStatements());
    EXPECT_EQ(Lines(), takeLog());
}

TEST_F(Execution, ReportsTheNearestNegativeCount)
{
    state().changes = [] { return -1; };
    state().exec = execOfStatus(SQLITE_OK, nullptr);
    EXPECT_EQ(-1, run("a text"));
    EXPECT_EQ(Lines{failureLine("Unknow Error!!", "a text")}, takeLog());
}

TEST_F(Execution, ReportsANegativeCount)
{
    state().changes = [] { return -7; };
    for (const char* szError : {static_cast<const char*>(nullptr), "a warning"}) {
        state().exec = execOfStatus(SQLITE_OK, szError);
        const std::string strShown = szError ? szError : "Unknow Error!!";
        EXPECT_EQ(-7, run("a text"));
        EXPECT_EQ(Lines{failureLine(strShown, "a text")}, takeLog());
        EXPECT_EQ(strShown, lastSqlError(table_));
        // With a callback nobody counts.
        EXPECT_EQ(0, table_.api.runSqlEx("a text", countRow, nullptr));
        EXPECT_EQ("", lastSqlError(table_));
    }
    state().exec = [](sqlite3*, const char*, doubles::RowCallback, void*, char** errText) {
        *errText = doubles::errorText("database is locked");
        errno = EAGAIN;
        return SQLITE_OK;
    };
    EXPECT_EQ(-7, run("a text"));
    EXPECT_TRUE(state().sleeps.empty());
}

TEST_F(Execution, ForgetsTheErrorTextOfASuccess)
{
    state().exec = execOfStatus(SQLITE_OK, "UNIQUE constraint failed: a warning");
    state().changes = [] { return 2; };
    EXPECT_EQ(2, run("a text"));
    EXPECT_EQ("", lastSqlError(table_));
    EXPECT_EQ(0, table_.api.runSqlEx("a text", countRow, nullptr));
    EXPECT_EQ("", lastSqlError(table_));
    EXPECT_EQ(Lines(), takeLog());
}

// What the handle holds while a statement runs, read by a save on the same handle.
TEST_F(Execution, ForgetsTheLastErrorBeforeItRuns)
{
    EXPECT_EQ(-1, run("no statement"));
    EXPECT_EQ("near \"no\": syntax error", lastSqlError(table_));
    std::string strDuring = "never read";
    state().exec = [&](sqlite3*, const char*, doubles::RowCallback, void*, char**) {
        strDuring = lastSqlError(table_);
        return SQLITE_OK;
    };
    EXPECT_EQ(0, table_.api.runSqlEx("a text", countRow, nullptr));
    EXPECT_EQ("", strDuring);
    EXPECT_EQ("", lastSqlError(table_));
}

TEST_F(Execution, HoldsAnUnknownErrorAfterAnEmptyText)
{
    EXPECT_EQ(-1, run("no statement"));
    EXPECT_EQ(-1, run(""));
    EXPECT_EQ("Unknow Error!!", lastSqlError(table_));
}

TEST_F(Execution, RunsTheStatementsBeforeABadOne)
{
    const std::string strSql = in("insert into $ values(8); no statement; delete from $");
    EXPECT_EQ(-1, run(strSql));
    EXPECT_EQ(Lines{failureLine("near \"no\": syntax error", strSql)}, takeLog());
    EXPECT_EQ("4", database_.value(in("select count(*) from $")));
}

TEST_F(Execution, ReleasesEveryErrorText)
{
    const sqlite3_int64 before = sqlite3_memory_used();
    for (int iStatus : {SQLITE_OK, SQLITE_ERROR}) {
        state().exec = execOfStatus(iStatus, "an error text that takes memory");
        run("a text");
        table_.api.runSqlEx("a text", countRow, nullptr);
    }
    state().changes = [] { return -1; };
    state().exec = execOfStatus(SQLITE_OK, "an error text that takes memory");
    run("a text");
    state().exec = execOfStatus(SQLITE_BUSY, "database is locked");
    run("a text");
    state().exec = nullptr;
    EXPECT_EQ(before, sqlite3_memory_used());
}

}  // namespace
