// SPDX-License-Identifier: MIT
// The three allocators of a host process, each with a fault that can be armed: SQLite's through
// SQLITE_CONFIG_MALLOC, C++'s operator new, and malloc, calloc and realloc themselves. Each counts
// its own allocations only: what SQLite and operator new take is no malloc of the program.
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
bool ownMalloc();

// Before SQLite is used at all. Lookaside memory is off, as in SQLite's own tests of this kind, so
// that each allocation reaches the allocator.
void install();

// Arms the fault for this thread until it is disarmed, which tells how many allocations failed.
void arm(const Fault& fault);
int disarm();

// While one lives, this thread's allocations neither fail nor count.
class Pause {
public:
    Pause();
    ~Pause();
    Pause(const Pause&) = delete;
    Pause& operator=(const Pause&) = delete;

private:
    bool blArmed_;
};

// What is allocated at present, in all threads: blocks of operator new, blocks of malloc.
struct Blocks {
    long nNew = 0;
    long nMalloc = 0;
};
Blocks blocks();

}  // namespace allocators
