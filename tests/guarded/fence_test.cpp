// What SQLite refuses behind the fence, whatever the statement comes from.

#include "world.h"

namespace {

class FenceTest : public HostTest {
protected:
    static constexpr int kRefused = -1;

    FenceTest()
    {
        database_.run(
            "create table note (id integer primary key, text text);"
            "create table vault (secret text);"
            "insert into note values (1,'a'),(2,'b'); insert into vault values ('s')");
        pFence_ = std::make_unique<Fence>(database_.get(), "note");
    }

    // 0, or -1 where SQLite refuses the statement and says why.
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

    void expectNotAuthorized(Access access, const std::string& strSql)
    {
        EXPECT_EQ(kRefused, run(access, strSql)) << strSql;
        EXPECT_TRUE(std::string::npos != strError_.find("not authorized") ||
                    std::string::npos != strError_.find("prohibited"))
            << strSql << ": " << strError_;
    }

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
    EXPECT_EQ(0, run(Access::kRead, "select id,text from note where id=1 order by 'id' limit 1"));
    EXPECT_EQ(0, run(Access::kInsert,
                     "insert into note (id,text) values (3,'c');"
                     "select * from note where rowid == last_insert_rowid()"));
    EXPECT_EQ(0, run(Access::kInsert, "replace into note (id,text) values (3,'d')"));
    EXPECT_EQ(0, run(Access::kUpdate, "update note set text='z' where (id=1)"));
    EXPECT_EQ(0, run(Access::kDelete, "delete from note where (id=2)"));
    EXPECT_EQ("1z,3d", notes());
}

TEST_F(FenceTest, GivesNoneMore)
{
    const char* kSelect = "select * from note";
    const char* kInsert = "insert into note (id) values (3)";
    const char* kUpdate = "update note set text='z' where id=1";
    const char* kDelete = "delete from note where id=1";
    const struct {
        Access access;
        std::vector<std::string> statements;
    } cases[] = {
        {Access::kRead, {kInsert, kUpdate, kDelete, "select count(*) from note"}},
        {Access::kInsert, {kUpdate, kDelete, "select length(text) from note"}},
        {Access::kUpdate, {kSelect, kInsert, kDelete, "update note set text=hex(text)"}},
        {Access::kDelete, {kSelect, kInsert, kUpdate, "delete from note where hex(text)=''"}},
        {Access::kNothing, {kSelect, kInsert, kUpdate, kDelete, "begin"}},
    };
    for (const auto& row : cases)
        for (const std::string& strSql : row.statements) expectNotAuthorized(row.access, strSql);

    for (const Access access :
         {Access::kRead, Access::kInsert, Access::kUpdate, Access::kDelete, Access::kNothing})
        for (const char* szSql :
             {"select * from vault", "select count(*) from vault", "insert into vault values ('x')",
              "update vault set secret=''", "delete from vault", "drop table vault",
              "select * from sqlite_master", "create table x (a)", "create temp table note (a)",
              "alter table vault add column b", "pragma user_version=1", "attach ':memory:' as x",
              "commit", "savepoint x", "release x", "analyze",
              "create trigger x after insert on note begin delete from vault; end"})
            expectNotAuthorized(access, szSql);
    EXPECT_EQ(kRefused, execute("select 1")) << "between two calls";
    EXPECT_EQ("1a,2b", notes());
    EXPECT_EQ("s", database_.value("select secret from vault"));
}

// Whoever can write a trigger into the file writes as the host does, but not behind the fence.
TEST_F(FenceTest, GivesNothingToTriggers)
{
    pFence_.reset();
    database_.run(
        "create trigger x after insert on note when new.id < 9 "
        "begin insert into note values (9,'x'); end");
    pFence_ = std::make_unique<Fence>(database_.get(), "note");
    expectNotAuthorized(Access::kInsert, "insert into note values (3,'c')");
    EXPECT_EQ("1a,2b", notes());
}

TEST_F(FenceTest, TakesBackMoreThanOneChange)
{
    EXPECT_EQ(kRefused, run(Access::kDelete, "delete from note"));
    EXPECT_EQ(kRefused, run(Access::kInsert,
                            "insert into note values (3,'c');"
                            "insert into note values (4,'d')"));
    EXPECT_EQ(kRefused, run(Access::kUpdate,
                            "update note set text='z' where id=1;"
                            "update note set text='z' where id=2"));
    EXPECT_EQ("1a,2b", notes());
}

TEST_F(FenceTest, TakesBackWhatFails)
{
    EXPECT_EQ(kRefused, run(Access::kInsert, "insert into note values (3,'c'); nonsense"));
    EXPECT_THROW(pFence_->run(Access::kInsert,
                              [&]() -> int {
                                  EXPECT_EQ(0, execute("insert into note values (3,'c')"));
                                  throw std::runtime_error("late");
                              }),
                 std::runtime_error);
    EXPECT_EQ(kRefused, execute("select * from note"));
    EXPECT_EQ(1, sqlite3_get_autocommit(database_.get()));
    EXPECT_EQ("1a,2b", notes());
}

TEST_F(FenceTest, KnowsNoUnion)
{
    EXPECT_EQ(kRefused, run(Access::kRead, "select id from note union select id from note"));
    EXPECT_EQ(SQLITE_ERROR, iStatus_);
}

TEST_F(FenceTest, LimitsTheSizeOfStatementsAndTexts)
{
    const std::string strText(600 * 1024, 'x');
    EXPECT_EQ(kRefused, run(Access::kInsert, "insert into note values (3,'" + strText + "')"));
    EXPECT_EQ(SQLITE_TOOBIG, iStatus_);
    EXPECT_EQ(512 * 1024, sqlite3_limit(database_.get(), SQLITE_LIMIT_LENGTH, -1));
    int iDefensive = 0;
    sqlite3_db_config(database_.get(), SQLITE_DBCONFIG_DEFENSIVE, -1, &iDefensive);
    EXPECT_EQ(1, iDefensive);
    EXPECT_EQ("1a,2b", notes());
}

// The guard lets these through: they are good requests, but for the size of the table.
TEST_F(HostTest, FencedScansOfALargeTableEnd)
{
    World world(World::Layers::kBoth, 200000);
    for (const char* szRequest :
         {R"({"author":"nobody"})", R"({"offset":190000})", R"({"text":["none"]})"})
        world.send(std::string(R"({"op":"list","request":)") + szRequest + "}");
    for (const Json::Value& jAnswer : world.answers)
        EXPECT_EQ(R"({"error":"failed"})", text(jAnswer));
    world.send(R"({"op":"list","request":{"id":200000}})");
    EXPECT_EQ(1U, world.answers.back()["records"].size());
    world.stop();
}

// The library alone would try 500 times.
TEST_F(HostTest, FencedCallsDoNotWaitForALock)
{
    Database database(Database::Place::kFile);
    Host host(database.get());
    sqlite3* pOther = nullptr;
    ASSERT_EQ(SQLITE_OK, sqlite3_open(database.path().c_str(), &pOther));
    ASSERT_EQ(SQLITE_OK, doubles::realExec(pOther, "begin exclusive", nullptr, nullptr, nullptr));
    const std::string strLine = R"({"op":"create","record":{"id":1}})";
    EXPECT_EQ(R"({"error":"failed"})", text(host.answer(strLine)));
    EXPECT_EQ(0U, doubles::state().sleeps.size());
    EXPECT_EQ(SQLITE_OK, sqlite3_close(pOther));
    EXPECT_EQ(0, host.answer(strLine)["result"].asInt());
    EXPECT_EQ(R"({"error":"DUPLICATE_PRIMARY_KEY"})", text(host.answer(strLine)));
}

}  // namespace
