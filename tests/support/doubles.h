// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// Doubles for what the library calls outside itself, put in by symbol interposition: the functions
// are defined in the test program, where the loader finds them before the real ones. By default
// they pass every call on; the log is always caught.
#pragma once

#include <sqlite3.h>

#include <ctime>
#include <functional>
#include <string>
#include <vector>

namespace doubles {

using RowCallback = int (*)(void*, int, char**, char**);
using Exec = std::function<int(sqlite3*, const char*, RowCallback, void*, char**)>;

// One line as the library wrote it.
struct LogRecord {
    bool blSyslog;  // otherwise printf
    int iPriority;  // of syslog, otherwise -1
    int iErrno;     // when the line was written
    std::string strText;
};

struct State {
    // sqlite3_exec: the texts that were run since the last reset, and a replacement.
    std::vector<std::string> statements;
    Exec exec;
    // usleep: does not really sleep, unless told to.
    std::vector<unsigned> sleeps;
    bool blReallySleep = false;
    std::function<void()> onSleep;
    // syslog and printf.
    std::vector<LogRecord> log;
    // sqlite3_changes: what it returns instead of the real number.
    std::function<int()> changes;
    // sqlite3_mprintf: the n-th call from now (1 is the next one) returns NULL; 0 means never.
    int iFailMprintf = 0;
    // operator new: the n-th call from now throws std::bad_alloc; 0 means never.
    int iFailNew = 0;
    // operator new: what it leaves in errno, as an allocator may; 0 leaves errno alone.
    int iErrnoOfNew = 0;
    // gmtime_r, localtime_r and strftime fail.
    bool blFailTime = false;
    bool blFailStrftime = false;
    // time: what it returns instead of the real time, unless -1.
    time_t now = -1;
    // time: fails, with -1.
    bool blNoClock = false;
};

// Each thread has its own.
State& state();

// Back to passing every call on, with nothing recorded.
void reset();

// Called with every line of the whole program; reset() leaves it alone.
extern void (*onEveryLine)(const std::string& strText);

// The real sqlite3_exec, unrecorded.
int realExec(sqlite3* pDb, const char* szSql, RowCallback callback, void* arg, char** errText);

// An error text allocated as SQLite would.
char* errorText(const char* szText);

}  // namespace doubles
