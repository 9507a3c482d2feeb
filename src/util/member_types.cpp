// SPDX-License-Identifier: MIT
#include "util/json_members.h"
#include "util/json_text.h"
#include "util/log.h"
#include "util/no_destructor.h"

#include <VornJsonDbApi.h>

#include <utility>

using namespace vorn;

namespace {

// The member types of every table that was asked for.
// Kept(MemberTypes.KeepTheFirstDefinitionForEveryHandle): the first definition under a table name
// wins
struct Cache {
    Json::Value jType;
    // The last entry that was asked for: an operation asks for the same one several times.
    std::string strLastName;
    Json::Value* pjLast = nullptr;
};

// False, after logging the failed check, if jTableDef does not define the members of a table.
bool definesTable(Json::Value& jTableDef, std::string& strJsonName)
{
    if (FAILED(jTableDef.empty())) return false;
    if (FAILED_AS(!hasMember(jTableDef, strJsonName), "!jTableDef.isMember(strJsonName)"))
        return false;
    if (FAILED(!jTableDef[strJsonName].isObject())) return false;
    if (FAILED(!jTableDef[strJsonName].isMember("member"))) return false;
    if (FAILED(!jTableDef[strJsonName]["member"].isObject())) return false;
    // Kept(MemberTypes.RefuseAnEmptyNameAfterTheLookUps): an empty table name is rejected only
    // after the lookups
    return !FAILED(strJsonName.empty());
}

// Copies what the library reads of each declared member into jEntry; false, after logging the
// failed check, at the first member without a type word.
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

// Fills the table's entry.
// Kept(MemberTypes.KeepTheEntryOfABadDefinition): a bad definition leaves a null or
// partial entry for the life of the process
bool fillEntry(Json::Value& jTableDef, std::string& strJsonName, Json::Value& jType)
{
    if (!definesTable(jTableDef, strJsonName)) return false;
    Json::Value jEntry;
    const bool blComplete = readMembers(jTableDef, strJsonName, jEntry);
    if (!jEntry.isNull()) jType[strJsonName] = std::move(jEntry);
    if (!blComplete) return false;
    return !FAILED(jType == Json::nullValue || !jType.isMember(strJsonName));
}

// The table's entry, filled if it is new; null, after logging the failed check, if none is usable.
Json::Value* findEntry(Json::Value& jTableDef, std::string& strJsonName, Json::Value& jType)
{
    Json::Value* pjEntry = findMember(jType, strJsonName);
    if (nullptr == pjEntry) {
        if (!fillEntry(jTableDef, strJsonName, jType)) return nullptr;
        pjEntry = findMember(jType, strJsonName);
    }
    if (FAILED_AS(pjEntry->type() != Json::objectValue,
                  "jType[strJsonName].type() != Json::objectValue"))
        return nullptr;
    return pjEntry;
}

}  // namespace

Json::Value& VORN_JSON_DB::recType(Json::Value& jTableDef, std::string& strJsonName)
{
    static NoDestructor<Cache> instance;
    Cache& cache = *instance;
    if (nullptr != cache.pjLast && cache.strLastName == strJsonName && cache.pjLast->isObject())
        return *cache.pjLast;

    Json::Value& jType = cache.jType;
    if (Json::Value* pjEntry = findEntry(jTableDef, strJsonName, jType)) {
        cache.strLastName = strJsonName;
        cache.pjLast = pjEntry;
        return *pjEntry;
    }
    LOG_PLAIN("strJsonName=%s", strJsonName.c_str());
    LOG_PLAIN("jTableDef=%s", toString(jTableDef).c_str());
    LOG_PLAIN("jType=%s", toString(jType).c_str());
    // A name that was absent gets a null entry, which stays.
    return jType[strJsonName];
}
