// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// SqlExpandMemberList: a request as WHERE terms or as the SET list of an UPDATE.

#include "support/composed.h"
#include "support/lookups.h"

namespace {

constexpr char kMembers[] = R"({
    "": {"cpptype": "string"}, "Z": {"cpptype": "string"}, "a": {"cpptype": "string"},
    "b": {"cpptype": "string"}, "doc": {"cpptype": "Json::Value"}, "flag": {"cpptype": "bool"},
    "list": {"cpptype": "Json::arrayValue"}, "n": {"cpptype": "int"},
    "nul\u0000name": {"cpptype": "string"}, "obj": {"cpptype": "Json::objectValue"},
    "z": {"cpptype": "string"}
})";

constexpr int kOr = VORN_SQL_WHERE_TYPE_OR;
constexpr int kAnd = VORN_SQL_WHERE_TYPE_AND;
constexpr int kComma = VORN_SQL_WHERE_TYPE_COMMA;

const std::string kBadKind =
    failed("jRecParam.type() != Json::objectValue && jRecParam.type() != Json::nullValue");
const std::string kBadFilter = failed("!jRecParam[jmFieldName[i]].isString()");
const std::string kBadMatch =
    failed("0 > SqlMakeByMatchField(jmFieldName[i], jTmp, strSqlWhereOut)");
const std::string kBadList =
    failed("0 > SqlMakeByListField(jmFieldName[i].c_str(), jTmp, strSqlWhereOut)");

struct Case {
    int iJoiner;
    std::string strRequest;
    Composed expected;
};

class Conditions : public TableTest {
protected:
    Conditions()
    {
        takeLog();
        takeStatements();
    }

    static void expectTerms(VornJsonDbApi& api, const std::vector<Case>& cases)
    {
        for (const Case& row : cases)
            expectComposed(row.expected, row.strRequest, [&](auto& jRequest, auto& strOut) {
                return api.SqlExpandMemberList(jRequest, strOut, row.iJoiner);
            });
    }

    void expectTerms(const std::vector<Case>& cases) { expectTerms(api_, cases); }

    // Conditions need no connection.
    Table table_{database_, kMembers, "a"};
    VornJsonDbApi api_{nullptr, table_.strName, table_.jDefinition, table_.strCreate};
};

TEST_F(Conditions, JoinTermsByTheJoiner)
{
    // The numbers that hosts pass.
    EXPECT_EQ(0, kOr);
    EXPECT_EQ(1, kAnd);
    EXPECT_EQ(2, kComma);
    expectTerms({
        {kOr, R"({"a":"x"})", {" (a='x' )"}},
        {kAnd, R"({"a":"x"})", {" (a='x' )"}},
        {kComma, R"({"a":"x"})", {"a='x'"}},
        {kOr, R"({"n":7,"b":"y","a":"x"})", {" (a='x' or b='y' or n=7 )"}},
        {kAnd, R"({"n":7,"b":"y","a":"x"})", {" (a='x' and b='y' and n=7 )"}},
        {kComma, R"({"n":7,"b":"y","a":"x"})", {"a='x' , b='y' , n=7"}},
    });
}

TEST_F(Conditions, AddNothingWithoutAUsableKey)
{
    for (const char* szRequest : {"null", "{}", R"({"c":"x","A":1,"n ":2})", R"({"c":["x"]})",
                                  R"({"limit":1,"offset":2,"sort_by":"a","sort_direction":"desc"})",
                                  R"({"vornsqlwherefilter":"1","VornSqlWhereFilter":"1"})",
                                  R"({"vornSqlWhereFilter2":"1","vornSqlWhereFilter\u0000":"1"})"})
        for (int iJoiner : {kOr, kAnd, kComma}) expectTerms({{iJoiner, szRequest, {"", "1"}}});
}

TEST_F(Conditions, SkipUndeclaredKeys)
{
    expectTerms({
        {kAnd, R"({"a":"x","aa":1,"b":"y"})", {" (a='x' and b='y' )"}},
        {kComma, R"({"A":1,"a":"x","aa":[2],"b":"y","zz":{}})", {"a='x' , b='y'"}},
        {kAnd, R"({"a":"x","limit":1,"offset":2,"sort_by":"a"})", {" (a='x' )"}},
        {kAnd, R"({"a\u0000b":"x","b":"y"})", {" (b='y' )"}},
    });
}

