// SPDX-License-Identifier: MIT
#include "crash/operation.h"

#include <iterator>
#include <sstream>

namespace {

constexpr std::size_t kFewRecords = 40;
constexpr std::size_t kManyRecords = 200;

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
    case Step::kEnd: break;
    }
}

Step::Kind planKind(std::size_t nRecords, std::mt19937& random)
{
    if (nRecords < kFewRecords) return Step::kCreate;
    if (nRecords > kManyRecords) return Step::kDeleteKind;
    constexpr Step::Kind kinds[] = {Step::kCreate,  Step::kCreate,     Step::kCreate,
                                    Step::kReplace, Step::kReplace,    Step::kUpdate,
                                    Step::kUpdate,  Step::kUpdateKind, Step::kDelete};
    return kinds[random() % std::size(kinds)];
}

Step planStep(const State& state, std::mt19937& random, int& iRevision)
{
    const Step::Kind kind = planKind(state.size(), random);
    ++iRevision;
    if (Step::kCreate == kind) return {kind, iRevision, iRevision};
    const auto nth = static_cast<State::difference_type>(random() % state.size());
    return {kind, std::next(state.begin(), nth)->first, iRevision};
}

bool create(Store& store, const Step& step)
{
    Json::Value jRecord = record(step.iId, step.iRevision);
    Json::Value jStored;
    return 0 == store.api().recCreate(jRecord, jStored) && jRecord == jStored;
}

bool replace(Store& store, const Step& step)
{
    Json::Value jRecord = record(step.iId, step.iRevision);
    return 0 == store.api().recSave(jRecord, false) && record(step.iId, step.iRevision) == jRecord;
}

Json::Value filterOf(const Step& step)
{
    Json::Value jFilter;
    if (Step::kUpdateKind == step.kind || Step::kDeleteKind == step.kind)
        jFilter["kind"] = kindOf(step.iId);
    else
        jFilter["id"] = step.iId;
    return jFilter;
}

bool update(Store& store, const Step& step)
{
    Json::Value jFilter = filterOf(step);
    Json::Value jRevision = revision(step.iRevision);
    return 0 == store.api().recUpdateByFilter(jFilter, jRevision) &&
           0 < sqlite3_changes(store.connection());
}

bool remove(Store& store, const Step& step)
{
    Json::Value jFilter = filterOf(step);
    return 0 < store.api().recDelete(jFilter);
}

bool performStep(Store& store, const Step& step)
{
    switch (step.kind) {
    case Step::kCreate: return create(store, step);
    case Step::kReplace: return replace(store, step);
    case Step::kUpdate:
    case Step::kUpdateKind: return update(store, step);
    case Step::kDelete:
    case Step::kDeleteKind: return remove(store, step);
    case Step::kEnd: break;
    }
    return false;
}

}  // namespace

std::string toLine(const Operation& operation)
{
    std::ostringstream line;
    line << operation.frame << ' ' << operation.steps.size();
    for (const Step& step : operation.steps)
        line << ' ' << step.kind << ' ' << step.iId << ' ' << step.iRevision;
    return line.str();
}

bool fromLine(const std::string& strLine, Operation& operation)
{
    std::istringstream line(strLine);
    int iFrame = 0;
    std::size_t nSteps = 0;
    if (!(line >> iFrame >> nSteps) || iFrame < Operation::kAlone || iFrame > Operation::kRollback)
        return false;
    operation = {static_cast<Operation::Frame>(iFrame), {}};
    for (std::size_t i = 0; i < nSteps; ++i) {
        int iKind = 0;
        Step step{};
        if (!(line >> iKind >> step.iId >> step.iRevision) || iKind < 0 || iKind >= Step::kEnd)
            return false;
        step.kind = static_cast<Step::Kind>(iKind);
        operation.steps.push_back(step);
    }
    return line.peek() == std::istringstream::traits_type::eof();
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
    if (!blAlone && !store.run("begin immediate")) return false;
    for (const Step& step : operation.steps)
        if (!performStep(store, step)) return false;
    return blAlone || store.run(Operation::kCommit == operation.frame ? "commit" : "rollback");
}
