// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// docs/limits.md, definitions and the process: names, ids, threads, plugins, the reader.

#include "docs/limits_page.h"
#include "support/records.h"

#include <json/reader.h>

#include <malloc.h>
#include <cstdio>
#include <cstring>
#include <functional>
#include <locale>
#include <mutex>
#include <sstream>
#include <thread>
#include <utility>

TEST_F(Limits, NamesAreNotQuoted)
{
    const std::string strColumns = R"(id integer primary key, "group" text, team text)";
    Table keyword(database_, example(0), strColumns);
    EXPECT_EQ("-1", created(keyword.api, R"({"group":"a","id":1})"));
    EXPECT_NE(std::string::npos, takeLog().at(0).find(R"(error=near "group": syntax error)"));

    Table quotedMember(database_, example(1), strColumns);
    EXPECT_EQ("-1", created(quotedMember.api, R"({"\"group\"":"a","id":1})"));
    EXPECT_EQ(failed("!jType.isMember(strName)"), takeLog().at(0));
    EXPECT_EQ("a", database_.value(R"(select "group" from )" + quotedMember.strName));
    EXPECT_EQ("-1", listed(quotedMember.api));
    takeLog();

    Table quotedTable(database_, R"("order")", example(2), "id integer primary key, team text");
    const std::string strRecord = R"({"id":1,"team":"a"})";
    EXPECT_EQ(strRecord, created(quotedTable.api, strRecord));
    EXPECT_EQ("[" + strRecord + "]", listed(quotedTable.api));
    EXPECT_EQ(1, quotedTable.api.recDeleteAll());
    EXPECT_EQ(R"(DELETE FROM "order" ;)", takeStatements().back());
}

TEST_F(Limits, IntIdEndsAt2147483647)
{
    const std::string strFirst = R"({"id":2147483647,"text":"a"})";
    Table small(database_, example(0), "id integer primary key, text text");
    EXPECT_EQ(strFirst, created(small.api, strFirst));
    EXPECT_EQ(R"({"id":2147483647,"text":"b"})", created(small.api, R"({"text":"b"})"));
    EXPECT_EQ((Rows{{"2147483647", "a"}, {"2147483648", "b"}}),
              database_.rows("select * from " + small.strName));
    // Asking for the second record by its own id finds the first.
    EXPECT_EQ(strFirst, found(small.api, R"({"id":2147483647})"));

    // The same table under a name with a definition of its own.
    database_.run("alter table " + small.strName + " rename to large" + small.strName);
    Table large(database_, "large" + small.strName, example(1), "id integer");
    EXPECT_EQ("[" + strFirst + R"(,{"id":2147483648,"text":"b"}])", listed(large.api));
    const std::string strLast = R"({"id":9223372036854775807,"text":"c"})";
    EXPECT_EQ(strLast, created(large.api, strLast));
}

