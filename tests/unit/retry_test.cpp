// SPDX-License-Identifier: MIT
// runSqlEx while the database is locked. Nothing sleeps in earnest.

#include "support/rows.h"

#include <cerrno>

namespace {

using doubles::state;

class Retry : public TableTest {
protected:
    int run() { return table_.api.runSqlEx("a text"); }

    // Locked attempts, then a success; the count of rows is 4.
    static void lockFor(int nAttempts)
    {
        state().changes = [] { return 4; };
        state().exec = [nAttempts, i = 0](sqlite3*, const char*, doubles::RowCallback, void*,
                                          char** errText) mutable {
            if (i++ >= nAttempts) return SQLITE_OK;
            *errText = doubles::errorText("database is locked");
            return SQLITE_BUSY;
        };
    }

    static std::string line(int i, const std::string& strError)
    {
        return plain("i=" + std::to_string(i) + ",errno=?, run sql failed, error=" + strError +
                     ", sql=a text");
    }

    static std::string retryLine(int i, const std::string& strError)
    {
        return plain("retry, i=" + std::to_string(i) +
                     ", errno=?, run sql failed, error=" + strError + ", sql=a text");
    }

    Table table_{database_, std::string(R"({"a":{"cpptype":"int"},)") + kUnsavable + "}", "a"};
};

const std::vector<unsigned> kAllSleeps(500, 10000U);

TEST_F(Retry, GivesUpAfterFiveHundredAttempts)
{
    lockFor(1000);
    EXPECT_EQ(-1, run());
    EXPECT_EQ(std::vector<std::string>(500, "a text"), takeStatements());
    EXPECT_EQ(kAllSleeps, state().sleeps);
    EXPECT_EQ(Lines{line(500, "database is locked")}, takeLog());
    EXPECT_EQ("database is locked", lastSqlError(table_));
}

TEST_F(Retry, TracesEveryLockedAttemptForDebugging)
{
    blDebugOutput = true;
    lockFor(1000);
    EXPECT_EQ(-1, run());
    Lines lines;
    for (int i = 0; i < 500; ++i) lines.push_back(retryLine(i, "database is locked"));
    lines.push_back(line(500, "database is locked"));
    lines.push_back(plain("run sql fail, err=database is locked"));
    EXPECT_EQ(lines, takeLog());
}

TEST_F(Retry, SucceedsAtTheFirstUnlockedAttempt)
{
    for (int nLocked : {1, 3, 499}) {
        state().sleeps.clear();
        lockFor(nLocked);
        EXPECT_EQ(4, run());
        const auto nTimes = static_cast<std::size_t>(nLocked);
        EXPECT_EQ(nTimes + 1, takeStatements().size());
        EXPECT_EQ(std::vector<unsigned>(nTimes, 10000U), state().sleeps);
        EXPECT_EQ(Lines(), takeLog());
        EXPECT_EQ("", lastSqlError(table_));
    }
}

TEST_F(Retry, LooksForTheWordsAnywhereInTheText)
{
    for (const char* szError : {"error: database is locked", "database is locked (5)",
                                "database is locked: UNIQUE constraint failed"}) {
        state().sleeps.clear();
        state().exec = execOfStatus(SQLITE_ERROR, szError);
        EXPECT_EQ(-1, run());
        EXPECT_EQ(kAllSleeps, state().sleeps) << szError;
        EXPECT_EQ(Lines{line(500, szError)}, takeLog());
    }
}

TEST_F(Retry, EndsWithAnErrorOfAnotherKind)
{
    state().exec = [i = 0](sqlite3*, const char*, doubles::RowCallback, void*,
                           char** errText) mutable {
        *errText = doubles::errorText(2 > i++ ? "database is locked" : "disk I/O error");
        return SQLITE_ERROR;
    };
    EXPECT_EQ(-1, run());
    EXPECT_EQ(2U, state().sleeps.size());
    EXPECT_EQ(Lines{line(2, "disk I/O error")}, takeLog());
    EXPECT_EQ("disk I/O error", lastSqlError(table_));
}

// An exec that fails with that errno.
doubles::Exec execOfErrno(int iErrno, const char* szError)
{
    return [=](sqlite3*, const char*, doubles::RowCallback, void*, char** errText) {
        if (nullptr != szError) *errText = doubles::errorText(szError);
        errno = iErrno;
        return SQLITE_ERROR;
    };
}

TEST_F(Retry, TakesTheErrnoOfALockForALock)
{
    blDebugOutput = true;
    struct Case {
        const char* szError;
        const char* szTraced;
        const char* szKept;
    };
    for (const Case& row : {Case{nullptr, "(null)", "Unknow Error!!"},
                            {"disk I/O error", "disk I/O error", "disk I/O error"}}) {
        state().sleeps.clear();
        state().exec = execOfErrno(EAGAIN, row.szError);
        EXPECT_EQ(-1, run());
        EXPECT_EQ(kAllSleeps, state().sleeps);
        EXPECT_EQ(500U, takeStatements().size());
        for (const doubles::LogRecord& record : state().log) EXPECT_EQ(EAGAIN, record.iErrno);
        const Lines lines = takeLog();
        ASSERT_EQ(502U, lines.size());
        for (int i = 0; i < 500; ++i)
            EXPECT_EQ(retryLine(i, row.szTraced), lines[static_cast<std::size_t>(i)]);
        EXPECT_EQ(line(500, row.szKept), lines[500]);
        EXPECT_EQ(plain(std::string("run sql fail, err=") + row.szTraced), lines[501]);
        EXPECT_EQ(row.szKept, lastSqlError(table_));
    }
}

TEST_F(Retry, DoesNotTakeAnotherErrnoForALock)
{
    for (int iErrno : {0, EINTR, EBUSY, ENOLCK}) {
        state().exec = execOfErrno(iErrno, nullptr);
        EXPECT_EQ(-1, run());
        EXPECT_TRUE(state().sleeps.empty());
        EXPECT_EQ(Lines{line(0, "Unknow Error!!")}, takeLog());
    }
}

TEST_F(Retry, ClearsErrnoBeforeEachAttempt)
{
    std::vector<int> found;
    state().exec = [&](sqlite3*, const char*, doubles::RowCallback, void*, char** errText) {
        found.push_back(errno);
        if (3 == found.size()) return SQLITE_ERROR;
        *errText = doubles::errorText("database is locked");
        errno = ENOENT;
        return SQLITE_BUSY;
    };
    state().onSleep = [] { errno = EAGAIN; };
    errno = EAGAIN;
    EXPECT_EQ(-1, run());
    EXPECT_EQ((std::vector<int>{0, 0, 0}), found);
    EXPECT_EQ(Lines{line(2, "Unknow Error!!")}, takeLog());
}

// What the handle holds while a later attempt runs, read by a save on the same handle.
TEST_F(Retry, HoldsTheTextOfTheLastLockedAttempt)
{
    std::vector<std::string> held;
    state().exec = [&](sqlite3*, const char*, doubles::RowCallback, void*, char** errText) {
        held.push_back(lastSqlError(table_));
        if (4 == held.size()) return SQLITE_OK;
        // The third has no text: the second one's stays.
        if (3 != held.size())
            *errText =
                doubles::errorText(("database is locked " + std::to_string(held.size())).c_str());
        errno = EAGAIN;
        return SQLITE_BUSY;
    };
    EXPECT_EQ(0, table_.api.runSqlEx("a text", [](void*, int, char**, char**) { return 0; }));
    EXPECT_EQ((std::vector<std::string>{"", "database is locked 1", "database is locked 2",
                                        "database is locked 2"}),
              held);
    EXPECT_EQ("", lastSqlError(table_));
}

TEST_F(Retry, TriesTheWholeTextAgain)
{
    int iRows = 0;
    const auto count = [](void* arg, int, char**, char**) { return ++*static_cast<int*>(arg), 0; };
    state().exec = [i = 0](sqlite3* pDb, const char* szSql, doubles::RowCallback callback,
                           void* arg, char** errText) mutable {
        const int iStatus = doubles::realExec(pDb, szSql, callback, arg, errText);
        if (0 < i++) return iStatus;
        *errText = doubles::errorText("database is locked");
        return SQLITE_BUSY;
    };
    const std::string strSql = "insert into " + table_.strName + " values(1); select 1; select 2";
    EXPECT_EQ(0, table_.api.runSqlEx(strSql, count, &iRows));
    EXPECT_EQ(4, iRows);
    EXPECT_EQ("2", database_.value("select count(*) from " + table_.strName));
}

// A table in a file that another connection has locked.
class RealLock : public HostTest {
protected:
    RealLock()
    {
        if (SQLITE_OK != sqlite3_open(database_.path().c_str(), &pOther_)) ADD_FAILURE();
        other("begin exclusive");
    }

