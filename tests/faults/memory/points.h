// SPDX-License-Identifier: MIT
// One fault point: a call of a case during which an allocation fails, and everything that has to
// hold afterwards.
#pragma once

#include "faults/memory/allocators.h"
#include "faults/memory/cases.h"

enum class Ending { kAsUndisturbed, kRefused, kBadAlloc, kRuntimeError, kLogicError, kOther };

// Plain data: a child process sends it to its parent.
struct Point {
    bool blFailed = false;  // an allocation did fail; otherwise the loop has reached its end
    Ending ending = Ending::kAsUndisturbed;
    // Blocks that are allocated since the point began, after everything of the host was released.
    // They may only be the library's own that last as long as the process.
    allocators::Blocks kept;
    char szProblem[1000] = {};  // empty when all is well
};

Point atPoint(const Case& row, const allocators::Fault& fault);
