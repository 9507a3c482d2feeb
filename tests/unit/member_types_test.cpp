// SPDX-License-Identifier: MIT
// What is read of a table definition, and how it is kept.

#include "support/database.h"

#include <cerrno>
#include <cstdio>
#include <cstdlib>

namespace {

class MemberTypes : public HostTest {
protected:
    // The entry of a table; strDefinition has $ for the table's name.
    Json::Value& entry(const std::string& strDefinition)
    {
        Json::Value jDefinition = definition(strDefinition);
        return VORN_JSON_DB::recType(jDefinition, strName_);
    }

    Json::Value definition(std::string strText) const
    {
        for (std::size_t n = 0; std::string::npos != (n = strText.find('$'));)
            strText.replace(n, 1, strName_);
        return json(strText);
    }

    // The whole cache as the three lines after a failed check show it.
    static Json::Value cacheAsLogged()
    {
        Json::Value jNone;
        std::string strUnknown = freshName();
        VORN_JSON_DB::recType(jNone, strUnknown);
        const std::string strLine = takeLog().back();
        Json::Value jCache = json(strLine.substr(utilPlain("jType=").size()));
        jCache[strUnknown] = Json::nullValue;
        return jCache;
    }

    // The lines after a failed check.
    Lines failure(const std::string& strCondition, const Json::Value& jDefinition,
                  const Json::Value& jCache) const
    {
        return {utilFailed(strCondition), utilPlain("strJsonName=" + strName_),
                utilPlain("jTableDef=" + text(jDefinition)), utilPlain("jType=" + text(jCache))};
    }

    std::string strName_ = freshName();
};

const char kNotAnObject[] = "jType[strJsonName].type() != Json::objectValue";
const char kGood[] = R"({"$":{"member":{"a":{"cpptype":"int"}}}})";

TEST_F(MemberTypes, AreWhatTheDefinitionSaysOfTypesAndDefaults)
{
    const Json::Value& jEntry = entry(R"({
        "other": {"member": {"z": {"cpptype": "int"}}},
        "$": {"comment": 1, "member": {
            "b": {"cpptype": "string", "cppDefaultValue": "x", "width": 3},
            "a": {"cpptype": "int", "default": 7}}}})");
    EXPECT_EQ(R"({"a":{"cpptype":"int"},"b":{"cppDefaultValue":"x","cpptype":"string"}})",
              text(jEntry));
    EXPECT_EQ(Lines(), takeLog());
}

TEST_F(MemberTypes, OfSeveralTablesStandInOneDocument)
{
    const std::string strOther = freshName();
    Json::Value jDefinition = definition(R"({"$":{"member":{"a":{"cpptype":"int"}}},")" + strOther +
                                         R"(":{"member":{"b":{"cpptype":"bool"}}}})");
    std::string strName = strOther;
    EXPECT_EQ(R"({"b":{"cpptype":"bool"}})", text(VORN_JSON_DB::recType(jDefinition, strName)));
    EXPECT_EQ(R"({"a":{"cpptype":"int"}})", text(VORN_JSON_DB::recType(jDefinition, strName_)));
    EXPECT_EQ(Lines(), takeLog());
}

TEST_F(MemberTypes, TakeEveryWordWithoutComplaint)
{
    for (const char* szWord :
         {"string", "int", "unsigned int", "unsigned", "long", "unsigned long", "long long",
          "unsigned long long", "float", "double", "bool", "Json::Value", "Json::objectValue",
          "Json::arrayValue", "uid_t", "time_t", "String", "no such word", ""}) {
        strName_ = freshName();
        const std::string strMembers = R"({"a":{"cpptype":")" + std::string(szWord) + R"("}})";
        EXPECT_EQ(strMembers, text(entry(R"({"$":{"member":)" + strMembers + "}}")));
        EXPECT_EQ(Lines(), takeLog()) << szWord;
    }
}

TEST_F(MemberTypes, TakeADefaultOfAnyKindAndNullToo)
{
    for (const char* szDefault :
         {"null", "true", "-3", "2.5", R"("x")", "[1,[2]]", R"({"k":{}})", "{}", "[]"}) {
        strName_ = freshName();
        const std::string strMembers =
            R"({"a":{"cppDefaultValue":)" + std::string(szDefault) + R"(,"cpptype":"int"}})";
        EXPECT_EQ(strMembers, text(entry(R"({"$":{"member":)" + strMembers + "}}")));
    }
    strName_ = freshName();
    EXPECT_FALSE(entry(kGood)["a"].isMember("cppDefaultValue"));
    EXPECT_EQ(Lines(), takeLog());
}

struct BadDefinition {
    const char* szDefinition;
    const char* szCondition;
    const char* szEntry = "null";
    const char* szLater = kNotAnObject;  // the failed check of a second call, or null for none
};

