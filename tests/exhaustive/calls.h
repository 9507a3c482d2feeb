// SPDX-License-Identifier: MIT
// The functions of the interface, called from a text.
#pragma once

#include "support/matrix.h"

#include <map>
#include <memory>
#include <string>
#include <vector>

// One value of each kind that jsoncpp knows, and edge cases.
inline constexpr const char* kKinds[] = {"null", "true", "-1",        "18446744073709551615",
                                         "1.5",  "\"\"", "\"x\"",     "[]",
                                         "[1]",  "{}",   R"({"k":1})"};

struct Ended {
    std::string strEnd;  // the result, or T if the call threw Json::LogicError
    std::string strOut;  // an output that was changed: its JSON, or what was appended to its text

    std::string whole() const { return strOut.empty() ? strEnd : strEnd + " " + strOut; }
};

inline bool isFailure(const std::string& strEnd)
{
    return "T" == strEnd || '-' == strEnd[0];
}

// Runs a call such as `recList {"a":1} []`: the function and its arguments as in the interface,
// between single blanks. A text argument is written without quotes; an empty one as "", a null
// pointer as nullptr, the record of CallTest as @. An output that is left out is filled before the
// call.
//
// The test fails if the call changed an argument that is not an output, or an output although it
// failed or found no record, except where the function keeps what it appended before the failure.
Ended called(VornJsonDbApi& api, const std::string& strCall);

std::string replaced(const std::string& strText, char cOld, const std::string& strNew);

template <typename Item>
std::vector<Item> operator+(std::vector<Item> items, const std::vector<Item>& more)
{
    items.insert(items.end(), more.begin(), more.end());
    return items;
}

// Calls on tables of one record, {"a":"a","m":5,"z":"z"}: two texts and a member of any type word.
class CallTest : public TableTest {
protected:
    Table& tableOf(const std::string& strWord);

    // The call by a handle on the table ends like this, with W for a failure that has nevertheless
    // written. It logs exactly when it returns -1. An output is compared if one is expected.
    void checkCall(Table& table, VornJsonDbApi& api, const std::string& strCall,
                   const std::string& strExpected);

    // Handle and connection still work.
    void expectSound(Table& table);

    std::size_t nCells_ = 0;  // calls checked

private:
    std::map<std::string, std::unique_ptr<Table>> tables_;
};
