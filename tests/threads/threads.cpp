// SPDX-License-Identifier: MIT
// Two threads, each with handles of its own, on one connection and on two, and the host's own mutex
// around every call: every result is right. With --without-lock the mutex is left out, which only
// ThreadSanitizer should be shown. The status is 0 when all is well.

#include <VornJsonDbApi.h>
#include <sqlite3.h>

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

struct TableOfThread {
    const char* szName;
    const char* szWord;
    Json::Value jValue;
};

Json::Value definition(const TableOfThread& table)
{
    Json::Value jDefinition;
    jDefinition[table.szName]["member"]["id"]["cpptype"] = "int";
    jDefinition[table.szName]["member"]["value"]["cpptype"] = table.szWord;
    return jDefinition;
}

// What a host does with a record, one call after the other.
void useRecord(VornJsonDbApi& api, const Json::Value& jRecord)
{
    Json::Value jIn = jRecord;
    Json::Value jStored;
    expect(0 == locked([&] { return api.recCreate(jIn, jStored); }) && jStored == jRecord,
           "recCreate");
    expect(-1 == locked([&] { return api.recCreate(jIn, jStored); }), "recCreate of a duplicate");
    expect("DUPLICATE_PRIMARY_KEY" == locked([&] { return api.getErrMsg(); }), "getErrMsg");
    locked([&] { api.setErrMsg(""); });

    Json::Value jRequest;
    Json::Value jRecords;
    expect(0 == locked([&] { return api.recList(jRequest, jRecords); }), "recList");
    expect(1U == jRecords.size() && jRecords[0] == jRecord, "the record of recList");
    jRequest["id"] = jRecord["id"];
    Json::Value jValues;
    jValues["value"] = jRecord["value"];
    expect(0 == locked([&] { return api.recUpdateByFilter(jRequest, jValues); }),
           "recUpdateByFilter");
    Json::Value jFound;
    expect(1 == locked([&] { return api.recGetOne(jRequest, jFound); }) && jFound == jRecord,
           "recGetOne");
    expect(1 == locked([&] { return api.recDelete(jRequest); }), "recDelete");
}

void useLibrary(sqlite3* pDb, const TableOfThread& table)
{
    std::string strName = table.szName;
    std::string strCreate =
        "create table if not exists " + strName + " (id integer primary key, value text)";
    Json::Value jDefinition = definition(table);
    std::optional<VornJsonDbApi> api;
    locked([&] { api.emplace(pDb, strName, jDefinition, strCreate); });
    for (int i = 0; i < kRounds; ++i) {
        Json::Value jRecord;
        jRecord["id"] = i;
        jRecord["value"] = table.jValue;
        useRecord(*api, jRecord);
        std::string strTime;
        locked([&] { return VORN_JSON_DB::convert2ReadableTime(0, strTime, 5); });
        expect("1970-01-01 00:00:00" == strTime, "convert2ReadableTime");
    }
    locked([&] { api.reset(); });
}

sqlite3* opened(const std::string& strFile)
{
    sqlite3* pDb = nullptr;
    expect(SQLITE_OK == sqlite3_open(strFile.c_str(), &pDb), "sqlite3_open");
    return pDb;
}

void runThreads(sqlite3* pFirst, sqlite3* pSecond)
{
    const TableOfThread texts = {"texts", "string", "it's"};
    Json::Value jObject;
    jObject["k"] = 1.5;
    const TableOfThread objects = {"objects", "Json::objectValue", jObject};
    std::thread first([&] { useLibrary(pFirst, texts); });
    std::thread second([&] { useLibrary(pSecond, objects); });
    first.join();
    second.join();
}

void countLine()
{
    ++iLines;
}

}  // namespace

extern "C" {

// The log is only counted.
void syslog(int, const char*, ...)
{
    countLine();
}

void __syslog_chk(int, int, const char*, ...)
{
    countLine();
}

}  // extern "C"

int main(int argc, char** argv)
{
    blLocked = !(1 < argc && 0 == strcmp("--without-lock", argv[1]));
    const std::string strFile = std::filesystem::temp_directory_path() /
                                ("vornjsondb-threads-" + std::to_string(getpid()) + ".db");
    sqlite3* pOne = opened(strFile);
    sqlite3* pOther = opened(strFile);
    sqlite3_exec(pOne, "pragma synchronous=off", nullptr, nullptr, nullptr);
    sqlite3_exec(pOther, "pragma synchronous=off", nullptr, nullptr, nullptr);
    runThreads(pOne, pOne);
    runThreads(pOne, pOther);
    expect(SQLITE_OK == sqlite3_close(pOne), "sqlite3_close");
    expect(SQLITE_OK == sqlite3_close(pOther), "sqlite3_close");
    std::filesystem::remove(strFile);

    expect(0 < iLines, "no failure was logged");
    printf("figure: threads, calls = %d\n", iCalls.load());
    printf("figure: threads, wrong results = %d\n", iWrong.load());
    return 0 == iWrong ? 0 : 1;
}
