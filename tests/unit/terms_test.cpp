// SPDX-License-Identifier: MIT
// SqlMakeByMatchField and SqlMakeByListField: one term by type word and value.

#include "support/database.h"

#include <stdexcept>

namespace {

// What a word does with a value. A membership list writes kBool as kBare.
enum class Group { kText, kJson, kBool, kBare };

struct Word {
    const char* szWord;
    Group group;
};

const Word kWords[] = {
    {"string", Group::kText},
    {"Json::Value", Group::kJson},
    {"Json::objectValue", Group::kJson},
    {"Json::arrayValue", Group::kJson},
    {"bool", Group::kBool},
    {"int", Group::kBare},
    {"unsigned int", Group::kBare},
    {"unsigned", Group::kBare},
    {"long", Group::kBare},
    {"unsigned long", Group::kBare},
    {"long long", Group::kBare},
    {"unsigned long long", Group::kBare},
    {"float", Group::kBare},
    {"double", Group::kBare},
    {"uid_t", Group::kBare},
    {"time_t", Group::kBare},
    // Unknown ones: words count whole and in their case.
    {"", Group::kBare},
    {"String", Group::kBare},
    {"string ", Group::kBare},
    {"Bool", Group::kBare},
    {"Json::value", Group::kBare},
    {"std::string", Group::kBare},
    {"text", Group::kBare},
    {"string\\u0000", Group::kBare},
};

constexpr const char* kThrows = nullptr;

// The rendered value in each group, as a value or as the only item of a list.
struct Value {
    const char* szJson;
    const char* szText;
    const char* szJsonText;
    const char* szBool;
    const char* szBare;
};

const Value kValues[] = {
    {R"("x")", "'x'", R"('"x"')", kThrows, "x"},
    {R"("")", "''", R"('""')", kThrows, ""},
    {R"("7")", "'7'", R"('"7"')", kThrows, "7"},
    {R"("O'Brien")", "'O''Brien'", R"('"O''Brien"')", kThrows, "O''Brien"},
    {R"("''")", "''''''", R"('"''''"')", kThrows, "''''"},
    {R"("a\"b\\c")", R"('a"b\c')", R"('"a\"b\\c"')", kThrows, R"(a"b\c)"},
    {R"("%d%n%z%%")", "'%d%n%z%%'", R"('"%d%n%z%%"')", kThrows, "%d%n%z%%"},
    {R"("1 or 1=1")", "'1 or 1=1'", R"('"1 or 1=1"')", kThrows, "1 or 1=1"},
    {R"("a\nb")", "'a\nb'", R"('"a\nb"')", kThrows, "a\nb"},
    // Text is cut at a NUL byte, JSON text has it escaped.
    {R"("a\u0000b")", "'a'", R"('"a\u0000b"')", kThrows, "a"},
    {R"("ändern 東京 😀")", "'ändern 東京 😀'", R"('"ändern 東京 😀"')", kThrows, "ändern 東京 😀"},
    {"7", "'7'", "'7'", "7", "7"},
    {"0", "'0'", "'0'", "0", "0"},
    {"-1", "'-1'", "'-1'", "-1", "-1"},
    {"2147483647", "'2147483647'", "'2147483647'", "2147483647", "2147483647"},
    {"2147483648", "'2147483648'", "'2147483648'", kThrows, "2147483648"},
    {"-9223372036854775808", "'-9223372036854775808'", "'-9223372036854775808'", kThrows,
     "-9223372036854775808"},
    {"18446744073709551615", "'18446744073709551615'", "'18446744073709551615'", kThrows,
     "18446744073709551615"},
    {"1.5", "'1.5'", "'1.5'", "1", "1.5"},
    {"-0.5", "'-0.5'", "'-0.5'", "0", "-0.5"},
    {"2.0", "'2.0'", "'2.0'", "2", "2.0"},
    {"0.1", "'0.10000000000000001'", "'0.10000000000000001'", "0", "0.10000000000000001"},
    {"1e300", "'1.0000000000000001e+300'", "'1.0000000000000001e+300'", kThrows,
     "1.0000000000000001e+300"},
    {"true", "'true'", "'true'", "1", "true"},
    {"false", "'false'", "'false'", "0", "false"},
    {"null", "''", "'null'", "0", ""},
    {"{}", kThrows, "'{}'", kThrows, kThrows},
    {R"({"k":"it's","a":[1,null]})", kThrows, R"('{"a":[1,null],"k":"it''s"}')", kThrows, kThrows},
    {"[]", kThrows, "'[]'", kThrows, kThrows},
    {R"(["it's",2])", kThrows, R"('["it''s",2]')", kThrows, kThrows},
};

const char* expected(const Value& value, Group group)
{
    switch (group) {
    case Group::kText: return value.szText;
    case Group::kJson: return value.szJsonText;
    case Group::kBool: return value.szBool;
    case Group::kBare: return value.szBare;
    }
    return kThrows;
}

class Terms : public TableTest {
protected:
    // A table whose only member, "m", has the word.
    std::unique_ptr<Table> tableOf(const std::string& strWord)
    {
        return std::make_unique<Table>(database_, R"({"m":{"cpptype":")" + strWord + "\"}}", "m");
    }

    std::string strField_ = "m";
};

TEST_F(Terms, OfEveryWordAndValue)
{
    for (const Word& word : kWords) {
        const auto pTable = tableOf(word.szWord);
        for (const Value& value : kValues) {
            SCOPED_TRACE(std::string(word.szWord) + ": " + value.szJson);
            Json::Value jValue = json(value.szJson);
            std::string strOut = "before ";
            const char* szExpected = expected(value, word.group);
            if (kThrows == szExpected) {
                EXPECT_THROW(pTable->api.SqlMakeByMatchField(strField_, jValue, strOut),
                             Json::LogicError);
                EXPECT_EQ("before ", strOut);
            } else {
                EXPECT_EQ(0, pTable->api.SqlMakeByMatchField(strField_, jValue, strOut));
                EXPECT_EQ(std::string("before m=") + szExpected, strOut);
            }
            EXPECT_EQ(text(json(value.szJson)), text(jValue));
            EXPECT_EQ(Lines(), takeLog());
        }
    }
    EXPECT_EQ(Lines(), takeStatements());
}

TEST_F(Terms, OfAListOfEveryWordAndItem)
{
    for (const Word& word : kWords) {
        const auto pTable = tableOf(word.szWord);
        for (const Value& value : kValues) {
            SCOPED_TRACE(std::string(word.szWord) + ": " + value.szJson);
            const std::string strList = std::string("[") + value.szJson + "]";
            Json::Value jList = json(strList);
            std::string strOut = "before ";
            // Kept: a list has no rendering of its own for "bool": flag in (true ).
            const char* szExpected =
                expected(value, Group::kBool == word.group ? Group::kBare : word.group);
            if (kThrows == szExpected) {
                EXPECT_THROW(pTable->api.SqlMakeByListField("m", jList, strOut), Json::LogicError);
                EXPECT_EQ("before ", strOut);
            } else {
                EXPECT_EQ(0, pTable->api.SqlMakeByListField("m", jList, strOut));
                EXPECT_EQ(std::string("before m in (") + szExpected + " )", strOut);
            }
            EXPECT_EQ(text(json(strList)), text(jList));
            EXPECT_EQ(Lines(), takeLog());
        }
    }
    EXPECT_EQ(Lines(), takeStatements());
}

TEST_F(Terms, OfNumbersThatAreNone)
{
    const auto pText = tableOf("string");
    const auto pNumber = tableOf("double");
    const auto pJson = tableOf("Json::Value");
    Json::Value jValue = json("Infinity");
    std::string strOut;
    EXPECT_EQ(0, pText->api.SqlMakeByMatchField(strField_, jValue, strOut));
    EXPECT_EQ(0, pNumber->api.SqlMakeByMatchField(strField_, jValue, strOut));
    EXPECT_EQ(0, pJson->api.SqlMakeByMatchField(strField_, jValue, strOut));
    EXPECT_EQ("m='1e+9999'm=1e+9999m='Infinity'", strOut);
}

// Kept: nothing stands between the items of a list.
TEST_F(Terms, OfSeveralItemsGlueThem)
{
    struct Case {
        const char* szWord;
        const char* szList;
        const char* szOut;
    };
    for (const Case& row : {
             Case{"string", R"(["1","2"])", "m in ('1''2' )"},
             Case{"string", R"(["a","b","c"])", "m in ('a''b''c' )"},
             Case{"string", R"(["",""])", "m in ('''' )"},
             Case{"string", R"([1,true,null])", "m in ('1''true''' )"},
             Case{"int", "[1,2]", "m in (12 )"},
             Case{"int", "[1,-2,3]", "m in (1-23 )"},
             Case{"int", R"(["1,","2"])", "m in (1,2 )"},
             Case{"bool", "[true,false]", "m in (truefalse )"},
             Case{"Json::arrayValue", "[1,[2],{}]", "m in ('1''[2]''{}' )"},
             Case{"Json::objectValue", R"([{"k":1},{"k":2}])", R"(m in ('{"k":1}''{"k":2}' ))"},
             Case{"no word", "[1,2]", "m in (12 )"},
         }) {
        SCOPED_TRACE(row.szList);
        const auto pTable = tableOf(row.szWord);
        Json::Value jList = json(row.szList);
        std::string strOut;
        EXPECT_EQ(0, pTable->api.SqlMakeByListField("m", jList, strOut));
        EXPECT_EQ(row.szOut, strOut);
        EXPECT_EQ(Lines(), takeLog());
    }
}

TEST_F(Terms, OfAnEmptyListAreNone)
{
    for (const Word& word : kWords) {
        const auto pTable = tableOf(word.szWord);
        Json::Value jList(Json::arrayValue);
        std::string strOut = "before";
        EXPECT_EQ(0, pTable->api.SqlMakeByListField("m", jList, strOut));
        EXPECT_EQ("before", strOut);
        EXPECT_EQ(Lines(), takeLog());
    }
}

TEST_F(Terms, OfALongList)
{
    const auto pTable = tableOf("int");
    Json::Value jList;
    for (int i = 0; i < 1000; ++i) jList.append(7);
    std::string strOut;
    EXPECT_EQ(0, pTable->api.SqlMakeByListField("m", jList, strOut));
    EXPECT_EQ("m in (" + std::string(1000, '7') + " )", strOut);
}

TEST_F(Terms, HaveTheFieldNameAsItStands)
{
    Table table(database_, R"({"it's %d":{"cpptype":"string"},"":{"cpptype":"int"}})", "a");
    std::string strField = "it's %d";
    Json::Value jValue = json(R"("x")");
    Json::Value jList = json(R"(["x"])");
    std::string strOut;
    EXPECT_EQ(0, table.api.SqlMakeByMatchField(strField, jValue, strOut));
    EXPECT_EQ(0, table.api.SqlMakeByListField("it's %d", jList, strOut));
    strField = "";
    EXPECT_EQ(0, table.api.SqlMakeByMatchField(strField, jValue, strOut));
    EXPECT_EQ("it's %d='x'it's %d in ('x' )=x", strOut);
}

// The result may be appended to the very text that the value came from.
TEST_F(Terms, MayWriteIntoTheFieldName)
{
    const auto pTable = tableOf("string");
    Json::Value jValue = json(R"("x")");
    EXPECT_EQ(0, pTable->api.SqlMakeByMatchField(strField_, jValue, strField_));
    EXPECT_EQ("mm='x'", strField_);
}

TEST_F(Terms, FollowAHostThatChangesTheMemberTypes)
{
    const auto pTable = tableOf("string");
    Json::Value& jType = VORN_JSON_DB::recType(pTable->jDefinition, pTable->strName);
    Json::Value jValue = json("5");
    std::string strOut;
    jType["m"]["cpptype"] = "int";
    EXPECT_EQ(0, pTable->api.SqlMakeByMatchField(strField_, jValue, strOut));
    // A word that is no text is taken as text, and no word at all is an unknown one.
    jType["m"]["cpptype"] = 1;
    EXPECT_EQ(0, pTable->api.SqlMakeByMatchField(strField_, jValue, strOut));
    jType["m"] = Json::Value(Json::objectValue);
    EXPECT_EQ(0, pTable->api.SqlMakeByMatchField(strField_, jValue, strOut));
    EXPECT_EQ("m=5m=5m=5", strOut);
}

}  // namespace
