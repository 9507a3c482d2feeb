// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// docs/limits.md: locks, what waiting costs, what a retry does, and what a cancelled thread leaves.

#include "docs/limits_page.h"
#include "support/stack.h"

#include <pthread.h>
#include <cerrno>
#include <thread>
#include <utility>

namespace {

using doubles::state;

// Runs SQL past the doubles and returns the result.
int run(Database& connection, const std::string& strSql)
{
    return doubles::realExec(connection.get(), strSql.c_str(), nullptr, nullptr, nullptr);
}

// How often the library has waited since the last call.
std::size_t waits()
{
    const auto sleeps = std::exchange(state().sleeps, {});
    EXPECT_EQ(std::vector<unsigned>(sleeps.size(), 10000), sleeps);
    return sleeps.size();
}

// Between the INSERT of the first attempt and the SELECT that reads the row back, the other
// connection locks the database until the second attempt.
struct LockBetween {
    explicit LockBetween(Database& other)
    {
        state().exec = [&](sqlite3* pDb, const char* szSql, doubles::RowCallback callback,
                           void* arg, char** errText) {
            const std::string strSql = szSql;
            std::size_t nSelect = strSql.find(";select") + 1;
            if (0 != nSelect && 0 == iAttempts++) {
                EXPECT_EQ(SQLITE_OK, doubles::realExec(pDb, strSql.substr(0, nSelect).c_str(),
                                                       nullptr, nullptr, nullptr));
                iLocked = run(other, "begin exclusive");
            } else {
                run(other, "rollback");
                nSelect = 0;
            }
            return doubles::realExec(pDb, szSql + nSelect, callback, arg, errText);
        };
    }

    int iAttempts = 0;
    int iLocked = SQLITE_OK;  // the result of the other connection's lock
};

}  // namespace

TEST_F(Limits, LockedCallBlocks)
{
    Database other(database_.path());
    EXPECT_EQ(SQLITE_OK, run(other, "begin exclusive"));
    EXPECT_EQ("-1", listed(api_));
    EXPECT_EQ(500U, waits());

    // The host's own attempt returns at once, and the calls after it do not wait.
    const std::string strBegin = example(0, "sql");
    EXPECT_EQ(SQLITE_BUSY, run(database_, strBegin));
    EXPECT_EQ(SQLITE_OK, run(other, "rollback"));
    EXPECT_EQ(SQLITE_OK, run(database_, strBegin));
    EXPECT_EQ(SQLITE_BUSY, run(other, "begin exclusive"));
    table_.create(R"({"id":1,"text":"x"})");
    EXPECT_LE(0, api_.runSqlEx("commit"));
    EXPECT_EQ(0U, waits());
}

TEST_F(Limits, RetryRunsTheWholeTextAgain)
{
    Database other(database_.path());
    LockBetween first(other);
    EXPECT_NE("-1", saved(api_, example()));
    EXPECT_EQ(2, first.iAttempts);
    EXPECT_EQ("12", ids());

    LockBetween second(other);
    EXPECT_LE(0, api_.runSqlEx(example(0, "sql")));
    EXPECT_NE("-1", saved(api_, example()));
    EXPECT_LE(0, api_.runSqlEx("commit"));
    EXPECT_EQ(SQLITE_BUSY, second.iLocked);
    EXPECT_EQ("123", ids());
}

TEST_F(Limits, DuplicateMayBeYourOwnRecord)
{
    Database other(database_.path());
    LockBetween first(other);
    EXPECT_EQ("-1", created(api_, example()));
    EXPECT_EQ(2, first.iAttempts);
    EXPECT_EQ("DUPLICATE_PRIMARY_KEY", api_.getErrMsg());
    EXPECT_EQ(0U, takeLog().at(0).find(plain("i=1,errno=")));
    const std::string strRecord = stored(1);

    database_.run("delete from " + table_.strName);
    LockBetween second(other);
    EXPECT_LE(0, api_.runSqlEx(example(0, "sql")));
    EXPECT_EQ(strRecord, created(api_, example()));
    EXPECT_LE(0, api_.runSqlEx("commit"));
    EXPECT_EQ(SQLITE_BUSY, second.iLocked);
}

