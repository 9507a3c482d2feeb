// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
/// @file
/// The log on syslog: how a host prepares it, and what it finds there.
///
/// Prints the result of two calls and, on standard error, what goes to syslog: for a record that is
/// refused one line for each level of the call, the innermost first, then, with blDebugOutput, the
/// trace of a call that does not fail.
#include <VornJsonDbApi.h>
#include <syslog.h>

#include <cerrno>
#include <iostream>

// False: to syslog, at LOG_ERR. Both flags are read for every line, so a host may change them.
bool blLogToStdout = false;
bool blDebugOutput = false;

namespace {

bool useSensors(sqlite3* pDb)
{
    std::string strName = "sensor";
    std::string strCreate = "create table if not exists sensor (id integer primary key, name text)";
    Json::Value jDefinition;
    jDefinition[strName]["member"]["id"]["cpptype"] = "long long";
    jDefinition[strName]["member"]["name"]["cpptype"] = "string";
    VornJsonDbApi sensor(pDb, strName, jDefinition, strCreate);
    if (0 > sensor.tableCreate()) return false;

    // Every line shows errno, whoever set it: cleared before a call, it is the call's own.
    Json::Value jSensor;
    Json::Value jStored;
    jSensor["id"] = "seven";
    jSensor["name"] = "roof";
    errno = 0;
    const int iCreated = sensor.recCreate(jSensor, jStored);
    std::cout << "recCreate: " << iCreated << std::endl;

    blDebugOutput = true;
    Json::Value jRoof;
    jRoof["name"] = "roof";
    errno = 0;
    const int iDeleted = sensor.recDelete(jRoof);
    std::cout << "recDelete: " << iDeleted << std::endl;
    return -1 == iCreated && 0 == iDeleted;
}

}  // namespace

int main()
{
    // The program's name in front of each line; LOG_PID is left out, as the lines have the process
    // id already. LOG_PERROR repeats each line on standard error: for looking at them, not for a
    // daemon. Priority LOG_ERR would be silenced by setlogmask(LOG_UPTO(LOG_CRIT)).
    openlog("log_on_syslog", LOG_PERROR, LOG_USER);

    sqlite3* pDb = nullptr;
    const bool blDone = SQLITE_OK == sqlite3_open(":memory:", &pDb) && useSensors(pDb);
    if (!blDone) std::cerr << "failed, see the log: " << sqlite3_errmsg(pDb) << '\n';
    const bool blClosed = SQLITE_OK == sqlite3_close(pDb);
    closelog();
    return blDone && blClosed ? 0 : 1;
}
