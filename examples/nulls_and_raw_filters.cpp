// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
/// @file
/// Nulls and raw filters: a column that is NULL is a member that the record lacks, and what a plain
/// condition cannot say is said in SQL, under the key "vornSqlWhereFilter".
///
/// Prints which books each filter selects, with the day on which a book that is lent is due. The
/// book with a quote in its title is found by a text that could have come from outside.
#include <VornJsonDbApi.h>

#include <iostream>
#include <memory>

bool blLogToStdout = false;
bool blDebugOutput = false;

namespace {

// "title like '%O''Clock%'": the text between quotes, with its own quotes doubled. A text from
// outside must not become part of a filter in any other way; % and _ in it match as in LIKE. Empty
// if memory runs out.
std::string containing(const std::string& strText)
{
    const std::string strPattern = "%" + strText + "%";
    const std::unique_ptr<char, decltype(&sqlite3_free)> szFilter(
        sqlite3_mprintf("title like %Q", strPattern.c_str()), sqlite3_free);
    return szFilter ? szFilter.get() : "";
}

bool create(VornJsonDbApi& book, const char* szTitle, const char* szDue)
{
    Json::Value jBook;
    Json::Value jStored;
    jBook["title"] = szTitle;
    if (nullptr != szDue) jBook["due"] = szDue;  // left out, and without a default: NULL
    return 0 == book.recCreate(jBook, jStored);
}

bool list(VornJsonDbApi& book, const std::string& strFilter)
{
    if (strFilter.empty()) return false;
    Json::Value jRequest;
    Json::Value jBooks(Json::arrayValue);
    jRequest["vornSqlWhereFilter"] = strFilter;
    if (0 > book.recList(jRequest, jBooks)) return false;
    std::cout << strFilter << '\n';
    for (const Json::Value& jBook : jBooks)
        std::cout << "    " << jBook["title"].asString()
                  << (jBook.isMember("due") ? ", due " + jBook["due"].asString() : "") << '\n';
    return true;
}

// NULL again: the record is fetched, loses the member, and is saved whole. Setting the member to
// null would store an empty text.
bool bringBack(VornJsonDbApi& book, const char* szTitle)
{
    Json::Value jRequest;
    Json::Value jBook;
    jRequest["title"] = szTitle;
    jRequest["limit"] = 1;
    if (1 != book.recGetOne(jRequest, jBook)) return false;
    jBook.removeMember("due");
    return 0 == book.recSave(jBook, false);
}

bool useBooks(sqlite3* pDb)
{
    std::string strName = "book";
    std::string strCreate =
        "create table if not exists book (id integer primary key, title text, due text)";
    Json::Value jDefinition;
    jDefinition[strName]["member"]["due"]["cpptype"] = "string";
    jDefinition[strName]["member"]["id"]["cpptype"] = "long long";
    jDefinition[strName]["member"]["title"]["cpptype"] = "string";
    VornJsonDbApi book(pDb, strName, jDefinition, strCreate);
    return 0 <= book.tableCreate() && create(book, "Emma", nullptr) &&
           create(book, "Faust", "2026-03-01") && create(book, "Twelve O'Clock", "2026-02-14") &&
           list(book, "due is null") && list(book, "due < '2026-03-01'") &&
           list(book, "title in ('Emma','Faust')") && list(book, containing("O'Clock")) &&
           bringBack(book, "Faust") && list(book, "due is null");
}

}  // namespace

int main()
{
    sqlite3* pDb = nullptr;
    const bool blDone = SQLITE_OK == sqlite3_open(":memory:", &pDb) && useBooks(pDb);
    if (!blDone) std::cerr << "failed, see the log: " << sqlite3_errmsg(pDb) << '\n';
    const bool blClosed = SQLITE_OK == sqlite3_close(pDb);
    return blDone && blClosed ? 0 : 1;
}
