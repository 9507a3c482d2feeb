// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// Column lists, and value lists of records without a percent sign; the definition and the member
// types that they are made from.

#include "support/composed.h"
#include "support/lookups.h"

#include <stdexcept>

namespace {

// Words that value lists know, and words that they refuse. Each also names a member of everyWord_.
const char kSigned[] = "int|long|long long|bool";
const char kUnsigned[] = "unsigned|unsigned int|unsigned long|unsigned long long";
const char kJson[] = "Json::objectValue|Json::arrayValue";
const char kRefused[] =
    "Json::Value|uid_t|time_t|String|INT|int | int|Json::intValue|100%s%n|no such word";

class ValueLists : public TableTest {
protected:
    static std::string everyWord()
    {
        Json::Value jMembers =
            json(R"({"":{"cpptype":""},"A":{"cpptype":"int"},"~":{"cpptype":"int"}})");
        for (const char* szWords : {kSigned, kUnsigned, kJson, kRefused, "string|float|double"})
            for (const std::string& strWord : split(szWords, '|'))
                jMembers[strWord]["cpptype"] = strWord;
        return text(jMembers);
    }

    static void expectValues(Table& table, const std::string& strRecord, const Composed& expected)
    {
        expectComposed(expected, strRecord, [&](auto& jRecord, auto& strOut) {
            return table.api.SqlExpandMemberSymbol(strOut, jRecord);
        });
    }

    static void expectColumns(Table& table, const std::string& strRecord, const char* szColumns)
    {
        expectComposed({szColumns}, strRecord, [&](auto& jRecord, auto& strOut) {
            return table.api.SqlExpandMemberName(strOut, &jRecord);
        });
    }

    // The value list of a record with an int and, after it, the value as a member of the word.
    void expectOfWords(const std::string& strWords, const std::string& strValue,
                       const Composed& expected)
    {
        for (const std::string& strWord : split(strWords, '|'))
            expectValues(everyWord_, R"({"A":1,")" + strWord + "\":" + strValue + "}", expected);
    }

    Table abc_{database_,
               R"({"b":{"cpptype":"string"},"a":{"cpptype":"int"},"c":{"cpptype":"bool"}})", "a"};
    Table everyWord_{database_, everyWord(), "a"};
};

TEST_F(ValueLists, FollowTheOrderOfTheDefinition)
{
    const struct {
        const char* szRecord;
        const char* szColumns;
        const char* szValues;
    } cases[] = {
        {R"({"a":1,"b":"x","c":true})", "a,b,c", "1,'x',1) "},
        {R"({"b":"x","c":true})", "b,c", "'x',1) "},
        {R"({"a":1,"c":false})", "a,c", "1,0) "},
        // Kept: without the last member the list does not close.
        {R"({"a":1,"b":"x"})", "a,b,", "1,'x',"},
        {R"({"a":1})", "a,", "1,"},
        {R"({"c":true})", "c", "1) "},
        {R"({"a":null,"b":null,"c":null})", "a,b,c", "0,'',0) "},
        {R"({"A":1,"a":2,"aa":3,"b":"y","c":true,"d":[]})", "a,b,c", "2,'y',1) "},
        {R"({"A":1,"d":[]})", "", ""},
        {"{}", "", ""},
        {"null", "", ""},
        {"[1]", "", ""},
        {"5", "", ""},
    };
    for (const auto& c : cases) {
        expectColumns(abc_, c.szRecord, c.szColumns);
        expectValues(abc_, c.szRecord, {c.szValues});
    }
}

TEST_F(ValueLists, NameEveryColumnWithoutARecord)
{
    std::string strSql = "SELECT ";
    EXPECT_EQ(0, abc_.api.SqlExpandMemberName(strSql));
    EXPECT_EQ(0, abc_.api.SqlExpandMemberName(strSql, nullptr));
    EXPECT_EQ("SELECT a,b,ca,b,c", strSql);
    EXPECT_EQ(Lines(), takeLog());
}

TEST_F(ValueLists, WriteNamesInByteOrderAndUnquoted)
{
    Table table(database_,
                R"({"z":{"cpptype":"int"},"B b":{"cpptype":"int"},"_":{"cpptype":"int"},
                    "10":{"cpptype":"int"},"9":{"cpptype":"int"},"\"q%":{"cpptype":"int"},
                    "é":{"cpptype":"int"},"":{"cpptype":"int"}})",
                "a");
    const char szRecord[] = R"({"":1,"\"q%":2,"10":3,"9":4,"B b":5,"_":6,"z":7,"é":8})";
    expectColumns(table, szRecord, ",\"q%,10,9,B b,_,z,é");
    expectValues(table, szRecord, {"1,2,3,4,5,6,7,8) "});
}

