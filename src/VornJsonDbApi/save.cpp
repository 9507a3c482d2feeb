#include "VornJsonDbApi/execution.h"
#include "VornJsonDbApi/row_decoder.h"
#include "util/json_members.h"
#include "util/json_text.h"
#include "util/log.h"
#include "util/member_types.h"

#include <VornJsonDbApi.h>

#include <utility>

namespace {

// Whether the record holds every member of the table, so that no default can be added to it.
bool isComplete(const Json::Value& jRecord, const Json::Value& jType)
{
    if (jType.empty()) return false;
    MemberWalk members(jRecord);
    for (auto it = jType.begin(); it != jType.end(); ++it)
        if (nullptr == members.find(memberName(it))) return false;
    return true;
}

}  // namespace

int VornJsonDbApi::recSave(Json::Value& jRecInOut, bool blCreate)
{
    return saveRecord(jRecInOut, blCreate, jRecInOut);
}

// INSERT INTO t (a,b) VALUES (1,'x') ;select * from t where rowid == last_insert_rowid();
int VornJsonDbApi::saveRecord(Json::Value& jRecInOut, bool blCreate, Json::Value& jStored)
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

    jStored = std::move(jArrayTmp[0]);
    return 0;
}

int VornJsonDbApi::recCreate(Json::Value& jRecIn, Json::Value& jRecOut)
{
    // A complete record serves as it is; to others defaults are added in a copy.
    Json::Value jCopy;
    Json::Value& jParam = isComplete(jRecIn, knownMemberTypes(strName)) ? jRecIn : jCopy = jRecIn;
    // Kept: the text of an earlier failure counts too, also where this call ran no SQL.
    const auto fail = [&] {
        LOG_PLAIN("call create rec, rec=%s", toString(jParam).c_str());
        if (isDuplicateKey(strSqlError)) strErrMsg = kDuplicateKeyMessage;
        return -1;
    };

    if (FAILED(jRecIn.empty())) return fail();
    if (FAILED(0 > fillDefaultValue(jParam, false))) return fail();  // Guard: always 0
    if (FAILED(0 > checkJsonType(jParam))) return fail();
    if (FAILED_AS(0 > saveRecord(jParam, true, jRecOut), "0 > recSave(jParam, true)"))
        return fail();
    return 0;
}
