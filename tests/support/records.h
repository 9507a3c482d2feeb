// SPDX-License-Identifier: MIT
// The log lines that several operations end with.
#pragma once

#include "support/database.h"

#include <string>

// The lines of a statement that SQLite refused, and of the operation that knows its text.
inline std::string runFailed(const std::string& strError, const std::string& strSql,
                             std::size_t nAttempts = 0)
{
    return plain("i=" + std::to_string(nAttempts) + ",errno=?, run sql failed, error=" + strError +
                 ", sql=" + strSql);
}

inline std::string sqlError(const std::string& strError, const std::string& strSql)
{
    return plain("sql error, err=" + strError + ", sql=" + strSql);
}

// What SQLite says when a condition is missing.
inline constexpr char kNearParenthesis[] = "near \")\": syntax error";
inline constexpr char kNearWhere[] = "near \"WHERE\": syntax error";
