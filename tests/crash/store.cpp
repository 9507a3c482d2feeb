// SPDX-License-Identifier: MIT
#include "crash/store.h"

// To the output of the test: nothing is logged unless an operation fails.
bool blLogToStdout = true;
bool blDebugOutput = false;

namespace {

constexpr const char* kPieces[] = {"a",  "record ", "'", "\"", "%s", "%",
                                   "\n", "\\",      "ä", "日", ";",  "--"};

std::string textOf(std::mt19937& random)
{
    // Most fit a page, some need many pages of their own.
    const unsigned long uPieces = 0 == random() % 8 ? random() % 8000 : random() % 60;
    std::string strText;
    for (unsigned long i = 0; i < uPieces; ++i) strText += kPieces[random() % std::size(kPieces)];
    return strText;
}

sqlite3* opened(const std::string& strPath)
{
    sqlite3* pDb = nullptr;
    sqlite3_open(strPath.c_str(), &pDb);
    return pDb;
}

Json::Value definition(const std::string& strName)
{
    Json::Value jDefinition;
    Json::Value& jMember = jDefinition[strName]["member"];
    jMember["data"]["cpptype"] = "Json::objectValue";
    jMember["id"]["cpptype"] = "int";
    jMember["kind"]["cpptype"] = "string";
    jMember["rev"]["cpptype"] = "int";
    jMember["text"]["cpptype"] = "string";
    return jDefinition;
}

}  // namespace

std::string kindOf(int iId)
{
    return "kind" + std::to_string(iId % kKinds);
}

Json::Value revision(int iRevision)
{
    std::mt19937 random(static_cast<unsigned>(iRevision));
    Json::Value jRevision;
    jRevision["rev"] = iRevision;
    jRevision["data"]["of"]["revision"] = iRevision;
    for (unsigned long i = random() % 4; 0 < i; --i)
        jRevision["data"]["list"].append(static_cast<int>(random() % 1000));
    jRevision["text"] = textOf(random);
    return jRevision;
}

Json::Value record(int iId, int iRevision)
{
    Json::Value jRecord = revision(iRevision);
    jRecord["id"] = iId;
    jRecord["kind"] = kindOf(iId);
    return jRecord;
}

Store::Store(const std::string& strPath)
    : pDb_(opened(strPath)),
      strCreate_("create table if not exists " + strName_ +
                 " (data text, id integer primary key, kind text, rev integer, text text);create "
                 "index if not exists " +
                 strName_ + "_rev on " + strName_ + " (rev)"),
      jDefinition_(definition(strName_)),
      api_(pDb_, strName_, jDefinition_, strCreate_)
{
}

bool Store::close()
{
    const bool blClosed = SQLITE_OK == sqlite3_close(pDb_);
    if (blClosed) pDb_ = nullptr;
    return blClosed;
}

bool Store::run(const std::string& strSql)
{
    return SQLITE_OK == sqlite3_exec(pDb_, strSql.c_str(), nullptr, nullptr, nullptr);
}

std::string Store::value(const std::string& strSql)
{
    std::string strValue;
    const auto keep = [](void* pValue, int nColumns, char** values, char**) {
        const char* szLast = values[nColumns - 1];
        *static_cast<std::string*>(pValue) = nullptr == szLast ? "NULL" : szLast;
        return 0;
    };
    if (SQLITE_OK != sqlite3_exec(pDb_, strSql.c_str(), keep, &strValue, nullptr))
        return sqlite3_errmsg(pDb_);
    return strValue;
}

bool Store::list(Json::Value& jRecords)
{
    Json::Value jAll;
    return 0 == api_.recList(jAll, jRecords);
}
