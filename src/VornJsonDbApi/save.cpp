// SPDX-License-Identifier: MIT
#include "VornJsonDbApi/execution.h"
#include "VornJsonDbApi/row_decoder.h"
#include "util/json_members.h"
#include "util/json_text.h"
#include "util/log.h"

#include <VornJsonDbApi.h>

#include <utility>

namespace {

// Whether the record lacks a declared member that has a default.
bool lacksDefault(const Json::Value& jType, const Json::Value& jRec)
{
    if (!jType.isObject()) return false;
    MemberWalk present(jRec);
    for (auto it = jType.begin(), end = jType.end(); it != end; ++it)
        if (nullptr == present.find(memberName(it)) && hasMember(*it, "cppDefaultValue"))
            return true;
    return false;
}

}  // namespace

// INSERT INTO t (a,b) VALUES (1,'x') ;select * from t where rowid == last_insert_rowid();
int VornJsonDbApi::saveRow(Json::Value& jRecInOut, bool blCreate, Json::Value& jRow)
{
    std::string strSql;
    Json::Value jArrayTmp(Json::arrayValue);
    const Json::Value& jType = VORN_JSON_DB::recType(jTableDef, strName);
    const auto fail = [&] {
        LOG_PLAIN("blCreate=%d, jRecInOut=%s", blCreate, toString(jRecInOut).c_str());
        LOG_PLAIN("jType=%s", toString(jType).c_str());
        logSqlError(strSqlError, strSql);
        return -1;
    };

    strSql.reserve(kUsualStatement);
    strSql.append(blCreate ? "INSERT INTO " : "REPLACE INTO ").append(strName).append(" (");
    if (FAILED(0 > SqlExpandMemberName(strSql, &jRecInOut))) return fail();  // Guard: always 0
    strSql += ") VALUES (";
    if (FAILED(0 > SqlExpandMemberSymbol(strSql, jRecInOut))) return fail();
    strSql.append(";select * from ").append(strName).append(" where rowid == last_insert_rowid();");
    if (FAILED(strSql.empty())) return fail();  // Guard: it has its verb
    if (FAILED(0 > runSqlEx(strSql, DbCallBackFillList, &jArrayTmp))) return fail();
    if (!strSqlError.empty()) {                          // Guard: a run that succeeds empties it
        LOG_ERROR("sql error, sql=%s", strSql.c_str());  // Guard
        return fail();                                   // Guard
    }
    if (FAILED(0 == jArrayTmp.size())) return fail();

    jRow = std::move(*jArrayTmp.begin());
    return 0;
}

int VornJsonDbApi::recSave(Json::Value& jRecInOut, bool blCreate)
{
    return saveRow(jRecInOut, blCreate, jRecInOut);
}

int VornJsonDbApi::recCreate(Json::Value& jRecIn, Json::Value& jRecOut)
{
    Json::Value jParam;  // the record with its defaults, when it lacks any
    Json::Value* pjRec = &jRecIn;
    // Kept: the text of an earlier failure counts too, also where this call ran no SQL.
    const auto fail = [&] {
        LOG_PLAIN("call create rec, rec=%s", toString(*pjRec).c_str());
        if (isDuplicateKey(strSqlError)) strErrMsg = kDuplicateKeyMessage;
        return -1;
    };

    if (FAILED(jRecIn.empty())) return fail();
    if (lacksDefault(VORN_JSON_DB::recType(jTableDef, strName), jRecIn)) {
        jParam = jRecIn;
        pjRec = &jParam;
        if (FAILED(0 > fillDefaultValue(jParam, false))) return fail();  // Guard: always 0
    }
    if (FAILED_AS(0 > checkJsonType(*pjRec), "0 > checkJsonType(jParam)")) return fail();
    if (FAILED_AS(0 > saveRow(*pjRec, true, jRecOut), "0 > recSave(jParam, true)")) return fail();
    return 0;
}
