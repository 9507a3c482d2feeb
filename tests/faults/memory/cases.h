// SPDX-License-Identifier: MIT
// Every operation of the library as a host calls it, a row per case: on success, on a failed check
// and on a refused statement.
#pragma once

#include <VornJsonDbApi.h>
#include <sqlite3.h>

#include <optional>
#include <string>
#include <vector>

// What a host holds for one call. The call itself allocates nothing of its own.
struct Call {
    sqlite3* pDb = nullptr;
    std::string strName;
    Json::Value jDefinition;
    std::string strCreate;
    std::optional<VornJsonDbApi> api;

    Json::Value jFirst;
    Json::Value jSecond;
    std::string strText;
    std::vector<std::string> strVector;
    std::string strKey;
    long now = 0;
    const Json::Value* pjResult = nullptr;  // what recType referred to
};

// szState is a JSON object with what the call begins with:
//
//     "handle"          false: there is none yet
//     "name", "create"  of the handle, otherwise the table task
//     "sql"             run by the host before
//     "message"         what getErrMsg returns before
//     "first", "second", "text", "vector", "key": the arguments
//
// szChange is a JSON object with what an undisturbed call changes:
//
//     "result"          0 where it is left out, "Json::LogicError" where that is thrown
//     "first", "second", "text", "message", "now", "type", "rows", "made": afterwards, otherwise as
//                       before
//     "grows"           "thrown": where it throws without memory, an output may end between before
//     and
//                       after; "refused": also where it gives -1
//     "silent"          true: the result does not tell whether the rows were written
struct Case {
    const char* szName;
    int (*call)(Call& call);
    const char* szState;
    const char* szChange;
};

using Cases = std::vector<Case>;

extern const Cases kHandleCases;
extern const Cases kSaveCases;
extern const Cases kListCases;
extern const Cases kUpdateCases;
extern const Cases kDeleteCases;
extern const Cases kValidationCases;
extern const Cases kBuilderCases;
extern const Cases kTermCases;
extern const Cases kFreeCases;

// All of them.
Cases everyCase();
