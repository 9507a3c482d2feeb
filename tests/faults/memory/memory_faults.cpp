// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// Fails each allocation of each operation, alone and with all that follow, and checks each time
// that the call ended in an allowed way and that connection and handle still work.

#include "faults/memory/points.h"
#include "faults/memory/store.h"
#include "support/figures.h"

#include <gtest/gtest.h>

#include <sys/mman.h>
#include <sys/wait.h>
#include <unistd.h>
#include <cstdio>
#include <cstdlib>
#include <ctime>
#include <new>
#include <string>

namespace {

using allocators::Fault;
using allocators::Kind;

struct Trial {
    const char* szName;
    Fault fault;
    const char* szFigure;
    // While the library is used for the first time in a process: its reader and writer of JSON
    // text, its member types and the names of columns are made then.
    bool blFirstUse;
};

// Those of the first use have to come first. Failing every allocator once is covered by failing
// each one once.
const Trial kTrials[] = {
    {"first_use_new", {Kind::kNew, 0, false}, "operator new, once, first use", true},
    {"first_use_malloc", {Kind::kMalloc, 0, false}, "malloc, once, first use", true},
    {"first_use_every", {Kind::kEvery, 0, true}, "every allocator, from then on, first use", true},
    {"sqlite_once", {Kind::kSqlite, 0, false}, "SQLite, once", false},
    {"sqlite_from_then_on", {Kind::kSqlite, 0, true}, "SQLite, from then on", false},
    {"new_once", {Kind::kNew, 0, false}, "operator new, once", false},
    {"new_from_then_on", {Kind::kNew, 0, true}, "operator new, from then on", false},
    {"malloc_once", {Kind::kMalloc, 0, false}, "malloc, once", false},
    {"malloc_from_then_on", {Kind::kMalloc, 0, true}, "malloc, from then on", false},
    {"every_from_then_on", {Kind::kEvery, 0, true}, "every allocator, from then on", false},
};

class MemoryFaults : public testing::TestWithParam<Trial> {
protected:
    static long long& figure(const std::string& strWhat)
    {
        return Figures::of(std::string("memory faults, ") + GetParam().szFigure + ", " + strWhat);
    }

    static Point pointOf(const Case& row, const Fault& fault)
    {
        static bool blUsed = false;
        blUsed = blUsed || !GetParam().blFirstUse;
        if (!GetParam().blFirstUse) return atPoint(row, fault);
        EXPECT_FALSE(blUsed) << "the library was used before in this process";
        return inChild(row, fault);
    }

    // Fails each allocation of the case, from the first to the last.
    void failEach(const Case& row)
    {
        Fault fault = GetParam().fault;
        // The first fills what lasts as long as the process.
        pointOf(row, fault);
        const Point undisturbed = pointOf(row, fault);
        report(row, fault, undisturbed.szProblem);
        if ('\0' != *undisturbed.szProblem) return;
        const allocators::Blocks& allowed = undisturbed.kept;
        for (fault.iNth = 1;; ++fault.iNth) {
            const Point point = pointOf(row, fault);
            report(row, fault, point.szProblem);
            if ('\0' == *point.szProblem &&
                (point.kept.nNew != allowed.nNew || point.kept.nMalloc != allowed.nMalloc))
                report(row, fault,
                       "leaked " + std::to_string(point.kept.nNew - allowed.nNew) +
                           " blocks of new, " +
                           std::to_string(point.kept.nMalloc - allowed.nMalloc) + " of malloc");
            if (!point.blFailed) return;
            ++figure("points failed");
            ++figure(point.szEnding);
        }
    }

private:
    // In a separate process.
    static Point inChild(const Case& row, const Fault& fault)
    {
        static void* const pShared =
            mmap(nullptr, sizeof(Point), PROT_READ | PROT_WRITE, MAP_SHARED | MAP_ANONYMOUS, -1, 0);
        Point* const pPoint = new (pShared) Point;
        const pid_t child = fork();
        if (0 == child) {
            *pPoint = atPoint(row, fault);
            _exit(0);
        }
        int iStatus = 0;
        if (child != waitpid(child, &iStatus, 0)) abort();
        if (0 != iStatus) {
            pPoint->blFailed = true;
            snprintf(pPoint->szProblem, sizeof(pPoint->szProblem),
                     "the process ended with status %d", iStatus);
        }
        return *pPoint;
    }

    void report(const Case& row, const Fault& fault, const std::string& strProblem)
    {
        if (strProblem.empty()) return;
        ++figure("findings");
        ADD_FAILURE() << row.szName << ", allocation " << fault.iNth << ": " << strProblem;
    }
};

TEST_P(MemoryFaults, AreHandledAtEveryAllocation)
{
    if (Kind::kMalloc == GetParam().fault.kind && !allocators::kOwnMalloc)
        GTEST_SKIP() << "malloc cannot be replaced beside the one of a sanitizer";
    // glibc silently falls back to UTC if it has no memory to read the zone.
    tzset();
    const Store theFileIsMadeOnce;
    figure("findings") = 0;
    for (const char* szEnding : {"absorbed", "result -1", "std::bad_alloc", "Json::RuntimeError",
                                 "std::logic_error", "another exception"})
        figure(szEnding) = 0;
    for (const Case& row : kCases)
        if (!GetParam().blFirstUse || row.blFirstUse || nullptr != getenv("VORN_SOAK"))
            failEach(row);
    EXPECT_LT(0, figure("points failed"));
}

INSTANTIATE_TEST_SUITE_P(Host, MemoryFaults, testing::ValuesIn(kTrials),
                         [](const auto& tested) { return std::string(tested.param.szName); });

}  // namespace

int main(int argc, char** argv)
{
    setenv("TZ", "EET-2", 1);
    allocators::install();
    testing::InitGoogleTest(&argc, argv);
    // A filter that selects nothing proves nothing.
    const int iStatus = RUN_ALL_TESTS();
    return 0 < testing::UnitTest::GetInstance()->test_to_run_count() ? iStatus : 1;
}
