// SPDX-License-Identifier: MIT
// A host in C++11, and as well in C++20, with hidden visibility: links, runs and creates records,
// the last one while the process exits. The status tells which step failed.

#include <VornJsonDbApi.h>
#include <sqlite3.h>

#include <stdlib.h>

bool blLogToStdout = true;
bool blDebugOutput = false;

namespace {

struct Host {
    Host() : pDb(nullptr), strName("task"), strCreate("create table task (id int, data text)")
    {
        if (SQLITE_OK != sqlite3_open(":memory:", &pDb)) exit(1);
        jDefinition["task"]["member"]["id"]["cpptype"] = "int";
        jDefinition["task"]["member"]["data"]["cpptype"] = "Json::objectValue";
    }

    // The library's own statics are younger than this object and would be gone by now.
    ~Host()
    {
        if (!creates(2)) _Exit(2);
        delete pApi;
        if (SQLITE_OK != sqlite3_close(pDb)) _Exit(3);
    }

    bool creates(int iId)
    {
        if (nullptr == pApi) pApi = new VornJsonDbApi(pDb, strName, jDefinition, strCreate);
        Json::Value jRecord;
        Json::Value jStored;
        jRecord["id"] = iId;
        jRecord["data"]["key"] = "value";
        return 0 == pApi->recCreate(jRecord, jStored) && jRecord == jStored;
    }

    sqlite3* pDb;
    std::string strName;
    std::string strCreate;
    Json::Value jDefinition;
    VornJsonDbApi* pApi = nullptr;
};

Host host;

}  // namespace

int main()
{
    return host.creates(1) && 1 == host.pApi->runSqlEx("update task set id=3") ? 0 : 4;
}
