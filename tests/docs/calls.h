// SPDX-License-Identifier: MIT
// The calls of a handle, from JSON text to JSON text. A call that fails gives its result instead.
#pragma once

#include "support/database.h"

// The record that recCreate stored.
inline std::string created(VornJsonDbApi& api, const std::string& strRecord)
{
    Json::Value jRecord = json(strRecord);
    Json::Value jStored;
    const int iResult = api.recCreate(jRecord, jStored);
    return 0 == iResult ? text(jStored) : std::to_string(iResult);
}

// The record that recSave stored.
inline std::string saved(VornJsonDbApi& api, const std::string& strRecord, bool blCreate = true)
{
    Json::Value jRecord = json(strRecord);
    const int iResult = api.recSave(jRecord, blCreate);
    return 0 == iResult ? text(jRecord) : std::to_string(iResult);
}

// The records of recList; "throws" where jsoncpp throws.
inline std::string listed(VornJsonDbApi& api, const std::string& strRequest = "null")
{
    Json::Value jRequest = json(strRequest);
    Json::Value jRecords(Json::arrayValue);
    try {
        const int iResult = api.recList(jRequest, jRecords);
        return 0 == iResult ? text(jRecords) : std::to_string(iResult);
    } catch (const Json::LogicError&) {
        return "throws";
    }
}

// The record of recGetOne.
inline std::string found(VornJsonDbApi& api, const std::string& strRequest)
{
    Json::Value jRequest = json(strRequest);
    Json::Value jRecord;
    const int iResult = api.recGetOne(jRequest, jRecord);
    return 1 == iResult ? text(jRecord) : std::to_string(iResult);
}

inline int updated(VornJsonDbApi& api, const std::string& strFilter, const std::string& strValue)
{
    Json::Value jFilter = json(strFilter);
    Json::Value jValue = json(strValue);
    return api.recUpdateByFilter(jFilter, jValue);
}

inline int deleted(VornJsonDbApi& api, const std::string& strRequest, bool blAll = false)
{
    Json::Value jRequest = json(strRequest);
    return api.recDelete(jRequest, blAll);
}
