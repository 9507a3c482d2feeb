// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
#include "crash/model.h"

#include "support/connection.h"
#include "support/json_text.h"

#include <iterator>

// On the output of the test: nothing is logged unless an operation fails.
bool blLogToStdout = true;
bool blDebugOutput = false;

namespace {

constexpr char kCreate[] =
    "create table if not exists item (data text, id integer primary key, kind text,"
    " rev integer, text text);create index if not exists item_rev on item (rev)";
constexpr char kDefinition[] = R"({"item": {"member": {
    "data": {"cpptype": "Json::objectValue"}, "id": {"cpptype": "int"},
    "kind": {"cpptype": "string"}, "rev": {"cpptype": "int"}, "text": {"cpptype": "string"}}}})";

constexpr int kKinds = 7;
constexpr std::size_t kFewRecords = 40;
constexpr std::size_t kManyRecords = 200;
constexpr const char* kPieces[] = {"a",  "record ", "'", "\"", "%s", "%",
                                   "\n", "\\",      "ä", "日", ";",  "--"};

std::string kindOf(int iId)
{
    return "kind" + std::to_string(iId % kKinds);
}

// The members that a new revision changes.
Json::Value revision(int iRevision)
{
    std::mt19937 random(static_cast<unsigned>(iRevision));
    Json::Value jRevision;
    jRevision["rev"] = iRevision;
    jRevision["data"]["of"]["revision"] = iRevision;
    for (unsigned long i = random() % 4; 0 < i; --i)
        jRevision["data"]["list"].append(static_cast<int>(random() % 1000));
    // Most texts fit a page, some need many pages of their own.
    std::string strText;
    for (unsigned long i = 0 == random() % 8 ? random() % 8000 : random() % 60; 0 < i; --i)
        strText += kPieces[random() % std::size(kPieces)];
    jRevision["text"] = strText;
    return jRevision;
}

Json::Value record(int iId, int iRevision)
{
    Json::Value jRecord = revision(iRevision);
    jRecord["id"] = iId;
    jRecord["kind"] = kindOf(iId);
    return jRecord;
}

void applyStep(State& state, const Step& step)
{
    switch (step.kind) {
    case Step::kCreate:
    case Step::kReplace:
    case Step::kUpdate: state[step.iId] = step.iRevision; break;
    case Step::kUpdateKind:
        for (auto& [iId, iRevision] : state)
            if (kindOf(iId) == kindOf(step.iId)) iRevision = step.iRevision;
        break;
    case Step::kDelete: state.erase(step.iId); break;
    case Step::kDeleteKind:
        for (auto it = state.begin(); it != state.end();)
            it = kindOf(it->first) == kindOf(step.iId) ? state.erase(it) : std::next(it);
        break;
    }
}

Step planStep(const State& state, std::mt19937& random, int& iRevision)
{
    constexpr Step::Kind kinds[] = {Step::kCreate,  Step::kCreate,     Step::kCreate,
                                    Step::kReplace, Step::kReplace,    Step::kUpdate,
                                    Step::kUpdate,  Step::kUpdateKind, Step::kDelete};
    Step::Kind kind = kinds[random() % std::size(kinds)];
    if (state.size() < kFewRecords) kind = Step::kCreate;
    if (state.size() > kManyRecords) kind = Step::kDeleteKind;
    ++iRevision;
    if (Step::kCreate == kind) return {kind, iRevision, iRevision};
    const auto nth = static_cast<State::difference_type>(random() % state.size());
    return {kind, std::next(state.begin(), nth)->first, iRevision};
}

