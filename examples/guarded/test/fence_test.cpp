// SPDX-License-Identifier: MIT
// What SQLite refuses inside the fence, wherever the statement comes from.

#include "world.h"

namespace {

constexpr int kRefused = -1;

class FenceTest : public HostTest {
protected:
    FenceTest()
    {
        rebuild(
            "create table note (id integer primary key autoincrement, text text);"
            "create table vault (secret text);"
            "insert into note values (1,'a'),(2,'b'); insert into vault values ('s')");
    }

    // Runs the statements without the fence, and then recreates it.
    void rebuild(const std::string& strSql)
    {
        pFence_.reset();
        database_.run(strSql);
        pFence_ = std::make_unique<Fence>(database_.get(), "note");
    }

    // 0, or -1 if SQLite refuses the statement and says why.
    int execute(const std::string& strSql)
    {
        const auto ignore = [](void*, int, char**, char**) { return 0; };
        iStatus_ = sqlite3_exec(database_.get(), strSql.c_str(), ignore, nullptr, nullptr);
        strError_ = sqlite3_errmsg(database_.get());
        return SQLITE_OK == iStatus_ ? 0 : kRefused;
    }

    int run(Access access, const std::string& strSql)
    {
        return pFence_->run(access, [&] { return execute(strSql); });
    }

    void expectNotAuthorized(Access access, const std::vector<std::string>& statements)
    {
        for (const std::string& strSql : statements) {
            EXPECT_EQ(kRefused, run(access, strSql)) << strSql;
            EXPECT_TRUE(std::string::npos != strError_.find("not authorized") ||
                        std::string::npos != strError_.find("prohibited"))
                << strSql << ": " << strError_;
        }
    }

    // Takes the fence away.
    std::string notes()
    {
        pFence_.reset();
        return database_.value("select group_concat(id || text) from note");
    }

