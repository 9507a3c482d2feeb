// SPDX-License-Identifier: MIT
// The time helpers over the whole range of a long.

#include "support/database.h"
#include "support/time_zone.h"

#include <climits>

namespace {

using VORN_JSON_DB::convert2ReadableTime;
using VORN_JSON_DB::getTimeAfterNow;

// The first and the last second whose year, counted from 1900, is an int.
constexpr long kFirst = -67768040609740800;
constexpr long kLast = 67768036191676799;

class TimeLimits : public HostTest {
protected:
    static void expectEnd(long lTime, int iType)
    {
        SCOPED_TRACE(std::to_string(lTime) + ", " + std::to_string(iType));
        const bool blFits = kFirst <= lTime && kLast >= lTime;
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
        for (long lTime : {LONG_MIN, LONG_MIN + 1, kFirst - 1, kFirst, kFirst + 1, -1L, 0L, 1L,
                           kLast - 1, kLast, kLast + 1, LONG_MAX - 1, LONG_MAX})
            expectEnd(lTime, iType);
        for (int iBit = 0; iBit < 63; ++iBit)
            for (long lNear : {-1L, 0L, 1L}) {
                expectEnd((1L << iBit) - 1 + lNear, iType);
                expectEnd(-(1L << iBit) + lNear, iType);
            }
    }
    std::string strOut;
    EXPECT_EQ(0, convert2ReadableTime(kFirst, strOut, 5));
    EXPECT_EQ("-2147481748-01-01 00:00:00", strOut);
}

TEST_F(TimeLimits, OfTheClockAndItsOffset)
{
    const struct {
        long lNow;
        int iOffset;
        long lResult;
        bool blText;
    } cases[] = {
        {LONG_MIN, 0, LONG_MIN, false}, {LONG_MIN, INT_MAX, LONG_MIN + INT_MAX, false},
        {LONG_MAX, 0, LONG_MAX, false}, {LONG_MAX, INT_MIN, LONG_MAX + INT_MIN, false},
        {kFirst, 0, kFirst, true},      {kFirst, -1, kFirst - 1, false},
        {kLast, 0, kLast, true},        {kLast, 1, kLast + 1, false},
        {0, INT_MIN, INT_MIN, true},    {0, INT_MAX, INT_MAX, true},
    };
    for (const auto& row : cases) {
        SCOPED_TRACE(std::to_string(row.lNow) + " " + std::to_string(row.iOffset));
        doubles::state().now = row.lNow;
        long lOut = 42;
        EXPECT_EQ(0, getTimeAfterNow(row.iOffset, lOut));
        EXPECT_EQ(row.lResult, lOut);
        EXPECT_EQ(Lines(), takeLog());
        std::string strOut = "kept";
        EXPECT_EQ(row.blText ? 0 : -1, getTimeAfterNow(row.iOffset, strOut, 5));
        EXPECT_EQ(row.blText, "kept" != strOut);
        EXPECT_EQ(row.blText ? 0U : 2U, takeLog().size());
    }
}

}  // namespace
