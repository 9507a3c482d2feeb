// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// What the record operations share.
#pragma once

#include "util/log.h"

#include <cstddef>
#include <string>

// The context line of a failed operation, if SQLite gave an error text. A macro, so that the line
// number is that operation's.
#define LOG_SQL_ERROR(STR_SQL_ERROR, STR_SQL)                                                   \
    do {                                                                                        \
        if (!(STR_SQL_ERROR).empty())                                                           \
            LOG_PLAIN("sql error, err=%s, sql=%s", (STR_SQL_ERROR).c_str(), (STR_SQL).c_str()); \
    } while (false)

// True, after logging the message, if a statement succeeded and yet left an error text, which never
// happens.
#define GUARDED_SQL(...) (strSqlError.empty() ? false : (LOG_ERROR(__VA_ARGS__), true))

namespace vorn {

// Bytes that suffice for most statements.
inline constexpr std::size_t kUsualStatement = 128;

// The key of a request that holds SQL of the host's own.
inline constexpr char kRawFilterKey[] = "vornSqlWhereFilter";

inline constexpr char kDuplicateKeyMessage[] = "DUPLICATE_PRIMARY_KEY";

// Whether SQLite's last error text reports a UNIQUE or PRIMARY KEY violation.
inline bool isDuplicateKey(const std::string& strSqlError)
{
    return std::string::npos != strSqlError.find("UNIQUE constraint failed");
}

}  // namespace vorn