const BadDefinition kBadDefinitions[] = {
    {"null", "jTableDef.empty()"},
    {"{}", "jTableDef.empty()"},
    {"[]", "jTableDef.empty()"},
    {R"({"other":{"member":{"a":{"cpptype":"int"}}}})", "!jTableDef.isMember(strJsonName)"},
    {"[1]", "!jTableDef.isMember(strJsonName)"},
    {R"("$")", "!jTableDef.isMember(strJsonName)"},
    {"5", "!jTableDef.isMember(strJsonName)"},
    {R"({"$":null})", "!jTableDef[strJsonName].isObject()"},
    {R"({"$":["member"]})", "!jTableDef[strJsonName].isObject()"},
    {R"({"$":{}})", R"(!jTableDef[strJsonName].isMember("member"))"},
    {R"({"$":{"Member":{}}})", R"(!jTableDef[strJsonName].isMember("member"))"},
    {R"({"$":{"member":null}})", R"(!jTableDef[strJsonName]["member"].isObject())"},
    {R"({"$":{"member":[]}})", R"(!jTableDef[strJsonName]["member"].isObject())"},
    {R"({"$":{"member":"a"}})", R"(!jTableDef[strJsonName]["member"].isObject())"},
    {R"({"$":{"member":{}}})", "jType == Json::nullValue || !jType.isMember(strJsonName)"},
    {R"({"$":{"member":{"a":{}}}})",
     R"(!jTableDef[strJsonName]["member"][strKey].isMember("cpptype"))"},
    {R"({"$":{"member":{"a":"int"}}})",
     R"(!jTableDef[strJsonName]["member"][strKey].isMember("cpptype"))"},
    {R"({"$":{"member":{"a":null}}})",
     R"(!jTableDef[strJsonName]["member"][strKey].isMember("cpptype"))"},
    {R"({"$":{"member":{"a":{"cpptype":4}}}})",
     R"(!jTableDef[strJsonName]["member"][strKey]["cpptype"].isString())"},
    {R"({"$":{"member":{"a":{"cpptype":null}}}})",
     R"(!jTableDef[strJsonName]["member"][strKey]["cpptype"].isString())"},
    {R"({"$":{"member":{"b":{"cpptype":"int"},"a":{}}}})",
     R"(!jTableDef[strJsonName]["member"][strKey].isMember("cpptype"))"},
    {R"({"$":{"member":{"a":{"cpptype":"int"},"b":{},"c":{"cpptype":"int"}}}})",
     R"(!jTableDef[strJsonName]["member"][strKey].isMember("cpptype"))",
     R"({"a":{"cpptype":"int"}})", nullptr},
    {R"({"$":{"member":{"a":{"cpptype":"int","cppDefaultValue":1},"b":{"cpptype":["int"]}}}})",
     R"(!jTableDef[strJsonName]["member"][strKey]["cpptype"].isString())",
     R"({"a":{"cppDefaultValue":1,"cpptype":"int"}})", nullptr},
};

// The first failed check, the entry it leaves, and that no later definition mends it.
TEST_F(MemberTypes, OfABadDefinitionAreReportedAndStayAsTheyAre)
{
    for (const BadDefinition& bad : kBadDefinitions) {
        SCOPED_TRACE(bad.szDefinition);
        strName_ = freshName();
        const Json::Value jBad = definition(bad.szDefinition);
        const Json::Value jGood = definition(kGood);
        Json::Value jArgument = jBad;
        Json::Value jCache = cacheAsLogged();
        // What was read before the bad member is in the cache already when the lines show it.
        if (nullptr == bad.szLater) jCache[strName_] = json(bad.szEntry);

        const Json::Value* pjEntry = &VORN_JSON_DB::recType(jArgument, strName_);
        EXPECT_EQ(bad.szEntry, text(*pjEntry));
        EXPECT_EQ(text(jBad), text(jArgument));
        EXPECT_EQ(failure(bad.szCondition, jBad, jCache), takeLog());

        jCache[strName_] = json(bad.szEntry);
        jArgument = jGood;
        EXPECT_EQ(pjEntry, &VORN_JSON_DB::recType(jArgument, strName_));
        EXPECT_EQ(bad.szEntry, text(*pjEntry));
        EXPECT_EQ(bad.szLater ? failure(bad.szLater, jGood, jCache) : Lines(), takeLog());
    }
}

TEST_F(MemberTypes, DiagnosticsDoNotDependOnTheDebugFlag)
{
    for (bool blDebug : {false, true}) {
        blDebugOutput = blDebug;
        strName_ = freshName();
        entry("{}");
        EXPECT_EQ(4U, takeLog().size());
        strName_ = freshName();
        entry(kGood);
        EXPECT_EQ(Lines(), takeLog());
    }
}

