// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// A database file and its tables, as the commands find them.
#pragma once

#include <VornJsonTable.h>

#include <memory>
#include <string>
#include <vector>

namespace tool {

struct CloseDatabase {
    void operator()(sqlite3* pDb) const { sqlite3_close(pDb); }
};
using Database = std::unique_ptr<sqlite3, CloseDatabase>;

// Throws Failure if the file cannot be opened. Only blCreate makes a file that is not there.
Database openDatabase(const std::string& strPath, bool blCreate);

// Statements of the tool's own wait for locks in SQLite; those of the library try again themselves.
class WaitForLocks {
public:
    explicit WaitForLocks(sqlite3* pDb) : pDb_(pDb) { sqlite3_busy_timeout(pDb, 5000); }
    ~WaitForLocks() { sqlite3_busy_timeout(pDb_, 0); }
    WaitForLocks(const WaitForLocks&) = delete;
    WaitForLocks& operator=(const WaitForLocks&) = delete;

private:
    sqlite3* pDb_;
};

// Runs one statement; %Q in the SQL stands for the text. Throws Failure with what SQLite says.
// Rows come as texts, NULL as an empty one.
std::vector<std::vector<std::string>> select(sqlite3* pDb, const char* szSql,
                                             const std::string& strText = "");

// The name as an identifier in SQL, whatever it holds.
std::string quotedName(const std::string& strName);

// A transaction around several calls of a table, undone unless it is committed.
class Transaction {
public:
    Transaction(sqlite3* pDb, const char* szBegin);
    ~Transaction();
    Transaction(const Transaction&) = delete;
    Transaction& operator=(const Transaction&) = delete;
    void commit();

private:
    sqlite3* pDb_;
};

// How SQLite spells the name of a table, and its CREATE statement.
struct TableText {
    std::string strName;
    std::string strSql;
};

// Throws Failure if there is no such table.
TableText findTable(sqlite3* pDb, const std::string& strName);

// {"name": ..., "create": ..., "definition": ...} of a table that exists. Throws Failure if it does
// not, or if no type word reads what is in a column.
Json::Value describeTable(sqlite3* pDb, const std::string& strName);

// Writes it in the form of a file that openTable reads.
std::string tableText(const Json::Value& jTable);

// What a command works with.
struct Table {
    Database database;
    std::string strName;
    Json::Value jMembers;  // of the definition
    std::unique_ptr<VornJsonTable> pRecords;

    // A result of the table, or Failure with its reason.
    long long checked(long long iResult) const;
};

// Whether the table may be made if it is not there.
enum class Open { kExisting, kCreating };

// strTable is the name of a table that exists, or a file that describe or infer has written.
Table openTable(const std::string& strDatabase, const std::string& strTable, Open open);

// Binds the table that jTable describes. Throws Failure if it cannot be handled exactly.
std::unique_ptr<VornJsonTable> bindTable(sqlite3* pDb, const Json::Value& jTable);

}  // namespace tool
