// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
#include "util/log.h"

#include <VornJsonDbApi.h>

int VORN_JSON_DB::jsonCopyMember(Json::Value& jIn, Json::Value& jSubSet, bool blOverwrite)
{
    if (FAILED(jIn.type() != Json::nullValue && jIn.type() != Json::objectValue)) return -1;
    if (FAILED(jSubSet.type() != Json::objectValue)) return -1;
    for (const std::string& strKey : jSubSet.getMemberNames())
        if (blOverwrite || !jIn.isMember(strKey)) jIn[strKey] = Json::Value(jSubSet[strKey]);
    return 0;
}
