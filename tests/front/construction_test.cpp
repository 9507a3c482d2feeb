// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// What the construction refuses, and with which words.
#include "front/front.h"

namespace {

struct Case {
    const char* szMembers;
    const char* szColumns;
    const char* szReason;  // "@" is the name of the table; "" if the table is taken
};

constexpr char kWords[] =
    ", expected \"string\", \"int\", \"long long\", \"bool\", \"Json::objectValue\", "
    "\"Json::arrayValue\" or \"Json::Value\"; fractions as integers of the smallest unit, as text "
    "or inside JSON";
constexpr char kNeedsQuotes[] = ": expected letters, digits and \"_\", and no keyword of SQL";

std::string word(const char* szWord)
{
    return std::string(R"({"m": {"cpptype": ")") + szWord + R"("}})";
}

class Construction : public FrontTest {
protected:
    void expectReason(const std::string& strReason, const std::string& strMembers,
                      const std::string& strColumns)
    {
        SCOPED_TRACE(strMembers + " over " + strColumns);
        // Every table has a key.
        Json::Value jMembers = json(strMembers);
        const bool blKey = std::string::npos != strColumns.find("primary key") || jMembers.empty();
        if (!blKey) jMembers["id"]["cpptype"] = "long long";
        Front front(database_, text(jMembers),
                    strColumns + (blKey ? "" : ", id integer primary key"));
        EXPECT_EQ(front.named(strReason), front.table->reason());
        const bool blRefused = !strReason.empty();
        EXPECT_EQ(blRefused ? VornJsonTable::Cause::kRefused : VornJsonTable::Cause::kNone,
                  front.table->cause());
        EXPECT_EQ(1, sqlite3_get_autocommit(database_.get()));
        // Every operation says so again.
        const std::string strOutcome = front.outcome([&] { return front.table->count({}); });
        EXPECT_EQ(blRefused ? "refused: " + front.named(strReason) : "0", strOutcome);
    }
};

TEST_F(Construction, TakesTheTypeWordsThatAreExact)
{
    for (const char* szColumn : {"m text", "m varchar(9)", "m clob", "m", "m blob"})
        for (const char* szWord :
             {"string", "Json::objectValue", "Json::arrayValue", "Json::Value"})
            expectReason("", word(szWord), szColumn);
    for (const char* szColumn : {"m integer", "m int", "m bigint", "m numeric", "m boolean", "m"})
        for (const char* szWord : {"int", "long long", "bool"})
            expectReason("", word(szWord), szColumn);
    expectReason("", word("long long"), "m integer primary key");
    expectReason("", word("int"), "m int primary key");
}

TEST_F(Construction, RefusesTypeWordsThatAreNotExact)
{
    for (const char* szWord : {"unsigned int", "unsigned", "long", "unsigned long",
                               "unsigned long long", "uid_t", "time_t", "float", "double", "text"})
        for (const char* szColumn : {"m integer", "m real", "m text"})
            expectReason(std::string("member \"m\": type word \"") + szWord + "\"" + kWords,
                         word(szWord), szColumn);
    for (const char* szMember : {R"({"m": {}})", R"({"m": 1})", R"({"m": {"cpptype": 1}})"})
        expectReason(std::string("member \"m\": type word \"\"") + kWords, szMember, "m");
}

TEST_F(Construction, RefusesColumnsThatChangeAValueOrItsOrder)
{
    const auto expectType = [&](const char* szWord, const char* szType, const char* szExpected) {
        expectReason(
            std::string("member \"m\": column type \"") + szType + "\", expected " + szExpected,
            word(szWord), std::string("m ") + szType);
    };
    for (const char* szType :
         {"INT", "INTEGER", "NUMERIC", "DATETIME", "decimal(5,2)", "charint", "REAL", "FLOAT"})
        for (const char* szWord : {"string", "Json::objectValue", "Json::Value"})
            expectType(szWord, szType, "a text column");
    for (const char* szType : {"TEXT", "varchar(5)", "REAL", "DOUBLE", "FLOAT"})
        for (const char* szWord : {"int", "long long", "bool"})
            expectType(szWord, szType, "an integer column");
    for (const char* szWord : {"int", "bool"})
        expectReason("member \"m\": over an integer primary key, expected \"long long\"",
                     word(szWord), "m integer primary key");
    // This one is not the rowid.
    expectReason("", word("int"), "m integer primary key desc");
}

TEST_F(Construction, RefusesTablesThatDifferFromTheDefinition)
{
    const Case cases[] = {
        {R"({"a":{"cpptype":"int"},"b":{"cpptype":"int"}})", "a int",
         "member \"b\": the table has no column of this name"},
        {R"({"a":{"cpptype":"int"}})", "a int, b int",
         "column \"b\": not in the definition; declare it"},
        {R"({"a":{"cpptype":"int"}})", "A int",
         "member \"a\": the table has no column of this name"},
        {R"({"a":{"cpptype":"int"},"b":{"cpptype":"int"}})", "a int, b int as (a + 1)",
         "table \"@\": cannot UPDATE generated column \"b\""},
        {R"({})", "a int", "the definition has no members for the table \"@\""},
        {R"([])", "a int", "the definition has no members for the table \"@\""},
    };
    for (const Case& one : cases) expectReason(one.szReason, one.szMembers, one.szColumns);
}

TEST_F(Construction, RefusesDefaultsOfAnotherKind)
{
    const Case cases[] = {
        {R"({"a":{"cpptype":"int","cppDefaultValue":"x"}})", "a int",
         "member \"a\": the default is a string, expected an integer from -2147483648 to "
         "2147483647"},
        {R"({"a":{"cpptype":"int","cppDefaultValue":2147483648}})", "a int",
         "member \"a\": the default is the integer 2147483648, expected an integer from "
         "-2147483648 to 2147483647"},
        {R"({"a":{"cpptype":"bool","cppDefaultValue":0}})", "a int",
         "member \"a\": the default is the integer 0, expected a boolean"},
        {R"({"a":{"cpptype":"string","cppDefaultValue":null}})", "a text", ""},
    };
    for (const Case& one : cases) expectReason(one.szReason, one.szMembers, one.szColumns);
}

TEST_F(Construction, RefusesNamesThatNeedQuotes)
{
    for (const char* szName : {"order", "group", "select", "current_time", "not", "null"}) {
        const std::string strMember = std::string("{\"") + szName + R"(":{"cpptype":"string"}})";
        expectReason(std::string("member \"") + szName + "\"" + kNeedsQuotes, strMember,
                     std::string("\"") + szName + "\" text");
    }
    for (const char* szName : {"a b", "1a", "", "a-b", "a.b", "a;", "\u00e4", "a'"})
        expectReason("member " + Json::valueToQuotedString(szName) + kNeedsQuotes,
                     std::string("{\"") + szName + R"(":{"cpptype":"string"}})", "a text");
    for (const char* szName : {"key", "desc", "first", "plan", "query", "action", "_", "A9"})
        expectReason("", std::string("{\"") + szName + R"(":{"cpptype":"string"}})",
                     std::string(szName) + " text");
}

