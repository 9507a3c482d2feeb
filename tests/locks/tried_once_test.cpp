// SPDX-License-Identifier: MIT
// Errors that waiting does not cure are tried once.

#include "locks/calls.h"
#include "support/figures.h"
#include "support/records.h"

namespace {

using doubles::state;

class OnceTest : public HostTest {
protected:
    ~OnceTest() override { Figures::of("locks, findings") += HasFailure() ? 1 : 0; }

    // The statement was tried once, and nobody waited.
    std::string onlyStatement()
    {
        const std::vector<std::string> statements = takeStatements();
        EXPECT_EQ(1U, statements.size());
        EXPECT_TRUE(state().sleeps.empty());
        ++Figures::of("locks, errors tried once");
        return statements.at(0);
    }

    // The call fails with that error at its first attempt.
    void expectOnce(const Call& call, Table& table, const std::string& strError)
    {
        SCOPED_TRACE(call.szName);
        takeStatements();
        EXPECT_EQ(-1, call.run(table));
        const std::string strSql = onlyStatement();
        EXPECT_EQ(failure(call, table, strError, strSql, 0), takeLog());
    }

    void expectOnce(const std::string& strText, Table& table, const std::string& strError)
    {
        takeStatements();
        EXPECT_EQ(-1, table.api.runSqlEx(strText));
        EXPECT_EQ(strText, onlyStatement());
        EXPECT_EQ(
            Lines{plain("i=0,errno=?, run sql failed, error=" + strError + ", sql=" + strText)},
            takeLog());
    }

    static void expectWorking(const Call& call, Table& table)
    {
        EXPECT_EQ(call.iResult, call.run(table)) << call.szName;
        EXPECT_EQ(Lines(), takeLog());
    }
};

class TriedOnce : public OnceTest {
protected:
    TriedOnce() { addRecords(database_, strTable_); }

    void run(const std::string& strSql) { database_.run(strSql); }

