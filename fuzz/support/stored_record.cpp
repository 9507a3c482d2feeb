// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
#include "support/stored_record.h"

#include "support/target.h"

#include <algorithm>
#include <cstdint>
#include <cstdio>

namespace {

// One member as it is written and as it comes back.
struct Column {
    bool blWritten = true;
    bool blReadable = true;
    bool blPercent = false;
    Json::Value jBack;
};

bool isOneOf(const std::string& strWord, std::initializer_list<const char*> words)
{
    return words.end() != std::find(words.begin(), words.end(), strWord);
}

Json::Value narrowed(bool blNarrow, Json::Int64 iValue)
{
    if (!blNarrow) return iValue;
    return static_cast<int>(std::clamp<Json::Int64>(iValue, INT32_MIN, INT32_MAX));
}

// SQLite holds what is above the signed range as a real and returns 15 digits of it, "1.8...e+19".
Json::Int64 readBack(Json::UInt64 uValue)
{
    if (uValue <= INT64_MAX) return static_cast<Json::Int64>(uValue);
    char szReal[32];
    snprintf(szReal, sizeof(szReal), "%.14e", static_cast<double>(uValue));
    return szReal[0] - '0';
}

Column column(const std::string& strWord, const Json::Value& jValue)
{
    Column column;
    if ("string" == strWord) {
        // A text ends at its first NUL byte.
        const std::string strText = jValue.asString().c_str();
        column.blPercent = std::string::npos != strText.find('%');
        column.jBack = strText;
    } else if ("Json::objectValue" == strWord || "Json::arrayValue" == strWord) {
        column.blPercent = std::string::npos != text(jValue).find('%');
        column.jBack = jValue;
    } else if ("bool" == strWord) {
        column.jBack = 1 == jValue.asInt64();
    } else if (isOneOf(strWord, {"int", "long long"})) {
        column.jBack = narrowed("int" == strWord, jValue.asInt64());
    } else if (isOneOf(strWord, {"unsigned int", "unsigned long long"})) {
        column.jBack = narrowed("unsigned int" == strWord, readBack(jValue.asUInt64()));
    } else if ("long" == strWord) {
        (void)jValue.asInt64();
        column.blReadable = false;
    } else if (isOneOf(strWord, {"unsigned", "unsigned long"})) {
        (void)jValue.asUInt64();
        column.blReadable = false;
    } else if (isOneOf(strWord, {"float", "double"})) {
        (void)jValue.asDouble();
        column.blReadable = false;
    } else {
        column.blWritten = false;
    }
    return column;
}

Stored walk(const Json::Value& jMembers, const Json::Value& jRecord)
{
    Stored stored{Stored::End::kRow, Json::objectValue};
    bool blPercent = false;
    for (const std::string& strKey : jMembers.getMemberNames()) {
        if (!jRecord.isMember(strKey)) continue;
        const Column next = column(jMembers[strKey]["cpptype"].asString(), jRecord[strKey]);
        if (!next.blWritten) return {Stored::End::kFails, {}};
        if (blPercent)
            stored.end = Stored::End::kAny;
        else if (!next.blReadable)
            stored.end = Stored::End::kFails;
        blPercent = blPercent || next.blPercent;
        stored.jRow[strKey] = next.jBack;
    }
    // The list is closed after the last member only.
    const bool blClosed = jRecord.isMember(jMembers.getMemberNames().back());
    if (!blClosed && Stored::End::kAny != stored.end) stored.end = Stored::End::kFails;
    return stored;
}

bool hasKindOf(const std::string& strWord, const Json::Value& jValue)
{
    if (isOneOf(strWord, {"int", "long long", "uid_t", "time_t"})) return jValue.isIntegral();
    if ("bool" == strWord) return jValue.isBool();
    if ("string" == strWord) return jValue.isString();
    if ("Json::objectValue" == strWord) return jValue.isObject();
    return "Json::arrayValue" == strWord && jValue.isArray();
}

}  // namespace

Stored storedRecord(const Json::Value& jMembers, const Json::Value& jRecord)
{
    try {
        return walk(jMembers, jRecord);
    } catch (const Json::LogicError&) {
        return {Stored::End::kThrows, {}};
    }
}

Json::Value withDefaults(const Json::Value& jMembers, Json::Value jRecord)
{
    for (const std::string& strKey : jMembers.getMemberNames())
        if (!jRecord.isMember(strKey) && jMembers[strKey].isMember("cppDefaultValue"))
            jRecord[strKey] = jMembers[strKey]["cppDefaultValue"];
    return jRecord;
}

bool passesTypeCheck(const Json::Value& jMembers, const Json::Value& jRecord)
{
    for (const std::string& strKey : jRecord.getMemberNames())
        if (!hasKindOf(jMembers[strKey]["cpptype"].asString(), jRecord[strKey])) return false;
    return true;
}
