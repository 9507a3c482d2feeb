// SPDX-License-Identifier: MIT
// The same faults while the library is used for the first time in a process: its reader and writer
// of JSON text, its member types and the names of columns are made then. So each point is a process
// of its own.

#include "allocators.h"
#include "figures.h"
#include "store.h"

#include <gtest/gtest.h>

#include <sys/wait.h>
#include <unistd.h>
#include <cstdio>
#include <cstdlib>
#include <ctime>
#include <set>
#include <string>

namespace {

using allocators::Fault;
using allocators::Kind;

// What the child has written, or how it ended instead.
Point received(pid_t child, int iRead)
{
    Point point;
    const ssize_t nRead = read(iRead, &point, sizeof(point));
    int iStatus = 0;
    if (child != waitpid(child, &iStatus, 0)) abort();
    if (0 == iStatus && static_cast<ssize_t>(sizeof(point)) == nRead) return point;
    Point crashed;
    crashed.blFailed = true;
    snprintf(crashed.szProblem, sizeof(crashed.szProblem), "the process ended with status %d",
             iStatus);
    return crashed;
}

Point inChild(const Case& row, const Fault& fault)
{
    int iPipe[2];
    if (0 != pipe(iPipe)) abort();
    const pid_t child = fork();
    if (0 > child) abort();
    if (0 == child) {
        const Point point = atPoint(row, fault);
        _exit(sizeof(point) == write(iPipe[1], &point, sizeof(point)) ? 0 : 1);
    }
    close(iPipe[1]);
    const Point point = received(child, iPipe[0]);
    close(iPipe[0]);
    return point;
}

// Whatever is made at the first use is made in one of these. VORN_SOAK is for all.
bool isChosen(const Case& row)
{
    static const std::set<std::string> chosen = {
        "constructor",
        "recSave inserts",
        "recSave has no literal for a member",
        "recCreate of a wrong type",
        "recList of rows alike",
        "recList ends at a row that cannot be read",
        "recGetOne merges",
        "recUpdateByFilter is refused by a key",
        "recDeleteByArray is refused",
        "checkJsonType of a word that it does not know",
        "SqlExpandMemberSymbol of percent signs",
        "SqlFilterConditionFromJson",
        "recType of a definition that ends early",
        "recType of a table that is not defined",
    };
    return nullptr != getenv("VORN_SOAK") || 0 < chosen.count(row.szName);
}

class FirstUseFaults : public testing::TestWithParam<Fault> {};

TEST_P(FirstUseFaults, OfEveryAllocation)
{
    if (Kind::kMalloc == GetParam().kind && !allocators::ownMalloc())
        GTEST_SKIP() << "malloc cannot be replaced beside the one of a sanitizer";
    Figures figures;
    for (const Case& row : everyCase()) {
        if (!isChosen(row)) continue;
        EXPECT_EQ("", failEach(row, GetParam(), inChild, figures));
    }
    EXPECT_LT(0, figures.iPoints);
    figures.print(nameOf(GetParam()) + ", first use");
}

INSTANTIATE_TEST_SUITE_P(New, FirstUseFaults, testing::Values(Fault{Kind::kNew, 0, false}));
INSTANTIATE_TEST_SUITE_P(Malloc, FirstUseFaults, testing::Values(Fault{Kind::kMalloc, 0, false}));
INSTANTIATE_TEST_SUITE_P(Every, FirstUseFaults, testing::Values(Fault{Kind::kEvery, 0, true}));

}  // namespace

int main(int argc, char** argv)
{
    setenv("TZ", "EET-2", 1);
    tzset();
    allocators::install();
    const Store theFileIsMadeOnce;
    testing::InitGoogleTest(&argc, argv);
    return RUN_ALL_TESTS();
}
