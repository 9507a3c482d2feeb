// SPDX-License-Identifier: MIT
// The handle's lifetime, its messages, running SQL, validation, and the free functions.

#include "cases.h"

#include <climits>

namespace {

int construct(Call& call)
{
    call.api.emplace(call.pDb, call.strName, call.jDefinition, call.strCreate);
    return 0;
}

int tableCreate(Call& call)
{
    return call.api->tableCreate();
}

int setErrMsg(Call& call)
{
    call.api->setErrMsg(call.strText);
    return 0;
}

int getErrMsg(Call& call)
{
    call.strText = call.api->getErrMsg();
    return 0;
}

int runSqlEx(Call& call)
{
    return call.api->runSqlEx(call.strText);
}

int countRow(void* arg, int /*nColumns*/, char** /*values*/, char** /*names*/)
{
    ++*static_cast<long*>(arg);
    return 0;
}

int runSqlExWithCallback(Call& call)
{
    long nRows = 0;
    const int iResult = call.api->runSqlEx(call.strText, countRow, &nRows);
    if (0 == iResult) call.now = nRows;
    return iResult;
}

int fillDefaultValue(Call& call)
{
    return call.api->fillDefaultValue(call.jFirst, false);
}

int checkDefaultValue(Call& call)
{
    return call.api->fillDefaultValue(call.jFirst, true);
}

int checkJsonType(Call& call)
{
    return call.api->checkJsonType(call.jFirst);
}

int recType(Call& call)
{
    call.pjResult = &VORN_JSON_DB::recType(call.jDefinition, call.strText);
    return 0;
}

int jsonCopyMember(Call& call)
{
    return VORN_JSON_DB::jsonCopyMember(call.jFirst, call.jSecond, false);
}

int jsonOverwriteMember(Call& call)
{
    return VORN_JSON_DB::jsonCopyMember(call.jFirst, call.jSecond, true);
}

int getTimeAfterNow(Call& call)
{
    return VORN_JSON_DB::getTimeAfterNow(60, call.now);
}

int getTimeTextAfterNow(Call& call)
{
    return VORN_JSON_DB::getTimeAfterNow(60, call.strText, 3);
}

int getTimeTextOfNoKind(Call& call)
{
    return VORN_JSON_DB::getTimeAfterNow(60, call.strText, 1);
}

int convertUtc(Call& call)
{
    return VORN_JSON_DB::convert2ReadableTime(0, call.strText, 5);
}

int convertLocal(Call& call)
{
    return VORN_JSON_DB::convert2ReadableTime(0, call.strText, 2);
}

int convertTheLastLong(Call& call)
{
    return VORN_JSON_DB::convert2ReadableTime(LONG_MAX, call.strText, 3);
}

// A long of 64 bits goes beyond the calendar.
const char* const kLastLong =
    8 == sizeof(long) ? R"({"result": -1})" : R"({"text": "Tue, 19 Jan 2038 03:14:07 GMT"})";

}  // namespace

