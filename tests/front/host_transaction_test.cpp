// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// Calls in a transaction of the host's, and what ends one.
#include "front/front.h"

namespace {

class HostTransaction : public FrontTest {
protected:
    Front front_{database_, R"({
                     "id":   {"cpptype": "long long"},
                     "name": {"cpptype": "string"},
                     "note": {"cpptype": "string", "cppDefaultValue": "none"}})",
                 "id integer primary key, name text unique, note text not null"};
};

TEST_F(HostTransaction, WorksInsideTheHostsTransaction)
{
    database_.run("begin");
    EXPECT_EQ("0", front_.create(json(R"({"id":1,"name":"a"})")));
    EXPECT_EQ(front_.named("duplicate: duplicate: UNIQUE constraint failed: @.name"),
              front_.create(json(R"({"id":2,"name":"a"})")));
    EXPECT_EQ("1", front_.update(json(R"({"id":1})"), json(R"({"note":"x"})")));
    EXPECT_EQ("1", front_.list({}));
    database_.run("rollback");
    EXPECT_EQ("0", front_.list({}));
}

TEST_F(HostTransaction, EndsWhenTheHostsTransactionIsLost)
{
    Front front(database_, R"({"id":{"cpptype":"long long"}})",
                "id integer primary key on conflict rollback");
    EXPECT_EQ("0", front.create(json(R"({"id":1})")));
    database_.run("begin");
    Json::Value jStored;
    EXPECT_EQ(-1, front.table->create(json(R"({"id":1})"), jStored));
    EXPECT_EQ("duplicate: UNIQUE constraint failed: " + front.strName + ".id",
              front.table->reason());
    EXPECT_EQ(1, sqlite3_get_autocommit(database_.get()));
}

TEST_F(HostTransaction, BlamesNoRecordForWhatFailsAtTheCommit)
{
    Front front(database_, R"({"id":{"cpptype":"long long"},"of":{"cpptype":"long long"}})",
                "id integer primary key, of integer references @ deferrable initially deferred");
    EXPECT_EQ("", front.table->reason());
    front.run("pragma foreign_keys=on");
    EXPECT_EQ("2", front.createMany(json(R"([{"id":1,"of":2},{"id":2}])")));
    EXPECT_EQ("invalid: FOREIGN KEY constraint failed",
              front.createMany(json(R"([{"id":3},{"id":4,"of":9},{"id":5}])")));
    EXPECT_EQ(-1, front.table->record());
    EXPECT_EQ("2", front.list({}));
}

// The trigger sees a row of the host's transaction, so a second attempt after it would succeed.
TEST_F(HostTransaction, TriesNothingAgainOutsideTheHostsTransaction)
{
    front_.run(
        "create table @_closed (a); create trigger @_t before insert on @ when new.id = 3 and "
        "exists (select 1 from @_closed) begin select raise(rollback, 'closed'); end");
    const Json::Value jRecords = json(R"([{"id":1},{"id":2},{"id":3},{"id":4}])");
    front_.run("begin; insert into @_closed values (1)");
    EXPECT_EQ(-1, front_.table->createMany(jRecords));
    EXPECT_EQ("record 2: closed", front_.table->reason());
    EXPECT_EQ(2, front_.table->record());
    EXPECT_EQ(VornJsonTable::Cause::kInvalid, front_.table->cause());
    EXPECT_EQ(1, sqlite3_get_autocommit(database_.get()));
    EXPECT_EQ("0", front_.list({}));
    EXPECT_EQ("4", front_.createMany(jRecords));
}

// A call that cannot begin undoes nothing of the one around it.
TEST_F(HostTransaction, KeepsACallWhoseTriggerCallsAnotherTable)
{
    Front log(database_, R"({"id":{"cpptype":"long long"}})", "id integer primary key");
    const auto write = [](sqlite3_context* pContext, int, sqlite3_value**) {
        Json::Value jStored;
        auto* pLog = static_cast<VornJsonTable*>(sqlite3_user_data(pContext));
        EXPECT_EQ(-1, pLog->create(json(R"({"id":1})"), jStored));
        sqlite3_result_null(pContext);
    };
    ASSERT_EQ(SQLITE_OK, sqlite3_create_function(database_.get(), "write", 0, SQLITE_UTF8,
                                                 log.table.get(), write, nullptr, nullptr));
    front_.run("create trigger @_t after delete on @ begin select write(); end");
    EXPECT_EQ("2", front_.createMany(json(R"([{"id":1},{"id":2}])")));
    database_.run("begin");
    EXPECT_EQ(1, front_.table->remove(json(R"({"id":1})")));
    database_.run("commit");
    EXPECT_EQ((Rows{{"2"}}), front_.rows("select id from @"));
}

}  // namespace
