// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
#include "support/operations.h"

#include "support/matrix.h"
#include "support/records.h"

#include <cstring>
#include <stdexcept>
#include <utility>

std::string recordsSql(const char* szColumns)
{
    return std::string("create table if not exists records (") + szColumns +
           ");with recursive n(i) as (select 1 union all select i+1 from n where i < " +
           std::to_string(kRecords) +
           ") insert into records select i, 'name' || i, printf('%.300c', 'x'), '{\"k\":1}' from n";
}

bool Operation::is(const std::string& strFunction) const
{
    return 0 == (std::string(szName) + " ").find(strFunction + " ");
}

int Operation::run(Database& database, Table& table, Json::Value& jOutput) const
{
    Call call;
    call.pDb = database.get();
    call.strTable = table.strName;
    call.jDefinition = table.jDefinition;
    call.strCreate = table.strCreate;
    call.pApi = &table.api;
    call.setArguments(json(szArguments));
    const int iReturned = Call::function(szName)(call);
    jOutput = is("recSave") ? call.jFirst : call.jSecond;
    return is("constructor") && !doubles::state().log.empty() ? -1 : iReturned;
}

Json::Value Operation::untouched() const
{
    return json(szArguments)[is("recSave") ? "first" : "second"];
}

Lines Operation::failure(const Table& table, const std::string& strError, const std::string& strSql,
                         std::size_t nRetries) const
{
    Json::Value jArguments = json(szArguments);
    jArguments["create"] = strSql;
    Json::Value jDefinition = table.jDefinition;
    std::string strName = table.strName;
    const std::string strFunction = split(szName, ' ')[0];
    const std::vector<Lines> levels =
        levelsOf(strFunction, jArguments, VORN_JSON_DB::recType(jDefinition, strName));
    return Lines{runFailed(strError, strSql, nRetries), levels[0][0]} +
           restOf(levels, 0, strError, strSql);
}

std::string onlyStatement(std::size_t nAttempts, std::size_t nSleeps)
{
    const std::vector<std::string> statements = std::exchange(doubles::state().statements, {});
    const std::string strSql = statements.empty() ? "" : statements[0];
    EXPECT_EQ(std::vector<std::string>(nAttempts, strSql), statements);
    EXPECT_EQ(std::vector<unsigned>(nSleeps, 10000), doubles::state().sleeps);
    doubles::state().sleeps.clear();
    return strSql;
}

std::string testName(const std::vector<std::string>& parts)
{
    std::string strName;
    for (const std::string& strPart : parts)
        for (const char c : (strName.empty() ? "" : "_") + strPart)
            if (',' != c) strName += ' ' == c ? '_' : c;
    return strName;
}

const std::vector<Operation>& operations()
{
    static const std::vector<Operation> all = {
        {"constructor", "{}", 0, false, false},
        {"constructor on its table", "{}", 0, false},
        {"tableCreate", "{}", 0, false, false},
        {"recCreate", R"({"first":{"id":50,"name":"new"},"second":{"untouched":true}})", 0},
        {"recCreate of a duplicate",
         R"({"first":{"id":50,"name":"name3"},"second":{"untouched":true}})", -1},
        {"recSave inserts",
         R"({"flag":true,"first":{"id":50,"name":"new","note":"n","tags":{"k":[1,2]}}})", 0},
        {"recSave replaces", R"({"first":{"id":3,"name":"other","note":"n","tags":{}}})", 0},
        {"recList", R"({"second":[]})", 0, false},
        {"recList of some",
         R"({"first":{"vornSqlWhereFilter":"id > 6","sort_by":"id","limit":3},"second":[]})", 0,
         false},
        // The filter is SQL verbatim, so it can end the statement and begin another.
        {"recList of all, twice",
         R"({"first":{"vornSqlWhereFilter":"1); SELECT id,name,note,tags FROM records WHERE (1"},
             "second":[]})",
         0, false},
        {"recGetOne", R"({"first":{"name":"name7"},"second":{"untouched":true}})", 1, false},
        {"recUpdateByWhere", R"({"first":{"note":"short"},"text":"id > 2"})", 0},
        {"recUpdateByFilter", R"({"first":{"name":"name9"},
                                  "second":{"id":90,"name":"nine","note":"n","tags":{"k":9}}})",
         0},
        {"recDelete", R"({"first":{"vornSqlWhereFilter":"id between 3 and 9"}})", 7},
        {"recDeleteAll", "{}", kRecords},
        {"recDeleteByArray", R"({"vector":["name4"],"key":"name"})", 1},
        {"recDeleteByName", R"({"text":"name5","key":"name"})", 1},
    };
    return all;
}

const Operation& operation(const char* szName)
{
    for (const Operation& candidate : operations())
        if (0 == strcmp(szName, candidate.szName)) return candidate;
    throw std::invalid_argument(szName);
}
