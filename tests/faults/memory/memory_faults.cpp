// SPDX-License-Identifier: MIT
// Fails each allocation of each operation, alone and with all that follow, and looks after each
// whether the call ended as it may, whether the connection is sound and whether the handle goes on.

#include "allocators.h"
#include "figures.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <ctime>

namespace {

using allocators::Fault;
using allocators::Kind;

class MemoryFaults : public testing::TestWithParam<Fault> {};

TEST_P(MemoryFaults, OfEveryAllocation)
{
    if (Kind::kMalloc == GetParam().kind && !allocators::ownMalloc())
        GTEST_SKIP() << "malloc cannot be replaced beside the one of a sanitizer";
    Figures figures;
    for (const Case& row : everyCase()) EXPECT_EQ("", failEach(row, GetParam(), atPoint, figures));
    EXPECT_LT(0, figures.iPoints);
    figures.print(nameOf(GetParam()));
}

// The faults of every allocator, once, are those of each.
INSTANTIATE_TEST_SUITE_P(Sqlite, MemoryFaults,
                         testing::Values(Fault{Kind::kSqlite, 0, false},
                                         Fault{Kind::kSqlite, 0, true}));
INSTANTIATE_TEST_SUITE_P(New, MemoryFaults,
                         testing::Values(Fault{Kind::kNew, 0, false}, Fault{Kind::kNew, 0, true}));
INSTANTIATE_TEST_SUITE_P(Malloc, MemoryFaults,
                         testing::Values(Fault{Kind::kMalloc, 0, false},
                                         Fault{Kind::kMalloc, 0, true}));
INSTANTIATE_TEST_SUITE_P(Every, MemoryFaults, testing::Values(Fault{Kind::kEvery, 0, true}));

}  // namespace

int main(int argc, char** argv)
{
    // glibc falls silently back to UTC when it has no memory to read the zone.
    setenv("TZ", "EET-2", 1);
    tzset();
    allocators::install();
    testing::InitGoogleTest(&argc, argv);
    return RUN_ALL_TESTS();
}
