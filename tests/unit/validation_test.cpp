// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// Default values and the type check.

#include "support/database.h"

#include <algorithm>
#include <utility>

namespace {

// Every kind of JSON value that is not an object.
const char* const kNonObjects[] = {"null", "true", "5",     "-5", "18446744073709551615",
                                   "1.5",  "\"\"", "\"a\"", "[]", R"([1,{"a":2}])"};

class DefaultValues : public TableTest {
protected:
    // Filling mode never fails; checking mode changes nothing and fails exactly when it logs.
    static void expectFill(Table& table, bool blCheckOnly, const std::string& strRecord,
                           const std::string& strFilled, const Lines& lines = {})
    {
        SCOPED_TRACE(strRecord);
        Json::Value jRecord = json(strRecord);
        EXPECT_EQ(lines.empty() ? 0 : -1, table.api.fillDefaultValue(jRecord, blCheckOnly));
        EXPECT_EQ(strFilled, text(jRecord));
        EXPECT_EQ(lines, takeLog());
    }

    static std::string lost(const std::string& strName)
    {
        return error("lost data member=" + strName);
    }

    Table abc_{database_,
               R"({"c":{"cpptype":"int","cppDefaultValue":3},"b":{"cpptype":"int"},
                   "a":{"cpptype":"string","cppDefaultValue":"x"}})",
               "a,b,c"};
};

TEST_F(DefaultValues, FillWhatTheRecordLacks)
{
    const std::pair<const char*, const char*> cases[] = {
        {"{}", R"({"a":"x","c":3})"},
        {"null", R"({"a":"x","c":3})"},
        {R"({"b":1})", R"({"a":"x","b":1,"c":3})"},
        {R"({"a":"","c":0})", R"({"a":"","c":0})"},
        {R"({"a":null,"b":null,"c":null})", R"({"a":null,"b":null,"c":null})"},
        {R"({"A":1,"c":{},"d":2})", R"({"A":1,"a":"x","c":{},"d":2})"},
    };
    for (const auto& [szRecord, szFilled] : cases) expectFill(abc_, false, szRecord, szFilled);
}

TEST_F(DefaultValues, AreCopiedWholeWhateverTheirKind)
{
    for (const std::string strDefault :
         {"null", "true", "false", "0", "-7", "18446744073709551615", "1.5", "\"\"",
          "\"it's 100%\"", "[]", R"([1,[2],{"k":null}])", "{}", R"({"k":{"l":[1,2]}})"}) {
        const std::string strMember = R"({"cppDefaultValue":)" + strDefault + R"(,"cpptype":)";
        Table table(database_,
                    R"({"i":)" + strMember + R"("int"},"v":)" + strMember + R"("no such word"}})",
                    "i,v");
        expectFill(table, false, "{}", R"({"i":)" + strDefault + R"(,"v":)" + strDefault + "}");
        expectFill(table, false, R"({"i":1,"v":null})", R"({"i":1,"v":null})");
    }
}

TEST_F(DefaultValues, AreIndependentCopies)
{
    Table table(database_, R"({"v":{"cpptype":"Json::objectValue","cppDefaultValue":{"k":[1]}}})",
                "v");
    Json::Value jRecord;
    EXPECT_EQ(0, table.api.fillDefaultValue(jRecord, false));
    jRecord["v"]["k"].append(2);
    jRecord["v"]["l"] = 3;
    expectFill(table, false, "{}", R"({"v":{"k":[1]}})");
    EXPECT_EQ(json(R"({"k":[1]})"),
              table.jDefinition[table.strName]["member"]["v"]["cppDefaultValue"]);
}

TEST_F(DefaultValues, LeaveARecordThatIsNotAnObjectAlone)
{
    Table nameless(database_, R"({"":{"cpptype":"int"}})", "a");
    for (const std::string strRecord : kNonObjects) {
        if ("null" != strRecord) expectFill(abc_, false, strRecord, strRecord);
        expectFill(abc_, true, strRecord, strRecord, {lost("a")});
        expectFill(nameless, true, strRecord, strRecord, {lost("")});
    }
}

TEST_F(DefaultValues, AreReportedMissingByTheFirstName)
{
    const std::pair<const char*, const char*> cases[] = {
        {R"({"b":1})", "a"},
        {"{}", "a"},
        {R"({"a":1,"c":1})", "b"},
        {R"({"a":null,"b":1})", "c"},
        {R"({"A":1,"B":1,"C":1})", "a"},
    };
    for (const auto& [szRecord, szLost] : cases) {
        expectFill(abc_, true, szRecord, szRecord, {lost(szLost)});
        blDebugOutput = true;
        for (bool blStdout : {false, true}) {
            blLogToStdout = blStdout;
            expectFill(abc_, true, szRecord, szRecord,
                       {lost(szLost), plain(std::string("jParam=") + szRecord)});
        }
        blLogToStdout = blDebugOutput = false;
    }
    for (const char* szRecord : {R"({"a":"","b":1,"c":2})", R"({"a":null,"b":null,"c":null})",
                                 R"({"a":1,"b":1,"c":1,"d":1})"})
        expectFill(abc_, true, szRecord, szRecord);
}

// The look-up says what is wrong; the result does not.
TEST_F(DefaultValues, AreAbsentInATableWithoutMembers)
{
    Table table(database_, "{}", "a");
    // A host may change what recType refers to.
    VORN_JSON_DB::recType(abc_.jDefinition, abc_.strName) = json(R"([{"cppDefaultValue":5}])");
    for (VornJsonDbApi* pApi : {&table.api, &abc_.api})
        for (const char* szRecord : {"{}", "null", R"({"a":1})", "[1]", "5"})
            for (bool blCheckOnly : {false, true}) {
                SCOPED_TRACE(szRecord);
                Json::Value jRecord = json(szRecord);
                EXPECT_EQ(0, pApi->fillDefaultValue(jRecord, blCheckOnly));
                EXPECT_EQ(szRecord, text(jRecord));
                EXPECT_EQ(4U, takeLog().size());
            }
}

