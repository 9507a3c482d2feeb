// SPDX-License-Identifier: MIT
// The time zone of the process, for a while, and which times can be asked for.
#pragma once

#include <climits>
#include <cstdlib>
#include <ctime>
#include <string>

// Whether the system's long holds the time.
inline bool isLong(long long iTime)
{
    return LONG_MIN <= iTime && LONG_MAX >= iTime;
}

// A time zone for as long as the object lives.
class TimeZone {
public:
    explicit TimeZone(const char* szZone)
    {
        const char* szBefore = getenv("TZ");
        blSet_ = nullptr != szBefore;
        if (blSet_) strBefore_ = szBefore;
        setenv("TZ", szZone, 1);
        tzset();
    }

    ~TimeZone()
    {
        if (blSet_)
            setenv("TZ", strBefore_.c_str(), 1);
        else
            unsetenv("TZ");
        tzset();
    }

    TimeZone(const TimeZone&) = delete;
    TimeZone& operator=(const TimeZone&) = delete;

private:
    bool blSet_ = false;
    std::string strBefore_;
};
