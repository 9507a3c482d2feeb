// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// JSON text: strict reading with errors in one line, and compact writing.
#pragma once

#include <json/value.h>

#include <string>
#include <string_view>

namespace tool {

// Where a text begins, for messages: a line of a file, or an argument, which has no lines.
struct Place {
    std::string strSource;
    unsigned long uLine = 0;
    unsigned long uRecord = 0;  // of an array, from 1
};

// notes.jsonl:7, or notes.json:7, record 3
std::string toString(const Place& place);

// Throws Failure with the place and the reason if the text is not JSON, names a member twice,
// is nested deeper than 1,000 levels, or holds an integer that does not fit into 64 bits.
Json::Value parseJson(std::string_view strText, const Place& place);

// Appends the value without blanks, numbers with the fewest digits that read back as the same.
void appendJson(const Json::Value& jValue, std::string& strOut);

std::string toText(const Json::Value& jValue);

bool isUtf8(std::string_view strText);

}  // namespace tool
