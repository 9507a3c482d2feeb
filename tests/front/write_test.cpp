// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// Creating many, saving, updating and deleting.
#include "front/front.h"

namespace {

constexpr char kMembers[] = R"({
    "id":   {"cpptype": "long long"},
    "name": {"cpptype": "string"},
    "note": {"cpptype": "string", "cppDefaultValue": "none"},
    "tags": {"cpptype": "Json::arrayValue"}})";
constexpr char kColumns[] =
    "id integer primary key, name text unique, note text not null, tags text";

constexpr char kMissingKey[] = "refused: member \"id\": missing, expected the whole key";
constexpr char kDiffers[] = ": the row differs or is gone; see the triggers";

class Write : public FrontTest {
protected:
    Json::Value all()
    {
        EXPECT_NE("", front_.list({}));
        return front_.jStored;
    }
    void expectUnchanged(const std::string& strOutcome, const std::string& strActual)
    {
        EXPECT_EQ(strOutcome, strActual);
        EXPECT_EQ(before_, all());
    }
    void begin(const char* szRecords)
    {
        EXPECT_EQ(std::to_string(json(szRecords).size()), front_.createMany(json(szRecords)));
        before_ = all();
    }

    Front front_{database_, kMembers, kColumns};
    Json::Value before_;
};

constexpr char kTwo[] = R"([{"id":1,"name":"a"},{"id":2,"name":"b","tags":[1]}])";

TEST_F(Write, CreatesManyWithoutATextForEach)
{
    Json::Value jRecords(Json::arrayValue);
    for (int i = 0; i < 250; ++i) {
        jRecords[i]["id"] = i;
        jRecords[i]["name"] = "%d '" + std::to_string(i);
    }
    takeStatements();
    EXPECT_EQ("250", front_.createMany(jRecords));
    const std::vector<std::string> statements = {
        "begin immediate", front_.named("insert into @ select * from @ where 0"), "commit"};
    EXPECT_EQ(statements, takeStatements());
    const Json::Value jStored = all();
    for (int i = 0; i < 250; ++i) EXPECT_EQ(jRecords[i]["name"], jStored[i]["name"]);
}

