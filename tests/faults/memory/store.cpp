// SPDX-License-Identifier: MIT
#include "store.h"

#include <unistd.h>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <thread>

namespace {

constexpr char kSchema[] =
    "drop table if exists task; drop table if exists made; drop table if exists plain;"
    "create table task (any text, big integer, data text, flag integer default 1,"
    " id integer primary key, name text unique, rate real, tags text);"
    "insert into task (id, name, flag, data, tags) values"
    " (1, 'Ann', 1, '{\"k\":[\"x\"]}', '[1,true]'), (2, 'Bob', 0, null, null),"
    " (3, 'O''Brien', 1, null, null);"
    "create table plain (data text, id integer primary key, name text);"
    "insert into plain values ('{\"n\":1}', 1, 'the first of the rows alike'),"
    " ('{\"n\":2}', 2, 'the second of the rows alike'),"
    " ('{\"n\":" LONG_LIST "}', 3, 'the third of the rows alike');";

constexpr char kRows[] =
    "select coalesce(group_concat(strRow), '') from (select id || ' ' || name || ' ' || flag"
    " || coalesce(' ' || replace(data, '\"', ''), '') || coalesce(' ' || replace(tags, '\"', ''),"
    " '') || coalesce(' ' || big, '') || coalesce(' ' || rate, '') strRow from task order by id)";

sqlite3* opened(const std::string& strPath)
{
    sqlite3* pDb = nullptr;
    if (SQLITE_OK != sqlite3_open(strPath.c_str(), &pDb)) abort();
    Store::run(pDb, "pragma synchronous = off");
    return pDb;
}

std::string path(const char* szEnd)
{
    return std::filesystem::temp_directory_path() /
           ("vornjsondb-memory-" + std::to_string(getpid()) + szEnd);
}

// The bytes of the file that every point begins with.
std::string freshFile()
{
    const std::string strPath = path(".fresh");
    sqlite3* pDb = opened(strPath);
    Store::run(pDb, "pragma page_size = 1024; create table other (n); insert into other values(0)");
    Store::run(pDb, kSchema);
    if (SQLITE_OK != sqlite3_close(pDb)) abort();
    std::ifstream file(strPath, std::ios::binary);
    const std::string strBytes((std::istreambuf_iterator<char>(file)),
                               std::istreambuf_iterator<char>());
    std::filesystem::remove(strPath);
    return strBytes;
}

int appendRow(void* arg, int nColumns, char** values, char** /*names*/)
{
    for (int i = 0; i < nColumns; ++i)
        static_cast<std::string*>(arg)->append(values[i] ? values[i] : "NULL");
    return 0;
}

bool isMutexFree(sqlite3* pDb)
{
    int iStatus = SQLITE_BUSY;
    std::thread other([&] {
        iStatus = sqlite3_mutex_try(sqlite3_db_mutex(pDb));
        if (SQLITE_OK == iStatus) sqlite3_mutex_leave(sqlite3_db_mutex(pDb));
    });
    other.join();
    return SQLITE_OK == iStatus;
}

}  // namespace

Store::Store() : strPath_(path(".db"))
{
    static const std::string& strFresh = *new std::string(freshFile());
    // Of a process that had this number and was killed: SQLite would play it back.
    std::filesystem::remove(strPath_ + "-journal");
    std::ofstream(strPath_, std::ios::binary) << strFresh;
    pDb_ = opened(strPath_);
    pOther_ = opened(strPath_);
}

Store::~Store()
{
    close();
    std::filesystem::remove(strPath_);
}

void Store::run(sqlite3* pDb, const std::string& strSql)
{
    char* szError = nullptr;
    if (SQLITE_OK == sqlite3_exec(pDb, strSql.c_str(), nullptr, nullptr, &szError)) return;
    fprintf(stderr, "%s: %s\n", strSql.c_str(), szError);
    abort();
}

// All columns of all rows in one text, as the second connection sees them.
std::string Store::value(const char* szSql)
{
    std::string strValue;
    if (SQLITE_OK == sqlite3_exec(pOther_, szSql, appendRow, &strValue, nullptr)) return strValue;
    return sqlite3_errmsg(pOther_);
}

std::string Store::rows()
{
    return value(kRows);
}

bool Store::hasMade()
{
    return "1" == value("select count(*) from sqlite_master where name = 'made'");
}

std::string Store::whatIsStuck()
{
    if (nullptr != sqlite3_next_stmt(pDb_, nullptr)) return "a statement is open";
    if (0 == sqlite3_get_autocommit(pDb_)) return "a transaction is open";
    if (!isMutexFree(pDb_)) return "the connection's mutex is held";
    if (SQLITE_OK != sqlite3_exec(pOther_, "update other set n = n + 1", nullptr, nullptr, nullptr))
        return std::string("another connection cannot write: ") + sqlite3_errmsg(pOther_);
    const std::string strIntegrity = value("pragma integrity_check");
    if ("ok" != strIntegrity) return "integrity_check: " + strIntegrity;
    return std::string();
}

void Store::restore()
{
    run(pDb_, std::string("begin immediate;") + kSchema + "commit");
    sqlite3_set_last_insert_rowid(pDb_, 0);
}

std::string Store::close()
{
    std::string strProblem;
    for (sqlite3** ppDb : {&pDb_, &pOther_}) {
        const int iStatus = sqlite3_close(*ppDb);
        if (SQLITE_OK != iStatus) {
            strProblem = "sqlite3_close gave " + std::to_string(iStatus);
            sqlite3_close_v2(*ppDb);
        }
        *ppDb = nullptr;
    }
    return strProblem;
}
