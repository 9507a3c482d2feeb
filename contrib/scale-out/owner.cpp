// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// The owner of a database, a host that writes records for some seconds and notes what was
// acknowledged:
//
//     scale_owner DATABASE SETTINGS-SQL ACKNOWLEDGED SECONDS [ROWS [PAUSE]]
//
// ROWS records make a transaction (1: none is begun, and no other owner may be there). As soon as
// it is acknowledged, the file ACKNOWLEDGED gets a line "SECONDS FIRST-ID LAST-ID": how long it
// took, and which records it wrote. Then another owner can have its turn for PAUSE milliseconds.
// There is at least one transaction. The exit status is 0, 1 when something failed, 2 for wrong
// arguments, 3 when the database belongs to another owner.
#include <VornJsonDbApi.h>
#include <sqlite3.h>

#include <fcntl.h>
#include <unistd.h>

#include <chrono>
#include <cstdlib>
#include <iostream>
#include <thread>

bool blLogToStdout = true;
bool blDebugOutput = false;

namespace {

using Clock = std::chrono::steady_clock;

double secondsSince(Clock::time_point began)
{
    return std::chrono::duration<double>(Clock::now() - began).count();
}

int keepNumber(void* pNumber, int, char** aszValues, char**)
{
    *static_cast<int*>(pNumber) = std::atoi(aszValues[0]);
    return 0;
}

bool findLast(VornJsonDbApi& records, int& iLast)
{
    return 0 <= records.runSqlEx("select ifnull(max(id), 0) from record", keepNumber, &iLast);
}

// Writes the records after iLast, which another owner may have moved if there is a transaction.
bool write(VornJsonDbApi& records, int iRows, int& iLast)
{
    if (1 != iRows && (0 > records.runSqlEx("begin immediate") || !findLast(records, iLast)))
        return false;
    for (int i = 0; i < iRows; ++i) {
        const std::string strNumber = std::to_string(++iLast);
        Json::Value jRecord;
        Json::Value jStored;
        jRecord["id"] = iLast;
        jRecord["text"] = std::string(180 - strNumber.size(), '0') + strNumber;
        if (0 > records.recCreate(jRecord, jStored)) return false;
    }
    return 1 == iRows || 0 <= records.runSqlEx("commit");
}

// A line is in the file, for every reader, once write() has returned.
bool acknowledge(int iFile, double dSeconds, int iFirst, int iLast)
{
    const std::string strLine = std::to_string(dSeconds) + ' ' + std::to_string(iFirst) + ' ' +
                                std::to_string(iLast) + '\n';
    return static_cast<ssize_t>(strLine.size()) == ::write(iFile, strLine.data(), strLine.size());
}

bool own(sqlite3* pDb, int iFile, double dSeconds, int iRows, int iPause)
{
    std::string strName = "record";
    std::string strCreate = "create table if not exists record (id integer primary key, text text)";
    Json::Value jDefinition;
    jDefinition[strName]["member"]["id"]["cpptype"] = "int";
    jDefinition[strName]["member"]["text"]["cpptype"] = "string";
    VornJsonDbApi records(pDb, strName, jDefinition, strCreate);

    int iLast = 0;
    if (!findLast(records, iLast)) return false;
    const auto began = Clock::now();
    do {
        const auto began1 = Clock::now();
        if (!write(records, iRows, iLast)) return false;
        if (!acknowledge(iFile, secondsSince(began1), iLast - iRows + 1, iLast)) return false;
        std::this_thread::sleep_for(std::chrono::milliseconds(iPause));
    } while (secondsSince(began) < dSeconds);
    return true;
}

}  // namespace

int main(int argc, char** argv)
{
    const double dSeconds = 4 < argc ? std::atof(argv[4]) : -1;
    const int iRows = 5 < argc ? std::atoi(argv[5]) : 1;
    const int iPause = 6 < argc ? std::atoi(argv[6]) : 0;
    if (5 > argc || 7 < argc || 0 > dSeconds || 1 > iRows) return 2;

    sqlite3* pDb = nullptr;
    const int iFile = open(argv[3], O_WRONLY | O_CREAT | O_APPEND | O_CLOEXEC, 0644);
    int iStatus = sqlite3_open(argv[1], &pDb);
    if (SQLITE_OK == iStatus) iStatus = sqlite3_exec(pDb, argv[2], nullptr, nullptr, nullptr);
    const bool blDone = SQLITE_OK == iStatus && own(pDb, iFile, dSeconds, iRows, iPause);
    if (!blDone) std::cerr << "scale_owner: " << argv[1] << ": " << sqlite3_errmsg(pDb) << '\n';
    sqlite3_close(pDb);
    if (SQLITE_BUSY == iStatus) return 3;
    return blDone ? 0 : 1;
}
