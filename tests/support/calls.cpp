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

using Named = std::pair<const std::string, Call::Function>;
#define METHOD(NAME, ...) Named(#NAME, [](Call& call) { return call.pApi->NAME(__VA_ARGS__); })

const std::map<std::string, Call::Function>& functions()
{
    static const std::map<std::string, Call::Function> all = {
        {"constructor", construct},
        {"setErrMsg", [](Call& call) { return call.pApi->setErrMsg(call.strText), 0; }},
        {"getErrMsg", getErrMsg},
        {"runSqlEx", runSqlEx},
        {"recType", recType},
        {"getTimeAfterNow", getTimeAfterNow},
        {"convert2ReadableTime", convert2ReadableTime},
        {"jsonCopyMember", jsonCopyMember},
        METHOD(tableCreate),
        METHOD(fillDefaultValue, call.jFirst, call.blFlag),
        METHOD(checkJsonType, call.jFirst),
        METHOD(recSave, call.jFirst, call.blFlag),
        METHOD(recCreate, call.jFirst, call.jSecond),
        METHOD(recList, call.jFirst, call.jSecond),
        METHOD(recGetOne, call.jFirst, call.jSecond),
        METHOD(recUpdateByWhere, call.jFirst, call.strText),
        METHOD(recUpdateByFilter, call.jFirst, call.jSecond),
        METHOD(recDelete, call.jFirst, call.blFlag),
        METHOD(recDeleteAll),
        METHOD(recDeleteByArray, call.strVector, call.strKey.c_str()),
        METHOD(recDeleteByName, call.strText, call.strKey.c_str()),
        METHOD(SqlExpandMemberName, call.strText, call.blFlag ? &call.jFirst : nullptr),
        METHOD(SqlExpandMemberSymbol, call.strText, call.jFirst),
        METHOD(SqlExpandMemberList, call.jFirst, call.strText, call.iNumber),
        METHOD(SqlMakeByMatchField, call.strKey, call.jFirst, call.strText),
        METHOD(SqlMakeByListField, call.strKey.c_str(), call.jFirst, call.strText),
        METHOD(VectorParamToJson, call.strVector, call.strKey.c_str(), call.jFirst),
        METHOD(SqlFilterConditionFromJson, call.jFirst, call.strText),
    };
    return all;
}

}  // namespace

Call::Function Call::function(const std::string& strCase)
{
    return functions().at(strCase.substr(0, strCase.find(' ')));
}

void Call::setArguments(const Json::Value& jArguments)
{
    jFirst = jArguments["first"];
    jSecond = jArguments["second"];
    strText = jArguments["text"].asString();
    strKey = jArguments["key"].asString();
    strVector.clear();
    for (const Json::Value& jText : jArguments["vector"]) strVector.push_back(jText.asString());
    blFlag = jArguments["flag"].asBool();
    iNumber = jArguments["number"].asInt();
    now = static_cast<long>(std::min<Json::Int64>(jArguments["now"].asInt64(), LONG_MAX));
    pjResult = nullptr;
}