    Database database_{Database::Place::kFile};
    Table table_{database_, kMembers, kColumns};
    const std::string strTable_ = table_.strName;
};

TEST_F(TriedOnce, UniqueViolation)
{
    run("insert into " + strTable_ + " values (9,'Eve','e')");
    expectOnce(call("recCreate"), table_, "UNIQUE constraint failed: " + strTable_ + ".id");
    EXPECT_EQ("DUPLICATE_PRIMARY_KEY", table_.api.getErrMsg());
    run("update " + strTable_ + " set id = 10, name = 'Zoe' where id = 9");
    for (const char* szCall : {"recUpdateByWhere", "recUpdateByFilter"})
        expectOnce(call(szCall), table_, "UNIQUE constraint failed: " + strTable_ + ".name");
    run("delete from " + strTable_ + " where id = 10");
    expectWorking(call("recCreate"), table_);
}

TEST_F(TriedOnce, ViolationOfAnotherConstraint)
{
    const std::string strText = "insert into " + strTable_ + " (id) values (5)";
    expectOnce(strText, table_, "NOT NULL constraint failed: " + strTable_ + ".note");
    run("create trigger refuse before delete on " + strTable_ +
        " begin select raise(abort, 'not this one'); end");
    expectOnce(call("recDeleteByName"), table_, "not this one");
    run("drop trigger refuse");
    expectWorking(call("recDeleteAll"), table_);
}

TEST_F(TriedOnce, SyntaxError)
{
    expectOnce("delete from " + strTable_ + " where", table_, "incomplete input");
    expectOnce("nonsense", table_, "near \"nonsense\": syntax error");
    Json::Value jRequest;
    jRequest["vornSqlWhereFilter"] = "id = = 1";
    EXPECT_EQ(-1, table_.api.recDelete(jRequest));
    const std::string strSql = onlyStatement();
    EXPECT_EQ(runFailed("near \"=\": syntax error", strSql), takeLog().at(0));
    expectWorking(call("recList"), table_);
}

TEST_F(TriedOnce, MissingTable)
{
    run("alter table " + strTable_ + " rename to away");
    for (const Call& call : calls())
        if (std::string("tableCreate") != call.szName)
            expectOnce(call, table_, "no such table: " + strTable_);
    run("alter table away rename to " + strTable_);
    expectWorking(call("recDeleteAll"), table_);
}

TEST_F(TriedOnce, FullDatabase)
{
    run("create trigger fill after insert on " + strTable_ + " begin update " + strTable_ +
        " set note = printf('%.99999c', 'x') where id = 1; end");
    EXPECT_EQ(database_.value("pragma page_count"), database_.value("pragma max_page_count=1"));
    for (const char* szCall : {"recCreate", "recSave"})
        expectOnce(call(szCall), table_, "database or disk is full");
    database_.value("pragma max_page_count=1000");
    expectWorking(call("recCreate"), table_);
}

// SQLite looks for an interrupt in the loops of a statement.
TEST_F(TriedOnce, Interrupt)
{
    run("with recursive n(i) as (select 10 union all select i+1 from n where i < 300) insert "
        "into " +
        strTable_ + " select i, i, 'more' from n");
    const std::string strCount = "select count(*) from " + strTable_ + " where note = 'more'";
    const auto interrupt = [](void* pDb) {
        sqlite3_interrupt(static_cast<sqlite3*>(pDb));
        return 0;
    };
    Json::Value jRequest;
    jRequest["vornSqlWhereFilter"] = "note > 'm'";
    Json::Value jRecord = json(R"({"note":"none"})");
    Json::Value jRecords;
    std::string strWhere = "id > 9";
    const std::function<int()> longCalls[] = {
        [&] { return table_.api.recList(jRequest, jRecords); },
        [&] { return table_.api.recUpdateByWhere(jRecord, strWhere); },
        [&] { return table_.api.recDelete(jRequest); },
    };
    for (const auto& longCall : longCalls) {
        sqlite3_progress_handler(database_.get(), 1, interrupt, database_.get());
        EXPECT_EQ(-1, longCall());
        sqlite3_progress_handler(database_.get(), 0, nullptr, nullptr);
        EXPECT_EQ(runFailed("interrupted", onlyStatement()), takeLog().at(0));
        EXPECT_EQ("291", database_.value(strCount));
    }
    EXPECT_GT(291U, jRecords.size());
    EXPECT_EQ(291, table_.api.recDelete(jRequest));
}

TEST_F(TriedOnce, RefusalByTheAuthorizer)
{
    const auto refuse = [](void*, int, const char*, const char*, const char*, const char*) {
        return SQLITE_DENY;
    };
    sqlite3_set_authorizer(database_.get(), refuse, nullptr);
    for (const char* szCall : {"recGetOne", "recDeleteAll", "recUpdateByFilter"})
        expectOnce(call(szCall), table_, "not authorized");
    sqlite3_set_authorizer(database_.get(), nullptr, nullptr);
    expectWorking(call("recGetOne"), table_);
}

// A table cannot be dropped while the same connection reads.
TEST_F(TriedOnce, TableLockedByItsOwnConnection)
{
    const std::string strSelect = "select * from " + strTable_;
    sqlite3_stmt* pReader = nullptr;
    ASSERT_EQ(SQLITE_OK,
              sqlite3_prepare_v2(database_.get(), strSelect.c_str(), -1, &pReader, nullptr));
    ASSERT_EQ(SQLITE_ROW, sqlite3_step(pReader));
    const std::string strDrop = "drop table " + strTable_;
    expectOnce(strDrop, table_, "database table is locked");
    sqlite3_finalize(pReader);
    EXPECT_LE(0, table_.api.runSqlEx(strDrop));
    EXPECT_EQ("0", database_.value("select count(*) from sqlite_master"));
}

// Kept: the words decide, whoever wrote them.
TEST_F(TriedOnce, ButNotATriggerThatSpeaksOfALock)
{
    const std::string strError = "the database is locked away";
    run("create trigger refuse before delete on " + strTable_ + " begin select raise(abort, '" +
        strError + "'); end");
    EXPECT_EQ(-1, call("recDeleteAll").run(table_));
    const std::vector<std::string> statements = takeStatements();
    EXPECT_EQ(500U, statements.size());
    EXPECT_EQ(std::vector<unsigned>(500, 10000), state().sleeps);
    EXPECT_EQ(failure(call("recDeleteAll"), table_, strError, statements.at(0), 500), takeLog());
}

// Connections to one file, opened in a special way.
class TriedOnceBeside : public OnceTest {
protected:
    explicit TriedOnceBeside(const std::string& strParameter)
        : strUri_("file:" +
                  (owner_.run("create table " + strTable_ + " (" + kColumns + ")"),
                   addRecords(owner_, strTable_), owner_.path()) +
                  "?" + strParameter)
    {
    }

    const std::string strTable_ = freshName();
    Database owner_{Database::Place::kFile};
    const std::string strUri_;
    Database database_{strUri_};
    Table table_{database_, strTable_, kMembers, kColumns};
};

class TriedOnceReadOnly : public TriedOnceBeside {
protected:
    TriedOnceReadOnly() : TriedOnceBeside("mode=ro") {}
};

TEST_F(TriedOnceReadOnly, File)
{
    for (const Call& call : calls()) {
        if (call.blWrites)
            expectOnce(call, table_, "attempt to write a readonly database");
        else
            expectWorking(call, table_);
    }
}

class TriedOnceSharedCache : public TriedOnceBeside {
protected:
    TriedOnceSharedCache() : TriedOnceBeside("cache=shared") {}

    Database other_{strUri_};
};

TEST_F(TriedOnceSharedCache, LockedTable)
{
    other_.run("begin immediate; update " + strTable_ + " set note = 'x'");
    for (const Call& call : calls()) {
        if (std::string("tableCreate") == call.szName) continue;
        expectOnce(
            call, table_,
            call.blWrites ? "database table is locked" : "database table is locked: " + strTable_);
    }
    other_.run("rollback");
    expectWorking(call("recDeleteAll"), table_);
}

TEST_F(TriedOnceSharedCache, LockedSchema)
{
    other_.run("begin immediate; create table another (a)");
    for (const Call& call : calls()) expectOnce(call, table_, "database schema is locked: main");
    other_.run("rollback");
    expectWorking(call("recDeleteAll"), table_);
}

}  // namespace
