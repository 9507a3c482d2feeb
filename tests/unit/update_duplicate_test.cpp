// SPDX-License-Identifier: MIT
// The duplicate message that comes with a failed update by filter.

#include "support/filter_update.h"

namespace {

class UpdateDuplicate : public UpdateByFilterTest {};

TEST_F(UpdateDuplicate, TellsTheHostOfADuplicate)
{
    const struct {
        const char* szValues;
        const char* szSet;
        const char* szColumn;
    } cases[] = {
        {R"({"name":"Bob"})", "name='Bob'", ".name"},
        {R"({"id":2})", "id=2", ".id"},
    };
    for (const auto& row : cases) {
        table_.api.setErrMsg("");
        EXPECT_EQ(-1, update(R"({"id":1})", row.szValues));
        const std::string strSql = statement(std::string(row.szSet) + " WHERE  (id=1 );");
        EXPECT_EQ(refused("UNIQUE constraint failed: " + table_.strName + row.szColumn, strSql,
                          row.szValues),
                  takeLog());
        EXPECT_EQ("DUPLICATE_PRIMARY_KEY", table_.api.getErrMsg());
        EXPECT_EQ("1Ann1,2Bob0,3O'Brien1", contents());
    }
    // Nothing but the host clears it.
    EXPECT_EQ(0, update(R"({"id":1})", R"({"flag":true})"));
    EXPECT_EQ("DUPLICATE_PRIMARY_KEY", table_.api.getErrMsg());
    EXPECT_EQ(-1, update(R"({"id":1})", "{}"));
    EXPECT_EQ("DUPLICATE_PRIMARY_KEY", table_.api.getErrMsg());
}

TEST_F(UpdateDuplicate, AnotherConstraintIsNoDuplicate)
{
    Table table(database_, R"({"n":{"cpptype":"int"}})", "n integer check (n < 10)");
    database_.run("insert into " + table.strName + " values (1)");
    jFilter_ = json(R"({"n":1})");
    jValues_ = json(R"({"n":11})");
    table.api.setErrMsg("mine");
    EXPECT_EQ(-1, table.api.recUpdateByFilter(jFilter_, jValues_));
    EXPECT_EQ(refused("CHECK constraint failed: n < 10",
                      "UPDATE " + table.strName + " SET n=11 WHERE  (n=1 );", R"({"n":11})"),
              takeLog());
    EXPECT_EQ("mine", table.api.getErrMsg());
}

TEST_F(UpdateDuplicate, AnEarlierDuplicateCountsForEveryFailureWithoutSql)
{
    makeStaleDuplicate();
    const struct {
        const char* szFilter;
        const char* szValues;
    } cases[] = {
        {"{}", R"({"id":5})"},
        {"[1]", R"({"id":5})"},
        {R"({"id":1})", "[1]"},
        {R"({"vornSqlWhereFilter":5})", R"({"id":5})"},
        {R"({"undeclared":5})", R"({"id":5})"},
        {R"({"id":1})", R"({"id":"5"})"},
        {R"({"id":1})", "{}"},
    };
    for (const auto& row : cases) {
        table_.api.setErrMsg("");
        EXPECT_EQ(-1, update(row.szFilter, row.szValues)) << row.szFilter;
        EXPECT_EQ("DUPLICATE_PRIMARY_KEY", table_.api.getErrMsg()) << row.szFilter;
    }
    EXPECT_EQ(Lines(), takeStatements());
    takeLog();

    // Only the level below has a line for the text.
    EXPECT_EQ(-1, update(R"({"id":1})", "{}"));
    EXPECT_EQ((Lines{failed("jRecIn.empty()"), plain("jRecIn={}"),
                     sqlError("UNIQUE constraint failed: " + table_.strName + ".id", ""), kNoUpdate,
                     summary("{}")}),
              takeLog());
    EXPECT_EQ(-1, update("{}", "{}"));
    EXPECT_EQ((Lines{failed("jFilterIn.empty()"), summary("{}")}), takeLog());

    // A statement that succeeds, of whatever operation, ends it.
    EXPECT_EQ(0, update(R"({"id":9})", R"({"flag":true})"));
    table_.api.setErrMsg("");
    EXPECT_EQ(-1, update("{}", "{}"));
    EXPECT_EQ("", table_.api.getErrMsg());
}

TEST_F(UpdateDuplicate, AnEarlierErrorOfAnotherKindLeavesTheMessage)
{
    makeStale();
    table_.api.setErrMsg("mine");
    EXPECT_EQ(-1, update("{}", "{}"));
    EXPECT_EQ("mine", table_.api.getErrMsg());
    EXPECT_EQ((Lines{failed("jFilterIn.empty()"), summary("{}")}), takeLog());
}

TEST_F(UpdateDuplicate, ADuplicateOfOneHandleIsNoneOfAnother)
{
    makeStaleDuplicate();
    VornJsonDbApi other(database_.get(), table_.strName, table_.jDefinition, table_.strCreate);
    EXPECT_EQ(-1, other.recUpdateByFilter(jFilter_, jValues_));
    EXPECT_EQ("", other.getErrMsg());
}

TEST_F(UpdateDuplicate, AReplaceTakesAwayTheRowsInItsWayAndIsNoDuplicate)
{
    Json::Value jRecord = json(R"({"flag":true,"id":1,"name":"Bob","tags":[2]})");
    EXPECT_EQ(0, table_.api.recSave(jRecord, false));
    EXPECT_EQ("1Bob1,3O'Brien1", contents());
    EXPECT_EQ(0, update(R"({"name":"Bob"})", R"({"id":2})"));
    EXPECT_EQ("2Bob1,3O'Brien1", contents());
    EXPECT_EQ("", table_.api.getErrMsg());
    EXPECT_EQ(Lines(), takeLog());
}

}  // namespace
