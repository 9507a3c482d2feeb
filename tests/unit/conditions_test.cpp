// SPDX-License-Identifier: MIT
// SqlExpandMemberList: a request as WHERE terms or as the SET list of an UPDATE.

#include "support/database.h"

namespace {

constexpr char kMembers[] = R"({
    "": {"cpptype": "string"},
    "Z": {"cpptype": "string"},
    "a": {"cpptype": "string"},
    "b": {"cpptype": "string"},
    "doc": {"cpptype": "Json::Value"},
    "flag": {"cpptype": "bool"},
    "list": {"cpptype": "Json::arrayValue"},
    "n": {"cpptype": "int"},
    "obj": {"cpptype": "Json::objectValue"},
    "z": {"cpptype": "string"}
})";

constexpr int kOr = VORN_SQL_WHERE_TYPE_OR;
constexpr int kAnd = VORN_SQL_WHERE_TYPE_AND;
constexpr int kComma = VORN_SQL_WHERE_TYPE_COMMA;

struct Case {
    const char* szName;
    const char* szRequest;
    int iJoiner;
    int iResult;
    const char* szOut;
};

class Conditions : public TableTest {
protected:
    // Every case begins with a text that has to stay in front, and neither logs nor runs SQL.
    void expectTerms(const std::vector<Case>& cases)
    {
        for (const Case& row : cases) {
            SCOPED_TRACE(row.szName);
            Json::Value jRequest = json(row.szRequest);
            const Json::Value jBefore = jRequest;
            std::string strOut = "before";
            EXPECT_EQ(row.iResult, table_.api.SqlExpandMemberList(jRequest, strOut, row.iJoiner));
            EXPECT_EQ(std::string("before") + row.szOut, strOut);
            EXPECT_EQ(Lines(), takeLog());
            EXPECT_EQ(text(jBefore), text(jRequest));
        }
        EXPECT_EQ(Lines(), takeStatements());
    }

    Table table_{database_, kMembers, "a, b, doc, flag, list, n, obj, z"};
};

TEST_F(Conditions, JoinersHaveTheNumbersThatHostsPass)
{
    EXPECT_EQ(0, VORN_SQL_WHERE_TYPE_OR);
    EXPECT_EQ(1, VORN_SQL_WHERE_TYPE_AND);
    EXPECT_EQ(2, VORN_SQL_WHERE_TYPE_COMMA);
}

TEST_F(Conditions, JoinsTermsByTheJoiner)
{
    expectTerms({
        {"one, or", R"({"a":"x"})", kOr, 0, " (a='x' )"},
        {"one, and", R"({"a":"x"})", kAnd, 0, " (a='x' )"},
        {"one, comma", R"({"a":"x"})", kComma, 0, "a='x'"},
        {"two, or", R"({"a":"x","n":7})", kOr, 0, " (a='x' or n=7 )"},
        {"two, and", R"({"a":"x","n":7})", kAnd, 0, " (a='x' and n=7 )"},
        {"two, comma", R"({"a":"x","n":7})", kComma, 0, "a='x' , n=7"},
        {"three, or", R"({"n":7,"b":"y","a":"x"})", kOr, 0, " (a='x' or b='y' or n=7 )"},
        {"three, and", R"({"n":7,"b":"y","a":"x"})", kAnd, 0, " (a='x' and b='y' and n=7 )"},
        {"three, comma", R"({"n":7,"b":"y","a":"x"})", kComma, 0, "a='x' , b='y' , n=7"},
    });
}

TEST_F(Conditions, AddNothingWithoutAUsableKey)
{
    for (int iJoiner : {kOr, kAnd, kComma})
        expectTerms({
            {"null", "null", iJoiner, 1, ""},
            {"empty object", "{}", iJoiner, 1, ""},
            {"undeclared", R"({"c":"x","A":1,"n ":2})", iJoiner, 1, ""},
            {"undeclared array", R"({"c":["x"]})", iJoiner, 1, ""},
            {"paging keys", R"({"limit":1,"offset":2,"sort_by":"a","sort_direction":"desc"})",
             iJoiner, 1, ""},
            {"raw filter in another case", R"({"vornsqlwherefilter":"1","VornSqlWhereFilter":"1"})",
             iJoiner, 1, ""},
            {"raw filter and more", R"({"vornSqlWhereFilter2":"1","vornSqlWhereFilter\u0000":"1"})",
             iJoiner, 1, ""},
        });
}

