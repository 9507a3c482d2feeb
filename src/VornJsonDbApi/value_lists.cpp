// SPDX-License-Identifier: MIT
#include "VornJsonDbApi/formatted_text.h"
#include "util/json_members.h"
#include "util/json_text.h"
#include "util/log.h"
#include "util/member_types.h"
#include "util/type_words.h"

#include <VornJsonDbApi.h>

using namespace vorn;

namespace {

bool mayHoldMembers(const Json::Value& jValue)
{
    return jValue.isNull() || jValue.isObject();
}

// The members that the definition declares for the table, an object or null.
// Kept(ValueListTypes.InsertWhatTheDefinitionLacks): the list functions insert a missing table or
// "member" into the handle's definition
const Json::Value& declaredMembers(Json::Value& jTableDef, const std::string& strName)
{
    if (!mayHoldMembers(jTableDef)) return Json::Value::nullSingleton();
    Json::Value& jTable = jTableDef[strName];
    if (!mayHoldMembers(jTable)) return Json::Value::nullSingleton();
    const Json::Value& jMembers = jTable["member"];
    return jMembers.isObject() ? jMembers : Json::Value::nullSingleton();
}

// Appends one member's value as an SQL literal; false when its type word has none.
bool appendLiteral(FormattedText& text, const Json::Value& jMember, const Json::Value& jValue)
{
    switch (TypeWord(jMember).forms().literal) {
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

}  // namespace

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

        if (!appendLiteral(text, *pjMember, *pjValue)) {
            LOG_ERROR("cannot support this type=%s", TypeWord(*pjMember).text().c_str());
            return -1;
        }
        text.append(0 < nLeft ? "," : ") ");
    }
    sql = text.take();
    return 0;
}
