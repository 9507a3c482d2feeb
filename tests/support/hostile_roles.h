// SPDX-License-Identifier: MIT
// What the tests share that put every hostile string into a role.
#pragma once

#include "support/hostile_strings.h"
#include "support/matrix.h"

class HostileRoleTest : public TableTest {
protected:
    static constexpr char kMembers[] = R"({"n": {"cpptype": "int"},
                                           "o": {"cpptype": "Json::objectValue"},
                                           "s": {"cpptype": "string"}})";
    static constexpr char kSound[] = R"({"n":1,"o":{},"s":"sound"})";

    static void SetUpTestSuite() { nCases_ = 0; }
    static void TearDownTestSuite()
    {
        const auto* pSuite = testing::UnitTest::GetInstance()->current_test_suite();
        printFigure(std::string("hostile strings in roles, ") + pSuite->name(), nCases_);
    }

    // The check for each string, on a table of two records, n=1 and n=2; then handle and connection
    // have to be sound.
    template <typename Check>
    void forEachString(Check check)
    {
        for (const std::string& strHostile : hostileStrings()) {
            SCOPED_TRACE(testing::PrintToString(strHostile.substr(0, 100)));
            refill();
            check(strHostile);
            endTransaction();
            doubles::state().log.clear();
            refill();
            expectSound(database_, table_.api, kSound);
            ++nCases_;
        }
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

    static std::string doubled(const std::string& strText)
    {
        std::string strOut;
        for (char c : upToNul(strText)) strOut.append('\'' == c ? 2 : 1, c);
        return strOut;
    }

    static Json::Value member(const char* szName, const Json::Value& jValue)
    {
        Json::Value jObject;
        jObject[szName] = jValue;
        return jObject;
    }

    std::size_t rowCount() { return database_.rows("select 1 from " + table_.strName).size(); }

    Table table_{database_, kMembers, "n integer, o text, s text"};

private:
    void refill()
    {
        database_.run("delete from " + table_.strName);
        database_.run("insert into " + table_.strName +
                      " values (1, '{}', 'one'), (2, '{}', 'two')");
    }

    // Of a string that is SQL and has begun one.
    void endTransaction()
    {
        if (0 == sqlite3_get_autocommit(database_.get())) database_.run("rollback");
    }

    inline static std::size_t nCases_ = 0;
    UnwatchedLog unwatched_;
};
