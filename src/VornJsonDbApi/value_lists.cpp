#include "VornJsonDbApi/formatted_text.h"
#include "util/json_members.h"
#include "util/json_text.h"
#include "util/log.h"
#include "util/type_words.h"

#include <VornJsonDbApi.h>

namespace {

bool mayHoldMembers(const Json::Value& jValue)
{
    return jValue.isNull() || jValue.isObject();
}

// The names that the definition declares for the table. Kept: a table or "member" that is missing
// is inserted as null, and later log lines show it.
Json::Value::Members declaredNames(Json::Value& jTableDef, const std::string& strName)
{
    if (!mayHoldMembers(jTableDef)) return {};
    Json::Value& jTable = jTableDef[strName];
    if (!mayHoldMembers(jTable)) return {};
    return memberNames(jTable["member"]);
}

// Appends one member's value as an SQL literal; false when its type word has none.
bool appendLiteral(FormattedText& text, const std::string& strType, const Json::Value& jValue)
{
    switch (typeWord(strType).value) {
    case Value::kText:
        text.appendValue("%Q", FormatArgument::text(jValue.asString().c_str()));
        return true;
    case Value::kSigned:
        text.appendValue("%lld", FormatArgument::integer(jValue.asInt64()));
        return true;
    case Value::kUnsigned:
        text.appendValue("%llu",
                         FormatArgument::integer(static_cast<long long>(jValue.asUInt64())));
        return true;
    case Value::kFloat:
        text.appendValue("%f", FormatArgument::floating(static_cast<double>(jValue.asFloat())));
        return true;
    case Value::kDouble:
        text.appendValue("%lf", FormatArgument::floating(jValue.asDouble()));
        return true;
    case Value::kJson:
        text.appendValue("%Q", FormatArgument::text(toString(jValue).c_str()));
        return true;
    case Value::kNo: break;
    }
    return false;
}

}  // namespace

int VornJsonDbApi::SqlExpandMemberName(std::string& sql, Json::Value* rec)
{
    const Json::Value::Members names = declaredNames(jTableDef, strName);
    for (std::size_t i = 0; i < names.size(); ++i) {
        if (nullptr != rec && !hasMember(*rec, names[i])) continue;
        sql += names[i];
        // Kept: the place in the definition decides, so a record without the last member ends in
        // ",".
        if (i + 1 < names.size()) sql += ",";
    }
    return 0;
}

int VornJsonDbApi::SqlExpandMemberSymbol(std::string& sql, Json::Value& rec)
{
    const Json::Value& jType = VORN_JSON_DB::recType(jTableDef, strName);
    FormattedText text(sql);
    const Json::Value::Members names = declaredNames(jTableDef, strName);
    for (std::size_t i = 0; i < names.size(); ++i) {
        const std::string& strKey = names[i];
        const Json::Value* pjMember = findMember(jType, strKey);
        if (FAILED_AS(nullptr == pjMember, "!jType.isMember(strKey)")) return -1;
        const Json::Value* pjValue = findMember(rec, strKey);
        if (nullptr == pjValue) continue;

        const std::string strType = typeWordOf(*pjMember);
        if (!appendLiteral(text, strType, *pjValue)) {
            LOG_ERROR("cannot support this type=%s", strType.c_str());
            return -1;
        }
        text.append(i + 1 < names.size() ? "," : ") ");
    }
    sql = text.text();
    return 0;
}
