// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
#include "util/member_types.h"

#include "util/json_members.h"
#include "util/json_text.h"
#include "util/log.h"
#include "util/name_table.h"
#include "util/thread_state.h"

#include <VornJsonDbApi.h>

#include <algorithm>
#include <utility>
#include <vector>

using namespace vorn;

namespace {

using Table = NameTable<TableTypes>::Entry;

// The member types of every table that was asked for.
// Kept(MemberTypes.KeepTheFirstDefinitionForEveryHandle): the first definition under a table name
// wins
NameTable<TableTypes> tables;

// The last table that the thread asked for: an operation asks for the same one several times.
struct LastTypes : ThreadPart {
    static constexpr Kind kKind = kLastTypes;
    Table* pTable = nullptr;
};

// False, after logging the failed check, if jTableDef does not define the members of a table.
bool definesTable(Json::Value& jTableDef, const std::string& strJsonName)
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
bool readMembers(Json::Value& jTableDef, const std::string& strJsonName, Json::Value& jEntry)
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

// The table of that name with the types of its definition; null, after logging the failed check, if
// the definition does not give them all.
// Kept(MemberTypes.KeepTheEntryOfABadDefinition): a bad definition leaves a null or
// partial entry for the life of the process
Table* newTable(Json::Value& jTableDef, const std::string& strJsonName)
{
    if (!definesTable(jTableDef, strJsonName)) return nullptr;
    Json::Value jEntry;
    const bool blComplete = readMembers(jTableDef, strJsonName, jEntry);
    Table* const pTable =
        jEntry.isNull() ? tables.find(strJsonName) : tables.insert(strJsonName, std::move(jEntry));
    if (!blComplete) return nullptr;
    if (FAILED_AS(nullptr == pTable, "jType == Json::nullValue || !jType.isMember(strJsonName)"))
        return nullptr;
    return pTable;
}

// The table, with its types filled in if it is new; null, after logging the failed check, if there
// are no usable ones.
Table* findTable(Json::Value& jTableDef, const std::string& strJsonName)
{
    Table* pTable = tables.find(strJsonName);
    if (nullptr == pTable) pTable = newTable(jTableDef, strJsonName);
    if (nullptr == pTable) return nullptr;
    if (FAILED_AS(pTable->value.json().type() != Json::objectValue,
                  "jType[strJsonName].type() != Json::objectValue"))
        return nullptr;
    return pTable;
}

// The entries of all tables as one JSON object, or null where there are none.
std::string allTypes()
{
    std::vector<const Table*> sorted;
    tables.forEach([&sorted](const Table& table) { sorted.push_back(&table); });
    if (sorted.empty()) return "null";
    std::sort(sorted.begin(), sorted.end(), [](const Table* pLeft, const Table* pRight) {
        return pLeft->strName < pRight->strName;
    });
    std::string strAll;
    for (const Table* pTable : sorted)
        strAll.append(strAll.empty() ? "{" : ",")
            .append(toString(pTable->strName))
            .append(":")
            .append(toString(pTable->value.json()));
    return strAll + "}";
}

}  // namespace

TableTypes::TableTypes(Json::Value jMembers) : jMembers_(std::move(jMembers))
{
    for (auto it = jMembers_.begin(), end = jMembers_.end(); end != it; ++it)
        members_.push_back({it.name(), &TypeWord(*it).forms()});
}

TableTypes& vorn::tableTypes(Json::Value& jTableDef, const std::string& strJsonName)
{
    Table*& pLast = ofThisThread<LastTypes>().pTable;
    if (nullptr != pLast && pLast->strName == strJsonName && pLast->value.json().isObject())
        return pLast->value;

    if (Table* pTable = findTable(jTableDef, strJsonName)) {
        pLast = pTable;
        return pTable->value;
    }
    LOG_PLAIN("strJsonName=%s", strJsonName.c_str());
    LOG_PLAIN("jTableDef=%s", toString(jTableDef).c_str());
    LOG_PLAIN("jType=%s", allTypes().c_str());
    // A name that was absent gets a null entry, which stays.
    Table* const pTable = tables.find(strJsonName);
    return (nullptr == pTable ? tables.insert(strJsonName, Json::Value()) : pTable)->value;
}

const TableTypes* vorn::knownTypes(const std::string& strTable)
{
    const Table* pTable = ofThisThread<LastTypes>().pTable;
    if (nullptr == pTable || pTable->strName != strTable) pTable = tables.find(strTable);
    return nullptr == pTable ? nullptr : &pTable->value;
}

Json::Value& VORN_JSON_DB::recType(Json::Value& jTableDef, std::string& strJsonName)
{
    return tableTypes(jTableDef, strJsonName).handOut();
}
