// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
#include "VornJsonDbApi/operation.h"
#include "util/json_members.h"
#include "util/json_text.h"
#include "util/log.h"

#include <VornJsonDbApi.h>

using namespace vorn;

// UPDATE t SET a='x' , b=1 WHERE  (id=1 );
int VornJsonDbApi::recUpdateByWhere(Json::Value& jRecIn, std::string& strSqlWhere)
{
    std::string strSql;
    std::string strSql2;
    // A raw filter in the same object is not a column.
    Json::Value jWithoutFilter;
    if (hasMember(jRecIn, kRawFilterKey)) {
        jWithoutFilter = jRecIn;
        jWithoutFilter.removeMember(kRawFilterKey);
    }
    Json::Value& jColumnList = jWithoutFilter.isNull() ? jRecIn : jWithoutFilter;
    const auto fail = [&] {
        LOG_PLAIN("jRecIn=%s", toString(jRecIn).c_str());
        LOG_SQL_ERROR(strSqlError, strSql);
        return -1;
    };

    if (FAILED(strSqlWhere.empty())) return fail();
    if (FAILED(jRecIn.empty())) return fail();
    strSql.reserve(kUsualStatement);
    strSql.append("UPDATE ").append(strName).append(" SET ");
    if (FAILED(0 > SqlExpandMemberList(jColumnList, strSql2, VORN_SQL_WHERE_TYPE_COMMA)))
        return fail();
    strSql.append(strSql2).append(" WHERE ").append(strSqlWhere).append(";");
    // Cannot fail: the statement begins with its verb.
    if (GUARDED(strSql.empty())) return fail();
    if (FAILED(0 > runSqlEx(strSql, NULL, NULL))) return fail();
    // Cannot fail: a successful run clears the error text.
    if (GUARDED_SQL("sql error msg=%s, sql=%s", strSqlError.c_str(), strSql.c_str())) return fail();
    return 0;
}

int VornJsonDbApi::recUpdateByFilter(Json::Value& jFilterIn, Json::Value& jParamIn)
{
    std::string strSql;
    // The text of an earlier failure counts too, as in recCreate.
    const auto fail = [&] {
        LOG_PLAIN("recUpdateByFilter failed, jParamIn=%s", toString(jParamIn).c_str());
        if (isDuplicateKey(strSqlError)) strErrMsg = kDuplicateKeyMessage;
        return -1;
    };

    if (FAILED(jFilterIn.empty())) return fail();
    if (FAILED(jFilterIn.type() != Json::objectValue)) return fail();
    if (FAILED(jParamIn.type() != Json::objectValue)) return fail();
    if (FAILED(0 > SqlExpandMemberList(jFilterIn, strSql, VORN_SQL_WHERE_TYPE_AND))) return fail();
    if (FAILED(strSql.empty())) return fail();
    if (FAILED(0 > checkJsonType(jParamIn))) return fail();
    if (FAILED(0 > recUpdateByWhere(jParamIn, strSql))) return fail();
    return 0;
}
