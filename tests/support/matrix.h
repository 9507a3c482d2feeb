// SPDX-License-Identifier: MIT
// Shared by the tests that try very many arguments.
#pragma once

#include "support/database.h"

#include <iostream>

// The result of a call, or "T" if it throws Json::LogicError. Anything else that is thrown fails
// the test.
template <typename Call>
std::string endOf(Call call)
{
    try {
        return std::to_string(call());
    } catch (const Json::LogicError&) {
        return "T";
    }
}

// The non-empty parts between the separators.
std::vector<std::string> split(const std::string& strText, char cSeparator);

// No statement or transaction is open, and the handle can write a record and read it back;
// strRecord is a record for its table, as JSON.
void expectSound(Database& database, VornJsonDbApi& api, const std::string& strRecord);

// Ends the process of a death test, with 0 unless a check has failed. Its fixture is never
// destroyed, so the database file is removed here.
[[noreturn]] void endProcess(const Database& database);

// A line for the table of figures.
inline void printFigure(const std::string& strName, std::size_t nNumber)
{
    std::cout << "figure: " << strName << " = " << nNumber << std::endl;
}
