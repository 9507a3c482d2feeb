// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
#include "support/database.h"

#include "support/target.h"

#include <cstring>

namespace {

constexpr int kStepsPerCall = 1000;
constexpr int kMaxCalls = 100;
constexpr char kOther[] = "select group_concat(v) || (select count(*) from other) from other";

struct Limit {
    int iId;
    int iValue;
};

// One LIKE of a long pattern can take forever within a single step.
constexpr Limit kLimits[] = {
    {SQLITE_LIMIT_LENGTH, 200000},    {SQLITE_LIMIT_SQL_LENGTH, 200000},
    {SQLITE_LIMIT_COLUMN, 100},       {SQLITE_LIMIT_COMPOUND_SELECT, 20},
    {SQLITE_LIMIT_VDBE_OP, 25000},    {SQLITE_LIMIT_LIKE_PATTERN_LENGTH, 50},
    {SQLITE_LIMIT_TRIGGER_DEPTH, 5},  {SQLITE_LIMIT_ATTACHED, 0},
    {SQLITE_LIMIT_WORKER_THREADS, 0},
};

int authorize(void* /*arg*/, int iAction, const char* /*szFirst*/, const char* szSecond,
              const char* /*szDatabase*/, const char* /*szTrigger*/)
{
    switch (iAction) {
    case SQLITE_ATTACH:
    case SQLITE_DETACH:
    case SQLITE_PRAGMA:
    case SQLITE_TRANSACTION:
    case SQLITE_SAVEPOINT:
    case SQLITE_CREATE_VTABLE: return SQLITE_DENY;
    case SQLITE_FUNCTION: return 0 == strcmp("load_extension", szSecond) ? SQLITE_DENY : SQLITE_OK;
    default: return SQLITE_OK;
    }
}

Json::Value definition(const std::string& strName, const Json::Value& jMembers)
{
    Json::Value jDefinition;
    jDefinition[strName]["member"] = jMembers;
    return jDefinition;
}

Json::Value& memberTypes(std::string& strName)
{
    Json::Value jAnyMember;
    jAnyMember["a"]["cpptype"] = "int";
    Json::Value jAny = definition(strName, jAnyMember);
    return VORN_JSON_DB::recType(jAny, strName);
}

}  // namespace

FuzzDatabase::FuzzDatabase()
{
    require(SQLITE_OK == sqlite3_open(":memory:", &pDb_), "no database");
    value("create table other (v); insert into other values ('a'),('b')");
    for (const Limit& limit : kLimits) sqlite3_limit(pDb_, limit.iId, limit.iValue);
    limit(true);
}

FuzzDatabase::~FuzzDatabase()
{
    limit(false);
    require(nullptr == sqlite3_next_stmt(pDb_, nullptr), "a statement was left open");
    require(0 != sqlite3_get_autocommit(pDb_), "a transaction was left open");
    require("1" == value("select 1"), "the connection does not answer");
    require(SQLITE_OK == sqlite3_close(pDb_), "the connection cannot be closed");
}

// A value other than zero stops the statement.
int FuzzDatabase::step(void* arg)
{
    return kMaxCalls < ++static_cast<FuzzDatabase*>(arg)->iSteps_;
}

void FuzzDatabase::limit(bool blOn)
{
    sqlite3_progress_handler(pDb_, kStepsPerCall, blOn ? step : nullptr, this);
    sqlite3_set_authorizer(pDb_, blOn ? authorize : nullptr, nullptr);
}

std::string FuzzDatabase::value(const std::string& strSql)
{
    std::string strValue = "no row";
    const auto keep = [](void* arg, int, char** values, char**) {
        *static_cast<std::string*>(arg) = nullptr == values[0] ? "NULL" : values[0];
        return 0;
    };
    limit(false);
    const int iStatus = sqlite3_exec(pDb_, strSql.c_str(), keep, &strValue, nullptr);
    limit(true);
    require(SQLITE_OK == iStatus, "the host's own statement failed: ", strSql);
    return strValue;
}

int FuzzDatabase::number(const std::string& strSql, const std::vector<std::string>& bound)
{
    sqlite3_stmt* pStatement = nullptr;
    limit(false);
    sqlite3_prepare_v2(pDb_, strSql.c_str(), -1, &pStatement, nullptr);
    int iParameter = 0;
    for (const std::string& strText : bound)
        sqlite3_bind_text(pStatement, ++iParameter, strText.data(),
                          static_cast<int>(strText.size()), SQLITE_STATIC);
    const int iStep = sqlite3_step(pStatement);
    require(SQLITE_ROW == iStep || SQLITE_DONE == iStep,
            "the host's own statement failed: ", strSql);
    const int iNumber = SQLITE_ROW == iStep ? sqlite3_column_int(pStatement, 0) : 0;
    sqlite3_finalize(pStatement);
    limit(true);
    return iNumber;
}

void FuzzDatabase::requireOtherUntouched()
{
    require("a,b2" == value(kOther), "another table was touched");
}

FuzzTable::FuzzTable(FuzzDatabase& database, const Json::Value& jMembers,
                     const std::string& strColumns)
    : jDefinition(definition(strName, jMembers)),
      strCreate("create table t (" + strColumns + ")"),
      api(database.get(), strName, jDefinition, strCreate)
{
    memberTypes(strName) = jMembers;
}

std::string FuzzTable::rows(FuzzDatabase& database) const
{
    return database.value("select count(*) from " + strName);
}
