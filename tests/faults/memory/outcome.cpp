// SPDX-License-Identifier: MIT
#include "outcome.h"

#include "json_of.h"

#include <cstring>
#include <new>
#include <stdexcept>

namespace {

constexpr char kDefinition[] = R"({
    "task": {"member": {
        "any": {"cpptype": "Json::Value"}, "big": {"cpptype": "long long"},
        "data": {"cpptype": "Json::objectValue"}, "flag": {"cpptype": "bool"},
        "id": {"cpptype": "int"},
        "name": {"cpptype": "string", "cppDefaultValue": "somebody without a name of his own"},
        "rate": {"cpptype": "double"},
        "tags": {"cpptype": "Json::arrayValue", "cppDefaultValue": [1, 2]}}},
    "plain": {"member": {
        "data": {"cpptype": "Json::objectValue"}, "id": {"cpptype": "int"},
        "name": {"cpptype": "string"}}},
    "made": {"member": {"id": {"cpptype": "int"}}},
    "partial": {"member": {"a": {"cpptype": "int"}, "b": {}}},
    "words": {"member": {
        "a": {"cpptype": "string"}, "b": {"cpptype": "int"}, "c": {"cpptype": "unsigned int"},
        "d": {"cpptype": "unsigned long long"}, "e": {"cpptype": "float"},
        "f": {"cpptype": "double"}, "g": {"cpptype": "Json::arrayValue"}}}})";

bool isTextBetween(const std::string& strBefore, const std::string& strAfter,
                   const std::string& strNow)
{
    return 0 == strNow.compare(0, strBefore.size(), strBefore) &&
           0 == strAfter.compare(0, strNow.size(), strNow);
}

// Each member is old or new, and none of the old ones is missing.
bool isObjectBetween(const Json::Value& jBefore, const Json::Value& jAfter, const Json::Value& jNow)
{
    for (const std::string& strKey : jBefore.getMemberNames())
        if (!jNow.isMember(strKey)) return false;
    for (const std::string& strKey : jNow.getMemberNames())
        if (jNow[strKey] != jAfter[strKey] && jNow[strKey] != jBefore[strKey]) return false;
    return true;
}

// The rows are the first of the new ones. The last may lack members: SQLite hands out a number as
// NULL when there is no memory for its digits, and fails the statement behind that row.
bool isListBetween(const Json::Value& jBefore, const Json::Value& jAfter, const Json::Value& jNow)
{
    if (jNow.size() < jBefore.size() || jAfter.size() < jNow.size()) return false;
    for (Json::ArrayIndex i = 0; i < jNow.size(); ++i) {
        if (jNow[i] == jAfter[i]) continue;
        if (i + 1 < jNow.size() || !jNow[i].isObject()) return false;
        for (const std::string& strKey : jNow[i].getMemberNames())
            if (jNow[i][strKey] != jAfter[i][strKey]) return false;
    }
    return true;
}

// Whether an output that was being written ends somewhere on its way.
bool isBetween(const Json::Value& jBefore, const Json::Value& jAfter, const Json::Value& jNow)
{
    if (jNow == jBefore || jNow == jAfter) return true;
    if (jNow.type() != jAfter.type()) return false;
    if (jNow.isString())
        return isTextBetween(jBefore.asString(), jAfter.asString(), jNow.asString());
    if (jNow.isArray()) return isListBetween(jBefore, jAfter, jNow);
    return jNow.isObject() && isObjectBetween(jBefore, jAfter, jNow);
}

// Which exceptions the header names.
bool mayThrow(const Attempt& attempt)
{
    const std::string& strThrown = attempt.thrown();
    if ("std::bad_alloc" == strThrown || "Json::RuntimeError" == strThrown) return true;
    if ("std::logic_error" != strThrown) return false;
    for (const char* szName : {"recSave", "recCreate", "SqlExpandMemberSymbol"})
        if (0 == strncmp(attempt.name(), szName, strlen(szName))) return true;
    return false;
}

}  // namespace

