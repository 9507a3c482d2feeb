// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// Decodes the rows of a statement into records.
#pragma once

#include <exception>
#include <string>

namespace vorn {

// The row callback of sqlite3_exec: decodes the row into an object, typed by the member types of
// the table whose statement is running, and appends it to the Json::Value array that arg points to.
// Returns 0, or -1 to stop the statement. What is thrown inside is kept for takeThrown().
int DbCallBackFillList(void* arg, int n_column, char** column_value, char** column_name);

// Sets the table whose statement runs from now on.
void beginStatement(const std::string& strTable);

// What was thrown in the row callback since the last call, or null.
std::exception_ptr takeThrown();

}  // namespace vorn
