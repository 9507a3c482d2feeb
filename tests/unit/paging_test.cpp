// SPDX-License-Identifier: MIT
// SqlFilterConditionFromJson: sorting and paging.

#include "support/database.h"

#include <stdexcept>

namespace {

constexpr char kMembers[] = R"({"name":{"cpptype":"string"},"limit":{"cpptype":"int"}})";

struct Case {
    const char* szRequest;
    const char* szOut;
};

class Paging : public TableTest {
protected:
    // Every case begins with a text that has to stay in front, and neither logs nor runs SQL.
    void expectClauses(const std::vector<Case>& cases)
    {
        for (const Case& row : cases) {
            SCOPED_TRACE(row.szRequest);
            Json::Value jRequest = json(row.szRequest);
            std::string strOut = "before";
            EXPECT_EQ(0, table_.api.SqlFilterConditionFromJson(jRequest, strOut));
            EXPECT_EQ(std::string("before") + row.szOut, strOut);
            EXPECT_EQ(text(json(row.szRequest)), text(jRequest));
            EXPECT_EQ(Lines(), takeLog());
        }
        EXPECT_EQ(Lines(), takeStatements());
    }

    // An accessor throws; strOut is what it leaves behind the text that was there.
    void expectThrow(const std::string& strRequest, const std::string& strOut)
    {
        SCOPED_TRACE(strRequest);
        Json::Value jRequest = json(strRequest);
        std::string strWritten = "before";
        EXPECT_THROW(table_.api.SqlFilterConditionFromJson(jRequest, strWritten), Json::LogicError);
        EXPECT_EQ("before" + strOut, strWritten);
        EXPECT_EQ(text(json(strRequest)), text(jRequest));
        EXPECT_EQ(Lines(), takeLog());
    }

