// SPDX-License-Identifier: MIT
// What the operations share beside runSqlEx.
#pragma once

#include "util/log.h"

#include <cstddef>
#include <string>

// Bytes that most statements find enough.
inline constexpr std::size_t kUsualStatement = 128;

// The context line of a failed operation, when SQLite had something to say.
inline void logSqlError(const std::string& strSqlError, const std::string& strSql)
{
    if (!strSqlError.empty())
        LOG_PLAIN("sql error, err=%s, sql=%s", strSqlError.c_str(), strSql.c_str());
}

// Whether SQLite's last error text tells of a UNIQUE or PRIMARY KEY violation.
inline bool isDuplicateKey(const std::string& strSqlError)
{
    return std::string::npos != strSqlError.find("UNIQUE constraint failed");
}

inline constexpr char kDuplicateKeyMessage[] = "DUPLICATE_PRIMARY_KEY";