TEST_F(Write, RunsACallForEachStatement)
{
    takeStatements();
    EXPECT_EQ("0", front_.create(json(R"({"id":1,"name":"it's"})")));
    const std::vector<std::string> statements = {
        "begin immediate",
        front_.named("insert into @ (id,name,note,tags) values (1,'it''s','none',null)"),
        front_.named("SELECT id,name,note,tags FROM @  WHERE  ( (id)=(1)  );"), "commit"};
    EXPECT_EQ(statements, takeStatements());
    EXPECT_EQ("1", front_.list(json(R"({"id":1})")));
    EXPECT_EQ("begin", takeStatements().at(0));
}

TEST_F(Write, CreatesManyOrNone)
{
    begin(kTwo);
    const struct {
        const char* szRecords;
        const char* szOutcome;
        long long iRecord;
    } cases[] = {
        {R"([{"id":3,"name":"c"},{"id":4,"name":"a"},{"id":5,"name":"d"}])",
         "duplicate: record 1: duplicate: UNIQUE constraint failed: @.name", 1},
        {R"([{"id":3,"name":"c"},{"id":3,"name":"d"}])",
         "duplicate: record 1: duplicate: UNIQUE constraint failed: @.id", 1},
        {R"([{"name":"c"},{"id":30},{"id":4,"nam":"a"}])",
         "refused: record 2: member \"nam\": not declared for the table \"@\"", 2},
        {R"([{"id":3},{"id":4},7])",
         "refused: record 2: the record is the integer 7, expected an object", 2},
        {R"({"id":3})", "refused: the records are an object, expected an array", -1},
    };
    for (const auto& one : cases) {
        SCOPED_TRACE(one.szRecords);
        expectUnchanged(front_.named(one.szOutcome), front_.createMany(json(one.szRecords)));
        EXPECT_EQ(-1, front_.table->record());  // all() was the last call
        front_.createMany(json(one.szRecords));
        EXPECT_EQ(one.iRecord, front_.table->record());
    }
    Json::Value jMany = json("[]");
    for (int i = 0; i < 250; ++i) jMany[i]["name"] = "n" + std::to_string(i % 203);
    expectUnchanged(
        front_.named("duplicate: record 203: duplicate: UNIQUE constraint failed: @.name"),
        front_.createMany(jMany));
    EXPECT_EQ("0", front_.createMany(json("[]")));
    // What is bound to a prepared statement is not logged.
    doubles::reset();
    front_.createMany(json(R"([{"id":3,"name":"private"},{"id":4,"name":"a"}])"));
    EXPECT_TRUE(doubles::state().log.empty());
    EXPECT_EQ("4", front_.createMany(json(
                       R"([{"id":3},{"name":"x"},{"note":"y"},{"id":9,"name":null,"tags":[]}])")));
}

TEST_F(Write, SavesByTheKey)
{
    begin(kTwo);
    EXPECT_EQ("0", front_.save(json(R"({"id":1,"tags":["%"]})")));
    EXPECT_EQ(json(R"({"id":1,"name":"a","note":"none","tags":["%"]})"), front_.jStored);
    EXPECT_EQ("0", front_.save(json(R"({"id":2,"name":null,"tags":null})")));
    EXPECT_EQ(json(R"({"id":2,"note":"none"})"), front_.jStored);
    EXPECT_EQ("0", front_.save(json(R"({"id":2})")));
    EXPECT_EQ("0", front_.save(json(R"({"id":3,"name":"c"})")));
    EXPECT_EQ(json(R"({"id":3,"name":"c","note":"none"})"), front_.jStored);
    before_ = all();
    expectUnchanged(front_.named("duplicate: duplicate: UNIQUE constraint failed: @.name"),
                    front_.save(json(R"({"id":2,"name":"a"})")));
    expectUnchanged(front_.named("duplicate: duplicate: UNIQUE constraint failed: @.name"),
                    front_.save(json(R"({"id":9,"name":"a"})")));
    expectUnchanged(front_.named("invalid: NOT NULL constraint failed: @.note"),
                    front_.save(json(R"({"id":2,"note":null})")));
    expectUnchanged(kMissingKey, front_.save(json(R"({"name":"x"})")));
    expectUnchanged(kMissingKey, front_.save(json(R"({"id":null,"name":"x"})")));
}

TEST_F(Write, SavesAKeyThatOnlyTheCollationFindsEqual)
{
    Front front(database_, R"({"code":{"cpptype":"string"},"n":{"cpptype":"int"}})",
                "code text collate nocase primary key, n integer");
    EXPECT_EQ("0", front.create(json(R"({"code":"abc","n":1})")));
    EXPECT_EQ("0", front.save(json(R"({"code":"ABC"})")));
    EXPECT_EQ(json(R"({"code":"ABC","n":1})"), front.jStored);
    EXPECT_EQ("duplicate: duplicate: UNIQUE constraint failed: " + front.strName + ".code",
              front.create(json(R"({"code":"aBc"})")));
}

// A text key of another program's may be NULL, in many rows.
TEST_F(Write, UpdatesRecordsWithoutAKey)
{
    Front front(database_, R"({"code":{"cpptype":"string"},"n":{"cpptype":"int"}})",
                "code text primary key, n integer");
    front.run("insert into @ values (null, 1), (null, 2), ('a', 3)");
    EXPECT_EQ("3", front.update(json(R"({"n":{"$gt":0}})"), json(R"({"n":7})")));
    EXPECT_EQ("3", front.list(json(R"({"n":7})")));
    EXPECT_EQ("refused: member \"code\": missing, expected the whole key",
              front.update(json(R"({"n":7})"), json(R"({"code":null})")));
}

TEST_F(Write, UpdatesAndRemovesByACondition)
{
    begin(R"([{"id":1,"name":"a"},{"id":2,"name":"b"},{"id":3,"name":"c"}])");
    EXPECT_EQ("2", front_.update(json(R"({"id":{"$gte":2}})"), json(R"({"tags":["%s",[1]]})")));
    EXPECT_EQ("2",
              front_.outcome([&] { return front_.table->count(json(R"({"tags":["%s",[1]]})")); }));
    EXPECT_EQ("0", front_.update(json(R"({"id":7})"), json(R"({"note":"x"})")));
    EXPECT_EQ("1", front_.update(json(R"({"id":3})"), json(R"({"id":30,"name":null})")));
    before_ = all();
    const std::string strDuplicate = "duplicate: duplicate: UNIQUE constraint failed: ";
    expectUnchanged(strDuplicate + front_.strName + ".name",
                    front_.update(json(R"({"id":{"$lt":9}})"), json(R"({"name":"z"})")));
    expectUnchanged("refused: there are no values to set",
                    front_.update(json(R"({"id":1})"), json("{}")));
    expectUnchanged(
        "refused: the condition is empty; updateAll() and removeAll() take every record",
        front_.update({}, json(R"({"note":"x"})")));
    expectUnchanged(
        "refused: the condition is empty; updateAll() and removeAll() take every record",
        front_.remove(json("{}")));
    EXPECT_EQ("1", front_.remove(json(R"({"name":{"$in":["b","x"]}})")));
    EXPECT_EQ("2",
              front_.outcome([&] { return front_.table->updateAll(json(R"({"note":"y"})")); }));
    EXPECT_EQ(json(R"([{"id":1,"name":"a","note":"y"},{"id":30,"note":"y","tags":["%s",[1]]}])"),
              all());
    EXPECT_EQ("2", front_.outcome([&] { return front_.table->removeAll(); }));
    EXPECT_EQ("0", front_.outcome([&] { return front_.table->count({}); }));
}

TEST_F(Write, UndoesAnUpdateThatATriggerChanged)
{
    begin(kTwo);
    const struct {
        const char* szTrigger;
        std::string strOutcome;
    } cases[] = {
        {"before update on @ begin select raise(ignore); end", "changed: "},
        {"after update on @ when new.note = 'x' begin update @ set note = 'y'; end",
         std::string("changed: member \"note\"") + kDiffers},
        {"after update on @ begin delete from @ where id = new.id; end", "changed: member"},
    };
    for (const auto& one : cases) {
        SCOPED_TRACE(one.szTrigger);
        front_.run(std::string("create trigger @_t ") + one.szTrigger);
        const Json::Value jNote = json(R"({"note":"x"})");
        EXPECT_EQ(0U, front_.update(json(R"({"id":1})"), jNote).find(one.strOutcome));
        EXPECT_EQ(before_, all());
        EXPECT_EQ(0U, front_.save(json(R"({"id":1,"note":"x"})")).find(one.strOutcome));
        EXPECT_EQ(before_, all());
        front_.run("drop trigger @_t");
    }
    // A trigger may write elsewhere.
    front_.run(
        "create table @_log (a); create trigger @_t after update on @ "
        "begin insert into @_log values (1); end");
    EXPECT_EQ("1", front_.update(json(R"({"id":1})"), json(R"({"note":"x"})")));
}

TEST_F(Write, TakesWhatATriggerAdds)
{
    begin(kTwo);
    front_.run(
        "create trigger @_t after update on @ "
        "begin update @ set tags = '[\"seen\"]' where id = new.id; end");
    EXPECT_EQ("1", front_.update(json(R"({"id":1})"), json(R"({"note":"x"})")));
    EXPECT_EQ("0", front_.save(json(R"({"id":2,"note":"y"})")));
    EXPECT_EQ(json(R"({"id":2,"name":"b","note":"y","tags":["seen"]})"), front_.jStored);
    EXPECT_EQ("0", front_.save(json(R"({"id":1,"note":"z"})")));
    EXPECT_EQ(json(R"({"id":1,"name":"a","note":"z","tags":["seen"]})"), front_.jStored);
    before_ = all();
    // Not what was sent.
    expectUnchanged(std::string("changed: member \"tags\"") + kDiffers,
                    front_.save(json(R"({"id":1,"tags":[]})")));
    expectUnchanged(std::string("changed: member \"tags\"") + kDiffers,
                    front_.update(json(R"({"id":1})"), json(R"({"tags":[]})")));
}

TEST_F(Write, SavesMembersThatMayNotBeLeftOut)
{
    Front front(database_, R"({"id":{"cpptype":"long long"},"n":{"cpptype":"int"},
                               "text":{"cpptype":"string"}})",
                "id integer primary key, n integer, text text not null");
    EXPECT_EQ(front.named("invalid: NOT NULL constraint failed: @.text"),
              front.save(json(R"({"id":1,"n":1})")));
    EXPECT_EQ("0", front.save(json(R"({"id":1,"text":"x"})")));
    EXPECT_EQ("0", front.save(json(R"({"id":1,"n":2})")));
    EXPECT_EQ(json(R"({"id":1,"n":2,"text":"x"})"), front.jStored);
}

TEST_F(Write, TellsAFullDatabase)
{
    begin(kTwo);
    database_.run("pragma max_page_count = 1");  // no more than there are
    Json::Value jBig;
    jBig["name"] = std::string(100000, 'x');
    Json::Value jBigs;
    jBigs.append(jBig);
    const std::string strFull = "database or disk is full";
    expectUnchanged("failed: " + strFull, front_.create(jBig));
    expectUnchanged("failed: record 0: " + strFull, front_.createMany(jBigs));
    expectUnchanged("failed: " + strFull, front_.update(json(R"({"id":1})"), jBig));
    jBig["id"] = 1;
    expectUnchanged("failed: " + strFull, front_.save(jBig));
}

}  // namespace
