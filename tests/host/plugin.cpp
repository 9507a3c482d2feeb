// SPDX-License-Identifier: MIT
// A plugin that works with the library; plugin_host loads it.

#include <VornJsonDbApi.h>
#include <sqlite3.h>

extern "C" bool createsRecord(int iId);

// Whether a record can be created and comes back as it was.
bool createsRecord(int iId)
{
    sqlite3* pDb = nullptr;
    if (SQLITE_OK != sqlite3_open(":memory:", &pDb)) return false;
    std::string strName = "task";
    std::string strCreate = "create table task (data text, id integer primary key)";
    Json::Value jDefinition;
    jDefinition["task"]["member"]["data"]["cpptype"] = "Json::objectValue";
    jDefinition["task"]["member"]["id"]["cpptype"] = "int";
    bool blCreated = false;
    {
        VornJsonDbApi api(pDb, strName, jDefinition, strCreate);
        Json::Value jRecord;
        Json::Value jStored;
        jRecord["data"]["key"] = "value";
        jRecord["id"] = iId;
        blCreated = 0 == api.recCreate(jRecord, jStored) && jRecord == jStored;
    }
    return SQLITE_OK == sqlite3_close(pDb) && blCreated;
}
