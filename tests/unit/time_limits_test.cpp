// SPDX-License-Identifier: MIT
// The time helpers over the whole range of a long.

#include "support/database.h"
#include "support/time_zone.h"

#include <climits>

namespace {

using VORN_JSON_DB::convert2ReadableTime;
using VORN_JSON_DB::getTimeAfterNow;

// The first and the last second whose year, counted from 1900, is an int.
constexpr long long kFirst = -67768040609740800;
constexpr long long kLast = 67768036191676799;

class TimeLimits : public HostTest {
protected:
    // A time that the system's long cannot hold cannot be asked for.
    static void expectEnd(long long iTime, int iType)
    {
        if (!isLong(iTime)) return;
        SCOPED_TRACE(std::to_string(iTime) + ", " + std::to_string(iType));
        const long lTime = static_cast<long>(iTime);
        const bool blFits = kFirst <= iTime && kLast >= iTime;
        std::string strOut = "kept";
        EXPECT_EQ(blFits ? 0 : -1, convert2ReadableTime(lTime, strOut, iType));
        EXPECT_EQ(blFits, "kept" != strOut);
        EXPECT_EQ(blFits, takeLog().empty());
    }

    TimeZone zone_{"UTC0"};
};

TEST_F(TimeLimits, FromTheFirstToTheLastSecondOfTheCalendar)
{
    for (int iType : {2, 3, 4, 5, 6, 7}) {
        for (long lTime : {LONG_MIN, LONG_MIN + 1, -1L, 0L, 1L, LONG_MAX - 1, LONG_MAX})
            expectEnd(lTime, iType);
        for (int iNear : {-1, 0, 1}) {
            expectEnd(kFirst + iNear, iType);
            expectEnd(kLast + iNear, iType);
            for (int iBit = 0; iBit < 62; ++iBit) {
                expectEnd((1LL << iBit) - 1 + iNear, iType);
                expectEnd(-(1LL << iBit) + iNear, iType);
            }
        }
    }
}

TEST_F(TimeLimits, OfTheClockAndItsOffset)
{
    const struct {
        long long iNow;
        int iOffset;
        long long iResult;
        bool blText;
    } cases[] = {
        {LLONG_MIN, 0, LLONG_MIN, false}, {LLONG_MIN, INT_MAX, LLONG_MIN + INT_MAX, false},
        {LLONG_MAX, 0, LLONG_MAX, false}, {LLONG_MAX, INT_MIN, LLONG_MAX + INT_MIN, false},
        {kFirst, 0, kFirst, true},        {kFirst, -1, kFirst - 1, false},
        {kLast, 0, kLast, true},          {kLast, 1, kLast + 1, false},
        {0, INT_MIN, INT_MIN, true},      {0, INT_MAX, INT_MAX, true},
    };
    for (const auto& row : cases) {
        if (!isLong(row.iNow)) continue;
        SCOPED_TRACE(std::to_string(row.iNow) + " " + std::to_string(row.iOffset));
        doubles::state().now = static_cast<long>(row.iNow);
        long lOut = 42;
        EXPECT_EQ(0, getTimeAfterNow(row.iOffset, lOut));
        EXPECT_EQ(row.iResult, lOut);
        EXPECT_EQ(Lines(), takeLog());
        std::string strOut = "kept";
        EXPECT_EQ(row.blText ? 0 : -1, getTimeAfterNow(row.iOffset, strOut, 5));
        EXPECT_EQ(row.blText, "kept" != strOut);
        EXPECT_EQ(row.blText ? 0U : 2U, takeLog().size());
    }
}

}  // namespace
