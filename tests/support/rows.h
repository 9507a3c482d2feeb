// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// Shared by the tests of running statements and of decoding rows.
#pragma once

#include "support/records.h"

#include <optional>
#include <string>
#include <vector>

// The row callback of the library, as it hands it to sqlite3_exec. The table's member types are
// known afterwards.
doubles::RowCallback rowCallback(Table& table);

// One result row as it is passed to a row callback; a null text is SQL NULL, and an empty list is
// passed as a null pointer.
struct Row {
    std::vector<const char*> names;
    std::vector<const char*> values;
    std::optional<int> nColumns = {};  // unless as many as the longer list has

    int handTo(doubles::RowCallback callback, void* arg);
};

// A double of sqlite3_exec that hands rows to the callback until it stops, as SQLite does.
doubles::Exec execOfRows(std::vector<Row> rows);

// How a run of sqlite3_exec ends; null gives no error text, 0 leaves errno alone.
struct End {
    int iStatus;
    const char* szError = nullptr;
    int iErrno = 0;

    int leaveIn(char** errText) const;
};

// A double of sqlite3_exec whose runs end like these in turn, and like the last one from then on.
doubles::Exec execOfEnds(std::vector<End> ends);
inline doubles::Exec execOfStatus(int iStatus, const char* szError)
{
    return execOfEnds({{iStatus, szError}});
}

// A double of sqlite3_exec that runs the text, but reports it as locked that many times.
doubles::Exec execCalledLocked(int nTimes);

// The lines of a statement that the last column of a row stops.
Lines statementStopped(const Lines& field, const Row& row = {});

// The log, with "..." for the types of all tables of the process.
Lines takeLogWithoutTypes();

// With a table on which a save can fail before any SQL: no value list can hold "Unsavable".
class RunSqlTest : public TableTest {
protected:
    // The handle's SQL error text, as such a save logs it; empty for none. Takes the log.
    std::string lastSqlError();

    Table table_{database_,
                 R"({"Unsavable":{"cpptype":"Json::Value"},"a":{"cpptype":"int"},
                     "s":{"cpptype":"string"}})",
                 "a int, s text"};
};

// With a table of members of all types, for rows of SQL and rows that are handed to the callback.
// The log has to be taken.
class DecoderTest : public TableTest {
protected:
    ~DecoderTest() override { EXPECT_EQ(Lines(), takeLog()); }

    int run(const std::string& strSql) { return table_.api.runSqlEx(strSql, callback_, &rows_); }

    // The rows of a statement that succeeds.
    std::string rowsOf(const std::string& strSql);
    // What becomes of the rows that are handed to the callback, after the ones before.
    std::string decoded(std::vector<Row> rows, const char* szBefore = "null");
    std::string decoded(Table& table, const char* szBefore = "null");

    static const char kMembers[];
    Table table_{database_, kMembers, "s"};
    doubles::RowCallback callback_ = rowCallback(table_);
    // A host may change what recType refers to.
    Json::Value& jTypes_ = VORN_JSON_DB::recType(table_.jDefinition, table_.strName);
    const Json::Value jTypesBefore_ = jTypes_;
    Json::Value rows_;
    int iResult_ = 0;
};
