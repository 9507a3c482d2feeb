// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// The prepared statements of createMany(): where they could store, or find, something else than the
// text of a record would.
#include "front/front.h"

namespace {

constexpr char kMembers[] = R"({
    "id":   {"cpptype": "long long"},
    "name": {"cpptype": "string"},
    "tags": {"cpptype": "Json::arrayValue"}})";
constexpr char kColumns[] = "id integer primary key, name text, tags text";

class Bound : public FrontTest {
protected:
    Front front_{database_, kMembers, kColumns};
};

Json::Value records(Json::ArrayIndex nRecords)
{
    Json::Value jRecords;
    for (Json::ArrayIndex u = 0; u < nRecords; ++u) jRecords[u]["name"] = "n" + std::to_string(u);
    return jRecords;
}

TEST_F(Bound, RefusesWhatIsTooLongForSqlite)
{
    sqlite3_limit(database_.get(), SQLITE_LIMIT_LENGTH, 1000);
    Json::Value jRecords = records(2);
    jRecords[1]["name"] = std::string(2000, 'x');
    EXPECT_EQ("failed: record 1: string or blob too big", front_.createMany(jRecords));
    jRecords[1] = json("{}");
    for (int i = 0; i < 1000; ++i) jRecords[1]["tags"].append(i);
    EXPECT_EQ(0U, front_.createMany(jRecords).find("failed: record 1: "));
    EXPECT_EQ("0", front_.list({}));
}

TEST_F(Bound, StoresEachRecordOnceIfStatementsGiveTheirCount)
{
    database_.run("pragma count_changes=1");
    EXPECT_EQ("2", front_.createMany(records(2)));
    database_.run("pragma count_changes=0");
    EXPECT_EQ("2", front_.list({}));
}

TEST_F(Bound, CountsTheStepsOfEachRecordAlone)
{
    front_.table->setLimits({0, 0, 0, 0, 500});
    EXPECT_EQ("300", front_.createMany(records(300)));
    front_.table->setLimits({0, 0, 0, 0, 0});
    EXPECT_EQ("300", front_.outcome([&] { return front_.table->count({}); }));
}

TEST_F(Bound, NoticesWhatUtf16Replaces)
{
    Database wide;
    wide.run("pragma encoding='UTF-16'");
    Front front(wide, kMembers, kColumns);
    EXPECT_EQ("1", front.createMany(json(R"([{"name":"Grüße 🙂"}])")));
    EXPECT_EQ("changed: record 1: member \"name\": the row differs or is gone; see the triggers",
              front.createMany(json(R"([{"name":"a"},{"name":"\uffff"}])")));
    EXPECT_EQ("1", front.list({}));
    EXPECT_EQ("Grüße 🙂", front.jStored[0]["name"].asString());
}

TEST_F(Bound, TriesNothingTwice)
{
    front_.run(
        "create table @_log (id); create trigger @_t before insert on @ begin "
        "insert into @_log values (new.id); "
        "select raise(fail, 'first') where (select count(*) from @_log where id = new.id) < 2; "
        "end");
    EXPECT_EQ("invalid: record 0: first", front_.createMany(json(R"([{"id":1}])")));
    EXPECT_EQ("0", front_.list({}));
    EXPECT_EQ((Rows{{"0"}}), front_.rows("select count(*) from @_log"));
}

TEST_F(Bound, ComparesEachRecordWithItsRow)
{
    const char* const kTriggers[] = {"update @ set name = 'N1' where name = 'n1'",
                                     "update @ set name = x'6e32' where name = 'n1'",
                                     "update @ set tags = '[ ]' where name = 'n1'",
                                     "update @ set id = -2 where name = 'n1'",
                                     "delete from @ where name = 'n1'"};
    for (const char* szTrigger : kTriggers) {
        SCOPED_TRACE(szTrigger);
        front_.run(std::string("create trigger @_t after insert on @ begin ") + szTrigger +
                   "; end");
        Json::Value jRecords = records(3);
        jRecords[1]["tags"] = Json::Value(Json::arrayValue);
        const std::string strOutcome = front_.createMany(jRecords);
        // Another text of the same value is the same.
        if (std::string::npos == std::string(szTrigger).find("[ ]")) {
            EXPECT_EQ(0U, strOutcome.find("changed: record 1: member "));
            EXPECT_EQ("0", front_.list({}));
        } else {
            EXPECT_EQ("3", strOutcome);
            front_.table->removeAll();
        }
        front_.run("drop trigger @_t");
    }
}

TEST_F(Bound, RefusesHolesInTheArray)
{
    Json::Value jHoles;
    jHoles[2]["id"] = 1;
    EXPECT_EQ("refused: record 0: the record is null, expected an object",
              front_.createMany(jHoles));
    Json::Value jCondition;
    jCondition["$or"][1]["id"] = 1;
    EXPECT_EQ("refused: the condition is null, expected an object", front_.list(jCondition));
}

TEST_F(Bound, LeavesTheDefaultsOfColumnsToTheText)
{
    Front front(database_, R"({"id":{"cpptype":"int"},"n":{"cpptype":"int"}})",
                "id int primary key, n integer default 3");
    EXPECT_EQ("3", front.createMany(json(R"([{"id":1,"n":5},{"id":2},{"id":3,"n":null}])")));
    EXPECT_EQ("3", front.list({}));
    EXPECT_EQ(json(R"([{"id":1,"n":5},{"id":2,"n":3},{"id":3}])"), front.jStored);
}

TEST_F(Bound, KeepsItsPositionToItself)
{
    EXPECT_EQ("2", front_.createMany(records(2)));
    const auto clash = [&](const Json::Value& jRecord) {
        Json::Value jTwice;
        jTwice[0]["id"] = 77;
        jTwice[1] = jRecord;
        EXPECT_EQ(-1, front_.table->createMany(jTwice));
        EXPECT_EQ(1, front_.table->record());
        return true;
    };
    EXPECT_EQ(2, front_.table->each({}, {}, clash));
    EXPECT_EQ(-1, front_.table->record());
    EXPECT_EQ(-1, front_.table->each({}, json(R"({"sort":7})"), clash));
    EXPECT_EQ("option \"sort\": the integer 7, expected an array of names", front_.table->reason());
}

}  // namespace
