// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// The work that every contender does: the table `task`, its records and the six operations on them.
#pragma once

#include <json/value.h>

#include <string>

// Not included: SOCI puts SQLite's header into a namespace.
struct sqlite3;

namespace bench {

constexpr int kGroupSize = 10;
constexpr char kTable[] = "task";
// The columns in the order in which the library lists them.
constexpr char kColumns[] = "done,grp,id,meta,name,qty,tags";

// The table's definition as the library takes it, and the statements that make it.
Json::Value definition();
std::string createStatement();

// Records count from 1. A group has ten of them.
Json::Value record(int id);
std::string groupName(int group);
std::string newName(int id);

// JSON as one compact line, and back. Not for use within a measurement.
std::string toText(const Json::Value& jValue);
Json::Value fromText(const std::string& strText);

// Runs SQL that has to succeed; ends the program otherwise.
void run(sqlite3* pDb, const std::string& strSql);
// An empty database in memory.
sqlite3* openInMemory();
// Puts the records 1 to rows into the empty table.
void fill(sqlite3* pDb, int rows);
// What the table holds, as text.
std::string tableText(sqlite3* pDb);

// Ends the program with a message unless it holds.
void must(bool blHolds, const char* szWhat);

}  // namespace bench
