// SPDX-License-Identifier: MIT
// The n-th lock of an operation is held by somebody else.

#include "faults/files/fault_vfs.h"
#include "faults/files/host.h"
#include "support/figures.h"

#include <cerrno>
#include <functional>

namespace {

using namespace fault_vfs;

constexpr char kUnique[] = "UNIQUE constraint failed: records.id";
constexpr char kLocked[] = "database is locked";

// The locks of an INSERT are SHARED, RESERVED and EXCLUSIVE, in this order; the fourth is that of
// its re-selection.
constexpr int kReselection = 4;
// More times than a call tries.
constexpr int kAlways = 1000;

// The n-th lock of each of that many attempts.
std::function<bool(int n)> lockOf(int nLock, int nAttempts)
{
    return [=](int n) { return 0 == n % nLock && n / nLock <= nAttempts; };
}

// An operation on a connection that holds its pages in memory already, so that it only has to lock
// the file.
class Busy : public HostTest {
protected:
    explicit Busy(const char* szColumns = kWithoutKeys)
        : file_({Journal::kDelete, true, 4096, szColumns}), host_(file_)
    {
        // No page has to be written before the statement's end, which would take a lock as well.
        host_.database.run("pragma cache_size=1000");
        EXPECT_EQ(0, operation("recList").run(host_.database, host_.table, jAll_));
        takeStatements();
    }

    ~Busy() override { Figures::of("locks, findings") += HasFailure() ? 1 : 0; }

    // The result of an operation that is tried that many times.
    int run(const char* szOperation, int nLock, int nHeld, std::size_t nAttempts)
    {
        follow({kLock, lockOf(nLock, nHeld)});
        const int iResult = host_.run(operation(szOperation), jOutput_);
        lift();
        strSql_ = onlyStatement(nAttempts, 500 == nAttempts && -1 == iResult ? 500 : nAttempts - 1);
        Figures::of("locks, points failed") += failed();
        return iResult;
    }

    // All records, that many times.
    Json::Value all(int nTimes) const
    {
        Json::Value jRecords(Json::arrayValue);
        for (int i = 0; i < nTimes; ++i)
            for (const Json::Value& jRecord : jAll_) jRecords.append(jRecord);
        return jRecords;
    }

    // How many rows beyond the initial ones meet the condition.
    int nAdded(const char* szCondition = "1")
    {
        return std::stoi(host_.database.value(
            "select count(*) from (select * from records limit -1 offset 12) where " +
            std::string(szCondition)));
    }

