// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// SqlMakeByMatchField and SqlMakeByListField: one term by type word and value. VectorParamToJson.

#include "support/composed.h"
#include "support/matrix.h"

#include <memory>

namespace {

// What a word does with a value. A membership list writes kBool as kBare.
enum class Group { kText, kJson, kBool, kBare };

const struct {
    Group group;
    std::vector<std::string> words;
} kWords[] = {
    {Group::kText, {"string"}},
    {Group::kJson, {"Json::Value", "Json::objectValue", "Json::arrayValue"}},
    {Group::kBool, {"bool"}},
    {Group::kBare,
     {"int", "unsigned int", "unsigned", "long", "unsigned long", "long long", "unsigned long long",
      "float", "double", "uid_t", "time_t"}},
    // Unknown ones: words are compared whole and case-sensitively.
    {Group::kBare,
     {"", "String", "string ", "Bool", "Json::value", "std::string", "text", "string\\u0000"}},
};

constexpr const char* kThrows = nullptr;

struct Value {
    const char* szJson;
    const char* szBare;  // as a bare value; in quotes, as a text
    const char* szBool;
};

const Value kValues[] = {
    {R"("x")", "x", kThrows},
    {R"("")", "", kThrows},
    {R"("O'Brien")", "O''Brien", kThrows},
    {R"("a\"b\\c")", R"(a"b\c)", kThrows},
    {R"("%d%n%z%%")", "%d%n%z%%", kThrows},
    // Text is cut at a NUL byte, JSON text has it escaped.
    {R"("a\u0000b")", "a", kThrows},
    {R"("ändern 東京 😀")", "ändern 東京 😀", kThrows},
    {"7", "7", "7"},
    {"-1", "-1", "-1"},
    {"2147483647", "2147483647", "2147483647"},
    {"2147483648", "2147483648", kThrows},
    {"-9223372036854775808", "-9223372036854775808", kThrows},
    {"18446744073709551615", "18446744073709551615", kThrows},
    {"1.5", "1.5", "1"},
    {"-0.5", "-0.5", "0"},
    {"2.0", "2.0", "2"},
    {"0.10000000000000001", "0.10000000000000001", "0"},
    {"1.0000000000000001e+300", "1.0000000000000001e+300", kThrows},
    {"Infinity", "1e+9999", kThrows},
    {"true", "true", "1"},
    {"false", "false", "0"},
    {"null", "", "0"},
    {"{}", kThrows, kThrows},
    {R"({"a":[1,null],"k":"it's"})", kThrows, kThrows},
    {R"(["it's",2])", kThrows, kThrows},
};

// A term of the value in its group, between the texts.
Composed term(const char* szBefore, const Value& value, Group group, const char* szAfter)
{
    const char* szBare = Group::kBool == group ? value.szBool : value.szBare;
    if (Group::kJson == group)
        return {szBefore + ("'" + replaced(value.szJson, '\'', "''") + "'") + szAfter};
    if (kThrows == szBare) return {"", "T"};
    const char* szQuote = Group::kText == group ? "'" : "";
    return {std::string(szBefore) + szQuote + szBare + szQuote + szAfter};
}

class Terms : public TableTest {
protected:
    // A table whose only member, "m", has the word.
    std::unique_ptr<Table> tableOf(const std::string& strWord)
    {
        return std::make_unique<Table>(database_, R"({"m":{"cpptype":")" + strWord + "\"}}", "m");
    }

    static void expectMatch(Table& table, std::string strField, const std::string& strValue,
                            const Composed& expected)
    {
        SCOPED_TRACE(strField);
        expectComposed(expected, strValue, [&](auto& jValue, auto& strOut) {
            return table.api.SqlMakeByMatchField(strField, jValue, strOut);
        });
    }

    static void expectList(Table& table, const char* szField, const std::string& strList,
                           const Composed& expected)
    {
        SCOPED_TRACE(szField ? szField : "(null)");
        expectComposed(expected, strList, [&](auto& jList, auto& strOut) {
            return table.api.SqlMakeByListField(szField, jList, strOut);
        });
    }

    Table table_{database_,
                 R"({"arr":{"cpptype":"Json::arrayValue"}, "doc":{"cpptype":"Json::Value"},
                     "flag":{"cpptype":"bool"}, "n":{"cpptype":"int"},
                     "name":{"cpptype":"string"}, "it's %d":{"cpptype":"string"},
                     "":{"cpptype":"int"}, "odd":{"cpptype":"no word"}})",
                 "name"};
};

TEST_F(Terms, RenderEveryValueByItsWord)
{
    for (const auto& [group, words] : kWords)
        for (const std::string& strWord : words) {
            SCOPED_TRACE(strWord);
            const auto pTable = tableOf(strWord);
            // Kept: a list has no rendering of its own for "bool": flag in (true ).
            const Group listGroup = Group::kBool == group ? Group::kBare : group;
            for (const Value& value : kValues) {
                expectMatch(*pTable, "m", value.szJson, term("m=", value, group, ""));
                expectList(*pTable, "m", std::string("[") + value.szJson + "]",
                           term("m in (", value, listGroup, " )"));
            }
            expectList(*pTable, "m", "[]", {""});
        }
}

// Kept: two texts read as one, and so do two numbers.
TEST_F(Terms, PutNothingBetweenTheItemsOfAList)
{
    std::string strLong = "[7";
    for (int i = 1; i < 1000; ++i) strLong += ",7";
    const struct {
        const char* szField;
        std::string strList;
        std::string strItems;
    } cases[] = {
        {"name", R"(["a","b","c"])", "'a''b''c'"},
        {"name", R"(["",""])", "''''"},
        {"name", R"([1,true,null])", "'1''true'''"},
        {"n", "[1,-2,3]", "1-23"},
        {"n", R"(["1,","2"])", "1,2"},
        {"n", strLong + "]", std::string(1000, '7')},
        {"flag", "[true,false]", "truefalse"},
        {"arr", "[1,[2],{}]", "'1''[2]''{}'"},
        {"doc", R"([{"k":1},{"k":2}])", R"('{"k":1}''{"k":2}')"},
        {"odd", "[1,2]", "12"},
    };
    for (const auto& c : cases)
        expectList(table_, c.szField, c.strList,
                   {std::string(c.szField) + " in (" + c.strItems + " )"});
}

TEST_F(Terms, WriteTheFieldNameVerbatim)
{
    expectMatch(table_, "it's %d", R"("x")", {"it's %d='x'"});
    expectList(table_, "it's %d", R"(["x"])", {"it's %d in ('x' )"});
    expectMatch(table_, "", R"("x")", {"=x"});
    // The result may be appended to the very text that holds the name.
    std::string strField = "name";
    Json::Value jValue = "x";
    EXPECT_EQ(0, table_.api.SqlMakeByMatchField(strField, jValue, strField));
    EXPECT_EQ("namename='x'", strField);
}

TEST_F(Terms, FollowTheHostsChangesToTheMemberTypes)
{
    Json::Value& jType = VORN_JSON_DB::recType(table_.jDefinition, table_.strName);
    // A word that is not a text is read as one, and a missing word is an unknown one.
    for (const char* szEntry : {R"({"cpptype":"int"})", R"({"cpptype":1})", "{}"}) {
        jType["name"] = json(szEntry);
        expectMatch(table_, "name", "5", {"name=5"});
    }
}

TEST_F(Terms, RefuseABadFieldOrList)
{
    const auto refused = [](const char* szCondition) {
        return Composed{"", "-1", {failed(szCondition)}};
    };
    const Composed noMember = refused("!jType.isMember(strField)");
    const Composed noName = refused("!szField || !szField[0]");
    const Composed noListMember = refused("!jType.isMember(szField)");
    const Composed noList = refused("jList.type() != Json::arrayValue");
    for (bool blStdout : {false, true}) {
        blLogToStdout = blStdout;
        // The value is never read.
        for (const char* szField : {"Name", "name ", "vornSqlWhereFilter", "limit"}) {
            expectMatch(table_, szField, "{}", noMember);
            for (const char* szList : {R"(["x"])", "[]", R"("no list")"})
                expectList(table_, szField, szList, noListMember);
        }
        expectMatch(table_, std::string("name\0", 5), R"("x")", noMember);
        for (const char* szField : {"", static_cast<const char*>(nullptr)})
            for (const char* szList : {R"(["x"])", "[]", R"("no list")"})
                expectList(table_, szField, szList, noName);
        for (const char* szField : {"name", "arr", "flag", "n", "odd"})
            for (const char* szList : {"null", R"("x")", "1", "-1", "18446744073709551615", "1.5",
                                       "true", "{}", R"({"0":"x"})"})
                expectList(table_, szField, szList, noList);
    }
}

TEST_F(Terms, FailWithoutMemoryForAValue)
{
    const auto noMemory = [](const std::string& strArguments, int iFail) {
        const Lines lines = {failed("NULL == (szSql = sqlite3_mprintf(" + strArguments + "))")};
        return Composed{"", "-1", lines, iFail};
    };
    expectMatch(table_, "flag", "true", noMemory(R"("%d", jParam.asInt())", 1));
    for (const std::string strField : {"name", "n", "odd", "flag", "doc", "arr"}) {
        const bool blJson = "doc" == strField || "arr" == strField;
        const char* szText = blJson ? ".toString().c_str()" : ".asString().c_str()";
        if ("flag" != strField)
            expectMatch(table_, strField, "1",
                        noMemory(std::string(R"("%q", jParam)") + szText, 1));
        for (int iItem : {1, 2, 3})
            expectList(table_, strField.c_str(), "[1,2,3]",
                       noMemory(std::string(R"("%q", jList[i])") + szText, iItem));
    }
}

class VectorParam : public TableTest {
protected:
    // The call ends with the result and the line, if any, and leaves szAfter.
    void expectConverted(const std::vector<std::string>& strings, const char* szKey,
                         const char* szBefore, const char* szAfter, const Lines& lines = {})
    {
        SCOPED_TRACE(szBefore);
        std::vector<std::string> strVector = strings;
        Json::Value jOut = json(szBefore);
        EXPECT_EQ(lines.empty() ? 0 : -1, table_.api.VectorParamToJson(strVector, szKey, jOut));
        EXPECT_EQ(szAfter, text(jOut));
        EXPECT_EQ(strings, strVector);
        EXPECT_EQ(lines, takeLog());
        EXPECT_EQ(Lines(), takeStatements());
    }

