// SPDX-License-Identifier: MIT
// What the matrix tests share: the kinds of JSON value, and how a call ends.
#pragma once

#include "support/database.h"

#include <iostream>
#include <utility>

// One value of each kind that jsoncpp knows, and the edges: the columns of every matrix.
inline constexpr const char* kKinds[] = {"null", "true", "-1",        "18446744073709551615",
                                         "1.5",  "\"\"", "\"x\"",     "[]",
                                         "[1]",  "{}",   R"({"k":1})"};
// The column behind them, where a record fits: a record of SceneTest.
inline constexpr char kRecord[] = R"({"m":5,"z":"z"})";

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

inline bool isFailure(const std::string& strEnd)
{
    return "T" == strEnd || '-' == strEnd[0];
}

// The parts between the separators.
std::vector<std::string> split(const std::string& strText, char cSeparator);

// The template with the value where its "$" stands.
Json::Value filledIn(std::string strTemplate, const std::string& strValue);

// What a call may write besides the argument in question. On failure it has to be as it is here.
struct Outputs {
    std::string strText = "before";
    Json::Value jObject = json(R"({"kept":1})");
    Json::Value jArray = json(R"(["kept"])");

    void expectUntouched() const;
};

// No statement is open, no transaction either, and a record can be written and read back by the
// handle; strRecord is one that its table takes, as JSON.
void expectSound(Database& database, VornJsonDbApi& api, const std::string& strRecord);

// Ends the process of a death test, with 0 unless a check has failed. Its fixture is never
// destroyed, so the file of the database goes here.
[[noreturn]] void endProcess(const Database& database);

// While it lives, the lines of the log are not shown to EveryMessage, which searches each for every
// text that no line has had yet: thousands of lines would take their time.
class UnwatchedLog {
public:
    UnwatchedLog() : before_(std::exchange(doubles::onEveryLine, nullptr)) {}
    ~UnwatchedLog() { doubles::onEveryLine = before_; }
    UnwatchedLog(const UnwatchedLog&) = delete;
    UnwatchedLog& operator=(const UnwatchedLog&) = delete;

private:
    void (*before_)(const std::string& strText);
};

// A line for the table of figures.
inline void printFigure(const std::string& strName, std::size_t nNumber)
{
    std::cout << "figure: " << strName << " = " << nNumber << std::endl;
}
