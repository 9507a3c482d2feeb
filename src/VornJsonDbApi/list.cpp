// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
#include "VornJsonDbApi/operation.h"
#include "VornJsonDbApi/row_callback.h"
#include "util/json_text.h"
#include "util/log.h"

#include <VornJsonDbApi.h>

#include <utility>

using namespace vorn;
using VORN_JSON_DB::jsonCopyMember;

// SELECT a,b FROM t  WHERE  (a='x' ) order by 'a' LIMIT 1;
int VornJsonDbApi::recList(Json::Value& jRecParam, Json::Value& jRecArrayOut)
{
    std::string strSqlPrefix;
    std::string strSql;
    std::string strSqlLimit;
    std::string strSqlRun;
    const auto fail = [&] {
        LOG_PLAIN("jRecParam=%s", toString(jRecParam).c_str());
        LOG_SQL_ERROR(strSqlError, strSqlRun);
        return -1;
    };

    if (FAILED(jRecParam.type() != Json::objectValue && jRecParam.type() != Json::nullValue))
        return fail();
    if (FAILED(jRecArrayOut.type() != Json::nullValue && jRecArrayOut.type() != Json::arrayValue))
        return fail();
    if (FAILED(0 > SqlExpandMemberList(jRecParam, strSql, VORN_SQL_WHERE_TYPE_AND))) return fail();
    if (FAILED(0 > SqlFilterConditionFromJson(jRecParam, strSqlLimit))) return fail();
    strSqlPrefix.reserve(kUsualStatement);
    strSqlPrefix += "SELECT ";
    // Cannot fail: it always returns 0.
    if (GUARDED(0 > SqlExpandMemberName(strSqlPrefix))) return fail();
    strSqlRun = std::move(strSqlPrefix);
    strSqlRun.append(" FROM ").append(strName) += ' ';
    // Kept(List.ComposesOneStatement, Delete.ComposesOneStatementAndCounts): there are two spaces
    // before WHERE
    if (!strSql.empty()) strSqlRun.append(" WHERE ").append(strSql);
    strSqlRun.append(strSqlLimit) += ';';
    if (FAILED(0 > runSqlEx(strSqlRun, DbCallBackFillList, &jRecArrayOut))) return fail();
    return 0;
}

// Kept(GetOne.ReadsEveryMatchAndDropsAllButTheFirst): a single fetch reads every match
int VornJsonDbApi::recGetOne(Json::Value& jRecParam, Json::Value& jRecOut)
{
    Json::Value jRecArray(Json::arrayValue);
    if (FAILED(0 > recList(jRecParam, jRecArray))) return -1;
    if (jRecArray.empty()) return 0;
    // With nothing to merge, the row can be moved.
    Json::Value& jRow = *jRecArray.begin();
    if (jRecOut.empty() && !jRecOut.isArray() && !jRow.empty())
        jRecOut.swapPayload(jRow);
    else if (FAILED(0 > jsonCopyMember(jRecOut, jRecArray[0], true)))
        return -1;
    return 1;
}
