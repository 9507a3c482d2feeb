// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// Shared by the tests that try very many arguments, or calls that are written as words.
#pragma once

#include "support/database.h"

#include <string>
#include <vector>

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

// The text with other words for every such character.
std::string replaced(const std::string& strText, char cOld, const std::string& strNew);

// A call such as {"recList", R"({"a":1})", "[]"}: the function and its arguments as in the
// interface. A flag is a word such as "insert" or "all". An output that is left out is filled
// before the call, and a key that is left out is a null pointer.
using Words = std::vector<std::string>;

// The arguments as Call takes them; the member "output" names the one that is an output.
Json::Value argumentsOf(const Words& call);

struct Ended {
    std::string strEnd;  // as endOf tells it
    Json::Value jBefore;
    Json::Value jOut;       // the output, before the call and after it
    std::string strChange;  // of the output: its JSON, or what was appended to its text

    std::string whole() const { return strChange.empty() ? strEnd : strEnd + " " + strChange; }
};

// The test fails if the call changes an argument that is not an output, or the beginning of an
// output text.
Ended called(VornJsonDbApi& api, const Words& call);

// No statement or transaction is open, and the handle can write a record and read it back;
// strRecord is a record for its table, as JSON.
void expectSound(Database& database, VornJsonDbApi& api, const std::string& strRecord);

// Ends the process of a death test, with 0 unless a check has failed. Its fixture is never
// destroyed, so the database file is removed here.
[[noreturn]] void endProcess(const Database& database);
