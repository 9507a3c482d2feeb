// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// runSqlEx: results, callbacks, error texts and log lines, also while the database is locked.

#include "support/rows.h"

#include <algorithm>
#include <cerrno>
#include <utility>

namespace {

using doubles::state;

constexpr char kUnknown[] = "Unknow Error!!";
constexpr std::size_t kMaxAttempts = 500;

std::vector<unsigned> sleeps(std::size_t nTimes)
{
    return std::vector<unsigned>(nTimes, 10000U);
}

// Records the rows, and stops at the text "stop".
int collect(void* arg, int nColumns, char** values, char** names)
{
    auto& strRows = *static_cast<std::string*>(arg);
    for (int i = 0; i < nColumns; ++i)
        strRows.append(names[i]).append("=").append(values[i] ? values[i] : "NULL") += ';';
    return std::string::npos == strRows.find("stop") ? 0 : 1;
}

class Execution : public RunSqlTest {
protected:
    Execution() { database_.run(in("insert into $(a) values(1),(2),(3)")); }

    int run(const std::string& strSql) { return table_.api.runSqlEx(strSql); }

    // The text with the table's name.
    std::string in(std::string strSql) const
    {
        const std::size_t n = strSql.find('$');
        return std::string::npos == n ? strSql : in(strSql.replace(n, 1, table_.strName));
    }

