// SPDX-License-Identifier: MIT
// The time helpers. No test looks at the clock or the time zone of the machine.

#include "support/database.h"
#include "support/time_zone.h"

#include <cerrno>
#include <climits>
#include <clocale>
#include <cstdlib>
#include <ctime>

namespace {

using VORN_JSON_DB::convert2ReadableTime;
using VORN_JSON_DB::getTimeAfterNow;

constexpr int kGmt = 3;
constexpr int kLocal = 4;
constexpr int kUtc = 5;

class TimeText : public HostTest {
protected:
    // A conversion that succeeds.
    std::string converted(long lTime, int iType)
    {
        std::string strOut = "replaced";
        EXPECT_EQ(0, convert2ReadableTime(lTime, strOut, iType)) << lTime << ", " << iType;
        EXPECT_EQ(Lines(), takeLog());
        return strOut;
    }

    // One that fails.
    void expectFailure(long lTime, int iType, const Lines& lines)
    {
        SCOPED_TRACE(std::to_string(lTime) + ", " + std::to_string(iType));
        std::string strOut = "kept";
        EXPECT_EQ(-1, convert2ReadableTime(lTime, strOut, iType));
        EXPECT_EQ("kept", strOut);
        EXPECT_EQ(lines, takeLog());
    }
};

const std::string kNoUtc = utilFailed("NULL == gmtime_r(&ullTimeStamp, &sTime)");
const std::string kNoLocal = utilFailed("NULL == localtime_r(&ullTimeStamp, &sTime)");
const std::string kNoGmtText =
    utilFailed(R"(0 == strftime(szTime, sizeof(szTime), "%a, %d %b %Y %T GMT", &sTime))");
const std::string kNoNumericText =
    utilFailed(R"(0 == strftime(szTime, sizeof(szTime), "%Y-%m-%d %H:%M:%S", &sTime))");
const std::string kNoConversion = utilFailed("0 > convert2ReadableTime(now, strOut, iType)");

constexpr bool kEveryLongIsInTheCalendar = 8 > sizeof(long);
const char* const kNoTimeBeyond = "a long of 32 bits holds no time beyond the calendar";

std::string badType(int iType)
{
    return "E util: bad iType value=" + std::to_string(iType);
}

TEST_F(TimeText, Utc)
{
    struct Case {
        long long iTime;
        const char* szGmt;
        const char* szNumeric;
    };
    const TimeZone zone("AAA-5:30");
    for (const Case& row : {
             Case{0, "Thu, 01 Jan 1970 00:00:00 GMT", "1970-01-01 00:00:00"},
             Case{-1, "Wed, 31 Dec 1969 23:59:59 GMT", "1969-12-31 23:59:59"},
             Case{951782399, "Mon, 28 Feb 2000 23:59:59 GMT", "2000-02-28 23:59:59"},
             Case{951782400, "Tue, 29 Feb 2000 00:00:00 GMT", "2000-02-29 00:00:00"},
             Case{1690000000, "Sat, 22 Jul 2023 04:26:40 GMT", "2023-07-22 04:26:40"},
             Case{1700000000, "Tue, 14 Nov 2023 22:13:20 GMT", "2023-11-14 22:13:20"},
             Case{2147483648, "Tue, 19 Jan 2038 03:14:08 GMT", "2038-01-19 03:14:08"},
             Case{-2147483649, "Fri, 13 Dec 1901 20:45:51 GMT", "1901-12-13 20:45:51"},
             Case{253402300799, "Fri, 31 Dec 9999 23:59:59 GMT", "9999-12-31 23:59:59"},
             Case{253402300800, "Sat, 01 Jan 10000 00:00:00 GMT", "10000-01-01 00:00:00"},
         }) {
        // A time that the system's long cannot hold cannot be asked for.
        if (!isLong(row.iTime)) continue;
        EXPECT_EQ(row.szGmt, converted(static_cast<long>(row.iTime), kGmt));
        EXPECT_EQ(row.szNumeric, converted(static_cast<long>(row.iTime), kUtc));
    }
}

TEST_F(TimeText, LocalTimeByTheZone)
{
    struct Case {
        const char* szZone;
        long lTime;
        const char* szGmt;
        const char* szNumeric;
    };
    for (const Case& row : {
             Case{"AAA-5:30", 0, "Thu, 01 Jan 1970 05:30:00 GMT", "1970-01-01 05:30:00"},
             Case{"BBB+3", 0, "Wed, 31 Dec 1969 21:00:00 GMT", "1969-12-31 21:00:00"},
             Case{"UTC0", 0, "Thu, 01 Jan 1970 00:00:00 GMT", "1970-01-01 00:00:00"},
             Case{"EST5EDT,M3.2.0,M11.1.0", 1700000000, "Tue, 14 Nov 2023 17:13:20 GMT",
                  "2023-11-14 17:13:20"},
             Case{"EST5EDT,M3.2.0,M11.1.0", 1690000000, "Sat, 22 Jul 2023 00:26:40 GMT",
                  "2023-07-22 00:26:40"},
         }) {
        SCOPED_TRACE(row.szZone);
        const TimeZone zone(row.szZone);
        // Kept: the letters GMT stand behind local time too.
        EXPECT_EQ(row.szGmt, converted(row.lTime, 2));
        EXPECT_EQ(row.szNumeric, converted(row.lTime, kLocal));
    }
}

// The host says when a changed zone counts: the library calls no tzset.
TEST_F(TimeText, AChangedZoneCountsAfterTzset)
{
    const TimeZone zone("AAA-5:30");
    setenv("TZ", "BBB+3", 1);
    EXPECT_EQ("1970-01-01 05:30:00", converted(0, kLocal));
    tzset();
    EXPECT_EQ("1969-12-31 21:00:00", converted(0, kLocal));
}

TEST_F(TimeText, EveryBitSet)
{
    const TimeZone zone("AAA-5:30");
    const char* szLocalGmt = "Thu, 01 Jan 1970 05:30:00 GMT";
    const char* szUtcGmt = "Thu, 01 Jan 1970 00:00:00 GMT";
    const char* szLocal = "1970-01-01 05:30:00";
    const char* szUtc = "1970-01-01 00:00:00";
    const char* const expected[] = {nullptr, nullptr, szLocalGmt, szUtcGmt,
                                    szLocal, szUtc,   szLocalGmt, szUtcGmt};
    // Only the three lowest bits are read, also of a negative number.
    for (int iHigh : {0, 8, 16, 64, 1 << 30, -8, INT_MIN})
        for (int iLow = 0; iLow < 8; ++iLow) {
            const int iType = iHigh + iLow;
            if (nullptr == expected[iLow])
                expectFailure(0, iType, {badType(iType)});
            else
                EXPECT_EQ(expected[iLow], converted(0, iType)) << iType;
        }
}

TEST_F(TimeText, BadTypesGoToStandardOutputWhereTheHostAsks)
{
    blLogToStdout = true;
    for (int iType : {0, 1, 8, 9, -8}) expectFailure(0, iType, {badType(iType)});
}

TEST_F(TimeText, NamesOfDaysAndMonths)
{
    EXPECT_STREQ("C", setlocale(LC_ALL, nullptr));
    const char* const days[] = {"Thu", "Fri", "Sat", "Sun", "Mon", "Tue", "Wed"};
    for (int i = 0; i < 14; ++i)
        EXPECT_EQ(days[i % 7], converted(86400L * i, kGmt).substr(0, 3)) << i;
    const char* const months[] = {"Jan", "Feb", "Mar", "Apr", "May", "Jun",
                                  "Jul", "Aug", "Sep", "Oct", "Nov", "Dec"};
    // 1970: 15 January and every 30.5 days.
    for (int i = 0; i < 12; ++i)
        EXPECT_EQ(months[i], converted(86400L * 14 + 2635200L * i, kGmt).substr(8, 3)) << i;
    // The locale of the host stays as it was.
    EXPECT_STREQ("C", setlocale(LC_ALL, nullptr));
}

TEST_F(TimeText, TimesBeyondTheCalendar)
{
    if (kEveryLongIsInTheCalendar) GTEST_SKIP() << kNoTimeBeyond;
    const TimeZone zone("UTC0");
    for (long lTime : {LONG_MAX, LONG_MIN, LONG_MAX - 1, LONG_MIN + 1}) {
        for (int iType : {kGmt, kUtc, 7, 11}) expectFailure(lTime, iType, {kNoUtc});
        for (int iType : {2, kLocal, 6, 12}) expectFailure(lTime, iType, {kNoLocal});
        // The conversion comes before the look at the layout.
        expectFailure(lTime, 1, {kNoUtc});
        expectFailure(lTime, 9, {kNoUtc});
        expectFailure(lTime, 0, {kNoLocal});
        expectFailure(lTime, 8, {kNoLocal});
    }
}

TEST_F(TimeText, TheFirstAndTheLastYearOfTheCalendar)
{
    if (kEveryLongIsInTheCalendar) GTEST_SKIP() << kNoTimeBeyond;
    const TimeZone zone("UTC0");
    const long lFirst = static_cast<long>(-67768040609740800LL);
    const long lLast = static_cast<long>(67768036191676799LL);
    const long lInt = static_cast<long>(67767976233532799LL);
    EXPECT_EQ("-2147481748-01-01 00:00:00", converted(lFirst, kUtc));
    EXPECT_EQ("2147483647-12-31 23:59:59", converted(lInt, kUtc));
    for (int iType : {kUtc, kLocal}) {
        const std::string strLast = converted(lLast, iType);
        EXPECT_EQ("-12-31 23:59:59", strLast.substr(strLast.size() - 15));
    }
    expectFailure(lLast + 1, kUtc, {kNoUtc});
    expectFailure(lLast + 1, kLocal, {kNoLocal});
}

TEST_F(TimeText, TheLineShowsTheErrnoOfTheConversion)
{
    if (kEveryLongIsInTheCalendar) GTEST_SKIP() << kNoTimeBeyond;
    std::string strOut;
    EXPECT_EQ(-1, convert2ReadableTime(LONG_MAX, strOut, kUtc));
    EXPECT_EQ(EOVERFLOW, errno);
    ASSERT_EQ(1U, doubles::state().log.size());
    EXPECT_EQ(EOVERFLOW, doubles::state().log[0].iErrno);
    EXPECT_EQ(Lines{kNoUtc}, takeLog());
    blLogToStdout = true;
    errno = ENOENT;
    expectFailure(0, 0, {badType(0)});
    EXPECT_EQ(ENOENT, errno);
}

TEST_F(TimeText, NoBrokenDownTime)
{
    doubles::state().blFailTime = true;
    for (bool blStdout : {false, true}) {
        blLogToStdout = blStdout;
        for (int iType : {1, 3, 5, 7, 9}) expectFailure(0, iType, {kNoUtc});
        for (int iType : {0, 2, 4, 6, 8}) expectFailure(0, iType, {kNoLocal});
    }
}

TEST_F(TimeText, NoText)
{
    doubles::state().blFailStrftime = true;
    for (bool blStdout : {false, true}) {
        blLogToStdout = blStdout;
        for (int iType : {2, 3, 6, 7}) expectFailure(0, iType, {kNoGmtText});
        for (int iType : {4, 5, 12, 13}) expectFailure(0, iType, {kNoNumericText});
        for (int iType : {0, 1, 8}) expectFailure(0, iType, {badType(iType)});
    }
}

// The time that a host got from the C library stays as it was.
TEST_F(TimeText, UsesNoStaticBuffer)
{
    const TimeZone zone("AAA-5:30");
    const time_t lOther = 1700000000;
    const struct tm* pStatic = gmtime(&lOther);
    ASSERT_EQ(22, pStatic->tm_hour);
    converted(0, kGmt);
    converted(0, kLocal);
    EXPECT_EQ(22, pStatic->tm_hour);
    EXPECT_EQ(123, pStatic->tm_year);
}

class TimeAfterNow : public TimeText {
protected:
    // The text form where it fails.
    void expectTextFailure(int iOffset, int iType, const std::string& strInner)
    {
        std::string strOut = "kept";
        EXPECT_EQ(-1, getTimeAfterNow(iOffset, strOut, iType)) << strInner;
        EXPECT_EQ("kept", strOut);
        EXPECT_EQ((Lines{strInner, kNoConversion}), takeLog());
    }
};

TEST_F(TimeAfterNow, InSeconds)
{
    struct Case {
        long lNow;
        int iOffset;
        long long iSum;
    };
    for (const Case& row :
         {Case{1000, 0, 1000}, Case{1000, 3600, 4600}, Case{1000, -3600, -2600}, Case{0, 1, 1},
          Case{2147483647, 1, 2147483648}, Case{1700000000, INT_MAX, 3847483647},
          Case{1700000000, INT_MIN, -447483648}, Case{LONG_MAX, -1, LONG_MAX - 1LL}}) {
        doubles::state().now = row.lNow;
        long lOut = 42;
        EXPECT_EQ(0, getTimeAfterNow(row.iOffset, lOut));
        EXPECT_EQ(static_cast<long>(row.iSum), lOut);
    }
    EXPECT_EQ(Lines(), takeLog());
}

TEST_F(TimeAfterNow, WrapsBeyondALong)
{
    long lOut = 42;
    doubles::state().now = LONG_MAX;
    EXPECT_EQ(0, getTimeAfterNow(1, lOut));
    EXPECT_EQ(LONG_MIN, lOut);
    doubles::state().now = LONG_MIN;
    EXPECT_EQ(0, getTimeAfterNow(-1, lOut));
    EXPECT_EQ(LONG_MAX, lOut);
    EXPECT_EQ(Lines(), takeLog());
}

// Kept: a clock that fails counts as the second before the epoch.
TEST_F(TimeAfterNow, DoesNotLookWhetherTheClockFails)
{
    doubles::state().blNoClock = true;
    long lOut = 42;
    EXPECT_EQ(0, getTimeAfterNow(10, lOut));
    EXPECT_EQ(9, lOut);
    std::string strOut;
    EXPECT_EQ(0, getTimeAfterNow(0, strOut, kUtc));
    EXPECT_EQ("1969-12-31 23:59:59", strOut);
    EXPECT_EQ(Lines(), takeLog());
}

TEST_F(TimeAfterNow, AsText)
{
    const TimeZone zone("AAA-5:30");
    doubles::state().now = 1700000000;
    struct Case {
        int iOffset;
        int iType;
        const char* szText;
    };
    for (const Case& row : {
             Case{0, kGmt, "Tue, 14 Nov 2023 22:13:20 GMT"},
             Case{3600, kGmt, "Tue, 14 Nov 2023 23:13:20 GMT"},
             Case{-3600, kUtc, "2023-11-14 21:13:20"},
             Case{0, kLocal, "2023-11-15 03:43:20"},
             Case{-86400, 2, "Tue, 14 Nov 2023 03:43:20 GMT"},
             Case{0, 6, "Wed, 15 Nov 2023 03:43:20 GMT"},
             Case{0, 7, "Tue, 14 Nov 2023 22:13:20 GMT"},
         }) {
        std::string strOut = "replaced";
        EXPECT_EQ(0, getTimeAfterNow(row.iOffset, strOut, row.iType));
        EXPECT_EQ(row.szText, strOut);
        EXPECT_EQ(Lines(), takeLog());
    }
}

TEST_F(TimeAfterNow, AsTextLogsTheReasonAndItsOwnCheck)
{
    for (bool blStdout : {false, true}) {
        blLogToStdout = blStdout;
        for (int iType : {0, 1, 8, -8}) expectTextFailure(0, iType, badType(iType));
        doubles::state().now = 0;
        doubles::state().blFailTime = true;
        expectTextFailure(0, kGmt, kNoUtc);
        expectTextFailure(0, 2, kNoLocal);
        doubles::state().blFailTime = false;
        doubles::state().blFailStrftime = true;
        expectTextFailure(0, kGmt, kNoGmtText);
        expectTextFailure(0, kLocal, kNoNumericText);
        doubles::state().blFailStrftime = false;
        doubles::state().now = -1;
    }
}

TEST_F(TimeAfterNow, AsTextLogsATimeBeyondTheCalendar)
{
    if (kEveryLongIsInTheCalendar) GTEST_SKIP() << kNoTimeBeyond;
    doubles::state().now = LONG_MAX;
    for (bool blStdout : {false, true}) {
        blLogToStdout = blStdout;
        expectTextFailure(0, kUtc, kNoUtc);
        expectTextFailure(-1, 1, kNoUtc);
        expectTextFailure(-1, kLocal, kNoLocal);
    }
}

}  // namespace
