// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// What a host compiles and links against, beyond what abi/ and debian/libvornjsondb6.symbols check:
// they hold the exported functions, their types and, for 64 bits, the layout.

#include "support/database.h"

#include <cstdio>
#include <set>
#include <type_traits>

namespace {

// Hosts place handles in their own objects.
static_assert((8 == sizeof(void*) ? 216 : 148) == sizeof(VornJsonDbApi));
static_assert(!std::is_copy_constructible_v<VornJsonDbApi>);
static_assert(!std::is_copy_assignable_v<VornJsonDbApi>);
static_assert(!std::is_move_constructible_v<VornJsonDbApi>);
static_assert(!std::is_move_assignable_v<VornJsonDbApi>);
static_assert(std::is_same_v<bool, decltype(blLogToStdout)>);
static_assert(std::is_same_v<bool, decltype(blDebugOutput)>);
static_assert(0 == VORN_SQL_WHERE_TYPE_OR);
static_assert(1 == VORN_SQL_WHERE_TYPE_AND);
static_assert(2 == VORN_SQL_WHERE_TYPE_COMMA);

class Interface : public TableTest {};

TEST_F(Interface, HasDefaultsForCallbackArgumentRecordAndFlag)
{
    Table table(database_, R"({"a":{"cpptype":"int"},"b":{"cpptype":"int"}})", "a, b");
    EXPECT_EQ(1, table.api.runSqlEx("insert into " + table.strName + " values(1,2)"));
    EXPECT_EQ(0, table.api.runSqlEx("select 1", [](void* arg, int, char**, char**) {
        return nullptr == arg ? 0 : 1;
    }));
    std::string strNames;
    EXPECT_EQ(0, table.api.SqlExpandMemberName(strNames));
    EXPECT_EQ("a,b", strNames);
    Json::Value jNoCondition(Json::objectValue);
    EXPECT_EQ(-1, table.api.recDelete(jNoCondition));
}

TEST_F(Interface, LeavesTheFlagsAndTheReplaceableCallsToTheProgram)
{
    FILE* pPipe = popen(VORN_NM " -DCP --undefined-only " VORN_LIBRARY, "r");
    ASSERT_NE(nullptr, pPipe);
    std::set<std::string> names;
    char buffer[4096];
    while (nullptr != fgets(buffer, sizeof(buffer), pPipe)) {
        const std::string strLine = buffer;
        names.insert(strLine.substr(0, strLine.find_first_of("@([ ")));
    }
    EXPECT_EQ(0, pclose(pPipe));
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

// Of what is set aside for libraries that are loaded late.
TEST_F(Interface, TakesOnePointerOfThreadLocalStorage)
{
    FILE* pPipe = popen("readelf -lW " VORN_LIBRARY, "r");
    ASSERT_NE(nullptr, pPipe);
    std::size_t nBytes = 0;
    char buffer[4096];
    while (nullptr != fgets(buffer, sizeof(buffer), pPipe))
        sscanf(buffer, " TLS %*s %*s %*s %*s %zx", &nBytes);
    EXPECT_EQ(0, pclose(pPipe));
    EXPECT_EQ(sizeof(void*), nBytes);
}

}  // namespace
