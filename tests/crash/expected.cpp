// SPDX-License-Identifier: MIT
#include "crash/expected.h"

#include <algorithm>

namespace {

// The first difference; empty when there is none.
std::string difference(const Json::Value& jRecords, State state)
{
    for (const Json::Value& jRecord : jRecords) {
        const int iId = jRecord["id"].asInt();
        const auto it = state.find(iId);
        if (state.end() == it) return "record " + std::to_string(iId) + " should not be there";
        if (record(iId, it->second) != jRecord)
            return "record " + std::to_string(iId) + " is not revision " +
                   std::to_string(it->second);
        state.erase(it);
    }
    return state.empty() ? "" : "record " + std::to_string(state.begin()->first) + " is lost";
}

void compare(const Json::Value& jRecords, const Expected& expected, Verdict& verdict)
{
    const std::string strDifference = difference(jRecords, expected.state);
    if (expected.pending) verdict.pending = Verdict::kAbsent;
    if (strDifference.empty()) return;
    verdict.strWrong = strDifference;
    if (!expected.pending) return;
    const std::string strWhole = difference(jRecords, after(expected.state, *expected.pending));
    if (strWhole.empty()) {
        verdict.pending = Verdict::kWhole;
        verdict.strWrong.clear();
    } else {
        verdict.strWrong += "; with the operation [" + toLine(*expected.pending) + "]: " + strWhole;
    }
}

}  // namespace

bool Expected::take(const std::string& strLine)
{
    const std::string strBegin = "begin ";
    if ("open" == strLine || "ready" == strLine) return true;
    if ("done" == strLine && pending) {
        state = after(state, *pending);
        pending.reset();
        ++iAcknowledged;
        return true;
    }
    if (0 != strLine.find(strBegin) || pending) return false;
    pending.emplace();
    if (!fromLine(strLine.substr(strBegin.size()), *pending)) return false;
    for (const Step& step : pending->steps) iLastRevision = std::max(iLastRevision, step.iRevision);
    return true;
}

Verdict check(const std::string& strPath, const Expected& expected)
{
    Verdict verdict;
    Store store(strPath);
    Json::Value jRecords(Json::arrayValue);
    if (store.list(jRecords))
        compare(jRecords, expected, verdict);
    else
        verdict.strWrong = "the records cannot be listed";
    const std::string strIntegrity = store.value("pragma integrity_check");
    if ("ok" != strIntegrity) verdict.strCorrupt = strIntegrity;
    if (!store.close()) verdict.strCorrupt += " a statement was left open";
    return verdict;
}
