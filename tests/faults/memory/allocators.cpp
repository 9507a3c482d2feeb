// SPDX-License-Identifier: MIT
#include "allocators.h"

#include <sqlite3.h>

#include <malloc.h>
#include <atomic>
#include <cerrno>
#include <cstdlib>
#include <new>

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

// Whether the allocation that is asked for now has to fail.
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

void* allocate(std::size_t nSize)
{
    void* pMemory = fails(Kind::kNew) ? nullptr : RAW(malloc)(0 == nSize ? 1 : nSize);
    if (nullptr == pMemory) throw std::bad_alloc();
    ++nNewBlocks;
    return pMemory;
}

void release(void* pMemory)
{
    if (nullptr != pMemory) --nNewBlocks;
    RAW(free)(pMemory);
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

int sqliteSize(void* pMemory)
{
    return static_cast<int>(malloc_usable_size(pMemory));
}

int sqliteRoundup(int iSize)
{
    return (iSize + 7) & ~7;
}

int sqliteInit(void*)
{
    return SQLITE_OK;
}

void sqliteShutdown(void*) {}

}  // namespace

bool allocators::ownMalloc()
{
    return VORN_OWN_MALLOC;
}

void allocators::install()
{
    sqlite3_mem_methods methods = {sqliteMalloc,  sqliteFree, sqliteRealloc,  sqliteSize,
                                   sqliteRoundup, sqliteInit, sqliteShutdown, nullptr};
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

allocators::Pause::Pause() : blArmed_(state.blArmed)
{
    state.blArmed = false;
}

allocators::Pause::~Pause()
{
    state.blArmed = blArmed_;
}

allocators::Blocks allocators::blocks()
{
    return {nNewBlocks, nMallocBlocks};
}

void* operator new(std::size_t nSize)
{
    return allocate(nSize);
}

void* operator new[](std::size_t nSize)
{
    return allocate(nSize);
}

void operator delete(void* pMemory) noexcept
{
    release(pMemory);
}

void operator delete[](void* pMemory) noexcept
{
    release(pMemory);
}

void operator delete(void* pMemory, std::size_t /*nSize*/) noexcept
{
    release(pMemory);
}

void operator delete[](void* pMemory, std::size_t /*nSize*/) noexcept
{
    release(pMemory);
}

#if VORN_OWN_MALLOC
extern "C" {

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

}  // extern "C"
#endif
