// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
#include "support/database.h"

#include <json/reader.h>

#include <unistd.h>
#include <atomic>
#include <cerrno>
#include <cstdlib>
#include <filesystem>
#include <utility>

Json::Value json(const std::string& strText)
{
    Json::CharReaderBuilder builder;
    Json::CharReaderBuilder::strictMode(&builder.settings_);
    builder["strictRoot"] = false;
    builder["allowSpecialFloats"] = true;
    builder["rejectDupKeys"] = false;
    const std::unique_ptr<Json::CharReader> pReader(builder.newCharReader());
    Json::Value jValue;
    std::string strError;
    if (!pReader->parse(strText.data(), strText.data() + strText.size(), &jValue, &strError))
        ADD_FAILURE() << "no JSON: " << strText << ": " << strError;
    return jValue;
}

std::string freshName()
{
    static std::atomic<int> iCount{0};
    return "t" + std::to_string(++iCount);
}

Database::Database(Place place)
{
    const char* szFiles = getenv("VORN_TEST_FILES");
    if (Place::kFile == place || (nullptr != szFiles && '1' == *szFiles)) {
        static std::atomic<int> iCount{0};
        strPath_ =
            std::filesystem::temp_directory_path() /
            ("vornjsondb-" + std::to_string(getpid()) + "-" + std::to_string(++iCount) + ".db");
        // May be left from a killed process that had the same id.
        std::filesystem::remove(strPath_);
        std::filesystem::remove(strPath_ + "-journal");
    }
    const std::string strTarget = strPath_.empty() ? ":memory:" : strPath_;
    if (SQLITE_OK != sqlite3_open(strTarget.c_str(), &pDb_)) ADD_FAILURE() << sqlite3_errmsg(pDb_);
    if (!strPath_.empty()) run("pragma synchronous=off");
}

Database::Database(const std::string& strFile, const char* szVfs)
{
    constexpr int kFlags = SQLITE_OPEN_READWRITE | SQLITE_OPEN_CREATE | SQLITE_OPEN_URI;
    if (SQLITE_OK != sqlite3_open_v2(strFile.c_str(), &pDb_, kFlags, szVfs))
        ADD_FAILURE() << strFile << ": " << sqlite3_errmsg(pDb_);
}

Database::~Database()
{
    EXPECT_EQ(SQLITE_OK, sqlite3_close(pDb_)) << "a statement was left open";
    if (!strPath_.empty()) std::filesystem::remove(strPath_);
}

void Database::run(const std::string& strSql)
{
    rows(strSql);
}

Rows Database::rows(const std::string& strSql)
{
    Rows rows;
    char* szError = nullptr;
    const auto collect = [](void* arg, int nColumns, char** values, char**) {
        std::vector<std::string> row;
        for (int i = 0; i < nColumns; ++i) row.emplace_back(values[i] ? values[i] : "NULL");
        static_cast<Rows*>(arg)->push_back(std::move(row));
        return 0;
    };
    const int iStatus = doubles::realExec(pDb_, strSql.c_str(), collect, &rows, &szError);
    EXPECT_EQ(SQLITE_OK, iStatus) << strSql << ": " << (szError ? szError : "");
    sqlite3_free(szError);
    return rows;
}

std::string Database::value(const std::string& strSql)
{
    const Rows rows = this->rows(strSql);
    if (1 == rows.size() && 1 == rows[0].size()) return rows[0][0];
    ADD_FAILURE() << "not one value: " << strSql;
    return std::string();
}

namespace {

Json::Value definition(const std::string& strTable, const std::string& strMembers)
{
    Json::Value jDefinition;
    jDefinition[strTable]["member"] = json(strMembers);
    return jDefinition;
}

}  // namespace

Table::Table(Database& database, const std::string& strMembers, const std::string& strColumns)
    : Table(database, freshName(), strMembers, strColumns)
{
}

Table::Table(Database& database, const std::string& strTable, const std::string& strMembers,
             const std::string& strColumns)
    : strName(strTable),
      jDefinition(definition(strTable, strMembers)),
      strCreate("create table if not exists " + strTable + " (" + strColumns + ")"),
      api(database.get(), strName, jDefinition, strCreate)
{
    EXPECT_EQ(Lines(), takeLog());
    doubles::state().statements.clear();
}

Json::Value Table::create(const std::string& strRecord)
{
    Json::Value jRecord = json(strRecord);
    Json::Value jStored;
    EXPECT_EQ(0, api.recCreate(jRecord, jStored)) << strRecord;
    return jStored;
}

HostTest::HostTest()
{
    doubles::reset();
    blLogToStdout = blDebugOutput = false;
    errno = 0;
}

HostTest::~HostTest()
{
    doubles::reset();
    blLogToStdout = blDebugOutput = false;
}

std::vector<std::string> HostTest::takeStatements()
{
    return std::exchange(doubles::state().statements, {});
}
