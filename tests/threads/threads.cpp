// SPDX-License-Identifier: MIT
// Two threads, each with handles of its own, on one connection and on two, and the host's own mutex
// around every call: every result is right. With --without-lock the mutex is left out, which is for
// ThreadSanitizer only. The status is 0 when all is well.

#include "support/connection.h"

#include <VornJsonDbApi.h>

#include <unistd.h>
#include <atomic>
#include <cstdio>
#include <cstring>
#include <filesystem>
#include <mutex>
#include <optional>
#include <thread>

bool blLogToStdout = false;
bool blDebugOutput = false;

namespace {

constexpr int kRounds = 200;

std::mutex vornMutex;  // one mutex for all handles
bool blLocked = true;

std::atomic<int> iCalls{0};
std::atomic<int> iLines{0};
std::atomic<int> iWrong{0};

// One call, under the lock.
template <typename Call>
auto locked(Call call)
{
    ++iCalls;
    std::unique_lock<std::mutex> lock(vornMutex, std::defer_lock);
    if (blLocked) lock.lock();
    return call();
}

void expect(bool blRight, const char* szWhat)
{
    if (blRight) return;
    ++iWrong;
    fprintf(stderr, "wrong: %s\n", szWhat);
}

template <typename Call>
void expectResult(int iResult, const char* szWhat, Call call)
{
    expect(iResult == locked(call), szWhat);
}

// What a host does with a record, one call after the other.
void useRecord(VornJsonDbApi& api, const Json::Value& jRecord)
{
    Json::Value jIn = jRecord;
    Json::Value jStored;
    expectResult(0, "recCreate", [&] { return api.recCreate(jIn, jStored); });
    expect(jStored == jRecord, "the record of recCreate");
    expectResult(-1, "recCreate of a duplicate", [&] { return api.recCreate(jIn, jStored); });
    expect("DUPLICATE_PRIMARY_KEY" == locked([&] { return api.getErrMsg(); }), "getErrMsg");
    locked([&] { api.setErrMsg(""); });

    Json::Value jRequest;
    Json::Value jRecords;
    expectResult(0, "recList", [&] { return api.recList(jRequest, jRecords); });
    expect(1U == jRecords.size() && jRecords[0] == jRecord, "the record of recList");
    jRequest["id"] = jRecord["id"];
    Json::Value jValues;
    jValues["value"] = jRecord["value"];
    expectResult(0, "recUpdateByFilter", [&] { return api.recUpdateByFilter(jRequest, jValues); });
    Json::Value jFound;
    expectResult(1, "recGetOne", [&] { return api.recGetOne(jRequest, jFound); });
    expect(jFound == jRecord, "the record of recGetOne");
    expectResult(1, "recDelete", [&] { return api.recDelete(jRequest); });
}

// On a table of that name, whose records hold such a value.
void useLibrary(sqlite3* pDb, std::string strName, const char* szWord, const Json::Value& jValue)
{
    std::string strCreate =
        "create table if not exists " + strName + " (id integer primary key, value text)";
    Json::Value jDefinition;
    jDefinition[strName]["member"]["id"]["cpptype"] = "int";
    jDefinition[strName]["member"]["value"]["cpptype"] = szWord;
    std::optional<VornJsonDbApi> api;
    locked([&] { api.emplace(pDb, strName, jDefinition, strCreate); });
    for (int i = 0; i < kRounds; ++i) {
        Json::Value jRecord;
        jRecord["id"] = i;
        jRecord["value"] = jValue;
        useRecord(*api, jRecord);
        std::string strTime;
        locked([&] { return VORN_JSON_DB::convert2ReadableTime(0, strTime, 5); });
        expect("1970-01-01 00:00:00" == strTime, "convert2ReadableTime");
    }
    locked([&] { api.reset(); });
}

void runThreads(sqlite3* pFirst, sqlite3* pSecond)
{
    Json::Value jObject;
    jObject["k"] = 1.5;
    std::thread first([&] { useLibrary(pFirst, "texts", "string", "it's"); });
    std::thread second([&] { useLibrary(pSecond, "objects", "Json::objectValue", jObject); });
    first.join();
    second.join();
}

}  // namespace

extern "C" {

// The log is only counted.
void syslog(int, const char*, ...)
{
    ++iLines;
}

void __syslog_chk(int, int, const char*, ...)
{
    ++iLines;
}

}  // extern "C"

int main(int argc, char** argv)
{
    blLocked = !(1 < argc && 0 == strcmp("--without-lock", argv[1]));
    const std::string strFile = std::filesystem::temp_directory_path() /
                                ("vornjsondb-threads-" + std::to_string(getpid()) + ".db");
    sqlite3* const connections[] = {sqlite::opened(strFile), sqlite::opened(strFile)};
    for (sqlite3* pDb : connections) sqlite::run(pDb, "pragma synchronous=off");
    runThreads(connections[0], connections[0]);
    runThreads(connections[0], connections[1]);
    for (sqlite3* pDb : connections) expect(SQLITE_OK == sqlite3_close(pDb), "sqlite3_close");
    std::filesystem::remove(strFile);

    expect(0 < iLines, "no failure was logged");
    printf("figure: threads, calls = %d\n", iCalls.load());
    printf("figure: threads, wrong results = %d\n", iWrong.load());
    return 0 == iWrong ? 0 : 1;
}
