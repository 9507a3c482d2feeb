// SPDX-License-Identifier: MIT
// What the tests of held locks share: an operation on a connection that holds its pages in memory
// already, so that it only has to lock the file.
#pragma once

#include "faults/files/fault_vfs.h"
#include "faults/files/operations.h"
#include "support/figures.h"
#include "support/records.h"

#include <functional>
#include <stdexcept>
#include <string>
#include <vector>

// The locks of an INSERT with its re-selection. Those of the INSERT are SHARED, RESERVED and
// EXCLUSIVE, in this order.
constexpr int kLocksOfInsert = 3;
constexpr int kReselection = kLocksOfInsert + 1;

inline const Operation& operation(const std::string& strName)
{
    for (const Operation& candidate : operations())
        if (strName == candidate.szName) return candidate;
    throw std::invalid_argument(strName);
}

// Which locks are held.
using Held = std::function<bool(int n)>;

inline Held onlyLock(int nHeld)
{
    return [nHeld](int n) { return n == nHeld; };
}

// The n-th lock of each of so many attempts.
inline Held lockOfAttempts(int nHeld, int nAttempts)
{
    return [=](int n) { return 0 == n % nHeld && n / nHeld <= nAttempts; };
}

inline bool everyLock(int)
{
    return true;
}

class Busy : public HostTest {
protected:
    explicit Busy(const char* szColumns = kWithoutKeys)
        : file_({Journal::kDelete, true, 4096, szColumns}), host_(file_)
    {
        // No page has to be written before the statement's end, which would take a lock as well.
        host_.database.run("pragma cache_size=1000");
    }

    ~Busy() override { Figures::of("locks, findings") += HasFailure() ? 1 : 0; }

    // The result, after the output.
    int run(const char* szOperation, const Held& held)
    {
        jOutput_ = json(operation(szOperation).szOutput);
        takeStatements();
        fault_vfs::follow({fault_vfs::kLock, held});
        const int iResult = operation(szOperation).run(host_, jOutput_);
        fault_vfs::lift();
        const std::size_t nSleeps = doubles::state().sleeps.size();
        EXPECT_EQ(std::vector<unsigned>(nSleeps, 10000), doubles::state().sleeps);
        doubles::state().sleeps.clear();
        statements_ = takeStatements();
        EXPECT_EQ(std::vector<std::string>(statements_.size(), statements_.at(0)), statements_);
        EXPECT_EQ(-1 == iResult && 500 == nSleeps ? 500 : nSleeps + 1, statements_.size());
        Figures::of("locks, points failed") += fault_vfs::failed();
        return iResult;
    }

    int nAttempts() const { return static_cast<int>(statements_.size()); }

    // The rows that the operation added.
    int nAdded()
    {
        return std::stoi(host_.database.value("select count(*) from records")) - kRecords;
    }

    const DiskFile file_;
    Host host_;
    Json::Value jOutput_;
    std::vector<std::string> statements_;
};
