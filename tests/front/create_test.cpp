// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// Creating records: what is stored, what is refused, duplicates and triggers.
#include "front/front.h"

namespace {

constexpr char kMembers[] = R"({
    "any":  {"cpptype": "Json::Value"},
    "flag": {"cpptype": "bool", "cppDefaultValue": false},
    "id":   {"cpptype": "long long"},
    "list": {"cpptype": "Json::arrayValue", "cppDefaultValue": []},
    "name": {"cpptype": "string"},
    "obj":  {"cpptype": "Json::objectValue"},
    "qty":  {"cpptype": "int"}})";
constexpr char kColumns[] =
    "any text, flag integer, id integer primary key, list text, name text unique, obj text, "
    "qty integer default 3";

constexpr char kOtherAny[] =
    "changed: member \"any\": the row differs or is gone; see the triggers";
constexpr char kOtherName[] =
    "changed: member \"name\": the row differs or is gone; see the triggers";
constexpr char kExact[] = ", expected UTF-8, finite numbers and 1000 levels at most";

struct Case {
    const char* szRecord;
    const char* szOutcome;
};

class Create : public FrontTest {
protected:
    void expectStored(const char* szStored, const char* szRecord)
    {
        SCOPED_TRACE(szRecord);
        EXPECT_EQ("0", front_.create(json(szRecord)));
        EXPECT_EQ(json(szStored), front_.jStored);
        EXPECT_EQ("1", front_.get(json("{\"id\":" + front_.jStored["id"].asString() + "}")));
        EXPECT_EQ(json(szStored), front_.jStored);
        front_.run("delete from @");
    }

    void expectRefused(const std::string& strOutcome, const Json::Value& jRecord)
    {
        const Rows before = front_.rows("select * from @");
        EXPECT_EQ(strOutcome, front_.create(jRecord));
        EXPECT_EQ(before, front_.rows("select * from @"));
    }

    Front front_{database_, kMembers, kColumns};
};

TEST_F(Create, StoresWhatWasSent)
{
    expectStored(R"({"flag":false,"id":1,"list":[],"qty":3})", "{}");
    expectStored(R"({"flag":false,"id":1,"list":[],"qty":3})", R"({"id":null})");
    expectStored(R"({"id":7,"list":[]})", R"({"id":7,"qty":null,"flag":null,"name":null})");
    expectStored(R"({"flag":true,"id":-9223372036854775808,"list":[1,[null]],"qty":-2147483648,
                     "name":"50%s 'x' \"y\"","obj":{"$or":"\u0000","b":[1.5,1.0,-0.0,1e300]},
                     "any":"text"})",
                 R"({"flag":true,"id":-9223372036854775808,"list":[1,[null]],"qty":-2147483648,
                     "name":"50%s 'x' \"y\"","obj":{"$or":"\u0000","b":[1.5,1.0,-0.0,1e300]},
                     "any":"text"})");
    for (const char* szAny : {"1", "-1.25", "true", "\"\"", "[]", "{}", "18446744073709551615"}) {
        const std::string strRecord =
            std::string(R"({"flag":true,"id":9223372036854775807,"list":[],"qty":0,"any":)") +
            szAny + "}";
        expectStored(strRecord.c_str(), strRecord.c_str());
    }
}

TEST_F(Create, RefusesWhatCannotBeStoredExactly)
{
    const Case cases[] = {
        {"null", "refused: the record is null, expected an object"},
        {"[1]", "refused: the record is an array, expected an object"},
        {R"({"nam":"x"})", "refused: member \"nam\": not declared for the table \"@\""},
        {R"({"name":7})", "refused: member \"name\": the integer 7, expected a string"},
        {R"({"name":["x"]})", "refused: member \"name\": an array, expected a string"},
        {R"({"qty":"7"})",
         "refused: member \"qty\": a string, expected an integer from "
         "-2147483648 to 2147483647"},
        {R"({"qty":1.0})",
         "refused: member \"qty\": a floating-point number, expected an integer "
         "from -2147483648 to 2147483647"},
        {R"({"qty":2147483648})",
         "refused: member \"qty\": the integer 2147483648, expected an "
         "integer from -2147483648 to 2147483647"},
        {R"({"id":9223372036854775808})",
         "refused: member \"id\": the integer 9223372036854775808, expected an integer from "
         "-9223372036854775808 to 9223372036854775807"},
        {R"({"flag":1})", "refused: member \"flag\": the integer 1, expected a boolean"},
        {R"({"obj":[]})", "refused: member \"obj\": an array, expected an object"},
        {R"({"list":{}})", "refused: member \"list\": an object, expected an array"},
        {R"({"name":"a\u0000b"})",
         "refused: member \"name\": a string, expected UTF-8 without NUL bytes"},
    };
    for (const Case& one : cases) expectRefused(front_.named(one.szOutcome), json(one.szRecord));

    Json::Value jRecord;
    jRecord["name"] = "\xff";
    expectRefused("refused: member \"name\": a string, expected UTF-8 without NUL bytes", jRecord);
    jRecord.clear();
    jRecord["obj"]["k"][0] = "\xed\xa0\x80";
    expectRefused(std::string("refused: member \"obj\": an object") + kExact, jRecord);
    jRecord["obj"] = Json::Value(Json::objectValue);
    jRecord["obj"]["\xc0\x80"] = 1;
    expectRefused(std::string("refused: member \"obj\": an object") + kExact, jRecord);
    jRecord.clear();
    for (const double dValue : {HUGE_VAL, -HUGE_VAL, std::nan("")}) {
        jRecord["any"] = dValue;
        expectRefused(std::string("refused: member \"any\": a floating-point number") + kExact,
                      jRecord);
    }
}

