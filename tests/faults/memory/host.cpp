// SPDX-License-Identifier: MIT
#include "host.h"

#include "allocators.h"

#include <VornJsonDbApi.h>

#include <unistd.h>
#include <cstdarg>
#include <cstdio>
#include <ctime>

bool blLogToStdout = false;
bool blDebugOutput = true;

namespace {

int iWaits = 0;

// Reads the whole line, as the real log would.
__attribute__((format(printf, 1, 0))) void readLine(const char* szFormat, va_list arguments)
{
    const allocators::Pause pause;
    static char szLine[1 << 16];
    vsnprintf(szLine, sizeof(szLine), szFormat, arguments);
}

}  // namespace

int host::waits()
{
    return iWaits;
}

extern "C" {

void __syslog_chk(int, int, const char*, ...) __attribute__((format(printf, 3, 4)));

void syslog(int /*iPriority*/, const char* szFormat, ...) __attribute__((format(printf, 2, 3)));

void syslog(int /*iPriority*/, const char* szFormat, ...)
{
    va_list arguments;
    va_start(arguments, szFormat);
    readLine(szFormat, arguments);
    va_end(arguments);
}

void __syslog_chk(int /*iPriority*/, int /*iFlag*/, const char* szFormat, ...)
{
    va_list arguments;
    va_start(arguments, szFormat);
    readLine(szFormat, arguments);
    va_end(arguments);
}

int usleep(useconds_t /*uMicroseconds*/)
{
    ++iWaits;
    return 0;
}

time_t time(time_t* pTime) noexcept
{
    if (nullptr != pTime) *pTime = host::kNow;
    return host::kNow;
}

}  // extern "C"
