// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
#include "VornJsonDbApi/value_lists.h"

#include "VornJsonDbApi/formatted_text.h"
#include "util/json_members.h"
#include "util/json_text.h"
#include "util/log.h"
#include "util/member_types.h"
#include "util/type_words.h"

#include <VornJsonDbApi.h>

#include <algorithm>

using namespace vorn;

namespace {

bool mayHoldMembers(const Json::Value& jValue)
{
    return jValue.isNull() || jValue.isObject();
}

// The members that the definition declares for the table; null if it declares none.
const Json::Value* findDeclared(const Json::Value& jTableDef, const std::string& strName)
{
    const Json::Value* pjTable = findMember(jTableDef, strName);
    const Json::Value* pjMembers = nullptr == pjTable ? nullptr : findMember(*pjTable, "member");
    return nullptr != pjMembers && pjMembers->isObject() ? pjMembers : nullptr;
}

// The same as an object or null.
// Kept(ValueListTypes.InsertWhatTheDefinitionLacks): the list functions insert a missing table or
// "member" into the handle's definition
const Json::Value& declaredMembers(Json::Value& jTableDef, const std::string& strName)
{
    if (const Json::Value* pjMembers = findDeclared(jTableDef, strName)) return *pjMembers;
    if (mayHoldMembers(jTableDef) && mayHoldMembers(jTableDef[strName]))
        static_cast<void>(jTableDef[strName]["member"]);
    return Json::Value::nullSingleton();
}

// Appends a value as an SQL literal; false if there is no form for it.
bool appendLiteral(FormattedText& text, LiteralForm form, const Json::Value& jValue)
{
    switch (form) {
    case LiteralForm::kText:
        text.appendValue("%Q", FormatArgument::text(jValue.asString().c_str()));
        return true;
    case LiteralForm::kSigned:
        text.appendValue("%lld", FormatArgument::integer(jValue.asInt64()));
        return true;
    case LiteralForm::kUnsigned:
        text.appendValue("%llu",
                         FormatArgument::integer(static_cast<long long>(jValue.asUInt64())));
        return true;
    case LiteralForm::kFloat: {
        // Stored, because on i386 a function returns more digits than a float has.
        const volatile float fValue = jValue.asFloat();
        text.appendValue("%f", FormatArgument::floating(static_cast<double>(fValue)));
        return true;
    }
    case LiteralForm::kDouble:
        text.appendValue("%lf", FormatArgument::floating(jValue.asDouble()));
        return true;
    case LiteralForm::kJson:
        text.appendValue("%Q", FormatArgument::text(toString(jValue).c_str()));
        return true;
    case LiteralForm::kNo: break;
    }
    return false;
}

// Appends the names, each with a comma behind it; false if definition and record do not have these
// very members, or one of them cannot be written.
bool appendNames(std::string& strSql, const std::vector<DeclaredMember>& members,
                 const Json::Value& jMembers, const Json::Value& jRec)
{
    auto declared = jMembers.begin();
    auto value = jRec.begin();
    return std::all_of(members.begin(), members.end(), [&](const DeclaredMember& member) {
        if (memberName(declared) != member.strName || memberName(value) != member.strName)
            return false;
        (strSql += member.strName) += ',';
        ++declared;
        ++value;
        return LiteralForm::kNo != member.pForms->literal;
    });
}

}  // namespace

bool vorn::appendLists(std::string& strSql, const Json::Value& jTableDef,
                       const std::string& strTable, const TableTypes& types,
                       const Json::Value& jRec)
{
    const std::vector<DeclaredMember>* pMembers = types.unchanged();
    const Json::Value* pjMembers = findDeclared(jTableDef, strTable);
    if (nullptr == pMembers || nullptr == pjMembers || !jRec.isObject()) return false;
    const std::size_t nMembers = pMembers->size();
    if (0 == nMembers || pjMembers->size() != nMembers || jRec.size() != nMembers) return false;
    const std::size_t nBefore = strSql.size();
    if (!appendNames(strSql, *pMembers, *pjMembers, jRec)) {
        strSql.resize(nBefore);
        return false;
    }
    strSql.back() = ')';
    strSql += " VALUES (";
    FormattedText text(strSql);
    auto value = jRec.begin();
    for (const DeclaredMember& member : *pMembers) {
        appendLiteral(text, member.pForms->literal, *value);
        ++value;
        text.append(&member == &pMembers->back() ? ") " : ",");
    }
    strSql = text.take();
    return true;
}

int VornJsonDbApi::SqlExpandMemberName(std::string& sql, Json::Value* rec)
{
    const Json::Value& jMembers = declaredMembers(jTableDef, strName);
    MemberWalk values(nullptr == rec ? Json::Value::nullSingleton() : *rec);
    Json::ArrayIndex nLeft = jMembers.size();
    for (auto it = jMembers.begin(); 0 < nLeft; ++it) {
        --nLeft;
        const std::string_view strKey = memberName(it);
        if (nullptr != rec && nullptr == values.find(strKey)) continue;
        sql += strKey;
        // The position in the definition decides. Kept(Save.RefusesListsThatDoNotClose): a record
        // without the last declared member gives a list that does not close
        if (0 < nLeft) sql += ',';
    }
    return 0;
}

int VornJsonDbApi::SqlExpandMemberSymbol(std::string& sql, Json::Value& rec)
{
    const Json::Value& jType = memberTypes(jTableDef, strName);
    // A copy: sql changes only when every member is written.
    FormattedText text(sql);
    const Json::Value& jMembers = declaredMembers(jTableDef, strName);
    MemberWalk types(jType);
    MemberWalk values(rec);
    Json::ArrayIndex nLeft = jMembers.size();
    for (auto it = jMembers.begin(); 0 < nLeft; ++it) {
        --nLeft;
        const std::string_view strKey = memberName(it);
        const Json::Value* pjMember = types.find(strKey);
        if (FAILED_AS(nullptr == pjMember, "!jType.isMember(strKey)")) return -1;
        const Json::Value* pjValue = values.find(strKey);
        if (nullptr == pjValue) continue;

        const TypeWord word(*pjMember);
        if (!appendLiteral(text, word.forms().literal, *pjValue)) {
            LOG_ERROR("cannot support this type=%s", word.text().c_str());
            return -1;
        }
        text.append(0 < nLeft ? "," : ") ");
    }
    sql = text.take();
    return 0;
}