    Table table_{database_, R"({"name":{"cpptype":"string"}})", "name"};
};

TEST_F(VectorParam, BecomesAnArrayUnderTheKey)
{
    expectConverted({"x"}, "name", "null", R"({"name":["x"]})");
    expectConverted({"x"}, "name", "{}", R"({"name":["x"]})");
    expectConverted({"b", "a", "b", ""}, "name", "null", R"({"name":["b","a","b",""]})");
    expectConverted({}, "name", "null", R"({"name":[]})");
    expectConverted({"x"}, "name", R"({"name":"old","n":1})", R"({"n":1,"name":["x"]})");
    expectConverted({}, "name", R"({"name":["old","er"]})", R"({"name":[]})");
    expectConverted({"O'Brien", "%d"}, "no member", "{}", R"({"no member":["O'Brien","%d"]})");
    expectConverted({std::string("a\0b", 3)}, "name", "null", R"({"name":["a\u0000b"]})");
}

TEST_F(VectorParam, NeedsAnObjectOrNullAndAKey)
{
    const Lines badKind = {
        failed("jParamOut.type() != Json::objectValue && jParamOut.type() != Json::nullValue")};
    for (const char* szKey : {"", static_cast<const char*>(nullptr), "name"}) {
        for (const char* szOut : {"[]", R"(["x"])", R"("x")", "1", "-1", "18446744073709551615",
                                  "1.5", "true", "false"})
            expectConverted({"x"}, szKey, szOut, szOut, badKind);
        if (nullptr != szKey && '\0' != *szKey) continue;
        for (const char* szOut : {"null", "{}", R"({"name":"old"})"})
            expectConverted({"x"}, szKey, szOut, szOut, {failed("!szKey || !szKey[0]")});
    }
}

}  // namespace
