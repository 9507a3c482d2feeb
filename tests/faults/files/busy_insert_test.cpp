// SPDX-License-Identifier: MIT
// The n-th lock of an INSERT with its re-selection is held by somebody else.

#include "faults/files/busy.h"

namespace {

class BusyInsert : public Busy {
protected:
    using Busy::Busy;

    // The log of a recCreate that failed with that error after so many retries.
    Lines createFailed(const std::string& strError, int nRetries)
    {
        const std::string strRecord = R"({"id":50,"name":"new","note":"none","tags":{}})";
        const std::string& strSql = statements_.at(0);
        Table& table = host_.table;
        return {runFailed(strError, strSql, nRetries),
                failed("0 > runSqlEx(strSql, DbCallBackFillList, &jArrayTmp)"),
                plain("blCreate=1, jRecInOut=" + strRecord),
                plain("jType=" + text(VORN_JSON_DB::recType(table.jDefinition, table.strName))),
                sqlError(strError, strSql),
                failed("0 > recSave(jParam, true)"),
                plain("call create rec, rec=" + strRecord)};
    }
};

class BusyWithKeys : public BusyInsert {
protected:
    BusyWithKeys() : BusyInsert(kWithKeys) {}
};

const char kStored[] = R"({"id":50,"name":"new","note":"none","tags":{}})";

TEST_F(BusyInsert, InsertIsTriedAgainAndAddsOneRow)
{
    for (int n = 1; n <= kLocksOfInsert; ++n) {
        EXPECT_EQ(0, run("recCreate", onlyLock(n))) << n;
        EXPECT_EQ(2, nAttempts()) << n;
        EXPECT_EQ(n, nAdded());
        EXPECT_EQ(kStored, text(jOutput_));
    }
    EXPECT_EQ(Lines(), takeLog());
}

// Kept: the INSERT of each attempt stays.
TEST_F(BusyInsert, ReselectionAddsOneRowMoreForEachRetry)
{
    int nExpected = 0;
    for (const char* szOperation : {"recCreate", "recSaveInsert", "recSaveReplace"})
        for (int nHeld : {1, 2, 7, 499}) {
            EXPECT_EQ(0, run(szOperation, lockOfAttempts(kReselection, nHeld)));
            EXPECT_EQ(nHeld + 1, nAttempts());
            nExpected += nHeld + 1;
            EXPECT_EQ(nExpected, nAdded()) << szOperation << nHeld;
        }
    EXPECT_EQ(Lines(), takeLog());
}

TEST_F(BusyInsert, ReselectionForEverAddsFiveHundredRows)
{
    EXPECT_EQ(-1, run("recCreate", lockOfAttempts(kReselection, 1000)));
    EXPECT_EQ(500, nAttempts());
    EXPECT_EQ(500, nAdded());
    EXPECT_EQ(R"({"untouched":true})", text(jOutput_));
    EXPECT_EQ(createFailed("database is locked", 500), takeLog());
    EXPECT_EQ("", host_.table.api.getErrMsg());
}

TEST_F(BusyInsert, InsertForEverAddsNothing)
{
    EXPECT_EQ(-1, run("recCreate", everyLock));
    EXPECT_EQ(500, nAttempts());
    EXPECT_EQ(0, nAdded());
    EXPECT_EQ(createFailed("database is locked", 500), takeLog());
}

TEST_F(BusyInsert, EachRetryIsTraced)
{
    blDebugOutput = true;
    EXPECT_EQ(0, run("recSaveInsert", lockOfAttempts(kReselection, 2)));
    const std::string strTail =
        ", errno=?, run sql failed, error=database is locked, sql=" + statements_.at(0);
    const Lines expected{plain("retry, i=0" + strTail), plain("retry, i=1" + strTail)};
    EXPECT_EQ(expected, takeLog());
}

// Kept: the first attempt's row stands in the way of the second one.
TEST_F(BusyWithKeys, CreateFailsAfterItsRowIsWritten)
{
    EXPECT_EQ(-1, run("recCreate", onlyLock(kReselection)));
    EXPECT_EQ(2, nAttempts());
    EXPECT_EQ(1, nAdded());
    EXPECT_EQ(R"({"untouched":true})", text(jOutput_));
    EXPECT_EQ(createFailed("UNIQUE constraint failed: records.id", 1), takeLog());
    EXPECT_EQ("DUPLICATE_PRIMARY_KEY", host_.table.api.getErrMsg());
    EXPECT_EQ("50|new|none|{}",
              host_.database.value("select id||'|'||name||'|'||note||'|'||tags from records "
                                   "where id = 50"));
}

TEST_F(BusyWithKeys, SaveFailsAfterItsRowIsWritten)
{
    EXPECT_EQ(-1, run("recSaveInsert", onlyLock(kReselection)));
    EXPECT_EQ(2, nAttempts());
    EXPECT_EQ(1, nAdded());
    EXPECT_EQ(operation("recSaveInsert").szOutput, text(jOutput_));
    EXPECT_EQ("", host_.table.api.getErrMsg());
    EXPECT_EQ(5U, takeLog().size());
}

TEST_F(BusyWithKeys, ReplaceMayBeTriedAnyNumberOfTimes)
{
    EXPECT_EQ(0, run("recSaveReplace", lockOfAttempts(kReselection, 7)));
    EXPECT_EQ(8, nAttempts());
    EXPECT_EQ(0, nAdded());
    EXPECT_EQ(operation("recSaveReplace").szOutput, text(jOutput_));
    EXPECT_EQ(Lines(), takeLog());
}

class BusyInTransaction : public Busy, public testing::WithParamInterface<const char*> {
protected:
    BusyInTransaction() : Busy(GetParam()) {}
};

INSTANTIATE_TEST_SUITE_P(Tables, BusyInTransaction, testing::Values(kWithKeys, kWithoutKeys),
                         [](const auto& tested) {
                             return kWithKeys == tested.param ? "with_keys" : "without_keys";
                         });

// Inside the host's transaction all locks are held that could fail half-way.
TEST_P(BusyInTransaction, EveryOperationRunsOnce)
{
    for (const char* szOperation : {"recCreate", "recList", "recListTwice", "recDelete"}) {
        host_.database.run("begin immediate");
        const int iResult = run(szOperation, everyLock);
        EXPECT_EQ(operation(szOperation).iResult, iResult) << szOperation;
        EXPECT_EQ(1, nAttempts()) << szOperation;
        EXPECT_EQ(0, fault_vfs::counted(fault_vfs::kLock)) << szOperation;
        host_.database.run("rollback");
    }
    host_.database.run("begin immediate");
    EXPECT_EQ(0, run("recCreate", everyLock));
    host_.database.run("commit");
    EXPECT_EQ(1, nAdded());
    EXPECT_EQ(kStored, text(jOutput_));
    EXPECT_EQ(Lines(), takeLog());
}

}  // namespace
