// SPDX-License-Identifier: MIT
// Texts that something may trip over.
#pragma once

#include <string>
#include <vector>

// Quotes, SQL, controls, bidirectional marks, invalid UTF-8, percent signs in all forms, NUL bytes
// and long texts.
std::vector<std::string> hostileStrings();
