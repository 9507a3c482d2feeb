// SPDX-License-Identifier: MIT
// Every operation of the disk fails once, and from then on, under every operation of the library.

#include "faults/files/aftermath.h"
#include "faults/files/fault_vfs.h"
#include "faults/files/operations.h"
#include "support/figures.h"

#include <algorithm>
#include <cstdlib>
#include <limits>
#include <map>
#include <tuple>

namespace {

using namespace fault_vfs;

struct Fault {
    const char* szName;
    unsigned uKinds;
    // How many operations in a row fail.
    int nLength;
    bool blDiskFull = false;

    friend std::ostream& operator<<(std::ostream& out, const Fault& fault)
    {
        return out << fault.szName;
    }
};

constexpr int kFromThenOn = std::numeric_limits<int>::max();

const std::vector<Fault> kFaults = {
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
};

// For the long run: the disk recovers while the operation is still under way.
const std::vector<Fault> kBursts = {
    {"any operation twice", kEverythingButLocks, 2},
    {"any operation three times", kEverythingButLocks, 3},
    {"any operation eight times", kEverythingButLocks, 8},
    {"read three times", kRead, 3},
    {"write three times", kWrite, 3},
    {"disk full three times", kWrite, 3, true},
    {"size from then on", kFileSize, kFromThenOn},
    {"access from then on", kAccess, kFromThenOn},
    {"shared memory from then on", kMapShared, kFromThenOn},
};

constexpr Kind kKinds[] = {kOpen,   kRead,   kWrite,    kSync,     kTruncate,
                           kDelete, kAccess, kFileSize, kMapShared};

bool isLongRun()
{
    return nullptr != getenv("VORN_SOAK");
}

std::vector<Fault> faults()
{
    std::vector<Fault> all = kFaults;
    if (isLongRun()) all.insert(all.end(), kBursts.begin(), kBursts.end());
    return all;
}

// Whether it is the line of a statement that failed at its first attempt for want of the disk.
bool isErrorOfDisk(const std::string& strLine)
{
    const auto begins = [&](const char* szError) {
        const std::string strBegin =
            plain(std::string("i=0,errno=?, run sql failed, error=") + szError + ", sql=");
        return 0 == strLine.compare(0, strBegin.size(), strBegin);
    };
    return begins("disk I/O error") || begins("database or disk is full") ||
           begins("unable to open database file");
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
    static DiskFile::Form form(int iPageSize)
    {
        return {std::get<Journal>(GetParam()), operation().blWithRecords, iPageSize};
    }
    static const Operation& operation() { return std::get<Operation>(GetParam()); }
    static const Fault& fault() { return std::get<Fault>(GetParam()); }

    // Fails at the n-th operation of the disk; n is 0 for none.
    static Plan plan(int nFailing)
    {
        const auto fails = [nFailing, nLength = fault().nLength](int n) {
            return 0 < nFailing && nFailing <= n && n - nFailing < nLength;
        };
        return {fault().uKinds, fails, fault().blDiskFull};
    }

    static Outcome run(Host& host, int nFailing)
    {
        Outcome outcome;
        outcome.jOutput = json(operation().szOutput);
        follow(plan(nFailing));
        outcome.iResult = operation().run(host, outcome.jOutput);
        lift();
        outcome.log = takeLog();
        return outcome;
    }

    void learnUndisturbed(const DiskFile& file);
    void expectFailureOrUndisturbed(const Outcome& outcome) const;
    void tryEveryPoint(const DiskFile& file);

    Outcome undisturbed_;
    std::string strBefore_;
    std::string strAfterwards_;
};

void FileFaults::learnUndisturbed(const DiskFile& file)
{
    file.restore();
    strBefore_ = contents(file);
    Host host(file);
    undisturbed_ = run(host, 0);
    EXPECT_EQ(operation().iResult, undisturbed_.iResult);
    strAfterwards_ = contents(file);
}

void FileFaults::expectFailureOrUndisturbed(const Outcome& outcome) const
{
    const auto isBroken = [](const std::string& strLine) { return 0 == strLine.find("BROKEN"); };
    EXPECT_TRUE(std::none_of(outcome.log.begin(), outcome.log.end(), isBroken))
        << testing::PrintToString(outcome.log);
    if (undisturbed_.iResult == outcome.iResult && undisturbed_.log == outcome.log) {
        EXPECT_EQ(undisturbed_.jOutput, outcome.jOutput);
        return;
    }
    EXPECT_EQ(-1, outcome.iResult);
    ASSERT_FALSE(outcome.log.empty());
    EXPECT_TRUE(isErrorOfDisk(outcome.log[0])) << outcome.log[0];
    if (!outcome.jOutput.isArray()) {
        EXPECT_EQ(json(operation().szOutput), outcome.jOutput);
        return;
    }
    // A list keeps the rows before the failure.
    ASSERT_LE(outcome.jOutput.size(), undisturbed_.jOutput.size());
    for (Json::ArrayIndex i = 0; i < outcome.jOutput.size(); ++i)
        EXPECT_EQ(undisturbed_.jOutput[i], outcome.jOutput[i]);
}

void FileFaults::tryEveryPoint(const DiskFile& file)
{
    learnUndisturbed(file);
    int nFailing = 0;
    int iFailed = 0;
    do {
        ++nFailing;
        SCOPED_TRACE("at operation " + std::to_string(nFailing) + " of the disk");
        file.restore();
        const sqlite3_int64 lMemory = sqlite3_memory_used();
        {
            Host host(file);
            const Outcome outcome = run(host, nFailing);
            iFailed = failed();
            EXPECT_EQ(1U, takeStatements().size()) << "was tried again";
            expectFailureOrUndisturbed(outcome);
            EXPECT_TRUE(0 < iFailed || undisturbed_.log == outcome.log);
            if (-1 == outcome.iResult)
                expectNothingLeft(host, file, {strBefore_, strAfterwards_});
            else
                expectNothingLeft(host, file, {strAfterwards_});
        }
        EXPECT_EQ(lMemory, sqlite3_memory_used());
        Figures::of("file faults, findings") += HasFailure() ? 1 : 0;
        if (HasFailure()) return;
    } while (0 < iFailed);
    Figures::of("file faults, points failed") += nFailing - 1;
    ++Figures::of("file faults, loops that reached their end");
}

TEST_P(FileFaults, LeaveNothingBehind)
{
    for (int iPageSize : isLongRun() ? std::vector<int>{512, 1024, 4096} : std::vector<int>{512})
        tryEveryPoint(DiskFile(form(iPageSize)));
}

std::string nameOf(const testing::TestParamInfo<FileFaults::ParamType>& info)
{
    std::string strName = Journal::kWal == std::get<Journal>(info.param) ? "wal_" : "delete_";
    strName.append(std::get<Operation>(info.param).szName).append("_");
    strName += std::get<Fault>(info.param).szName;
    std::replace(strName.begin(), strName.end(), ' ', '_');
    return strName;
}

INSTANTIATE_TEST_SUITE_P(Disk, FileFaults,
                         testing::Combine(testing::Values(Journal::kDelete, Journal::kWal),
                                          testing::ValuesIn(operations()),
                                          testing::ValuesIn(faults())),
                         nameOf);

// Without it a loop could end at its first point and prove nothing.
TEST(FileFaultsReach, EveryKindOfOperation)
{
    std::map<Kind, int> reached;
    for (const Operation& operation : operations())
        for (Journal journal : {Journal::kDelete, Journal::kWal}) {
            const DiskFile file({journal, operation.blWithRecords});
            Host host(file);
            follow({kEverythingButLocks, [](int) { return false; }});
            Json::Value jOutput = json(operation.szOutput);
            operation.run(host, jOutput);
            lift();
            takeLog();
            EXPECT_LT(0, counted(kRead)) << operation.szName;
            for (Kind kind : kKinds) reached[kind] += counted(kind);
        }
    for (Kind kind : kKinds) EXPECT_LT(0, reached[kind]) << kind;
}

}  // namespace
