// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// JSON as the tests and the fuzz targets show it.
#pragma once

#include <json/value.h>

#include <string>

// The value as one compact line.
std::string text(const Json::Value& jValue);

// What jsoncpp's own reader makes of a text, even of one with a syntax error.
Json::Value leftByReader(const std::string& strText);
