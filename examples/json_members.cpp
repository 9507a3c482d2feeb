// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
/// @file
/// JSON members: an object and an array are members of a record and come back as such. They are
/// stored as JSON text, so that SQLite's JSON functions look into them.
///
/// Prints the cities that each filter selects, and between them the number of cities at each river,
/// by a query of the host's own. At the end both members of one city have changed.
#include <VornJsonDbApi.h>

#include <iostream>

bool blLogToStdout = false;
bool blDebugOutput = false;

namespace {

bool create(VornJsonDbApi& city, const char* szName, const char* szCountry, const char* szRiver)
{
    Json::Value jCity;
    Json::Value jStored;
    jCity["name"] = szName;
    jCity["place"]["country"] = szCountry;
    jCity["rivers"].append(szRiver);
    return 0 == city.recCreate(jCity, jStored);
}

bool list(VornJsonDbApi& city, const char* szFilter)
{
    Json::Value jRequest;
    Json::Value jCities(Json::arrayValue);
    jRequest["vornSqlWhereFilter"] = szFilter;
    if (0 > city.recList(jRequest, jCities)) return false;
    Json::StreamWriterBuilder oneLine;
    oneLine["indentation"] = "";
    std::cout << szFilter << '\n';
    for (const Json::Value& jCity : jCities)
        std::cout << "    " << Json::writeString(oneLine, jCity) << '\n';
    return true;
}

// A row of the query below: SQLite gives each column as text, or as a null pointer for NULL.
int printRiver(void* /*none*/, int iColumns, char** szValues, char** /*names*/)
{
    if (2 != iColumns || nullptr == szValues[0] || nullptr == szValues[1]) return -1;
    std::cout << szValues[0] << ": " << szValues[1] << '\n';
    return 0;
}

bool countByRiver(VornJsonDbApi& city)
{
    return 0 == city.runSqlEx("select value, count(*) from city, json_each(rivers) group by value",
                              printRiver);
}

// An update replaces an object whole, so SQL is used to change it inside. An array member cannot be
// updated at all: fetch the record, change it, and save it whole.
bool change(VornJsonDbApi& city)
{
    Json::Value jRequest;
    Json::Value jCity;
    jRequest["name"] = "Vienna";
    if (1 != city.recGetOne(jRequest, jCity)) return false;
    jCity["rivers"].append("Wien");
    if (0 > city.recSave(jCity, false)) return false;
    const char* szSql =
        "update city set place = json_set(place, '$.opera', 1869) where name = 'Vienna'";
    return 1 == city.runSqlEx(szSql);
}

bool useCities(sqlite3* pDb)
{
    std::string strName = "city";
    std::string strCreate =
        "create table if not exists city (name text primary key, place text, rivers text)";
    Json::Value jDefinition;
    jDefinition[strName]["member"]["name"]["cpptype"] = "string";
    jDefinition[strName]["member"]["place"]["cpptype"] = "Json::objectValue";
    jDefinition[strName]["member"]["rivers"]["cpptype"] = "Json::arrayValue";
    VornJsonDbApi city(pDb, strName, jDefinition, strCreate);
    return 0 <= city.tableCreate() && create(city, "Vienna", "AT", "Danube") &&
           create(city, "Budapest", "HU", "Danube") && create(city, "Rome", "IT", "Tiber") &&
           list(city, "json_extract(place, '$.country') = 'IT'") &&
           list(city, "exists (select 1 from json_each(rivers) where value = 'Danube')") &&
           countByRiver(city) && change(city) && list(city, "json_array_length(rivers) > 1");
}

}  // namespace

int main()
{
    sqlite3* pDb = nullptr;
    const bool blDone = SQLITE_OK == sqlite3_open(":memory:", &pDb) && useCities(pDb);
    if (!blDone) std::cerr << "failed, see the log: " << sqlite3_errmsg(pDb) << '\n';
    const bool blClosed = SQLITE_OK == sqlite3_close(pDb);
    return blDone && blClosed ? 0 : 1;
}
