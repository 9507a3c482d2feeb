// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// bench_kept CASE, run under callgrind like bench_count: what the library keeps of tables and rows
// (member types, layouts) must not make a call dearer that uses another table, that alternates
// between tables, or whose rows hold NULLs. Prints how many calls or rows the count is of.
#include "workload.h"

#include <VornJsonDbApi.h>
#include <sqlite3.h>
#include <valgrind/callgrind.h>

#include <cstdio>
#include <functional>
#include <memory>
#include <string>
#include <vector>

namespace {

constexpr int kCalls = 1000;
constexpr int kMembers = 7;

Json::Value texts(int nMembers)
{
    Json::Value jMembers;
    for (int i = 0; i < nMembers; ++i)
        jMembers["m" + std::to_string(1000 + i)]["cpptype"] = "string";
    return jMembers;
}

struct Table {
    Table(sqlite3* pDb, std::string strOf, int nMembersOf)
        : strName(std::move(strOf)), nMembers(nMembersOf)
    {
        jDefinition[strName]["member"] = texts(nMembers);
        std::string strColumns;
        for (const std::string& strMember : jDefinition[strName]["member"].getMemberNames())
            strColumns += (strColumns.empty() ? "" : ",") + strMember;
        strCreate = "CREATE TABLE " + strName + " (" + strColumns + ")";
        api = std::make_unique<VornJsonDbApi>(pDb, strName, jDefinition, strCreate);
    }

    std::string strName;
    int nMembers;
    Json::Value jDefinition;
    std::string strCreate;
    std::unique_ptr<VornJsonDbApi> api;
};

Json::Value row(int nMembers)
{
    Json::Value jRecord;
    for (int i = 0; i < nMembers; ++i)
        jRecord["m" + std::to_string(1000 + i)] = "a text of some length " + std::to_string(i);
    return jRecord;
}

void list(Table& table)
{
    Json::Value jRequest;
    Json::Value jRecords;
    bench::must(0 == table.api->recList(jRequest, jRecords) && 0 < jRecords.size(), "recList");
}

void create(Table& table)
{
    Json::Value jRecord = row(table.nMembers);
    Json::Value jStored;
    bench::must(0 == table.api->recCreate(jRecord, jStored) && jStored == jRecord, "recCreate");
}

// Counts the call for i from 0 to n - 1, after a first round of them.
void count(int n, const std::function<void(int)>& call)
{
    for (int i = 0; i < n; ++i) call(i);
    CALLGRIND_START_INSTRUMENTATION;
    for (int i = 0; i < n; ++i) call(i);
    CALLGRIND_STOP_INSTRUMENTATION;
    printf("{\"calls\": %d}\n", n);
}

// Lists of one row, or creations, on one table or on two of them in turn.
void countAlternating(sqlite3* pDb, int nTables, void (*call)(Table&))
{
    Table tables[] = {{pDb, "first", kMembers}, {pDb, "other", kMembers}};
    for (Table& table : tables) create(table);
    count(kCalls, [&](int i) { call(tables[i % nTables]); });
}

// The rows of one list, by so many members as one usually has; in every nNull-th row a text is
// NULL, and in alternating ones where blAlternating says so.
void countRows(sqlite3* pDb, int nMembers, int nNull, bool blAlternating)
{
    Table table(pDb, "listed", nMembers);
    for (int i = 0; i < kCalls; ++i) create(table);
    for (int i = 0; 0 < nNull && i < kCalls; i += nNull)
        bench::run(pDb, "update listed set m100" +
                            std::to_string(blAlternating ? i / nNull % 7 : 3) +
                            "=NULL where rowid=" + std::to_string(i + 1));
    list(table);
    CALLGRIND_START_INSTRUMENTATION;
    list(table);
    CALLGRIND_STOP_INSTRUMENTATION;
    printf("{\"calls\": %d}\n", kCalls * nMembers / kMembers);
}

// Looking up the types of so many tables in turn, or adding them.
void countTypes(int nTables, bool blAdd)
{
    std::vector<std::string> names;
    std::vector<Json::Value> definitions;
    for (int i = 0; i < nTables; ++i) {
        names.push_back("table" + std::to_string(100000 + i));
        definitions.emplace_back()[names.back()]["member"] = texts(1);
    }
    const auto ask = [&](int i) {
        const auto n = static_cast<std::size_t>(i % nTables);
        bench::must(1 == VORN_JSON_DB::recType(definitions[n], names[n]).size(), "recType");
    };
    if (!blAdd) return count(100000, ask);
    CALLGRIND_START_INSTRUMENTATION;
    for (int i = 0; i < nTables; ++i) ask(i);
    CALLGRIND_STOP_INSTRUMENTATION;
    printf("{\"calls\": %d}\n", nTables);
}

void useWide(sqlite3* pDb, void (*call)(Table&))
{
    Table wide(pDb, "wide", 2000);
    create(wide);
    list(wide);
    countAlternating(pDb, 1, call);
}

}  // namespace

int main(int argc, char** argv)
{
    bench::must(2 == argc, "usage: bench_kept CASE");
    const std::string strCase = argv[1];
    sqlite3* const pDb = bench::openInMemory();
    if ("fetch" == strCase) countAlternating(pDb, 1, list);
    if ("fetch, two tables" == strCase) countAlternating(pDb, 2, list);
    if ("fetch, after a wide table" == strCase) useWide(pDb, list);
    if ("create" == strCase) countAlternating(pDb, 1, create);
    if ("create, two tables" == strCase) countAlternating(pDb, 2, create);
    if ("create, after a wide table" == strCase) useWide(pDb, create);
    if ("rows" == strCase) countRows(pDb, kMembers, 0, false);
    if ("rows, NULL in every second" == strCase) countRows(pDb, kMembers, 2, false);
    if ("rows, NULLs in alternating members" == strCase) countRows(pDb, kMembers, 2, true);
    if ("rows, 100 members" == strCase) countRows(pDb, 100, 0, false);
    if ("types of 10 tables" == strCase) countTypes(10, false);
    if ("types of 100000 tables" == strCase) countTypes(100000, false);
    if ("adding 1000 tables" == strCase) countTypes(1000, true);
    if ("adding 100000 tables" == strCase) countTypes(100000, true);
    return 0;
}
