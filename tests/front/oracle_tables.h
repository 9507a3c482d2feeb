// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// The tables that random requests are about.
#pragma once

inline constexpr char kMembers[] = R"({
    "big":  {"cpptype": "long long"},
    "code": {"cpptype": "string"},
    "doc":  {"cpptype": "Json::Value"},
    "flag": {"cpptype": "bool"},
    "id":   {"cpptype": "long long"},
    "name": {"cpptype": "string"},
    "num":  {"cpptype": "int"}})";

inline constexpr const char* kTables[] = {
    "big integer, code text, doc text, flag integer, id integer primary key, name text, num "
    "integer",
    "big integer, code text, doc text, flag integer, id integer, name text, num integer, "
    "primary key (code, id)) without rowid --",
    "big integer not null, code text, doc text, flag integer, id integer primary key, "
    "name text collate nocase, num integer",
};
inline constexpr const char* kIndexes[] = {"", "create index @_i on @ (num, name)",
                                           "create index @_i on @ (name)"};
inline constexpr int kRows = 60;
