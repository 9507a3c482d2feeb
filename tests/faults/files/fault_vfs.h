// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// A VFS over the default one whose operations fail as planned.
#pragma once

namespace fault_vfs {

// To be handed to sqlite3_open_v2; registered by the first call.
const char* name();

// The kinds of operations, one bit each.
enum Kind : unsigned {
    kOpen = 1,
    kRead = 2,
    kWrite = 4,
    kSync = 8,
    kTruncate = 16,
    kDelete = 32,
    kAccess = 64,
    kFileSize = 128,
    kMapShared = 256,
    kLock = 512,
    kLockShared = 1024,  // a lock in WAL mode's shared memory
};
constexpr unsigned kEverythingButLocks = kLock - 1;

struct Plan {
    // The kinds that are counted, together and from 1.
    unsigned uKinds = 0;
    // So many of them fail: the n-th and then each that is a step further. None for 0.
    int nFirst = 0;
    int nTimes = 1;
    int nStep = 1;
    // What a failure means: no space left, or a broken device. A lock that fails is held by
    // somebody else. A write that fails leaves the first half of its bytes.
    bool blDiskFull = false;
};

// Takes effect at once; the counts start again.
void follow(const Plan& plan);
// Nothing fails any more; the counts stay.
void lift();

// Operations since then: of the plan's kinds, and those of them that failed.
struct Counts {
    int nAll = 0;
    int nFailed = 0;
};
inline Counts counts;

}  // namespace fault_vfs
