// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
/// @file
/// First steps: opens a database, describes a table of tasks, and creates, gets, lists, updates and
/// deletes records.
///
/// Prints each record as it is stored, on a line of JSON that begins with what was done. The first
/// task is created with its title alone: the rest comes from its defaults and from SQLite.
#include <VornJsonDbApi.h>

#include <iostream>

// The library reads these two flags, and the host defines them. False and false: what fails is
// logged to syslog, and nothing else is logged.
bool blLogToStdout = false;
bool blDebugOutput = false;

namespace {

void print(const char* szWhat, const Json::Value& jValue)
{
    Json::StreamWriterBuilder oneLine;
    oneLine["indentation"] = "";
    std::cout << szWhat << ' ' << Json::writeString(oneLine, jValue) << '\n';
}

// Every call gives a negative number when it fails; the log then says why.
bool useTasks(sqlite3* pDb)
{
    // A record is a JSON object. Its members are described here, its columns in the statement.
    std::string strName = "task";
    std::string strCreate =
        "create table if not exists task (id integer primary key, title text, done integer)";
    Json::Value jDefinition;
    Json::Value& jMember = jDefinition[strName]["member"];
    jMember["done"]["cpptype"] = "bool";
    jMember["done"]["cppDefaultValue"] = false;
    jMember["id"]["cpptype"] = "long long";
    jMember["title"]["cpptype"] = "string";

    // The constructor runs the statement and cannot tell how it went: ask once more.
    VornJsonDbApi task(pDb, strName, jDefinition, strCreate);
    if (0 > task.tableCreate()) return false;

    for (const char* szTitle : {"Read the manual", "Write a host"}) {
        Json::Value jTask;
        Json::Value jStored;
        jTask["title"] = szTitle;
        if (0 > task.recCreate(jTask, jStored)) return false;
        print("created", jStored);
    }

    // A request names what the members have to be. 1: found, 0: there is none.
    Json::Value jFirst;
    Json::Value jFound;
    jFirst["id"] = 1;
    if (1 != task.recGetOne(jFirst, jFound)) return false;
    print("got", jFound);

    Json::Value jDone;
    jDone["done"] = true;
    if (0 > task.recUpdateByFilter(jFirst, jDone)) return false;

    // The empty request selects every record.
    Json::Value jAll(Json::objectValue);
    Json::Value jTasks(Json::arrayValue);
    if (0 > task.recList(jAll, jTasks)) return false;
    for (const Json::Value& jTask : jTasks) print("listed", jTask);

    const int iDeleted = task.recDelete(jDone);
    if (0 > iDeleted) return false;
    print("deleted", iDeleted);
    return true;
}

}  // namespace

int main()
{
    sqlite3* pDb = nullptr;
    const bool blDone = SQLITE_OK == sqlite3_open(":memory:", &pDb) && useTasks(pDb);
    if (!blDone) std::cerr << "failed, see the log: " << sqlite3_errmsg(pDb) << '\n';
    // The handle is gone by now. A connection is closed even when it could not be opened.
    const bool blClosed = SQLITE_OK == sqlite3_close(pDb);
    return blDone && blClosed ? 0 : 1;
}
