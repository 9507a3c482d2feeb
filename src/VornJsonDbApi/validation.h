// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
#pragma once

#include "util/member_types.h"

namespace vorn {

// Whether the record has the very members of its table, each of its type: fillDefaultValue would
// change nothing, and checkJsonType find nothing. False also where only they can tell.
bool isCompleteAndValid(const Json::Value& jRec, const TableTypes* pTypes);

}  // namespace vorn