TEST_F(Limits, Threads)
{
    table_.create(R"({"id":1,"text":"x"})");
    table_.create(R"({"id":2,"text":"x"})");
    Table other(database_, R"({"name":{"cpptype":"string"}})", "name text");
    const std::string strOther = text(other.create(R"({"name":"y"})"));
    const std::string strStored = stored(1);

    // A call within a call: the rows after it are looked up in the members of the other table.
    const std::function<void()> calls[] = {
        [&] { EXPECT_EQ("[" + strOther + "]", listed(other.api)); },
        [&] { VornJsonDbApi(database_.get(), other.strName, other.jDefinition, other.strCreate); },
    };
    for (std::function<void()> call : calls) {
        const auto nested = [](sqlite3_context* pContext, int, sqlite3_value**) {
            (*static_cast<std::function<void()>*>(sqlite3_user_data(pContext)))();
            sqlite3_result_int(pContext, 1);
        };
        EXPECT_EQ(SQLITE_OK, sqlite3_create_function(database_.get(), "nested", 0, SQLITE_UTF8,
                                                     &call, nested, nullptr, nullptr));
        Json::Value jRequest = json(R"x({"vornSqlWhereFilter":"id = 1 or nested()"})x");
        Json::Value jRecords;
        EXPECT_EQ(-1, api_.recList(jRequest, jRecords));
        EXPECT_EQ("[" + strStored + "]", text(jRecords));
        EXPECT_EQ(failed("!jType.isMember(strName)"), takeLog().at(0));
    }
    database_.run("delete from " + table_.strName + " where id = 2");

    // Two threads that share a connection, with one lock around every call.
    std::mutex connectionMutex;
    const auto listMany = [&connectionMutex](VornJsonDbApi& task, const std::string& strExpected) {
        for (int i = 0; i < 200; ++i) {
            Json::Value jRequest;
            Json::Value jRecords;
#include "limits/Threads.inc"
            EXPECT_EQ("[" + strExpected + "]", text(jRecords));
        }
    };
    std::thread thread(listMany, std::ref(other.api), strOther);
    listMany(api_, strStored);
    thread.join();

    // A connection for each, even without SQLite's own lock: no lock at all.
    const auto listAlone = [this] {
        const int iFlags = SQLITE_OPEN_READWRITE | SQLITE_OPEN_CREATE | SQLITE_OPEN_NOMUTEX;
        sqlite3* pDb = nullptr;
        EXPECT_EQ(SQLITE_OK, sqlite3_open_v2(":memory:", &pDb, iFlags, nullptr));
        VornJsonDbApi api(pDb, table_.strName, table_.jDefinition, table_.strCreate);
        const std::string strOwn = created(api, R"({"id":7,"text":"own"})");
        for (int i = 0; i < 200; ++i) EXPECT_EQ("[" + strOwn + "]", listed(api));
        EXPECT_EQ(SQLITE_OK, sqlite3_close(pDb));
    };
    std::thread first(listAlone);
    listAlone();
    first.join();

    // A lock on a table of a shared cache is not waited for.
    const std::string strShared = "file:" + freshName() + "?mode=memory&cache=shared";
    Database writer(strShared);
    Database reader(strShared);
    const char szMembers[] = R"({"id":{"cpptype":"int"}})";
    Table written(writer, szMembers, "id integer");
    Table read(reader, written.strName, szMembers, "id integer");
    writer.run("begin immediate; insert into " + written.strName + " values (1)");
    takeLog();
    EXPECT_EQ("-1", listed(read.api));
    EXPECT_EQ(runFailed("database table is locked: " + written.strName,
                        "SELECT id FROM " + written.strName + " ;"),
              takeLog().at(0));
    writer.run("rollback");
}

TEST_F(Limits, FirstDefinitionWins)
{
    const std::string strSecond = R"({"id":{"cpptype":"int"},"zone":{"cpptype":"string"}})";
    const std::string strRecord = R"({"id":1,"zone":"north"})";
    Database database;
    database.run("create table " + table_.strName + " (id integer primary key, zone text)");
    EXPECT_EQ("", ids());  // reads the first definition
    Table second(database, table_.strName, strSecond, "id integer");
    EXPECT_EQ("-1", created(second.api, strRecord));
    EXPECT_EQ("0", database.value("select count(*) from " + table_.strName));
    takeLog();

    Table named(database, strSecond, "id integer primary key, zone text");
    EXPECT_EQ(strRecord, created(named.api, strRecord));

    Json::Value& jDefinition = second.jDefinition;
    std::string& strName = second.strName;
#include "limits/FirstDefinitionWins.inc"
    Table replaced(database, table_.strName, strSecond, "id integer");
    EXPECT_EQ(strRecord, created(replaced.api, strRecord));
}

TEST_F(Limits, ManyTables)
{
    constexpr std::size_t kTables = 100;
    std::string strName = "many" + table_.strName;
    const Json::Value jMembers = json(strMembers_);
    Json::Value jDefinition;
    const std::size_t nBefore = mallinfo2().uordblks;
    for (std::size_t i = 0; i < kTables; ++i) {
        std::string strEach = strName + std::to_string(i);
        jDefinition.clear();
        jDefinition[strEach]["member"] = jMembers;
        VORN_JSON_DB::recType(jDefinition, strEach);
    }
    // The allocator of a sanitizer or of valgrind is not counted.
    const std::size_t nUsed = (mallinfo2().uordblks - nBefore) / kTables;
    EXPECT_TRUE(100 > nUsed || (800 < nUsed && 3000 > nUsed)) << nUsed;

    // The host checks the definition before it makes a handle.
    const auto unknownTable = [](const std::string& strUnknown) { return strUnknown; };
    const auto unknown = [&]() -> std::string {
#include "limits/ManyTables.inc"
        return "";
    };
    EXPECT_EQ(strName, unknown());
    jDefinition[strName]["member"] = jMembers;
    EXPECT_EQ("", unknown());
}

