// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// Shared by the tests that put every hostile string into a role.
#pragma once

#include "support/figures.h"
#include "support/matrix.h"

// Texts that something may trip over: quotes, SQL, control characters, bidirectional marks, invalid
// UTF-8, percent signs in all forms, NUL bytes and long texts.
const std::vector<std::string>& hostileStrings();

class HostileRoleTest : public TableTest {
protected:
    static constexpr char kMembers[] = R"({"n": {"cpptype": "int"},
                                           "o": {"cpptype": "Json::objectValue"},
                                           "s": {"cpptype": "string"}})";
    static constexpr char kSound[] = R"({"n":1,"o":{},"s":"sound"})";

    // A file for the journal of each transaction would take most of the time.
    HostileRoleTest() { database_.run("pragma journal_mode=memory"); }

    // The check for each string, on a table of two records, n=1 and n=2; then handle and connection
    // have to be sound. The figure counts nRoles a string.
    template <typename Check>
    void forEachString(std::size_t nRoles, Check check)
    {
        for (const std::string& strHostile : hostileStrings()) {
            SCOPED_TRACE(testing::PrintToString(strHostile.substr(0, 100)));
            database_.run("begin; delete from " + table_.strName + "; insert into " +
                          table_.strName + " values (1,'{}','one'),(2,'{}','two'); commit");
            check(strHostile);
            // A string that is SQL may have begun one.
            if (0 == sqlite3_get_autocommit(database_.get())) database_.run("rollback");
            doubles::state().log.clear();
            expectSound(database_, table_.api, kSound);
        }
        const auto* pTest = testing::UnitTest::GetInstance()->current_test_info();
        Figures::of(std::string("hostile strings in roles, ") + pTest->test_suite_name()) +=
            static_cast<long long>(nRoles * hostileStrings().size());
    }

    // A call that may end either way: -1 is logged, and nothing else is.
    static void expectEnds(int iResult)
    {
        EXPECT_LE(-1, iResult);
        EXPECT_EQ(-1 == iResult, !doubles::state().log.empty());
        doubles::state().log.clear();
    }

    // Texts end at their first NUL byte where they go through SQL.
    static std::string upToNul(const std::string& strText) { return strText.c_str(); }

    // With every quote doubled, as in an SQL literal.
    static std::string doubled(const std::string& strText)
    {
        std::string strOut;
        for (char c : upToNul(strText)) strOut.append('\'' == c ? 2 : 1, c);
        return strOut;
    }

    static Json::Value member(const std::string& strName, const Json::Value& jValue)
    {
        Json::Value jObject;
        jObject[strName] = jValue;
        return jObject;
    }

    static Json::Value listOf(const Json::Value& jItem)
    {
        Json::Value jList;
        jList.append(jItem);
        return jList;
    }

    Table table_{database_, kMembers, "n integer, o text, s text"};
};
