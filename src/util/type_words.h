// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// The vocabulary of "cpptype": one row per word, one column per consumer.
#pragma once

#include "util/json_members.h"

#include <string>
#include <string_view>

namespace vorn {

// How a column of a result row becomes a member.
enum class RowForm { kNo, kText, kInt32, kInt64, kBool, kJson };
// How a member is written in the value list of INSERT and REPLACE.
enum class LiteralForm { kNo, kText, kSigned, kUnsigned, kFloat, kDouble, kJson };
// How a member is written in an equality term. A membership list knows only text and JSON words and
// writes the rest bare, "bool" too.
enum class TermForm { kText, kJson, kBool, kBare };
// Which kind of JSON value the type check asks for.
enum class CheckedKind { kNo, kIntegral, kBool, kString, kArray, kObject };

struct TypeForms {
    std::string_view strWord;
    RowForm row;
    LiteralForm literal;
    TermForm term;
    CheckedKind checked;
};

// Kept(ValueLists.RefuseAnyOtherWord, RowCallback.RefusesAValueOfAnyOtherType,
// TypeCheck.KnowsNoOtherWord): each consumer knows its own type words: a "double" is written but
// not read back, a "Json::Value" read but not written
// clang-format off
inline constexpr TypeForms kTypeWords[] = {
    //  word               a row            a value list            a condition      the type check
    {"string",             RowForm::kText,  LiteralForm::kText,     TermForm::kText, CheckedKind::kString  },
    {"int",                RowForm::kInt32, LiteralForm::kSigned,   TermForm::kBare, CheckedKind::kIntegral},
    {"unsigned int",       RowForm::kInt32, LiteralForm::kUnsigned, TermForm::kBare, CheckedKind::kNo      },
    {"unsigned",           RowForm::kNo,    LiteralForm::kUnsigned, TermForm::kBare, CheckedKind::kNo      },
    {"long",               RowForm::kNo,    LiteralForm::kSigned,   TermForm::kBare, CheckedKind::kNo      },
    {"unsigned long",      RowForm::kNo,    LiteralForm::kUnsigned, TermForm::kBare, CheckedKind::kNo      },
    {"long long",          RowForm::kInt64, LiteralForm::kSigned,   TermForm::kBare, CheckedKind::kIntegral},
    {"unsigned long long", RowForm::kInt64, LiteralForm::kUnsigned, TermForm::kBare, CheckedKind::kNo      },
    {"float",              RowForm::kNo,    LiteralForm::kFloat,    TermForm::kBare, CheckedKind::kNo      },
    {"double",             RowForm::kNo,    LiteralForm::kDouble,   TermForm::kBare, CheckedKind::kNo      },
    {"bool",               RowForm::kBool,  LiteralForm::kSigned,   TermForm::kBool, CheckedKind::kBool    },
    {"Json::Value",        RowForm::kJson,  LiteralForm::kNo,       TermForm::kJson, CheckedKind::kNo      },
    {"Json::objectValue",  RowForm::kJson,  LiteralForm::kJson,     TermForm::kJson, CheckedKind::kObject  },
    {"Json::arrayValue",   RowForm::kJson,  LiteralForm::kJson,     TermForm::kJson, CheckedKind::kArray   },
    {"uid_t",              RowForm::kNo,    LiteralForm::kNo,       TermForm::kBare, CheckedKind::kIntegral},
    {"time_t",             RowForm::kNo,    LiteralForm::kNo,       TermForm::kBare, CheckedKind::kIntegral},
};
inline constexpr TypeForms kUnknownWord =
    {"",                   RowForm::kNo,    LiteralForm::kNo,       TermForm::kBare, CheckedKind::kNo      };
// clang-format on

// Words are compared whole and case-sensitively.
inline const TypeForms& formsOf(std::string_view strWord)
{
    for (const TypeForms& forms : kTypeWords)
        if (forms.strWord == strWord) return forms;
    return kUnknownWord;
}

// The type word of a member as the cache of member types holds it; empty if there is none.
class TypeWord {
public:
    explicit TypeWord(const Json::Value& jMember) : pjWord_(find(jMember)) {}

    // A host may have put something other than a text there: it is converted, or jsoncpp throws.
    std::string text() const { return nullptr == pjWord_ ? std::string() : pjWord_->asString(); }

    const TypeForms& forms() const
    {
        const bool blText = nullptr != pjWord_ && pjWord_->isString();
        return blText ? formsOf(textOf(*pjWord_)) : formsOf(text());
    }

    // Whether it is that text. Never throws.
    bool is(std::string_view strWord) const
    {
        return nullptr != pjWord_ && pjWord_->isString() && textOf(*pjWord_) == strWord;
    }

private:
    // "cpptype" is the last member by name, as far as the library fills the cache, so that one is
    // tried before a search.
    static const Json::Value* find(const Json::Value& jMember)
    {
        const Json::ArrayIndex nMembers = jMember.size();
        if (0 == nMembers) return nullptr;
        const auto last = 1 == nMembers ? jMember.begin() : --jMember.end();
        return "cpptype" == memberName(last) ? &*last : findMember(jMember, "cpptype");
    }

    const Json::Value* pjWord_;
};

}  // namespace vorn
