// The cache of member types, for those who ask without a definition and without a word in the log.
#pragma once

#include <json/value.h>

#include <string>

// The table's entry as VORN_JSON_DB::recType would return it when that is an object, otherwise
// null.
const Json::Value& knownMemberTypes(const std::string& strJsonName);
