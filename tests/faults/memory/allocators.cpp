// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
#include "faults/memory/allocators.h"

#include <VornJsonDbApi.h>
#include <sqlite3.h>

#include <malloc.h>
#include <unistd.h>
#include <atomic>
#include <cerrno>
#include <cstdarg>
#include <cstdio>
#include <cstdlib>
#include <ctime>
#include <new>
#include <utility>

bool blLogToStdout = false;
bool blDebugOutput = true;

#if VORN_OWN_MALLOC
extern "C" {
void* __libc_malloc(size_t nSize);
void* __libc_calloc(size_t nItems, size_t nSize);
void* __libc_realloc(void* pMemory, size_t nSize);
void __libc_free(void* pMemory);
}
#define RAW(FUNCTION) __libc_##FUNCTION
#else
#define RAW(FUNCTION) ::FUNCTION
#endif

namespace {

using allocators::Fault;
using allocators::Kind;

struct State {
    bool blArmed = false;
    Fault fault;
    int iCounted = 0;
    int iFailed = 0;
};
thread_local State state;

std::atomic<long> nNewBlocks{0};
std::atomic<long> nMallocBlocks{0};
int iWaits = 0;

// Whether the current allocation has to fail.
bool fails(Kind kind)
{
    if (!state.blArmed) return false;
    if (Kind::kEvery != state.fault.kind && kind != state.fault.kind) return false;
    ++state.iCounted;
    if (0 == state.fault.iNth || state.iCounted < state.fault.iNth) return false;
    if (state.iCounted > state.fault.iNth && !state.fault.blFromThenOn) return false;
    ++state.iFailed;
    errno = ENOMEM;
    return true;
}

void* sqliteMalloc(int iSize)
{
    return fails(Kind::kSqlite) ? nullptr : RAW(malloc)(static_cast<std::size_t>(iSize));
}

void sqliteFree(void* pMemory)
{
    RAW(free)(pMemory);
}

void* sqliteRealloc(void* pMemory, int iSize)
{
    return fails(Kind::kSqlite) ? nullptr : RAW(realloc)(pMemory, static_cast<std::size_t>(iSize));
}

// Reads the whole line, as the real log would, with memory of its own.
__attribute__((format(printf, 1, 0))) void readLine(const char* szFormat, va_list arguments)
{
    const bool blArmed = std::exchange(state.blArmed, false);
    static char szLine[1 << 16];
    vsnprintf(szLine, sizeof(szLine), szFormat, arguments);
    state.blArmed = blArmed;
}

}  // namespace

void allocators::install()
{
    sqlite3_mem_methods methods = {
        sqliteMalloc,
        sqliteFree,
        sqliteRealloc,
        [](void* pMemory) { return static_cast<int>(malloc_usable_size(pMemory)); },
        [](int iSize) { return (iSize + 7) & ~7; },
        [](void*) { return SQLITE_OK; },
        [](void*) {},
        nullptr};
    if (SQLITE_OK != sqlite3_config(SQLITE_CONFIG_MALLOC, &methods)) abort();
    if (SQLITE_OK != sqlite3_config(SQLITE_CONFIG_LOOKASIDE, 0, 0)) abort();
    if (SQLITE_OK != sqlite3_initialize()) abort();
}

void allocators::arm(const Fault& fault)
{
    state = {true, fault, 0, 0};
}

int allocators::disarm()
{
    state.blArmed = false;
    return state.iFailed;
}

allocators::Blocks allocators::blocks()
{
    return {nNewBlocks, nMallocBlocks};
}

int allocators::waits()
{
    return iWaits;
}

void* operator new(std::size_t nSize)
{
    void* pMemory = fails(Kind::kNew) ? nullptr : RAW(malloc)(0 == nSize ? 1 : nSize);
    if (nullptr == pMemory) throw std::bad_alloc();
    ++nNewBlocks;
    return pMemory;
}

void operator delete(void* pMemory) noexcept
{
    if (nullptr != pMemory) --nNewBlocks;
    RAW(free)(pMemory);
}

void operator delete(void* pMemory, std::size_t /*nSize*/) noexcept
{
    operator delete(pMemory);
}

extern "C" {

#if VORN_OWN_MALLOC
void* malloc(size_t nSize)
{
    void* pMemory = fails(Kind::kMalloc) ? nullptr : __libc_malloc(nSize);
    if (nullptr != pMemory) ++nMallocBlocks;
    return pMemory;
}

void* calloc(size_t nItems, size_t nSize)
{
    void* pMemory = fails(Kind::kMalloc) ? nullptr : __libc_calloc(nItems, nSize);
    if (nullptr != pMemory) ++nMallocBlocks;
    return pMemory;
}

void* realloc(void* pOld, size_t nSize)
{
    if (nullptr == pOld) return malloc(nSize);
    void* pMemory = fails(Kind::kMalloc) ? nullptr : __libc_realloc(pOld, nSize);
    if (nullptr == pMemory && 0 == nSize) --nMallocBlocks;
    return pMemory;
}

void free(void* pMemory)
{
    if (nullptr != pMemory) --nMallocBlocks;
    __libc_free(pMemory);
}
#endif

void __syslog_chk(int, int, const char*, ...) __attribute__((format(printf, 3, 4)));
void syslog(int, const char*, ...) __attribute__((format(printf, 2, 3)));

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
    return ++iWaits, 0;
}

time_t time(time_t* pTime) noexcept
{
    constexpr time_t kNow = 1700000000;
    if (nullptr != pTime) *pTime = kNow;
    return kNow;
}

}  // extern "C"
