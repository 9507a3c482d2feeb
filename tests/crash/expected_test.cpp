// SPDX-License-Identifier: MIT
// The check after a kill lets pass what it has to, and nothing else.

#include "crash/expected.h"

#include <gtest/gtest.h>

#include <unistd.h>
#include <filesystem>
#include <fstream>

namespace {

// A database of the records 1 to 9, all acknowledged.
class CrashCheck : public testing::Test {
protected:
    CrashCheck() : strPath_("crash-check-" + std::to_string(getpid()) + ".db")
    {
        Store store(strPath_);
        Operation operation;
        for (int iId = 1; iId <= 9; ++iId)
            operation.steps = {{Step::kCreate, iId, iId}}, done(store, operation);
    }
    ~CrashCheck() override { std::filesystem::remove(strPath_); }

    void done(Store& store, const Operation& operation)
    {
        EXPECT_TRUE(perform(store, operation));
        EXPECT_TRUE(expected_.take("begin " + toLine(operation)));
        EXPECT_TRUE(expected_.take("done"));
    }
    void begin(const Operation& operation)
    {
        EXPECT_TRUE(expected_.take("begin " + toLine(operation)));
    }
    // Behind the back of the library.
    void tamper(const std::string& strSql)
    {
        Store store(strPath_);
        EXPECT_TRUE(store.run(strSql)) << strSql;
        EXPECT_LT(0, sqlite3_changes(store.connection()));
    }
    Verdict verdict() const { return check(strPath_, expected_); }

    std::string strPath_;
    Expected expected_;
};

const Operation kThree{Operation::kCommit,
                       {{Step::kCreate, 20, 20}, {Step::kReplace, 3, 21}, {Step::kDelete, 4, 22}}};

TEST_F(CrashCheck, PassesWhatWasAcknowledged)
{
    const Verdict verdict = this->verdict();
    EXPECT_EQ(Verdict::kNone, verdict.pending);
    EXPECT_EQ("", verdict.strWrong);
    EXPECT_EQ("", verdict.strCorrupt);
}

TEST_F(CrashCheck, PassesAPendingOperationAbsentOrWhole)
{
    begin(kThree);
    EXPECT_EQ(Verdict::kAbsent, verdict().pending);
    EXPECT_EQ("", verdict().strWrong);
    {
        Store store(strPath_);
        EXPECT_TRUE(perform(store, kThree));
    }
    EXPECT_EQ(Verdict::kWhole, verdict().pending);
    EXPECT_EQ("", verdict().strWrong);
}

TEST_F(CrashCheck, FindsALostRecord)
{
    tamper("delete from item where id=5");
    EXPECT_EQ("record 5 is lost", verdict().strWrong);
    begin(kThree);
    EXPECT_NE("", verdict().strWrong);
}

TEST_F(CrashCheck, FindsARecordTooMany)
{
    tamper("insert into item (id,rev) values (50,50)");
    EXPECT_EQ("record 50 should not be there", verdict().strWrong);
}

TEST_F(CrashCheck, FindsAChangedRecord)
{
    tamper("update item set text=text||' ' where id=5");
    EXPECT_EQ("record 5 is not revision 5", verdict().strWrong);
}

TEST_F(CrashCheck, FindsAnOlderRevision)
{
    const Operation replace{Operation::kAlone, {{Step::kReplace, 5, 30}}};
    expected_.take("begin " + toLine(replace));
    expected_.take("done");
    EXPECT_EQ("record 5 is not revision 30", verdict().strWrong);
}

TEST_F(CrashCheck, FindsHalfAnOperation)
{
    begin(kThree);
    tamper("delete from item where id=4");
    EXPECT_EQ(
        "record 4 is lost; with the operation [1 3 0 20 20 1 3 21 4 4 22]: "
        "record 3 is not revision 21",
        verdict().strWrong);
}

TEST_F(CrashCheck, FindsWhatWasRolledBack)
{
    Operation rolledBack = kThree;
    rolledBack.frame = Operation::kRollback;
    begin(rolledBack);
    EXPECT_EQ("", verdict().strWrong);
    Store store(strPath_);
    EXPECT_TRUE(perform(store, kThree));
    EXPECT_NE("", verdict().strWrong);
}

TEST_F(CrashCheck, FindsADamagedIndex)
{
    tamper(
        "pragma writable_schema=on; update sqlite_master set sql=replace(sql,'(rev)','(kind)') "
        "where type='index'");
    EXPECT_EQ("", verdict().strWrong);
    EXPECT_NE("", verdict().strCorrupt);
}

TEST_F(CrashCheck, FindsWhatIsNoDatabase)
{
    std::ofstream(strPath_) << std::string(4096, 'x');
    EXPECT_EQ("the records cannot be listed", verdict().strWrong);
    EXPECT_EQ("file is not a database", verdict().strCorrupt);
}

TEST(CrashReports, OfOtherFormsAreRefused)
{
    Expected expected;
    for (const char* szLine : {"", "done", "begin ", "begin 0 1", "begin 0 1 0 1", "begin 3 0",
                               "begin 0 1 6 1 1", "begin 0 1 0 1 1 x", "begun"})
        EXPECT_FALSE(Expected().take(szLine)) << szLine;
    EXPECT_TRUE(expected.take("begin 0 1 0 1 7"));
    EXPECT_FALSE(expected.take("begin 0 1 0 1 7"));
    EXPECT_EQ(7, expected.iLastRevision);
    EXPECT_EQ(State(), expected.state);
    EXPECT_TRUE(expected.take("done"));
    EXPECT_EQ((State{{1, 7}}), expected.state);
}

}  // namespace
