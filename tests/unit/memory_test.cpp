// SPDX-License-Identifier: MIT
// A lack of memory while a statement is composed.

#include "support/database.h"

#include <new>

namespace {

using doubles::state;

class Memory : public TableTest {
protected:
    // The value list of the record, or "no memory" when the n-th allocation of the call fails.
    std::string values(int n)
    {
        Json::Value jRecord = json(strRecord_);
        const std::string strBefore = "a text that is not short (";
        std::string strSql = strBefore;
        state().iFailNew = n;
        try {
            const int iResult = table_.api.SqlExpandMemberSymbol(strSql, jRecord);
            state().iFailNew = 0;
            EXPECT_EQ(0, iResult);
        } catch (const std::bad_alloc&) {
            EXPECT_EQ(strBefore, strSql);
            EXPECT_EQ(json(strRecord_), jRecord);
            return "no memory";
        }
        EXPECT_EQ(strBefore, strSql.substr(0, strBefore.size()));
        return strSql.substr(strBefore.size());
    }

    // Longer than the room that a JSON text begins with.
    const std::string strJson_ =
        R"({"first":"a text that is not short","second":")" + std::string(200, 'x') + "\"}";
    const std::string strRecord_ = "{\"j\":" + strJson_ + "}";
    const std::string strValues_ = "'" + strJson_ + "') ";

    Table table_{database_, R"({"j":{"cpptype":"Json::objectValue"}})", "j text"};
};

// JSON text is never cut and nothing of a text that was not finished gets into the next one.
TEST_F(Memory, MissingAtAnyAllocationOfAValueListLeavesNoHalfText)
{
    ASSERT_EQ(strValues_, values(0));
    int nThrown = 0;
    for (int n = 1;; ++n) {
        SCOPED_TRACE(n);
        const std::string strValues = values(n);
        if ("no memory" != strValues) {
            EXPECT_EQ(strValues_, strValues);
            break;
        }
        ++nThrown;
        EXPECT_EQ(strValues_, values(0));
    }
    EXPECT_LE(5, nThrown);
    EXPECT_EQ(Lines(), takeLog());
}

}  // namespace
