// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// bench_value_list MEMBERS BYTES, run under callgrind like bench_count, counts the instructions of
// the value list of one record with MEMBERS text members, the first of them BYTES bytes long.
#include "workload.h"

#include <VornJsonDbApi.h>
#include <sqlite3.h>
#include <valgrind/callgrind.h>

#include <cstdio>
#include <cstdlib>

int main(int argc, char** argv)
{
    bench::must(3 == argc, "usage: bench_value_list MEMBERS BYTES");
    const int members = atoi(argv[1]);
    const auto bytes = static_cast<std::size_t>(atol(argv[2]));

    std::string strName = "wide";
    std::string strCreate = "CREATE TABLE IF NOT EXISTS wide (id)";
    Json::Value jDefinition;
    Json::Value jRecord;
    for (int i = 0; i < members; ++i) {
        const std::string strMember = "m" + std::to_string(1000 + i);
        jDefinition[strName]["member"][strMember]["cpptype"] = "string";
        jRecord[strMember] = 0 == i ? std::string(bytes, 'x') : "short";
    }
    sqlite3* pDb = bench::openInMemory();
    VornJsonDbApi api(pDb, strName, jDefinition, strCreate);
    std::string strFirst;
    std::string strList;
    api.SqlExpandMemberSymbol(strFirst, jRecord);

    CALLGRIND_START_INSTRUMENTATION;
    const int iResult = api.SqlExpandMemberSymbol(strList, jRecord);
    CALLGRIND_STOP_INSTRUMENTATION;

    bench::must(0 == iResult && strList == strFirst && bytes < strList.size(), "the value list");
    printf("{\"members\": %d, \"bytes\": %zu}\n", members, bytes);
    sqlite3_close(pDb);
    return 0;
}
