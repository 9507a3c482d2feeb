// SPDX-License-Identifier: MIT
#include "util/json_members.h"
#include "util/json_text.h"
#include "util/log.h"

#include <VornJsonDbApi.h>

#include <utility>

namespace {

// False, after the failed check's line, when jTableDef does not define the members of a table.
bool definesTable(Json::Value& jTableDef, std::string& strJsonName)
{
    if (FAILED(jTableDef.empty())) return false;
    if (FAILED_AS(!hasMember(jTableDef, strJsonName), "!jTableDef.isMember(strJsonName)"))
        return false;
    if (FAILED(!jTableDef[strJsonName].isObject())) return false;
    if (FAILED(!jTableDef[strJsonName].isMember("member"))) return false;
    if (FAILED(!jTableDef[strJsonName]["member"].isObject())) return false;
    // Kept: the name is looked at last.
    return !FAILED(strJsonName.empty());
}

// Copies what the library reads of each declared member into jEntry; false, after the failed
// check's line, at the first member without a type word.
bool readMembers(Json::Value& jTableDef, std::string& strJsonName, Json::Value& jEntry)
{
    const Json::Value& jMembers = jTableDef[strJsonName]["member"];
    for (const std::string& strKey : jMembers.getMemberNames()) {
        const Json::Value& jMember = jMembers[strKey];
        if (FAILED_AS(!hasMember(jMember, "cpptype"),
                      "!jTableDef[strJsonName][\"member\"][strKey].isMember(\"cpptype\")"))
            return false;
        if (FAILED_AS(!jMember["cpptype"].isString(),
                      "!jTableDef[strJsonName][\"member\"][strKey][\"cpptype\"].isString()"))
            return false;
        Json::Value& jCopy = jEntry[strKey];
        jCopy["cpptype"] = jMember["cpptype"];
        if (jMember.isMember("cppDefaultValue"))
            jCopy["cppDefaultValue"] = jMember["cppDefaultValue"];
    }
    return true;
}

// Fills the table's entry. Kept: the members before a bad one stay, and nothing completes them
// later.
bool fillEntry(Json::Value& jTableDef, std::string& strJsonName, Json::Value& jType)
{
    if (!definesTable(jTableDef, strJsonName)) return false;
    Json::Value jEntry;
    const bool blComplete = readMembers(jTableDef, strJsonName, jEntry);
    if (!jEntry.isNull()) jType[strJsonName] = std::move(jEntry);
    if (!blComplete) return false;
    return !FAILED(jType == Json::nullValue || !jType.isMember(strJsonName));
}

// The entry that was asked for last: an operation asks for the same one several times.
struct LastEntry {
    std::string strName;
    Json::Value* pjEntry = nullptr;
};

}  // namespace

Json::Value& VORN_JSON_DB::recType(Json::Value& jTableDef, std::string& strJsonName)
{
    // Never destroyed: references to its entries stay valid until the process ends.
    static Json::Value& jType = *new Json::Value;
    static LastEntry& last = *new LastEntry;
    if (nullptr != last.pjEntry && last.strName == strJsonName && last.pjEntry->isObject())
        return *last.pjEntry;

    Json::Value* pjEntry = findMember(jType, strJsonName);
    if (nullptr == pjEntry && fillEntry(jTableDef, strJsonName, jType))
        pjEntry = findMember(jType, strJsonName);
    if (nullptr != pjEntry &&
        !FAILED_AS(pjEntry->type() != Json::objectValue,
                                         "jType[strJsonName].type() != Json::objectValue")) {
        last.strName = strJsonName;
        last.pjEntry = pjEntry;
        return *pjEntry;
    }

    LOG_PLAIN("strJsonName=%s", strJsonName.c_str());
    LOG_PLAIN("jTableDef=%s", toString(jTableDef).c_str());
    LOG_PLAIN("jType=%s", toString(jType).c_str());
    // Kept: a name that was absent gets a null entry, which stays.
    return jType[strJsonName];
}
