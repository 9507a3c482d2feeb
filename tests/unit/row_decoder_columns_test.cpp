// SPDX-License-Identifier: MIT
// Columns without a name, at places that no row of the process had before.

#include "support/rows.h"

namespace {

class NamelessColumn : public TableTest {
protected:
    // The lines, but the last, of a row that has the nameless column behind nOthers others, which
    // have "s".
    Lines refused(Table& table, int nOthers)
    {
        std::string strSql = "select ";
        for (int i = 0; i < nOthers; ++i) strSql += "'x' as s,";
        strSql += "1 as \"\"";
        Json::Value jRows;
        EXPECT_EQ(-1, table.api.runSqlEx(strSql, rowCallback(table), &jRows));
        EXPECT_TRUE(jRows.isNull());
        Lines lines = takeLog();
        EXPECT_EQ(6U, lines.size());
        lines.resize(5);
        return lines;
    }

    static Lines linesBehind(const std::string& strFirst, int nOthers)
    {
        const std::string strPlace = "[" + std::to_string(nOthers) + "]=";
        return {strFirst,
                failed("0 > (iTmp = DbCallBackFillField(*pjRec, column_name, column_value, i))"),
                plain("column_name" + strPlace), plain("column_value" + strPlace + "1"),
                failed("0 > DbCallBackFillRec(&jTmp, n_column, column_value, column_name)")};
    }
};

TEST_F(NamelessColumn, IsLookedUpLikeEveryOther)
{
    Table table(database_, R"({"s":{"cpptype":"string"}})", "s");
    EXPECT_EQ(linesBehind(failed("!jType.isMember(strName)"), 70), refused(table, 70));
}

TEST_F(NamelessColumn, WithAnEmptyTypeWordIsOfNoType)
{
    Table table(database_, R"({"s":{"cpptype":"string"},"":{"cpptype":""}})", "s");
    EXPECT_EQ(linesBehind(error("type error, strType="), 80), refused(table, 80));
}

class OtherColumns : public TableTest {};

TEST_F(OtherColumns, OfTheNextNameAreNotTakenForTheOnesBefore)
{
    Table table(database_, R"({"a":{"cpptype":"string"},"b":{"cpptype":"string"}})", "a");
    for (const char* szName : {"a", "b", "a"}) {
        const std::string strName = szName;
        for (int i = 0; i < 3; ++i) {
            Json::Value jRows;
            EXPECT_EQ(0,
                      table.api.runSqlEx("select 'x' as " + strName, rowCallback(table), &jRows));
            EXPECT_EQ("[{\"" + strName + "\":\"x\"}]", text(jRows));
        }
    }
}

}  // namespace