TEST_F(Conditions, WriteTheRawFilterVerbatimAtItsPlaceInByteOrder)
{
    expectTerms({
        {kAnd, R"({"vornSqlWhereFilter":"x > 1"})", {" ( x > 1  )"}},
        {kOr, R"({"vornSqlWhereFilter":"x > 1"})", {" ( x > 1  )"}},
        {kComma, R"({"vornSqlWhereFilter":"x > 1"})", {" x > 1 "}},
        {kAnd, R"({"vornSqlWhereFilter":""})", {" (   )"}},
        {kAnd,
         R"({"vornSqlWhereFilter":"a like '%o''B%n' -- \" ;"})",
         {R"( ( a like '%o''B%n' -- " ;  ))"}},
        {kAnd, R"({"vornSqlWhereFilter":"1\u0000x"})", {std::string(" ( 1\0x  )", 9)}},
        {kAnd, R"({"a":"x","vornSqlWhereFilter":"n=1 or n=2"})", {" (a='x' and  n=1 or n=2  )"}},
        {kAnd, R"({"z":"x","vornSqlWhereFilter":"1"})", {" ( 1  and z='x' )"}},
        {kOr,
         R"({"z":"x","vornSqlWhereFilter":"1","Z":"w","a":"v"})",
         {" (Z='w' or a='v' or  1  or z='x' )"}},
        {kComma, R"({"z":"x","vornSqlWhereFilter":"n=n+1"})", {" n=n+1  , z='x'"}},
    });
}

TEST_F(Conditions, TurnEveryArrayIntoAMembershipTerm)
{
    expectTerms({
        {kAnd, R"({"a":["x"]})", {" (a in ('x' ) )"}},
        {kAnd, R"({"a":"x","b":["1","2"]})", {" (a='x' and b in ('1''2' ) )"}},
        {kOr, R"({"n":[5]})", {" (n in (5 ) )"}},
        {kAnd, R"({"list":[[1,2]]})", {" (list in ('[1,2]' ) )"}},
        {kAnd, R"({"obj":[{"k":1}]})", {R"( (obj in ('{"k":1}' ) ))"}},
        {kAnd, R"({"doc":["x"]})", {R"( (doc in ('"x"' ) ))"}},
        {kComma, R"({"a":["x"],"n":1})", {"a in ('x' ) , n=1"}},
    });
}

TEST_F(Conditions, WriteTheJoinerAroundAnEmptyArray)
{
    expectTerms({
        {kAnd, R"({"a":"x","b":[]})", {" (a='x' and  )"}},
        {kComma, R"({"a":"x","b":[]})", {"a='x' , "}},
        {kOr, R"({"a":[],"b":"x"})", {" ( or b='x' )"}},
        {kComma, R"({"a":[]})", {""}},
        {kAnd, R"({"list":[]})", {" ( )"}},
    });
}

TEST_F(Conditions, TurnAnyOtherValueIntoAnEqualityTerm)
{
    expectTerms({
        {kAnd, R"({"a":"O'Brien"})", {" (a='O''Brien' )"}},
        {kAnd, R"({"n":null})", {" (n= )"}},
        {kAnd, R"({"flag":true})", {" (flag=1 )"}},
        {kAnd, R"({"obj":{"k":"it's"}})", {R"( (obj='{"k":"it''s"}' ))"}},
        {kAnd, R"({"list":{}})", {" (list='{}' )"}},
        {kAnd, R"({"doc":null})", {" (doc='null' )"}},
        {kAnd, R"({"":"x"})", {" (='x' )"}},
    });
}

TEST_F(Conditions, ReadPagingKeysThatTheTableDeclares)
{
    const char szMembers[] = R"({"limit":{"cpptype":"int"},"offset":{"cpptype":"int"},
        "sort_by":{"cpptype":"string"},"sort_direction":{"cpptype":"string"}})";
    Table table(database_, szMembers, "a");
    expectTerms(table.api, {{kAnd,
                             R"({"offset":2,"sort_by":"a","sort_direction":"desc","a":3})",
                             {" (offset=2 and sort_by='a' and sort_direction='desc' )"}},
                            {kAnd, R"({"limit":1})", {" (limit=1 )"}}});
}

// Kept: the name always means the raw filter, and its value is never written as a value.
TEST_F(Conditions, PreferTheRawFilterToAMemberOfItsName)
{
    Table table(database_, R"({"vornSqlWhereFilter":{"cpptype":"int"}})", "vornSqlWhereFilter");
    expectTerms(table.api, {{kAnd, R"({"vornSqlWhereFilter":"x"})", {" ( x  )"}},
                            {kAnd, R"({"vornSqlWhereFilter":5})", {" (", "-1", {kBadFilter}}}});
}

TEST_F(Conditions, RefuseANonObjectOrAnUnknownJoiner)
{
    for (const char* szRequest : {"[]", R"([{"a":"x"}])", R"("x")", R"("")", "0", "-1",
                                  "18446744073709551615", "1.5", "true", "false"})
        for (int iJoiner : {kOr, kAnd, kComma, 3})
            expectTerms({{iJoiner, szRequest, {"", "-1", {kBadKind}}}});
    for (int iJoiner : {3, -1, 4, 2147483647, -2147483647 - 1}) {
        const std::string strLine = error("error andType=" + std::to_string(iJoiner));
        for (const char* szRequest : {R"({"a":"x"})", "{}", "null"})
            expectTerms({{iJoiner, szRequest, {"", "-1", {strLine}}}});
    }
}

