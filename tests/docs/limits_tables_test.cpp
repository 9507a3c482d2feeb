// SPDX-License-Identifier: MIT
// docs/limits.md, definitions: names, an id that is too small, many tables, two plugins.

#include "support/limits.h"

#include <malloc.h>
#include <cstdio>
#include <cstdlib>

TEST_F(Limits, NamesAreNotQuoted)
{
    const std::string strColumns = R"(id integer primary key, "group" text, team text)";
    Json::Value jStored;

    Table keyword(database_, text(jExample(0)), strColumns);
    Json::Value jRecord = json(R"({"group":"a","id":1})");
    EXPECT_EQ(-1, keyword.api.recCreate(jRecord, jStored));
    EXPECT_NE(std::string::npos, takeLog().at(0).find(R"(error=near "group": syntax error)"));

    Table table(database_, R"("order")", text(jExample(2)), "id integer primary key, team text");
    EXPECT_EQ(R"({"id":1,"team":"a"})", text(table.create(R"({"id":1,"team":"a"})")));
    Json::Value jRequest;
    Json::Value jRecords;
    EXPECT_EQ(0, table.api.recList(jRequest, jRecords));
    EXPECT_EQ(R"([{"id":1,"team":"a"}])", text(jRecords));
    takeStatements();
    EXPECT_EQ(1, table.api.recDeleteAll());
    EXPECT_EQ(R"(DELETE FROM "order" ;)", takeStatements().at(0));

    Table quoted(database_, text(jExample(1)), strColumns);
    jRecord = json(R"({"\"group\"":"a","id":1})");
    EXPECT_EQ(-1, quoted.api.recCreate(jRecord, jStored));
    EXPECT_EQ(failed("!jType.isMember(strName)"), takeLog().at(0));
    EXPECT_EQ("a", database_.value(R"(select "group" from )" + quoted.strName));
    EXPECT_EQ(-1, quoted.api.recList(jRequest, jRecords));
    takeLog();
}

TEST_F(Limits, IntIdEndsAt2147483647)
{
    Table small(database_, text(jExample(0)), "id integer primary key, text text");
    EXPECT_EQ(2147483647, small.create(R"({"id":2147483647,"text":"a"})")["id"].asInt64());
    EXPECT_EQ(2147483647, small.create(R"({"text":"b"})")["id"].asInt64());
    EXPECT_EQ((Rows{{"2147483647", "a"}, {"2147483648", "b"}}),
              database_.rows("select * from " + small.strName));
    // The second record by its own id: the first one answers.
    Json::Value jRequest = json(R"({"id":2147483647})");
    Json::Value jRecord;
    EXPECT_EQ(1, small.api.recGetOne(jRequest, jRecord));
    EXPECT_EQ("a", jRecord["text"].asString());

    // The same table under a definition of its own name.
    database_.run("alter table " + small.strName + " rename to large" + small.strName);
    Table large(database_, "large" + small.strName, text(jExample(1)), "id integer");
    Json::Value jAll;
    Json::Value jRecords;
    EXPECT_EQ(0, large.api.recList(jAll, jRecords));
    EXPECT_EQ(R"([{"id":2147483647,"text":"a"},{"id":2147483648,"text":"b"}])", text(jRecords));
    EXPECT_EQ(INT64_MAX, large.create(R"({"id":9223372036854775807,"text":"c"})")["id"].asInt64());
}

namespace {

long bytesInUse()
{
    return static_cast<long>(mallinfo2().uordblks);
}

// Whether these bytes are counted: a sanitizer or valgrind puts another allocator in the place of
// the C library's.
bool areCounted()
{
    const long lBefore = bytesInUse();
    const std::vector<char> probe(10000);
    return probe.size() <= static_cast<std::size_t>(bytesInUse() - lBefore);
}

// In a process of its own, which ends: what the tables of the page's shape leave in memory and in
// the log.
void useManyTables(const Json::Value& jMembers)
{
    constexpr long kTables = 1000;
    const auto use = [&jMembers](std::string strName) {
        Json::Value jDefinition;
        jDefinition[strName]["member"] = jMembers;
        VORN_JSON_DB::recType(jDefinition, strName);
    };
    use("first");
    const long lBefore = bytesInUse();
    for (long i = 0; i < kTables; ++i) use("task" + std::to_string(i));
    const long lTable = (bytesInUse() - lBefore) / kTables;
    if (areCounted())
        EXPECT_TRUE(800 < lTable && 3000 > lTable) << lTable;
    else
        puts("The bytes of a table are not compared: another allocator is in use.");
    EXPECT_EQ(Lines(), takeLog());

    // A handle whose table the definition lacks.
    Database database;
    Json::Value jDefinition;
    jDefinition["task"]["member"] = jMembers;
    std::string strName = "taks";
    std::string strCreate = "create table taks (id integer)";
    VornJsonDbApi api(database.get(), strName, jDefinition, strCreate);
    Json::Value jRecord = json(R"({"text":"x"})");
    Json::Value jStored;
    EXPECT_EQ(-1, api.recCreate(jRecord, jStored));
    std::size_t nDumps = 0;
    for (const std::string& strLine : takeLog()) {
        if (0 != strLine.find(utilPlain("jType="))) continue;
        ++nDumps;
        EXPECT_LT(kTables * text(jMembers).size(), strLine.size());
    }
    EXPECT_EQ(4U, nDumps);
}

}  // namespace

