// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// A plugin with flags of its own; two_plugins loads two of them. LOG_TO_STDOUT is the flag's
// initial value.

#include "task.h"

bool blLogToStdout = LOG_TO_STDOUT;
bool blDebugOutput = false;

extern "C" void setLogToStdout(bool blStdout)
{
    blLogToStdout = blStdout;
}

extern "C" bool logsOneFailure()
{
    return -1 == Task().api().runSqlEx("no sql");
}
