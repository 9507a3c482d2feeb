#include "workload.h"

#include <json/reader.h>
#include <json/writer.h>
#include <sqlite3.h>

#include <cstdio>
#include <cstdlib>
#include <memory>

namespace bench {

namespace {

// Without a "%": such a text is slow on purpose in the library's value lists, and rare.
const char* const kWords[] = {"urgent", "home", "office", "garden", "later", "travel", "weekly"};

const char* word(int i)
{
    return kWords[static_cast<std::size_t>(i) % (sizeof kWords / sizeof *kWords)];
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
    jRecord["name"] = "Task number " + std::to_string(id);
    jRecord["done"] = 0 == id % 3;
    jRecord["qty"] = Json::Int64(5000000000) + id;
    jRecord["grp"] = groupName((id - 1) / kGroupSize);
    jRecord["tags"].append(word(id));
    jRecord["tags"].append(word(id / 7 + 3));
    jRecord["meta"]["owner"] = "person " + std::to_string(id % 100);
    jRecord["meta"]["level"] = id % 5;
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
    Json::StreamWriterBuilder builder;
    builder["indentation"] = "";
    return Json::writeString(builder, jValue);
}

Json::Value fromText(const std::string& strText)
{
    const std::unique_ptr<Json::CharReader> reader(Json::CharReaderBuilder().newCharReader());
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
        const Json::Value jRecord = record(id);
        sqlite3_bind_int(pInsert, 1, id);
        bindText(2, jRecord["name"].asString());
        sqlite3_bind_int(pInsert, 3, jRecord["done"].asBool());
        sqlite3_bind_int64(pInsert, 4, jRecord["qty"].asInt64());
        bindText(5, jRecord["grp"].asString());
        bindText(6, toText(jRecord["tags"]));
        bindText(7, toText(jRecord["meta"]));
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
    // Blanks between the JSON tokens are a matter of each writer.
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