bool performStep(Store& store, const Step& step)
{
    Json::Value jRecord = record(step.iId, step.iRevision);
    const Json::Value jWritten = jRecord;
    Json::Value jRevision = revision(step.iRevision);
    Json::Value jFilter;
    Json::Value jStored;
    switch (step.kind) {
    case Step::kCreate: return 0 == store.api.recCreate(jRecord, jStored) && jWritten == jStored;
    case Step::kReplace: return 0 == store.api.recSave(jRecord, false) && jWritten == jRecord;
    case Step::kUpdateKind:
    case Step::kDeleteKind: jFilter["kind"] = jRecord["kind"]; break;
    default: jFilter["id"] = step.iId; break;
    }
    if (Step::kDelete == step.kind || Step::kDeleteKind == step.kind)
        return 0 < store.api.recDelete(jFilter);
    return 0 == store.api.recUpdateByFilter(jFilter, jRevision) && 0 < sqlite3_changes(store.pDb);
}

// The first difference; empty when there is none.
std::string difference(const Json::Value& jRecords, State state)
{
    for (const Json::Value& jRecord : jRecords) {
        const int iId = jRecord["id"].asInt();
        const std::string strRecord = "record " + std::to_string(iId);
        const auto it = state.find(iId);
        if (state.end() == it) return strRecord + " should not be there";
        if (record(iId, it->second) != jRecord)
            return strRecord + " is not revision " + std::to_string(it->second);
        state.erase(it);
    }
    return state.empty() ? "" : "record " + std::to_string(state.begin()->first) + " is lost";
}

// SQL of the host itself; false when SQLite refuses.
bool run(Store& store, const char* szSql)
{
    return sqlite::value(store.pDb, szSql).empty();
}

void compare(const Json::Value& jRecords, const Expected& expected, Verdict& verdict)
{
    verdict.strWrong = difference(jRecords, expected.state);
    if (!expected.pending) return;
    verdict.pending = Verdict::kAbsent;
    if (verdict.strWrong.empty()) return;
    const std::string strWhole = difference(jRecords, after(expected.state, *expected.pending));
    if (strWhole.empty()) {
        verdict.pending = Verdict::kWhole;
        verdict.strWrong.clear();
    } else {
        verdict.strWrong += "; with the operation: " + strWhole;
    }
}

}  // namespace

Store::Store(const std::string& strPath)
    : pDb(sqlite::opened(strPath)),
      strCreate(kCreate),
      jDefinition(leftByReader(kDefinition)),
      api(pDb, strName, jDefinition, strCreate)
{
}

Store::~Store()
{
    sqlite3_close_v2(pDb);
}

bool Store::list(Json::Value& jRecords)
{
    Json::Value jAll;
    return 0 == api.recList(jAll, jRecords);
}

State after(State state, const Operation& operation)
{
    if (Operation::kRollback == operation.frame) return state;
    for (const Step& step : operation.steps) applyStep(state, step);
    return state;
}

Operation plan(const State& state, std::mt19937& random, int& iRevision)
{
    constexpr Operation::Frame frames[] = {Operation::kAlone, Operation::kAlone, Operation::kAlone,
                                           Operation::kCommit, Operation::kRollback};
    Operation operation;
    operation.frame = frames[random() % std::size(frames)];
    State next = state;
    const unsigned long uSteps = Operation::kAlone == operation.frame ? 1 : 2 + random() % 9;
    for (unsigned long i = 0; i < uSteps; ++i) {
        operation.steps.push_back(planStep(next, random, iRevision));
        applyStep(next, operation.steps.back());
    }
    return operation;
}

bool perform(Store& store, const Operation& operation)
{
    const bool blAlone = Operation::kAlone == operation.frame;
    if (!blAlone && !run(store, "begin immediate")) return false;
    for (const Step& step : operation.steps)
        if (!performStep(store, step)) return false;
    return blAlone || run(store, Operation::kCommit == operation.frame ? "commit" : "rollback");
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
    const std::string strIntegrity = sqlite::value(store.pDb, "pragma integrity_check");
    if ("ok" != strIntegrity) verdict.strCorrupt = strIntegrity;
    if (nullptr != sqlite3_next_stmt(store.pDb, nullptr))
        verdict.strCorrupt += " a statement was left open";
    return verdict;
}
