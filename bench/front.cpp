// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// bench_front CASE, run under callgrind like bench_count: what VornJsonTable.h takes for a record,
// and what the interface that it stands on takes ("..., bare"). Prints how many records the count
// is of.
#include "workload.h"

#include <VornJsonTable.h>
#include <valgrind/callgrind.h>

#include <cstdio>

namespace {

constexpr int kRecords = 1000;

// "int" is no word for an integer primary key.
Json::Value exactDefinition()
{
    Json::Value jDefinition = bench::definition();
    jDefinition[bench::kTable]["member"]["id"]["cpptype"] = "long long";
    return jDefinition;
}

Json::Value records()
{
    Json::Value jRecords;
    for (int id = 1; id <= kRecords; ++id) jRecords.append(bench::record(id));
    return jRecords;
}

class Front {
public:
    explicit Front(sqlite3* pDb)
        : table_(pDb, bench::kTable, exactDefinition(), bench::createStatement())
    {
    }

    void create()
    {
        for (const Json::Value& jRecord : jRecords_) {
            Json::Value jStored;
            bench::must(0 == table_.create(jRecord, jStored), "create");
        }
    }

    void createMany() { bench::must(kRecords == table_.createMany(jRecords_), "createMany"); }

    void list()
    {
        Json::Value jListed;
        bench::must(kRecords == table_.list({}, {}, jListed), "list");
    }

    void each()
    {
        const auto take = [](const Json::Value&) { return true; };
        bench::must(kRecords == table_.each({}, {}, take), "each");
    }

private:
    VornJsonTable table_;
    Json::Value jRecords_ = records();
};

class Bare {
public:
    explicit Bare(sqlite3* pDb) : pDb_(pDb), api_(pDb, strName_, jDefinition_, strCreate_) {}

    void create()
    {
        for (Json::Value& jRecord : jRecords_) {
            Json::Value jStored;
            bench::must(0 == api_.recCreate(jRecord, jStored), "recCreate");
        }
    }

    void createMany()
    {
        bench::run(pDb_, "begin");
        create();
        bench::run(pDb_, "commit");
    }

    void list()
    {
        Json::Value jRequest;
        Json::Value jListed;
        bench::must(0 == api_.recList(jRequest, jListed) && kRecords == jListed.size(), "recList");
    }

private:
    sqlite3* pDb_;
    std::string strName_ = bench::kTable;
    Json::Value jDefinition_ = exactDefinition();
    std::string strCreate_ = bench::createStatement();
    VornJsonDbApi api_;
    Json::Value jRecords_ = records();
};

std::string filledText()
{
    sqlite3* const pDb = bench::openInMemory();
    bench::run(pDb, bench::createStatement());
    bench::fill(pDb, kRecords);
    return bench::tableText(pDb);
}

// Counts the calls on an empty table, or on one of all records, after a first round of them.
template <typename Host>
void count(bool blEmpty, void (Host::*calls)())
{
    sqlite3* const pDb = bench::openInMemory();
    Host host(pDb);
    if (!blEmpty) bench::fill(pDb, kRecords);
    (host.*calls)();
    if (blEmpty) bench::run(pDb, "delete from task");
    CALLGRIND_START_INSTRUMENTATION;
    (host.*calls)();
    CALLGRIND_STOP_INSTRUMENTATION;
    bench::must(filledText() == bench::tableText(pDb), "the table");
    printf("{\"calls\": %d}\n", kRecords);
}

}  // namespace

int main(int argc, char** argv)
{
    bench::must(2 == argc, "usage: bench_front CASE");
    const std::string strCase = argv[1];
    if ("create" == strCase) count(true, &Front::create);
    if ("create, bare" == strCase) count(true, &Bare::create);
    if ("create many" == strCase) count(true, &Front::createMany);
    if ("create many, bare" == strCase) count(true, &Bare::createMany);
    if ("list" == strCase) count(false, &Front::list);
    if ("list, bare" == strCase) count(false, &Bare::list);
    if ("each" == strCase) count(false, &Front::each);
    return 0;
}
