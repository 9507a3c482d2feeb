// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// JSON values as text and back.
#pragma once

#include <json/value.h>

#include <string>

namespace vorn {

// One compact line without a trailing newline: non-ASCII unchanged, 17 significant digits, no
// comments. NaN and infinities are written so that fromString reads them again.
std::string toString(const Json::Value& jValue);

// Parses szText straight into jValue. After a syntax error jValue holds what the reader left there;
// text that is nested deeper than the reader allows gives null.
void fromString(const char* szText, Json::Value& jValue);

}  // namespace vorn