    Database database_;
    std::unique_ptr<Fence> pFence_;
    int iStatus_ = SQLITE_OK;
    std::string strError_;
};

TEST_F(FenceTest, GivesEachAccessWhatItNeeds)
{
    const std::pair<Access, const char*> statements[] = {
        {Access::kRead, "select id,text from note where id=1 order by 'id' limit 1"},
        {Access::kInsert,
         "insert into note (id,text) values (3,'c');"
         "select * from note where rowid == last_insert_rowid()"},
        {Access::kInsert, "replace into note (id,text) values (3,'d')"},
        {Access::kUpdate, "update note set text='z' where (id=1)"},
        {Access::kDelete, "delete from note where (id=2)"},
    };
    for (const auto& [access, szSql] : statements) EXPECT_EQ(0, run(access, szSql)) << szSql;
    EXPECT_EQ("1z,3d", notes());
}

TEST_F(FenceTest, GivesNoFurtherAccessAndNoneBetweenCalls)
{
    const char* kSelect = "select * from note";
    const char* kInsert = "insert into note (id) values (3)";
    const char* kUpdate = "update note set text='z' where id=1";
    const char* kDelete = "delete from note where id=1";
    const char* kRowid = "select last_insert_rowid() from note";
    const std::vector<std::string> never = {
        // Other tables, including SQLite's own.
        "select * from vault", "select count(*) from vault", "insert into vault values ('x')",
        "update vault set secret=''", "delete from vault", "drop table vault",
        "select * from sqlite_sequence", "insert into sqlite_sequence values ('note',9)",
        "update sqlite_sequence set seq=0", "delete from sqlite_sequence",
        "select * from sqlite_master",
        // The schema, and the connection with its transactions.
        "create table x (a)", "create temp table note (a)", "alter table vault add column b",
        "pragma user_version=1", "attach ':memory:' as x", "commit", "savepoint x", "release x",
        "analyze", "create trigger x after insert on note begin delete from vault; end"};
    const std::pair<Access, std::vector<std::string>> cases[] = {
        {Access::kRead, {kInsert, kUpdate, kDelete, kRowid, "select count(*) from note"}},
        {Access::kInsert, {kUpdate, kDelete, "select length(text) from note"}},
        {Access::kUpdate,
         {kSelect, kInsert, kDelete, "update note set text=hex(text)",
          "update note set text=last_insert_rowid() where id=1"}},
        {Access::kDelete,
         {kSelect, kInsert, kUpdate, "delete from note where hex(text)=''",
          "delete from note where id=last_insert_rowid()"}},
        {Access::kNothing, {kSelect, kInsert, kUpdate, kDelete, kRowid, "begin"}},
    };
    for (const auto& [access, statements] : cases) {
        EXPECT_EQ(0, run(Access::kRead, kSelect));
        for (const char* szSql : {kSelect, "begin", "savepoint x"})
            EXPECT_EQ(kRefused, execute(szSql)) << "between two calls: " << szSql;
        expectNotAuthorized(access, statements);
        expectNotAuthorized(access, never);
    }
    EXPECT_EQ("1a,2b", notes());
    EXPECT_EQ("s", database_.value("select secret from vault"));
}

// Whoever can write a trigger into the file writes as the host does, but not inside the fence.
// Another table of that name, of the connection or of an attached file, is not the host's.
TEST_F(FenceTest, GivesNothingToTriggersAndOtherDatabases)
{
    rebuild(
        "attach ':memory:' as x; create table x.note (id integer primary key, text text);"
        "create trigger x after insert on note when new.id < 9 "
        "begin insert into note values (9,'x'); end");
    EXPECT_EQ(0, run(Access::kRead, "select * from note"));
    expectNotAuthorized(Access::kRead, {"select * from x.note"});
    expectNotAuthorized(Access::kInsert,
                        {"insert into note values (3,'c')", "insert into x.note values (1,'x')"});
    rebuild("create temp table note (id integer primary key, text text)");
    EXPECT_EQ(0, run(Access::kRead, "select * from main.note"));
    expectNotAuthorized(Access::kRead, {"select * from note"});
    expectNotAuthorized(Access::kDelete, {"delete from note where id=1"});
    rebuild("drop table temp.note");
    EXPECT_EQ("1a,2b", notes());
}

TEST_F(FenceTest, RollsBackFailuresAndMoreThanOneChange)
{
    const std::pair<Access, const char*> calls[] = {
        {Access::kDelete, "delete from note"},
        {Access::kInsert, "insert into note values (3,'c'); insert into note values (4,'d')"},
        {Access::kUpdate,
         "update note set text='z' where id=1; update note set text='z' where id=2"},
        {Access::kInsert, "insert into note values (3,'c'); nonsense"},
    };
    for (const auto& [access, szSql] : calls) EXPECT_EQ(kRefused, run(access, szSql)) << szSql;
    const auto work = [&]() -> int {
        EXPECT_EQ(0, execute("insert into note values (3,'c')"));
        throw std::runtime_error("late");
    };
    EXPECT_THROW(pFence_->run(Access::kInsert, work), std::runtime_error);
    EXPECT_EQ(kRefused, execute("select * from note"));
    EXPECT_EQ(1, sqlite3_get_autocommit(database_.get()));
    EXPECT_EQ("1a,2b", notes());
}

// How the message about a name goes on depends on the version of SQLite.
TEST_F(FenceTest, LimitsStatements)
{
    const std::string strSelect = "select id from note where ";
    const std::string strGrow = "update note set text=text||text where id=3";
    const struct {
        Access access;
        std::string strSql;
        int iStatus;
        const char* szError;
    } cases[] = {
        {Access::kRead, "select id from note union select id from note", SQLITE_ERROR, ""},
        {Access::kRead, strSelect + "id=1" + std::string(63 * 1024, ' '), SQLITE_OK, ""},
        {Access::kRead, strSelect + "id=1" + std::string(65 * 1024, ' '), SQLITE_TOOBIG, ""},
        {Access::kInsert, "insert into note values (3,'" + std::string(25 * 1024, 'x') + "')",
         SQLITE_OK, ""},
        {Access::kUpdate, strGrow, SQLITE_OK, ""},
        {Access::kUpdate, strGrow, SQLITE_TOOBIG, ""},
        {Access::kRead, strSelect + repeated(15, "not ") + "id", SQLITE_OK, ""},
        {Access::kRead, strSelect + repeated(25, "not ") + "id", SQLITE_ERROR, "maximum depth"},
        {Access::kRead, strSelect + "text='none'", SQLITE_OK, ""},
        {Access::kRead, strSelect + "text=\"none\"", SQLITE_ERROR, "no such column: "},
    };
    for (const auto& row : cases) {
        SCOPED_TRACE(row.strSql.substr(0, 100));
        EXPECT_EQ(SQLITE_OK == row.iStatus ? 0 : kRefused, run(row.access, row.strSql));
        EXPECT_EQ(row.iStatus, iStatus_);
        EXPECT_NE(std::string::npos, strError_.find(row.szError)) << strError_;
    }
    EXPECT_NE(std::string::npos, strError_.find("none")) << strError_;
}

TEST_F(FenceTest, StopsNothingOnceDestroyed)
{
    pFence_.reset();
    EXPECT_EQ("524288", database_.value("select count(*) from note" + repeated(18, " join note")));
}

// Whoever can write a CHECK into the file calls the host's own functions with it, and the
// authorizer is not asked about those.
TEST_F(FenceTest, IsDefensiveAndDoesNotTrustTheSchema)
{
    int iDefensive = 0;  // the authorizer refuses first what this would
    sqlite3_db_config(database_.get(), SQLITE_DBCONFIG_DEFENSIVE, -1, &iDefensive);
    EXPECT_EQ(1, iDefensive);

    const auto one = [](sqlite3_context* pContext, int, sqlite3_value**) {
        sqlite3_result_int(pContext, 1);
    };
    sqlite3_create_function(database_.get(), "one", 0, SQLITE_UTF8 | SQLITE_DETERMINISTIC, nullptr,
                            one, nullptr, nullptr);
    sqlite3_db_config(database_.get(), SQLITE_DBCONFIG_TRUSTED_SCHEMA, 1, nullptr);
    rebuild(
        "drop table note; create table note (id integer primary key, text text check (one()));"
        "insert into note values (1,'a')");
    EXPECT_EQ(kRefused, run(Access::kInsert, "insert into note values (3,'c')"));
    EXPECT_EQ("unsafe use of one()", strError_);
    EXPECT_EQ("1a", notes());
}

// The guard lets these through: they are good requests, but for the size of the table. Each call
// may take all its steps.
TEST_F(HostTest, StopsScansOfALargeTable)
{
    World large(World::Layers::kBoth, 200000);
    World medium(World::Layers::kBoth, 10000);
    for (int i = 0; i < 10; ++i) {
        medium.send(list(R"({"offset":9000,"limit":1})"));
        EXPECT_EQ(1U, medium.answers.back()["records"].size());
    }
    for (const char* szRequest : {R"({"offset":190000})", R"({"offset":190000,"limit":1})"}) {
        large.send(list(szRequest));
        EXPECT_EQ(R"({"error":"failed"})", text(large.answers.back()));
    }
    large.send(list(R"({"id":200000})"));
    EXPECT_EQ(1U, large.answers.back()["records"].size());
}

// The library alone would try 500 times to get a lock.
TEST_F(HostTest, AnswersWhileAnotherConnectionHoldsALock)
{
    Database database(Database::Place::kFile);
    Host host(database.get());
    Database other(database.path());
    const char* kFailed = R"({"error":"failed"})";
    const char* kNone = R"({"records":null,"result":0})";
    const std::string strCreate = create(R"({"text":"once"})");
    const std::pair<const char*, const char*> cases[] = {
        {"begin exclusive", kFailed},
        {"begin immediate", kNone},
        {"begin; select * from note", kNone},  // a reader keeps the commit from the file
    };
    for (const auto& [szSql, szListed] : cases) {
        SCOPED_TRACE(szSql);
        other.run(szSql);
        EXPECT_EQ(kFailed, text(host.answer(strCreate)));
        EXPECT_EQ(1, sqlite3_get_autocommit(database.get()));
        EXPECT_EQ(szListed, text(host.answer(list(R"({"id":1})"))));
        other.run("commit");
    }
    EXPECT_EQ(0U, doubles::state().sleeps.size());

    other.run("create unique index one on note (text)");
    EXPECT_EQ(0, host.answer(strCreate)["result"].asInt());
    EXPECT_EQ(R"({"error":"DUPLICATE_PRIMARY_KEY"})", text(host.answer(strCreate)));
    EXPECT_EQ(kFailed, text(host.answer(update(R"({"id":1})", R"({"topics":[1]})"))));
}

}  // namespace
