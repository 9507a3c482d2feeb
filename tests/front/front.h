// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// Shared by the tests of VornJsonTable.h.
#pragma once

#include "support/database.h"
#include "support/matrix.h"

#include <VornJsonTable.h>

#include <memory>
#include <string>
#include <vector>

// The result of a call: its number, or the cause and the reason.
inline std::string outcomeOf(const VornJsonTable& table, long long iResult)
{
    constexpr const char* kCauses[] = {"none",    "refused", "duplicate", "locked",
                                       "changed", "limit",   "invalid",   "failed"};
    const std::string strCause = kCauses[static_cast<int>(table.cause())];
    if (0 > iResult) return strCause + ": " + table.reason();
    EXPECT_EQ("none", strCause);
    EXPECT_EQ("", table.reason());
    return std::to_string(iResult);
}

// A table with what it was made from. After each call, nothing of the table's own may be open.
class Front {
public:
    // As Table takes them; "@" in the texts to run is the name of the table.
    Front(Database& database, const std::string& strMembers, const std::string& strColumns)
        : Front(database, freshName(), strMembers, strColumns)
    {
    }
    Front(Database& database, std::string strTable, const std::string& strMembers,
          const std::string& strColumns)
        : strName(std::move(strTable)), database_(database)
    {
        Json::Value jDefinition;
        jDefinition[strName]["member"] = json(strMembers);
        table = std::make_unique<VornJsonTable>(
            database.get(), strName, jDefinition,
            named("create table if not exists @ (" + strColumns + ")"));
        expectIdle();
    }

    std::string named(const std::string& strText) const { return replaced(strText, '@', strName); }
    void run(const std::string& strSql) { database_.run(named(strSql)); }
    Rows rows(const std::string& strSql) { return database_.rows(named(strSql)); }

    // Each gives the outcome, and the stored record or the list in "stored".
    std::string create(const Json::Value& jRecord)
    {
        return outcome([&] { return table->create(jRecord, jStored); });
    }
    std::string createMany(const Json::Value& jRecords)
    {
        return outcome([&] { return table->createMany(jRecords); });
    }
    std::string save(const Json::Value& jRecord)
    {
        return outcome([&] { return table->save(jRecord, jStored); });
    }
    std::string list(const Json::Value& jCondition, const Json::Value& jOptions = {})
    {
        return outcome([&] { return table->list(jCondition, jOptions, jStored); });
    }
    std::string get(const Json::Value& jCondition)
    {
        return outcome([&] { return table->get(jCondition, jStored); });
    }
    std::string update(const Json::Value& jCondition, const Json::Value& jValues)
    {
        return outcome([&] { return table->update(jCondition, jValues); });
    }
    std::string remove(const Json::Value& jCondition)
    {
        return outcome([&] { return table->remove(jCondition); });
    }

    template <typename Call>
    std::string outcome(Call call)
    {
        jStored = "untouched";
        const int iAutocommit = sqlite3_get_autocommit(database_.get());
        const long long iResult = call();
        EXPECT_TRUE(0 <= iResult || Json::Value("untouched") == jStored) << jStored;
        EXPECT_EQ(iAutocommit, sqlite3_get_autocommit(database_.get()));
        expectIdle();
        return outcomeOf(*table, iResult);
    }

    std::string strName;
    std::unique_ptr<VornJsonTable> table;
    Json::Value jStored;

private:
    void expectIdle() const { EXPECT_EQ(nullptr, sqlite3_next_stmt(database_.get(), nullptr)); }

    Database& database_;
};

class FrontTest : public TableTest {};