TEST_F(ValueLists, RenderEachWord)
{
    const struct {
        const char* szWords;
        const char* szValue;
        const char* szLiteral;
    } cases[] = {
        {"string", R"("O'Brien")", "'O''Brien'"},
        {"string", R"("''")", "''''''"},
        {"string", R"("")", "''"},
        {"string", R"("a\"b\\c\nd\t;--")", "'a\"b\\c\nd\t;--'"},
        {"string", R"("žluťoučký 🐎")", "'žluťoučký 🐎'"},
        {"string", R"("100%")", "'100%'"},
        {"string", R"("%s%n%z%")", "'%s%n%z%'"},
        {"string", R"("a\u0000b")", "'a'"},
        {"string", "-7", "'-7'"},
        {"string", "true", "'true'"},
        {"string", "null", "''"},
        {"string", "1.5", "'1.5'"},
        {kSigned, "-9223372036854775808", "-9223372036854775808"},
        {kSigned, "9223372036854775807", "9223372036854775807"},
        {kSigned, "1.9", "1"},
        {kSigned, "true", "1"},
        {kSigned, "false", "0"},
        {kSigned, "null", "0"},
        {kUnsigned, "18446744073709551615", "18446744073709551615"},
        {kUnsigned, "7.9", "7"},
        {kUnsigned, "true", "1"},
        {kUnsigned, "null", "0"},
        {"float", "16777217", "16777216.000000"},
        {"float", "0.30000001192092896", "0.300000"},
        {"double", "16777217", "16777217.000000"},
        {"double", "-0.1234567", "-0.123457"},
        {"double", "1e15", "1000000000000000.000000"},
        {"float|double", "1.5", "1.500000"},
        {"float|double", "null", "0.000000"},
        {"float|double", "true", "1.000000"},
        {"float|double", "NaN", "NaN"},
        {"float|double", "Infinity", "Inf"},
        {"float|double", "-Infinity", "-Inf"},
        {kJson, R"({"b":"it's","a":[1,{"c":null}]})", R"('{"a":[1,{"c":null}],"b":"it''s"}')"},
        {kJson, "{}", "'{}'"},
        {kJson, "null", "'null'"},
        {kJson, R"([1,"it's",true])", R"('[1,"it''s",true]')"},
        {kJson, "\"x\"", "'\"x\"'"},
        {kJson, "5", "'5'"},
    };
    for (const auto& c : cases)
        expectOfWords(c.szWords, c.szValue, {std::string("1,") + c.szLiteral + ","});
}

TEST_F(ValueLists, LeaveTheTextAloneWhenAnAccessorThrows)
{
    for (const char* szValue : {"\"5\"", "{}", "[]"})
        for (const char* szWords : {kSigned, kUnsigned, "float|double"})
            expectOfWords(szWords, szValue, {"", "T"});
    for (const char* szValue : {"1e30", "18446744073709551615"})
        expectOfWords(kSigned, szValue, {"", "T"});
    for (const char* szValue : {"1e30", "-1"}) expectOfWords(kUnsigned, szValue, {"", "T"});
    for (const char* szValue : {"{}", "[1]"}) expectOfWords("string", szValue, {"", "T"});
}

// Kept: words that other consumers know. A word matters only if the record holds the member.
TEST_F(ValueLists, RefuseAnyOtherWord)
{
    for (const std::string& strWord : split(kRefused, '|'))
        for (const char* szValue : {"1", "null", "{}"})
            expectOfWords(strWord, szValue,
                          {"", "-1", {error("cannot support this type=" + strWord)}});
    expectValues(everyWord_, R"({"":1})", {"", "-1", {error("cannot support this type=")}});
}

TEST_F(ValueLists, ThrowLogicErrorWhenTheFormatterFindsNoMemory)
{
    Json::Value jRecord = json(R"({"a":1,"b":"x","c":true})");
    for (int iCall : {1, 2, 3})
        for (const char* szPrefix : {"INSERT INTO x VALUES (", "%% 100% ", "a%d%s%n"}) {
            SCOPED_TRACE(szPrefix);
            std::string strSql = szPrefix;
            doubles::state().iFailMprintf = iCall;
            EXPECT_THROW(abc_.api.SqlExpandMemberSymbol(strSql, jRecord), std::logic_error);
            EXPECT_EQ(0, doubles::state().iFailMprintf);
            EXPECT_EQ(szPrefix, strSql);
            EXPECT_EQ(Lines(), takeLog());
        }
}

TEST_F(ValueLists, DoNotFormatATextThatGetsNoValue)
{
    Table empty(database_, "{}", "a");
    Json::Value jRecord = json(R"({"d":1})");
    for (const std::string& strText :
         {std::string("100%d %s %n"), std::string("%"), std::string("%%"), std::string("a\0b", 3)})
        for (Table* pTable : {&abc_, &empty}) {
            std::string strSql = strText;
            EXPECT_EQ(0, pTable->api.SqlExpandMemberSymbol(strSql, jRecord));
            EXPECT_EQ(strText, strSql);
        }
}

TEST_F(ValueLists, FollowTheFirstDefinitionUnderAName)
{
    const std::string strName = freshName();
    const auto table = [&](const char* szMembers) {
        return Table(database_, strName, szMembers, "a,b");
    };
    Table first = table(R"({"a":{"cpptype":"int"},"b":{"cpptype":"string"}})");
    expectValues(first, "{}", {""});
    Table other = table(R"({"a":{"cpptype":"string"},"b":{"cpptype":"Json::Value"}})");
    expectValues(other, R"({"a":7,"b":"x"})", {"7,'x') "});
    Table fewer = table("{}");
    expectValues(fewer, R"({"a":1})", {""});
    Table more = table(R"({"a":{"cpptype":"int"},"c":{"cpptype":"int"}})");
    for (const char* szRecord : {R"({"a":1,"c":2})", R"({"a":1})", "{}", "null", "[1]"})
        expectValues(more, szRecord, {"", "-1", {failed("!jType.isMember(strKey)")}});
    expectColumns(more, R"({"a":1,"c":2})", "a,c");
}

// What a host changes through recType's reference takes effect with the next call.
TEST_F(ValueLists, ReadTheWordFromTheTypesAsTheyAre)
{
    Json::Value& jType = VORN_JSON_DB::recType(abc_.jDefinition, abc_.strName)["a"];
    jType = json(R"({"cpptype":"string"})");
    expectValues(abc_, R"({"a":7})", {"'7',"});
    jType = json(R"({"cpptype":5})");
    expectValues(abc_, R"({"a":7})", {"", "-1", {error("cannot support this type=5")}});
    for (const char* szEntry : {R"({"cpptype":null})", "{}", "null"}) {
        jType = json(szEntry);
        expectValues(abc_, R"({"a":7})", {"", "-1", {error("cannot support this type=")}});
    }
}

using ValueListTypes = LookUpsTest;

// Kept: what the lists look up and do not find is inserted into the handle's definition.
TEST_F(ValueListTypes, InsertWhatTheDefinitionLacks)
{
    const char szNoMembers[] = R"(!jTableDef[strJsonName]["member"].isObject())";
    const auto expectInserted = [&](const BadDefinition& bad, bool blColumns) {
        SCOPED_TRACE(bad.szName);
        strName_ = freshName();
        std::string strCreate = "create table " + strName_ + " (a)";
        Json::Value jDefinition = json(named(bad.szDefinition));
        VornJsonDbApi api(database_.get(), strName_, jDefinition, strCreate);
        takeLog();
        std::string strSql;
        EXPECT_EQ(0, blColumns ? api.SqlExpandMemberName(strSql) : 0);
        EXPECT_EQ(Lines(), takeLog());
        Json::Value jRecord = json(R"({"a":1})");
        EXPECT_EQ(0, api.SqlExpandMemberSymbol(strSql, jRecord));
        // It finds what the column list has inserted, if that came before.
        const bool blInserted = blColumns && std::string(bad.szDefinition) != bad.szLater;
        EXPECT_EQ(named(blInserted ? lookUp(szNoMembers, bad.szLater, "-")
                                   : lookUp(bad.szCondition, bad.szDefinition, "-")),
                  takeOwnLog());
        EXPECT_EQ(0, api.SqlExpandMemberSymbol(strSql, jRecord));
        EXPECT_EQ(named(lookUp(kPoisoned, bad.szLater, "null")), takeOwnLog());
        EXPECT_EQ("", strSql);
        EXPECT_EQ(json(named(bad.szDefinition)), jDefinition) << "the host's own was changed";
    };
    const BadDefinition more[] = {
        {"text", "\"$\"", "\"$\"", "!jTableDef.isMember(strJsonName)"},
        {"number", "5", "5", "!jTableDef.isMember(strJsonName)"},
        {"array table", R"({"$":["a"]})", R"({"$":["a"]})", "!jTableDef[strJsonName].isObject()"},
        {"text member", R"({"$":{"member":"a"}})", R"({"$":{"member":"a"}})", szNoMembers},
        {"null member", R"({"$":{"member":null}})", R"({"$":{"member":null}})", szNoMembers},
    };
    for (bool blColumns : {false, true}) {
        for (const BadDefinition& bad : kBadDefinitions) expectInserted(bad, blColumns);
        for (const BadDefinition& bad : more) expectInserted(bad, blColumns);
    }
}

}  // namespace
