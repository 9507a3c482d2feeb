// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
/// @file
/// Transactions: many records are stored together or not at all. They are the host's, who begins,
/// commits and rolls back with statements of its own.
///
/// Prints how many commits it took to store records one by one, how many to store a thousand in one
/// transaction, and that nothing is left of one that failed halfway. A commit waits until
/// the disk has the data, which takes longer than all the rest: one for a thousand records instead
/// of a thousand is why one transaction is fast.
#include <VornJsonDbApi.h>

#include <iostream>

bool blLogToStdout = false;
bool blDebugOutput = false;

namespace {

// SQLite calls this at every commit; 0 lets it happen.
int countCommit(void* pCommits)
{
    ++*static_cast<int*>(pCommits);
    return 0;
}

bool createRange(VornJsonDbApi& reading, int iFirst, int iLast)
{
    for (int i = iFirst; i <= iLast; ++i) {
        Json::Value jReading;
        Json::Value jStored;
        jReading["id"] = i;
        jReading["value"] = 10 * i;
        if (0 > reading.recCreate(jReading, jStored)) return false;
    }
    return true;
}

// All of them or none. "immediate" takes the lock at once: no call within the transaction then
// meets a database that another process has locked. Where a call might throw, roll back as well.
bool createTogether(VornJsonDbApi& reading, int iFirst, int iLast)
{
    if (0 > reading.runSqlEx("begin immediate")) return false;
    if (createRange(reading, iFirst, iLast) && 0 <= reading.runSqlEx("commit")) return true;
    if (0 > reading.runSqlEx("rollback")) std::cerr << "nothing to roll back\n";
    return false;
}

// The number of records, or -1.
int count(VornJsonDbApi& reading)
{
    Json::Value jAll(Json::objectValue);
    Json::Value jReadings(Json::arrayValue);
    return 0 > reading.recList(jAll, jReadings) ? -1 : static_cast<int>(jReadings.size());
}

bool useReadings(sqlite3* pDb)
{
    std::string strName = "reading";
    std::string strCreate =
        "create table if not exists reading (id integer primary key, value integer)";
    Json::Value jDefinition;
    jDefinition[strName]["member"]["id"]["cpptype"] = "long long";
    jDefinition[strName]["member"]["value"]["cpptype"] = "int";
    VornJsonDbApi reading(pDb, strName, jDefinition, strCreate);
    if (0 > reading.tableCreate()) return false;

    int iCommits = 0;
    sqlite3_commit_hook(pDb, countCommit, &iCommits);
    if (!createRange(reading, 1, 10)) return false;
    std::cout << "one by one: " << count(reading) << " records, " << iCommits << " commits\n";

    iCommits = 0;
    if (!createTogether(reading, 11, 1010)) return false;
    std::cout << "together: " << count(reading) << " records, " << iCommits << " commit\n";

    // 1500 is there already, so 1011 to 1499 go, too.
    if (!createRange(reading, 1500, 1500)) return false;
    if (createTogether(reading, 1011, 2010)) return false;
    std::cout << "rolled back: " << count(reading) << " records, " << reading.getErrMsg() << '\n';
    sqlite3_commit_hook(pDb, nullptr, nullptr);
    return true;
}

}  // namespace

int main()
{
    sqlite3* pDb = nullptr;
    const bool blDone = SQLITE_OK == sqlite3_open(":memory:", &pDb) && useReadings(pDb);
    if (!blDone) std::cerr << "failed, see the log: " << sqlite3_errmsg(pDb) << '\n';
    const bool blClosed = SQLITE_OK == sqlite3_close(pDb);
    return blDone && blClosed ? 0 : 1;
}
