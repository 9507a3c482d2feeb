// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// Which values of a table a definition does not read as they are. Other programs may have written
// them; what goes through the table is checked there.
#include "commands.h"
#include "database.h"
#include "failure.h"
#include "json_text.h"

#include <algorithm>
#include <cstdint>
#include <map>

namespace tool {

namespace {

// A column of the row that a statement is at.
struct Cell {
    sqlite3_stmt* pStatement;
    int iColumn;

    int type() const { return sqlite3_column_type(pStatement, iColumn); }
    long long integer() const { return sqlite3_column_int64(pStatement, iColumn); }
    std::string_view text() const
    {
        const auto* szText =
            reinterpret_cast<const char*>(sqlite3_column_text(pStatement, iColumn));
        const int nBytes = sqlite3_column_bytes(pStatement, iColumn);
        return {szText, static_cast<std::size_t>(nBytes)};
    }
};

std::string kindOf(const Cell& cell)
{
    switch (cell.type()) {
    case SQLITE_INTEGER: return "the integer " + std::to_string(cell.integer());
    case SQLITE_FLOAT: return "a floating-point number";
    case SQLITE_TEXT: return "text";
    default: return "a blob";
    }
}

std::string flawOfInteger(const Cell& cell, long long iLeast, long long iMost)
{
    const bool blInteger = SQLITE_INTEGER == cell.type();
    if (blInteger && iLeast <= cell.integer() && cell.integer() <= iMost) return "";
    return kindOf(cell) + ", expected an integer from " + std::to_string(iLeast) + " to " +
           std::to_string(iMost);
}

std::string flawOfText(const Cell& cell)
{
    if (SQLITE_TEXT != cell.type()) return kindOf(cell) + ", expected text";
    if (std::string_view::npos != cell.text().find('\0')) return "text with a NUL byte";
    return isUtf8(cell.text()) ? "" : "text that is not UTF-8";
}

std::string flawOfJson(const Cell& cell, const std::string& strWord)
{
    std::string strFlaw = flawOfText(cell);
    if (!strFlaw.empty()) return strFlaw;
    Json::Value jValue;
    try {
        jValue = parseJson(cell.text(), {"text"});
    } catch (const Failure& failure) {
        return failure.what();
    }
    if ("Json::objectValue" == strWord && !jValue.isObject()) return "JSON, but no object";
    if ("Json::arrayValue" == strWord && !jValue.isArray()) return "JSON, but no array";
    return "";
}

// Why the type word does not read the value as it is, or nothing.
std::string flawOf(const Cell& cell, const std::string& strWord)
{
    if (SQLITE_NULL == cell.type()) return "";
    if ("string" == strWord) return flawOfText(cell);
    if ("int" == strWord) return flawOfInteger(cell, INT32_MIN, INT32_MAX);
    if ("long long" == strWord) return flawOfInteger(cell, INT64_MIN, INT64_MAX);
    if ("bool" == strWord) return flawOfInteger(cell, 0, 1);
    return flawOfJson(cell, strWord);
}

// What names a record in a message: its key.
Json::Value nameOf(sqlite3_stmt* pStatement, const std::vector<std::string>& names)
{
    Json::Value jName;
    for (int i = 0; i < static_cast<int>(names.size()); ++i) {
        const Cell cell{pStatement, i};
        Json::Value& jValue = jName[names[static_cast<std::size_t>(i)]];
        if (SQLITE_INTEGER == cell.type())
            jValue = Json::Int64(cell.integer());
        else if (SQLITE_NULL != cell.type())
            jValue = std::string(cell.text());
    }
    return jName;
}

// Prints a line for each value that is not read as it is, and returns their number.
long long checkTable(sqlite3* pDb, const std::string& strTable, const Json::Value& jMembers,
                     const std::vector<std::string>& names, Output& output)
{
    std::string strColumns;
    for (const std::string& strName : names) strColumns += strName + ",";
    const std::vector<std::string> members = jMembers.getMemberNames();
    for (const std::string& strMember : members)
        strColumns += strMember + (&strMember == &members.back() ? "" : ",");
    const std::string strSql = "select " + strColumns + " from " + strTable;
    const WaitForLocks wait(pDb);
    sqlite3_stmt* pStatement = nullptr;
    if (SQLITE_OK != sqlite3_prepare_v2(pDb, strSql.c_str(), -1, &pStatement, nullptr))
        throw Failure(sqlite3_errmsg(pDb));
    const std::unique_ptr<sqlite3_stmt, int (*)(sqlite3_stmt*)> owner(pStatement, sqlite3_finalize);
    long long nFlaws = 0;
    while (SQLITE_ROW == sqlite3_step(pStatement)) {
        int iColumn = static_cast<int>(names.size());
        for (const std::string& strMember : members) {
            const Cell cell{pStatement, iColumn++};
            const bool blKey = names.end() != std::find(names.begin(), names.end(), strMember);
            const std::string strFlaw =
                blKey && SQLITE_NULL == cell.type()
                    ? "null in the key"
                    : flawOf(cell, jMembers[strMember]["cpptype"].asString());
            if (strFlaw.empty()) continue;
            Json::Value jFlaw;
            jFlaw["table"] = strTable;
            jFlaw["record"] = nameOf(pStatement, names);
            jFlaw["member"] = strMember;
            jFlaw["reason"] = strFlaw;
            output.line(jFlaw);
            ++nFlaws;
        }
    }
    if (SQLITE_OK != sqlite3_reset(pStatement)) throw Failure(sqlite3_errmsg(pDb));
    return nFlaws;
}

std::vector<std::string> tableNames(const std::string& strDatabase)
{
    const Database database = openDatabase(strDatabase, false);
    std::vector<std::string> names;
    for (const auto& row : select(database.get(),
                                  "select name from sqlite_schema where type='table' and name not "
                                  "like 'sqlite\\_%%' escape '\\' order by name"))
        names.push_back(row[0]);
    return names;
}

}  // namespace

int check(const Arguments& arguments, Output& output)
{
    const std::string& strDatabase = arguments.values[0];
    long long nFlaws = 0;
    const auto checkOne = [&](const std::string& strTable) {
        const Table table = openTable(strDatabase, strTable, Open::kExisting);
        nFlaws += checkTable(table.database.get(), table.strName, table.jMembers,
                             table.pRecords->key(), output);
    };
    if (2 == arguments.values.size()) {
        checkOne(arguments.values[1]);
    } else {
        for (const std::string& strTable : tableNames(strDatabase)) {
            try {
                checkOne(strTable);
            } catch (const Failure& failure) {
                Json::Value jFlaw;
                jFlaw["table"] = strTable;
                jFlaw["reason"] = failure.what();
                output.line(jFlaw);
                ++nFlaws;
            }
        }
    }
    if (0 == nFlaws) return kDone;
    output.finish();
    throw Failure("not read as they are: " + std::to_string(nFlaws));
}

}  // namespace tool
