// The vocabulary of "cpptype": one row a word, one column a consumer.
#pragma once

#include <string_view>

// How a column of a result row becomes a member.
enum class Decode { kNo, kText, kInt32, kInt64, kBool, kJson };
// How a member is written in the value list of INSERT and REPLACE.
enum class Value { kNo, kText, kSigned, kUnsigned, kFloat, kDouble, kJson };
// Which kind of JSON value the type check asks for.
enum class Check { kNo, kIntegral, kBool, kString, kArray, kObject };

struct TypeWord {
    std::string_view strWord;
    Decode decode;
    Value value;
    Check check;
};

// Kept: each consumer knows words of its own, and the gaps are part of what hosts rely on (a
// "double" can be written but not read back, a "Json::Value" the other way round).
// clang-format off
inline constexpr TypeWord kTypeWords[] = {
    //  word                  decode a row     value list         type check
    {"string",             Decode::kText,   Value::kText,     Check::kString  },
    {"int",                Decode::kInt32,  Value::kSigned,   Check::kIntegral},
    {"unsigned int",       Decode::kInt32,  Value::kUnsigned, Check::kNo      },
    {"unsigned",           Decode::kNo,     Value::kUnsigned, Check::kNo      },
    {"long",               Decode::kNo,     Value::kSigned,   Check::kNo      },
    {"unsigned long",      Decode::kNo,     Value::kUnsigned, Check::kNo      },
    {"long long",          Decode::kInt64,  Value::kSigned,   Check::kIntegral},
    {"unsigned long long", Decode::kInt64,  Value::kUnsigned, Check::kNo      },
    {"float",              Decode::kNo,     Value::kFloat,    Check::kNo      },
    {"double",             Decode::kNo,     Value::kDouble,   Check::kNo      },
    {"bool",               Decode::kBool,   Value::kSigned,   Check::kBool    },
    {"Json::Value",        Decode::kJson,   Value::kNo,       Check::kNo      },
    {"Json::objectValue",  Decode::kJson,   Value::kJson,     Check::kObject  },
    {"Json::arrayValue",   Decode::kJson,   Value::kJson,     Check::kArray   },
    {"uid_t",              Decode::kNo,     Value::kNo,       Check::kIntegral},
    {"time_t",             Decode::kNo,     Value::kNo,       Check::kIntegral},
};
// clang-format on

inline constexpr TypeWord kUnknownWord = {"", Decode::kNo, Value::kNo, Check::kNo};

// The row of a type word. Words are compared whole and case-sensitively.
inline const TypeWord& typeWord(std::string_view strWord)
{
    for (const TypeWord& row : kTypeWords)
        if (row.strWord == strWord) return row;
    return kUnknownWord;
}