    const DiskFile file_;
    Host host_;
    Json::Value jAll_;
    Json::Value jOutput_;
    std::string strSql_;
};

const char kStored[] = R"({"id":50,"name":"new","note":"none","tags":{}})";
const char kStoredRow[] = "id = 50 and name = 'new' and note = 'none' and tags = '{}'";

// The n-th lock of that many attempts is held.
struct Held {
    const char* szOperation;
    int nLock;
    int nHeld;
    int iResult;
    std::size_t nAttempts;
    // How many rows are new afterwards, or how many times a list holds all records.
    int nTimes;
    const char* szColumns = kWithoutKeys;
    const char* szError = kLocked;
};

// Kept: the INSERT of each attempt stays, and the rows of each attempt stay in the array.
std::vector<Held> everyHeld()
{
    std::vector<Held> all = {
        {"recCreate", 1, 1, 0, 2, 1},
        {"recCreate", 2, 1, 0, 2, 1},
        {"recCreate", 3, 1, 0, 2, 1},
        {"recCreate", 1, kAlways, -1, 500, 0},
        {"recCreate", kReselection, kAlways, -1, 500, 500},
        // The first attempt's row is in the way of the second one.
        {"recCreate", kReselection, 1, -1, 2, 1, kWithKeys, kUnique},
        {"recSave inserts", kReselection, 1, -1, 2, 1, kWithKeys, kUnique},
        {"recSave replaces", kReselection, 7, 0, 8, 0, kWithKeys},
        {"recList", 1, 1, 0, 2, 1},
        {"recList", 2, 1, 0, 1, 1},
        {"recList of all, twice", 1, 1, 0, 2, 2},
        {"recList of all, twice", 2, kAlways, -1, 500, 500},
    };
    for (int nHeld : {1, 2, 7, 499}) {
        const std::size_t nAttempts = static_cast<std::size_t>(nHeld) + 1;
        for (const char* szOperation : {"recCreate", "recSave inserts", "recSave replaces"})
            all.push_back({szOperation, kReselection, nHeld, 0, nAttempts, nHeld + 1});
        all.push_back({"recList of all, twice", 2, nHeld, 0, nAttempts, nHeld + 2});
    }
    return all;
}

class BusyAt : public Busy, public testing::WithParamInterface<Held> {
protected:
    BusyAt() : Busy(GetParam().szColumns) {}
};

TEST_P(BusyAt, RetriesFromTheStart)
{
    const Held& held = GetParam();
    const Operation& tested = operation(held.szOperation);
    EXPECT_EQ(held.iResult, run(held.szOperation, held.nLock, held.nHeld, held.nAttempts));
    EXPECT_EQ(tested.is("recList") ? 0 : held.nTimes, nAdded());
    const bool blStored = tested.is("recCreate") && 0 == held.iResult;
    EXPECT_EQ(tested.is("recList") ? all(held.nTimes)
              : blStored           ? json(kStored)
                                   : tested.untouched(),
              jOutput_);
    EXPECT_EQ(tested.is("recCreate") ? held.nTimes : 0, nAdded(kStoredRow));
    const std::size_t nRetries = 500 == held.nAttempts ? 500 : held.nAttempts - 1;
    EXPECT_EQ(
        0 == held.iResult ? Lines() : tested.failure(host_.table, held.szError, strSql_, nRetries),
        takeLog());
    EXPECT_EQ(tested.is("recCreate") && kUnique == held.szError ? "DUPLICATE_PRIMARY_KEY" : "",
              host_.table.api.getErrMsg());
}

INSTANTIATE_TEST_SUITE_P(Locks, BusyAt, testing::ValuesIn(everyHeld()), [](const auto& tested) {
    const Held& held = tested.param;
    return testName({held.szOperation, "lock", std::to_string(held.nLock), "of",
                     std::to_string(held.nHeld),
                     kWithKeys == held.szColumns ? "with keys" : "without keys"});
});

TEST_F(Busy, EachRetryIsTraced)
{
    blDebugOutput = true;
    EXPECT_EQ(0, run("recSave inserts", kReselection, 2, 3));
    const std::string strTail =
        ", errno=?, run sql failed, error=database is locked, sql=" + strSql_;
    const Lines expected{plain("retry, i=0" + strTail), plain("retry, i=1" + strTail)};
    EXPECT_EQ(expected, takeLog());
}

class BusyInTransaction : public Busy, public testing::WithParamInterface<const char*> {
protected:
    BusyInTransaction() : Busy(GetParam()) {}
};

INSTANTIATE_TEST_SUITE_P(Tables, BusyInTransaction, testing::Values(kWithKeys, kWithoutKeys));

// Inside the host's transaction every lock that could fail half-way is already held.
TEST_P(BusyInTransaction, EveryOperationRunsOnce)
{
    for (const char* szOperation : {"recList", "recList of all, twice", "recDelete", "recCreate"}) {
        host_.database.run("begin immediate");
        EXPECT_EQ(operation(szOperation).iResult, run(szOperation, 1, kAlways, 1)) << szOperation;
        EXPECT_EQ(0, counted(kLock)) << szOperation;
        host_.database.run(operation(szOperation).is("recCreate") ? "commit" : "rollback");
    }
    EXPECT_EQ(1, nAdded(kStoredRow));
    EXPECT_EQ(kStored, text(jOutput_));
    EXPECT_EQ(Lines(), takeLog());
}

// Kept: EAGAIN counts as a lock, whatever failed. Such a failure can come between two rows, and a
// transaction does not help.
TEST_F(Busy, ListRepeatsItsFirstRowsIfAReadHasToWait)
{
    const DiskFile file({Journal::kDelete});
    std::size_t nRepeated = 0;
    for (int nFailing = 1, iFailed = 1; 0 < iFailed; ++nFailing) {
        file.restore();
        Host host(file);
        follow({kRead, lockOf(nFailing, 1), false, EAGAIN});
        EXPECT_EQ(0, host.run(operation("recList"), jOutput_));
        lift();
        iFailed = failed();
        EXPECT_EQ(0 < iFailed ? 2U : 1U, takeStatements().size()) << nFailing;
        ASSERT_LE(jAll_.size(), jOutput_.size());
        const Json::ArrayIndex nFirst = jOutput_.size() - jAll_.size();
        nRepeated += nFirst;
        for (Json::ArrayIndex i = 0; i < jOutput_.size(); ++i)
            EXPECT_EQ(jAll_[i < nFirst ? i : i - nFirst], jOutput_[i]) << nFailing;
    }
    EXPECT_LT(0U, nRepeated);
    EXPECT_EQ(Lines(), takeLog());
}

// Even at the locks that a connection takes before its first statement. Only an INSERT into a table
// with keys fails, at the lock of its re-selection.
TEST_F(Busy, EveryOperationIsRetriedAtEachLock)
{
    for (const Operation& operation : operations())
        for (Journal journal : {Journal::kDelete, Journal::kWal}) {
            SCOPED_TRACE(operation.szName);
            const DiskFile file({journal, operation.blNeedsTable});
            std::string strUndisturbed;
            int nFailures = 0;
            // The loop ends after the last lock that is ever taken.
            for (int nHeld = kAlways, iFailed = 1; 0 < iFailed; nHeld = nHeld % kAlways + 1) {
                file.restore();
                {
                    Host host(file);
                    follow({kLock | kLockShared, lockOf(nHeld, 1)});
                    Json::Value jOutput;
                    const int iResult = host.run(operation, jOutput);
                    lift();
                    iFailed = kAlways == nHeld ? 1 : failed();
                    Figures::of("locks, points failed") += failed();
                    if (iResult != operation.iResult) ++nFailures;
                    EXPECT_EQ(-1 == iResult, !takeLog().empty());
                }
                if (kAlways == nHeld) strUndisturbed = file.contents();
                EXPECT_EQ(strUndisturbed, file.contents()) << nHeld;
            }
            const std::string strName = operation.szName;
            const bool blInsert = "recCreate" == strName || "recSave inserts" == strName;
            EXPECT_EQ(Journal::kDelete == journal && blInsert ? 1 : 0, nFailures);
        }
}

}  // namespace
