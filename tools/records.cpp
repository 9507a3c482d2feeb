// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// One record, or those that a condition selects: create, save, get, count, update, delete.
#include "commands.h"
#include "database.h"
#include "failure.h"
#include "json_text.h"

#include <iostream>
#include <iterator>

namespace tool {

namespace {

// {"updated":3}
void printCount(Output& output, const char* szWhat, long long nRecords)
{
    Json::Value jCount;
    jCount[szWhat] = Json::Int64(nRecords);
    output.line(jCount);
}

// Null with --all, and then it is not among the arguments.
Json::Value conditionOf(const Arguments& arguments, std::size_t nArguments)
{
    const bool blAll = arguments.has("all");
    if (arguments.values.size() != nArguments - (blAll ? 1 : 0))
        throw UsageError("expected either a condition or --all");
    if (blAll) return Json::Value();
    Json::Value jCondition = parseArgument(arguments.values[2], "CONDITION");
    if (jCondition.empty()) throw Failure("the condition is empty; --all selects every record");
    return jCondition;
}

// Stores the record by the operation and prints it.
int store(const Arguments& arguments, Output& output,
          int (VornJsonTable::*operation)(const Json::Value&, Json::Value&))
{
    const Json::Value jRecord = parseArgument(arguments.values[2], "RECORD");
    const Table table = openTable(arguments.values[0], arguments.values[1], Open::kCreating);
    Json::Value jStored;
    table.checked((*table.pRecords.*operation)(jRecord, jStored));
    output.line(jStored);
    return kDone;
}

}  // namespace

Json::Value parseArgument(const std::string& strArgument, const char* szName)
{
    if ("-" != strArgument) return parseJson(strArgument, {szName});
    const std::string strText(std::istreambuf_iterator<char>(std::cin), {});
    return parseJson(strText, {"standard input", 1});
}

int create(const Arguments& arguments, Output& output)
{
    return store(arguments, output, &VornJsonTable::create);
}

int save(const Arguments& arguments, Output& output)
{
    return store(arguments, output, &VornJsonTable::save);
}

int get(const Arguments& arguments, Output& output)
{
    const Json::Value jCondition = parseArgument(arguments.values[2], "CONDITION");
    const Table table = openTable(arguments.values[0], arguments.values[1], Open::kExisting);
    Json::Value jRecord;
    if (0 == table.checked(table.pRecords->get(jCondition, jRecord))) return kNothingFound;
    output.line(jRecord);
    return kDone;
}

int count(const Arguments& arguments, Output& output)
{
    const Json::Value jCondition = parseArgument(arguments.value(2, "{}"), "CONDITION");
    const Table table = openTable(arguments.values[0], arguments.values[1], Open::kExisting);
    output.text(std::to_string(table.checked(table.pRecords->count(jCondition))) + "\n");
    return kDone;
}

int update(const Arguments& arguments, Output& output)
{
    const Json::Value jCondition = conditionOf(arguments, 4);
    const Json::Value jValues = parseArgument(arguments.values.back(), "VALUES");
    const Table table = openTable(arguments.values[0], arguments.values[1], Open::kExisting);
    const long long nUpdated = jCondition.isNull() ? table.pRecords->updateAll(jValues)
                                                   : table.pRecords->update(jCondition, jValues);
    printCount(output, "updated", table.checked(nUpdated));
    return kDone;
}

int remove(const Arguments& arguments, Output& output)
{
    const Json::Value jCondition = conditionOf(arguments, 3);
    const Table table = openTable(arguments.values[0], arguments.values[1], Open::kExisting);
    const long long nDeleted =
        jCondition.isNull() ? table.pRecords->removeAll() : table.pRecords->remove(jCondition);
    printCount(output, "deleted", table.checked(nDeleted));
    return kDone;
}

}  // namespace tool
