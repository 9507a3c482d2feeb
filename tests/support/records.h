// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// The log lines that several operations end with.
#pragma once

#include "support/database.h"

#include <string>
#include <vector>

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

// The lines of a column that cannot be decoded, and of its row. Unless it is the first column, it
// is shown.
Lines fieldFailed(const std::string& strFirst);
Lines rowRefused(const Lines& field, const Lines& shown = {});

// How the log of a failed operation ends: for each level, the innermost first, the check of what
// the level below gives (the first: of what SQLite gives) and the lines that follow any check. The
// arguments are as Call takes them, with the text of the CREATE statement as "create".
std::vector<Lines> levelsOf(const std::string& strFunction, Json::Value jArguments,
                            const Json::Value& jTypes);

// What follows a failed check of that level; the error text is the one that the handle holds.
Lines restOf(const std::vector<Lines>& levels, std::size_t nLevel, const std::string& strError,
             const std::string& strSql);