    ~RealLock() override { sqlite3_close(pOther_); }

    void other(const char* szSql)
    {
        EXPECT_EQ(SQLITE_OK, doubles::realExec(pOther_, szSql, nullptr, nullptr, nullptr));
    }

    Database database_{Database::Place::kFile};
    Table table_{database_, R"({"a":{"cpptype":"int"}})", "a"};
    sqlite3* pOther_ = nullptr;
};

TEST_F(RealLock, IsWaitedOut)
{
    state().onSleep = [this] {
        if (100 == state().sleeps.size()) other("commit");
    };
    EXPECT_EQ(R"({"a":5})", text(table_.create(R"({"a":5})")));
    EXPECT_EQ(std::vector<unsigned>(100, 10000U), state().sleeps);
    EXPECT_EQ(101U, takeStatements().size());
    EXPECT_EQ(Lines(), takeLog());
    EXPECT_EQ("5", database_.value("select a from " + table_.strName));
}

TEST_F(RealLock, ThatStaysEndsTheCall)
{
    const std::string strSql = "delete from " + table_.strName;
    EXPECT_EQ(-1, table_.api.runSqlEx(strSql));
    EXPECT_EQ(kAllSleeps, state().sleeps);
    EXPECT_EQ(
        Lines{plain("i=500,errno=?, run sql failed, error=database is locked, sql=" + strSql)},
        takeLog());
    other("commit");
    EXPECT_EQ(0, table_.api.runSqlEx(strSql));
    EXPECT_EQ(Lines(), takeLog());
}

}  // namespace
