// SPDX-License-Identifier: MIT
// The check after a kill accepts what it has to, and nothing else.

#include "crash/model.h"

#include <gtest/gtest.h>

#include <unistd.h>
#include <filesystem>
#include <fstream>

namespace {

const Operation kThree{Operation::kCommit,
                       {{Step::kCreate, 20, 20}, {Step::kReplace, 3, 21}, {Step::kDelete, 4, 22}}};

// A database of the records 1 to 9, all acknowledged.
class CrashCheck : public testing::Test {
protected:
    CrashCheck() : strPath_("crash-check-" + std::to_string(getpid()) + ".db")
    {
        for (int iId = 1; iId <= 9; ++iId) {
            const Operation operation{Operation::kAlone, {{Step::kCreate, iId, iId}}};
            write(operation);
            begin(operation);
            EXPECT_TRUE(expected_.take("done"));
        }
    }
    ~CrashCheck() override { std::filesystem::remove(strPath_); }

    void write(const Operation& operation)
    {
        Store store(strPath_);
        EXPECT_TRUE(perform(store, operation));
    }
    void begin(const Operation& operation)
    {
        EXPECT_TRUE(expected_.take("begin " + toLine(operation)));
    }
    // Without the library.
    void tamper(const std::string& strSql)
    {
        Store store(strPath_);
        EXPECT_TRUE(store.run(strSql)) << strSql;
        EXPECT_LT(0, sqlite3_changes(store.connection()));
    }
    void expectVerdict(Verdict::Pending pending, const std::string& strWrong,
                       const std::string& strCorrupt = "")
    {
        const Verdict verdict = check(strPath_, expected_);
        EXPECT_EQ(pending, verdict.pending);
        EXPECT_EQ(strWrong, verdict.strWrong);
        EXPECT_EQ(strCorrupt, verdict.strCorrupt);
    }

    std::string strPath_;
    Expected expected_;
};

TEST_F(CrashCheck, AcceptsAPendingOperationAbsentOrComplete)
{
    expectVerdict(Verdict::kNone, "");
    begin(kThree);
    expectVerdict(Verdict::kAbsent, "");
    write(kThree);
    expectVerdict(Verdict::kWhole, "");
}

TEST_F(CrashCheck, FindsARolledBackChange)
{
    Operation rolledBack = kThree;
    rolledBack.frame = Operation::kRollback;
    begin(rolledBack);
    expectVerdict(Verdict::kAbsent, "");
    write(kThree);
    const std::string strFound = "record 3 is not revision 3";
    expectVerdict(Verdict::kAbsent,
                  strFound + "; with the operation [2 3 0 20 20 1 3 21 4 4 22]: " + strFound);
}

TEST_F(CrashCheck, FindsAnOlderRevision)
{
    begin({Operation::kAlone, {{Step::kReplace, 5, 30}}});
    EXPECT_TRUE(expected_.take("done"));
    expectVerdict(Verdict::kNone, "record 5 is not revision 30");
}

TEST_F(CrashCheck, FindsADamagedIndex)
{
    tamper(
        "pragma writable_schema=on; update sqlite_master set sql=replace(sql,'(rev)','(kind)') "
        "where type='index'");
    EXPECT_EQ("", check(strPath_, expected_).strWrong);
    EXPECT_NE("", check(strPath_, expected_).strCorrupt);
}

TEST_F(CrashCheck, FindsAFileThatIsNotADatabase)
{
    std::ofstream(strPath_) << std::string(4096, 'x');
    expectVerdict(Verdict::kNone, "the records cannot be listed", "file is not a database");
}

const char* const kTamperings[][2] = {
    {"delete from item where id=4", "record 4 is lost"},
    {"delete from item where id=5", "record 5 is lost"},
    {"insert into item (id,rev) values (50,50)", "record 50 should not be there"},
    {"update item set text=text||' ' where id=5", "record 5 is not revision 5"},
};

// The first of these is also half of an operation.
TEST_F(CrashCheck, FindsALostChangedOrExtraRecord)
{
    const std::string strSound = strPath_ + ".sound";
    std::filesystem::rename(strPath_, strSound);
    for (const auto& [szSql, szWrong] : kTamperings) {
        std::filesystem::copy_file(strSound, strPath_,
                                   std::filesystem::copy_options::overwrite_existing);
        tamper(szSql);
        expectVerdict(Verdict::kNone, szWrong);
        begin(kThree);
        const std::string strThree = "; with the operation [1 3 0 20 20 1 3 21 4 4 22]: ";
        expectVerdict(Verdict::kAbsent, szWrong + strThree + "record 3 is not revision 21");
        expected_.pending.reset();
    }
    std::filesystem::remove(strSound);
}

TEST(CrashReports, MalformedLinesAreRefused)
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
