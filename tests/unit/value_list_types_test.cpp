// SPDX-License-Identifier: MIT
// Column and value lists where the definition and the process-wide member types disagree, or where
// the definition lacks what is looked up.

#include "support/lookups.h"

namespace {

constexpr char kNoMembers[] = R"(!jTableDef[strJsonName]["member"].isObject())";

class ValueListTypes : public LookUpsTest {
protected:
    // A table of the test's name; the types of the first one hold for the others.
    Table table(const char* szMembers) { return {database_, strName_, szMembers, "a,b"}; }

    // SqlExpandMemberSymbol, which appends the list or fails with the line; look-ups may come
    // before.
    void expectValues(VornJsonDbApi& api, const char* szRecord, const std::string& strOut,
                      const Lines& lines, int iResult = 0)
    {
        SCOPED_TRACE(szRecord);
        Json::Value jRecord = json(szRecord);
        std::string strSql = "(";
        EXPECT_EQ(iResult, api.SqlExpandMemberSymbol(strSql, jRecord));
        EXPECT_EQ("(" + strOut, strSql);
        EXPECT_EQ(named(lines), takeOwnLog());
    }

    void expectColumns(VornJsonDbApi& api, const char* szColumns)
    {
        std::string strSql;
        EXPECT_EQ(0, api.SqlExpandMemberName(strSql));
        EXPECT_EQ(szColumns, strSql);
        EXPECT_EQ(Lines(), takeLog());
    }
};

TEST_F(ValueListTypes, FollowTheFirstDefinitionUnderAName)
{
    Table first = table(R"({"a":{"cpptype":"int"},"b":{"cpptype":"string"}})");
    expectValues(first.api, "{}", "", {});
    Table other = table(R"({"a":{"cpptype":"string"},"b":{"cpptype":"Json::Value"}})");
    expectValues(other.api, R"({"a":7,"b":"x"})", "7,'x') ", {});
    Table fewer = table("{}");
    expectValues(fewer.api, R"({"a":1})", "", {});
    Table more = table(R"({"a":{"cpptype":"int"},"c":{"cpptype":"int"}})");
    for (const char* szRecord : {R"({"a":1,"c":2})", R"({"a":1})", "{}", "null", "[1]"})
        expectValues(more.api, szRecord, "", {failed("!jType.isMember(strKey)")}, -1);
    expectColumns(more.api, "a,c");
}

// Kept: what the lists look up and do not find is inserted into the handle's definition.
TEST_F(ValueListTypes, InsertWhatTheDefinitionLacks)
{
    const auto expectInserted = [this](const BadDefinition& bad, bool blColumns) {
        SCOPED_TRACE(bad.szName);
        strName_ = freshName();
        std::string strCreate = "create table " + strName_ + " (a)";
        Json::Value jDefinition = json(named(bad.szDefinition));
        VornJsonDbApi api(database_.get(), strName_, jDefinition, strCreate);
        takeLog();
        // The first look-up finds what the column list has left, if it came before.
        const bool blInserted = blColumns && std::string(bad.szDefinition) != bad.szLater;
        if (blColumns) expectColumns(api, "");
        expectValues(api, R"({"a":1})", "",
                     blInserted ? lookUp(kNoMembers, bad.szLater, "-")
                                : lookUp(bad.szCondition, bad.szDefinition, "-"));
        expectValues(api, R"({"a":1})", "", lookUp(kPoisoned, bad.szLater, "null"));
        EXPECT_EQ(json(named(bad.szDefinition)), jDefinition) << "the host's own was changed";
    };
    const BadDefinition more[] = {
        {"text", "\"$\"", "\"$\"", "!jTableDef.isMember(strJsonName)"},
        {"number", "5", "5", "!jTableDef.isMember(strJsonName)"},
        {"array table", R"({"$":["a"]})", R"({"$":["a"]})", "!jTableDef[strJsonName].isObject()"},
        {"text member", R"({"$":{"member":"a"}})", R"({"$":{"member":"a"}})", kNoMembers},
        {"null member", R"({"$":{"member":null}})", R"({"$":{"member":null}})", kNoMembers},
    };
    for (bool blColumns : {false, true}) {
        for (const BadDefinition& bad : kBadDefinitions) expectInserted(bad, blColumns);
        for (const BadDefinition& bad : more) expectInserted(bad, blColumns);
    }
}

// What a host changes through recType's reference holds from the next call on.
TEST_F(ValueListTypes, ReadTheWordFromTheTypesAsTheyAre)
{
    Table one = table(R"({"a":{"cpptype":"int"}})");
    Json::Value& jWord = VORN_JSON_DB::recType(one.jDefinition, one.strName)["a"];
    jWord = json(R"({"cpptype":"string"})");
    expectValues(one.api, R"({"a":7})", "'7') ", {});
    jWord = json(R"({"cpptype":5})");
    expectValues(one.api, R"({"a":7})", "", {error("cannot support this type=5")}, -1);
    for (const char* szEntry : {R"({"cpptype":null})", "{}", "null"}) {
        jWord = json(szEntry);
        expectValues(one.api, R"({"a":7})", "", {error("cannot support this type=")}, -1);
    }
}

}  // namespace
