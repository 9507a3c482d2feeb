// SPDX-License-Identifier: MIT
// What the operations share beside runSqlEx.
#pragma once

#include "util/log.h"

#include <cstddef>
#include <string>

// Bytes that most statements find enough.
inline constexpr std::size_t kUsualStatement = 128;

// The context line of a failed operation, when SQLite had something to say. A macro, so that the
// line has the number of that operation.
#define LOG_SQL_ERROR(STR_SQL_ERROR, STR_SQL)                                                   \
    do {                                                                                        \
        if (!(STR_SQL_ERROR).empty())                                                           \
            LOG_PLAIN("sql error, err=%s, sql=%s", (STR_SQL_ERROR).c_str(), (STR_SQL).c_str()); \
    } while (false)

// Whether SQLite's last error text tells of a UNIQUE or PRIMARY KEY violation.
inline bool isDuplicateKey(const std::string& strSqlError)
{
    return std::string::npos != strSqlError.find("UNIQUE constraint failed");
}

inline constexpr char kDuplicateKeyMessage[] = "DUPLICATE_PRIMARY_KEY";
