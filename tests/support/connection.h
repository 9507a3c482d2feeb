// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// A host's connections to a file, without the doubles, and what a call of the library must not
// leave behind on one.
#pragma once

#include <sqlite3.h>

#include <string>

namespace sqlite {

// Ends the program if SQLite refuses.
sqlite3* opened(const std::string& strPath);
void run(sqlite3* pDb, const std::string& strSql);

// All columns of all rows in one text, NULL as "NULL"; SQLite's error text if it refuses.
std::string value(sqlite3* pDb, const std::string& strSql);

// Empty, or what is wrong: an open statement or transaction, a held mutex, a lock that keeps
// another connection from writing to the table "bystander (a)", a damaged file.
std::string whatIsStuck(sqlite3* pDb, sqlite3* pOther);

}  // namespace sqlite
