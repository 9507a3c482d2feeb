// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// A plugin that works with the library; plugin_host loads it.

#include "task.h"

extern "C" bool createsRecord(int iId);

bool createsRecord(int iId)
{
    return Task().works(iId);
}
