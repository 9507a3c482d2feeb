// SPDX-License-Identifier: MIT
// Column and value lists where the definition and the process-wide member types disagree, or where
// the definition lacks what is looked up.

#include "support/database.h"

namespace {

class ValueListTypes : public TableTest {
protected:
    std::string strName_ = freshName();
    std::string strCreate_ = "create table " + strName_ + " (a)";
};

// The text with every "$" replaced by the table's name.
std::string named(std::string strText, const std::string& strName)
{
    for (std::size_t i = 0; std::string::npos != (i = strText.find('$', i)); i += strName.size())
        strText.replace(i, 1, strName);
    return strText;
}

// The first lines of a look-up that fails: up to the definition. The dump of all tables' types
// follows.
Lines lookUpHead(const Lines& lines)
{
    return Lines(lines.begin(),
                 lines.begin() + std::min<std::ptrdiff_t>(3, lines.end() - lines.begin()));
}

TEST_F(ValueListTypes, FollowTheFirstDefinitionUnderAName)
{
    const std::string strName = freshName();
    Table first(database_, strName, R"({"a":{"cpptype":"int"},"b":{"cpptype":"string"}})", "a,b");
    Json::Value jNone(Json::objectValue);
    EXPECT_EQ(0, first.api.checkJsonType(jNone));

    Table other(database_, strName, R"({"a":{"cpptype":"string"},"b":{"cpptype":"Json::Value"}})",
                "a,b");
    std::string strSql = "(";
    Json::Value jRecord = json(R"({"a":7,"b":"x"})");
    EXPECT_EQ(0, other.api.SqlExpandMemberSymbol(strSql, jRecord));
    EXPECT_EQ("(7,'x') ", strSql);
    EXPECT_EQ(Lines(), takeLog());
}

TEST_F(ValueListTypes, RefuseAMemberThatTheTypesLack)
{
    const std::string strName = freshName();
    Table first(database_, strName, R"({"a":{"cpptype":"int"}})", "a");
    Json::Value jNone(Json::objectValue);
    EXPECT_EQ(0, first.api.checkJsonType(jNone));

    Table other(database_, strName, R"({"a":{"cpptype":"int"},"b":{"cpptype":"int"}})", "a");
    for (const char* szRecord : {R"({"a":1,"b":2})", R"({"a":1})", "{}", "null", "[1]"}) {
        SCOPED_TRACE(szRecord);
        std::string strSql = "(";
        Json::Value jRecord = json(szRecord);
        // The column list looks at the definition alone.
        std::string strColumns;
        EXPECT_EQ(0, other.api.SqlExpandMemberName(strColumns));
        EXPECT_EQ("a,b", strColumns);
        EXPECT_EQ(Lines(), takeLog());
        EXPECT_EQ(-1, other.api.SqlExpandMemberSymbol(strSql, jRecord));
        EXPECT_EQ("(", strSql);
        EXPECT_EQ(Lines{failed("!jType.isMember(strKey)")}, takeLog());
    }
    // A definition with fewer members than the types is fine.
    Table fewer(database_, strName, "{}", "a");
    std::string strSql = "(";
    Json::Value jRecord = json(R"({"a":1})");
    EXPECT_EQ(0, fewer.api.SqlExpandMemberSymbol(strSql, jRecord));
    EXPECT_EQ("(", strSql);
    EXPECT_EQ(Lines(), takeLog());
}

TEST_F(ValueListTypes, RefuseTheMembersBehindOneWithoutAWord)
{
    Table table(database_,
                R"({"a":{"cpptype":"int"},"b":{},"c":{"cpptype":"int"},"d":{"cpptype":"int"}})",
                "a");
    std::string strSql = "(";
    Json::Value jRecord = json(R"({"a":1})");
    EXPECT_EQ(-1, table.api.SqlExpandMemberSymbol(strSql, jRecord));
    EXPECT_EQ("(", strSql);
    Lines lines = takeLog();
    ASSERT_EQ(5U, lines.size());
    EXPECT_EQ(utilFailed("!jTableDef[strJsonName][\"member\"][strKey].isMember(\"cpptype\")"),
              lines[0]);
    EXPECT_EQ(utilPlain("strJsonName=" + table.strName), lines[1]);
    EXPECT_EQ(utilPlain("jTableDef=" + text(table.jDefinition)), lines[2]);
    EXPECT_EQ(failed("!jType.isMember(strKey)"), lines[4]);
    // The types stay partial, without another line about it.
    EXPECT_EQ(-1, table.api.SqlExpandMemberSymbol(strSql, jRecord));
    EXPECT_EQ(Lines{failed("!jType.isMember(strKey)")}, takeLog());
}

TEST_F(ValueListTypes, ListNothingForAnEmptyMemberObject)
{
    Table table(database_, "{}", "a");
    std::string strSql = "(";
    Json::Value jRecord = json(R"({"a":1})");
    EXPECT_EQ(0, table.api.SqlExpandMemberName(strSql));
    EXPECT_EQ(0, table.api.SqlExpandMemberName(strSql, &jRecord));
    EXPECT_EQ(Lines(), takeLog());
    EXPECT_EQ(0, table.api.SqlExpandMemberSymbol(strSql, jRecord));
    EXPECT_EQ("(", strSql);
    EXPECT_EQ((Lines{utilFailed("jType == Json::nullValue || !jType.isMember(strJsonName)"),
                     utilPlain("strJsonName=" + table.strName),
                     utilPlain("jTableDef=" + text(table.jDefinition))}),
              lookUpHead(takeLog()));
}

// Kept: what the column list looks up and does not find is inserted into the handle's definition.
TEST_F(ValueListTypes, InsertWhatTheDefinitionLacks)
{
    const struct {
        const char* szName;
        const char* szDefinition;
        const char* szLater;      // the definition after the column list
        const char* szCondition;  // what a later look-up finds wrong with it
    } cases[] = {
        {"null", "null", R"({"$":{"member":null}})",
         R"(!jTableDef[strJsonName]["member"].isObject())"},
        {"no table", R"({"other":{"member":{}}})", R"({"other":{"member":{}},"$":{"member":null}})",
         R"(!jTableDef[strJsonName]["member"].isObject())"},
        {"null table", R"({"$":null})", R"({"$":{"member":null}})",
         R"(!jTableDef[strJsonName]["member"].isObject())"},
        {"no member", R"({"$":{"x":1}})", R"({"$":{"member":null,"x":1}})",
         R"(!jTableDef[strJsonName]["member"].isObject())"},
        {"null member", R"({"$":{"member":null}})", R"({"$":{"member":null}})",
         R"(!jTableDef[strJsonName]["member"].isObject())"},
        {"array member", R"({"$":{"member":["a"]}})", R"({"$":{"member":["a"]}})",
         R"(!jTableDef[strJsonName]["member"].isObject())"},
        {"text member", R"({"$":{"member":"a"}})", R"({"$":{"member":"a"}})",
         R"(!jTableDef[strJsonName]["member"].isObject())"},
        {"array table", R"({"$":["member"]})", R"({"$":["member"]})",
         "!jTableDef[strJsonName].isObject()"},
        {"text table", R"({"$":"member"})", R"({"$":"member"})",
         "!jTableDef[strJsonName].isObject()"},
        {"array", "[1]", "[1]", "!jTableDef.isMember(strJsonName)"},
        {"text", "\"x\"", "\"x\"", "!jTableDef.isMember(strJsonName)"},
        {"number", "5", "5", "!jTableDef.isMember(strJsonName)"},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(c.szName);
        std::string strName = freshName();
        std::string strCreate = "create table " + strName + " (a)";
        Json::Value jDefinition = json(named(c.szDefinition, strName));
        const Json::Value jBefore = jDefinition;
        VornJsonDbApi api(database_.get(), strName, jDefinition, strCreate);
        takeLog();

        std::string strSql = "(";
        EXPECT_EQ(0, api.SqlExpandMemberName(strSql));
        EXPECT_EQ("(", strSql);
        EXPECT_EQ(Lines(), takeLog());

        Json::Value jRecord(Json::objectValue);
        EXPECT_EQ(0, api.SqlExpandMemberSymbol(strSql, jRecord));
        EXPECT_EQ("(", strSql);
        EXPECT_EQ((Lines{utilFailed(c.szCondition), utilPlain("strJsonName=" + strName),
                         utilPlain("jTableDef=" + named(c.szLater, strName))}),
                  lookUpHead(takeLog()));
        EXPECT_EQ(jBefore, jDefinition) << "the host's own definition changed";
    }
}

TEST_F(ValueListTypes, InsertFromTheValueListToo)
{
    Json::Value jDefinition = json(R"({"x":1})");
    VornJsonDbApi api(database_.get(), strName_, jDefinition, strCreate_);
    Json::Value jRecord(Json::objectValue);
    std::string strSql = "(";
    EXPECT_EQ(0, api.SqlExpandMemberSymbol(strSql, jRecord));
    EXPECT_EQ((Lines{utilFailed("!jTableDef.isMember(strJsonName)"),
                     utilPlain("strJsonName=" + strName_), utilPlain("jTableDef={\"x\":1}")}),
              lookUpHead(takeLog()));
    // The types are poisoned by now; the line shows what the first call has inserted.
    EXPECT_EQ(0, api.SqlExpandMemberSymbol(strSql, jRecord));
    EXPECT_EQ((Lines{utilFailed("jType[strJsonName].type() != Json::objectValue"),
                     utilPlain("strJsonName=" + strName_),
                     utilPlain(named(R"(jTableDef={"$":{"member":null},"x":1})", strName_))}),
              lookUpHead(takeLog()));
    EXPECT_EQ("(", strSql);
}

// What a host changes through recType's reference holds from the next call on.
TEST_F(ValueListTypes, ReadTheWordFromTheTypesAsTheyAre)
{
    Table table(database_, R"({"a":{"cpptype":"int"}})", "a");
    Json::Value& jType = VORN_JSON_DB::recType(table.jDefinition, table.strName);
    Json::Value jRecord = json(R"({"a":7})");
    const struct {
        const char* szEntry;
        const char* szSql;
        Lines lines;
    } cases[] = {
        {R"({"cpptype":"string"})", "('7') ", {}},
        {R"({"cpptype":5})", "(", {error("cannot support this type=5")}},
        {R"({"cpptype":null})", "(", {error("cannot support this type=")}},
        {"{}", "(", {error("cannot support this type=")}},
        {"null", "(", {error("cannot support this type=")}},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(c.szEntry);
        jType["a"] = json(c.szEntry);
        std::string strSql = "(";
        EXPECT_EQ(c.lines.empty() ? 0 : -1, table.api.SqlExpandMemberSymbol(strSql, jRecord));
        EXPECT_EQ(c.szSql, strSql);
        EXPECT_EQ(c.lines, takeLog());
    }
}

}  // namespace