// clang-format off
const Cases kHandleCases = {
    {"constructor", construct,
     R"({"handle": false, "name": "made"})",
     R"({"made": true, "silent": true})"},
    {"constructor without anything", construct,
     R"({"handle": false, "name": "", "create": ""})",
     R"({})"},
    {"constructor is refused", construct,
     R"({"handle": false, "name": "made", "create": "create table made ("})",
     R"({})"},
    {"tableCreate", tableCreate,
     R"({"name": "made", "sql": "drop table if exists made"})",
     R"({"made": true})"},
    {"tableCreate of nothing", tableCreate,
     R"({"name": "made", "create": ""})",
     R"({"result": -1})"},
    {"tableCreate is refused", tableCreate,
     R"({"name": "made", "create": "create table made ("})",
     R"({"result": -1})"},
    {"setErrMsg", setErrMsg,
     R"({"text": "a message that is not short"})",
     R"({"message": "a message that is not short"})"},
    {"getErrMsg", getErrMsg,
     R"({"message": "a message that is not short", "text": "before"})",
     R"({"text": "a message that is not short"})"},
    {"runSqlEx writes", runSqlEx,
     R"({"text": "update task set name = name || ' of a name that is not short' where id > 1"})",
     R"({"result": 2, "rows": "1 Ann 1 {k:[x]} [1,true],2 Bob of a name that is not short 0,3 O'Brien of a name that is not short 1"})"},
    {"runSqlEx reads", runSqlExWithCallback,
     R"({"text": "select * from task order by name"})",
     R"({"now": 3})"},
    {"runSqlEx of nothing", runSqlEx,
     R"({"text": ""})",
     R"({"result": -1})"},
    {"runSqlEx is refused", runSqlEx,
     R"({"text": "there is no such statement"})",
     R"({"result": -1})"},
};

const Cases kValidationCases = {
    {"fillDefaultValue", fillDefaultValue,
     R"({"first": {"id": 4}})",
     R"({"first": {"id": 4, "name": "somebody without a name of his own", "tags": [1, 2]}, "grows": "thrown"})"},
    {"fillDefaultValue of a table that is not defined", fillDefaultValue,
     R"({"name": "undefined", "first": {"id": 4}})",
     R"({})"},
    {"fillDefaultValue finds everything", checkDefaultValue,
     R"({"name": "plain", "first": {"id": 4, "name": "Dora", "data": {}}})",
     R"({})"},
    {"fillDefaultValue misses a member", checkDefaultValue,
     R"({"first": {"id": 4, "name": "a text that is not short"}})",
     R"({"result": -1})"},
    {"checkJsonType", checkJsonType,
     R"({"first": {"id": 4, "name": "Dora", "data": {}, "undeclared": 1}})",
     R"({})"},
    {"checkJsonType of no object", checkJsonType,
     R"({"first": ["a text that is not short"]})",
     R"({"result": -1})"},
    {"checkJsonType of a wrong type", checkJsonType,
     R"({"first": {"name": ["a text that is not short"]}})",
     R"({"result": -1})"},
    {"checkJsonType of a word that it does not know", checkJsonType,
     R"({"first": {"rate": 1.5}})",
     R"({"result": -1})"},
};

const Cases kFreeCases = {
    {"recType", recType,
     R"({"text": "plain"})",
     R"({"type": {"data": {"cpptype": "Json::objectValue"}, "id": {"cpptype": "int"}, "name": {"cpptype": "string"}}})"},
    {"recType of a definition that ends early", recType,
     R"({"text": "partial"})",
     R"({"type": {"a": {"cpptype": "int"}}})"},
    {"recType of a table that is not defined", recType,
     R"({"text": "undefined"})",
     R"({"type": null})"},
    {"jsonCopyMember", jsonCopyMember,
     R"({"first": {"kept": 1}, "second": {"kept": 2, "data": {"key": "a text that is not short"}, "name": "Dora"}})",
     R"({"first": {"kept": 1, "data": {"key": "a text that is not short"}, "name": "Dora"}, "grows": "thrown"})"},
    {"jsonCopyMember overwrites", jsonOverwriteMember,
     R"({"first": {"a": 1, "b": "before"}, "second": {"a": {"key": "a text that is not short"}, "b": ["after"]}})",
     R"({"first": {"a": {"key": "a text that is not short"}, "b": ["after"]}, "grows": "thrown"})"},
    {"jsonCopyMember into a list", jsonCopyMember,
     R"({"first": [1], "second": {"a": 1}})",
     R"({"result": -1})"},
    {"jsonCopyMember from a text", jsonCopyMember,
     R"({"first": null, "second": "a text that is not short"})",
     R"({"result": -1})"},
    {"getTimeAfterNow", getTimeAfterNow,
     R"({})",
     R"({"now": 1700000060})"},
    {"getTimeAfterNow as text", getTimeTextAfterNow,
     R"({"text": "before"})",
     R"({"text": "Tue, 14 Nov 2023 22:14:20 GMT"})"},
    {"getTimeAfterNow as text of no kind", getTimeTextOfNoKind,
     R"({"text": "before"})",
     R"({"result": -1})"},
    {"convert2ReadableTime in UTC", convertUtc,
     R"({"text": "before"})",
     R"({"text": "1970-01-01 00:00:00"})"},
    {"convert2ReadableTime in local time", convertLocal,
     R"({"text": "before"})",
     R"({"text": "Thu, 01 Jan 1970 02:00:00 GMT"})"},
    {"convert2ReadableTime of the last long", convertTheLastLong,
     R"({"text": "before"})",
     kLastLong},
};
// clang-format on

Cases everyCase()
{
    Cases every;
    for (const Cases& cases : {kHandleCases, kSaveCases, kListCases, kUpdateCases, kDeleteCases,
                               kValidationCases, kBuilderCases, kTermCases, kFreeCases})
        every.insert(every.end(), cases.begin(), cases.end());
    return every;
}
