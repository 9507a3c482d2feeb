// SPDX-License-Identifier: MIT
// The vocabulary of "cpptype": one row a word, one column a consumer.
#pragma once

#include "util/json_members.h"

#include <string_view>

// How a column of a result row becomes a member.
enum class Decode { kNo, kText, kInt32, kInt64, kBool, kJson };
// How a member is written in the value list of INSERT and REPLACE.
enum class Value { kNo, kText, kSigned, kUnsigned, kFloat, kDouble, kJson };
// How a member is written in an equality term. A membership list knows only text and JSON words and
// writes the rest bare, "bool" too.
enum class Term { kText, kJson, kBool, kBare };
// Which kind of JSON value the type check asks for.
enum class Check { kNo, kIntegral, kBool, kString, kArray, kObject };

struct TypeWord {
    std::string_view strWord;
    Decode decode;
    Value value;
    Term term;
    Check check;
};

// Kept: each consumer knows words of its own, and the gaps are part of what hosts rely on (a
// "double" can be written but not read back, a "Json::Value" the other way round).
// clang-format off
inline constexpr TypeWord kTypeWords[] = {
    //  word               decode a row     value list        condition    type check
    {"string",             Decode::kText,   Value::kText,     Term::kText, Check::kString  },
    {"int",                Decode::kInt32,  Value::kSigned,   Term::kBare, Check::kIntegral},
    {"unsigned int",       Decode::kInt32,  Value::kUnsigned, Term::kBare, Check::kNo      },
    {"unsigned",           Decode::kNo,     Value::kUnsigned, Term::kBare, Check::kNo      },
    {"long",               Decode::kNo,     Value::kSigned,   Term::kBare, Check::kNo      },
    {"unsigned long",      Decode::kNo,     Value::kUnsigned, Term::kBare, Check::kNo      },
    {"long long",          Decode::kInt64,  Value::kSigned,   Term::kBare, Check::kIntegral},
    {"unsigned long long", Decode::kInt64,  Value::kUnsigned, Term::kBare, Check::kNo      },
    {"float",              Decode::kNo,     Value::kFloat,    Term::kBare, Check::kNo      },
    {"double",             Decode::kNo,     Value::kDouble,   Term::kBare, Check::kNo      },
    {"bool",               Decode::kBool,   Value::kSigned,   Term::kBool, Check::kBool    },
    {"Json::Value",        Decode::kJson,   Value::kNo,       Term::kJson, Check::kNo      },
    {"Json::objectValue",  Decode::kJson,   Value::kJson,     Term::kJson, Check::kObject  },
    {"Json::arrayValue",   Decode::kJson,   Value::kJson,     Term::kJson, Check::kArray   },
    {"uid_t",              Decode::kNo,     Value::kNo,       Term::kBare, Check::kIntegral},
    {"time_t",             Decode::kNo,     Value::kNo,       Term::kBare, Check::kIntegral},
};
// clang-format on

inline constexpr TypeWord kUnknownWord = {"", Decode::kNo, Value::kNo, Term::kBare, Check::kNo};

// The row of a type word. Words are compared whole and case-sensitively.
inline const TypeWord& typeWord(std::string_view strWord)
{
    for (const TypeWord& row : kTypeWords)
        if (row.strWord == strWord) return row;
    return kUnknownWord;
}

// The row of a member's type word as the cache of member types holds it.
inline const TypeWord& typeWordRow(const Json::Value& jMember)
{
    std::string strBuffer;
    return typeWord(typeWordView(jMember, strBuffer));
}
