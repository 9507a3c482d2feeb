// SPDX-License-Identifier: MIT
// The second part of hostileStrings().
#pragma once

#include <string>
#include <vector>

// Lines that look like the log's, SQL that closes what stands before it, texts that show as
// something else, controls, NUL bytes and long texts.
std::vector<std::string> moreHostileStrings();