TEST_F(Create, TakesAThousandLevelsOfJson)
{
    Json::Value jDeep(Json::arrayValue);
    for (int i = 1; i < 1000; ++i) {
        Json::Value jOuter(Json::arrayValue);
        jOuter.append(std::move(jDeep));
        jDeep = std::move(jOuter);
    }
    Json::Value jRecord;
    jRecord["list"] = jDeep;
    EXPECT_EQ("0", front_.create(jRecord));
    EXPECT_EQ(jDeep, front_.jStored["list"]);
    jRecord["list"] = Json::Value(Json::arrayValue);
    jRecord["list"].append(jDeep);
    expectRefused(std::string("refused: member \"list\": an array") + kExact, jRecord);
}

TEST_F(Create, NamesTheColumnsOfADuplicate)
{
    front_.run("create unique index @_two on @ (qty, flag)");
    EXPECT_EQ("0", front_.create(json(R"({"id":1,"name":"a","qty":1})")));
    const auto expectDuplicate = [&](const char* szColumns, const char* szRecord) {
        EXPECT_EQ(0U, front_.create(json(szRecord)).find("duplicate: duplicate: UNIQUE "));
        EXPECT_EQ(split(szColumns, ','), front_.table->columns());
    };
    expectDuplicate("id", R"({"id":1,"name":"b","qty":2})");
    expectDuplicate("name", R"({"id":2,"name":"a","qty":2})");
    expectDuplicate("qty,flag", R"({"id":2,"name":"b","qty":1})");
    front_.run("drop index @_two; create unique index @_sum on @ (qty + 1000)");
    expectDuplicate("", R"({"id":2,"name":"b","qty":1,"flag":true})");
    EXPECT_EQ("0", front_.create(json(R"({"id":2,"name":"b","qty":2})")));
    EXPECT_EQ(std::vector<std::string>(), front_.table->columns());
}

// A name of its own: another table's constraint is no duplicate of this record.
TEST_F(Create, TellsOtherConstraintsFromDuplicates)
{
    front_.run("create table @_log (a unique)");
    front_.run("create trigger @_t after insert on @ begin insert into @_log values (1); end");
    EXPECT_EQ("0", front_.create(json("{}")));
    expectRefused(front_.named("invalid: UNIQUE constraint failed: @_log.a"), json("{}"));
    Front strict(database_, R"({"a":{"cpptype":"int"},"id":{"cpptype":"long long"}})",
                 "a int not null check (a > 0), id integer primary key");
    EXPECT_EQ(strict.named("invalid: NOT NULL constraint failed: @.a"), strict.create(json("{}")));
    EXPECT_EQ("invalid: CHECK constraint failed: a > 0", strict.create(json(R"({"a":0})")));
}

TEST_F(Create, UndoesWhatATriggerChanged)
{
    const Case cases[] = {
        {"before insert on @ begin select raise(ignore); end",
         "changed: a trigger or an \"on conflict\" clause ignored a record"},
        {"after insert on @ begin update @ set name = 'x' where id = new.id; end", kOtherName},
        {"after insert on @ begin update @ set any = '1' where id = new.id; end", kOtherAny},
        {"after insert on @ begin delete from @ where id = new.id; end", kOtherAny},
        {"after insert on @ begin update @ set id = id + 1 where id = new.id; end", kOtherAny},
        {"before insert on @ begin select raise(abort, 'not today'); end", "invalid: not today"},
    };
    EXPECT_EQ("0", front_.create(json(R"({"id":1,"name":"first"})")));
    for (const Case& one : cases) {
        SCOPED_TRACE(one.szRecord);
        front_.run(std::string("create trigger @_t ") + one.szRecord);
        expectRefused(one.szOutcome, json(R"({"name":"y"})"));
        expectRefused(one.szOutcome, json(R"({"id":7,"name":"y"})"));
        front_.run("drop trigger @_t");
    }
}

TEST_F(Create, ReportsRowsThatTheTableIgnores)
{
    Front ignoring(database_, R"({"a":{"cpptype":"string"},"id":{"cpptype":"long long"}})",
                   "a text unique on conflict ignore, id integer primary key on conflict ignore");
    EXPECT_EQ("0", ignoring.create(json(R"({"a":"x"})")));
    const std::string strIgnored =
        "changed: a trigger or an \"on conflict\" clause ignored a record";
    EXPECT_EQ(strIgnored, ignoring.create(json(R"({"a":"x"})")));
    EXPECT_EQ(strIgnored, ignoring.create(json(R"({"a":"y","id":1})")));
    EXPECT_EQ("0", ignoring.create(json(R"({"a":"y","id":2})")));
}

TEST_F(Create, FindsTheRowWhateverTheKey)
{
    const char* const kKeys[] = {
        "code text, lang text, primary key (lang, code)",
        "code text, lang text, primary key (lang, code)) without rowid --",
        "code text primary key default (hex(randomblob(8))), lang text",
        "code text collate nocase, lang text, primary key (code, lang, code)",
    };
    for (const char* szColumns : kKeys) {
        Front front(database_, R"({"code":{"cpptype":"string"},"lang":{"cpptype":"string"}})",
                    szColumns);
        EXPECT_EQ("", front.table->reason());
        EXPECT_EQ("0", front.create(json(R"({"code":"%s","lang":"'"})")));
        EXPECT_EQ(json(R"({"code":"%s","lang":"'"})"), front.jStored);
        EXPECT_EQ("refused: member \"code\": missing, expected the whole key",
                  front.create(json(R"({"lang":"x"})")));
    }
}

}  // namespace