Attempt::Attempt(const Case& row, Store& store)
    : row_(row), store_(store), jState_(jsonOf(row.szState))
{
    call_.pDb = store.get();
    call_.strName = jState_.get("name", "task").asString();
    call_.jDefinition = jsonOf(kDefinition);
    const std::string strCreate =
        "create table if not exists " + call_.strName + " (id integer primary key)";
    call_.strCreate = jState_.get("create", strCreate).asString();

    Json::Value jChange = jsonOf(row.szChange);
    strGrows_ = jChange.get("grows", "").asString();
    jChange.removeMember("grows");
    blSilent_ = jChange.removeMember("silent", nullptr);
    if (!jState_.isMember("handle"))
        call_.api.emplace(call_.pDb, call_.strName, call_.jDefinition, call_.strCreate);
    prepare();
    jBefore_ = outcome();
    jAfter_ = jBefore_;
    for (const std::string& strKey : jChange.getMemberNames()) jAfter_[strKey] = jChange[strKey];
}

void Attempt::prepare()
{
    if (jState_.isMember("sql")) Store::run(call_.pDb, jState_["sql"].asString());
    setArguments(jState_);
    iResult_ = 0;
    strThrown_.clear();
}

void Attempt::setArguments(const Json::Value& jState)
{
    call_.jFirst = jState["first"];
    call_.jSecond = jState["second"];
    call_.strText = jState["text"].asString();
    call_.strKey = jState["key"].asString();
    call_.strVector.clear();
    for (const Json::Value& jText : jState["vector"]) call_.strVector.push_back(jText.asString());
    call_.now = 0;
    call_.pjResult = nullptr;
    if (call_.api) call_.api->setErrMsg(jState["message"].asString());
}

bool Attempt::grows() const
{
    return "refused" == strGrows_ || ("thrown" == strGrows_ && !strThrown_.empty());
}

bool Attempt::call(const allocators::Fault& fault)
{
    int iFailed = 0;
    const auto thrown = [&](const char* szType) {
        iFailed = allocators::disarm();
        strThrown_ = szType;
    };
    allocators::arm(fault);
    try {
        iResult_ = row_.call(call_);
        iFailed = allocators::disarm();
    } catch (const std::bad_alloc&) {
        thrown("std::bad_alloc");
    } catch (const Json::RuntimeError&) {
        thrown("Json::RuntimeError");
    } catch (const Json::LogicError&) {
        thrown("Json::LogicError");
    } catch (const std::logic_error&) {
        thrown("std::logic_error");
    } catch (...) {
        thrown("another exception");
    }
    return 0 < iFailed;
}

Json::Value Attempt::outcome()
{
    Json::Value jOutcome;
    if (strThrown_.empty())
        jOutcome["result"] = iResult_;
    else
        jOutcome["result"] = strThrown_;
    jOutcome["first"] = call_.jFirst;
    jOutcome["second"] = call_.jSecond;
    jOutcome["text"] = call_.strText;
    jOutcome["message"] = call_.api ? call_.api->getErrMsg() : std::string();
    jOutcome["now"] = Json::Int64(call_.now);
    jOutcome["type"] = nullptr == call_.pjResult ? Json::Value("none") : *call_.pjResult;
    jOutcome["rows"] = store_.rows();
    jOutcome["made"] = store_.hasMade();
    return jOutcome;
}

std::string whatIsWrong(const Attempt& attempt, const Json::Value& jOutcome)
{
    const Json::Value& jBefore = attempt.before();
    const Json::Value& jAfter = attempt.after();
    if (jOutcome == jAfter) return std::string();

    const bool blRefused = jOutcome["result"] == -1 && attempt.thrown().empty();
    const bool blSilent = attempt.silent() && jOutcome["result"] == jAfter["result"];
    if (!blRefused && !blSilent && !mayThrow(attempt)) return "the result must not be";
    for (const char* szKey : {"rows", "made", "message"})
        if (jOutcome[szKey] != jBefore[szKey] && jOutcome[szKey] != jAfter[szKey]) return szKey;
    for (const char* szKey : {"first", "second", "text", "now", "type"}) {
        const bool blKept = jOutcome[szKey] == jBefore[szKey];
        if (blKept) continue;
        if (!attempt.grows() || !isBetween(jBefore[szKey], jAfter[szKey], jOutcome[szKey]))
            return szKey;
    }
    return std::string();
}
