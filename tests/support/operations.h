// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// Every operation of the library that touches the file, on a table of twelve records, with the log
// of its failure.
#pragma once

#include "support/calls.h"
#include "support/database.h"

#include <ostream>
#include <string>
#include <vector>

constexpr char kMembers[] = R"({"id":   {"cpptype": "int"},
                                "name": {"cpptype": "string"},
                                "note": {"cpptype": "string", "cppDefaultValue": "none"},
                                "tags": {"cpptype": "Json::objectValue", "cppDefaultValue": {}}})";
constexpr char kWithKeys[] =
    "id integer primary key, name text unique, note text not null, tags text";
constexpr char kWithoutKeys[] = "id integer, name text, note text, tags text";
constexpr int kRecords = 12;

// Makes the table "records" with its records, called name1 to name12.
std::string recordsSql(const char* szColumns);

struct Operation {
    const char* szName;       // the first word is the function
    const char* szArguments;  // as Call takes them
    // Of an undisturbed run; the constructor's is -1 if it logged anything.
    int iResult;
    bool blWrites = true;
    bool blNeedsTable = true;

    // Sets jOutput to the record or list that the operation writes, if there is one.
    int run(Database& database, Table& table, Json::Value& jOutput) const;
    // The output's value before the operation.
    Json::Value untouched() const;
    // The whole log when the statement fails with that error after that many retries.
    Lines failure(const Table& table, const std::string& strError, const std::string& strSql,
                  std::size_t nRetries = 0) const;

    bool is(const std::string& strFunction) const;
    friend std::ostream& operator<<(std::ostream& out, const Operation& operation)
    {
        return out << operation.szName;
    }
};

// The statement of the only call since the last check. It was tried that often, with 10 ms after
// each attempt that met a lock.
std::string onlyStatement(std::size_t nAttempts, std::size_t nSleeps);

// A gtest name made of these parts: "recSave inserts" and "wal" give recSave_inserts_wal.
std::string testName(const std::vector<std::string>& parts);

const std::vector<Operation>& operations();
const Operation& operation(const char* szName);
