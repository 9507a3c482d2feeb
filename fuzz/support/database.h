// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// A database in memory with a table, new for each input.
#pragma once

#include <VornJsonDbApi.h>

#include <sqlite3.h>

#include <string>
#include <vector>

// SQL that an input injects can neither leave the connection nor keep it busy: what an input makes
// of the statements is limited in steps, lengths and kinds.
class FuzzDatabase {
public:
    // Has a table "other" that no operation under test is asked for.
    FuzzDatabase();
    // Checks that no statement or transaction is open and that the connection can be closed.
    ~FuzzDatabase();
    FuzzDatabase(const FuzzDatabase&) = delete;
    FuzzDatabase& operator=(const FuzzDatabase&) = delete;

    sqlite3* get() const { return pDb_; }

    // The only column of the first row of the host's own query, free of all limits.
    std::string value(const std::string& strSql);
    // The number in the first column of the first row, 0 without a row, of the host's own query
    // with bound texts.
    int number(const std::string& strSql, const std::vector<std::string>& bound);

    // To be called where no part of an input is SQL.
    void requireOtherUntouched();

private:
    static int step(void* arg);
    void limit(bool blOn);

    sqlite3* pDb_ = nullptr;
    int iSteps_ = 0;
};

// A table and its handle. The cache of member types, which never forgets, learns of each new
// definition through the entry that recType hands out, so that all inputs share one name.
struct FuzzTable {
    // strColumns is the text between the parentheses of the CREATE statement.
    FuzzTable(FuzzDatabase& database, const Json::Value& jMembers, const std::string& strColumns);

    std::string rows(FuzzDatabase& database) const;

    std::string strName = "t";
    Json::Value jDefinition;
    std::string strCreate;
    VornJsonDbApi api;
};
