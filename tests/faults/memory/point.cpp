// SPDX-License-Identifier: MIT
#include "point.h"

#include "host.h"
#include "json_of.h"
#include "outcome.h"
#include "store.h"

namespace {

using allocators::Blocks;
using allocators::Fault;

Ending endingOf(const Attempt& attempt, const Json::Value& jOutcome)
{
    if (jOutcome == attempt.after()) return Ending::kAsUndisturbed;
    if ("std::bad_alloc" == attempt.thrown()) return Ending::kBadAlloc;
    if ("Json::RuntimeError" == attempt.thrown()) return Ending::kRuntimeError;
    if ("std::logic_error" == attempt.thrown()) return Ending::kLogicError;
    return Ending::kRefused;
}

// Empty, or what is wrong after the call.
std::string check(Attempt& attempt, Store& store, Point& point)
{
    std::string strProblem = store.whatIsStuck();
    if (!strProblem.empty()) return strProblem;
    const Json::Value jOutcome = attempt.outcome();
    point.ending = endingOf(attempt, jOutcome);
    strProblem = whatIsWrong(attempt, jOutcome);
    if (!strProblem.empty()) return strProblem + ": " + textOf(jOutcome);

    // Twice: what the library keeps between statements is complete then.
    for (int i = 0; i < 2; ++i) {
        store.restore();
        attempt.prepare();
        attempt.call(Fault());
        const Json::Value jAgain = attempt.outcome();
        if (jAgain != attempt.after())
            return "the next call: " + textOf(jAgain) + " instead of " + textOf(attempt.after());
    }
    if (0 < host::waits()) return "it waited for a lock";
    return store.whatIsStuck();
}

// Lines of the log that are written whole: no part of an earlier one is kept, and what the writer
// of JSON keeps for lists is there.
void settle()
{
    Json::Value jNoTable;
    jNoTable["list"].append(1);
    std::string strNone;
    VORN_JSON_DB::recType(jNoTable, strNone);
}

}  // namespace

Point atPoint(const Case& row, const Fault& fault)
{
    Point point;
    const Blocks blocks = allocators::blocks();
    const sqlite3_int64 nUsed = sqlite3_memory_used();
    {
        Store store;
        std::string strProblem;
        {
            Attempt attempt(row, store);
            point.blFailed = attempt.call(fault);
            strProblem = check(attempt, store, point);
        }
        const std::string strClosed = store.close();
        if (strProblem.empty()) strProblem = strClosed;
        const sqlite3_int64 nKept = sqlite3_memory_used() - nUsed;
        if (strProblem.empty() && 0 != nKept)
            strProblem = "SQLite keeps " + std::to_string(nKept) + " bytes";
        strProblem.copy(point.szProblem, sizeof(point.szProblem) - 1);
    }
    settle();
    point.kept = {allocators::blocks().nNew - blocks.nNew,
                  allocators::blocks().nMalloc - blocks.nMalloc};
    return point;
}
