// SPDX-License-Identifier: MIT
// The places of a request that are SQL by design.
#pragma once

#include <json/value.h>

// Whether something of the request may stand in a statement outside quotes: the raw filter, a text
// under a member whose word is a number, and paging that is no number.
bool mayBeSql(const Json::Value& jRequest);
