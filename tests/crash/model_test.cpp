// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// The check after a kill accepts what it must, and nothing else.

#include "crash/model.h"
#include "support/connection.h"

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
            write({Operation::kAlone, {{Step::kCreate, iId, iId}}});
            expected_.state[iId] = iId;
        }
    }
    ~CrashCheck() override { std::filesystem::remove(strPath_); }

    void write(const Operation& operation)
    {
        Store store(strPath_);
        EXPECT_TRUE(perform(store, operation));
    }
    // Without the library.
    void tamper(const std::string& strSql)
    {
        Store store(strPath_);
        sqlite::run(store.pDb, strSql);
        EXPECT_LT(0, sqlite3_changes(store.pDb));
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
    expected_.pending = kThree;
    expectVerdict(Verdict::kAbsent, "");
    write(kThree);
    expectVerdict(Verdict::kWhole, "");
}

TEST_F(CrashCheck, FindsARolledBackChange)
{
    expected_.pending = kThree;
    expected_.pending->frame = Operation::kRollback;
    expectVerdict(Verdict::kAbsent, "");
    write(kThree);
    const std::string strFound = "record 3 is not revision 3";
    expectVerdict(Verdict::kAbsent, strFound + "; with the operation: " + strFound);
}

TEST_F(CrashCheck, FindsAnOlderRevision)
{
    expected_.state = after(expected_.state, {Operation::kAlone, {{Step::kReplace, 5, 30}}});
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

using Tamper = std::pair<const char*, std::string>;

class Tampering : public CrashCheck, public testing::WithParamInterface<Tamper> {};

TEST_P(Tampering, IsFound)
{
    const auto& [szSql, strWrong] = GetParam();
    tamper(szSql);
    expectVerdict(Verdict::kNone, strWrong);
    expected_.pending = kThree;
    expectVerdict(Verdict::kAbsent, strWrong + "; with the operation: record 3 is not revision 21");
}

// The first of these is also half of an operation.
INSTANTIATE_TEST_SUITE_P(Records, Tampering,
                         testing::Values(Tamper("delete from item where id=4", "record 4 is lost"),
                                         Tamper("delete from item where id=5", "record 5 is lost"),
                                         Tamper("insert into item (id,rev) values (50,50)",
                                                "record 50 should not be there"),
                                         Tamper("update item set text=text||' ' where id=5",
                                                "record 5 is not revision 5")));

}  // namespace
