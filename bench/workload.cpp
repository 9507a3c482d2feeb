// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
#include "workload.h"

#include <json/reader.h>
#include <json/writer.h>
#include <sqlite3.h>

#include <cstdio>
#include <cstdlib>
#include <memory>
#include <sstream>

namespace bench {

namespace {

// Without a "%": such a text is slow on purpose in the library's value lists, and rare.
const char* const kWords[] = {"urgent", "home", "office", "garden", "later", "travel", "weekly"};

std::string word(int i)
{
    return kWords[static_cast<std::size_t>(i) % (sizeof kWords / sizeof *kWords)];
}

// The members' values, for records and for rows that are made without a record.
std::string name(int id)
{
    return "Task number " + std::to_string(id);
}

bool isDone(int id)
{
    return 0 == id % 3;
}

long long quantity(int id)
{
    return 5000000000 + id;
}

int groupOf(int id)
{
    return (id - 1) / kGroupSize;
}

std::string firstTag(int id)
{
    return word(id);
}

std::string secondTag(int id)
{
    return word(id / 7 + 3);
}

std::string owner(int id)
{
    return "person " + std::to_string(id % 100);
}

int level(int id)
{
    return id % 5;
}

}  // namespace

Json::Value definition()
{
    const char* const members[][2] = {{"id", "int"},
                                      {"name", "string"},
                                      {"done", "bool"},
                                      {"qty", "long long"},
                                      {"grp", "string"},
                                      {"tags", "Json::arrayValue"},
                                      {"meta", "Json::objectValue"}};
    Json::Value jDefinition;
    for (const auto& member : members)
        jDefinition[kTable]["member"][member[0]]["cpptype"] = member[1];
    return jDefinition;
}

std::string createStatement()
{
    return "CREATE TABLE IF NOT EXISTS task (id INTEGER PRIMARY KEY, name TEXT, done INTEGER,"
           " qty INTEGER, grp TEXT, tags TEXT, meta TEXT);"
           "CREATE INDEX IF NOT EXISTS task_grp ON task (grp);";
}

Json::Value record(int id)
{
    Json::Value jRecord;
    jRecord["id"] = id;
    jRecord["name"] = name(id);
    jRecord["done"] = isDone(id);
    jRecord["qty"] = Json::Int64(quantity(id));
    jRecord["grp"] = groupName(groupOf(id));
    jRecord["tags"].append(firstTag(id));
    jRecord["tags"].append(secondTag(id));
    jRecord["meta"]["owner"] = owner(id);
    jRecord["meta"]["level"] = level(id);
    return jRecord;
}

std::string groupName(int group)
{
    return "group " + std::to_string(group);
}

std::string newName(int id)
{
    return "Renamed task " + std::to_string(id);
}

std::string toText(const Json::Value& jValue)
{
    static const std::unique_ptr<Json::StreamWriter> writer([] {
        Json::StreamWriterBuilder builder;
        builder["indentation"] = "";
        return builder.newStreamWriter();
    }());
    std::ostringstream stream;
    writer->write(jValue, &stream);
    return stream.str();
}

Json::Value fromText(const std::string& strText)
{
    static const std::unique_ptr<Json::CharReader> reader(
        Json::CharReaderBuilder().newCharReader());
    Json::Value jValue;
    must(reader->parse(strText.data(), strText.data() + strText.size(), &jValue, nullptr),
         strText.c_str());
    return jValue;
}

void run(sqlite3* pDb, const std::string& strSql)
{
    must(SQLITE_OK == sqlite3_exec(pDb, strSql.c_str(), nullptr, nullptr, nullptr), strSql.c_str());
}

sqlite3* openInMemory()
{
    sqlite3* pDb = nullptr;
    must(SQLITE_OK == sqlite3_open(":memory:", &pDb), "open");
    return pDb;
}

void fill(sqlite3* pDb, int rows)
{
    sqlite3_stmt* pInsert = nullptr;
    sqlite3_prepare_v2(pDb,
                       "INSERT INTO task (id,name,done,qty,grp,tags,meta) VALUES (?,?,?,?,?,?,?)",
                       -1, &pInsert, nullptr);
    must(nullptr != pInsert, "prepare the filling");
    const auto bindText = [&](int i, const std::string& strText) {
        sqlite3_bind_text(pInsert, i, strText.c_str(), -1, SQLITE_TRANSIENT);
    };
    run(pDb, "BEGIN");
    for (int id = 1; id <= rows; ++id) {
        sqlite3_bind_int(pInsert, 1, id);
        bindText(2, name(id));
        sqlite3_bind_int(pInsert, 3, isDone(id));
        sqlite3_bind_int64(pInsert, 4, quantity(id));
        bindText(5, groupName(groupOf(id)));
        bindText(6, "[\"" + firstTag(id) + "\",\"" + secondTag(id) + "\"]");
        bindText(7,
                 "{\"level\":" + std::to_string(level(id)) + ",\"owner\":\"" + owner(id) + "\"}");
        must(SQLITE_DONE == sqlite3_step(pInsert), "fill");
        sqlite3_reset(pInsert);
    }
    run(pDb, "COMMIT");
    sqlite3_finalize(pInsert);
}

std::string tableText(sqlite3* pDb)
{
    std::string strText;
    const auto append = [](void* pText, int nColumn, char** values, char**) {
        for (int i = 0; i < nColumn; ++i)
            static_cast<std::string*>(pText)->append(values[i] ? values[i] : "NULL").append("|");
        return 0;
    };
    // Each writer has its own way with blanks between the JSON tokens.
    const char* const szSql =
        "SELECT done,grp,id,json(meta),name,qty,json(tags),typeof(id),"
        "typeof(done),typeof(qty) FROM task ORDER BY id";
    must(SQLITE_OK == sqlite3_exec(pDb, szSql, append, &strText, nullptr), "read the table");
    return strText;
}

void must(bool blHolds, const char* szWhat)
{
    if (blHolds) return;
    fprintf(stderr, "bench: failed: %s\n", szWhat);
    exit(1);
}

}  // namespace bench
