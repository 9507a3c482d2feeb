// SPDX-License-Identifier: MIT
// Every operation of the library as a host calls it, a row per case: on success, on a failed check
// and on a refused statement.
#pragma once

#include <vector>

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
// szChange is a JSON object with what an undisturbed call changes:
//
//     "result"          0 where it is left out, "Json::LogicError" where that is thrown
//     "first", "second", "text", "message", "now", "type", "rows", "made": afterwards, otherwise as
//                       before
//     "grows"           "thrown": where it throws without memory, an output may end between before
//                       and after; "refused": also where it gives -1
//     "silent"          true: the result does not tell whether the rows were written
struct Case {
    const char* szName;
    const char* szState;
    const char* szChange;
};

extern const std::vector<Case> kCases;
