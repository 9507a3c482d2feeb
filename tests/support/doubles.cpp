// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
#include "support/doubles.h"

#include <VornJsonDbApi.h>

#include <dlfcn.h>
#include <syslog.h>
#include <unistd.h>
#include <cerrno>
#include <cstdarg>
#include <cstdio>
#include <cstdlib>
#include <new>
#include <utility>

bool blLogToStdout = false;
bool blDebugOutput = false;

namespace doubles {

void (*onEveryLine)(const std::string& strText) = nullptr;

State& state()
{
    static thread_local State state;
    return state;
}

void reset()
{
    state() = State();
}

char* errorText(const char* szText)
{
    return sqlite3_mprintf("%s", szText);
}

}  // namespace doubles

namespace {

using doubles::state;

template <typename Function>
Function* real(const char* szName)
{
    return reinterpret_cast<Function*>(dlsym(RTLD_NEXT, szName));
}

// Runs the statement, which reads the variable arguments after szFormat.
#define WITH_ARGUMENTS(STATEMENT)  \
    va_list arguments;             \
    va_start(arguments, szFormat); \
    STATEMENT;                     \
    va_end(arguments)

// SQLite calls sqlite3_exec itself while it loads a schema; those calls are not the library's.
thread_local int iExecDepth = 0;

// True once, when the n-th call is reached.
bool isDue(int& iCountdown)
{
    return 0 < iCountdown && 0 == --iCountdown;
}

__attribute__((format(printf, 3, 0))) void record(bool blSyslog, int iPriority,
                                                  const char* szFormat, va_list arguments)
{
    const int iErrno = errno;
    const int iFailNew = std::exchange(state().iFailNew, 0);  // not for the double's own memory
    char* szText = nullptr;
    if (0 > vasprintf(&szText, szFormat, arguments)) abort();
    state().log.push_back({blSyslog, iPriority, iErrno, szText});
    if (nullptr != doubles::onEveryLine) doubles::onEveryLine(szText);
    free(szText);
    state().iFailNew = iFailNew;
    // The real ones may leave anything in errno.
    errno = ENOTTY;
}

__attribute__((format(printf, 1, 0))) int writeToStdout(const char* szFormat, va_list arguments)
{
    if (!blLogToStdout) return vprintf(szFormat, arguments);
    record(false, -1, szFormat, arguments);
    return 0;
}

}  // namespace

int doubles::realExec(sqlite3* pDb, const char* szSql, RowCallback callback, void* arg,
                      char** errText)
{
    static auto* const pReal = real<decltype(sqlite3_exec)>("sqlite3_exec");
    ++iExecDepth;
    const int iStatus = pReal(pDb, szSql, callback, arg, errText);
    --iExecDepth;
    return iStatus;
}

// jsoncpp's default depth limit as in its newest releases, whichever one is used.
void Json::CharReaderBuilder::setDefaults(Json::Value* pjSettings)
{
    static auto* const pReal =
        real<void(Json::Value*)>("_ZN4Json17CharReaderBuilder11setDefaultsEPNS_5ValueE");
    pReal(pjSettings);
    (*pjSettings)["stackLimit"] = 256;
}

extern "C" {

void __syslog_chk(int, int, const char*, ...) __attribute__((format(printf, 3, 4)));
int __printf_chk(int, const char*, ...) __attribute__((format(printf, 2, 3)));

int sqlite3_exec(sqlite3* pDb, const char* szSql, int (*callback)(void*, int, char**, char**),
                 void* arg, char** errText)
{
    if (0 < iExecDepth) return doubles::realExec(pDb, szSql, callback, arg, errText);
    const int iFailNew = std::exchange(state().iFailNew, 0);  // not for the double's own memory
    state().statements.emplace_back(szSql);
    state().iFailNew = iFailNew;
    if (!state().exec) return doubles::realExec(pDb, szSql, callback, arg, errText);
    return state().exec(pDb, szSql, callback, arg, errText);
}

int sqlite3_changes(sqlite3* pDb)
{
    static auto* const pReal = real<decltype(sqlite3_changes)>("sqlite3_changes");
    return state().changes ? state().changes() : pReal(pDb);
}

char* sqlite3_mprintf(const char* szFormat, ...)
{
    if (isDue(state().iFailMprintf)) return nullptr;
    WITH_ARGUMENTS(char* szText = sqlite3_vmprintf(szFormat, arguments));
    return szText;
}

int usleep(useconds_t uMicroseconds)
{
    static auto* const pReal = real<decltype(usleep)>("usleep");
    state().sleeps.push_back(uMicroseconds);
    if (state().onSleep) state().onSleep();
    return state().blReallySleep ? pReal(uMicroseconds) : 0;
}

void syslog(int iPriority, const char* szFormat, ...)
{
    WITH_ARGUMENTS(record(true, iPriority, szFormat, arguments));
}

void __syslog_chk(int iPriority, int /*iFlag*/, const char* szFormat, ...)
{
    WITH_ARGUMENTS(record(true, iPriority, szFormat, arguments));
}

int printf(const char* szFormat, ...)
{
    WITH_ARGUMENTS(const int iLength = writeToStdout(szFormat, arguments));
    return iLength;
}

int __printf_chk(int /*iFlag*/, const char* szFormat, ...)
{
    WITH_ARGUMENTS(const int iLength = writeToStdout(szFormat, arguments));
    return iLength;
}

time_t time(time_t* pTime) noexcept
{
    static auto* const pReal = real<time_t(time_t*)>("time");
    if (state().blNoClock) return -1;
    const time_t now = -1 == state().now ? pReal(nullptr) : state().now;
    if (nullptr != pTime) *pTime = now;
    return now;
}

struct tm* gmtime_r(const time_t* pTime, struct tm* pOut) noexcept
{
    static auto* const pReal = real<struct tm*(const time_t*, struct tm*)>("gmtime_r");
    return state().blFailTime ? nullptr : pReal(pTime, pOut);
}

struct tm* localtime_r(const time_t* pTime, struct tm* pOut) noexcept
{
    static auto* const pReal = real<struct tm*(const time_t*, struct tm*)>("localtime_r");
    return state().blFailTime ? nullptr : pReal(pTime, pOut);
}

size_t strftime(char* szOut, size_t nSize, const char* szFormat, const struct tm* pTime) noexcept
{
    static auto* const pReal =
        real<size_t(char*, size_t, const char*, const struct tm*)>("strftime");
    return state().blFailStrftime ? 0 : pReal(szOut, nSize, szFormat, pTime);
}

}  // extern "C"

void* operator new(std::size_t nSize)
{
    if (isDue(state().iFailNew)) throw std::bad_alloc();
    void* pMemory = malloc(0 == nSize ? 1 : nSize);
    if (nullptr == pMemory) throw std::bad_alloc();
    if (0 != state().iErrnoOfNew) errno = state().iErrnoOfNew;
    return pMemory;
}

void operator delete(void* pMemory) noexcept
{
    free(pMemory);
}

void operator delete(void* pMemory, std::size_t /*nSize*/) noexcept
{
    free(pMemory);
}
