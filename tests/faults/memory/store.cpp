// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
#include "faults/memory/store.h"

#include "support/connection.h"

#include <unistd.h>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iterator>

namespace fs = std::filesystem;

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
    " ('{\"n\":" OBJECTS
    "}', 2, 'the second of the rows alike'),"
    " ('{\"n\":" LONG_LIST "}', 3, 'the third of the rows alike');";

constexpr char kRows[] =
    "select coalesce(group_concat(strRow), '') from (select id || ' ' || name || ' ' || flag"
    " || coalesce(' ' || replace(data, '\"', ''), '') || coalesce(' ' || replace(tags, '\"', ''),"
    " '') || coalesce(' ' || big, '') || coalesce(' ' || rate, '') strRow from task order by id)";

std::string path(const char* szEnd)
{
    return fs::temp_directory_path() / ("vornjsondb-memory-" + std::to_string(getpid()) + szEnd);
}

sqlite3* openedQuick(const std::string& strPath)
{
    sqlite3* pDb = sqlite::opened(strPath);
    sqlite::run(pDb, "pragma synchronous = off");
    return pDb;
}

// The bytes of the file that every point begins with.
std::string freshFile()
{
    const std::string strPath = path(".fresh");
    sqlite3* pDb = openedQuick(strPath);
    sqlite::run(pDb, std::string("pragma page_size = 1024; create table bystander (a);") + kSchema);
    if (SQLITE_OK != sqlite3_close(pDb)) abort();
    std::ifstream file(strPath, std::ios::binary);
    const std::string strBytes{std::istreambuf_iterator<char>(file), {}};
    fs::remove(strPath);
    return strBytes;
}

}  // namespace

const char kDefinition[] = R"({
    "task": {"member": {
        "any": {"cpptype": "Json::Value"}, "big": {"cpptype": "long long"},
        "data": {"cpptype": "Json::objectValue"}, "flag": {"cpptype": "bool"},
        "id": {"cpptype": "int"},
        "name": {"cpptype": "string", "cppDefaultValue": "somebody unnamed"},
        "rate": {"cpptype": "double"},
        "tags": {"cpptype": "Json::arrayValue", "cppDefaultValue": [1, 2]}}},
    "plain": {"member": {
        "data": {"cpptype": "Json::objectValue"}, "id": {"cpptype": "int"},
        "name": {"cpptype": "string"}}},
    "made": {"member": {"id": {"cpptype": "int"}}},
    "partial": {"member": {"a": {"cpptype": "int"}, "b": {}}},
    "words": {"member": {
        "a": {"cpptype": "string"}, "b": {"cpptype": "int"}, "c": {"cpptype": "unsigned int"},
        "d": {"cpptype": "unsigned long long"}, "e": {"cpptype": "float"},
        "f": {"cpptype": "double"}, "g": {"cpptype": "Json::arrayValue"}}}})";

Store::Store() : strPath_(path(".db"))
{
    static const std::string& strFresh = *new std::string(freshFile());
    // Of a killed process that had the same id: SQLite would play it back.
    fs::remove(strPath_ + "-journal");
    std::ofstream(strPath_, std::ios::binary) << strFresh;
    pDb_ = openedQuick(strPath_);
    pOther_ = openedQuick(strPath_);
}

Store::~Store()
{
    sqlite3_close_v2(pDb_);
    sqlite3_close_v2(pOther_);
    fs::remove(strPath_);
}

std::string Store::rows()
{
    return sqlite::value(pOther_, kRows);
}

bool Store::hasMade()
{
    return "1" == sqlite::value(pOther_, "select count(*) from sqlite_master where name = 'made'");
}

void Store::restore()
{
    sqlite::run(pDb_, std::string("begin immediate;") + kSchema + "commit");
    sqlite3_set_last_insert_rowid(pDb_, 0);
}