    Table table_{database_, kMembers, "name, \"limit\""};
};

TEST_F(Paging, IsNothingWithoutAKey)
{
    expectClauses({
        {"null", ""},
        {"{}", ""},
        {R"({"name":"x","vornSqlWhereFilter":"1"})", ""},
        {R"({"offset":5})", ""},
        {R"({"offset":{},"sort_direction":{}})", ""},
        {R"({"sort_direction":"desc"})", ""},
        {R"({"sort_direction":"desc","offset":5})", ""},
        {R"({"Limit":1,"LIMIT":2,"limit ":3,"limit\u0000":4,"sort":"a","Sort_by":"b"})", ""},
    });
}

TEST_F(Paging, WritesTheSortKeyAsATextLiteral)
{
    expectClauses({
        {R"({"sort_by":"name"})", " order by 'name'"},
        {R"({"sort_by":""})", " order by ''"},
        {R"({"sort_by":"a'b"})", " order by 'a''b'"},
        {R"({"sort_by":"''"})", " order by ''''''"},
        {R"({"sort_by":"a\"b\\c"})", R"( order by 'a"b\c')"},
        {R"({"sort_by":"name desc, id"})", " order by 'name desc, id'"},
        {R"({"sort_by":"%d%n%s%q"})", " order by '%d%n%s%q'"},
        {R"({"sort_by":"größe 東京"})", " order by 'größe 東京'"},
        // Cut at a NUL byte.
        {R"({"sort_by":"a\u0000b"})", " order by 'a'"},
        {R"({"sort_by":"not declared"})", " order by 'not declared'"},
    });
}

TEST_F(Paging, SortsDownOnlyForDesc)
{
    expectClauses({
        {R"({"sort_by":"name","sort_direction":"desc"})", " order by 'name' DESC"},
        {R"({"sort_by":"name","sort_direction":"DESC"})", " order by 'name' ASC"},
        {R"({"sort_by":"name","sort_direction":"Desc"})", " order by 'name' ASC"},
        {R"({"sort_by":"name","sort_direction":"desc "})", " order by 'name' ASC"},
        {R"({"sort_by":"name","sort_direction":"desc\u0000"})", " order by 'name' ASC"},
        {R"({"sort_by":"name","sort_direction":"des"})", " order by 'name' ASC"},
        {R"({"sort_by":"name","sort_direction":"asc"})", " order by 'name' ASC"},
        {R"({"sort_by":"name","sort_direction":""})", " order by 'name' ASC"},
        {R"({"sort_by":"name","sort_direction":null})", " order by 'name' ASC"},
        {R"({"sort_by":"name","sort_direction":1})", " order by 'name' ASC"},
        {R"({"sort_by":"name","sort_direction":1.5})", " order by 'name' ASC"},
        {R"({"sort_by":"name","sort_direction":true})", " order by 'name' ASC"},
    });
}

TEST_F(Paging, WritesAllOfItInOrder)
{
    expectClauses({
        {R"({"limit":10})", " LIMIT 10"},
        {R"({"limit":10,"offset":20})", " LIMIT 10 OFFSET 20"},
        {R"({"sort_by":"name","limit":10})", " order by 'name' LIMIT 10"},
        {R"({"sort_by":"name","offset":10})", " order by 'name'"},
        {R"({"sort_by":"name","limit":10,"offset":20})", " order by 'name' LIMIT 10 OFFSET 20"},
        {R"({"sort_by":"name","sort_direction":"desc","limit":10,"offset":0})",
         " order by 'name' DESC LIMIT 10 OFFSET 0"},
        {R"({"sort_direction":"desc","limit":10,"offset":0})", " LIMIT 10 OFFSET 0"},
    });
}

// Limit and offset of every kind, as their JSON text and unchecked.
TEST_F(Paging, WritesLimitAndOffsetAsJson)
{
    const Case values[] = {
        {"0", "0"},
        {"-1", "-1"},
        {"2147483648", "2147483648"},
        {"-9223372036854775808", "-9223372036854775808"},
        {"18446744073709551615", "18446744073709551615"},
        {"1.5", "1.5"},
        {"10.0", "10.0"},
        {"0.1", "0.10000000000000001"},
        {"NaN", "NaN"},
        {R"("10")", R"("10")"},
        {R"("")", R"("")"},
        {R"("1; drop table t")", R"("1; drop table t")"},
        {R"("a'b\"c")", R"("a'b\"c")"},
        {R"("%d%n")", R"("%d%n")"},
        {R"("a\u0000b")", R"("a\u0000b")"},
        {R"("東京")", R"("東京")"},
        {"true", "true"},
        {"false", "false"},
        {"null", "null"},
        {"[]", "[]"},
        {"[1, 2]", "[1,2]"},
        {"{}", "{}"},
        {R"({"b": 1, "a": [null]})", R"({"a":[null],"b":1})"},
    };
    for (const Case& value : values) {
        const std::string strLimit = std::string(R"({"limit":)") + value.szRequest + "}";
        const std::string strOffset =
            std::string(R"({"limit":1,"offset":)") + value.szRequest + "}";
        const std::string strLimitOut = std::string(" LIMIT ") + value.szOut;
        const std::string strOffsetOut = std::string(" LIMIT 1 OFFSET ") + value.szOut;
        expectClauses(
            {{strLimit.c_str(), strLimitOut.c_str()}, {strOffset.c_str(), strOffsetOut.c_str()}});
    }
}

TEST_F(Paging, LeavesOutTheCommentsOfAReader)
{
    Json::Value jRequest = json(R"({"limit":10})");
    jRequest["limit"].setComment(std::string("// ten"), Json::commentAfterOnSameLine);
    std::string strOut;
    EXPECT_EQ(0, table_.api.SqlFilterConditionFromJson(jRequest, strOut));
    EXPECT_EQ(" LIMIT 10", strOut);
}

TEST_F(Paging, RequestsOfEveryOtherKind)
{
    const Lines lines = {
        failed("jFilter.type() != Json::objectValue && jFilter.type() != Json::nullValue")};
    for (const char* szRequest : {"[]", "[1]", R"([{"limit":1}])", R"("limit")", R"("")", "0", "1",
                                  "-1", "18446744073709551615", "1.5", "true", "false"})
        for (bool blStdout : {false, true}) {
            SCOPED_TRACE(szRequest);
            blLogToStdout = blStdout;
            Json::Value jRequest = json(szRequest);
            std::string strOut = "before";
            EXPECT_EQ(-1, table_.api.SqlFilterConditionFromJson(jRequest, strOut));
            EXPECT_EQ("before", strOut);
            EXPECT_EQ(lines, takeLog());
            EXPECT_EQ(text(json(szRequest)), text(jRequest));
        }
}

TEST_F(Paging, ASortKeyThatIsNoTextThrowsBeforeAnythingIsWritten)
{
    for (const char* szKey :
         {"null", "1", "-1", "18446744073709551615", "1.5", "true", "[]", R"(["name"])", "{}"})
        expectThrow(std::string(R"({"limit":1,"sort_direction":"desc","sort_by":)") + szKey + "}",
                    "");
}

TEST_F(Paging, ADirectionThatHasNoTextThrowsBehindTheSortKey)
{
    for (const char* szDirection : {"{}", R"({"desc":1})", "[]", R"(["desc"])"})
        expectThrow(
            std::string(R"({"limit":1,"sort_by":"name","sort_direction":)") + szDirection + "}",
            " order by 'name'");
    expectClauses({{R"({"sort_by":"name"})", " order by 'name'"}});
}

TEST_F(Paging, NoMemoryForTheSortKey)
{
    Json::Value jRequest = json(R"({"sort_by":"name","sort_direction":"desc","limit":1})");
    std::string strOut = "before";
    doubles::state().iFailMprintf = 1;
    EXPECT_EQ(-1, table_.api.SqlFilterConditionFromJson(jRequest, strOut));
    EXPECT_EQ(0, doubles::state().iFailMprintf);
    EXPECT_EQ("before", strOut);
    EXPECT_EQ(Lines{failed("!szSql")}, takeLog());
    EXPECT_EQ(0, table_.api.SqlFilterConditionFromJson(jRequest, strOut));
    EXPECT_EQ("before order by 'name' DESC LIMIT 1", strOut);
}

// Neither the connection nor the definition is looked at.
TEST_F(Paging, NeedsNoTable)
{
    std::string strName = freshName();
    Json::Value jDefinition;
    std::string strCreate;
    VornJsonDbApi api(nullptr, strName, jDefinition, strCreate);
    takeLog();
    Json::Value jRequest = json(R"({"sort_by":"name","limit":1})");
    std::string strOut;
    EXPECT_EQ(0, api.SqlFilterConditionFromJson(jRequest, strOut));
    EXPECT_EQ(" order by 'name' LIMIT 1", strOut);
    EXPECT_EQ(Lines(), takeLog());
}

}  // namespace