TEST_F(Limits, ManyTables)
{
    GTEST_FLAG_SET(death_test_style, "threadsafe");
    const Json::Value jMembers = table_.jDefinition[table_.strName]["member"];
    const auto inAChild = [&jMembers] {
        useManyTables(jMembers);
        _Exit(testing::Test::HasFailure() ? 1 : 0);
    };
    EXPECT_EXIT(inAChild(), testing::ExitedWithCode(0), "");

    const auto unknownTable = [](const std::string& strName) { return strName; };
    const auto unknown = [&](const std::string& strName) -> std::string {
        const Json::Value& jDefinition = table_.jDefinition;
#include "limits/ManyTables.inc"
        return "";
    };
    EXPECT_EQ("taks", unknown("taks"));
    EXPECT_EQ("", unknown(table_.strName));
}

namespace {

// What two_plugins prints, each step with the number of lines that the library logged in it.
std::string linesOfTwoPlugins(const std::string& strProgram, const std::string& strArguments)
{
    FILE* pPipe = popen((strProgram + " " + strArguments).c_str(), "r");
    if (nullptr == pPipe) return "not run";
    std::string strSteps;
    int iLines = 0;
    char szLine[1000];
    while (nullptr != fgets(szLine, sizeof(szLine), pPipe)) {
        const std::string strLine = szLine;
        iLines += std::string::npos != strLine.find("run sql failed");
        if (0 != strLine.find("step: ")) continue;
        strSteps += strLine.substr(6, strLine.size() - 7) + ' ' + std::to_string(iLines) + ", ";
        iLines = 0;
    }
    EXPECT_EQ(0, pclose(pPipe)) << strArguments;
    return strSteps;
}

}  // namespace

TEST_F(Limits, FirstPluginsFlagsRule)
{
    const std::string strStdout = VORN_STDOUT_PLUGIN;
    const std::string strSyslog = VORN_SYSLOG_PLUGIN;
    const std::string strStdoutFirst = strStdout + " " + strSyslog;
    const std::string strSyslogFirst = strSyslog + " " + strStdout;
    const struct {
        const char* szProgram;
        std::string strArguments;
        const char* szLines;
    } cases[] = {
        {VORN_TWO_PLUGINS, "local " + strStdoutFirst,
         "first 1, second 1, second sets true 1, second sets false 1, first is closed 1, "},
        {VORN_TWO_PLUGINS, "local " + strSyslogFirst,
         "first 0, second 0, second sets true 0, second sets false 0, first is closed 0, "},
        {VORN_TWO_PLUGINS, "global " + strStdoutFirst,
         "first 1, second 1, second sets true 1, second sets false 0, first is closed 0, "},
        {VORN_TWO_PLUGINS, "global " + strSyslogFirst,
         "first 0, second 0, second sets true 1, second sets false 0, first is closed 0, "},
        // The program's flags, which it shows; they begin with false.
        {VORN_TWO_PLUGINS_OF_A_HOST, "local " + strStdoutFirst,
         "first 0, second 0, second sets true 1, second sets false 0, first is closed 0, "},
        {VORN_TWO_PLUGINS_OF_A_HOST, "global " + strSyslogFirst,
         "first 0, second 0, second sets true 1, second sets false 0, first is closed 0, "},
    };
    for (const auto& row : cases)
        EXPECT_EQ(row.szLines, linesOfTwoPlugins(row.szProgram, row.strArguments))
            << row.szProgram << ' ' << row.strArguments;
}
