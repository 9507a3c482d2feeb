// SPDX-License-Identifier: MIT
// Fails malloc, n-th call by n-th call, while a host creates and lists records: jsoncpp takes its
// texts from malloc and throws Json::RuntimeError when there is none. After each the handle works
// and no statement is open. Prints how each attempt ended; the status tells which check failed.

#include <VornJsonDbApi.h>
#include <sqlite3.h>

#include <json/json.h>
#include <cstdio>
#include <cstdlib>
#include <new>
#include <stdexcept>

bool blLogToStdout = false;
bool blDebugOutput = false;

extern "C" {

void* __libc_malloc(size_t nSize);

int iFailMalloc = 0;
int iMallocs = 0;

void* malloc(size_t nSize)
{
    if (0 < iFailMalloc && ++iMallocs == iFailMalloc) return nullptr;
    return __libc_malloc(nSize);
}

}  // extern "C"

namespace {

enum Ending { kGood, kMinusOne, kBadAlloc, kRuntimeError, kLogicError, kEndings };

template <typename Operation>
Ending attempt(int iFail, Operation operation)
{
    iMallocs = 0;
    iFailMalloc = iFail;
    try {
        const int iResult = operation();
        iFailMalloc = 0;
        return 0 > iResult ? kMinusOne : kGood;
    } catch (const std::bad_alloc&) {
        iFailMalloc = 0;
        return kBadAlloc;
    } catch (const Json::RuntimeError&) {
        iFailMalloc = 0;
        return kRuntimeError;
    } catch (const std::logic_error&) {
        iFailMalloc = 0;
        return kLogicError;
    }
}

// Each malloc in turn until none fails. The handle and the connection have to be sound in between.
template <typename Operation>
void failEach(const char* szName, sqlite3* pDb, VornJsonDbApi& api, Operation operation)
{
    int endings[kEndings] = {};
    for (int iFail = 1;; ++iFail) {
        ++endings[attempt(iFail, operation)];
        if (iMallocs < iFail) break;
        if (nullptr != sqlite3_next_stmt(pDb, nullptr)) exit(2);
        Json::Value jAll;
        Json::Value jList;
        if (0 != api.recList(jAll, jList) || 1 > jList.size()) exit(3);
    }
    printf("%s: %d good, %d refused, %d bad_alloc, %d RuntimeError, %d logic_error\n", szName,
           endings[kGood], endings[kMinusOne], endings[kBadAlloc], endings[kRuntimeError],
           endings[kLogicError]);
    if (1 > endings[kRuntimeError] || 1 > endings[kGood]) exit(4);
}

}  // namespace

int main()
{
    sqlite3* pDb = nullptr;
    if (SQLITE_OK != sqlite3_open(":memory:", &pDb)) return 1;
    std::string strName = "task";
    std::string strCreate = "create table task (data text, id integer primary key, name text)";
    Json::Value jDefinition;
    jDefinition["task"]["member"]["data"]["cpptype"] = "Json::objectValue";
    jDefinition["task"]["member"]["id"]["cpptype"] = "int";
    jDefinition["task"]["member"]["name"]["cpptype"] = "string";
    {
        VornJsonDbApi api(pDb, strName, jDefinition, strCreate);
        Json::Value jRecord;
        jRecord["data"]["a key that is long"] = "a text that is longer than a short string";
        jRecord["id"] = 1;
        jRecord["name"] = "a name that is longer than a short string";
        if (0 != api.recSave(jRecord, true)) return 1;
        failEach("save", pDb, api, [&] {
            Json::Value jCopy = jRecord;
            return api.recSave(jCopy, false);
        });
        failEach("list", pDb, api, [&] {
            Json::Value jAll;
            Json::Value jList;
            const int iResult = api.recList(jAll, jList);
            // A list that succeeds lacks nothing.
            if (0 == iResult && jRecord != jList[0]) exit(6);
            return iResult;
        });
    }
    return SQLITE_OK == sqlite3_close(pDb) ? 0 : 5;
}
