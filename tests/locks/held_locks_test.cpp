// SPDX-License-Identifier: MIT
// A second process holds a lock, for a while and for ever.

#include "locks/calls.h"
#include "locks/holder.h"
#include "support/figures.h"

#include <chrono>
#include <cstdlib>
#include <tuple>

namespace {

using doubles::state;

// How the file is written, and what the other process has begun.
struct Situation {
    const char* szName;
    const char* szJournal;
    std::string strSql;
    bool blBlocksReaders;
    bool blBlocksWriters;

    friend std::ostream& operator<<(std::ostream& out, const Situation& situation)
    {
        return out << situation.szName;
    }
};

const std::vector<Situation> kSituations = {
    {"exclusive", "delete", "begin exclusive", true, true},
    {"writer", "delete", "begin immediate", false, true},
    {"reader", "delete", "begin; select * from sqlite_master", false, true},
    {"wal_writer", "wal", "begin immediate", false, true},
    {"wal_reader", "wal", "begin; select * from sqlite_master", false, false},
};

class HeldLock : public HostTest {
protected:
    explicit HeldLock(const char* szJournal = "delete")
    {
        database_.run(std::string("pragma journal_mode=") + szJournal);
        addRecords(database_, table_.strName);
    }

    ~HeldLock() override { Figures::of("locks, findings") += HasFailure() ? 1 : 0; }

    // The statement of the only call since the last time, after a look at its attempts and sleeps.
    std::string statement(std::size_t nAttempts, std::size_t nSleeps)
    {
        const std::vector<std::string> statements = takeStatements();
        EXPECT_EQ(nAttempts, statements.size());
        const std::string strSql = statements.at(0);
        EXPECT_EQ(std::vector<std::string>(statements.size(), strSql), statements);
        EXPECT_EQ(std::vector<unsigned>(nSleeps, 10000), state().sleeps);
        return strSql;
    }

    // The holder lets go after 20 sleeps, which are 0.2 s.
    void expectWaitedOut(const Call& call, const std::string& strHold, bool blBlocks)
    {
        Holder holder(database_.path(), strHold);
        state().onSleep = [&holder] {
            if (20 == state().sleeps.size()) holder.release();
        };
        EXPECT_EQ(call.iResult, call.run(table_));
        statement(blBlocks ? 21 : 1, blBlocks ? 20 : 0);
        EXPECT_EQ(Lines(), takeLog());
        state().onSleep = nullptr;
        if (blBlocks) ++Figures::of("locks, waited out");
    }

    void expectGivenUp(const Call& call, const std::string& strHold)
    {
        const std::string strBefore = contents();
        {
            const Holder holder(database_.path(), strHold);
            EXPECT_EQ(-1, call.run(table_));
            const std::string strSql = statement(500, 500);
            EXPECT_EQ(failure(call, table_, "database is locked", strSql, 500), takeLog());
            EXPECT_EQ("", table_.api.getErrMsg());
            EXPECT_EQ(nullptr, sqlite3_next_stmt(database_.get(), nullptr));
        }
        EXPECT_EQ(strBefore, contents());
        EXPECT_EQ(call.iResult, call.run(table_));
        takeStatements();
        EXPECT_EQ(Lines(), takeLog());
        ++Figures::of("locks, given up after 500 attempts");
    }

    std::string contents()
    {
        return database_.value("select group_concat(id||name||note) from " + table_.strName);
    }

    Database database_{Database::Place::kFile};
    Table table_{database_, kMembers, kColumns};
};

class EveryHeldLock : public HeldLock,
                      public testing::WithParamInterface<std::tuple<Situation, Call>> {
protected:
    // The long run sleeps in earnest.
    EveryHeldLock() : HeldLock(situation().szJournal)
    {
        state().blReallySleep = nullptr != getenv("VORN_SOAK");
    }

    static const Situation& situation() { return std::get<Situation>(GetParam()); }
    static const Call& call() { return std::get<Call>(GetParam()); }
    static bool isBlocked()
    {
        return call().blWrites ? situation().blBlocksWriters : situation().blBlocksReaders;
    }
};

TEST_P(EveryHeldLock, IsWaitedOut)
{
    expectWaitedOut(call(), situation().strSql, isBlocked());
}

TEST_P(EveryHeldLock, EndsTheCallAfterFiveHundredAttempts)
{
    if (isBlocked()) return expectGivenUp(call(), situation().strSql);
    const Holder holder(database_.path(), situation().strSql);
    EXPECT_EQ(call().iResult, call().run(table_));
    statement(1, 0);
}

INSTANTIATE_TEST_SUITE_P(Locks, EveryHeldLock,
                         testing::Combine(testing::ValuesIn(kSituations),
                                          testing::ValuesIn(calls())),
                         [](const auto& tested) {
                             return std::string(std::get<Situation>(tested.param).szName) + "_" +
                                    std::get<Call>(tested.param).szName;
                         });

// The two runs that sleep in earnest.
TEST_F(HeldLock, OfAFifthOfASecondIsWaitedOutInEarnest)
{
    state().blReallySleep = true;
    expectWaitedOut(call("recCreate"), "begin exclusive", true);
}

TEST_F(HeldLock, OfFiveSecondsIsGivenUpInEarnest)
{
    using namespace std::chrono;
    state().blReallySleep = true;
    const auto start = steady_clock::now();
    expectGivenUp(call("recCreate"), "begin exclusive");
    const auto elapsed = duration_cast<milliseconds>(steady_clock::now() - start);
    EXPECT_LE(5000, elapsed.count());
    Figures::of("locks, milliseconds before giving up in earnest") = elapsed.count();
}

// A transaction of the host that has read an older state can never write: all attempts are made.
TEST_F(HeldLock, OfAnOlderSnapshotIsGivenUp)
{
    database_.run("pragma journal_mode=wal");
    database_.run("begin; select * from " + table_.strName);
    {
        Holder other(database_.path(),
                     "begin immediate; insert into " + table_.strName + " values (4,'Dan','d')");
    }
    EXPECT_EQ(-1, call("recCreate").run(table_));
    const std::string strSql = statement(500, 500);
    EXPECT_EQ(failure(call("recCreate"), table_, "database is locked", strSql, 500), takeLog());
    database_.run("rollback");
    EXPECT_EQ(0, call("recCreate").run(table_));
    EXPECT_EQ("5", database_.value("select count(*) from " + table_.strName));
}

}  // namespace
