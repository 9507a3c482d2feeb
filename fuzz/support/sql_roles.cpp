// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
#include "support/sql_roles.h"

#include <string>

namespace {

bool holdsText(const Json::Value& jValue)
{
    if (jValue.isString()) return true;
    if (!jValue.isArray()) return false;
    for (const Json::Value& jItem : jValue)
        if (holdsText(jItem)) return true;
    return false;
}

bool isBare(const std::string& strKey)
{
    return "any" == strKey || "double" == strKey || "id" == strKey || "long" == strKey ||
           "time" == strKey || "uns" == strKey || "bool" == strKey;
}

}  // namespace

bool mayBeSql(const Json::Value& jRequest)
{
    if (!jRequest.isObject()) return false;
    if (jRequest.isMember("vornSqlWhereFilter")) return true;
    for (const std::string& strKey : jRequest.getMemberNames())
        if (isBare(strKey) && holdsText(jRequest[strKey])) return true;
    for (const char* szKey : {"limit", "offset"})
        if (jRequest.isMember(szKey) && !jRequest[szKey].isUInt64()) return true;
    return false;
}
