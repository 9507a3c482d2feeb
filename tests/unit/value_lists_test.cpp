// SPDX-License-Identifier: MIT
// Column lists, and value lists of records that hold no percent sign.

#include "support/database.h"

#include <limits>
#include <stdexcept>

namespace {

const char kPrefix[] = "INSERT INTO x VALUES (";

class ValueLists : public TableTest {
protected:
    // What SqlExpandMemberSymbol makes of kPrefix, without kPrefix.
    std::string values(Table& table, Json::Value jRecord)
    {
        std::string strSql = kPrefix;
        EXPECT_EQ(0, table.api.SqlExpandMemberSymbol(strSql, jRecord));
        EXPECT_EQ(kPrefix, strSql.substr(0, sizeof(kPrefix) - 1));
        return strSql.substr(sizeof(kPrefix) - 1);
    }

    std::string columns(Table& table, Json::Value jRecord)
    {
        std::string strSql = "SELECT ";
        EXPECT_EQ(0, table.api.SqlExpandMemberName(strSql, &jRecord));
        EXPECT_EQ("SELECT ", strSql.substr(0, 7));
        return strSql.substr(7);
    }

    // A call that fails or throws and changes nothing; the handle works afterwards.
    void expectSound(Table& table, const char* szGood, const char* szValues)
    {
        EXPECT_EQ(szValues, values(table, json(szGood)));
        EXPECT_EQ(Lines(), takeLog());
    }
};

const char kAbc[] = R"({"b":{"cpptype":"string"},"a":{"cpptype":"int"},"c":{"cpptype":"bool"}})";

TEST_F(ValueLists, LineUpByTheDefinitionsOrder)
{
    const struct {
        const char* szName;
        const char* szRecord;
        const char* szColumns;
        const char* szValues;
    } cases[] = {
        {"all", R"({"a":1,"b":"x","c":true})", "a,b,c", "1,'x',1) "},
        {"without the first", R"({"b":"x","c":true})", "b,c", "'x',1) "},
        {"without a middle one", R"({"a":1,"c":false})", "a,c", "1,0) "},
        {"without the last", R"({"a":1,"b":"x"})", "a,b,", "1,'x',"},
        {"only the first", R"({"a":1})", "a,", "1,"},
        {"only the last", R"({"c":true})", "c", "1) "},
        {"none", "{}", "", ""},
        {"null members count", R"({"a":null,"b":null,"c":null})", "a,b,c", "0,'',0) "},
        {"undeclared keys", R"({"A":1,"a":2,"aa":3,"b":"y","c":true,"d":[]})", "a,b,c",
         "2,'y',1) "},
        {"only undeclared keys", R"({"A":1,"d":[]})", "", ""},
        {"null", "null", "", ""},
        {"array", "[1]", "", ""},
        {"text", "\"a\"", "", ""},
        {"number", "5", "", ""},
        {"bool", "true", "", ""},
    };
    Table table(database_, kAbc, "a");
    for (const auto& c : cases) {
        SCOPED_TRACE(c.szName);
        EXPECT_EQ(c.szColumns, columns(table, json(c.szRecord)));
        EXPECT_EQ(c.szValues, values(table, json(c.szRecord)));
    }
    EXPECT_EQ(Lines(), takeLog());
    EXPECT_EQ(Lines(), takeStatements());
}

TEST_F(ValueLists, NameEveryColumnWithoutARecord)
{
    Table table(database_, kAbc, "a");
    std::string strSql = "SELECT ";
    EXPECT_EQ(0, table.api.SqlExpandMemberName(strSql));
    EXPECT_EQ("SELECT a,b,c", strSql);
    EXPECT_EQ(0, table.api.SqlExpandMemberName(strSql, nullptr));
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
    std::string strSql;
    EXPECT_EQ(0, table.api.SqlExpandMemberName(strSql));
    EXPECT_EQ(",\"q%,10,9,B b,_,z,é", strSql);
    EXPECT_EQ("1,2,3,4,5,6,7,8) ",
              values(table, json(R"({"":1,"\"q%":2,"10":3,"9":4,"B b":5,"_":6,"z":7,"é":8})")));
}

TEST_F(ValueLists, WriteTextsQuotedAndNumbersBare)
{
    Table table(
        database_,
        R"({"age":{"cpptype":"int"},"name":{"cpptype":"string"},"score":{"cpptype":"double"}})",
        "a");
    std::string strSql = "INSERT INTO people (age,name,score) VALUES (";
    Json::Value jRecord = json(R"({"age":30,"name":"Ann","score":2.5})");
    EXPECT_EQ(0, table.api.SqlExpandMemberSymbol(strSql, jRecord));
    EXPECT_EQ("INSERT INTO people (age,name,score) VALUES (30,'Ann',2.500000) ", strSql);
    EXPECT_EQ(json(R"({"age":30,"name":"Ann","score":2.5})"), jRecord);
}

struct Rendering {
    const char* szWord;
    const char* szValue;
    const char* szText;
};

const Rendering kRenderings[] = {
    {"string", R"("O'Brien")", "'O''Brien'"},
    {"string", R"("''")", "''''''"},
    {"string", R"("")", "''"},
    {"string", R"("a\"b\\c\nd\t;--")", "'a\"b\\c\nd\t;--'"},
    {"string", R"("žluťoučký 🐎")", "'žluťoučký 🐎'"},
    {"string", R"("100%")", "'100%'"},
    {"string", R"("%s%n%z%")", "'%s%n%z%'"},
    {"string", R"("a\u0000b")", "'a'"},
    {"string", "5", "'5'"},
    {"string", "-7", "'-7'"},
    {"string", "true", "'true'"},
    {"string", "false", "'false'"},
    {"string", "null", "''"},
    {"string", "1.5", "'1.5'"},
    {"long long", "42", "42"},
    {"long long", "-9223372036854775808", "-9223372036854775808"},
    {"long long", "9223372036854775807", "9223372036854775807"},
    {"long long", "1.9", "1"},
    {"long long", "null", "0"},
    {"int", "42", "42"},
    {"int", "5000000000", "5000000000"},
    {"int", "true", "1"},
    {"int", "null", "0"},
    {"long", "-42", "-42"},
    {"bool", "true", "1"},
    {"bool", "false", "0"},
    {"bool", "7", "7"},
    {"bool", "null", "0"},
    {"unsigned long long", "18446744073709551615", "18446744073709551615"},
    {"unsigned long long", "7", "7"},
    {"unsigned long long", "null", "0"},
    {"unsigned int", "4294967296", "4294967296"},
    {"unsigned long", "7", "7"},
    {"unsigned long", "true", "1"},
    {"unsigned", "7", "7"},
    {"unsigned", "7.9", "7"},
    {"float", "1.5", "1.500000"},
    {"float", "16777217", "16777216.000000"},
    {"float", "0.30000001192092896", "0.300000"},
    {"float", "null", "0.000000"},
    {"float", "true", "1.000000"},
    {"float", "NaN", "NaN"},
    {"double", "0.25", "0.250000"},
    {"double", "16777217", "16777217.000000"},
    {"double", "-0.1234567", "-0.123457"},
    {"double", "1e15", "1000000000000000.000000"},
    {"double", "null", "0.000000"},
    {"double", "Infinity", "Inf"},
    {"double", "-Infinity", "-Inf"},
    {"Json::objectValue", R"({"k":1})", R"('{"k":1}')"},
    {"Json::objectValue", R"({"b":"it's","a":[1,{"c":null}]})",
     R"('{"a":[1,{"c":null}],"b":"it''s"}')"},
    {"Json::objectValue", "{}", "'{}'"},
    {"Json::objectValue", "null", "'null'"},
    {"Json::objectValue", "[1]", "'[1]'"},
    {"Json::arrayValue", R"([1,"it's",true])", R"('[1,"it''s",true]')"},
    {"Json::arrayValue", "[]", "'[]'"},
    {"Json::arrayValue", "\"x\"", "'\"x\"'"},
    {"Json::arrayValue", "5", "'5'"},
};

std::string oneMember(const std::string& strWord)
{
    Json::Value jMembers;
    jMembers["v"]["cpptype"] = strWord;
    return text(jMembers);
}

TEST_F(ValueLists, RenderEachWord)
{
    for (const Rendering& row : kRenderings) {
        SCOPED_TRACE(std::string(row.szWord) + " " + row.szValue);
        Table table(database_, oneMember(row.szWord), "v");
        Json::Value jRecord;
        jRecord["v"] = json(row.szValue);
        const std::string strBefore = text(jRecord);
        EXPECT_EQ(std::string(row.szText) + ") ", values(table, jRecord));
        EXPECT_EQ(strBefore, text(jRecord));
        EXPECT_EQ(Lines(), takeLog());
    }
}

TEST_F(ValueLists, RefuseEveryOtherWord)
{
    for (const char* szWord : {"Json::Value", "uid_t", "time_t", "", "String", "INT", "int ",
                               " int", "Json::intValue", "100%s%n"}) {
        SCOPED_TRACE(szWord);
        Json::Value jMembers;
        jMembers["a"]["cpptype"] = "int";
        jMembers["v"]["cpptype"] = szWord;
        Table table(database_, text(jMembers), "a");
        std::string strSql = kPrefix;
        for (const char* szValue : {"1", "null", "{}"}) {
            Json::Value jRecord = json(std::string(R"({"a":1,"v":)") + szValue + "}");
            EXPECT_EQ(-1, table.api.SqlExpandMemberSymbol(strSql, jRecord));
            EXPECT_EQ(kPrefix, strSql);
            EXPECT_EQ(Lines{error(std::string("cannot support this type=") + szWord)}, takeLog());
        }
        // The word matters only where the record holds the member.
        expectSound(table, R"({"a":1})", "1,");
    }
}

TEST_F(ValueLists, LeaveTheTextAloneWhenAnAccessorThrows)
{
    const struct {
        const char* szWord;
        const char* szValue;
    } cases[] = {
        {"string", "{}"},          {"string", "[1]"},
        {"int", "\"5\""},          {"int", "{}"},
        {"long long", "1e30"},     {"long", "18446744073709551615"},
        {"bool", "\"true\""},      {"bool", "[]"},
        {"unsigned", "-1"},        {"unsigned int", "\"7\""},
        {"unsigned long", "1e30"}, {"unsigned long long", "{}"},
        {"float", "\"1.5\""},      {"double", "[]"},
        {"double", "{}"},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(std::string(c.szWord) + " " + c.szValue);
        Json::Value jMembers;
        jMembers["a"]["cpptype"] = "int";
        jMembers["v"]["cpptype"] = c.szWord;
        Table table(database_, text(jMembers), "a");
        std::string strSql = kPrefix;
        Json::Value jRecord = json(std::string(R"({"a":1,"v":)") + c.szValue + "}");
        const Json::Value jBefore = jRecord;
        EXPECT_THROW(table.api.SqlExpandMemberSymbol(strSql, jRecord), Json::LogicError);
        EXPECT_EQ(kPrefix, strSql);
        EXPECT_EQ(jBefore, jRecord);
        EXPECT_EQ(Lines(), takeLog());
        expectSound(table, R"({"a":1})", "1,");
    }
}

TEST_F(ValueLists, ThrowLogicErrorWhenTheFormatterFindsNoMemory)
{
    Table table(database_, kAbc, "a");
    Json::Value jRecord = json(R"({"a":1,"b":"x","c":true})");
    for (int iCall = 1; iCall <= 3; ++iCall) {
        SCOPED_TRACE(iCall);
        for (const char* szPrefix : {kPrefix, "%% 100% ", "a%d%s%n"}) {
            std::string strSql = szPrefix;
            doubles::state().iFailMprintf = iCall;
            EXPECT_THROW(table.api.SqlExpandMemberSymbol(strSql, jRecord), std::logic_error);
            EXPECT_EQ(0, doubles::state().iFailMprintf);
            EXPECT_EQ(szPrefix, strSql);
            EXPECT_EQ(Lines(), takeLog());
        }
    }
    expectSound(table, R"({"a":1,"b":"x","c":true})", "1,'x',1) ");
}

TEST_F(ValueLists, DoNotFormatATextThatGetsNoValue)
{
    Table table(database_, kAbc, "a");
    Table empty(database_, "{}", "a");
    for (const char* szText : {"100%d %s %n", "%", "%%"}) {
        std::string strSql = szText;
        Json::Value jNone(Json::objectValue);
        EXPECT_EQ(0, table.api.SqlExpandMemberSymbol(strSql, jNone));
        EXPECT_EQ(szText, strSql);
        EXPECT_EQ(Lines(), takeLog());
        Json::Value jSome = json(R"({"a":1})");
        EXPECT_EQ(0, empty.api.SqlExpandMemberSymbol(strSql, jSome));
        EXPECT_EQ(szText, strSql);
        EXPECT_FALSE(takeLog().empty());
    }
    std::string strNul("a\0b", 3);
    Json::Value jNone(Json::objectValue);
    EXPECT_EQ(0, table.api.SqlExpandMemberSymbol(strNul, jNone));
    EXPECT_EQ(std::string("a\0b", 3), strNul);
}

}  // namespace
