// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// What every fuzz target is built on. entry.cpp hands each input to testInput() and checks the
// process afterwards.
#pragma once

#include "support/json_text.h"

#include <json/value.h>

#include <string>

// Defined once by each target.
void testInput(const std::string& strInput);

// Shows the text and ends the process.
[[noreturn]] void finding(const std::string& strText);

// The strict JSON of an input; false if it is invalid, or nested too deeply for jsoncpp's reader.
bool parseJson(const std::string& strText, Json::Value& jValue);

inline std::string text(const char* szText)
{
    return szText;
}

inline std::string text(const std::string& strText)
{
    return strText;
}

inline std::string text(int iValue)
{
    return std::to_string(iValue);
}

// Ends with a finding, described by the parts in a row, unless the condition holds.
template <typename... Part>
void require(bool blHolds, const Part&... part)
{
    if (!blHolds) finding((text(part) + ...));
}

// Outcome of a call of the library: its result, or the only exception that it may throw.
struct Outcome {
    bool blThrew = false;
    int iResult = 0;
};

template <typename Call>
Outcome outcomeOf(Call call)
{
    try {
        return {false, call()};
    } catch (const Json::LogicError&) {
        return {true, 0};
    }
}

// The result is iLow, or any between the two, or -1, or an accessor threw.
void requireResult(const Outcome& outcome, int iLow, int iHigh, const char* szCall);
