// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// What all record operations do alike when their statement fails or has to wait.

#include "support/record_calls.h"
#include "support/rows.h"

namespace {

class Operations : public RecordsTest {
protected:
    struct Row {
        Words call;
        Outcome success;
        bool blCounts = false;  // the number of changed rows is checked
    };

    static constexpr char kEve[] = R"({"data":{},"flag":false,"id":4,"name":"Eve","tags":[]})";
    static constexpr char kWithEve[] = "1Ann1,2Bob0,3O'Brien1,4Eve0";
    static std::string savedEve(bool blCreate)
    {
        return saved(blCreate, "data,flag,id,name,tags", "'{}',0,4,'Eve','[]') ");
    }
    const std::string strUpdate_ = "UPDATE $ SET name='Eve' WHERE ";
    const std::string strList_ = listed("123");
    const std::vector<Row> rows_ = {
        {save(kEve, true), {0, savedEve(true), kEve, kWithEve}},
        {save(kEve, false), {0, savedEve(false), kEve, kWithEve}},
        {create(kEve), {0, savedEve(true), kEve, kWithEve}},
        {list("null"), {0, select(";"), strList_.c_str(), kBefore}},
        {get("null"), {1, select(";"), record('1'), kBefore}},
        {updateByWhere(R"({"name":"Eve"})", "id=1"),
         {0, strUpdate_ + "id=1;", nullptr, "1Eve1,2Bob0,3O'Brien1"},
         true},
        {updateByFilter(R"({"id":1})", R"({"name":"Eve"})"),
         {0, strUpdate_ + " (id=1 );", nullptr, "1Eve1,2Bob0,3O'Brien1"},
         true},
        {remove(R"({"id":1})"),
         {1, "DELETE FROM $  WHERE  (id=1 );", nullptr, "2Bob0,3O'Brien1"},
         true},
        {removeAll(), {3, "DELETE FROM $ ;", nullptr, ""}, true},
        {removeByArray({"Ann"}, "name"),
         {1, "DELETE FROM $  WHERE  (name in ('Ann' ) );", nullptr, "2Bob0,3O'Brien1"},
         true},
        {removeByName("Ann", "name"),
         {1, "DELETE FROM $  WHERE  (name in ('Ann' ) );", nullptr, "2Bob0,3O'Brien1"},
         true},
    };
};

TEST_F(Operations, RunOneStatement)
{
    for (const Row& row : rows_) expect(row.call, row.success);
}

TEST_F(Operations, WaitForALock)
{
    lock(3);
    for (const Row& row : rows_) expect(row.call, row.success);
}

TEST_F(Operations, GiveUpAfterFiveHundredAttempts)
{
    lock(500);
    for (const Row& row : rows_)
        expectSqlFailure(row.call, row.success.strSql, "database is locked");
}

TEST_F(Operations, ReportTheErrorOfTheStatement)
{
    prepare_ = [] { doubles::state().exec = execOfStatus(SQLITE_IOERR, "disk I/O error"); };
    for (const Row& row : rows_) expectSqlFailure(row.call, row.success.strSql, "disk I/O error");
}

// The rows are changed nevertheless.
TEST_F(Operations, FailOnANegativeNumberOfChangedRows)
{
    prepare_ = [] { doubles::state().changes = [] { return -7; }; };
    blWritten_ = true;
    for (const Row& row : rows_)
        if (row.blCounts) expectSqlFailure(row.call, row.success.strSql, "Unknow Error!!");
}

// Only deletes return the number.
TEST_F(Operations, AcceptAnyOtherNumberOfChangedRows)
{
    prepare_ = [] { doubles::state().changes = [] { return 2147483647; }; };
    for (Row row : rows_) {
        if (isRemoval(row.call)) row.success.iResult = 2147483647;
        expect(row.call, row.success);
    }
}

// Kept: the text of the last failure counts, whether the failing call ran SQL or not.
TEST_F(Operations, ReportAnEarlierDuplicateAgain)
{
    VornJsonDbApi other(database_.get(), table_.strName, table_.jDefinition, table_.strCreate);
    const auto end = [](VornJsonDbApi& api, const Words& call) { return called(api, call).strEnd; };
    for (const Words& call : {create("{}"), updateByFilter("{}", kEve)}) {
        table_.api.setErrMsg("");
        EXPECT_EQ(-1, table_.api.runSqlEx("insert into " + table_.strName + " (id) values (1)"));
        EXPECT_EQ("", table_.api.getErrMsg());
        EXPECT_EQ("-1", end(table_.api, call));
        EXPECT_EQ("DUPLICATE_PRIMARY_KEY", table_.api.getErrMsg());
        // Handles do not share their error texts.
        EXPECT_EQ("-1", end(other, call));
        EXPECT_EQ("", other.getErrMsg());
        // A success clears the text, but not the message.
        EXPECT_EQ("1", end(table_.api, get("null")));
        EXPECT_EQ("DUPLICATE_PRIMARY_KEY", table_.api.getErrMsg());
        table_.api.setErrMsg("");
        EXPECT_EQ("-1", end(table_.api, call));
        EXPECT_EQ("", table_.api.getErrMsg());
    }
}

}  // namespace
