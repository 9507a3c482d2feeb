// SPDX-License-Identifier: MIT
// The memory that a log line takes while it is composed.

#include "support/rows.h"

#include <malloc.h>
#include <cerrno>
#include <cstdarg>
#include <cstdio>

namespace {

using doubles::state;

// vasprintf: the next call fails; what it leaves in errno, 0 leaves errno alone.
bool blFailNextLine = false;
int iErrnoOfLine = 0;

}  // namespace

// What the library calls instead of the real one.
extern "C" __attribute__((format(printf, 2, 0))) int vasprintf(char** pszText, const char* szFormat,
                                                               va_list arguments) noexcept
{
    const int iErrno = errno;
    if (std::exchange(blFailNextLine, false)) return -1;
    va_list again;
    va_copy(again, arguments);
    const int iLength = vsnprintf(nullptr, 0, szFormat, again);
    va_end(again);
    errno = iErrno;
    *pszText = static_cast<char*>(malloc(static_cast<std::size_t>(iLength) + 1));
    if (nullptr == *pszText) return -1;
    vsnprintf(*pszText, static_cast<std::size_t>(iLength) + 1, szFormat, arguments);
    if (0 != iErrnoOfLine) errno = iErrnoOfLine;
    return iLength;
}

// With _FORTIFY_SOURCE it is this one.
extern "C" __attribute__((format(printf, 3, 0))) int __vasprintf_chk(char** pszText, int /*iFlag*/,
                                                                     const char* szFormat,
                                                                     va_list arguments) noexcept
{
    return vasprintf(pszText, szFormat, arguments);
}

namespace {

class LogMemory : public TableTest {
protected:
    Table table_{database_, R"({"a":{"cpptype":"string"}})", "a text"};
};

TEST_F(LogMemory, ThatIsLackingDropsTheLineAlone)
{
    const Lines lines = {failed("0 >= strSql.length()"),
                         plain("i=0,errno=?, run sql failed, error=Unknow Error!!, sql=")};
    EXPECT_EQ(-1, table_.api.runSqlEx(""));
    EXPECT_EQ(lines, takeLog());
    blFailNextLine = true;
    errno = ENOENT;
    EXPECT_EQ(-1, table_.api.runSqlEx(""));
    EXPECT_EQ(ENOENT, errno);
    EXPECT_FALSE(blFailNextLine);
    EXPECT_EQ(Lines{lines[1]}, takeLog());
}

TEST_F(LogMemory, LeavesTheErrnoOfTheCheckInTheLine)
{
    iErrnoOfLine = ENOTTY;
    for (int iErrno : {0, ENOENT}) {
        state().log.clear();
        errno = iErrno;
        EXPECT_EQ(-1, table_.api.runSqlEx(""));
        EXPECT_EQ(iErrno, errno);
        ASSERT_EQ(2U, state().log.size());
        for (const doubles::LogRecord& record : state().log) EXPECT_EQ(iErrno, record.iErrno);
    }
    iErrnoOfLine = 0;
}

std::size_t bytesInUse()
{
    const struct mallinfo2 info = mallinfo2();
    return info.uordblks + info.hblkhd;
}

// Under a sanitizer, which counts otherwise, its own leak check is the one that tells.
TEST_F(LogMemory, IsReleased)
{
    const std::string strLong(1000000, 'x');
    Json::Value jRecord;
    jRecord["a"] = strLong;
    const auto failOnce = [&] {
        std::string strNoFilter;
        EXPECT_EQ(-1, table_.api.recUpdateByWhere(jRecord, strNoFilter));
        EXPECT_EQ(2U, std::exchange(state().log, {}).size());
    };
    failOnce();
    const std::size_t nBefore = bytesInUse();
    for (int i = 0; i < 20; ++i) failOnce();
    EXPECT_GT(nBefore + 2 * strLong.size(), bytesInUse());
}

}  // namespace
