// SPDX-License-Identifier: MIT
#include "faults/files/operations.h"

namespace {

const char kUntouched[] = R"({"untouched":true})";
const char kNothing[] = "null";
const char kNewRecord[] = R"({"id":50,"name":"new","note":"n","tags":{"k":[1,2]}})";
const char kOldRecord[] = R"({"id":3,"name":"other","note":"n","tags":{}})";

int construct(Host& host, Json::Value&)
{
    Table& table = host.table;
    const VornJsonDbApi api(host.database.get(), table.strName, table.jDefinition, table.strCreate);
    return doubles::state().log.empty() ? 0 : -1;
}

int createTable(Host& host, Json::Value&)
{
    return host.table.api.tableCreate();
}

int create(Host& host, Json::Value& jOutput)
{
    Json::Value jRecord = json(R"({"id":50,"name":"new"})");
    return host.table.api.recCreate(jRecord, jOutput);
}

int createDuplicate(Host& host, Json::Value& jOutput)
{
    Json::Value jRecord = json(R"({"id":50,"name":"name3"})");
    return host.table.api.recCreate(jRecord, jOutput);
}

int insert(Host& host, Json::Value& jOutput)
{
    return host.table.api.recSave(jOutput, true);
}

int replace(Host& host, Json::Value& jOutput)
{
    return host.table.api.recSave(jOutput, false);
}

int list(Host& host, Json::Value& jOutput)
{
    Json::Value jRequest;
    return host.table.api.recList(jRequest, jOutput);
}

int listSome(Host& host, Json::Value& jOutput)
{
    Json::Value jRequest = json(R"({"vornSqlWhereFilter":"id > 6","sort_by":"id","limit":3})");
    return host.table.api.recList(jRequest, jOutput);
}

// The filter is SQL as it stands, so it can end the statement and begin another.
int listTwice(Host& host, Json::Value& jOutput)
{
    Json::Value jRequest;
    jRequest["vornSqlWhereFilter"] = "1); SELECT id,name,note,tags FROM records WHERE (1";
    return host.table.api.recList(jRequest, jOutput);
}

int getOne(Host& host, Json::Value& jOutput)
{
    Json::Value jRequest = json(R"({"name":"name7"})");
    return host.table.api.recGetOne(jRequest, jOutput);
}

int updateByWhere(Host& host, Json::Value&)
{
    Json::Value jRecord = json(R"({"note":"short"})");
    std::string strWhere = "id > 2";
    return host.table.api.recUpdateByWhere(jRecord, strWhere);
}

int updateByFilter(Host& host, Json::Value&)
{
    Json::Value jFilter = json(R"({"name":"name9"})");
    Json::Value jRecord = json(R"({"id":90,"name":"nine","note":"n","tags":{"k":9}})");
    return host.table.api.recUpdateByFilter(jFilter, jRecord);
}

int deleteSome(Host& host, Json::Value&)
{
    Json::Value jRequest = json(R"({"vornSqlWhereFilter":"id between 3 and 9"})");
    return host.table.api.recDelete(jRequest);
}

int deleteAll(Host& host, Json::Value&)
{
    return host.table.api.recDeleteAll();
}

int deleteByArray(Host& host, Json::Value&)
{
    std::vector<std::string> names{"name4"};
    return host.table.api.recDeleteByArray(names, "name");
}

int deleteByName(Host& host, Json::Value&)
{
    std::string strName = "name5";
    return host.table.api.recDeleteByName(strName, "name");
}

}  // namespace

const std::vector<Operation>& operations()
{
    static const std::vector<Operation> all = {
        {"constructor", false, kNothing, construct, 0},
        {"constructorOnItsTable", true, kNothing, construct, 0},
        {"tableCreate", false, kNothing, createTable, 0},
        {"recCreate", true, kUntouched, create, 0},
        {"recCreateDuplicate", true, kUntouched, createDuplicate, -1},
        {"recSaveInsert", true, kNewRecord, insert, 0},
        {"recSaveReplace", true, kOldRecord, replace, 0},
        {"recList", true, "[]", list, 0},
        {"recListSome", true, "[]", listSome, 0},
        {"recListTwice", true, "[]", listTwice, 0},
        {"recGetOne", true, kUntouched, getOne, 1},
        {"recUpdateByWhere", true, kNothing, updateByWhere, 0},
        {"recUpdateByFilter", true, kNothing, updateByFilter, 0},
        {"recDelete", true, kNothing, deleteSome, 7},
        {"recDeleteAll", true, kNothing, deleteAll, kRecords},
        {"recDeleteByArray", true, kNothing, deleteByArray, 1},
        {"recDeleteByName", true, kNothing, deleteByName, 1},
    };
    return all;
}
