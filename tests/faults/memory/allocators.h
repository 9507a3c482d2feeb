// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// What the host process gives the library: the log, the clock, the wait, and three allocators, each
// with a fault that can be armed: SQLite's through SQLITE_CONFIG_MALLOC, C++'s operator new, and
// malloc, calloc and realloc themselves. Each counts its own allocations only: what SQLite and
// operator new take is not counted as the program's malloc.
#pragma once

namespace allocators {

enum class Kind { kSqlite, kNew, kMalloc, kEvery };

// The n-th allocation of that kind fails, alone or with all that follow; 0 counts and fails none.
struct Fault {
    Kind kind = Kind::kEvery;
    int iNth = 0;
    bool blFromThenOn = false;
};

// Whether the program has a malloc of its own. A sanitizer does not allow it.
constexpr bool kOwnMalloc = VORN_OWN_MALLOC;

// Before SQLite is used at all. Lookaside memory is off, as in SQLite's own tests of this kind, so
// that each allocation reaches the allocator.
void install();

// Arms the fault for this thread until disarm(), which tells how many allocations failed.
void arm(const Fault& fault);
int disarm();

// What is allocated at present, in all threads: blocks of operator new, blocks of malloc.
struct Blocks {
    long nNew = 0;
    long nMalloc = 0;
};
Blocks blocks();

// How often the library has waited for a lock. It does not really wait.
int waits();

}  // namespace allocators
