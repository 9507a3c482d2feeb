// SPDX-License-Identifier: MIT
// JSON of the tests' own, without the library's reader and writer.
#pragma once

#include <json/value.h>

#include <string>

// Ends the program where the text is no JSON.
Json::Value jsonOf(const std::string& strText);
std::string textOf(const Json::Value& jValue);
