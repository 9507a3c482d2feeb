// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// A temporary database and a table handle on it.
#pragma once

#include "support/doubles.h"
#include "support/json_text.h"
#include "support/log.h"

#include <VornJsonDbApi.h>
#include <gtest/gtest.h>
#include <sqlite3.h>

#include <memory>
#include <string>
#include <vector>

// Parses JSON text; the test fails if it is not valid.
Json::Value json(const std::string& strText);

// A table name that is new: member types are kept for the life of the process.
std::string freshName();

using Rows = std::vector<std::vector<std::string>>;

// In memory, or in a file of its own if VORN_TEST_FILES=1 is set or a file is asked for.
class Database {
public:
    enum class Place { kDefault, kFile };

    explicit Database(Place place = Place::kDefault);
    // In that file (a name or a URI), which stays. Through that VFS, or the default one.
    explicit Database(const std::string& strFile, const char* szVfs = nullptr);
    // Fails the test if a statement is still open.
    ~Database();
    Database(const Database&) = delete;
    Database& operator=(const Database&) = delete;

    sqlite3* get() const { return pDb_; }
    const std::string& path() const { return strPath_; }

    // Bypasses the doubles; the test fails if SQLite refuses the text.
    void run(const std::string& strSql);
    // All rows, NULL as "NULL".
    Rows rows(const std::string& strSql);
    // The only column of the only row.
    std::string value(const std::string& strSql);

private:
    sqlite3* pDb_ = nullptr;
    std::string strPath_;
};

// A handle with what it was made from.
struct Table {
    // strMembers is the "member" object of the definition; strColumns is the text between
    // the parentheses of the CREATE statement.
    Table(Database& database, const std::string& strMembers, const std::string& strColumns);
    // On an existing table of that name.
    Table(Database& database, const std::string& strTable, const std::string& strMembers,
          const std::string& strColumns);

    // Calls recCreate with the JSON text, which has to succeed, and returns the stored row.
    Json::Value create(const std::string& strRecord);

    std::string strName;
    Json::Value jDefinition;
    std::string strCreate;
    VornJsonDbApi api;
};

// Resets the doubles and the host flags around each test.
class HostTest : public testing::Test {
protected:
    HostTest();
    ~HostTest() override;

    // The statements that the library ran since the last call.
    std::vector<std::string> takeStatements();
};

// With a database.
class TableTest : public HostTest {
protected:
    Database database_;
};
