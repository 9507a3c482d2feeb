// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
#include "support/connection.h"

#include <cstdio>
#include <cstdlib>
#include <thread>

namespace {

// Tried from another thread, because SQLite's mutexes are recursive.
bool isMutexFree(sqlite3* pDb)
{
    sqlite3_mutex* const pMutex = sqlite3_db_mutex(pDb);
    int iStatus = SQLITE_ERROR;
    std::thread([&] {
        iStatus = sqlite3_mutex_try(pMutex);
        if (SQLITE_OK == iStatus) sqlite3_mutex_leave(pMutex);
    }).join();
    return nullptr != pMutex && SQLITE_OK == iStatus;
}

}  // namespace

sqlite3* sqlite::opened(const std::string& strPath)
{
    sqlite3* pDb = nullptr;
    if (SQLITE_OK != sqlite3_open(strPath.c_str(), &pDb)) abort();
    return pDb;
}

void sqlite::run(sqlite3* pDb, const std::string& strSql)
{
    if (SQLITE_OK == sqlite3_exec(pDb, strSql.c_str(), nullptr, nullptr, nullptr)) return;
    fprintf(stderr, "%s: %s\n", strSql.c_str(), sqlite3_errmsg(pDb));
    abort();
}

std::string sqlite::value(sqlite3* pDb, const std::string& strSql)
{
    std::string strValue;
    const auto append = [](void* arg, int nColumns, char** values, char**) {
        for (int i = 0; i < nColumns; ++i)
            static_cast<std::string*>(arg)->append(values[i] ? values[i] : "NULL");
        return 0;
    };
    if (SQLITE_OK == sqlite3_exec(pDb, strSql.c_str(), append, &strValue, nullptr)) return strValue;
    return sqlite3_errmsg(pDb);
}

std::string sqlite::whatIsStuck(sqlite3* pDb, sqlite3* pOther)
{
    if (nullptr != sqlite3_next_stmt(pDb, nullptr)) return "a statement is open";
    if (0 == sqlite3_get_autocommit(pDb)) return "a transaction is open";
    if (!isMutexFree(pDb)) return "the connection's mutex is held";
    const std::string strWritten = value(pOther, "insert into bystander values (1)");
    if (!strWritten.empty()) return "another connection cannot write: " + strWritten;
    const std::string strIntegrity = value(pOther, "pragma integrity_check");
    return "ok" == strIntegrity ? "" : "integrity_check: " + strIntegrity;
}
