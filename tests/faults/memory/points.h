// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// One fault point: a call of a case during which an allocation fails, and everything that has to
// hold afterwards.
#pragma once

#include "faults/memory/allocators.h"

#include <vector>

// Every operation of the library as a host calls it, a row per case: on success, on a failed check
// and on a refused statement.
//
// The first word of szName is the function.
//
// szState is a JSON object with what the call begins with:
//
//     "handle"          false: there is none yet
//     "name", "create"  of the handle, otherwise the table task
//     "sql"             run by the host before
//     "message"         what getErrMsg returns before
//     and the arguments as Call takes them; "text" is "begin (" and "second" is "before" where they
//     are left out
//
// szChange is a JSON object with what an undisturbed call changes, a result of -1 where it is left
// out:
//
//     "result"          0 if it is left out, "Json::LogicError" if that is thrown
//     "first", "second", "text", "message", "now", "type", "rows", "made": afterwards, otherwise as
//                       before
//     "grows"           "thrown": if it throws without memory, an output may end between before
//                       and after; "refused": also if it returns -1
//     "silent"          true: the result does not tell whether the rows were written
constexpr char kFailure[] = R"({"result": -1})";
struct Case {
    const char* szName;
    const char* szState;
    const char* szChange = kFailure;
    // Whatever is made when the library is used for the first time is made in one of these.
    bool blFirstUse = false;
};

extern const std::vector<Case> kCases;

struct Point {
    bool blFailed = false;  // an allocation did fail; otherwise the loop has reached its end
    const char* szEnding = "";
    // Blocks that are allocated since the point began, after everything of the host was released.
    // They may only be the library's own that last as long as the process.
    allocators::Blocks kept;
    char szProblem[1000] = {};  // empty when all is well
};

Point atPoint(const Case& row, const allocators::Fault& fault);
