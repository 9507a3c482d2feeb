// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// The header of the table as the only thing that a host includes; every function is compiled.
#include <VornJsonTable.h>

bool blLogToStdout = false;
bool blDebugOutput = false;

std::string useTable(const Json::Value& jDefinition);

std::string useTable(const Json::Value& jDefinition)
{
    sqlite3* pDb = nullptr;
    if (SQLITE_OK != sqlite3_open(":memory:", &pDb)) return sqlite3_errmsg(pDb);

    VornJsonTable table(pDb, "task", jDefinition, "create table task (id integer primary key)");
    table.setLimits({});
    Json::Value jRecord;
    Json::Value jStored;
    table.create(jRecord, jStored);
    table.createMany(jRecord);
    table.save(jRecord, jStored);
    table.list(jRecord, jRecord, jStored);
    table.each(jRecord, jRecord, [](const Json::Value&) { return true; });
    table.get(jRecord, jStored);
    table.count(jRecord);
    table.update(jRecord, jRecord);
    table.updateAll(jRecord);
    table.remove(jRecord);
    table.removeAll();
    return table.reason();
}
