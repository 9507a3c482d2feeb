// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// Shared by the hand-written hosts on the C API: thin owners of a database and of statements that
// are prepared once.
#pragma once

#include "workload.h"

#include <sqlite3.h>

#include <string>
#include <string_view>

namespace bench {

class Statement {
public:
    Statement(sqlite3* pDb, const std::string& strSql)
    {
        must(SQLITE_OK == sqlite3_prepare_v3(pDb, strSql.c_str(), -1, SQLITE_PREPARE_PERSISTENT,
                                             &pStatement_, nullptr),
             strSql.c_str());
    }
    ~Statement() { sqlite3_finalize(pStatement_); }
    Statement(const Statement&) = delete;
    Statement& operator=(const Statement&) = delete;

    void bind(int i, int iValue) { sqlite3_bind_int(pStatement_, i, iValue); }
    void bind(int i, long long iValue) { sqlite3_bind_int64(pStatement_, i, iValue); }
    // The text has to live until the statement is reset.
    void bind(int i, const char* pBegin, const char* pEnd)
    {
        sqlite3_bind_text(pStatement_, i, pBegin, static_cast<int>(pEnd - pBegin), SQLITE_STATIC);
    }
    void bind(int i, const std::string& strText)
    {
        bind(i, strText.data(), strText.data() + strText.size());
    }

    // True while there is a row.
    bool step()
    {
        const int iStatus = sqlite3_step(pStatement_);
        must(SQLITE_ROW == iStatus || SQLITE_DONE == iStatus, sqlite3_sql(pStatement_));
        return SQLITE_ROW == iStatus;
    }
    void reset() { sqlite3_reset(pStatement_); }
    void runOnce()
    {
        step();
        reset();
    }

    int integer(int i) { return sqlite3_column_int(pStatement_, i); }
    long long integer64(int i) { return sqlite3_column_int64(pStatement_, i); }
    std::string_view text(int i)
    {
        const auto* szText = reinterpret_cast<const char*>(sqlite3_column_text(pStatement_, i));
        return {szText, static_cast<std::size_t>(sqlite3_column_bytes(pStatement_, i))};
    }

private:
    sqlite3_stmt* pStatement_ = nullptr;
};

// A database in memory with the table.
class TaskDatabase {
public:
    TaskDatabase() : pDb_(openInMemory()) { run(pDb_, createStatement()); }
    ~TaskDatabase() { sqlite3_close(pDb_); }
    TaskDatabase(const TaskDatabase&) = delete;
    TaskDatabase& operator=(const TaskDatabase&) = delete;

    sqlite3* get() const { return pDb_; }

private:
    sqlite3* pDb_;
};

// The statements of the six operations, their values in the order of kColumns.
struct TaskStatements {
    explicit TaskStatements(sqlite3* pDb)
        : insert(pDb, std::string("INSERT INTO task (") + kColumns + ") VALUES (?,?,?,?,?,?,?)"),
          stored(pDb, select + " WHERE rowid = last_insert_rowid()"),
          byId(pDb, select + " WHERE id = ?"),
          byGroup(pDb, select + " WHERE grp = ?"),
          every(pDb, select),
          update(pDb, "UPDATE task SET name = ? WHERE id = ?"),
          remove(pDb, "DELETE FROM task WHERE id = ?")
    {
    }

    const std::string select = std::string("SELECT ") + kColumns + " FROM task";
    Statement insert;
    Statement stored;
    Statement byId;
    Statement byGroup;
    Statement every;
    Statement update;
    Statement remove;
};

}  // namespace bench
