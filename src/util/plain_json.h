// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// JSON text of the usual kind, read straight into a value.
#pragma once

#include <json/value.h>

namespace vorn {

// Gives a null value what jsoncpp's reader gives it for objects, arrays, strings, numbers and
// literals as the standard writes them: the same kinds, values, order, last of equal names, and
// offsets. False, with the value still null, for every text that holds anything else or that
// releases of jsoncpp read differently; only that reader knows what becomes of it.
bool readPlainJson(const char* szText, Json::Value& jValue);

}  // namespace vorn
