// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// A table of tasks in memory, for hosts and a plugin in every language version since C++11.
#ifndef TESTS_HOST_TASK_H
#define TESTS_HOST_TASK_H

#include <VornJsonDbApi.h>
#include <sqlite3.h>

#include <cstdlib>
#include <memory>
#include <string>

// Does not use the library before the first call of api().
struct Task {
    Task()
    {
        if (SQLITE_OK != sqlite3_open(":memory:", &pDb)) std::_Exit(11);
        Json::Value& jMember = jDefinition["task"]["member"];
        jMember["data"]["cpptype"] = "Json::objectValue";
        jMember["id"]["cpptype"] = "int";
        jMember["name"]["cpptype"] = "string";
    }
    ~Task()
    {
        pApi.reset();
        if (SQLITE_OK != sqlite3_close(pDb)) std::_Exit(12);
    }

    VornJsonDbApi& api()
    {
        if (!pApi) pApi.reset(new VornJsonDbApi(pDb, strName, jDefinition, strCreate));
        return *pApi;
    }

    static Json::Value record(int iId)
    {
        Json::Value jRecord;
        jRecord["data"]["a key that is long"] = "a text that is longer than a short string";
        jRecord["id"] = iId;
        jRecord["name"] = "a name that is longer than a short string";
        return jRecord;
    }

    // Whether a record comes back as it was created, in a list too, and can be changed and deleted.
    bool works(int iId)
    {
        Json::Value jRecord = record(iId);
        Json::Value jStored;
        if (0 != api().recCreate(jRecord, jStored) || jRecord != jStored) return false;
        Json::Value jAll(Json::objectValue);
        Json::Value jRecords(Json::arrayValue);
        if (0 != api().recList(jAll, jRecords) || 1U != jRecords.size()) return false;
        return jRecord == jRecords[0U] && 1 == api().runSqlEx("update task set id=id+1") &&
               1 == api().recDeleteAll();
    }

    sqlite3* pDb = nullptr;
    std::string strName = "task";
    std::string strCreate = "create table task (data text, id integer primary key, name text)";
    Json::Value jDefinition;
    std::unique_ptr<VornJsonDbApi> pApi;
};

#endif
