// SPDX-License-Identifier: MIT
// What is thrown in the library's row callback passes SQLite and reaches the host.

#include "support/rows.h"

#include <cerrno>
#include <new>
#include <thread>

namespace {

using doubles::state;

// What SQLite calls instead of the library's callback: lets the n-th allocation in it fail.
struct FailingMemory {
    doubles::RowCallback callback;
    void* arg;
    int iFailNew;
    int iCalls;
};

int callWithoutMemory(void* arg, int nColumns, char** values, char** names)
{
    auto& memory = *static_cast<FailingMemory*>(arg);
    ++memory.iCalls;
    state().iFailNew = memory.iFailNew;
    const int iResult = memory.callback(memory.arg, nColumns, values, names);
    state().iFailNew = 0;
    return iResult;
}

class CallbackException : public TableTest {
protected:
    CallbackException()
    {
        database_.run("insert into " + table_.strName +
                      "(a,s) values(1,'a text that is not short')");
        database_.run("insert into " + table_.strName + "(a,s) values(2,'b')");
    }

    // The n-th allocation in each call of the row callback fails from now on.
    void failAllocation(int n)
    {
        iCallbacks_ = 0;
        state().exec = [this, n](sqlite3* pDb, const char* szSql, doubles::RowCallback callback,
                                 void* arg, char** errText) {
            FailingMemory memory = {callback, arg, n, 0};
            const int iStatus = doubles::realExec(pDb, szSql, callWithoutMemory, &memory, errText);
            iCallbacks_ += memory.iCalls;
            return iStatus;
        };
    }

    int select() { return table_.api.runSqlEx(strSelect_, callback_, &rows_); }

    // No statement is open, no mutex held, no error line was written, the text ran once.
    void expectCalm()
    {
        EXPECT_EQ(Lines(), takeLog());
        EXPECT_EQ(1U, takeStatements().size());
        EXPECT_TRUE(state().sleeps.empty());
        EXPECT_EQ(nullptr, sqlite3_next_stmt(database_.get(), nullptr));
        int iTried = SQLITE_BUSY;
        std::thread other([&] {
            sqlite3_mutex* pMutex = sqlite3_db_mutex(database_.get());
            iTried = sqlite3_mutex_try(pMutex);
            if (SQLITE_OK == iTried) sqlite3_mutex_leave(pMutex);
        });
        other.join();
        EXPECT_EQ(SQLITE_OK, iTried);
    }

    // The next statement is not touched by what was thrown before.
    void expectSound()
    {
        state().exec = nullptr;
        rows_ = Json::nullValue;
        EXPECT_EQ(0, select());
        EXPECT_EQ(R"([{"a":1,"s":"a text that is not short"},{"a":2,"s":"b"}])", text(rows_));
        EXPECT_EQ("", lastSqlError(table_));
        takeStatements();
    }

