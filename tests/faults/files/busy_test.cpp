// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// The n-th lock of an operation is held by somebody else.

#include "faults/files/fault_vfs.h"
#include "faults/files/host.h"
#include "support/figures.h"

#include <algorithm>

namespace {

using namespace fault_vfs;

constexpr char kUnique[] = "UNIQUE constraint failed: records.id";
constexpr char kLocked[] = "database is locked";

// The locks of an INSERT are SHARED, RESERVED and EXCLUSIVE, in this order; the fourth is that of
// its re-selection.
constexpr int kReselection = 4;
// More times than a call tries.
constexpr int kAlways = 1000;

class Busy : public HostTest {
protected:
    ~Busy() override { Figures::of("locks, findings") += HasFailure() ? 1 : 0; }
};

// The n-th lock of that many attempts is held.
struct Held {
    const char* szOperation;
    int nLock;
    int nHeld;
    int iResult;
    // How many rows are new afterwards, or how many times a list holds all records.
    int nTimes;
    const char* szColumns = kWithoutKeys;
    const char* szError = kLocked;
};

// Kept: the INSERT of each attempt stays, and the rows of each attempt stay in the array.
std::vector<Held> everyHeld()
{
    std::vector<Held> all = {
        {"recCreate", 1, 1, 0, 1},
        {"recCreate", 2, 2, 0, 1},
        {"recCreate", 3, 2, 0, 1},
        {"recCreate", 1, kAlways, -1, 0},
        {"recCreate", kReselection, kAlways, -1, 500},
        // The first attempt's row is in the way of the second one.
        {"recCreate", kReselection, 1, -1, 1, kWithKeys, kUnique},
        {"recSave inserts", kReselection, 1, -1, 1, kWithKeys, kUnique},
        {"recSave replaces", kReselection, 7, 0, 0, kWithKeys},
        {"recList", 1, 1, 0, 1},
        {"recList of all, twice", 1, 1, 0, 2},
        {"recList of all, twice", 2, kAlways, -1, 500},
    };
    for (int nHeld : {1, 2, 7, 499}) {
        for (const char* szOperation : {"recCreate", "recSave inserts", "recSave replaces"})
            all.push_back({szOperation, kReselection, nHeld, 0, nHeld + 1});
        all.push_back({"recList of all, twice", 2, nHeld, 0, nHeld + 2});
    }
    return all;
}

// An operation on a connection that holds its pages in memory already, so that it only has to lock
// the file.
class BusyAt : public Busy, public testing::WithParamInterface<Held> {
protected:
    BusyAt()
    {
        // No page has to be written before the statement's end, which would take a lock as well.
        host_.database.run("pragma cache_size=1000");
        EXPECT_EQ(0, host_.run(operation("recList"), jAll_));
        takeStatements();
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
    int nAdded(const char* szCondition)
    {
        return std::stoi(host_.database.value(
            "select count(*) from (select * from records limit -1 offset 12) where " +
            std::string(szCondition)));
    }

    const DiskFile file_{{Journal::kDelete, true, 4096, GetParam().szColumns}};
    Host host_{file_};
    Json::Value jAll_;
};

TEST_P(BusyAt, RetriesFromTheStart)
{
    const Held& held = GetParam();
    const Operation& tested = operation(held.szOperation);
    follow({kLock, held.nLock, held.nHeld, held.nLock});
    Json::Value jOutput;
    EXPECT_EQ(held.iResult, host_.run(tested, jOutput));
    lift();
    Figures::of("locks, points failed") += counts.nFailed;
    const auto nRetries = static_cast<std::size_t>(std::min(held.nHeld, 500));
    const std::string strSql = onlyStatement(std::min<std::size_t>(nRetries + 1, 500), nRetries);

    const bool blList = tested.is("recList");
    const bool blCreate = tested.is("recCreate");
    EXPECT_EQ(blList ? 0 : held.nTimes, nAdded("1"));
    EXPECT_EQ(blCreate ? held.nTimes : 0,
              nAdded("id = 50 and name = 'new' and note = 'none' and tags = '{}'"));
    const Json::Value jStored = json(R"({"id":50,"name":"new","note":"none","tags":{}})");
    EXPECT_EQ(blList                          ? all(held.nTimes)
              : blCreate && 0 == held.iResult ? jStored
                                              : tested.untouched(),
              jOutput);
    EXPECT_EQ(
        0 == held.iResult ? Lines() : tested.failure(host_.table, held.szError, strSql, nRetries),
        takeLog());
    EXPECT_EQ(blCreate && kUnique == held.szError ? "DUPLICATE_PRIMARY_KEY" : "",
              host_.table.api.getErrMsg());
}

INSTANTIATE_TEST_SUITE_P(Locks, BusyAt, testing::ValuesIn(everyHeld()), [](const auto& tested) {
    const Held& held = tested.param;
    return testName({held.szOperation, "lock", std::to_string(held.nLock), "of",
                     std::to_string(held.nHeld),
                     kWithKeys == held.szColumns ? "with keys" : "without keys"});
});

// In the host's own write transaction no operation takes another lock, so none can be held.
TEST_F(Busy, NoOperationNeedsALockInAWriteTransaction)
{
    const DiskFile file({Journal::kDelete});
    for (const Operation& operation : operations()) {
        SCOPED_TRACE(operation.szName);
        file.restore();
        Host host(file);
        host.database.run("pragma cache_size=1000; begin immediate");
        follow({kLock, 1, kAlways});
        Json::Value jOutput;
        EXPECT_EQ(operation.iResult, host.run(operation, jOutput));
        lift();
        EXPECT_EQ(0, counts.nAll);
        EXPECT_EQ(-1 == operation.iResult, !takeLog().empty());
        host.database.run("rollback");
    }
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
            // None at first. The loop ends after the last lock that is ever taken.
            for (int nHeld = 0, nFailed = 1; 0 < nFailed; ++nHeld) {
                file.restore();
                {
                    Host host(file);
                    follow({kLock | kLockShared, nHeld});
                    Json::Value jOutput;
                    const int iResult = host.run(operation, jOutput);
                    lift();
                    nFailed = 0 == nHeld ? 1 : counts.nFailed;
                    Figures::of("locks, points failed") += counts.nFailed;
                    if (iResult != operation.iResult) ++nFailures;
                    EXPECT_EQ(-1 == iResult, !takeLog().empty());
                }
                if (0 == nHeld) strUndisturbed = file.contents();
                EXPECT_EQ(strUndisturbed, file.contents()) << nHeld;
            }
            const std::string strName = operation.szName;
            const bool blInsert = "recCreate" == strName || "recSave inserts" == strName;
            EXPECT_EQ(Journal::kDelete == journal && blInsert ? 1 : 0, nFailures);
        }
}

}  // namespace
