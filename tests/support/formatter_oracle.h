// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// SQLite's own formatter as the judge of value lists: wherever C defines what
//
//     sqlite3_mprintf(text + conversion, value)
//
// does with its one value, a value list has to be the same, byte for byte.
#pragma once

#include <json/value.h>

#include <string>

namespace formatter_oracle {

struct Value {
    const char* szConversion;  // "%Q", "%lld", "%llu" or "%lf"
    Json::Value jValue;
};

// How many arguments the format reads, as far as it is defined.
int countReads(const std::string& strFormat);

// Whether the described call is one that C defines.
bool isComparable(const std::string& strFormat, const Value& value);

// What the described call returns.
std::string described(const std::string& strFormat, const Value& value);

}  // namespace formatter_oracle
