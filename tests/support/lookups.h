// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// Look-ups of member types as their tests expect them in the log, and definitions that have none.
#pragma once

#include "support/matrix.h"

#include <string>

inline constexpr char kPoisoned[] = "jType[strJsonName].type() != Json::objectValue";

struct BadDefinition {
    const char* szName;
    const char* szDefinition;
    const char* szLater;  // after the column list looked up its members
    const char* szCondition;
};

inline constexpr BadDefinition kBadDefinitions[] = {
    {"null", "null", R"({"$":{"member":null}})", "jTableDef.empty()"},
    {"empty object", "{}", R"({"$":{"member":null}})", "jTableDef.empty()"},
    {"empty array", "[]", "[]", "jTableDef.empty()"},
    {"array", R"(["$"])", R"(["$"])", "!jTableDef.isMember(strJsonName)"},
    {"another table", R"({"-":{}})", R"({"-":{},"$":{"member":null}})",
     "!jTableDef.isMember(strJsonName)"},
    {"null table", R"({"$":null})", R"({"$":{"member":null}})",
     "!jTableDef[strJsonName].isObject()"},
    {"text table", R"({"$":"member"})", R"({"$":"member"})", "!jTableDef[strJsonName].isObject()"},
    {"no member", R"({"$":{"x":1}})", R"({"$":{"member":null,"x":1}})",
     R"(!jTableDef[strJsonName].isMember("member"))"},
    {"member an array", R"({"$":{"member":["a"]}})", R"({"$":{"member":["a"]}})",
     R"(!jTableDef[strJsonName]["member"].isObject())"},
    {"member empty", R"({"$":{"member":{}}})", R"({"$":{"member":{}}})",
     "jType == Json::nullValue || !jType.isMember(strJsonName)"},
};

class LookUpsTest : public TableTest {
protected:
    // The text with every "$" replaced by the table's name.
    std::string named(const std::string& strText) const { return replaced(strText, '$', strName_); }

    Lines named(Lines lines) const
    {
        for (std::string& strLine : lines) strLine = named(strLine);
        return lines;
    }

    // The log. A dump of all tables' types is reduced to the entry of this table.
    Lines takeOwnLog()
    {
        const std::string strDump = utilPlain("jType=");
        const std::string strKey = '"' + strName_ + "\":";
        Lines lines = takeLog();
        for (std::string& strLine : lines) {
            if (0 != strLine.compare(0, strDump.size(), strDump)) continue;
            const std::size_t nKey = strLine.find(strKey);
            // The reader ignores what follows the entry.
            strLine = strDump + (std::string::npos == nKey
                                     ? "-"
                                     : text(leftByReader(strLine.substr(nKey + strKey.size()))));
        }
        return lines;
    }

    // Four lines of a failed look-up.
    static Lines lookUp(const std::string& strCondition, const std::string& strDefinition,
                        const std::string& strEntry)
    {
        return {utilFailed(strCondition), utilPlain("strJsonName=$"),
                utilPlain("jTableDef=" + strDefinition), utilPlain("jType=" + strEntry)};
    }

    std::string strName_ = freshName();
};
