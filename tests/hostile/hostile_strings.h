// SPDX-License-Identifier: MIT
// Texts that something may trip over: quotes, SQL, control characters, bidirectional marks, invalid
// UTF-8, percent signs in all forms, NUL bytes and long texts.
#pragma once

#include <string>
#include <vector>

const std::vector<std::string>& hostileStrings();