namespace {

// The number of lines that the library logs in each step of two_plugins: first plugin, second,
// second sets true, second sets false, first is closed.
std::string linesOfTwoPlugins(const std::string& strCommand)
{
    FILE* pPipe = popen(strCommand.c_str(), "r");
    if (nullptr == pPipe) return "not run";
    std::string strSteps;
    int iLines = 0;
    for (char szLine[1000]; nullptr != fgets(szLine, sizeof(szLine), pPipe);) {
        iLines += nullptr != strstr(szLine, "run sql failed");
        if (szLine == strstr(szLine, "step: "))
            strSteps += std::to_string(std::exchange(iLines, 0));
    }
    EXPECT_EQ(0, pclose(pPipe)) << strCommand;
    return strSteps;
}

}  // namespace

TEST_F(Limits, FirstPluginsFlagsWin)
{
    const std::string strStdoutFirst = " " VORN_STDOUT_PLUGIN " " VORN_SYSLOG_PLUGIN;
    const std::string strSyslogFirst = " " VORN_SYSLOG_PLUGIN " " VORN_STDOUT_PLUGIN;
    EXPECT_EQ("11111", linesOfTwoPlugins(VORN_TWO_PLUGINS " local" + strStdoutFirst));
    EXPECT_EQ("00000", linesOfTwoPlugins(VORN_TWO_PLUGINS " local" + strSyslogFirst));
    EXPECT_EQ("11100", linesOfTwoPlugins(VORN_TWO_PLUGINS " global" + strStdoutFirst));
    EXPECT_EQ("00100", linesOfTwoPlugins(VORN_TWO_PLUGINS " global" + strSyslogFirst));
    // The host's own flags win; they start as false.
    EXPECT_EQ("00100", linesOfTwoPlugins(VORN_TWO_PLUGINS_OF_A_HOST " local" + strStdoutFirst));
    EXPECT_EQ("00100", linesOfTwoPlugins(VORN_TWO_PLUGINS_OF_A_HOST " global" + strSyslogFirst));
}

TEST_F(Limits, DeepJsonReadsBackAsNull)
{
    const std::string strDeep = std::string(1001, '[') + std::string(1001, ']');
    // As a host reads a document that it keeps as text.
    Json::CharReaderBuilder builder;
    builder["stackLimit"] = 10000;
    Json::Value jRecord;
    std::istringstream document(strDeep);
    EXPECT_TRUE(Json::parseFromStream(builder, document, &jRecord["tags"], nullptr));
    jRecord["text"] = strDeep;
    Json::Value jStored;
    EXPECT_EQ(0, api_.recCreate(jRecord, jStored));
    EXPECT_TRUE(jStored["tags"].isNull());
    EXPECT_EQ(strDeep, jStored["text"].asString());
    EXPECT_EQ(strDeep, database_.value("select tags from " + table_.strName));
}

namespace {

struct DecimalComma : std::numpunct<char> {
    char do_decimal_point() const override { return ','; }
    char do_thousands_sep() const override { return '.'; }
    std::string do_grouping() const override { return "\3"; }
};

}  // namespace

TEST_F(Limits, GlobalLocaleWithADecimalComma)
{
    Table table(database_, R"({"o":{"cpptype":"Json::objectValue"}})", "o text");
    const auto create = [&table](const Json::Value& jRecord) {
        Json::Value jSent = jRecord;
        Json::Value jStored;
        EXPECT_EQ(0, table.api.recCreate(jSent, jStored));
        return text(jStored);
    };
    const Json::Value jFraction = json(R"({"o":)" + example(0) + "}");
    const Json::Value jText = json(R"({"o":)" + example(1) + "}");
    const bool blByLocale = JSONCPP_VERSION_HEXA < 0x01090800;
    const std::locale before = std::locale::global(std::locale(std::locale(), new DecimalComma));
    EXPECT_EQ(blByLocale ? R"({"o":{"rate":null}})" : text(jFraction), create(jFraction));
    EXPECT_EQ(text(jText), create(jText));
    EXPECT_EQ(R"({"o":{"n":12345}})", create(json(R"({"o":{"n":12345}})")));
    EXPECT_EQ(Lines(), takeLog());
    std::locale::global(before);
    EXPECT_EQ(text(jFraction), create(jFraction));
    EXPECT_EQ(text(jFraction["o"]), database_.value("select o from " + table.strName + " limit 1"));
}
