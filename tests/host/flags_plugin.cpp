// SPDX-License-Identifier: MIT
// A plugin with flags of its own; two_plugins loads two of them. LOG_TO_STDOUT is the flag's
// initial value.

#include <VornJsonDbApi.h>
#include <sqlite3.h>

bool blLogToStdout = LOG_TO_STDOUT;
bool blDebugOutput = false;

extern "C" void setLogToStdout(bool blStdout);
extern "C" bool logsOneFailure();

void setLogToStdout(bool blStdout)
{
    blLogToStdout = blStdout;
}

bool logsOneFailure()
{
    sqlite3* pDb = nullptr;
    if (SQLITE_OK != sqlite3_open(":memory:", &pDb)) return false;
    std::string strName = "task";
    std::string strCreate = "create table task (id integer primary key)";
    Json::Value jDefinition;
    jDefinition["task"]["member"]["id"]["cpptype"] = "long long";
    bool blFailed = false;
    {
        VornJsonDbApi api(pDb, strName, jDefinition, strCreate);
        blFailed = -1 == api.runSqlEx("no sql");
    }
    return SQLITE_OK == sqlite3_close(pDb) && blFailed;
}
