// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
#include "VornJsonDbApi/operation.h"
#include "VornJsonDbApi/row_callback.h"
#include "VornJsonDbApi/validation.h"
#include "VornJsonDbApi/value_lists.h"
#include "util/json_text.h"
#include "util/log.h"
#include "util/member_types.h"

#include <VornJsonDbApi.h>

#include <utility>

using namespace vorn;

// INSERT INTO t (a,b) VALUES (1,'x') ;select * from t where rowid == last_insert_rowid();
int VornJsonDbApi::recSave(Json::Value& jRecInOut, bool blCreate)
{
    std::string strSql;
    Json::Value jArrayTmp(Json::arrayValue);
    const TableTypes& types = tableTypes(jTableDef, strName);
    const auto fail = [&] {
        LOG_PLAIN("blCreate=%d, jRecInOut=%s", blCreate, toString(jRecInOut).c_str());
        LOG_PLAIN("jType=%s", toString(types.json()).c_str());
        LOG_SQL_ERROR(strSqlError, strSql);
        return -1;
    };

    strSql.reserve(kUsualStatement);
    strSql.append(blCreate ? "INSERT INTO " : "REPLACE INTO ").append(strName).append(" (");
    if (!appendLists(strSql, jTableDef, strName, types, jRecInOut)) {
        // Cannot fail: it always returns 0.
        if (GUARDED(0 > SqlExpandMemberName(strSql, &jRecInOut))) return fail();
        strSql += ") VALUES (";
        if (FAILED(0 > SqlExpandMemberSymbol(strSql, jRecInOut))) return fail();
    }
    strSql.append(";select * from ").append(strName).append(" where rowid == last_insert_rowid();");
    // Cannot fail: the statement begins with its verb.
    if (GUARDED(strSql.empty())) return fail();
    if (FAILED(0 > runSqlEx(strSql, DbCallBackFillList, &jArrayTmp))) return fail();
    // Cannot fail: a successful run clears the error text.
    if (GUARDED_SQL("sql error, sql=%s", strSql.c_str())) return fail();
    // Kept(Save.FailsIfTheWrittenRowCannotBeReadBack): a write whose row cannot be read back fails,
    // but the row stays
    if (FAILED(0 == jArrayTmp.size())) return fail();

    jRecInOut = std::move(*jArrayTmp.begin());
    return 0;
}

int VornJsonDbApi::recCreate(Json::Value& jRecIn, Json::Value& jRecOut)
{
    // What runs inside the statement may change or destroy the host's record: do not read it again.
    Json::Value jParam = jRecIn;
    // Kept(Operations.ReportAnEarlierDuplicateAgain): a later failure without SQL is reported as a
    // duplicate if an earlier one was
    const auto fail = [&] {
        LOG_PLAIN("call create rec, rec=%s", toString(jParam).c_str());
        if (isDuplicateKey(strSqlError)) strErrMsg = kDuplicateKeyMessage;
        return -1;
    };

    if (FAILED(jRecIn.empty())) return fail();
    if (!isCompleteAndValid(jParam, knownTypes(strName))) {
        // Cannot fail: filling always returns 0.
        if (GUARDED(0 > fillDefaultValue(jParam, false))) return fail();
        if (FAILED(0 > checkJsonType(jParam))) return fail();
    }
    if (FAILED(0 > recSave(jParam, true))) return fail();
    jRecOut = std::move(jParam);
    return 0;
}
