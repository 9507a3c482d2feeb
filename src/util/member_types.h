// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// What the process knows of its tables.
#pragma once

#include "util/type_words.h"

#include <atomic>
#include <string>
#include <utility>
#include <vector>

namespace vorn {

struct DeclaredMember {
    std::string strName;
    const TypeForms* pForms;
};

// The member types of a table.
class TableTypes {
public:
    explicit TableTypes(Json::Value jMembers);

    // As recType shows them; null if there are none.
    const Json::Value& json() const { return jMembers_; }

    // For the host, which may change them from now on.
    Json::Value& handOut()
    {
        blHandedOut_.store(true, std::memory_order_relaxed);
        return jMembers_;
    }

    // The same in the order of their names; null once a host may have changed them.
    const std::vector<DeclaredMember>* unchanged() const
    {
        return blHandedOut_.load(std::memory_order_relaxed) ? nullptr : &members_;
    }

private:
    Json::Value jMembers_;
    std::vector<DeclaredMember> members_;
    std::atomic<bool> blHandedOut_{false};
};

// The types of the table, read from the definition if nobody has asked for them before; every
// failed check is logged.
TableTypes& tableTypes(Json::Value& jTableDef, const std::string& strTable);

inline const Json::Value& memberTypes(Json::Value& jTableDef, const std::string& strTable)
{
    return tableTypes(jTableDef, strTable).json();
}

// The types of the table without a look at a definition or a line in the log; null if nobody has
// asked for them.
const TableTypes* knownTypes(const std::string& strTable);

}  // namespace vorn
