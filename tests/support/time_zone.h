// SPDX-License-Identifier: MIT
// Sets the time zone of the process for a while, and tells which times can be asked for.
#pragma once

#include <climits>
#include <cstdlib>
#include <ctime>
#include <optional>
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
