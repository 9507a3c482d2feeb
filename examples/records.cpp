// SPDX-License-Identifier: MIT
/// @file
/// A complete host of libvornjsondb: it opens a database, binds one table and works with its
/// records from the command line.
///
///     records [-v] DATABASE TABLE.json COMMAND [ARGUMENT...]
///
/// TABLE.json describes the table to the library and to SQLite (examples/tables holds two):
///
///     {"name": "task", "key": "id",
///      "create": "create table if not exists task (id integer primary key, name text)",
///      "definition": {"task": {"member": {"id": {"cpptype": "long long"},
///                                         "name": {"cpptype": "string"}}}}}
///
/// "key" is this program's own and may be absent: the member that names a record in a message.
///
/// Records go to standard output as JSON, one per line. Messages are one line on stderr. The
/// exit status is 0, 1 when something failed, 2 for wrong arguments, 3 when `get` finds nothing,
/// about which it says nothing else. `get` reads one record: it puts "limit" 1 into the request.
#include "progress.h"

#include <VornJsonDbApi.h>

#include <cerrno>
#include <cstdint>
#include <cstring>
#include <fstream>
#include <iostream>
#include <memory>
#include <sstream>
#include <stdexcept>
#include <string>
#include <vector>

// The library only declares its two flags. A host defines them, in a file that includes the header.
// False and false: what fails is logged to syslog.
bool blLogToStdout = false;
bool blDebugOutput = false;