TEST_F(Limits, WhatWaitingCosts)
{
    Database other(database_.path());
    sqlite3* pDb = database_.get();
    EXPECT_EQ(SQLITE_OK, run(other, "begin exclusive"));

    // A signal that ends each sleep does not change their number.
    state().onSleep = [] { errno = EINTR; };
    EXPECT_EQ("-1", listed(api_));
    EXPECT_EQ(500U, waits());

    // A constructor waits, although the table exists.
    VornJsonDbApi second(pDb, table_.strName, table_.jDefinition, table_.strCreate);
    EXPECT_EQ(500U, waits());

    // One interrupt between two attempts does nothing, unless a statement is running. It lasts
    // until that statement is reset.
    state().onSleep = [pDb] {
        if (3 == state().sleeps.size()) sqlite3_interrupt(pDb);
    };
    EXPECT_EQ("-1", listed(api_));
    EXPECT_EQ(500U, waits());
#include "limits/WhatWaitingCosts.inc"
    for (std::size_t nWaits : {3U, 0U}) {
        takeLog();
        EXPECT_EQ("-1", listed(api_));
        EXPECT_EQ(nWaits, waits());
        EXPECT_NE(std::string::npos, takeLog().at(0).find("error=interrupted"));
    }
    sqlite3_reset(pRunning);
    sqlite3_finalize(pRunning);
    state().onSleep = nullptr;
    EXPECT_EQ(SQLITE_OK, run(other, "rollback"));

    // In a transaction that began as a writer nothing waits after a read.
    EXPECT_EQ("wal", database_.value("pragma journal_mode=wal"));
    const std::string strOther = "insert into " + table_.strName + " (text) values ('other')";
    for (const std::string& strBegin : {std::string("begin"), example(0, "sql")}) {
        const bool blWriter = "begin" != strBegin;
        EXPECT_LE(0, api_.runSqlEx(strBegin));
        EXPECT_NE("-1", ids());
        EXPECT_EQ(blWriter ? SQLITE_BUSY : SQLITE_OK, run(other, strOther));
        EXPECT_EQ(blWriter, "-1" != created(api_, R"({"text":"x"})"));
        EXPECT_EQ(blWriter ? 0U : 500U, waits());
        EXPECT_LE(0, api_.runSqlEx("rollback"));
    }
}

TEST_F(Limits, CancelledThreads)
{
    // Never closed: with its mutex locked that would wait forever.
    static auto& database = *new Database;
    static auto& table = *new Table(database, R"({"id":{"cpptype":"int"}})", "id int");
    table.create(R"({"id":1})");
    const auto cancel = [](sqlite3_context* pContext, int, sqlite3_value**) {
        pthread_cancel(pthread_self());
        pthread_testcancel();
        sqlite3_result_int(pContext, 1);
    };
    EXPECT_EQ(SQLITE_OK, sqlite3_create_function(database.get(), "cancel", 0, SQLITE_UTF8, nullptr,
                                                 cancel, nullptr, nullptr));
    std::thread([&task = table.api] {
        Json::Value jRequest = json(R"x({"vornSqlWhereFilter":"cancel()"})x");
        Json::Value jRecords;
#include "limits/CancelledThreads.inc"
        EXPECT_EQ(R"([{"id":1}])", text(jRecords));
        pthread_testcancel();
        ADD_FAILURE() << "it was not cancelled";
    }).join();
    EXPECT_EQ(R"([{"id":1}])", listed(table.api));

    if (VORN_SANITIZED) GTEST_SKIP() << "a sanitizer cannot follow a thread out of SQLite";
    std::thread([] { table.api.runSqlEx("select cancel()"); }).join();
    EXPECT_EQ(SQLITE_BUSY, sqlite3_mutex_try(sqlite3_db_mutex(database.get())));
}