    // Runs a text whose attempts end like these, the first nLocked of them as locked ones.
    void expectRun(const std::vector<End>& ends, std::size_t nLocked, int iResult)
    {
        const auto traced = [&ends](std::size_t i) {
            const char* szError = ends[std::min(i, ends.size() - 1)].szError;
            return szError ? szError : "(null)";
        };
        const std::size_t nAttempts = std::min(nLocked + 1, kMaxAttempts);
        const End last = ends[std::min(nAttempts, ends.size()) - 1];
        const std::string strError = last.szError ? last.szError : kUnknown;
        SCOPED_TRACE(std::to_string(last.iStatus) + " " + strError);
        const bool blDone = SQLITE_OK == last.iStatus;
        state().changes = [=] { return blDone ? iResult : 5; };
        const sqlite3_int64 iMemory = sqlite3_memory_used();
        for (bool blDebug : {false, true}) {
            Lines lines;
            for (std::size_t i = 0; blDebug && i < nLocked; ++i)
                lines.push_back(plain("retry, i=" + std::to_string(i) +
                                      ", errno=?, run sql failed, error=" + traced(i) +
                                      ", sql=a text"));
            if (0 > iResult) lines.push_back(runFailed(strError, "a text", nLocked));
            if (0 > iResult && blDebug)
                lines.push_back(plain(std::string("run sql fail, err=") + traced(nLocked)));

            blDebugOutput = blDebug;
            state().exec = execOfEnds(ends);
            state().sleeps.clear();
            EXPECT_EQ(iResult, run("a text"));
            for (const auto& record : state().log) EXPECT_EQ(last.iErrno, record.iErrno);
            EXPECT_EQ(lines, takeLog());
            EXPECT_EQ(Lines(nAttempts, "a text"), takeStatements());
            EXPECT_EQ(sleeps(nLocked), state().sleeps);
            EXPECT_EQ(0 > iResult ? strError : "", lastSqlError());
        }
        // With a callback no changes are counted.
        state().exec = execOfEnds(ends);
        EXPECT_EQ(blDone ? 0 : iResult, table_.api.runSqlEx("a text", collect));
        EXPECT_EQ(blDone ? "" : strError, lastSqlError());
        EXPECT_EQ(iMemory, sqlite3_memory_used());
        takeStatements();
    }
};

TEST_F(Execution, GivesTheNumberOfChangedRows)
{
    struct Case {
        const char* szSql;
        int iResult;
    };
    // In this order: what changes nothing itself leaves the count of the statement before.
    for (const Case& row : {Case{"update $ set a=a+1", 3},
                            {"select * from $", 3},
                            {"create table if not exists $ (a)", 3},
                            {"update $ set a=0 where a>100", 0},
                            {"insert into $(a) values(9)", 1},
                            {"update $ set a=1; delete from $ where a=7", 0},
                            {"delete from $ where a=7; update $ set a=1", 4},
                            {"update $ set a=2; select a from $; ", 4},
                            {"-- nothing at all", 4},
                            {"delete from $", 4}}) {
        EXPECT_EQ(row.iResult, run(in(row.szSql))) << row.szSql;
        EXPECT_EQ(Lines{in(row.szSql)}, takeStatements());
    }
    EXPECT_EQ(Lines(), takeLog());
}

TEST_F(Execution, HandsRowsToTheCallbackWithoutCountingChanges)
{
    struct Case {
        std::string strSql;
        std::string strRows;
        Lines lines;
    };
    state().changes = [] { return 5; };
    const std::string strStopped = "select 'stop' as x union all select 'more'";
    const std::string strBad = in("insert into $(a) values(8); no statement; delete from $");
    for (const Case& row : {Case{"select a from $", "a=1;a=2;a=3;", {}},
                            {"select 1 as x, null as y; select 'z' as z", "x=1;y=NULL;z=z;", {}},
                            {"select a from $ where a=7", "", {}},
                            {"update $ set a=a+1", "", {}},
                            {";", "", {}},
                            {strStopped, "x=stop;", {runFailed("query aborted", strStopped)}},
                            {strBad, "", {runFailed("near \"no\": syntax error", strBad)}}}) {
        std::string strRows;
        const std::string strSql = in(row.strSql);
        EXPECT_EQ(row.lines.empty() ? 0 : -1, table_.api.runSqlEx(strSql, collect, &strRows));
        EXPECT_EQ(row.strRows, strRows);
        EXPECT_EQ(row.lines, takeLog());
        EXPECT_EQ(Lines{strSql}, takeStatements());
    }
    // What was written before the bad statement stays.
    EXPECT_EQ("4", database_.value(in("select count(*) from $")));
}

TEST_F(Execution, PassesCallbackAndArgumentUnchanged)
{
    std::string strRows;
    for (doubles::RowCallback passed : {doubles::RowCallback(collect), doubles::RowCallback()})
        for (void* passedArg : {static_cast<void*>(&strRows), static_cast<void*>(nullptr)}) {
            state().exec = [&](sqlite3*, const char*, doubles::RowCallback callback, void* arg,
                               char**) {
                EXPECT_EQ(passed, callback);
                EXPECT_EQ(passedArg, arg);
                return SQLITE_OK;
            };
            table_.api.runSqlEx("any text", passed, passedArg);
            EXPECT_EQ(Lines{"any text"}, takeStatements());
        }
}

TEST_F(Execution, ReportsAnEmptyTextWithoutRunningIt)
{
    for (bool blDebug : {false, true}) {
        EXPECT_EQ(-1, run("no statement"));
        takeLog();
        EXPECT_EQ(Lines{"no statement"}, takeStatements());
        blDebugOutput = blDebug;
        errno = EACCES;
        EXPECT_EQ(-1, table_.api.runSqlEx("", blDebug ? collect : nullptr));
        EXPECT_EQ(EACCES, state().log.at(1).iErrno);
        Lines lines = {failed("0 >= strSql.length()"), runFailed(kUnknown, "")};
        if (blDebug) lines.push_back(plain("run sql fail, err=(null)"));
        EXPECT_EQ(lines, takeLog());
        EXPECT_EQ(Lines(), takeStatements());
        EXPECT_EQ(kUnknown, lastSqlError());
    }
}

TEST_F(Execution, ReportsAFailureOnce)
{
    for (int iStatus : {SQLITE_ERROR, SQLITE_BUSY, SQLITE_LOCKED, -1})
        for (const char* szError :
             {static_cast<const char*>(nullptr), "some error", "", "Database is locked",
              "database table is locked", "database is  locked", "database is locke", "%n%s%d"})
            expectRun({{iStatus, szError}}, 0, -1);
    for (int iErrno : {EINTR, EBUSY, ENOLCK}) expectRun({{SQLITE_ERROR, nullptr, iErrno}}, 0, -1);
}

TEST_F(Execution, SucceedsUnlessTheCountIsNegative)
{
    for (int iCount : {2, -1, -7})
        for (const char* szError :
             {static_cast<const char*>(nullptr), "UNIQUE constraint failed", "database is locked"})
            expectRun({{SQLITE_OK, szError, EAGAIN}}, 0, iCount);
}

class Retry : public Execution {};

TEST_F(Retry, EndsWithTheFirstAttemptThatIsNotLocked)
{
    for (std::size_t nLocked : {1U, 2U, 3U, 499U})
        for (const End& last : {End{SQLITE_OK}, {SQLITE_ERROR, "disk I/O error"}, {SQLITE_ERROR}}) {
            std::vector<End> ends(nLocked, End{SQLITE_BUSY, "database is locked"});
            ends.push_back(last);
            expectRun(ends, nLocked, SQLITE_OK == last.iStatus ? 4 : -1);
        }
}

TEST_F(Retry, LooksForTheWordsAnywhereInTheText)
{
    for (const char* szError :
         {"database is locked", "error: database is locked", "database is locked (5)",
          "database is locked: UNIQUE constraint failed"})
        expectRun({{SQLITE_ERROR, szError}}, kMaxAttempts, -1);
}

TEST_F(Retry, TreatsTheErrnoOfALockAsALock)
{
    expectRun({{SQLITE_ERROR, nullptr, EAGAIN}}, kMaxAttempts, -1);
    expectRun({{SQLITE_ERROR, "disk I/O error", EAGAIN}}, kMaxAttempts, -1);
}

// Errno, and what the handle holds while an attempt runs, read by a save on the same handle.
TEST_F(Retry, ClearsErrnoAndHoldsTheTextOfTheLastLockedAttempt)
{
    EXPECT_EQ(-1, run("no statement"));
    EXPECT_EQ("near \"no\": syntax error", lastSqlError());
    Lines found;
    doubles::Exec exec = execOfEnds({{SQLITE_BUSY, "database is locked 1", ENOENT},
                                     {SQLITE_BUSY, "database is locked 2"},
                                     {SQLITE_BUSY, nullptr, EAGAIN},
                                     {SQLITE_OK}});
    state().exec = [&](sqlite3* pDb, const char* szSql, doubles::RowCallback callback, void* arg,
                       char** errText) {
        found.push_back(std::to_string(errno) + " ");
        found.back() += lastSqlError();
        return exec(pDb, szSql, callback, arg, errText);
    };
    state().onSleep = [] { errno = EAGAIN; };
    errno = EAGAIN;
    EXPECT_EQ(0, table_.api.runSqlEx("a text", collect));
    EXPECT_EQ(
        (Lines{"0 ", "0 database is locked 1", "0 database is locked 2", "0 database is locked 2"}),
        found);
    EXPECT_EQ("", lastSqlError());
}

TEST_F(Retry, RunsTheWholeTextAgain)
{
    std::string strRows;
    state().exec = execCalledLocked(1);
    EXPECT_EQ(0, table_.api.runSqlEx(in("insert into $(a) values(8); select 1 as x; select 2 as y"),
                                     collect, &strRows));
    EXPECT_EQ("x=1;y=2;x=1;y=2;", strRows);
    EXPECT_EQ("2", database_.value(in("select count(*) from $ where a=8")));
}

TEST_F(Retry, WaitsForAnotherConnection)
{
    Database file(Database::Place::kFile);
    Database other(file.path());
    Table table(file, R"({"a":{"cpptype":"int"}})", "a");
    other.run("begin exclusive");
    state().onSleep = [&other] {
        if (kMaxAttempts + 100 == state().sleeps.size()) other.run("commit");
    };
    const std::string strSql = "delete from " + table.strName;
    EXPECT_EQ(-1, table.api.runSqlEx(strSql));
    EXPECT_EQ(sleeps(kMaxAttempts), state().sleeps);
    EXPECT_EQ(Lines{runFailed("database is locked", strSql, kMaxAttempts)}, takeLog());
    EXPECT_EQ(R"({"a":5})", text(table.create(R"({"a":5})")));
    EXPECT_EQ(sleeps(kMaxAttempts + 100), state().sleeps);
    EXPECT_EQ(kMaxAttempts + 101, takeStatements().size());
    EXPECT_EQ(Lines(), takeLog());
    EXPECT_EQ("5", file.value("select a from " + table.strName));
}

}  // namespace
