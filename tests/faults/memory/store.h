// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// The database file of a fault point, with the host's connection and a second one.
#pragma once

#include <sqlite3.h>

#include <string>

// JSON that exceeds the initial capacity of any text or statement.
#define LONG_LIST                                                  \
    "[1,2,3,4,5,6,7,8,9,10,11,12,13,14,15,16,17,18,19,20,"         \
    "21,22,23,24,25,26,27,28,29,30,31,32,33,34,35,36,37,38,39,40," \
    "41,42,43,44,45,46,47,48,49,50,51,52,53,54,55,56,57,58,59,60," \
    "61,62,63,64,65,66,67,68,69,70,71,72,73,74,75,76,77,78,79,80," \
    "81,82,83,84,85,86,87,88,89,90,91,92,93,94,95,96,97,98,99,100]"

// An object of each kind of member: like the one before it, unlike it, of a name that is not
// shared.
#define OBJECTS                                                                     \
    R"([{"k":1.5,"l":"a long enough text\n"},{"k":{},"l":[18446744073709551615]},)" \
    R"({"k":true},{"a name that is too long to be shared":{"l":"\u00e9"}}])"

// The tables of the file and the definitions of some that are not there.
extern const char kDefinition[];

class Store {
public:
    // A fresh copy of the same file each time.
    Store();
    ~Store();
    Store(const Store&) = delete;
    Store& operator=(const Store&) = delete;

    sqlite3* get() const { return pDb_; }
    sqlite3* other() const { return pOther_; }

    // What was committed, as the second connection sees it: the rows of the table "task", a row as
    // its columns between blanks, and whether there is a table "made".
    std::string rows();
    bool hasMade();

    // Restores the initial rows through the host's connection.
    void restore();

private:
    std::string strPath_;
    sqlite3* pDb_ = nullptr;
    sqlite3* pOther_ = nullptr;
};
