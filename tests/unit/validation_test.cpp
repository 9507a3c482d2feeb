// SPDX-License-Identifier: MIT
// Default values and the type check.

#include "support/database.h"

#include <algorithm>

namespace {

// Every kind of JSON value that is not an object.
const char* const kNoObjects[] = {"null", "true", "5",     "-5", "18446744073709551615",
                                  "1.5",  "\"\"", "\"a\"", "[]", R"([1,{"a":2}])"};

class DefaultValues : public TableTest {
protected:
    // The record after fillDefaultValue in filling mode, which never fails.
    std::string filled(Table& table, const std::string& strRecord)
    {
        Json::Value jRecord = json(strRecord);
        EXPECT_EQ(0, table.api.fillDefaultValue(jRecord, false)) << strRecord;
        EXPECT_EQ(Lines(), takeLog());
        return text(jRecord);
    }

    // The log of fillDefaultValue in checking mode, which has to fail and change nothing.
    Lines lost(Table& table, const std::string& strRecord)
    {
        Json::Value jRecord = json(strRecord);
        const Json::Value jBefore = jRecord;
        EXPECT_EQ(-1, table.api.fillDefaultValue(jRecord, true)) << strRecord;
        EXPECT_EQ(jBefore, jRecord);
        EXPECT_EQ(jBefore.type(), jRecord.type());
        return takeLog();
    }

    Table abc_{database_,
               R"({"c":{"cpptype":"int","cppDefaultValue":3},"a":{"cpptype":"string",
                   "cppDefaultValue":"x"},"b":{"cpptype":"int"}})",
               "a,b,c"};
};

TEST_F(DefaultValues, FillWhatTheRecordLacks)
{
    const struct {
        const char* szRecord;
        const char* szFilled;
    } cases[] = {
        {"{}", R"({"a":"x","c":3})"},
        {"null", R"({"a":"x","c":3})"},
        {R"({"a":"y"})", R"({"a":"y","c":3})"},
        {R"({"b":1})", R"({"a":"x","b":1,"c":3})"},
        {R"({"a":"","b":0,"c":0})", R"({"a":"","b":0,"c":0})"},
        {R"({"a":null,"b":null,"c":null})", R"({"a":null,"b":null,"c":null})"},
        {R"({"a":[1],"c":{}})", R"({"a":[1],"c":{}})"},
        {R"({"A":1,"d":2})", R"({"A":1,"a":"x","c":3,"d":2})"},
    };
    for (const auto& c : cases) EXPECT_EQ(c.szFilled, filled(abc_, c.szRecord)) << c.szRecord;
}

