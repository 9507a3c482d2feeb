// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
#pragma once

#include "util/member_types.h"

#include <string>

namespace vorn {

// Appends the lists of names and values, "a,b) VALUES (1,2) ", of a record that has the very
// members of the definition and of the types, as SqlExpandMemberName and SqlExpandMemberSymbol do,
// but in one walk. False, with nothing appended, for any other record.
bool appendLists(std::string& strSql, const Json::Value& jTableDef, const std::string& strTable,
                 const TableTypes& types, const Json::Value& jRec);

}  // namespace vorn
