// SPDX-License-Identifier: MIT
// The database file of a fault point, with the host's connection and a second one.
#pragma once

#include <sqlite3.h>

#include <string>

class Store {
public:
    // A fresh copy of the same file each time.
    Store();
    ~Store();
    Store(const Store&) = delete;
    Store& operator=(const Store&) = delete;

    sqlite3* get() const { return pDb_; }

    // What was committed, as the second connection sees it: the rows of the table "task", a row as
    // its columns between blanks, and whether there is a table "made".
    std::string rows();
    bool hasMade();

    // Empty, or what is wrong with the connection after a call: an open statement or transaction, a
    // held mutex, a lock that keeps the second connection from writing, a damaged file.
    std::string whatIsStuck();

    // Back to the rows of the beginning, by the host's connection.
    void restore();

    // Closes both; empty, or what went wrong.
    std::string close();

    // Runs the text, which has to succeed.
    static void run(sqlite3* pDb, const std::string& strSql);

private:
    std::string value(const char* szSql);

    std::string strPath_;
    sqlite3* pDb_ = nullptr;
    sqlite3* pOther_ = nullptr;
};
