// SPDX-License-Identifier: MIT
// What the decoder knows of a result's columns is kept for the next statement. A host that changes
// member types through the reference of recType in between sees no difference.

#include "support/rows.h"

namespace {

using doubles::state;

class KeptColumns : public TableTest {
protected:
    // The answer to one more statement with the same columns.
    std::string answer(Row row = {{"s", "i"}, {"7", "8"}})
    {
        state().exec = execOfRow(std::move(row));
        Json::Value jRows;
        iResult_ = table_.api.runSqlEx("a text", callback_, &jRows);
        return text(jRows);
    }

    // Until nothing about the columns is new.
    void warmUp()
    {
        for (int i = 0; i < 3; ++i) EXPECT_EQ(R"([{"i":8,"s":"7"}])", answer());
    }

    Json::Value& types() { return VORN_JSON_DB::recType(table_.jDefinition, table_.strName); }

    Table table_{database_, R"({"i":{"cpptype":"int"},"s":{"cpptype":"string"}})", "i"};
    doubles::RowCallback callback_ = rowCallback(table_);
    int iResult_ = 0;
};

TEST_F(KeptColumns, TakeAnotherTypeWord)
{
    warmUp();
    types()["s"]["cpptype"] = "bool";
    EXPECT_EQ(R"([{"i":8,"s":false}])", answer());
    types()["s"]["cpptype"] = "long long";
    EXPECT_EQ(R"([{"i":8,"s":7}])", answer());
    types()["i"] = json(R"({"cpptype":"string"})");
    EXPECT_EQ(R"([{"i":"8","s":7}])", answer());
    EXPECT_EQ(R"([{"i":"8","s":7}])", answer());
    EXPECT_EQ(Lines(), takeLog());
}

TEST_F(KeptColumns, TakeAnotherTypeWordBehindOtherColumns)
{
    types()["t"]["cpptype"] = "string";
    for (int i = 0; i < 3; ++i) EXPECT_EQ(R"([{"s":"7"}])", answer({{"s"}, {"7"}}));
    EXPECT_EQ(R"([{"t":"7"}])", answer({{"t"}, {"7"}}));
    types()["s"]["cpptype"] = "bool";
    EXPECT_EQ(R"([{"s":false}])", answer({{"s"}, {"7"}}));
}

// SQLite has no such rows; a host that calls the callback itself may.
TEST_F(KeptColumns, AreNoneOfARowWithoutColumns)
{
    types()["t"]["cpptype"] = "string";
    for (int i = 0; i < 3; ++i) {
        warmUp();
        EXPECT_EQ(R"([{"t":"7"}])", answer({{"t"}, {"7"}}));
        state().exec = [](sqlite3*, const char*, doubles::RowCallback callback, void* arg, char**) {
            char* none[] = {nullptr};
            EXPECT_EQ(0, callback(arg, 0, none, none));
            return SQLITE_OK;
        };
        Json::Value jRows;
        EXPECT_EQ(0, table_.api.runSqlEx("a text", callback_, &jRows));
        EXPECT_EQ("[{}]", text(jRows));
    }
}

TEST_F(KeptColumns, TakeATypeWordBesideOtherMembers)
{
    warmUp();
    types()["s"]["zzz"] = 1;
    EXPECT_EQ(R"([{"i":8,"s":"7"}])", answer());
    types()["s"]["cpptype"] = "bool";
    EXPECT_EQ(R"([{"i":8,"s":false}])", answer());
    types()["s"].removeMember("cpptype");
    EXPECT_EQ("null", answer());
    EXPECT_EQ(-1, iResult_);
    EXPECT_EQ(error("type error, strType="), takeLog()[0]);
}

TEST_F(KeptColumns, RefuseAWordThatIsNotDecoded)
{
    warmUp();
    for (const char* szWord : {R"("double")", R"("")", "5", "null"}) {
        types()["s"]["cpptype"] = json(szWord);
        EXPECT_EQ("null", answer());
        EXPECT_EQ(-1, iResult_);
        EXPECT_EQ(error("type error, strType=" + json(szWord).asString()), takeLog()[0]);
    }
    // No text at all: jsoncpp refuses to make one of it.
    types()["s"]["cpptype"] = json("[]");
    EXPECT_THROW(answer(), Json::LogicError);
    types()["s"]["cpptype"] = "string";
    EXPECT_EQ(R"([{"i":8,"s":"7"}])", answer());
    EXPECT_EQ(Lines(), takeLog());
}

// The columns are looked at in the order of the row.
TEST_F(KeptColumns, RefuseTheFirstOfTwoBadWords)
{
    warmUp();
    types()["s"]["cpptype"] = "double";
    types()["i"]["cpptype"] = json("[]");
    EXPECT_EQ("null", answer());
    EXPECT_EQ(-1, iResult_);
    EXPECT_EQ(error("type error, strType=double"), takeLog()[0]);
}

TEST_F(KeptColumns, RefuseAMemberWithoutAWord)
{
    for (const char* szMember : {"{}", R"({"":"string"})", R"({"zzz":"string"})"}) {
        warmUp();
        types()["s"] = json(szMember);
        EXPECT_EQ("null", answer()) << szMember;
        EXPECT_EQ(-1, iResult_);
        EXPECT_EQ(error("type error, strType="), takeLog()[0]);
        types()["s"]["cpptype"] = "string";
    }
}

TEST_F(KeptColumns, RefuseAMemberThatIsGone)
{
    warmUp();
    types().removeMember("i");
    EXPECT_EQ("null", answer());
    EXPECT_EQ(-1, iResult_);
    EXPECT_EQ(failed("!jType.isMember(strName)"), takeLog()[0]);
    types()["i"]["cpptype"] = "int";
    warmUp();
}

TEST_F(KeptColumns, AskAgainForTypesThatAreNoObject)
{
    warmUp();
    types() = Json::nullValue;
    EXPECT_EQ("null", answer());
    const Lines lines = takeLog();
    ASSERT_LE(5U, lines.size());
    EXPECT_EQ(utilFailed("jType[strJsonName].type() != Json::objectValue"), lines[0]);
    EXPECT_EQ(utilPlain("strJsonName=" + table_.strName), lines[1]);
    EXPECT_EQ(utilPlain("jTableDef=null"), lines[2]);
    EXPECT_EQ(0U, lines[3].find(utilPlain("jType={")));
    EXPECT_EQ(failed("!jType.isMember(strName)"), lines[4]);
}

TEST_F(KeptColumns, AreThoseOfTheTableThatRuns)
{
    Table other(database_, R"({"i":{"cpptype":"string"},"s":{"cpptype":"bool"}})", "i");
    VORN_JSON_DB::recType(other.jDefinition, other.strName);
    for (int i = 0; i < 3; ++i) {
        warmUp();
        state().exec = execOfRow({{"s", "i"}, {"7", "8"}});
        Json::Value jRows;
        EXPECT_EQ(0, other.api.runSqlEx("a text", callback_, &jRows));
        EXPECT_EQ(R"([{"i":"8","s":false}])", text(jRows));
    }
    EXPECT_EQ(Lines(), takeLog());
}

// The first statement of the text looks at one column only.
TEST_F(KeptColumns, AreLookedAtOnceEachInATextOfTwoStatements)
{
    warmUp();
    types()["i"]["cpptype"] = "string";
    state().exec = [](sqlite3*, const char*, doubles::RowCallback callback, void* arg, char**) {
        Row narrow{{"s"}, {"7"}};
        Row wide{{"s", "i"}, {"7", "8"}};
        EXPECT_EQ(0, narrow.handTo(callback, arg));
        EXPECT_EQ(0, wide.handTo(callback, arg));
        return SQLITE_OK;
    };
    Json::Value jRows;
    EXPECT_EQ(0, table_.api.runSqlEx("a text", callback_, &jRows));
    EXPECT_EQ(R"([{"s":"7"},{"i":"8","s":"7"}])", text(jRows));
}

}  // namespace
