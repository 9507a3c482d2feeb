// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// Another connection holds a lock, for as long as the table tries or for less.
#include "front/front.h"

namespace {

constexpr char kMembers[] = R"({"id":{"cpptype":"long long"},"text":{"cpptype":"string"}})";
constexpr char kColumns[] = "id integer primary key, text text unique";

class FrontLocks : public HostTest {
protected:
    explicit FrontLocks(const char* szJournal = "delete")
    {
        database_.run(std::string("pragma journal_mode=") + szJournal);
        front_ = std::make_unique<Front>(database_, kMembers, kColumns);
        EXPECT_EQ("0", front_->create(json(R"({"id":1,"text":"first"})")));
        other_.run("pragma busy_timeout=0");
    }

    template <typename Call>
    void expectLocked(Call call)
    {
        const auto before = doubles::state().sleeps.size();
        EXPECT_EQ("locked: locked: database is locked", call());
        EXPECT_EQ(500U, doubles::state().sleeps.size() - before);
        EXPECT_EQ(std::vector<std::string>(), front_->table->columns());
    }

    void expectWritesLocked()
    {
        expectLocked([&] { return front_->create(json(R"({"id":2,"text":"x"})")); });
        expectLocked([&] { return front_->createMany(json(R"([{"id":2},{"id":3}])")); });
        expectLocked([&] { return front_->save(json(R"({"id":1,"text":"x"})")); });
        expectLocked([&] { return front_->update(json(R"({"id":1})"), json(R"({"text":"x"})")); });
        expectLocked([&] { return front_->remove(json(R"({"id":1})")); });
    }

    void expectReadsLocked()
    {
        expectLocked([&] { return front_->list({}); });
        expectLocked([&] { return front_->get({}); });
        expectLocked([&] { return front_->outcome([&] { return front_->table->count({}); }); });
    }

    Database database_{Database::Place::kFile};
    Database other_{database_.path()};
    std::unique_ptr<Front> front_;
};

class FrontLocksInWal : public FrontLocks {
protected:
    FrontLocksInWal() : FrontLocks("wal") {}
};

TEST_F(FrontLocks, SayLockedAndLeaveNothing)
{
    other_.run("begin exclusive");
    expectWritesLocked();
    expectReadsLocked();
    other_.run("commit; begin immediate");
    expectWritesLocked();
    EXPECT_EQ("1", front_->list({}));
    other_.run("commit");
    EXPECT_EQ("1", front_->list({}));
    EXPECT_EQ(json(R"([{"id":1,"text":"first"}])"), front_->jStored);
}

TEST_F(FrontLocks, RetryTheCommitAlone)
{
    other_.run("begin; select * from sqlite_master");
    expectWritesLocked();
    EXPECT_EQ("1", front_->list({}));
    EXPECT_EQ(json(R"([{"id":1,"text":"first"}])"), front_->jStored);
    doubles::state().onSleep = [&] {
        if (0 == sqlite3_get_autocommit(other_.get())) other_.run("commit");
    };
    takeStatements();
    EXPECT_EQ("0", front_->create(json(R"({"id":2,"text":"x"})")));
    int nCommits = 0;
    for (const std::string& strSql : takeStatements()) nCommits += "commit" == strSql;
    EXPECT_EQ(2, nCommits);
    EXPECT_EQ("2", front_->list({}));
}

// Whenever the lock comes, a call that is tried again stores one record, and says no duplicate.
TEST_F(FrontLocks, NeverCallTheirOwnRecordADuplicate)
{
    for (int iStatement = 1; iStatement <= 4; ++iStatement) {
        SCOPED_TRACE(iStatement);
        int nRun = 0;
        bool blLocked = false;
        doubles::state().exec = [&](sqlite3* pDb, const char* szSql, doubles::RowCallback callback,
                                    void* arg, char** errText) {
            if (++nRun != iStatement || blLocked)
                return doubles::realExec(pDb, szSql, callback, arg, errText);
            blLocked = true;
            --nRun;
            *errText = doubles::errorText("database is locked");
            return SQLITE_BUSY;
        };
        Json::Value jRecord;
        jRecord["id"] = 10 + iStatement;
        jRecord["text"] = "t" + std::to_string(iStatement);
        EXPECT_EQ("0", front_->create(jRecord));
        EXPECT_TRUE(blLocked);
        doubles::state().exec = nullptr;
    }
    EXPECT_EQ("5", front_->list({}));
}

TEST_F(FrontLocks, SayLockedInTheHostsTransaction)
{
    other_.run("begin immediate");
    database_.run("begin");
    expectLocked([&] { return front_->create(json(R"({"id":2})")); });
    expectLocked([&] { return front_->createMany(json(R"([{"id":2},{"id":3}])")); });
    EXPECT_EQ(0, sqlite3_get_autocommit(database_.get()));
    other_.run("rollback");
    EXPECT_EQ("0", front_->create(json(R"({"id":2})")));
    database_.run("commit");
    EXPECT_EQ("2", other_.value("select count(*) from " + front_->strName));
}

TEST_F(FrontLocksInWal, StopWritersOnly)
{
    other_.run("begin immediate");
    expectWritesLocked();
    EXPECT_EQ("1", front_->list({}));
    other_.run("commit");
    EXPECT_EQ("0", front_->create(json(R"({"id":2})")));
}

TEST_F(FrontLocks, KeepTheConstructionFromReading)
{
    other_.run("begin exclusive");
    Json::Value jDefinition;
    jDefinition[front_->strName]["member"] = json(kMembers);
    VornJsonTable table(
        database_.get(), front_->strName, jDefinition,
        front_->named(std::string("create table if not exists @ (") + kColumns + ")"));
    EXPECT_EQ("locked: database is locked", table.reason());
    other_.run("commit");
    EXPECT_EQ(VornJsonTable::Cause::kLocked, table.cause());
    EXPECT_EQ(-1, table.count({}));
    EXPECT_EQ("locked: database is locked", table.reason());
    EXPECT_EQ(VornJsonTable::Cause::kLocked, table.cause());
}

}  // namespace
