// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// The log: one line per failed check or message, to syslog or standard output as the host chose.
#pragma once

// True when COND holds, after logging COND's own source text. COND is evaluated exactly once.
// The text is taken here, at the outermost macro: one macro deeper, NULL would turn into __null.
#define FAILED(COND) FAILED_AS(COND, #COND)

// For a check whose code differs from its text. The text is part of what hosts read and may name
// code that is gone.
#define FAILED_AS(COND, TEXT) \
    ((COND) ? (vorn::logFailed(VORN_LOG_COMPONENT, __LINE__, TEXT), true) : false)

// A check that nothing outside the library can make fail. The line above says why.
#define GUARDED(COND) FAILED_AS(COND, #COND)

// One line of the error family, or of the plain family. VORN_LOG_COMPONENT is set by the build.
#define LOG_ERROR(...) \
    vorn::LogLine(vorn::LogLine::Family::kError, VORN_LOG_COMPONENT, __LINE__).write(__VA_ARGS__)
#define LOG_PLAIN(...) \
    vorn::LogLine(vorn::LogLine::Family::kPlain, VORN_LOG_COMPONENT, __LINE__).write(__VA_ARGS__)

namespace vorn {

// Made before the arguments of write() are rendered, so that the line shows the errno of the check;
// destroyed after them, so that the line leaves errno as it was.
class LogLine {
public:
    enum class Family { kError, kPlain };

    LogLine(Family family, const char* szComponent, int iLine);
    ~LogLine();
    LogLine(const LogLine&) = delete;
    LogLine& operator=(const LogLine&) = delete;

    // Writes the line with one call of printf or syslog. A line is dropped if memory runs out.
    void write(const char* szFormat, ...) __attribute__((format(printf, 2, 3)));

private:
    Family family_;
    const char* szComponent_;
    int iLine_;
    int iErrno_;
};

// The line of a failed check.
inline void logFailed(const char* szComponent, int iLine, const char* szCondition)
{
    LogLine(LogLine::Family::kError, szComponent, iLine).write("Failed [%s], err=%m", szCondition);
}

}  // namespace vorn