TEST_F(Conditions, PassOverUndeclaredKeys)
{
    expectTerms({
        {"before", R"({"A":1,"a":"x"})", kAnd, 0, " (a='x' )"},
        {"between", R"({"a":"x","aa":1,"b":"y"})", kAnd, 0, " (a='x' and b='y' )"},
        {"after", R"({"a":"x","zz":1})", kAnd, 0, " (a='x' )"},
        {"around, comma", R"({"A":1,"a":"x","aa":[2],"b":"y","zz":{}})", kComma, 0,
         "a='x' , b='y'"},
        {"a whole list request", R"({"a":"x","limit":1,"offset":2,"sort_by":"a"})", kAnd, 0,
         " (a='x' )"},
        {"a declared name and more behind a NUL", R"({"a\u0000b":"x","b":"y"})", kAnd, 0,
         " (b='y' )"},
    });
}

TEST_F(Conditions, WriteARawFilterAsItStands)
{
    expectTerms({
        {"alone, and", R"({"vornSqlWhereFilter":"x > 1"})", kAnd, 0, " ( x > 1  )"},
        {"alone, or", R"({"vornSqlWhereFilter":"x > 1"})", kOr, 0, " ( x > 1  )"},
        {"alone, comma", R"({"vornSqlWhereFilter":"x > 1"})", kComma, 0, " x > 1 "},
        {"empty", R"({"vornSqlWhereFilter":""})", kAnd, 0, " (   )"},
        {"nothing escaped", R"({"vornSqlWhereFilter":"a like '%o''B%n' -- \" ;"})", kAnd, 0,
         " ( a like '%o''B%n' -- \" ;  )"},
        {"not put in parentheses", R"({"a":"x","vornSqlWhereFilter":"n=1 or n=2"})", kAnd, 0,
         " (a='x' and  n=1 or n=2  )"},
    });
}

TEST_F(Conditions, WriteARawFilterAtItsPlaceInByteOrder)
{
    expectTerms({
        {"last", R"({"vornSqlWhereFilter":"1","a":"x"})", kAnd, 0, " (a='x' and  1  )"},
        {"first", R"({"z":"x","vornSqlWhereFilter":"1"})", kAnd, 0, " ( 1  and z='x' )"},
        {"between", R"({"z":"x","vornSqlWhereFilter":"1","Z":"w","a":"v"})", kOr, 0,
         " (Z='w' or a='v' or  1  or z='x' )"},
        {"between, comma", R"({"z":"x","vornSqlWhereFilter":"n=n+1","a":"v"})", kComma, 0,
         "a='v' ,  n=n+1  , z='x'"},
    });
}

TEST_F(Conditions, ARawFilterKeepsANulByte)
{
    Json::Value jRequest = json(R"({"vornSqlWhereFilter":"1\u0000x"})");
    std::string strOut;
    EXPECT_EQ(0, table_.api.SqlExpandMemberList(jRequest, strOut, kAnd));
    EXPECT_EQ(std::string(" ( 1\0x  )", 9), strOut);
}

TEST_F(Conditions, MakeAMembershipTermOfEveryArray)
{
    expectTerms({
        {"text", R"({"a":["x"]})", kAnd, 0, " (a in ('x' ) )"},
        {"with another", R"({"a":"x","b":["1","2"]})", kAnd, 0, " (a='x' and b in ('1''2' ) )"},
        {"number", R"({"n":[5]})", kOr, 0, " (n in (5 ) )"},
        {"Json::arrayValue", R"({"list":[1]})", kAnd, 0, " (list in ('1' ) )"},
        {"Json::arrayValue in an array", R"({"list":[[1,2]]})", kAnd, 0, " (list in ('[1,2]' ) )"},
        {"Json::objectValue", R"({"obj":[{"k":1}]})", kAnd, 0, R"( (obj in ('{"k":1}' ) ))"},
        {"Json::Value", R"({"doc":["x"]})", kAnd, 0, R"( (doc in ('"x"' ) ))"},
        {"comma", R"({"a":["x"],"n":1})", kComma, 0, "a in ('x' ) , n=1"},
        {"Json::arrayValue, comma", R"({"list":[1,2]})", kComma, 0, "list in ('1''2' )"},
    });
}