    Table table_{
        database_,
        std::string(R"({"a":{"cpptype":"int"},"s":{"cpptype":"string"},)") + kUnsavable + "}",
        "a int primary key, s text"};
    doubles::RowCallback callback_ = rowCallback(table_);
    std::string strSelect_ = "select a, s from " + table_.strName;
    Json::Value rows_;
    int iCallbacks_ = 0;
};

TEST_F(CallbackException, OfMemoryReachesTheHostFromEveryAllocation)
{
    int nThrown = 0;
    for (int n = 1;; ++n) {
        SCOPED_TRACE(n);
        rows_ = Json::nullValue;
        failAllocation(n);
        bool blThrown = false;
        try {
            EXPECT_EQ(0, select());
        } catch (const std::bad_alloc&) {
            blThrown = true;
        }
        if (!blThrown) break;
        ++nThrown;
        EXPECT_GE(2, iCallbacks_);
        EXPECT_GE(1U, rows_.size());
        expectCalm();
        EXPECT_EQ("query aborted", lastSqlError(table_));
        expectSound();
    }
    EXPECT_LE(3, nThrown);
}

TEST_F(CallbackException, StopsTheStatementAtItsRow)
{
    failAllocation(1);
    EXPECT_THROW(select(), std::bad_alloc);
    EXPECT_EQ(1, iCallbacks_);
    EXPECT_TRUE(rows_.isNull());
    expectCalm();
}

TEST_F(CallbackException, OfMemoryLeavesTheRecordOfASaveAlone)
{
    failAllocation(1);
    Json::Value jRecord = json(R"({"a":3,"s":"c"})");
    EXPECT_THROW(table_.api.recSave(jRecord, true), std::bad_alloc);
    EXPECT_EQ(json(R"({"a":3,"s":"c"})"), jRecord);
    expectCalm();
    Json::Value jOut = "before";
    jRecord["a"] = 4;
    failAllocation(1);
    EXPECT_THROW(table_.api.recCreate(jRecord, jOut), std::bad_alloc);
    EXPECT_EQ(json(R"({"a":4,"s":"c"})"), jRecord);
    EXPECT_EQ("before", jOut.asString());
    EXPECT_EQ("", table_.api.getErrMsg());
    expectCalm();
    EXPECT_EQ("4", database_.value("select count(*) from " + table_.strName));
}

// A host may change what recType refers to.
TEST_F(CallbackException, OfAnAccessorReachesTheHost)
{
    Json::Value& jTypes = VORN_JSON_DB::recType(table_.jDefinition, table_.strName);
    jTypes["s"]["cpptype"] = Json::Value(Json::objectValue);
    EXPECT_THROW(select(), Json::LogicError);
    EXPECT_TRUE(rows_.isNull());
    expectCalm();
    EXPECT_EQ("query aborted", lastSqlError(table_));
    jTypes["s"]["cpptype"] = "string";
    expectSound();
}

TEST_F(CallbackException, ReplacesTheErrorTextOfEarlier)
{
    EXPECT_EQ(-1, table_.api.runSqlEx("no statement"));
    takeLog();
    takeStatements();
    failAllocation(1);
    EXPECT_THROW(select(), std::bad_alloc);
    EXPECT_EQ("query aborted", lastSqlError(table_));
}

// An exec that calls the callback without memory and ends as told.
doubles::Exec execWithoutMemory(int iStatus, const char* szError, int iErrno)
{
    return [=](sqlite3*, const char*, doubles::RowCallback callback, void* arg, char** errText) {
        Row row = {{"a"}, {"1"}};
        state().iFailNew = 1;
        EXPECT_EQ(-1, row.handTo(callback, arg));
        state().iFailNew = 0;
        if (nullptr != szError) *errText = doubles::errorText(szError);
        errno = iErrno;
        return iStatus;
    };
}

TEST_F(CallbackException, IsNeitherRetriedNorLoggedHoweverTheStatementEnds)
{
    struct End {
        int iStatus;
        const char* szError;
        int iErrno;
        const char* szKept;
    };
    blDebugOutput = true;
    const sqlite3_int64 before = sqlite3_memory_used();
    for (const End& end : {End{SQLITE_ABORT, "query aborted", 0, "query aborted"},
                           {SQLITE_BUSY, "database is locked", 0, "database is locked"},
                           {SQLITE_ABORT, nullptr, EAGAIN, "Unknow Error!!"},
                           {SQLITE_OK, "a warning", 0, "a warning"},
                           {SQLITE_OK, nullptr, 0, "Unknow Error!!"}}) {
        state().exec = execWithoutMemory(end.iStatus, end.szError, end.iErrno);
        EXPECT_THROW(select(), std::bad_alloc) << end.szKept;
        expectCalm();
        EXPECT_EQ(before, sqlite3_memory_used());
        EXPECT_EQ(end.szKept, lastSqlError(table_));
    }
    blDebugOutput = false;
    expectSound();
}

TEST_F(CallbackException, AtALaterAttemptEndsTheRetry)
{
    state().exec = [i = 0](sqlite3* pDb, const char* szSql, doubles::RowCallback callback,
                           void* arg, char** errText) mutable {
        if (2 <= i++)
            return execWithoutMemory(SQLITE_ABORT, "query aborted", 0)(pDb, szSql, callback, arg,
                                                                       errText);
        *errText = doubles::errorText("database is locked");
        return SQLITE_BUSY;
    };
    EXPECT_THROW(select(), std::bad_alloc);
    EXPECT_EQ(3U, takeStatements().size());
    EXPECT_EQ(2U, state().sleeps.size());
    EXPECT_EQ(Lines(), takeLog());
}

// The reader's own limit is no exception for the host; a lack of memory in the reader is.
TEST_F(CallbackException, OfMemoryComesFromTheReaderOfJsonTextToo)
{
    strSelect_ = "select '{\"key\":[1,2,{}]}' as Unsavable";
    int nThrown = 0;
    for (int n = 1;; ++n) {
        failAllocation(n);
        rows_ = Json::nullValue;
        try {
            EXPECT_EQ(0, select());
            break;
        } catch (const std::bad_alloc&) {
            ++nThrown;
        }
        expectCalm();
        state().exec = nullptr;
        rows_ = Json::nullValue;
        EXPECT_EQ(0, select());
        EXPECT_EQ(R"([{"Unsavable":{"key":[1,2,{}]}}])", text(rows_));
        takeStatements();
    }
    EXPECT_LE(5, nThrown);
}

}  // namespace
