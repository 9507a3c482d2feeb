// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// The text of a column through the row decoder, under every type word. The input is the text.

#include "support/database.h"
#include "support/target.h"

#include <cstdint>

namespace {

constexpr const char* kWords[] = {"string",
                                  "int",
                                  "unsigned int",
                                  "unsigned",
                                  "long",
                                  "unsigned long",
                                  "long long",
                                  "unsigned long long",
                                  "float",
                                  "double",
                                  "bool",
                                  "Json::Value",
                                  "Json::objectValue",
                                  "Json::arrayValue",
                                  "uid_t",
                                  "time_t",
                                  "any other word"};
constexpr int kRows = 3;

// The digits at the front, held within the bounds, as the C library reads them.
Json::Int64 digits(const std::string& strText, Json::Int64 iLow, Json::Int64 iHigh)
{
    std::size_t i = strText.find_first_not_of(" \t\n\v\f\r");
    if (std::string::npos == i) return 0;
    const bool blMinus = '-' == strText[i];
    if (blMinus || '+' == strText[i]) ++i;
    Json::Int64 iValue = 0;
    for (; i < strText.size() && '0' <= strText[i] && strText[i] <= '9'; ++i) {
        const int iDigit = blMinus ? '0' - strText[i] : strText[i] - '0';
        if (__builtin_mul_overflow(iValue, 10, &iValue) ||
            __builtin_add_overflow(iValue, iDigit, &iValue))
            return blMinus ? iLow : iHigh;
        if (iValue < iLow) return iLow;
        if (iHigh < iValue) return iHigh;
    }
    return iValue;
}

// The text and what it is as JSON; after a syntax error jsoncpp's reader may leave anything.
struct Text {
    std::string strText;
    bool blJson;
    Json::Value jParsed;
};

struct Expected {
    bool blReadable = true;
    bool blKnown = true;
    Json::Value jValue;
};

Expected expected(const std::string& strWord, const Text& in)
{
    if ("string" == strWord) return {true, true, in.strText};
    if ("int" == strWord || "unsigned int" == strWord)
        return {true, true, static_cast<int>(digits(in.strText, INT32_MIN, INT32_MAX))};
    const Json::Int64 iValue = digits(in.strText, INT64_MIN, INT64_MAX);
    if ("long long" == strWord || "unsigned long long" == strWord) return {true, true, iValue};
    if ("bool" == strWord) return {true, true, 1 == iValue};
    if (0 == strWord.rfind("Json::", 0)) return {true, in.blJson, in.jParsed};
    return {false, true, {}};
}

void requireRow(const Json::Value& jRow, bool blNull, const Expected& wanted,
                const std::string& strWord)
{
    require(jRow["a"] == "x", strWord, ": the column in front is wrong");
    require(blNull != jRow.isMember("b"), strWord, ": NULL");
    require(blNull || !wanted.blKnown || jRow["b"] == wanted.jValue, strWord, ": ", jRow["b"],
            " for ", wanted.jValue);
}

void list(FuzzTable& table, const std::string& strWord, const Text& in)
{
    const Expected wanted = expected(strWord, in);
    Json::Value jRequest;
    Json::Value jRows;
    const int iResult = table.api.recList(jRequest, jRows);
    require(iResult == (wanted.blReadable ? 0 : -1), strWord, ": recList");
    // The rows before the first that cannot be read stay.
    require((wanted.blReadable ? kRows : 1) == static_cast<int>(jRows.size()), strWord, ": rows");
    for (int i = 0; i < static_cast<int>(jRows.size()); ++i)
        requireRow(jRows[i], 0 == i, wanted, strWord);

    // Again, without a NULL first: the decoder may keep what it knows of the columns.
    jRequest["vornSqlWhereFilter"] = "b is not null";
    jRows = Json::Value();
    require(iResult == table.api.recList(jRequest, jRows), strWord, ": second recList");
    for (const Json::Value& jRow : jRows) requireRow(jRow, false, wanted, strWord);
}

}  // namespace

void testInput(const std::string& strInput)
{
    FuzzDatabase database;
    Json::Value jMembers;
    jMembers["a"]["cpptype"] = "string";
    jMembers["b"]["cpptype"] = "string";
    FuzzTable table(database, jMembers, "a,b");
    database.value("insert into t values ('x',null)");
    for (int i = 1; i < kRows; ++i) database.number("insert into t values ('x',?)", {strInput});

    // A text ends at its first NUL byte.
    Text in{strInput.c_str(), false, {}};
    in.blJson = parseJson(in.strText, in.jParsed);
    Json::Value& jCached = VORN_JSON_DB::recType(table.jDefinition, table.strName);
    for (const char* szWord : kWords) {
        jCached["b"]["cpptype"] = szWord;
        list(table, szWord, in);
    }
    jCached.removeMember("b");
    Json::Value jRequest;
    Json::Value jRows;
    require(-1 == table.api.recList(jRequest, jRows), "a column without a member was read");
    database.requireOtherUntouched();
}