TEST_F(Conditions, WriteTheJoinerAroundAnEmptyArray)
{
    expectTerms({
        {"after", R"({"a":"x","b":[]})", kAnd, 0, " (a='x' and  )"},
        {"after, comma", R"({"a":"x","b":[]})", kComma, 0, "a='x' , "},
        {"before", R"({"a":[],"b":"x"})", kOr, 0, " ( or b='x' )"},
        {"alone", R"({"a":[]})", kAnd, 0, " ( )"},
        {"alone, comma", R"({"a":[]})", kComma, 0, ""},
        {"Json::arrayValue", R"({"list":[]})", kAnd, 0, " ( )"},
    });
}

TEST_F(Conditions, MakeAnEqualityTermOfEveryOtherValue)
{
    expectTerms({
        {"text", R"({"a":"x"})", kAnd, 0, " (a='x' )"},
        {"quote", R"({"a":"O'Brien"})", kAnd, 0, " (a='O''Brien' )"},
        {"number under text", R"({"a":7})", kAnd, 0, " (a='7' )"},
        {"null under text", R"({"a":null})", kAnd, 0, " (a='' )"},
        {"text under a number", R"({"n":"7"})", kAnd, 0, " (n=7 )"},
        {"null under a number", R"({"n":null})", kAnd, 0, " (n= )"},
        {"bool", R"({"flag":true})", kAnd, 0, " (flag=1 )"},
        {"object", R"({"obj":{"k":"it's"}})", kAnd, 0, R"( (obj='{"k":"it''s"}' ))"},
        {"object under Json::arrayValue", R"({"list":{}})", kAnd, 0, " (list='{}' )"},
        {"null under Json::Value", R"({"doc":null})", kAnd, 0, " (doc='null' )"},
        {"an empty name", R"({"":"x"})", kAnd, 0, " (='x' )"},
    });
}

TEST_F(Conditions, ReadPagingKeysThatTheTableDeclares)
{
    Table table(database_,
                R"({"limit":{"cpptype":"int"},"offset":{"cpptype":"int"},
                    "sort_by":{"cpptype":"string"},"sort_direction":{"cpptype":"string"}})",
                "a");
    Json::Value jRequest =
        json(R"({"limit":1,"offset":2,"sort_by":"a","sort_direction":"desc","a":3})");
    std::string strOut;
    EXPECT_EQ(0, table.api.SqlExpandMemberList(jRequest, strOut, kAnd));
    EXPECT_EQ(" (limit=1 and offset=2 and sort_by='a' and sort_direction='desc' )", strOut);
}

// Kept: the name always means the raw filter, and its value is never written as a value.
TEST_F(Conditions, TakeTheRawFilterForAMemberOfItsName)
{
    Table table(database_, R"({"vornSqlWhereFilter":{"cpptype":"int"}})", "vornSqlWhereFilter");
    Json::Value jRequest = json(R"({"vornSqlWhereFilter":"x"})");
    std::string strOut;
    EXPECT_EQ(0, table.api.SqlExpandMemberList(jRequest, strOut, kAnd));
    EXPECT_EQ(" ( x  )", strOut);
    jRequest = json(R"({"vornSqlWhereFilter":5})");
    EXPECT_EQ(-1, table.api.SqlExpandMemberList(jRequest, strOut, kAnd));
    EXPECT_EQ(Lines{failed("!jRecParam[jmFieldName[i]].isString()")}, takeLog());
}

TEST_F(Conditions, MakesEachCallAfresh)
{
    Json::Value jRequest = json(R"({"a":"x","n":7})");
    std::string strOut;
    EXPECT_EQ(0, table_.api.SqlExpandMemberList(jRequest, strOut, kComma));
    EXPECT_EQ(0, table_.api.SqlExpandMemberList(jRequest, strOut, kAnd));
    EXPECT_EQ("a='x' , n=7 (a='x' and n=7 )", strOut);
}

TEST_F(Conditions, NeedNoConnection)
{
    Json::Value jDefinition = table_.jDefinition;
    VornJsonDbApi api(nullptr, table_.strName, jDefinition, table_.strCreate);
    takeLog();
    Json::Value jRequest = json(R"({"a":"x"})");
    std::string strOut;
    EXPECT_EQ(0, api.SqlExpandMemberList(jRequest, strOut, kAnd));
    EXPECT_EQ(" (a='x' )", strOut);
    EXPECT_EQ(Lines(), takeLog());
}

}  // namespace
