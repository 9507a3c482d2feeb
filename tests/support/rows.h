// SPDX-License-Identifier: MIT
// What the tests of execution and decoding share: rows handed to a row callback, and the handle's
// last SQL error.
#pragma once

#include "support/database.h"

#include <string>
#include <vector>

// The row callback of the library, as it hands it to sqlite3_exec. The table's member types are
// known afterwards.
doubles::RowCallback rowCallback(Table& table);

// One result row as SQLite would hand it to a row callback; a null text is SQL NULL.
struct Row {
    std::vector<const char*> names;
    std::vector<const char*> values;

    int handTo(doubles::RowCallback callback, void* arg);
};

// A double of sqlite3_exec that hands one row to the callback, and ends as SQLite would.
doubles::Exec execOfRow(Row row);

// A double of sqlite3_exec that ends with that status and error text (null for none).
doubles::Exec execOfStatus(int iStatus, const char* szError);

// The SQL error text that the handle holds, as a save that ends before it runs any SQL logs it;
// empty for none. Takes the log. The table's definition has to have kUnsavable as a member, beside
// others in small letters.
extern const char kUnsavable[];
std::string lastSqlError(Table& table);