TEST_F(MemberTypes, OnceKnownNeedNoDefinition)
{
    const Json::Value* pjEntry = &entry(kGood);
    for (const char* szDefinition :
         {"null", "[]", R"({"$":{"member":{"b":{"cpptype":"string"}}}})"}) {
        EXPECT_EQ(pjEntry, &entry(szDefinition));
        EXPECT_EQ(R"({"a":{"cpptype":"int"}})", text(*pjEntry));
    }
    EXPECT_EQ(Lines(), takeLog());
}

TEST_F(MemberTypes, StayWhereTheyAreWhileTablesAreAdded)
{
    const Json::Value* pjEntry = &entry(kGood);
    const std::string strFirst = strName_;
    for (int i = 0; i < 100; ++i) {
        strName_ = freshName();
        entry(kGood);
    }
    strName_ = strFirst;
    EXPECT_EQ(pjEntry, &entry("null"));
    EXPECT_EQ(R"({"a":{"cpptype":"int"}})", text(*pjEntry));
}

TEST_F(MemberTypes, OfTheFirstDefinitionHoldForEveryHandle)
{
    Database database;
    Table first(database, strName_, R"({"a":{"cpptype":"string"}})", "a");
    Table second(database, strName_, R"({"a":{"cpptype":"int"},"b":{"cpptype":"int"}})", "a");
    Json::Value jText = json(R"({"a":"x"})");
    Json::Value jNumber = json(R"({"a":5})");
    EXPECT_EQ(0, first.api.checkJsonType(jText));
    EXPECT_EQ(0, second.api.checkJsonType(jText));
    EXPECT_EQ(-1, second.api.checkJsonType(jNumber));
    EXPECT_EQ(Lines{error(R"(type failed, strKey=a, jRecParam={"a":5})")}, takeLog());
    std::string strSql;
    EXPECT_EQ(-1, second.api.SqlExpandMemberSymbol(strSql, jText));
    EXPECT_EQ(Lines{failed("!jType.isMember(strKey)")}, takeLog());
}

// In a process of its own each, where the cache is as the process began.
class FirstMemberTypes : public MemberTypes {
protected:
    FirstMemberTypes() { GTEST_FLAG_SET(death_test_style, "threadsafe"); }

    // Ends the process, with 0 when the call wrote these lines.
    static void callAndExit(const char* szDefinition, std::string strName, const Lines& lines)
    {
        Json::Value jDefinition = json(szDefinition);
        const bool blNull = VORN_JSON_DB::recType(jDefinition, strName).isNull();
        const Lines logged = takeLog();
        for (const std::string& strLine : logged) fprintf(stderr, "%s\n", strLine.c_str());
        _Exit(blNull && lines == logged ? 0 : 1);
    }
};

TEST_F(FirstMemberTypes, FindTheCacheNull)
{
    EXPECT_EXIT(callAndExit("null", "first",
                            {utilFailed("jTableDef.empty()"), utilPlain("strJsonName=first"),
                             utilPlain("jTableDef=null"), utilPlain("jType=null")}),
                testing::ExitedWithCode(0), "");
    EXPECT_EXIT(
        callAndExit(R"({"first":{"member":{}}})", "first",
                    {utilFailed("jType == Json::nullValue || !jType.isMember(strJsonName)"),
                     utilPlain("strJsonName=first"),
                     utilPlain(R"(jTableDef={"first":{"member":{}}})"), utilPlain("jType=null")}),
        testing::ExitedWithCode(0), "");
}

TEST_F(FirstMemberTypes, OfAnEmptyNameFailAfterTheLookUps)
{
    EXPECT_EXIT(callAndExit(R"({"":{"member":{"a":{"cpptype":"int"}}}})", "",
                            {utilFailed("strJsonName.empty()"), utilPlain("strJsonName="),
                             utilPlain(R"(jTableDef={"":{"member":{"a":{"cpptype":"int"}}}})"),
                             utilPlain("jType=null")}),
                testing::ExitedWithCode(0), "");
    EXPECT_EXIT(
        callAndExit(R"({"":{"member":[]}})", "",
                    {utilFailed(R"(!jTableDef[strJsonName]["member"].isObject())"),
                     utilPlain("strJsonName="), utilPlain(R"(jTableDef={"":{"member":[]}})"),
                     utilPlain("jType=null")}),
        testing::ExitedWithCode(0), "");
}

// The one test of this process that asks for a table without a name.
TEST(MemberTypesOfNoName, AreRefusedAfterTheLookUps)
{
    doubles::reset();
    Json::Value jDefinition = json(R"({"":{"member":{"a":{"cpptype":"int"}}}})");
    std::string strNoName;
    EXPECT_TRUE(VORN_JSON_DB::recType(jDefinition, strNoName).isNull());
    const Lines lines = takeLog();
    ASSERT_EQ(4U, lines.size());
    EXPECT_EQ(utilFailed("strJsonName.empty()"), lines[0]);
    EXPECT_EQ(utilPlain("strJsonName="), lines[1]);
}

}  // namespace
