// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
#include "support/calls.h"

#include <algorithm>
#include <climits>
#include <map>
#include <utility>

namespace {

int construct(Call& call)
{
    call.pApi = &call.made.emplace(call.pDb, call.strTable, call.jDefinition, call.strCreate);
    return 0;
}

int getErrMsg(Call& call)
{
    call.strText = call.pApi->getErrMsg();
    return 0;
}

int runSqlEx(Call& call)
{
    if (!call.blFlag) return call.pApi->runSqlEx(call.strText);
    long nRows = 0;
    const auto countRow = [](void* arg, int, char**, char**) {
        ++*static_cast<long*>(arg);
        return 0;
    };
    const int iResult = call.pApi->runSqlEx(call.strText, countRow, &nRows);
    if (0 == iResult) call.now = nRows;
    return iResult;
}

int recType(Call& call)
{
    call.pjResult = &VORN_JSON_DB::recType(call.jDefinition, call.strText);
    return 0;
}

int getTimeAfterNow(Call& call)
{
    if (0 == call.iNumber) return VORN_JSON_DB::getTimeAfterNow(60, call.now);
    return VORN_JSON_DB::getTimeAfterNow(60, call.strText, call.iNumber);
}

int convert2ReadableTime(Call& call)
{
    return VORN_JSON_DB::convert2ReadableTime(call.now, call.strText, call.iNumber);
}

int jsonCopyMember(Call& call)
{
    return VORN_JSON_DB::jsonCopyMember(call.jFirst, call.jSecond, call.blFlag);
}

struct Entry {
    Call::Function function;
    const char* szParameters = "";
};

using Named = std::pair<const std::string, Entry>;
#define METHOD(NAME, PARAMETERS, ...) \
    Named(#NAME, {[](Call& call) { return call.pApi->NAME(__VA_ARGS__); }, PARAMETERS})

const std::map<std::string, Entry>& functions()
{
    static const std::map<std::string, Entry> all = {
        {"constructor", {construct}},
        {"setErrMsg", {[](Call& call) { return call.pApi->setErrMsg(call.strText), 0; }}},
        {"getErrMsg", {getErrMsg}},
        {"runSqlEx", {runSqlEx, "text flag"}},
        {"recType", {recType}},
        {"getTimeAfterNow", {getTimeAfterNow}},
        {"convert2ReadableTime", {convert2ReadableTime}},
        {"jsonCopyMember", {jsonCopyMember, ">first second flag"}},
        METHOD(tableCreate, ""),
        METHOD(fillDefaultValue, ">first flag", call.jFirst, call.blFlag),
        METHOD(checkJsonType, "first", call.jFirst),
        METHOD(recSave, ">first flag", call.jFirst, call.blFlag),
        METHOD(recCreate, "first >second", call.jFirst, call.jSecond),
        METHOD(recList, "first >second", call.jFirst, call.jSecond),
        METHOD(recGetOne, "first >second", call.jFirst, call.jSecond),
        METHOD(recUpdateByWhere, "first text", call.jFirst, call.strText),
        METHOD(recUpdateByFilter, "first second", call.jFirst, call.jSecond),
        METHOD(recDelete, "first flag", call.jFirst, call.blFlag),
        METHOD(recDeleteAll, ""),
        METHOD(recDeleteByArray, "vector key", call.strVector, call.key()),
        METHOD(recDeleteByName, "text key", call.strText, call.key()),
        METHOD(SqlExpandMemberName, ">text record", call.strText,
               call.blFlag ? &call.jFirst : nullptr),
        METHOD(SqlExpandMemberSymbol, ">text first", call.strText, call.jFirst),
        METHOD(SqlExpandMemberList, "first >text number", call.jFirst, call.strText, call.iNumber),
        METHOD(SqlMakeByMatchField, "key first >text", call.strKey, call.jFirst, call.strText),
        METHOD(SqlMakeByListField, "key first >text", call.key(), call.jFirst, call.strText),
        METHOD(VectorParamToJson, "vector key >first", call.strVector, call.key(), call.jFirst),
        METHOD(SqlFilterConditionFromJson, "first >text", call.jFirst, call.strText),
    };
    return all;
}

const Entry& entry(const std::string& strCase)
{
    return functions().at(strCase.substr(0, strCase.find(' ')));
}

}  // namespace

Call::Function Call::function(const std::string& strCase)
{
    return entry(strCase).function;
}

const char* Call::parameters(const std::string& strCase)
{
    return entry(strCase).szParameters;
}

void Call::setArguments(const Json::Value& jArguments)
{
    jFirst = jArguments["first"];
    jSecond = jArguments["second"];
    strText = jArguments["text"].asString();
    blKey = jArguments.isMember("key");
    strKey = jArguments["key"].asString();
    strVector.clear();
    for (const Json::Value& jText : jArguments["vector"]) strVector.push_back(jText.asString());
    blFlag = jArguments["flag"].asBool();
    iNumber = jArguments["number"].asInt();
    now = static_cast<long>(std::min<Json::Int64>(jArguments["now"].asInt64(), LONG_MAX));
    pjResult = nullptr;
}

Json::Value Call::arguments() const
{
    Json::Value jArguments;
    jArguments["first"] = jFirst;
    jArguments["second"] = jSecond;
    jArguments["text"] = strText;
    jArguments["key"] = strKey;
    jArguments["vector"] = Json::arrayValue;
    for (const std::string& strItem : strVector) jArguments["vector"].append(strItem);
    jArguments["flag"] = blFlag;
    jArguments["number"] = iNumber;
    jArguments["now"] = Json::Int64(now);
    return jArguments;
}
