// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
#include "database.h"

#include "failure.h"
#include "json_text.h"

#include <cerrno>
#include <cstring>
#include <fstream>
#include <iterator>

namespace tool {

namespace {

// Names of tables have neither dots nor slashes.
bool isFile(const std::string& strTable)
{
    return std::string::npos != strTable.find_first_of("./");
}

Json::Value readTable(const std::string& strPath)
{
    std::ifstream file(strPath);
    const std::string strText(std::istreambuf_iterator<char>(file), {});
    if (!file) throw Failure(strPath + ": " + std::strerror(errno));
    Json::Value jTable = parseJson(strText, {strPath, 1});
    if (!jTable.isObject() || !jTable["name"].isString() || !jTable["create"].isString() ||
        !jTable["definition"].isObject())
        throw Failure(strPath + ": expected \"name\", \"create\" and \"definition\"");
    return jTable;
}

}  // namespace

Database openDatabase(const std::string& strPath, bool blCreate)
{
    sqlite3* pDb = nullptr;
    const int iFlags = SQLITE_OPEN_READWRITE | (blCreate ? SQLITE_OPEN_CREATE : 0);
    const int iStatus = sqlite3_open_v2(strPath.c_str(), &pDb, iFlags, nullptr);
    Database database(pDb);
    if (SQLITE_OK != iStatus) throw Failure(strPath + ": " + sqlite3_errmsg(pDb));
    return database;
}

std::vector<std::vector<std::string>> select(sqlite3* pDb, const char* szSql,
                                             const std::string& strText)
{
    const WaitForLocks wait(pDb);
    const std::unique_ptr<char, void (*)(void*)> szText(sqlite3_mprintf(szSql, strText.c_str()),
                                                        sqlite3_free);
    if (nullptr == szText) throw std::bad_alloc();
    std::vector<std::vector<std::string>> rows;
    const auto append = [](void* pRows, int nColumns, char** values, char** /*names*/) {
        auto& row = static_cast<std::vector<std::vector<std::string>>*>(pRows)->emplace_back();
        for (int i = 0; i < nColumns; ++i) row.emplace_back(values[i] ? values[i] : "");
        return 0;
    };
    if (SQLITE_OK != sqlite3_exec(pDb, szText.get(), append, &rows, nullptr))
        throw Failure(sqlite3_errmsg(pDb));
    return rows;
}

std::string quotedName(const std::string& strName)
{
    std::string strQuoted = "\"";
    for (const char c : strName) strQuoted.append('"' == c ? 2 : 1, c);
    return strQuoted + '"';
}

Transaction::Transaction(sqlite3* pDb, const char* szBegin) : pDb_(pDb)
{
    select(pDb, szBegin);
}

Transaction::~Transaction()
{
    if (0 == sqlite3_get_autocommit(pDb_))
        sqlite3_exec(pDb_, "rollback", nullptr, nullptr, nullptr);
}

void Transaction::commit()
{
    select(pDb_, "commit");
}

long long Table::checked(long long iResult) const
{
    if (0 > iResult) throw Failure(pRecords->reason());
    return iResult;
}

TableText findTable(sqlite3* pDb, const std::string& strName)
{
    const auto found = select(pDb,
                              "select type,name,sql from sqlite_schema where type in "
                              "('table','view') and name=%Q collate nocase",
                              strName);
    if (found.empty()) throw Failure("no table \"" + strName + "\"");
    if ("table" != found[0][0]) throw Failure("\"" + strName + "\" is a view, not a table");
    return {found[0][1], found[0][2]};
}

Table openTable(const std::string& strDatabase, const std::string& strTable, Open open)
{
    const bool blFile = isFile(strTable);
    Json::Value jTable = blFile ? readTable(strTable) : Json::Value();
    Table table;
    try {
        table.database = openDatabase(strDatabase, blFile && Open::kCreating == open);
    } catch (const Failure& failure) {
        if (blFile || Open::kCreating != open) throw;
        throw Failure(failure.what() + std::string("; to make it, give a table file"));
    }
    sqlite3* pDb = table.database.get();
    if (!blFile)
        jTable = describeTable(pDb, strTable);
    else if (Open::kExisting == open)
        findTable(pDb, jTable["name"].asString());
    table.strName = jTable["name"].asString();
    table.jMembers = jTable["definition"][table.strName]["member"];
    table.pRecords = bindTable(pDb, jTable);
    return table;
}

std::unique_ptr<VornJsonTable> bindTable(sqlite3* pDb, const Json::Value& jTable)
{
    auto pRecords = std::make_unique<VornJsonTable>(
        pDb, jTable["name"].asString(), jTable["definition"], jTable["create"].asString());
    if (VornJsonTable::Cause::kNone != pRecords->cause()) throw Failure(pRecords->reason());
    return pRecords;
}

}  // namespace tool
