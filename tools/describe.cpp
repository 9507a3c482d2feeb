// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// A definition from a table that exists. The declared types of the columns decide; where one says
// nothing, the values in the column do.
#include "commands.h"
#include "database.h"
#include "failure.h"
#include "json_text.h"

#include <algorithm>
#include <cctype>

namespace tool {

namespace {

using Row = std::vector<std::string>;

// The type word for a column of values that all have the same type.
const char* wordOfValues(sqlite3* pDb, const std::string& strTable, const std::string& strColumn)
{
    const std::string strName = quotedName(strColumn);
    const std::string strTypes = select(pDb, "%s",
                                        "select group_concat(t, ' and ') from (select distinct "
                                        "typeof(" +
                                            strName + ") as t from " + quotedName(strTable) +
                                            " where " + strName + " is not null order by t)")[0][0];
    if (strTypes.empty() || "text" == strTypes) return "string";
    if ("integer" == strTypes) return "long long";
    throw Failure("member \"" + strColumn + "\": the column holds " + strTypes +
                  " values, which no type word reads exactly");
}

const char* wordOfColumn(sqlite3* pDb, const std::string& strTable, const Row& column)
{
    std::string strType = column[1];
    std::transform(strType.begin(), strType.end(), strType.begin(),
                   [](unsigned char c) { return static_cast<char>(std::toupper(c)); });
    const auto has = [&](const char* szPart) { return std::string::npos != strType.find(szPart); };
    if (has("INT")) return "long long";
    if (has("CHAR") || has("CLOB") || has("TEXT")) return has("JSON") ? "Json::Value" : "string";
    if (has("BOOL")) return "bool";
    // The table refuses these columns and says what to use instead.
    if (has("REAL") || has("FLOA") || has("DOUB")) return "double";
    return wordOfValues(pDb, strTable, column[0]);
}

}  // namespace

Json::Value describeTable(sqlite3* pDb, const std::string& strName)
{
    Json::Value jTable;
    const auto [strTable, strSql] = findTable(pDb, strName);
    jTable["name"] = strTable;
    std::string strCreate = strSql;  // CREATE TABLE name ..., as SQLite keeps it
    strCreate.insert(strCreate.find("TABLE ") + 6, "IF NOT EXISTS ");
    jTable["create"] = strCreate;
    Json::Value& jMembers = jTable["definition"][strTable]["member"];
    // Columns of a virtual table may be hidden.
    const auto columns =
        select(pDb, "select name,type from pragma_table_xinfo(%Q) where hidden<>1", strTable);
    for (const Row& column : columns)
        jMembers[column[0]]["cpptype"] = wordOfColumn(pDb, strTable, column);
    return jTable;
}

std::string tableText(const Json::Value& jTable)
{
    const std::string strName = jTable["name"].asString();
    std::string strMembers;
    const Json::Value& jMembers = jTable["definition"][strName]["member"];
    for (auto it = jMembers.begin(); it != jMembers.end(); ++it)
        strMembers +=
            (strMembers.empty() ? "" : ",\n") + ("    " + toText(it.name())) + ": " + toText(*it);
    return "{\"name\": " + toText(strName) + ",\n \"create\": " + toText(jTable["create"]) +
           ",\n \"definition\": {" + toText(strName) + ": {\"member\": {\n" + strMembers + "}}}}\n";
}

int describe(const Arguments& arguments, Output& output)
{
    const Database database = openDatabase(arguments.values[0], false);
    const Json::Value jTable = describeTable(database.get(), arguments.values[1]);
    bindTable(database.get(), jTable);
    output.text(tableText(jTable));
    return kDone;
}

}  // namespace tool