class TypeCheck : public TableTest {
protected:
    // The check fails with the line of the error family, or passes if the line is empty.
    static void expectLine(Table& table, const std::string& strRecord, const std::string& strLine)
    {
        SCOPED_TRACE(strRecord);
        Json::Value jRecord = json(strRecord);
        EXPECT_EQ(strLine.empty() ? 0 : -1, table.api.checkJsonType(jRecord));
        EXPECT_EQ(strRecord, text(jRecord));
        EXPECT_EQ(strLine.empty() ? Lines() : Lines{error(strLine)}, takeLog());
    }

    // A table whose only member, "v", has the word.
    Table tableOf(const std::string& strWord)
    {
        return {database_, R"({"v":{"cpptype":")" + strWord + "\"}}", "v"};
    }
};

TEST_F(TypeCheck, AcceptsExactlyTheKindsOfEachWord)
{
    // Whole real numbers are integral to jsoncpp.
    const std::vector<std::string> integers = {"5", "-5", "5000000000", "18446744073709551615",
                                               "2.0"};
    const std::pair<const char*, std::vector<std::string>> accepted[] = {
        {"int", integers},
        {"long long", integers},
        {"uid_t", integers},
        {"time_t", integers},
        {"bool", {"true", "false"}},
        {"string", {"\"\"", "\"5\"", "\"true\""}},
        {"Json::arrayValue", {"[]", "[1]"}},
        {"Json::objectValue", {"{}", R"({"k":1})"}},
    };
    for (const auto& [szWord, values] : accepted) {
        SCOPED_TRACE(szWord);
        Table table = tableOf(szWord);
        for (const std::string strValue :
             {"null", "true", "false", "5", "-5", "5000000000", "18446744073709551615", "2.0",
              "2.5", "1.0000000000000001e+300", "NaN", "\"\"", "\"5\"", "\"true\"", "[]", "[1]",
              "{}", R"({"k":1})"}) {
            const std::string strRecord = R"({"v":)" + strValue + "}";
            const bool blPasses = values.end() != std::find(values.begin(), values.end(), strValue);
            expectLine(table, strRecord,
                       blPasses ? "" : "type failed, strKey=v, jRecParam=" + strRecord);
        }
    }
}

// Kept: a word that other consumers know may be one that the check does not.
TEST_F(TypeCheck, KnowsNoOtherWord)
{
    for (const char* szWord :
         {"unsigned int", "unsigned long long", "long", "unsigned long", "unsigned", "double",
          "float", "Json::Value", "", "Int", "string ", "array"}) {
        SCOPED_TRACE(szWord);
        Table table = tableOf(szWord);
        for (const std::string strValue : {"null", "5", "1.5", "\"x\"", "true", "[]", "{}"})
            expectLine(table, R"({"v":)" + strValue + "}", "type not found!!, key=v");
        expectLine(table, R"({"w":1})", "");
    }
}

TEST_F(TypeCheck, StopsAtTheFirstBadMember)
{
    Table table(database_,
                R"({"a":{"cpptype":"double"},"b":{"cpptype":"int"},"c":{"cpptype":"string"},
                    "100%s%n":{"cpptype":"int"},"ž":{"cpptype":"double"}})",
                "a,b,c");
    const std::pair<const char*, const char*> cases[] = {
        {R"({"a":1.5,"b":"x","c":5})", "type not found!!, key=a"},
        {R"({"a":null,"c":5})", "type not found!!, key=a"},
        {R"({"b":"x","c":5})", R"(type failed, strKey=b, jRecParam={"b":"x","c":5})"},
        {R"({"Z":1,"b":1,"c":5})", R"(type failed, strKey=c, jRecParam={"Z":1,"b":1,"c":5})"},
        {R"({"100%s%n":"%d"})", R"(type failed, strKey=100%s%n, jRecParam={"100%s%n":"%d"})"},
        {R"({"ž":1})", "type not found!!, key=ž"},
        {R"({"b":1,"c":"x"})", ""},
        // Not declared.
        {R"({"":{},"A":[],"aa":"x","b":1,"d":null})", ""},
        {"{}", ""},
    };
    for (const auto& [szRecord, szLine] : cases) expectLine(table, szRecord, szLine);
    for (const char* szRecord : kNonObjects)
        expectLine(table, szRecord, "Failed [!jRecParam.isObject()]");
}

TEST_F(TypeCheck, PassesEveryObjectIfTheTableHasNoTypes)
{
    Table table(database_, "{}", "a");
    Json::Value jRecord = json(R"({"a":[],"b":null})");
    EXPECT_EQ(0, table.api.checkJsonType(jRecord));
    EXPECT_EQ(4U, takeLog().size());
    jRecord = "x";
    EXPECT_EQ(-1, table.api.checkJsonType(jRecord));
    EXPECT_EQ(failed("!jRecParam.isObject()"), takeLog().at(4));
}

TEST_F(TypeCheck, ReadsTheWordAsText)
{
    Table table = tableOf("int");
    Json::Value& jType = VORN_JSON_DB::recType(table.jDefinition, table.strName);
    for (const char* szEntry : {R"({"cpptype":5})", R"({"cpptype":null})", "{}", "null"}) {
        jType["v"] = json(szEntry);
        expectLine(table, R"({"v":1})", "type not found!!, key=v");
    }
    jType["v"] = json(R"({"cpptype":"string"})");
    expectLine(table, R"({"v":"x"})", "");
}

}  // namespace
