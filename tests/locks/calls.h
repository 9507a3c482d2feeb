// SPDX-License-Identifier: MIT
// The operations of the library on a table of three records, with the log of their failures.
#pragma once

#include "support/database.h"

#include <functional>
#include <ostream>
#include <string>
#include <vector>

constexpr char kMembers[] = R"({"id":   {"cpptype": "int"},
                                "name": {"cpptype": "string"},
                                "note": {"cpptype": "string", "cppDefaultValue": "none"}})";
constexpr char kColumns[] = "id integer primary key, name text unique, note text not null";

// Adds the records 1, 2 and 3, called Ann, Bob and Cid.
void addRecords(Database& database, const std::string& strTable);

struct Call {
    const char* szName;
    bool blWrites;
    // Where nothing is in the way.
    int iResult;
    std::function<int(Table&)> run;
    // What it logs above the line of the failed statement.
    std::function<Lines(Table&, const std::string& strError, const std::string& strSql)> context;

    friend std::ostream& operator<<(std::ostream& out, const Call& call)
    {
        return out << call.szName;
    }
};

const std::vector<Call>& calls();
const Call& call(const std::string& strName);

// The whole log of a call that failed with that error after so many retries.
Lines failure(const Call& call, Table& table, const std::string& strError,
              const std::string& strSql, int nRetries);
