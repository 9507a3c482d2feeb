// SPDX-License-Identifier: MIT
// What the record operations share.
#pragma once

#include "util/log.h"

#include <cstddef>
#include <string>

// The context line of a failed operation, when SQLite had something to say. A macro, so that the
// line has the number of that operation.
#define LOG_SQL_ERROR(STR_SQL_ERROR, STR_SQL)                                                   \
    do {                                                                                        \
        if (!(STR_SQL_ERROR).empty())                                                           \
            LOG_PLAIN("sql error, err=%s, sql=%s", (STR_SQL_ERROR).c_str(), (STR_SQL).c_str()); \
    } while (false)

// True, after logging the message, when a statement succeeded and left an error text: it never
// does.
#define GUARDED_SQL(...) (strSqlError.empty() ? false : (LOG_ERROR(__VA_ARGS__), true))

namespace vorn {

// Bytes that are enough for most statements.
inline constexpr std::size_t kUsualStatement = 128;

// The key of a request under which the host writes SQL of its own.
inline constexpr char kRawFilterKey[] = "vornSqlWhereFilter";

inline constexpr char kDuplicateKeyMessage[] = "DUPLICATE_PRIMARY_KEY";

// Whether SQLite's last error text tells of a UNIQUE or PRIMARY KEY violation.
inline bool isDuplicateKey(const std::string& strSqlError)
{
    return std::string::npos != strSqlError.find("UNIQUE constraint failed");
}

}  // namespace vorn
