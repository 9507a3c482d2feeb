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
///      "definition": {"task": {"member": {"id": {"cpptype": "int"},
///                                         "name": {"cpptype": "string"}}}}}
///
/// "key" is this program's own and may be absent: the member that names a record in a message.
///
/// Records go to standard output as JSON, one a line. Messages are one line on standard error. The
/// exit status is 0, 1 when something failed, 2 for wrong arguments.
#include <VornJsonDbApi.h>

#include <json/reader.h>
#include <json/writer.h>
#include <sqlite3.h>
#include <unistd.h>

#include <cerrno>
#include <cstdio>
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

// What a command works with.
struct Table {
    VornJsonDbApi& api;
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

// Reads one JSON object or array; strSource names it in the message when it is none.
Json::Value parse(std::istream& stream, const std::string& strSource)
{
    Json::CharReaderBuilder builder;
    Json::CharReaderBuilder::strictMode(&builder.settings_);
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

// Ends the command after an operation on strWhat returned -1. The library has a message for the
// user where it knows the reason; everything else stands in its log.
[[noreturn]] void fail(const Table& table, const std::string& strWhat)
{
    const std::string strReason = table.api.getErrMsg();
    throw std::runtime_error(strWhat + ": " +
                             (strReason.empty() ? "failed (-v shows the log)" : strReason));
}

int create(Table& table, const Arguments& arguments)
{
    Json::Value jRecord = parseArgument(arguments[0], "RECORD-JSON");
    Json::Value jStored;
    table.api.setErrMsg("");
    if (0 > table.api.recCreate(jRecord, jStored)) fail(table, nameOf(table, jRecord));
    print(jStored);
    return 0;
}

// Inserts or replaces. Unlike create, it takes the record as it is: no defaults, no type check.
int save(Table& table, const Arguments& arguments)
{
    Json::Value jRecord = parseArgument(arguments[0], "RECORD-JSON");
    table.api.setErrMsg("");
    if (0 > table.api.recSave(jRecord, false)) fail(table, nameOf(table, jRecord));
    print(jRecord);
    return 0;
}

// A bar on standard error, where that is a terminal.
class Progress {
public:
    explicit Progress(unsigned uTotal) : uTotal_(uTotal), blShown_(0 < uTotal && 1 == isatty(2)) {}
    ~Progress()
    {
        if (blShown_) std::fputc('\n', stderr);
    }
    Progress(const Progress&) = delete;
    Progress& operator=(const Progress&) = delete;

    void show(unsigned uDone)
    {
        const int iPercent = static_cast<int>(100ULL * uDone / uTotal_);
        if (!blShown_ || iPercent == iPercent_) return;
        iPercent_ = iPercent;
        const std::string strBar(static_cast<std::size_t>(iPercent / 2), '#');
        std::fprintf(stderr, "\r[%-50s] %3d %% of %u", strBar.c_str(), iPercent, uTotal_);
        std::fflush(stderr);
    }

private:
    unsigned uTotal_;
    bool blShown_;
    int iPercent_ = -1;
};

Json::Value readArray(const Arguments& arguments)
{
    const std::string& strPath = arguments[0];
    Json::Value jTop = readFile(strPath);
    if (1 == arguments.size()) {
        if (jTop.isArray()) return jTop;
        throw std::runtime_error(strPath + ": not an array, KEY has to name the member that is");
    }
    const std::string& strKey = arguments[1];
    if (jTop.isObject() && jTop[strKey].isArray()) return jTop[strKey];
    throw std::runtime_error(strPath + ": no array under " + toText(strKey));
}

void runSql(Table& table, const char* szSql)
{
    table.api.setErrMsg("");
    if (0 > table.api.runSqlEx(szSql)) fail(table, szSql);
}

void createAll(Table& table, Json::Value& jArray)
{
    Progress progress(jArray.size());
    Json::Value jStored;
    for (Json::ArrayIndex i = 0; i < jArray.size(); ++i) {
        table.api.setErrMsg("");
        if (0 > table.api.recCreate(jArray[i], jStored)) fail(table, nameOf(table, jArray[i]));
        progress.show(i + 1);
    }
}

// All records or none. The transaction is the host's: the library knows none. IMMEDIATE takes the
// write lock at once, so that no record meets a database that somebody else has locked meanwhile.
int import(Table& table, const Arguments& arguments)
{
    Json::Value jArray = readArray(arguments);
    runSql(table, "begin immediate");
    try {
        createAll(table, jArray);
        runSql(table, "commit");
    } catch (...) {
        // It may fail where SQLite has rolled back already, and closing the database does it too.
        table.api.runSqlEx("rollback");
        throw;
    }
    Json::Value jResult;
    jResult["imported"] = jArray.size();
    print(jResult);
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
        std::cerr << "  " << command.szName << ' ' << command.szArguments << '\n';
    return 2;
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

    Table table{api, jTable["key"].asString()};
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
        return 1;
    }
}
