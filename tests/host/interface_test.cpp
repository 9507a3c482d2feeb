// SPDX-License-Identifier: MIT
// What a host compiles and links against.

#include "support/database.h"

#include <algorithm>
#include <cstdio>
#include <set>
#include <type_traits>

namespace {

TEST(Interface, OfAHandleHasItsSizeAndIsNotCopied)
{
    // Hosts place handles in their own objects.
    constexpr std::size_t kSize = 8 == sizeof(void*) ? 216 : 148;
    static_assert(kSize == sizeof(VornJsonDbApi));
    static_assert(sizeof(void*) == alignof(VornJsonDbApi));
    static_assert(!std::is_copy_constructible_v<VornJsonDbApi>);
    static_assert(!std::is_copy_assignable_v<VornJsonDbApi>);
    static_assert(!std::is_move_constructible_v<VornJsonDbApi>);
    static_assert(!std::is_move_assignable_v<VornJsonDbApi>);
    static_assert(!std::is_polymorphic_v<VornJsonDbApi>);
    static_assert(
        std::is_constructible_v<VornJsonDbApi, sqlite3*, std::string&, Json::Value&, std::string&>);
    EXPECT_EQ(kSize, sizeof(VornJsonDbApi));
}

TEST(Interface, HasTheseTypes)
{
    using Api = VornJsonDbApi;
    using Callback = int (*)(void*, int, char**, char**);
    static_assert(std::is_same_v<int (Api::*)(), decltype(&Api::tableCreate)>);
    static_assert(std::is_same_v<void (Api::*)(std::string), decltype(&Api::setErrMsg)>);
    static_assert(std::is_same_v<std::string (Api::*)(), decltype(&Api::getErrMsg)>);
    static_assert(
        std::is_same_v<int (Api::*)(std::string, Callback, void*), decltype(&Api::runSqlEx)>);
    static_assert(std::is_same_v<int (Api::*)(std::string&, Json::Value*),
                                 decltype(&Api::SqlExpandMemberName)>);
    static_assert(std::is_same_v<int (Api::*)(std::string&, Json::Value&),
                                 decltype(&Api::SqlExpandMemberSymbol)>);
    static_assert(
        std::is_same_v<int (Api::*)(Json::Value&, bool), decltype(&Api::fillDefaultValue)>);
    static_assert(std::is_same_v<int (Api::*)(Json::Value&), decltype(&Api::checkJsonType)>);
    static_assert(std::is_same_v<int (Api::*)(Json::Value&, bool), decltype(&Api::recSave)>);
    static_assert(
        std::is_same_v<int (Api::*)(Json::Value&, Json::Value&), decltype(&Api::recCreate)>);
    static_assert(std::is_same_v<Json::Value& (*)(Json::Value&, std::string&),
                                 decltype(&VORN_JSON_DB::recType)>);
    static_assert(std::is_same_v<bool, decltype(blLogToStdout)>);
    static_assert(std::is_same_v<bool, decltype(blDebugOutput)>);
    // Compiled into the hosts, so scripts/dev/abi does not see them.
    static_assert(0 == VORN_SQL_WHERE_TYPE_OR);
    static_assert(1 == VORN_SQL_WHERE_TYPE_AND);
    static_assert(2 == VORN_SQL_WHERE_TYPE_COMMA);
}

class Defaults : public TableTest {};

TEST_F(Defaults, StandForCallbackArgumentAndRecord)
{
    Table table(database_, R"({"a":{"cpptype":"int"},"b":{"cpptype":"int"}})", "a, b");
    EXPECT_EQ(1, table.api.runSqlEx("insert into " + table.strName + " values(1,2)"));
    EXPECT_EQ(0, table.api.runSqlEx("select 1", [](void* arg, int, char**, char**) {
        return nullptr == arg ? 0 : 1;
    }));
    std::string strNames;
    EXPECT_EQ(0, table.api.SqlExpandMemberName(strNames));
    EXPECT_EQ("a,b", strNames);
}

// The dynamic symbols of the library, one "T name" or "U name" each, versions cut off.
std::set<std::string> symbols(const std::string& strOptions)
{
    std::set<std::string> found;
    FILE* pPipe = popen((VORN_NM " -DC -P " + strOptions + " " VORN_LIBRARY).c_str(), "r");
    if (nullptr == pPipe) {
        ADD_FAILURE() << "cannot run nm";
        return found;
    }
    std::string strAll;
    char buffer[4096];
    for (std::size_t n; 0 < (n = fread(buffer, 1, sizeof(buffer), pPipe));)
        strAll.append(buffer, n);
    EXPECT_EQ(0, pclose(pPipe));
    for (std::size_t n = 0, nEnd; std::string::npos != (nEnd = strAll.find('\n', n)); n = nEnd + 1)
        found.insert(strAll.substr(n, std::min(nEnd, strAll.find_first_of("@(", n)) - n));
    return found;
}

std::string nameOf(const std::string& strSymbol)
{
    return strSymbol.substr(0, std::min(strSymbol.find_first_of(" ["), strSymbol.size()));
}

TEST(Symbols, DefinedAreTheInterfaceAlone)
{
    std::set<std::string> names;
    for (const std::string& strSymbol : symbols("--defined-only")) names.insert(nameOf(strSymbol));
    EXPECT_EQ((std::set<std::string>{"VORN_JSON_DB::convert2ReadableTime",
                                     "VORN_JSON_DB::getTimeAfterNow",
                                     "VORN_JSON_DB::jsonCopyMember",
                                     "VORN_JSON_DB::recType",
                                     "VornJsonDbApi::SqlExpandMemberList",
                                     "VornJsonDbApi::SqlExpandMemberName",
                                     "VornJsonDbApi::SqlExpandMemberSymbol",
                                     "VornJsonDbApi::SqlFilterConditionFromJson",
                                     "VornJsonDbApi::SqlMakeByListField",
                                     "VornJsonDbApi::SqlMakeByMatchField",
                                     "VornJsonDbApi::VectorParamToJson",
                                     "VornJsonDbApi::VornJsonDbApi",
                                     "VornJsonDbApi::checkJsonType",
                                     "VornJsonDbApi::fillDefaultValue",
                                     "VornJsonDbApi::getErrMsg",
                                     "VornJsonDbApi::recCreate",
                                     "VornJsonDbApi::recDelete",
                                     "VornJsonDbApi::recDeleteAll",
                                     "VornJsonDbApi::recDeleteByArray",
                                     "VornJsonDbApi::recDeleteByName",
                                     "VornJsonDbApi::recGetOne",
                                     "VornJsonDbApi::recList",
                                     "VornJsonDbApi::recSave",
                                     "VornJsonDbApi::recUpdateByFilter",
                                     "VornJsonDbApi::recUpdateByWhere",
                                     "VornJsonDbApi::runSqlEx",
                                     "VornJsonDbApi::setErrMsg",
                                     "VornJsonDbApi::tableCreate",
                                     "VornJsonDbApi::~VornJsonDbApi"}),
              names);
}

TEST(Symbols, UndefinedAreTheFlagsAndTheDoubledCalls)
{
    std::set<std::string> names;
    for (const std::string& strSymbol : symbols("--undefined-only"))
        names.insert(nameOf(strSymbol));
    for (const char* szName : {"blLogToStdout", "blDebugOutput", "usleep", "getpid", "sqlite3_exec",
                               "sqlite3_changes", "sqlite3_mprintf"})
        EXPECT_EQ(1U, names.count(szName)) << szName;
    // With _FORTIFY_SOURCE they have the second name.
    EXPECT_EQ(1U, names.count("syslog") + names.count("__syslog_chk"));
    EXPECT_EQ(1U, names.count("printf") + names.count("__printf_chk"));
    if (VORN_COVERAGE) GTEST_SKIP() << "the counters of a coverage build write files themselves";
    for (const char* szName :
         {"vsyslog", "vprintf", "puts", "putchar", "fputs", "fwrite", "fflush", "write", "fprintf",
          "std::cout", "std::cerr", "sqlite3_open", "sqlite3_close", "setlocale"})
        EXPECT_EQ(0U, names.count(szName)) << szName;
}

}  // namespace
