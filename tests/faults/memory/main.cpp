// SPDX-License-Identifier: MIT
#include "faults/memory/allocators.h"

#include <gtest/gtest.h>

#include <cstdlib>

int main(int argc, char** argv)
{
    setenv("TZ", "EET-2", 1);
    allocators::install();
    testing::InitGoogleTest(&argc, argv);
    return RUN_ALL_TESTS();
}
