// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
#include "VornJsonDbApi/operation.h"
#include "util/json_members.h"
#include "util/log.h"
#include "util/member_types.h"
#include "util/type_words.h"

#include <VornJsonDbApi.h>

#include <sstream>

using namespace vorn;

namespace {

std::string joined(const std::vector<std::string>& strVector)
{
    std::ostringstream stream;
    const char* szComma = "";
    for (const std::string& strValue : strVector) {
        stream << szComma << strValue;
        szComma = ",";
    }
    return stream.str();
}

}  // namespace

// DELETE FROM t  WHERE  (id=1 );
int VornJsonDbApi::recDelete(Json::Value& jRecParam, bool blDeleteAll)
{
    std::string strSql;
    std::string strSqlRun;
    int err = 0;
    const auto fail = [&] {
        LOG_SQL_ERROR(strSqlError, strSqlRun);
        return -1;
    };

    if (FAILED(jRecParam.type() != Json::objectValue)) return fail();
    if (FAILED(0 > SqlExpandMemberList(jRecParam, strSql, VORN_SQL_WHERE_TYPE_AND))) return fail();
    if (!blDeleteAll && FAILED(strSql.empty())) return fail();
    strSqlRun.reserve(kUsualStatement);
    strSqlRun.append("DELETE FROM ").append(strName).append(" ");
    // Two blanks before WHERE, as in a listing.
    if (!strSql.empty()) strSqlRun.append(" WHERE ").append(strSql);
    strSqlRun += ";";
    if (FAILED(0 > (err = runSqlEx(strSqlRun)))) return fail();
    // Cannot fail: a successful run clears the error text.
    if (GUARDED_SQL("sql error, sql=%s", strSqlRun.c_str())) return fail();
    if (blDebugOutput) LOG_PLAIN("delete rec number=%d", err);
    return err;
}

int VornJsonDbApi::recDeleteAll()
{
    Json::Value jEveryRecord(Json::objectValue);
    return recDelete(jEveryRecord, true);
}

int VornJsonDbApi::recDeleteByArray(std::vector<std::string>& strVector, const char* szKey)
{
    const Json::Value& jType = memberTypes(jTableDef, strName);
    Json::Value jParam(Json::objectValue);
    int err = 0;
    const auto fail = [&] {
        LOG_PLAIN("recDeleteByArray failed, name=%s, strVector=%s", szKey,
                  joined(strVector).c_str());
        return -1;
    };

    if (FAILED(0 >= strVector.size())) return fail();
    if (FAILED(!szKey || !szKey[0])) return fail();
    const Json::Value* pjMember = findMember(jType, szKey);
    if (FAILED_AS(nullptr == pjMember, "!jType.isMember(szKey)")) return fail();
    if (FAILED_AS(TypeWord(*pjMember).text() != "string",
                  "jType[szKey][\"cpptype\"].asString() != \"string\""))
        return fail();
    // Cannot fail: the object and the key were checked before.
    if (GUARDED(0 > VectorParamToJson(strVector, szKey, jParam))) return fail();
    if (FAILED(0 > (err = recDelete(jParam)))) return fail();
    return err;
}

int VornJsonDbApi::recDeleteByName(std::string& strValue, const char* szKey)
{
    const Json::Value& jType = memberTypes(jTableDef, strName);
    std::vector<std::string> strVector;
    int err = 0;
    const auto fail = [&] {
        LOG_PLAIN("recDeleteByName failed, name=%s, strValue=%s", szKey, strValue.c_str());
        return -1;
    };

    if (FAILED(strValue.empty())) return fail();
    if (FAILED(!szKey || !szKey[0])) return fail();
    if (FAILED_AS(!hasMember(jType, szKey), "!jType.isMember(szKey)")) return fail();
    strVector.push_back(strValue);
    if (FAILED(0 > (err = recDeleteByArray(strVector, szKey)))) return fail();
    return err;
}
