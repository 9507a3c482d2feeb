// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// The value list against SQLite's own formatter. The first line of the input is a JSON array of
// values, the rest is the text that the list is appended to:
//
//     ["O'Brien", -5, 1.5]
//     INSERT INTO t (a,b,c) VALUES (

#include "support/database.h"
#include "support/formatter_oracle.h"
#include "support/target.h"

#include <vector>

namespace {

using formatter_oracle::Value;

constexpr Json::ArrayIndex kMaxValues = 6;

struct Member {
    const char* szWord;
    Value value;
};

bool readMember(const Json::Value& jValue, std::vector<Member>& members)
{
    if (jValue.isString()) {
        // The described call takes a C string.
        const std::string strText = jValue.asString().c_str();
        members.push_back({"string", {"%Q", strText}});
    } else if (jValue.isInt64()) {
        members.push_back({"long long", {"%lld", jValue}});
    } else if (jValue.isUInt64()) {
        members.push_back({"unsigned long long", {"%llu", jValue}});
    } else if (jValue.isDouble()) {
        members.push_back({"double", {"%lf", jValue}});
    } else {
        return false;
    }
    return true;
}

bool readMembers(const std::string& strLine, std::vector<Member>& members)
{
    Json::Value jValues;
    if (!parseJson(strLine, jValues) || !jValues.isArray() || kMaxValues < jValues.size())
        return false;
    for (const Json::Value& jValue : jValues)
        if (!readMember(jValue, members)) return false;
    return !members.empty();
}

// The list as the described calls give it, value by value; false where one is not defined.
bool describedList(const std::vector<Member>& members, std::string& strText)
{
    std::size_t nLeft = members.size();
    for (const Member& member : members) {
        const std::string strFormat = strText + member.value.szConversion;
        if (!isComparable(strFormat, member.value)) return false;
        strText = described(strFormat, member.value) + (0 < --nLeft ? "," : ") ");
    }
    return true;
}

}  // namespace

void testInput(const std::string& strInput)
{
    const std::size_t nLine = strInput.find('\n');
    std::vector<Member> members;
    if (std::string::npos == nLine || !readMembers(strInput.substr(0, nLine), members)) return;
    const std::string strPrefix = strInput.substr(nLine + 1);

    Json::Value jMembers;
    Json::Value jRecord;
    for (std::size_t i = 0; i < members.size(); ++i) {
        const std::string strKey(1, static_cast<char>('a' + i));
        jMembers[strKey]["cpptype"] = members[i].szWord;
        jRecord[strKey] = members[i].value.jValue;
    }
    FuzzDatabase database;
    FuzzTable table(database, jMembers, "a");
    std::string strList = strPrefix;
    require(0 == table.api.SqlExpandMemberSymbol(strList, jRecord), "no value list");
    require(2 <= strList.size() && ") " == strList.substr(strList.size() - 2), "not closed");

    std::string strWanted = strPrefix;
    if (describedList(members, strWanted))
        require(strWanted == strList, "list ", strList, " for ", strWanted);
}
