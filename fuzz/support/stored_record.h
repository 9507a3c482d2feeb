// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// What becomes of a record, stated without the library: the reference for the record target.
#pragma once

#include <json/value.h>

#include <string>

struct Stored {
    // kAny: a "%" precedes another value, so that the statement may become anything.
    enum class End { kRow, kFails, kThrows, kAny };

    End end = End::kFails;
    Json::Value jRow;
};

// What recSave makes of the record in a table whose columns have no type.
Stored storedRecord(const Json::Value& jMembers, const Json::Value& jRecord);

// The record with the default of each member that it lacks.
Json::Value withDefaults(const Json::Value& jMembers, Json::Value jRecord);

bool passesTypeCheck(const Json::Value& jMembers, const Json::Value& jRecord);
