// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// Every operation of the disk fails once, and from then on, under every operation of the library.

#include "faults/files/fault_vfs.h"
#include "faults/files/host.h"
#include "support/figures.h"

#include <algorithm>
#include <cstdlib>
#include <limits>
#include <tuple>

namespace {

using namespace fault_vfs;

struct Fault {
    const char* szName;
    unsigned uKinds;
    // How many operations in a row fail.
    int nLength;
    bool blDiskFull = false;
    // The disk recovers while the operation is still running, or something rare fails: only in the
    // long run.
    bool blLongRun = false;
};

constexpr int kFromThenOn = std::numeric_limits<int>::max();

const Fault kFaults[] = {
    {"any operation once", kEverythingButLocks, 1},
    {"any operation from then on", kEverythingButLocks, kFromThenOn},
    {"open from then on", kOpen, kFromThenOn},
    {"read from then on", kRead, kFromThenOn},
    {"write from then on", kWrite, kFromThenOn},
    {"sync from then on", kSync, kFromThenOn},
    {"truncate from then on", kTruncate, kFromThenOn},
    {"delete from then on", kDelete, kFromThenOn},
    {"disk full once", kWrite, 1, true},
    {"disk full from then on", kWrite, kFromThenOn, true},
    {"any operation twice", kEverythingButLocks, 2, false, true},
    {"any operation three times", kEverythingButLocks, 3, false, true},
    {"any operation eight times", kEverythingButLocks, 8, false, true},
    {"read three times", kRead, 3, false, true},
    {"write three times", kWrite, 3, false, true},
    {"disk full three times", kWrite, 3, true, true},
    {"size from then on", kFileSize, kFromThenOn, false, true},
    {"access from then on", kAccess, kFromThenOn, false, true},
    {"shared memory from then on", kMapShared, kFromThenOn, false, true},
};

bool isLongRun()
{
    return nullptr != getenv("VORN_SOAK");
}

std::vector<Fault> faults()
{
    std::vector<Fault> chosen;
    for (const Fault& fault : kFaults)
        if (isLongRun() || !fault.blLongRun) chosen.push_back(fault);
    return chosen;
}

// What a trial shows.
struct Outcome {
    int iResult = 0;
    Json::Value jOutput;
    Lines log;
};

class FileFaults : public HostTest,
                   public testing::WithParamInterface<std::tuple<Journal, Operation, Fault>> {
protected:
    static const Operation& operation() { return std::get<Operation>(GetParam()); }

    // Fails at the n-th operation of the disk; n is 0 for none.
    static Outcome run(Host& host, int nFailing)
    {
        const Fault& fault = std::get<Fault>(GetParam());
        Outcome outcome;
        follow({fault.uKinds, nFailing, fault.nLength, 1, fault.blDiskFull});
        outcome.iResult = host.run(operation(), outcome.jOutput);
        lift();
        outcome.log = takeLog();
        return outcome;
    }

    void expectFailureOrUndisturbed(const Outcome& outcome, const Outcome& undisturbed,
                                    const Table& table)
    {
        const std::vector<std::string> statements = takeStatements();
        ASSERT_EQ(1U, statements.size()) << "was tried again";
        if (undisturbed.iResult == outcome.iResult && undisturbed.log == outcome.log) {
            EXPECT_EQ(undisturbed.jOutput, outcome.jOutput);
            return;
        }
        EXPECT_LT(0, counts.nFailed);
        EXPECT_EQ(-1, outcome.iResult);
        std::vector<Lines> logs;
        for (const char* szError :
             {"disk I/O error", "database or disk is full", "unable to open database file"})
            logs.push_back(operation().failure(table, szError, statements[0]));
        EXPECT_TRUE(logs.end() != std::find(logs.begin(), logs.end(), outcome.log))
            << testing::PrintToString(outcome.log);
        if (!outcome.jOutput.isArray()) {
            EXPECT_EQ(operation().untouched(), outcome.jOutput);
            return;
        }
        // A list keeps the rows before the failure.
        ASSERT_LE(outcome.jOutput.size(), undisturbed.jOutput.size());
        for (Json::ArrayIndex i = 0; i < outcome.jOutput.size(); ++i)
            EXPECT_EQ(undisturbed.jOutput[i], outcome.jOutput[i]);
    }

    void tryEveryPoint(const DiskFile& file)
    {
        const std::string strBefore = file.contents();
        file.restore();
        Outcome undisturbed;
        {
            Host host(file);
            undisturbed = run(host, 0);
        }
        takeStatements();
        EXPECT_EQ(operation().iResult, undisturbed.iResult);
        const std::string strAfterwards = file.contents();
        for (int nFailing = 1, nFailed = 1; 0 < nFailed; ++nFailing) {
            SCOPED_TRACE("at operation " + std::to_string(nFailing) + " of the disk");
            file.restore();
            const sqlite3_int64 lMemory = sqlite3_memory_used();
            {
                Host host(file);
                const Outcome outcome = run(host, nFailing);
                nFailed = counts.nFailed;
                expectFailureOrUndisturbed(outcome, undisturbed, host.table);
                std::vector<std::string> contents{strAfterwards};
                if (-1 == outcome.iResult) contents.push_back(strBefore);
                host.expectNothingLeft(file, contents);
            }
            EXPECT_EQ(lMemory, sqlite3_memory_used());
            Figures::of("file faults, findings") += HasFailure() ? 1 : 0;
            if (HasFailure()) return;
            Figures::of("file faults, points failed") += 0 < nFailed ? 1 : 0;
        }
        ++Figures::of("file faults, loops that reached their end");
    }
};

TEST_P(FileFaults, LeaveNothingBroken)
{
    for (int iPageSize : isLongRun() ? std::vector<int>{512, 1024, 4096} : std::vector<int>{512})
        tryEveryPoint(
            DiskFile({std::get<Journal>(GetParam()), operation().blNeedsTable, iPageSize}));
}

INSTANTIATE_TEST_SUITE_P(
    Disk, FileFaults,
    testing::Combine(testing::Values(Journal::kDelete, Journal::kWal),
                     testing::ValuesIn(operations()), testing::ValuesIn(faults())),
    [](const auto& tested) {
        return testName({Journal::kWal == std::get<0>(tested.param) ? "wal" : "delete",
                         std::get<1>(tested.param).szName, std::get<2>(tested.param).szName});
    });

// Otherwise a loop could end at its first point and prove nothing.
TEST(FileFaultsReach, EveryKindOfOperation)
{
    for (unsigned uKind = kOpen; uKind < kLock; uKind *= 2) {
        int nReached = 0;
        for (const Operation& operation : operations())
            for (Journal journal : {Journal::kDelete, Journal::kWal}) {
                const DiskFile file({journal, operation.blNeedsTable});
                Host host(file);
                follow({uKind});
                Json::Value jOutput;
                host.run(operation, jOutput);
                lift();
                takeLog();
                EXPECT_TRUE(kRead != uKind || 0 < counts.nAll) << operation.szName;
                nReached += counts.nAll;
            }
        EXPECT_LT(0, nReached) << uKind;
    }
}

}  // namespace
