// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// The records that a command line asks for, one after the other.
#pragma once

#include "arguments.h"
#include "database.h"

#include <functional>

namespace tool {

// Calls the function with each record that the condition, the third argument, and the options
// --sort, --limit, --offset and --after select. All are of the same state of the table. It is read
// in pages, so memory does not grow with the number of records.
void forEachRecord(const Table& table, const Arguments& arguments,
                   const std::function<void(const Json::Value& jRecord)>& use);

}  // namespace tool
