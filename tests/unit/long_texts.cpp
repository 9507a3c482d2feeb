// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// Value lists as long as SQLite's formatter allows, and one byte longer. Where the machine lacks
// the memory for SQLite's own limit, a double of sqlite3_mprintf has a lower one.

#include <VornJsonDbApi.h>
#include <gtest/gtest.h>
#include <sqlite3.h>

#include <unistd.h>
#include <cstdarg>
#include <cstdio>
#include <cstring>
#include <stdexcept>

bool blLogToStdout = false;
bool blDebugOutput = false;

namespace {

// 8 GiB.
const bool blHasMemory =
    4 < sizeof(void*) && 8 <= sysconf(_SC_PHYS_PAGES) / ((1L << 30) / sysconf(_SC_PAGESIZE));

// How often SQLite has formatted.
std::size_t nFormatted = 0;

// The shortest text that is too long.
const std::size_t nLimit = blHasMemory ? 1'000'000'000 : 510'000'000;

}  // namespace

extern "C" char* sqlite3_mprintf(const char* szFormat, ...)
{
    ++nFormatted;
    va_list arguments;
    va_start(arguments, szFormat);
    char* szText = sqlite3_vmprintf(szFormat, arguments);
    va_end(arguments);
    if (blHasMemory || nullptr == szText || strlen(szText) < nLimit) return szText;
    sqlite3_free(szText);
    return nullptr;
}

namespace {

// The result for a statement to which the value 7 is appended; -2 for std::logic_error.
int expand(std::string& strSql)
{
    sqlite3* pDb = nullptr;
    sqlite3_open(":memory:", &pDb);
    std::string strName = "t";
    std::string strCreate = "create table t (n)";
    Json::Value jDefinition;
    jDefinition["t"]["member"]["n"]["cpptype"] = "int";
    Json::Value jRecord;
    jRecord["n"] = 7;
    int iResult = -2;
    nFormatted = 0;
    try {
        iResult = VornJsonDbApi(pDb, strName, jDefinition, strCreate)
                      .SqlExpandMemberSymbol(strSql, jRecord);
    } catch (const std::logic_error&) {
    }
    sqlite3_close(pDb);
    return iResult;
}

TEST(LongTexts, AreWrittenUpToTheLimitAndRefusedBeyondIt)
{
    if (!blHasMemory) printf("left out: texts of a gigabyte: they need 64 bits and 8 GiB\n");
    const struct {
        const char* szBefore;
        std::size_t nLetters;
        int iResult;
        const char* szAfter;
        const char* szEnd;
    } cases[] = {
        {"", nLimit - 2, 0, "", "7) "},
        {"(", nLimit - 2, -2, "(", ""},
        {"%%", nLimit - 3, 0, "%", "7) "},
        {"%%", nLimit - 2, -2, "%%", ""},
    };
    for (const auto& row : cases) {
        SCOPED_TRACE(std::string(row.szBefore) + " " + std::to_string(row.iResult));
        std::string strSql = std::string(row.szBefore).append(row.nLetters, 'x');
        EXPECT_EQ(row.iResult, expand(strSql));
        EXPECT_TRUE(std::string(row.szAfter).append(row.nLetters, 'x').append(row.szEnd) == strSql);
    }
}

TEST(LongTexts, AreRefusedBeforeTheirWideConversionsAreAllWritten)
{
    if (!blHasMemory) GTEST_SKIP() << "a text of a gigabyte needs 64 bits and 8 GiB";
    constexpr std::size_t kWidth = 4096;
    std::string strSql;
    for (std::size_t i = 0; i < 4 * nLimit / kWidth; ++i) strSql += "%4096d";
    const std::string strBefore = strSql;
    EXPECT_EQ(-2, expand(strSql));
    EXPECT_TRUE(strBefore == strSql);
    EXPECT_GT(3 * nLimit / kWidth, nFormatted);
}

}  // namespace
