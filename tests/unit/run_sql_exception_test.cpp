// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// What is thrown in the library's row callback passes SQLite and reaches the host.

#include "support/rows.h"

#include <cerrno>
#include <new>
#include <thread>
#include <utility>

namespace {

using doubles::state;

class CallbackException : public RunSqlTest {
protected:
    CallbackException()
    {
        database_.run("insert into " + table_.strName +
                      "(a,s) values(1,'a text that is not short'),(2,'b')");
    }

    // The n-th allocation in the row callback fails from now on; SQLite has its own allocator.
    static void failAllocation(int n)
    {
        state().exec = [n](sqlite3* pDb, const char* szSql, doubles::RowCallback callback,
                           void* arg, char** errText) {
            state().iFailNew = n;
            const int iStatus = doubles::realExec(pDb, szSql, callback, arg, errText);
            state().iFailNew = 0;
            return iStatus;
        };
    }

    int select() { return table_.api.runSqlEx(strSelect_, callback_, &rows_); }

    // No statement is open, no mutex held, no error line written, and the text ran that often.
    void expectCalm(std::size_t nAttempts = 1)
    {
        EXPECT_EQ(Lines(), takeLog());
        EXPECT_EQ(nAttempts, takeStatements().size());
        EXPECT_EQ(nAttempts - 1, state().sleeps.size());
        EXPECT_EQ(nullptr, sqlite3_next_stmt(database_.get(), nullptr));
        std::thread([this] {
            sqlite3_mutex* pMutex = sqlite3_db_mutex(database_.get());
            const int iTried = sqlite3_mutex_try(pMutex);
            EXPECT_EQ(SQLITE_OK, iTried);
            if (SQLITE_OK == iTried) sqlite3_mutex_leave(pMutex);
        }).join();
    }

    // The next statement is not affected by what was thrown before.
    void expectSound(const std::string& strRows)
    {
        state().exec = nullptr;
        rows_ = Json::nullValue;
        EXPECT_EQ(0, select());
        EXPECT_EQ(strRows, text(rows_));
        EXPECT_EQ("", lastSqlError());
        takeStatements();
    }

    static constexpr char kRows[] = R"([{"a":1,"s":"a text that is not short"},{"a":2,"s":"b"}])";

    doubles::RowCallback callback_ = rowCallback(table_);
    std::string strSelect_ = "select a, s from " + table_.strName;
    Json::Value rows_;
};

// Even the reader of JSON text runs out of memory.
TEST_F(CallbackException, FromAnyAllocationReachesTheHost)
{
    using Case = std::pair<std::string, const char*>;
    for (const auto& [strSelect, szRows] :
         {Case{strSelect_, kRows},
          {"select '{\"key\":[1,2,{}]}' as Unsavable", R"([{"Unsavable":{"key":[1,2,{}]}}])"}}) {
        strSelect_ = strSelect;
        const Json::Value jRows = json(szRows);
        for (int n = 1;; ++n) {
            SCOPED_TRACE(n);
            EXPECT_EQ(-1, table_.api.runSqlEx("no statement"));
            takeLog();
            takeStatements();
            rows_ = Json::nullValue;
            failAllocation(n);
            try {
                EXPECT_EQ(0, select());
                EXPECT_LT(5, n);
                break;
            } catch (const std::bad_alloc&) {
                // The statement stopped at its row.
                EXPECT_GT(jRows.size(), rows_.size());
                for (Json::ArrayIndex i = 0; i < rows_.size(); ++i) EXPECT_EQ(jRows[i], rows_[i]);
            }
            expectCalm();
            EXPECT_EQ("query aborted", lastSqlError());
            expectSound(szRows);
        }
        expectSound(szRows);
    }
}

TEST_F(CallbackException, LeavesTheRecordOfASaveAlone)
{
    failAllocation(1);
    Json::Value jRecord = json(R"({"a":3,"s":"c"})");
    EXPECT_THROW(table_.api.recSave(jRecord, true), std::bad_alloc);
    EXPECT_EQ(json(R"({"a":3,"s":"c"})"), jRecord);
    expectCalm();
    Json::Value jOut = "before";
    jRecord["a"] = 4;
    EXPECT_THROW(table_.api.recCreate(jRecord, jOut), std::bad_alloc);
    EXPECT_EQ(json(R"({"a":4,"s":"c"})"), jRecord);
    EXPECT_EQ("before", jOut.asString());
    EXPECT_EQ("", table_.api.getErrMsg());
    expectCalm();
    EXPECT_EQ("4", database_.value("select count(*) from " + table_.strName));
}

TEST_F(CallbackException, IsNeitherRetriedNorLoggedHoweverTheStatementEnds)
{
    for (const End& end : {End{SQLITE_ABORT, "query aborted"},
                           {SQLITE_BUSY, "database is locked"},
                           {SQLITE_ABORT, nullptr, EAGAIN},
                           {SQLITE_OK, "a warning"},
                           {SQLITE_OK}})
        for (std::size_t nLocked : {0U, 2U}) {
            state().sleeps.clear();
            // Retried attempts are logged for debugging.
            blDebugOutput = 0 == nLocked;
            const sqlite3_int64 before = sqlite3_memory_used();
            state().exec = [&](sqlite3*, const char*, doubles::RowCallback callback, void* arg,
                               char** errText) {
                if (nLocked > state().sleeps.size())
                    return End{SQLITE_BUSY, "database is locked"}.leaveIn(errText);
                Row row = {{"a"}, {"1"}};
                state().iFailNew = 1;
                EXPECT_EQ(-1, row.handTo(callback, arg));
                state().iFailNew = 0;
                return end.leaveIn(errText);
            };
            EXPECT_THROW(select(), std::bad_alloc);
            expectCalm(nLocked + 1);
            EXPECT_EQ(before, sqlite3_memory_used());
            EXPECT_EQ(end.szError ? end.szError : "Unknow Error!!", lastSqlError());
        }
    expectSound(kRows);
}

}  // namespace
