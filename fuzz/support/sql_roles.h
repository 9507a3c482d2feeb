// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// The places of a request that are SQL by design.
#pragma once

#include <json/value.h>

// Whether part of the request may appear in a statement outside quotes: the raw filter, a text
// under a member whose word is a number, and paging that is not a number.
bool mayBeSql(const Json::Value& jRequest);