TEST_F(Construction, RefusesNamesOfTables)
{
    for (const char* szName : {"order", "a b"})
        EXPECT_EQ(std::string("table \"") + szName + "\"" + kNeedsQuotes,
                  Front(database_, szName, word("int"), "m int").table->reason());
}

TEST_F(Construction, RefusesTypesThatTheProcessHoldsDifferently)
{
    const std::string strName = freshName();
    const auto reasonOf = [&](const char* szMembers, const char* szColumns) {
        Database database;
        return Front(database, strName, szMembers, szColumns).table->reason();
    };
    const std::string strHeld = "the process already holds the table \"" + strName +
                                "\" with other types; use the same definition or another name";
    // A refused table leaves no types behind.
    EXPECT_NE("", reasonOf(R"({"a":{"cpptype":"string"}})", "a int primary key"));
    EXPECT_EQ("", reasonOf(R"({"a":{"cpptype":"int"}})", "a int primary key"));
    EXPECT_EQ("", reasonOf(R"({"a":{"cpptype":"int"}})", "a int primary key"));
    EXPECT_EQ(strHeld, reasonOf(R"({"a":{"cpptype":"long long"}})", "a int primary key"));
    EXPECT_EQ(strHeld,
              reasonOf(R"({"a":{"cpptype":"int","cppDefaultValue":1}})", "a int primary key"));
    EXPECT_EQ(strHeld, reasonOf(R"({"a":{"cpptype":"int"},"b":{"cpptype":"int"}})",
                                "a int primary key, b int"));
}

TEST_F(Construction, RefusesTablesWithoutAKey)
{
    EXPECT_EQ("table \"front_keyless\": no primary key",
              Front(database_, "front_keyless", word("int"), "m int").table->reason());
}

// Two records of the key would be one to every condition.
TEST_F(Construction, RefusesAKeyOfAnotherCollationThanItsColumn)
{
    const char* const szOther =
        "member \"m\": the primary key has another collation than the column";
    expectReason(szOther, word("string"), "m text collate nocase, primary key (m collate binary)");
    expectReason(szOther, word("string"), "m text, primary key (m collate nocase)");
    expectReason("", word("string"), "m text collate nocase, primary key (m)");
    expectReason("", word("string"), "m text collate NoCase, primary key (m)) without rowid --");
}

TEST_F(Construction, RefusesWhatItCannotOpen)
{
    const Json::Value jNone;
    EXPECT_EQ("the connection is null", VornJsonTable(nullptr, "x", jNone, "select 1").reason());
    EXPECT_EQ("the CREATE statement is empty",
              VornJsonTable(database_.get(), "x", jNone, "").reason());
    Json::Value jDefinition;
    jDefinition["front_none"]["member"]["a"]["cpptype"] = "int";
    EXPECT_EQ("near \"crate\": syntax error",
              VornJsonTable(database_.get(), "front_none", jDefinition, "crate table").reason());
    EXPECT_EQ("no such table: front_none",
              VornJsonTable(database_.get(), "front_none", jDefinition, "select 1").reason());
    EXPECT_EQ("table \"front_none\": no primary key",
              VornJsonTable(database_.get(), "front_none", jDefinition,
                            "create view if not exists front_none as select 1 as a")
                  .reason());
}

// So that the statement can be corrected.
TEST_F(Construction, LeavesNoTableThatItRefuses)
{
    const std::string strName = freshName();
    const char* const kMembers =
        R"({"id":{"cpptype":"long long"},"tags":{"cpptype":"Json::arrayValue"}})";
    {
        Front front(database_, strName, kMembers, "id integer primary key, tags json");
        EXPECT_EQ(VornJsonTable::Cause::kRefused, front.table->cause());
        EXPECT_EQ(Rows{}, front.rows("select name from sqlite_master where name = '@'"));
        database_.run("begin");
        Front again(database_, strName, kMembers, "id integer primary key, tags json");
        EXPECT_EQ(Rows{}, again.rows("select name from sqlite_master where name = '@'"));
        database_.run("commit");
    }
    Front front(database_, strName, kMembers, "id integer primary key, tags json text");
    EXPECT_EQ("0", front.create(json(R"({"tags":[1]})")));
}

}  // namespace
