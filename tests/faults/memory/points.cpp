// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
#include "faults/memory/points.h"

#include "faults/memory/store.h"
#include "support/calls.h"
#include "support/connection.h"
#include "support/json_text.h"

#include <cstdio>
#include <cstring>
#include <new>
#include <stdexcept>

namespace {

using allocators::Blocks;
using allocators::Fault;

// Whether an interrupted output is somewhere between before and after.
bool isBetween(const Json::Value& jBefore, const Json::Value& jAfter, const Json::Value& jNow)
{
    if (jNow == jBefore || jNow == jAfter) return true;
    if (jNow.type() != jAfter.type()) return false;
    if (jNow.isString()) {
        const std::string strNow = jNow.asString();
        return 0 == strNow.find(jBefore.asString()) && 0 == jAfter.asString().find(strNow);
    }
    if (jNow.isObject()) {
        // Each member is old or new, and none of the old ones is missing.
        for (const std::string& strKey : jBefore.getMemberNames())
            if (!jNow.isMember(strKey)) return false;
        for (const std::string& strKey : jNow.getMemberNames())
            if (jNow[strKey] != jAfter[strKey] && jNow[strKey] != jBefore[strKey]) return false;
        return true;
    }
    // The rows are the first of the new ones. The last may lack members: SQLite hands out a number
    // as NULL when there is no memory for its digits, and fails the statement after that row.
    if (!jNow.isArray() || jNow.size() < jBefore.size() || jAfter.size() < jNow.size())
        return false;
    for (Json::ArrayIndex i = 0; i < jNow.size(); ++i) {
        if (jNow[i] == jAfter[i]) continue;
        if (i + 1 < jNow.size() || !jNow[i].isObject()) return false;
        for (const std::string& strKey : jNow[i].getMemberNames())
            if (jNow[i][strKey] != jAfter[i][strKey]) return false;
    }
    return true;
}

void assign(Json::Value& jObject, const Json::Value& jMembers)
{
    for (const std::string& strKey : jMembers.getMemberNames()) jObject[strKey] = jMembers[strKey];
}

// The calls of one case on the host's connection.
class Attempt {
public:
    Attempt(const Case& row, Store& store)
        : szName_(row.szName), function_(Call::function(row.szName)), store_(store)
    {
        jState_["text"] = "begin (";
        jState_["second"] = "before";
        assign(jState_, leftByReader(row.szState));
        call_.pDb = store.get();
        call_.strTable = jState_.get("name", "task").asString();
        call_.jDefinition = leftByReader(kDefinition);
        const std::string strCreate =
            "create table if not exists " + call_.strTable + " (id integer primary key)";
        call_.strCreate = jState_.get("create", strCreate).asString();
        if (!jState_.isMember("handle")) Call::function("constructor")(call_);
        prepare();
        jBefore_ = outcome();
        jAfter_ = jBefore_;
        Json::Value jChange = leftByReader(row.szChange);
        strGrows_ = jChange.get("grows", "").asString();
        jChange.removeMember("grows");
        blSilent_ = jChange.removeMember("silent", nullptr);
        assign(jAfter_, jChange);
    }

    // Brings the arguments and the message back to what they are before the call, and runs the
    // host's SQL of the case.
    void prepare()
    {
        if (jState_.isMember("sql")) sqlite::run(call_.pDb, jState_["sql"].asString());
        call_.setArguments(jState_);
        if (nullptr != call_.pApi) call_.pApi->setErrMsg(jState_["message"].asString());
        jResult_ = 0;
    }

    // The call alone, with the fault armed; tells whether an allocation failed.
    bool call(const Fault& fault)
    {
        int iResult = 0;
        szThrown_ = nullptr;
        allocators::arm(fault);
        try {
            iResult = function_(call_);
        } catch (const std::bad_alloc&) {
            szThrown_ = "std::bad_alloc";
        } catch (const Json::RuntimeError&) {
            szThrown_ = "Json::RuntimeError";
        } catch (const Json::LogicError&) {
            szThrown_ = "Json::LogicError";
        } catch (const std::logic_error&) {
            szThrown_ = "std::logic_error";
        } catch (...) {
            szThrown_ = "another exception";
        }
        const int iFailed = allocators::disarm();
        jResult_ = nullptr == szThrown_ ? Json::Value(iResult) : Json::Value(szThrown_);
        return 0 < iFailed;
    }

