// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// A second process holds a lock, for a while or longer than a call tries.

#include "support/child.h"
#include "support/figures.h"
#include "support/operations.h"

#include <unistd.h>
#include <chrono>
#include <cstdlib>
#include <tuple>

namespace {

using doubles::state;

// How the file is written, and what the other process has begun.
struct Situation {
    const char* szName;
    const char* szJournal;
    const char* szSql;
    bool blBlocksReaders;
    bool blBlocksWriters;
};

const Situation kSituations[] = {
    {"exclusive", "delete", "begin exclusive", true, true},
    {"writer", "delete", "begin immediate", false, true},
    {"reader", "delete", "begin; select * from sqlite_master", false, true},
    {"wal_writer", "wal", "begin immediate", false, true},
    {"wal_reader", "wal", "begin; select * from sqlite_master", false, false},
};

// The other process, which has run the text and commits when it is told to, or at its end.
class Holder {
public:
    Holder(const std::string& strFile, const std::string& strSql)
        : child_({VORN_LOCK_HOLDER, strFile, strSql}, STDOUT_FILENO)
    {
        EXPECT_EQ("held", child_.line());
    }
    ~Holder() { EXPECT_EQ(0, child_.finish()) << "the holder failed"; }

    void release()
    {
        EXPECT_TRUE(child_.write("x"));
        EXPECT_EQ("released", child_.line());
    }

private:
    Child child_;
};

class HeldLock : public HostTest {
protected:
    explicit HeldLock(const char* szJournal = "delete")
    {
        database_.run(std::string("pragma journal_mode=") + szJournal);
        database_.run(recordsSql(kWithKeys));
    }

    ~HeldLock() override { Figures::of("locks, findings") += HasFailure() ? 1 : 0; }

    int run(const Operation& operation)
    {
        Json::Value jOutput;
        const int iResult = operation.run(database_, table_, jOutput);
        EXPECT_TRUE(-1 != iResult || operation.untouched() == jOutput) << text(jOutput);
        return iResult;
    }

    // While somebody holds a lock.
    void expectEveryAttempt(const Operation& operation)
    {
        EXPECT_EQ(-1, run(operation));
        const Lines log =
            operation.failure(table_, "database is locked", onlyStatement(500, 500), 500);
        EXPECT_EQ(log, takeLog());
        EXPECT_EQ("", table_.api.getErrMsg());
        EXPECT_EQ(nullptr, sqlite3_next_stmt(database_.get(), nullptr));
    }

    void expectGivenUp(const Operation& operation, const char* szHold)
    {
        const Rows before = database_.rows("select * from records");
        {
            const Holder holder(database_.path(), szHold);
            expectEveryAttempt(operation);
        }
        EXPECT_EQ(before, database_.rows("select * from records"));
        ++Figures::of("locks, given up after 500 attempts");
    }

    Database database_{Database::Place::kFile};
    Table table_{database_, "records", kMembers, kWithKeys};
};

// The operations that succeed while no lock is held.
std::vector<Operation> undisturbed()
{
    std::vector<Operation> all;
    for (const Operation& operation : operations())
        if (-1 != operation.iResult) all.push_back(operation);
    return all;
}

class EveryHeldLock : public HeldLock,
                      public testing::WithParamInterface<std::tuple<Situation, Operation>> {
protected:
    // The long run really sleeps.
    EveryHeldLock() : HeldLock(std::get<Situation>(GetParam()).szJournal)
    {
        state().blReallySleep = nullptr != getenv("VORN_SOAK");
    }
};

// The holder of the second lock lets go after 20 sleeps, which are 0.2 s.
TEST_P(EveryHeldLock, IsGivenUpAfterFiveHundredAttemptsOrWaitedOut)
{
    const auto& [situation, tested] = GetParam();
    const bool blBlocked = tested.blWrites ? situation.blBlocksWriters : situation.blBlocksReaders;
    if (blBlocked) expectGivenUp(tested, situation.szSql);
    Holder holder(database_.path(), situation.szSql);
    state().onSleep = [&holder] {
        if (20 == state().sleeps.size()) holder.release();
    };
    EXPECT_EQ(tested.iResult, run(tested));
    onlyStatement(blBlocked ? 21 : 1, blBlocked ? 20 : 0);
    EXPECT_EQ(Lines(), takeLog());
    state().onSleep = nullptr;
    if (blBlocked) ++Figures::of("locks, waited out");
}

INSTANTIATE_TEST_SUITE_P(Locks, EveryHeldLock,
                         testing::Combine(testing::ValuesIn(kSituations),
                                          testing::ValuesIn(undisturbed())),
                         [](const auto& row) {
                             return testName({std::get<Situation>(row.param).szName,
                                              std::get<Operation>(row.param).szName});
                         });

TEST_F(HeldLock, IsGivenUpAfterFiveRealSeconds)
{
    using namespace std::chrono;
    state().blReallySleep = true;
    const auto start = steady_clock::now();
    expectGivenUp(operation("recCreate"), "begin exclusive");
    const auto elapsed = duration_cast<milliseconds>(steady_clock::now() - start);
    EXPECT_LE(5000, elapsed.count());
    Figures::of("locks, milliseconds before really giving up") = elapsed.count();
}

// A host's transaction that has read an older state can never write: all attempts are made.
TEST_F(HeldLock, IsGivenUpInATransactionWithAnOlderSnapshot)
{
    database_.run("pragma journal_mode=wal");
    database_.run("begin; select * from records");
    const std::string strInsert = "insert into records values (40,'Dan','d','{}')";
    Holder(database_.path(), "begin immediate; " + strInsert).release();
    expectEveryAttempt(operation("recCreate"));
    database_.run("rollback");
    EXPECT_EQ(0, run(operation("recCreate")));
    EXPECT_EQ("14", database_.value("select count(*) from records"));
}

}  // namespace