TEST_F(Conditions, RefuseARawFilterThatIsNotText)
{
    for (const char* szFilter : {"1", "1.5", "true", "null", "[]", R"(["x"])", R"({"a":"x"})"}) {
        const std::string strFilter = std::string(R"("vornSqlWhereFilter":)") + szFilter + "}";
        const auto refused = [](const char* szOut) { return Composed{szOut, "-1", {kBadFilter}}; };
        expectTerms({{kOr, "{" + strFilter, refused(" (")},
                     {kComma, "{" + strFilter, refused("")},
                     {kAnd, R"({"z":"y",)" + strFilter, refused(" (")},
                     {kAnd, R"({"a":"x",)" + strFilter, refused(" (a='x' and ")},
                     {kComma, R"({"a":"x",)" + strFilter, refused("a='x' , ")}});
    }
}

TEST_F(Conditions, RefuseAListUnderANameThatIsEmptyOrHoldsANul)
{
    const Lines noName = {failed("!szField || !szField[0]"), kBadList};
    // The list builder takes the name up to its NUL.
    const Lines notDeclared = {failed("!jType.isMember(szField)"), kBadList};
    expectTerms({{kAnd, R"({"":["x"]})", {" (", "-1", noName}},
                 {kComma, R"({"":[],"a":"x"})", {"", "-1", noName}},
                 {kAnd, R"({"n":1,"nul\u0000name":["x"]})", {" (n=1 and ", "-1", notDeclared}}});
}

TEST_F(Conditions, FailWithoutMemoryForATerm)
{
    const auto noMemory = [](const char* szOut, int iFail, const std::string& strArgument,
                             const std::string& strOuter) {
        const Lines lines = {
            failed("NULL == (szSql = sqlite3_mprintf(\"%q\", " + strArgument + ".c_str()))"),
            strOuter};
        return Composed{szOut, "-1", lines, iFail};
    };
    const auto noMatch = [&](const char* szOut, int iFail) {
        return noMemory(szOut, iFail, "jParam.asString()", kBadMatch);
    };
    expectTerms({
        {kComma, R"({"a":"x"})", noMatch("", 1)},
        {kAnd, R"({"a":"x","b":"y"})", noMatch(" (a='x' and ", 2)},
        {kOr, R"({"a":"x","n":7})", noMatch(" (a='x' or ", 2)},
        {kComma, R"({"a":"x","b":"y"})", noMatch("a='x' , ", 2)},
        {kAnd, R"({"vornSqlWhereFilter":"1","z":"x"})", noMatch(" ( 1  and ", 1)},
        {kAnd, R"({"doc":1})", noMemory(" (", 1, "jParam.toString()", kBadMatch)},
        {kAnd, R"({"doc":[1]})", noMemory(" (", 1, "jList[i].toString()", kBadList)},
        {kAnd, R"({"a":"x","n":[1,2]})",
         noMemory(" (a='x' and ", 3, "jList[i].asString()", kBadList)},
    });
}

TEST_F(Conditions, KeepWhatWasAppendedBeforeAnAccessorThrows)
{
    for (const char* szRequest : {R"({"a":{"k":1}})", R"({"flag":"x"})", R"({"flag":4294967296})",
                                  R"({"n":{}})", R"({"a":[{}]})", R"({"n":[1,[2]]})"})
        expectTerms({{kAnd, szRequest, {" (", "T"}}});
    expectTerms({{kAnd, R"({"a":"x","b":["y",{}]})", {" (a='x' and ", "T"}}});
}

using ConditionLookUps = LookUpsTest;

TEST_F(ConditionLookUps, HappenOncePerCallBeforeAnyCheck)
{
    const char szDefinition[] = R"({"-":{}})";
    Json::Value jDefinition = json(szDefinition);
    std::string strCreate = "create table " + strName_ + " (a text)";
    VornJsonDbApi api(database_.get(), strName_, jDefinition, strCreate);
    std::string strField = "a";
    Json::Value jNone;
    std::string strOut;
    const auto list = [&](const char* szRequest, int iJoiner) {
        Json::Value jRequest = json(szRequest);
        return api.SqlExpandMemberList(jRequest, strOut, iJoiner);
    };
    VORN_JSON_DB::recType(jDefinition, strName_);
    takeLog();
    const auto expectLines = [&](int iExpected, int iResult, const Lines& lines) {
        EXPECT_EQ(iExpected, iResult);
        EXPECT_EQ(named(lookUp(kPoisoned, szDefinition, "null") + lines), takeOwnLog());
    };
    expectLines(1, list(R"({"a":"x"})", kAnd), {});
    expectLines(-1, list("[1]", 3), {kBadKind});
    expectLines(-1, list("null", 3), {error("error andType=3")});
    expectLines(-1, api.SqlMakeByMatchField(strField, jNone, strOut),
                {failed("!jType.isMember(strField)")});
    expectLines(-1, api.SqlMakeByListField("a", jNone, strOut),
                {failed("!jType.isMember(szField)")});
    expectLines(-1, api.SqlMakeByListField(nullptr, jNone, strOut),
                {failed("!szField || !szField[0]")});
    EXPECT_EQ("", strOut);
    expectLines(0, list(R"({"a":"x","vornSqlWhereFilter":"1"})", kAnd), {});
    EXPECT_EQ(" ( 1  )", strOut);
}

}  // namespace
