// SPDX-License-Identifier: MIT
// What the tests share that try very many arguments.
#pragma once

#include "support/database.h"

#include <iostream>

// The result of a call, or "T" where it throws Json::LogicError. Anything else that is thrown fails
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

// The parts between the separators that are not empty.
std::vector<std::string> split(const std::string& strText, char cSeparator);

// No statement is open, no transaction either, and a record can be written and read back by the
// handle; strRecord is one that its table takes, as JSON.
void expectSound(Database& database, VornJsonDbApi& api, const std::string& strRecord);

// Ends the process of a death test, with 0 unless a check has failed. Its fixture is never
// destroyed, so the file of the database goes here.
[[noreturn]] void endProcess(const Database& database);

// A line for the table of figures.
inline void printFigure(const std::string& strName, std::size_t nNumber)
{
    std::cout << "figure: " << strName << " = " << nNumber << std::endl;
}