    // The current state.
    Json::Value outcome()
    {
        Json::Value jOutcome;
        jOutcome["result"] = jResult_;
        jOutcome["first"] = call_.jFirst;
        jOutcome["second"] = call_.jSecond;
        jOutcome["text"] = call_.strText;
        jOutcome["message"] = nullptr == call_.pApi ? "" : call_.pApi->getErrMsg();
        jOutcome["now"] = Json::Int64(call_.now);
        jOutcome["type"] = nullptr == call_.pjResult ? Json::Value("none") : *call_.pjResult;
        jOutcome["rows"] = store_.rows();
        jOutcome["made"] = store_.hasMade();
        return jOutcome;
    }

    // Empty, or what is wrong after the call.
    std::string check(Point& point)
    {
        std::string strProblem = sqlite::whatIsStuck(store_.get(), store_.other());
        if (!strProblem.empty()) return strProblem;
        const Json::Value jOutcome = outcome();
        point.szEnding = jOutcome == jAfter_    ? "absorbed"
                         : nullptr == szThrown_ ? "result -1"
                                                : szThrown_;
        strProblem = whatIsWrong(jOutcome);
        if (!strProblem.empty()) return strProblem + ": " + text(jOutcome);

        // Twice: what the library keeps between statements is complete then.
        for (int i = 0; i < 2; ++i) {
            store_.restore();
            prepare();
            call(Fault());
            const Json::Value jAgain = outcome();
            if (jAgain != jAfter_)
                return "the next call: " + text(jAgain) + " instead of " + text(jAfter_);
        }
        if (0 < allocators::waits()) return "it waited for a lock";
        return sqlite::whatIsStuck(store_.get(), store_.other());
    }

private:
    // Empty, or what is wrong after a call that ran out of memory.
    std::string whatIsWrong(const Json::Value& jOutcome) const
    {
        if (jOutcome == jAfter_) return std::string();
        const bool blSilent = blSilent_ && jResult_ == jAfter_["result"];
        if (jResult_ != -1 && !blSilent && !mayThrow()) return "the result must not be";
        for (const char* szKey : {"rows", "made", "message"})
            if (jOutcome[szKey] != jBefore_[szKey] && jOutcome[szKey] != jAfter_[szKey])
                return szKey;
        const bool blGrows =
            "refused" == strGrows_ || ("thrown" == strGrows_ && nullptr != szThrown_);
        for (const char* szKey : {"first", "second", "text", "now", "type"}) {
            if (jOutcome[szKey] == jBefore_[szKey]) continue;
            if (!blGrows || !isBetween(jBefore_[szKey], jAfter_[szKey], jOutcome[szKey]))
                return szKey;
        }
        return std::string();
    }

    // Which exceptions the header names.
    bool mayThrow() const
    {
        if (jResult_ == "std::bad_alloc" || jResult_ == "Json::RuntimeError") return true;
        if (jResult_ != "std::logic_error") return false;
        for (const char* szName : {"recSave", "recCreate", "SqlExpandMemberSymbol"})
            if (0 == strncmp(szName_, szName, strlen(szName))) return true;
        return false;
    }

    const char* szName_;
    Call::Function function_;
    Store& store_;
    Call call_;
    Json::Value jState_;
    Json::Value jBefore_;
    Json::Value jAfter_;
    Json::Value jResult_;
    std::string strGrows_;
    bool blSilent_ = false;
    const char* szThrown_ = nullptr;
};

// Logs whole lines, so that no part of an earlier one is kept and the memory that the JSON writer
// keeps for lists is there.
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
        Attempt attempt(row, store);
        point.blFailed = attempt.call(fault);
        const std::string strProblem = attempt.check(point);
        strProblem.copy(point.szProblem, sizeof(point.szProblem) - 1);
    }
    const sqlite3_int64 nKept = sqlite3_memory_used() - nUsed;
    if ('\0' == *point.szProblem && 0 != nKept)
        snprintf(point.szProblem, sizeof(point.szProblem), "SQLite keeps %lld bytes", nKept);
    settle();
    point.kept = {allocators::blocks().nNew - blocks.nNew,
                  allocators::blocks().nMalloc - blocks.nMalloc};
    return point;
}
