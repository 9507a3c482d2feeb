// SPDX-License-Identifier: MIT
// The n-th lock of a list, and of every other operation, is held by somebody else.

#include "faults/files/busy.h"

#include <cerrno>

namespace {

using namespace fault_vfs;

class BusyList : public Busy {
protected:
    BusyList()
    {
        Json::Value jRequest;
        EXPECT_EQ(0, host_.table.api.recList(jRequest, jAll_));
        EXPECT_EQ(kRecords, static_cast<int>(jAll_.size()));
    }

    // All records, so many times.
    Json::Value all(int nTimes) const
    {
        Json::Value jRecords(Json::arrayValue);
        for (int i = 0; i < nTimes; ++i)
            for (const Json::Value& jRecord : jAll_) jRecords.append(jRecord);
        return jRecords;
    }

    Json::Value jAll_;
};

TEST_F(BusyList, OfOneStatementIsTriedAgain)
{
    EXPECT_EQ(0, run("recList", onlyLock(1)));
    EXPECT_EQ(2, nAttempts());
    EXPECT_EQ(all(1), jOutput_);
    EXPECT_EQ(0, run("recList", onlyLock(2)));
    EXPECT_EQ(1, nAttempts());
    EXPECT_EQ(all(1), jOutput_);
    EXPECT_EQ(Lines(), takeLog());
}

// Kept: the rows of each attempt stay in the array.
TEST_F(BusyList, OfTwoStatementsRepeatsTheRowsOfTheFirst)
{
    EXPECT_EQ(0, run("recListTwice", onlyLock(1)));
    EXPECT_EQ(all(2), jOutput_);
    for (int nHeld : {1, 2, 7, 499}) {
        EXPECT_EQ(0, run("recListTwice", lockOfAttempts(2, nHeld)));
        EXPECT_EQ(nHeld + 1, nAttempts());
        EXPECT_EQ(all(nHeld + 2), jOutput_);
    }
    EXPECT_EQ(Lines(), takeLog());
}

TEST_F(BusyList, ForEverKeepsTheRowsOfEveryAttempt)
{
    EXPECT_EQ(-1, run("recListTwice", lockOfAttempts(2, 1000)));
    EXPECT_EQ(500, nAttempts());
    EXPECT_EQ(all(500), jOutput_);
    const std::string strError = "database is locked";
    const std::string& strSql = statements_.at(0);
    const Lines expected{
        runFailed(strError, strSql, 500),
        failed("0 > runSqlEx(strSqlRun, DbCallBackFillList, &jRecArrayOut)"),
        plain(R"(jRecParam={"vornSqlWhereFilter":"1); SELECT id,name,note,tags FROM records )"
              R"(WHERE (1"})"),
        sqlError(strError, strSql)};
    EXPECT_EQ(expected, takeLog());
}

// Kept: EAGAIN counts as a lock, whatever failed. Such a failure can come between two rows, and a
// transaction is no help.
TEST_F(BusyList, RepeatsItsFirstRowsWhereAReadWouldHaveToWait)
{
    const DiskFile file({Journal::kDelete});
    std::size_t nRepeated = 0;
    for (int nFailing = 1, iFailed = 1; 0 < iFailed; ++nFailing) {
        file.restore();
        Host host(file);
        jOutput_ = Json::Value(Json::arrayValue);
        follow({kRead, onlyLock(nFailing), false, EAGAIN});
        EXPECT_EQ(0, operation("recList").run(host, jOutput_));
        lift();
        iFailed = fault_vfs::failed();
        EXPECT_EQ(0 < iFailed ? 2U : 1U, takeStatements().size()) << nFailing;
        ASSERT_LE(jAll_.size(), jOutput_.size());
        const Json::ArrayIndex nFirst = jOutput_.size() - jAll_.size();
        nRepeated += nFirst;
        for (Json::ArrayIndex i = 0; i < jOutput_.size(); ++i)
            EXPECT_EQ(jAll_[i < nFirst ? i : i - nFirst], jOutput_[i]) << nFailing;
    }
    EXPECT_LT(0U, nRepeated);
    EXPECT_EQ(Lines(), takeLog());
}

// Also the locks that a connection takes before its first statement.
class BusyOperation : public HostTest {
protected:
    // How many of the points made the operation fail.
    static int failures(const Operation& operation, Journal journal)
    {
        const DiskFile file({journal, operation.blWithRecords});
        std::string strUndisturbed;
        int nFailures = 0;
        for (int nHeld = 0, iFailed = 1; 0 < iFailed; ++nHeld) {
            file.restore();
            {
                Host host(file);
                follow({kLock | kLockShared, onlyLock(nHeld)});
                Json::Value jOutput = json(operation.szOutput);
                const int iResult = operation.run(host, jOutput);
                lift();
                iFailed = 0 == nHeld ? 1 : fault_vfs::failed();
                Figures::of("locks, points failed") += fault_vfs::failed();
                if (iResult != operation.iResult) ++nFailures;
                EXPECT_EQ(-1 == iResult, !takeLog().empty());
            }
            if (0 == nHeld) strUndisturbed = contents(file);
            EXPECT_EQ(strUndisturbed, contents(file)) << operation.szName << nHeld;
        }
        return nFailures;
    }
};

TEST_F(BusyOperation, IsTriedAgain)
{
    for (const Operation& operation : operations()) {
        const std::string strName = operation.szName;
        const bool blInsert = "recCreate" == strName || "recSaveInsert" == strName;
        EXPECT_EQ(blInsert ? 1 : 0, failures(operation, Journal::kDelete)) << strName;
        EXPECT_EQ(0, failures(operation, Journal::kWal)) << strName;
    }
}

}  // namespace