TEST_F(DefaultValues, AreCopiedWholeWhateverTheirKind)
{
    for (const char* szDefault :
         {"null", "true", "false", "0", "-7", "18446744073709551615", "1.5", "\"\"",
          "\"it's 100%\"", "[]", R"([1,[2],{"k":null}])", "{}", R"({"k":{"l":[1,2]}})"}) {
        for (const char* szWord : {"int", "string", "Json::Value", "no such word"}) {
            SCOPED_TRACE(std::string(szWord) + " " + szDefault);
            Table table(database_,
                        std::string(R"({"v":{"cpptype":")") + szWord + R"(","cppDefaultValue":)" +
                            szDefault + "}}",
                        "v");
            EXPECT_EQ(text(json(std::string(R"({"v":)") + szDefault + "}")), filled(table, "{}"));
            EXPECT_EQ(R"({"v":1})", filled(table, R"({"v":1})"));
            EXPECT_EQ(R"({"v":null})", filled(table, R"({"v":null})"));
        }
    }
}

TEST_F(DefaultValues, AreCopiesOfTheirOwn)
{
    Table table(database_, R"({"v":{"cpptype":"Json::objectValue","cppDefaultValue":{"k":[1]}}})",
                "v");
    Json::Value jRecord;
    EXPECT_EQ(0, table.api.fillDefaultValue(jRecord, false));
    jRecord["v"]["k"].append(2);
    jRecord["v"]["l"] = 3;
    EXPECT_EQ(R"({"v":{"k":[1]}})", filled(table, "{}"));
    EXPECT_EQ(json(R"({"k":[1]})"),
              table.jDefinition[table.strName]["member"]["v"]["cppDefaultValue"]);
}

TEST_F(DefaultValues, LeaveARecordAloneThatIsNoObject)
{
    for (const char* szRecord : kNoObjects) {
        if (json(szRecord).isNull()) continue;
        SCOPED_TRACE(szRecord);
        EXPECT_EQ(text(json(szRecord)), filled(abc_, szRecord));
        EXPECT_EQ(Lines{error("lost data member=a")}, lost(abc_, szRecord));
    }
    EXPECT_EQ(Lines{error("lost data member=a")}, lost(abc_, "null"));
}

TEST_F(DefaultValues, AreNotNeededWhereEveryMemberIsPresent)
{
    for (const char* szRecord : {R"({"a":"","b":1,"c":2})", R"({"a":null,"b":null,"c":null})",
                                 R"({"a":1,"b":1,"c":1,"d":1})"}) {
        Json::Value jRecord = json(szRecord);
        EXPECT_EQ(0, abc_.api.fillDefaultValue(jRecord, true)) << szRecord;
        EXPECT_EQ(json(szRecord), jRecord);
    }
    EXPECT_EQ(Lines(), takeLog());
}

TEST_F(DefaultValues, AreReportedAsLostByTheFirstName)
{
    const struct {
        const char* szRecord;
        const char* szLost;
    } cases[] = {
        {R"({"b":1})", "a"},          {"{}", "a"},
        {R"({"a":1})", "b"},          {R"({"a":1,"c":1})", "b"},
        {R"({"a":1,"b":1})", "c"},    {R"({"A":1,"B":1,"C":1})", "a"},
        {R"({"a":null,"b":1})", "c"},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(c.szRecord);
        const std::string strLost = std::string("lost data member=") + c.szLost;
        EXPECT_EQ(Lines{error(strLost)}, lost(abc_, c.szRecord));
        blDebugOutput = true;
        EXPECT_EQ((Lines{error(strLost), plain("jParam=" + text(json(c.szRecord)))}),
                  lost(abc_, c.szRecord));
        blLogToStdout = true;
        EXPECT_EQ((Lines{error(strLost), plain("jParam=" + text(json(c.szRecord)))}),
                  lost(abc_, c.szRecord));
        blLogToStdout = blDebugOutput = false;
    }
}

// A host may change what recType refers to.
TEST_F(DefaultValues, AreNoneWhereTheTypesAreAList)
{
    VORN_JSON_DB::recType(abc_.jDefinition, abc_.strName) = json(R"([{"cppDefaultValue":5}])");
    for (bool blCheckOnly : {false, true}) {
        Json::Value jRecord(Json::objectValue);
        EXPECT_EQ(0, abc_.api.fillDefaultValue(jRecord, blCheckOnly));
        EXPECT_EQ("{}", text(jRecord));
        EXPECT_EQ(utilFailed("jType[strJsonName].type() != Json::objectValue"), takeLog()[0]);
    }
}

TEST_F(DefaultValues, OfANamelessMemberAreLostInAList)
{
    Table table(database_, R"({"":{"cpptype":"int"}})", "a");
    EXPECT_EQ(Lines{error("lost data member=")}, lost(table, "[1]"));
    EXPECT_EQ(Lines{error("lost data member=")}, lost(table, "{}"));
}

TEST_F(DefaultValues, AreNoneInATableWithoutMembers)
{
    Table table(database_, "{}", "a");
    for (const char* szRecord : {"{}", "null", R"({"a":1})", "[1]", "5"}) {
        for (bool blCheckOnly : {false, true}) {
            SCOPED_TRACE(szRecord);
            Json::Value jRecord = json(szRecord);
            EXPECT_EQ(0, table.api.fillDefaultValue(jRecord, blCheckOnly));
            EXPECT_EQ(json(szRecord), jRecord);
            // The look-up fails and says so; the result does not.
            EXPECT_EQ(4U, takeLog().size());
        }
    }
}

class TypeCheck : public TableTest {
protected:
    Lines log(Table& table, const Json::Value& jValue, int iResult)
    {
        Json::Value jRecord = jValue;
        EXPECT_EQ(iResult, table.api.checkJsonType(jRecord));
        EXPECT_EQ(jValue, jRecord);
        return takeLog();
    }

    void expectPasses(Table& table, const std::string& strRecord)
    {
        SCOPED_TRACE(strRecord);
        EXPECT_EQ(Lines(), log(table, json(strRecord), 0));
    }

    void expectFails(Table& table, const std::string& strRecord, const std::string& strLine)
    {
        SCOPED_TRACE(strRecord);
        EXPECT_EQ(Lines{error(strLine)}, log(table, json(strRecord), -1));
    }
};

struct Accepted {
    const char* szWord;
    std::vector<std::string> values;
};

// The words with the kinds they take. Whole real numbers are integral to jsoncpp.
const Accepted kAccepted[] = {
    {"int", {"5", "-5", "5000000000", "18446744073709551615", "2.0"}},
    {"long long", {"5", "-5", "5000000000", "18446744073709551615", "2.0"}},
    {"uid_t", {"5", "-5", "5000000000", "18446744073709551615", "2.0"}},
    {"time_t", {"5", "-5", "5000000000", "18446744073709551615", "2.0"}},
    {"bool", {"true", "false"}},
    {"string", {"\"\"", "\"5\"", "\"true\""}},
    {"Json::arrayValue", {"[]", "[1]"}},
    {"Json::objectValue", {"{}", "{\"k\":1}"}},
};

const char* const kValues[] = {
    "null",  "true",     "false", "5",         "-5",   "5000000000",
    "2.0",   "2.5",      "1e300", "NaN",       "\"\"", "[]",
    "\"5\"", "\"true\"", "[1]",   "{\"k\":1}", "{}",   "18446744073709551615"};

TEST_F(TypeCheck, AcceptsExactlyTheKindsOfEachWord)
{
    for (const Accepted& row : kAccepted) {
        SCOPED_TRACE(row.szWord);
        Json::Value jMembers;
        jMembers["v"]["cpptype"] = row.szWord;
        Table table(database_, text(jMembers), "v");
        for (const std::string strValue : kValues) {
            const bool blPasses =
                row.values.end() != std::find(row.values.begin(), row.values.end(), strValue);
            const std::string strRecord = R"({"v":)" + strValue + "}";
            Json::Value jRecord = json(strRecord);
            EXPECT_EQ(blPasses ? 0 : -1, table.api.checkJsonType(jRecord)) << strRecord;
            EXPECT_EQ(blPasses ? Lines()
                               : Lines{error("type failed, strKey=v, jRecParam=" + text(jRecord))},
                      takeLog());
        }
    }
}

TEST_F(TypeCheck, KnowsNoOtherWord)
{
    for (const char* szWord :
         {"unsigned int", "unsigned long long", "long", "unsigned long", "unsigned", "double",
          "float", "Json::Value", "", "Int", "string ", "array"}) {
        SCOPED_TRACE(szWord);
        Json::Value jMembers;
        jMembers["v"]["cpptype"] = szWord;
        Table table(database_, text(jMembers), "v");
        for (const char* szValue : {"null", "5", "1.5", "\"x\"", "true", "[]", "{}"})
            expectFails(table, std::string(R"({"v":)") + szValue + "}", "type not found!!, key=v");
        expectPasses(table, "{}");
        expectPasses(table, R"({"w":1})");
    }
}

TEST_F(TypeCheck, PassesWhatTheDefinitionDoesNotDeclare)
{
    Table table(database_, R"({"a":{"cpptype":"int"}})", "a");
    expectPasses(table, "{}");
    expectPasses(table, R"({"b":null,"A":[],"":{},"aa":"x"})");
    expectPasses(table, R"({"a":1,"b":"x"})");
}

TEST_F(TypeCheck, StopsAtTheFirstBadMember)
{
    Table table(database_,
                R"({"a":{"cpptype":"double"},"b":{"cpptype":"int"},"c":{"cpptype":"string"}})",
                "a,b,c");
    expectFails(table, R"({"a":1.5,"b":"x","c":5})", "type not found!!, key=a");
    expectFails(table, R"({"b":"x","c":5})", R"(type failed, strKey=b, jRecParam={"b":"x","c":5})");
    expectFails(table, R"({"b":1,"c":5,"Z":1})",
                R"(type failed, strKey=c, jRecParam={"Z":1,"b":1,"c":5})");
    expectFails(table, R"({"a":null,"c":5})", "type not found!!, key=a");
    expectPasses(table, R"({"b":1,"c":"x"})");
}

TEST_F(TypeCheck, RefusesWhatIsNoObject)
{
    Table table(database_, R"({"a":{"cpptype":"int"}})", "a");
    for (const char* szRecord : kNoObjects) {
        SCOPED_TRACE(szRecord);
        EXPECT_EQ(Lines{failed("!jRecParam.isObject()")}, log(table, json(szRecord), -1));
    }
}

TEST_F(TypeCheck, PassesEverythingWhereTheTableHasNoTypes)
{
    Table table(database_, "{}", "a");
    Json::Value jRecord = json(R"({"a":[],"b":null})");
    EXPECT_EQ(0, table.api.checkJsonType(jRecord));
    EXPECT_EQ(4U, takeLog().size());
    // The look-up comes first.
    Json::Value jText = "x";
    EXPECT_EQ(-1, table.api.checkJsonType(jText));
    const Lines lines = takeLog();
    ASSERT_EQ(5U, lines.size());
    EXPECT_EQ(utilFailed("jType[strJsonName].type() != Json::objectValue"), lines[0]);
    EXPECT_EQ(failed("!jRecParam.isObject()"), lines[4]);
}

TEST_F(TypeCheck, ReadsTheWordAsText)
{
    Table table(database_, R"({"a":{"cpptype":"int"}})", "a");
    Json::Value& jType = VORN_JSON_DB::recType(table.jDefinition, table.strName);
    for (const char* szEntry : {R"({"cpptype":5})", R"({"cpptype":null})", "{}", "null"}) {
        jType["a"] = json(szEntry);
        expectFails(table, R"({"a":1})", "type not found!!, key=a");
    }
    jType["a"] = json(R"({"cpptype":"string"})");
    expectPasses(table, R"({"a":"x"})");
}

TEST_F(TypeCheck, LogsNamesAndRecordsAsText)
{
    Table table(database_, R"({"100%s%n":{"cpptype":"int"},"ž":{"cpptype":"double"}})", "a");
    expectFails(table, R"({"100%s%n":"%d"})",
                R"(type failed, strKey=100%s%n, jRecParam={"100%s%n":"%d"})");
    expectFails(table, R"({"ž":1})", "type not found!!, key=ž");
}

}  // namespace
