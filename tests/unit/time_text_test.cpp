// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// The time helpers. No test depends on the machine's clock or time zone.

#include "support/database.h"

#include <cerrno>
#include <climits>
#include <cstdlib>
#include <ctime>
#include <optional>

namespace {

using doubles::state;
using VORN_JSON_DB::convert2ReadableTime;
using VORN_JSON_DB::getTimeAfterNow;

// Whether the system's long holds the time.
bool isLong(long long iTime)
{
    return LONG_MIN <= iTime && LONG_MAX >= iTime;
}

// A time zone for as long as the object lives.
class TimeZone {
public:
    explicit TimeZone(const char* szZone)
    {
        if (const char* szBefore = getenv("TZ")) before_ = szBefore;
        set(szZone);
    }
    ~TimeZone() { set(before_ ? before_->c_str() : nullptr); }
    TimeZone(const TimeZone&) = delete;
    TimeZone& operator=(const TimeZone&) = delete;

private:
    static void set(const char* szZone)
    {
        nullptr == szZone ? unsetenv("TZ") : setenv("TZ", szZone, 1);
        tzset();
    }

    std::optional<std::string> before_;
};

constexpr int kLocalGmt = 2, kGmt = 3, kLocal = 4, kUtc = 5;

// The first and the last second whose year, counted from 1900, is an int.
constexpr long long kFirst = -67768040609740800;
constexpr long long kLast = 67768036191676799;

const std::string kNoUtc = utilFailed("NULL == gmtime_r(&ullTimeStamp, &sTime)");
const std::string kNoLocal = utilFailed("NULL == localtime_r(&ullTimeStamp, &sTime)");
const std::string kNoGmtText =
    utilFailed(R"(0 == strftime(szTime, sizeof(szTime), "%a, %d %b %Y %T GMT", &sTime))");
const std::string kNoNumericText =
    utilFailed(R"(0 == strftime(szTime, sizeof(szTime), "%Y-%m-%d %H:%M:%S", &sTime))");
const std::string kNoConversion = utilFailed("0 > convert2ReadableTime(now, strOut, iType)");

std::string badType(int iType)
{
    return "E util: bad iType value=" + std::to_string(iType);
}

// The text of a call that succeeds; the log of one that fails, which leaves its output alone.
template <typename Call>
std::string endOf(Call call)
{
    std::string strOut = "kept";
    const int iResult = call(strOut);
    const Lines lines = takeLog();
    EXPECT_EQ(lines.empty() ? 0 : -1, iResult);
    EXPECT_EQ(lines.empty(), "kept" != strOut);
    if (!lines.empty()) strOut = lines[0];
    for (std::size_t i = 1; i < lines.size(); ++i) strOut += "\n" + lines[i];
    return strOut;
}

std::string afterNow(int iOffset, int iType)
{
    return endOf([&](std::string& strOut) { return getTimeAfterNow(iOffset, strOut, iType); });
}

// A time as text, which has to be the same text when it is the present time.
std::string converted(long long iTime, int iType)
{
    const long lTime = static_cast<long>(iTime);
    const std::string strEnd =
        endOf([&](std::string& strOut) { return convert2ReadableTime(lTime, strOut, iType); });
    const int iOffset = -1 == lTime ? 1 : 0;  // the double of the clock cannot show -1
    state().now = lTime - iOffset;
    EXPECT_EQ(0 == strEnd.find("E ") ? strEnd + "\n" + kNoConversion : strEnd,
              afterNow(iOffset, iType));
    return strEnd;
}

class TimeText : public HostTest {};

TEST_F(TimeText, ShowsUtcAndLocalTimeInBothLayouts)
{
    const char* szNewYork = "EST5EDT,M3.2.0,M11.1.0";
    const struct {
        const char* szZone;  // null for UTC
        long long iTime;
        const char* szGmt;
        const char* szNumeric;
    } cases[] = {
        {nullptr, 0, "Thu, 01 Jan 1970 00:00:00 GMT", "1970-01-01 00:00:00"},
        {nullptr, -1, "Wed, 31 Dec 1969 23:59:59 GMT", "1969-12-31 23:59:59"},
        {nullptr, 951782399, "Mon, 28 Feb 2000 23:59:59 GMT", "2000-02-28 23:59:59"},
        {nullptr, 951782400, "Tue, 29 Feb 2000 00:00:00 GMT", "2000-02-29 00:00:00"},
        {nullptr, 2147483648, "Tue, 19 Jan 2038 03:14:08 GMT", "2038-01-19 03:14:08"},
        {nullptr, -2147483649, "Fri, 13 Dec 1901 20:45:51 GMT", "1901-12-13 20:45:51"},
        {nullptr, 253402300799, "Fri, 31 Dec 9999 23:59:59 GMT", "9999-12-31 23:59:59"},
        {nullptr, 253402300800, "Sat, 01 Jan 10000 00:00:00 GMT", "10000-01-01 00:00:00"},
        {nullptr, kFirst, "Thu, 01 Jan -2147481748 00:00:00 GMT", "-2147481748-01-01 00:00:00"},
        {nullptr, 67767976233532799, "Tue, 31 Dec 2147483647 23:59:59 GMT",
         "2147483647-12-31 23:59:59"},
        {"AAA-5:30", 0, "Thu, 01 Jan 1970 05:30:00 GMT", "1970-01-01 05:30:00"},
        {"BBB+3", 0, "Wed, 31 Dec 1969 21:00:00 GMT", "1969-12-31 21:00:00"},
        {"UTC0", 0, "Thu, 01 Jan 1970 00:00:00 GMT", "1970-01-01 00:00:00"},
        {szNewYork, 1700000000, "Tue, 14 Nov 2023 17:13:20 GMT", "2023-11-14 17:13:20"},
        {szNewYork, 1690000000, "Sat, 22 Jul 2023 00:26:40 GMT", "2023-07-22 00:26:40"},
    };
    for (const auto& row : cases) {
        // A time that the system's long cannot hold cannot be asked for.
        if (!isLong(row.iTime)) continue;
        const bool blUtc = nullptr == row.szZone;
        const TimeZone zone(blUtc ? "AAA-5:30" : row.szZone);
        EXPECT_EQ(row.szGmt, converted(row.iTime, blUtc ? kGmt : kLocalGmt));
        EXPECT_EQ(row.szNumeric, converted(row.iTime, blUtc ? kUtc : kLocal));
    }
}

// The host decides when a changed zone takes effect: the library never calls tzset.
TEST_F(TimeText, FollowsAChangedZoneAfterTzset)
{
    const TimeZone zone("AAA-5:30");
    setenv("TZ", "BBB+3", 1);
    EXPECT_EQ("1970-01-01 05:30:00", converted(0, kLocal));
    tzset();
    EXPECT_EQ("1969-12-31 21:00:00", converted(0, kLocal));
}

// Kept: the letters GMT follow local time too.
TEST_F(TimeText, ReadsOnlyTheThreeLowestBits)
{
    const TimeZone zone("AAA-5:30");
    const std::string strLocalGmt = "Thu, 01 Jan 1970 05:30:00 GMT";
    const std::string strGmt = "Thu, 01 Jan 1970 00:00:00 GMT";
    const std::string strLocal = "1970-01-01 05:30:00";
    const std::string strUtc = "1970-01-01 00:00:00";
    errno = ENOENT;
    for (bool blStdout : {false, true}) {
        blLogToStdout = blStdout;
        for (int iHigh : {0, 8, 16, 64, 1 << 30, -8, INT_MIN}) {
            const std::string expected[] = {
                badType(iHigh), badType(iHigh + 1), strLocalGmt, strGmt, strLocal,
                strUtc,         strLocalGmt,        strGmt};
            for (int iLow = 0; iLow < 8; ++iLow)
                EXPECT_EQ(expected[iLow], converted(0, iHigh + iLow)) << iHigh + iLow;
        }
    }
    EXPECT_EQ(ENOENT, errno);
}

TEST_F(TimeText, CoversTheCalendarFromItsFirstSecondToItsLast)
{
    const TimeZone zone("UTC0");
    std::vector<long long> times = {LONG_MIN, LONG_MIN + 1, LONG_MAX - 1, LONG_MAX};
    for (int iNear : {-1, 0, 1}) {
        times.insert(times.end(), {kFirst + iNear, kLast + iNear});
        for (int iBit = 0; iBit < 62; ++iBit)
            times.insert(times.end(), {(1LL << iBit) - 1 + iNear, -(1LL << iBit) + iNear});
    }
    for (long long iTime : times)
        for (int iType : {0, 1, 2, 3, 4, 5, 6, 7, 12}) {
            if (!isLong(iTime)) continue;
            const bool blFits = kFirst <= iTime && kLast >= iTime;
            // The conversion comes before the check of the layout.
            const std::string strFailure = !blFits     ? (0 == iType % 2 ? kNoLocal : kNoUtc)
                                           : 2 > iType ? badType(iType)
                                                       : "";
            const std::string strEnd = converted(iTime, iType);
            EXPECT_EQ(strFailure, 0 == strEnd.find("E ") ? strEnd : "") << iTime << ", " << iType;
        }
}

TEST_F(TimeText, FailsWhenTheCLibraryFails)
{
    for (bool blStdout : {false, true}) {
        blLogToStdout = blStdout;
        state().blFailTime = true;
        for (int iType : {1, 3, 5, 7, 9}) EXPECT_EQ(kNoUtc, converted(0, iType));
        for (int iType : {0, 2, 4, 6, 8}) EXPECT_EQ(kNoLocal, converted(0, iType));
        state().blFailTime = false;
        state().blFailStrftime = true;
        for (int iType : {2, 3, 6, 7}) EXPECT_EQ(kNoGmtText, converted(0, iType));
        for (int iType : {4, 5, 12, 13}) EXPECT_EQ(kNoNumericText, converted(0, iType));
        for (int iType : {0, 1, 8}) EXPECT_EQ(badType(iType), converted(0, iType));
        state().blFailStrftime = false;
    }
}

// The time that a host has from the C library stays as it was.
TEST_F(TimeText, UsesNoStaticBuffer)
{
    const time_t lOther = 1700000000;
    const struct tm* pStatic = gmtime(&lOther);
    converted(0, kGmt);
    converted(0, kLocal);
    EXPECT_EQ(22, pStatic->tm_hour);
    EXPECT_EQ(123, pStatic->tm_year);
}

class TimeAfterNow : public HostTest {};

TEST_F(TimeAfterNow, IsTheSumInSecondsAndWrapsBeyondALong)
{
    const auto afterClock = [](long lNow, int iOffset) {
        state().now = lNow;
        long lOut = 42;
        EXPECT_EQ(0, getTimeAfterNow(iOffset, lOut));
        return lOut;
    };
    EXPECT_EQ(-2600, afterClock(1000, -3600));
    EXPECT_EQ(static_cast<long>(3847483647), afterClock(1700000000, INT_MAX));
    EXPECT_EQ(LONG_MAX - 1, afterClock(LONG_MAX, -1));
    EXPECT_EQ(LONG_MIN, afterClock(LONG_MAX, 1));
    EXPECT_EQ(LONG_MAX, afterClock(LONG_MIN, -1));
    EXPECT_EQ(Lines(), takeLog());
}

// Kept: a clock that fails counts as the second before the epoch.
TEST_F(TimeAfterNow, IgnoresAFailingClock)
{
    state().blNoClock = true;
    long lOut = 42;
    EXPECT_EQ(0, getTimeAfterNow(10, lOut));
    EXPECT_EQ(9, lOut);
    EXPECT_EQ("1969-12-31 23:59:59", afterNow(0, kUtc));
    EXPECT_EQ(Lines(), takeLog());
}

TEST_F(TimeAfterNow, IsTheTextOfTheSum)
{
    const TimeZone zone("AAA-5:30");
    state().now = 1700000000;
    EXPECT_EQ("Tue, 14 Nov 2023 23:13:20 GMT", afterNow(3600, kGmt));
    EXPECT_EQ("2023-11-14 21:13:20", afterNow(-3600, kUtc));
    EXPECT_EQ("2023-11-15 03:43:20", afterNow(0, kLocal));
    EXPECT_EQ("Tue, 14 Nov 2023 03:43:20 GMT", afterNow(-86400, kLocalGmt));
}

}  // namespace
