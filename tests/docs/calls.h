// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// The calls of a handle, from JSON text to JSON text. A call that fails gives its result instead.
#pragma once

#include "support/matrix.h"

// The output of a call with that result, and any other result; "throws" where jsoncpp throws.
inline std::string outputOf(const Ended& ended, const char* szResult = "0")
{
    if ("T" == ended.strEnd) return "throws";
    return szResult == ended.strEnd ? text(ended.jOut) : ended.strEnd;
}

// The record that recCreate stored.
inline std::string created(VornJsonDbApi& api, const std::string& strRecord)
{
    return outputOf(called(api, {"recCreate", strRecord, "null"}));
}

// The record that recSave stored.
inline std::string saved(VornJsonDbApi& api, const std::string& strRecord, bool blCreate = true)
{
    return outputOf(called(api, {"recSave", strRecord, blCreate ? "insert" : "replace"}));
}

// The records of recList.
inline std::string listed(VornJsonDbApi& api, const std::string& strRequest = "null")
{
    return outputOf(called(api, {"recList", strRequest, "[]"}));
}

// The record of recGetOne.
inline std::string found(VornJsonDbApi& api, const std::string& strRequest)
{
    return outputOf(called(api, {"recGetOne", strRequest, "null"}), "1");
}

inline int updated(VornJsonDbApi& api, const std::string& strFilter, const std::string& strValue)
{
    return std::stoi(called(api, {"recUpdateByFilter", strFilter, strValue}).strEnd);
}

inline int deleted(VornJsonDbApi& api, const std::string& strRequest, bool blAll = false)
{
    return std::stoi(called(api, {"recDelete", strRequest, blAll ? "all" : "some"}).strEnd);
}