namespace {

using Arguments = std::vector<std::string>;

constexpr int kFailed = 1;
constexpr int kWrongArguments = 2;
constexpr int kNothingFound = 3;

// What a command works with.
struct Table {
    VornJsonDbApi& api;
    sqlite3* pDb;
    std::string strKey;  // the member that names a record in a message, or empty
};

std::string toText(const Json::Value& jValue)
{
    static const Json::StreamWriterBuilder builder = [] {
        Json::StreamWriterBuilder compact;
        compact["indentation"] = "";
        compact["emitUTF8"] = true;
        return compact;
    }();
    return Json::writeString(builder, jValue);
}

void print(const Json::Value& jValue)
{
    std::cout << toText(jValue) << '\n';
}

// {"deleted":3}
template <typename Number>
void printCount(const char* szWhat, Number count)
{
    Json::Value jResult;
    jResult[szWhat] = count;
    print(jResult);
}

// Reads one JSON object or array; strSource names it in the message if it is invalid.
Json::Value parse(std::istream& stream, const std::string& strSource)
{
    Json::CharReaderBuilder builder;
    Json::CharReaderBuilder::strictMode(&builder.settings_);
    builder["stackLimit"] = 1000;  // as the library reads
    Json::Value jValue;
    std::string strErrors;
    if (Json::parseFromStream(builder, stream, &jValue, &strErrors)) return jValue;

    // jsoncpp reports on several lines that begin with stars or blanks: make one of them.
    std::string strMessage = strSource + ": not valid JSON:";
    std::istringstream words(strErrors);
    for (std::string strWord; words >> strWord;)
        if ("*" != strWord) strMessage += " " + strWord;
    throw std::runtime_error(strMessage);
}

Json::Value parseArgument(const std::string& strArgument, const char* szName)
{
    std::istringstream stream(strArgument);
    return parse(stream, szName);
}

Json::Value readFile(const std::string& strPath)
{
    std::ifstream file(strPath);
    if (!file) throw std::runtime_error(strPath + ": " + std::strerror(errno));
    return parse(file, strPath);
}

std::string nameOf(const Table& table, const Json::Value& jRecord)
{
    if (!jRecord.isObject() || !jRecord.isMember(table.strKey)) return "the record";
    return table.strKey + " " + toText(jRecord[table.strKey]);
}

// Runs one operation of the library and returns its result. After -1 it ends the command: the
// library has a message for the user if it knows the reason; the log has everything else.
template <typename Operation>
int attempt(Table& table, const std::string& strWhat, Operation operation)
{
    table.api.setErrMsg("");  // nothing else clears the message of an earlier operation
    const int iResult = operation();
    if (0 <= iResult) return iResult;
    const std::string strReason = table.api.getErrMsg();
    throw std::runtime_error(strWhat + ": " +
                             (strReason.empty() ? "failed (-v shows the log)" : strReason));
}

void runSql(Table& table, const char* szSql)
{
    attempt(table, szSql, [&] { return table.api.runSqlEx(szSql); });
}

// Does the work as a whole or, when it throws, not at all. The transaction is the host's: the
// library knows none. IMMEDIATE takes the write lock at once, so that no part of the work meets a
// database that somebody else has locked meanwhile.
template <typename Work>
void inTransaction(Table& table, Work work)
{
    runSql(table, "begin immediate");
    try {
        work();
        runSql(table, "commit");
    } catch (...) {
        // This may fail if SQLite has rolled back already; closing the database rolls back, too.
        table.api.runSqlEx("rollback");
        throw;
    }
}

int create(Table& table, const Arguments& arguments)
{
    Json::Value jRecord = parseArgument(arguments[0], "RECORD-JSON");
    Json::Value jStored;
    attempt(table, nameOf(table, jRecord), [&] { return table.api.recCreate(jRecord, jStored); });
    print(jStored);
    return 0;
}

// Inserts or replaces. Unlike create, it takes the record as it is: no defaults, no type check.
int save(Table& table, const Arguments& arguments)
{
    Json::Value jRecord = parseArgument(arguments[0], "RECORD-JSON");
    attempt(table, nameOf(table, jRecord), [&] { return table.api.recSave(jRecord, false); });
    print(jRecord);
    return 0;
}

Json::Value readArray(const Arguments& arguments)
{
    const std::string& strPath = arguments[0];
    Json::Value jTop = readFile(strPath);
    if (1 == arguments.size()) {
        if (jTop.isArray()) return jTop;
        throw std::runtime_error(strPath + ": not an array, KEY must name the member that is");
    }
    const std::string& strKey = arguments[1];
    if (jTop.isObject() && jTop[strKey].isArray()) return jTop[strKey];
    throw std::runtime_error(strPath + ": no array under " + toText(strKey));
}

// All records or none.
int import(Table& table, const Arguments& arguments)
{
    Json::Value jArray = readArray(arguments);
    inTransaction(table, [&] {
        Progress progress(jArray.size());
        Json::Value jStored;
        for (Json::Value& jRecord : jArray) {
            attempt(table, nameOf(table, jRecord),
                    [&] { return table.api.recCreate(jRecord, jStored); });
            progress.advance();
        }
    });
    printCount("imported", jArray.size());
    return 0;
}

int list(Table& table, const Arguments& arguments)
{
    const std::string strEveryRecord = "{}";
    Json::Value jRequest =
        parseArgument(arguments.empty() ? strEveryRecord : arguments[0], "REQUEST-JSON");
    Json::Value jRecords(Json::arrayValue);
    attempt(table, toText(jRequest), [&] { return table.api.recList(jRequest, jRecords); });
    for (const Json::Value& jRecord : jRecords) print(jRecord);
    return 0;
}

int get(Table& table, const Arguments& arguments)
{
    Json::Value jRequest = parseArgument(arguments[0], "REQUEST-JSON");
    const std::string strRequest = toText(jRequest);
    // Without it the library reads every record that matches and takes the first.
    if (jRequest.isObject()) jRequest["limit"] = 1;
    Json::Value jRecord;
    if (0 == attempt(table, strRequest, [&] { return table.api.recGetOne(jRequest, jRecord); }))
        return kNothingFound;
    print(jRecord);
    return 0;
}

int update(Table& table, const Arguments& arguments)
{
    Json::Value jFilter = parseArgument(arguments[0], "FILTER-JSON");
    Json::Value jValues = parseArgument(arguments[1], "VALUES-JSON");
    attempt(table, toText(jFilter), [&] { return table.api.recUpdateByFilter(jFilter, jValues); });
    // The library does not tell how many, but SQLite does: all rows that the filter selected.
    printCount("updated", sqlite3_changes(table.pDb));
    return 0;
}

// A request without conditions is refused: delete-all is there for that.
int deleteSome(Table& table, const Arguments& arguments)
{
    Json::Value jRequest = parseArgument(arguments[0], "REQUEST-JSON");
    printCount("deleted",
               attempt(table, toText(jRequest), [&] { return table.api.recDelete(jRequest); }));
    return 0;
}

int deleteAll(Table& table, const Arguments& /*none*/)
{
    printCount("deleted", attempt(table, "every record", [&] { return table.api.recDeleteAll(); }));
    return 0;
}

// One call for each value, because the library writes several values of a list without a comma.
int deleteBy(Table& table, const Arguments& arguments)
{
    const std::string& strKey = arguments[0];
    int iDeleted = 0;
    inTransaction(table, [&] {
        for (std::size_t i = 1; i < arguments.size(); ++i) {
            std::string strValue = arguments[i];
            Json::Value jRequest;
            jRequest[strKey] = strValue;
            iDeleted += attempt(table, toText(jRequest), [&] {
                return table.api.recDeleteByName(strValue, strKey.c_str());
            });
        }
    });
    printCount("deleted", iDeleted);
    return 0;
}

struct Command {
    const char* szName;
    const char* szArguments;
    std::size_t uLeast;
    std::size_t uMost;
    int (*run)(Table& table, const Arguments& arguments);
};

constexpr Command kCommands[] = {
    {"create", "RECORD-JSON", 1, 1, create},
    {"save", "RECORD-JSON", 1, 1, save},
    {"import", "FILE.json [KEY]", 1, 2, import},
    {"list", "[REQUEST-JSON]", 0, 1, list},
    {"get", "REQUEST-JSON", 1, 1, get},
    {"update", "FILTER-JSON VALUES-JSON", 2, 2, update},
    {"delete", "REQUEST-JSON", 1, 1, deleteSome},
    {"delete-all", "", 0, 0, deleteAll},
    {"delete-by", "KEY VALUE...", 2, SIZE_MAX, deleteBy},
};

const Command* findCommand(const std::string& strName, std::size_t uArguments)
{
    for (const Command& command : kCommands)
        if (command.szName == strName && command.uLeast <= uArguments &&
            uArguments <= command.uMost)
            return &command;
    return nullptr;
}

int usage()
{
    std::cerr << "usage: records [-v] DATABASE TABLE.json COMMAND [ARGUMENT...]\n"
                 "  -v  show the library's log on standard output\n"
                 "commands:\n";
    for (const Command& command : kCommands)
        std::cerr << "  " << command.szName << (*command.szArguments ? " " : "")
                  << command.szArguments << '\n';
    return kWrongArguments;
}

struct CloseDatabase {
    void operator()(sqlite3* pDb) const { sqlite3_close(pDb); }
};
using Database = std::unique_ptr<sqlite3, CloseDatabase>;

Database openDatabase(const std::string& strPath)
{
    sqlite3* pDb = nullptr;
    const int iStatus = sqlite3_open(strPath.c_str(), &pDb);
    Database database(pDb);
    if (SQLITE_OK != iStatus) throw std::runtime_error(strPath + ": " + sqlite3_errmsg(pDb));
    return database;
}

Json::Value readTable(const std::string& strPath)
{
    Json::Value jTable = readFile(strPath);
    if (!jTable.isObject() || !jTable["name"].isString() || !jTable["create"].isString() ||
        !jTable["definition"].isObject())
        throw std::runtime_error(strPath +
                                 ": \"name\", \"create\" and \"definition\" have to be there");
    return jTable;
}

int run(const Command& command, const std::string& strDatabase, const std::string& strTable,
        const Arguments& arguments)
{
    Json::Value jTable = readTable(strTable);
    std::string strName = jTable["name"].asString();
    std::string strCreate = jTable["create"].asString();

    // The handle is destroyed before the connection that it uses is closed.
    const Database database = openDatabase(strDatabase);
    VornJsonDbApi api(database.get(), strName, jTable["definition"], strCreate);
    // A constructor cannot say whether its CREATE statement failed: ask again.
    if (0 > api.tableCreate())
        throw std::runtime_error(strDatabase + ": " + sqlite3_errmsg(database.get()));

    Table table{api, database.get(), jTable["key"].asString()};
    const int iStatus = command.run(table, arguments);
    if (!std::cout.flush()) throw std::runtime_error("standard output cannot be written");
    return iStatus;
}

}  // namespace

int main(int argc, char** argv)
{
    Arguments arguments(argv + 1, argv + argc);
    if (!arguments.empty() && "-v" == arguments[0]) {
        blLogToStdout = blDebugOutput = true;
        arguments.erase(arguments.begin());
    }
    if (3 > arguments.size()) return usage();
    const Command* pCommand = findCommand(arguments[2], arguments.size() - 3);
    if (nullptr == pCommand) return usage();

    try {
        return run(*pCommand, arguments[0], arguments[1],
                   Arguments(arguments.begin() + 3, arguments.end()));
    } catch (const std::exception& error) {
        // Also what jsoncpp throws, through the library, at a value of the wrong kind.
        std::cerr << "records: " << pCommand->szName << ": " << error.what() << '\n';
        return kFailed;
    }
}
