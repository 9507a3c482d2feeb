// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// SqlFilterConditionFromJson: sorting and paging.

#include "support/composed.h"

#include <utility>

namespace {

class Paging : public HostTest {
protected:
    Paging()
    {
        takeLog();
        takeStatements();
    }

    void expectClause(const std::string& strRequest, const Composed& expected)
    {
        expectComposed(expected, strRequest, [this](auto& jRequest, auto& strOut) {
            return api_.SqlFilterConditionFromJson(jRequest, strOut);
        });
    }

    // Neither a connection nor a definition is needed.
    std::string strName_ = freshName();
    Json::Value jDefinition_;
    std::string strCreate_;
    VornJsonDbApi api_{nullptr, strName_, jDefinition_, strCreate_};
};

TEST_F(Paging, WritesItsPartsInOrder)
{
    const std::pair<const char*, const char*> cases[] = {
        {R"({"offset":20,"limit":10,"sort_by":"name"})", " order by 'name' LIMIT 10 OFFSET 20"},
        {R"({"sort_by":"name","sort_direction":"desc","limit":10,"offset":0})",
         " order by 'name' DESC LIMIT 10 OFFSET 0"},
        {R"({"sort_direction":"desc","limit":10,"offset":0})", " LIMIT 10 OFFSET 0"},
        {R"({"sort_by":"name","offset":10})", " order by 'name'"},
        {R"({"sort_direction":"desc","offset":5})", ""},
        {R"({"offset":{},"sort_direction":{}})", ""},
        {R"({"name":"x","vornSqlWhereFilter":"1"})", ""},
        {R"({"Limit":1,"LIMIT":2,"limit ":3,"limit\u0000":4,"sort":"a","Sort_by":"b"})", ""},
        {"{}", ""},
        {"null", ""},
    };
    for (const auto& [szRequest, szClause] : cases) expectClause(szRequest, {szClause});
}

TEST_F(Paging, WritesTheSortKeyAsATextLiteral)
{
    const std::pair<const char*, const char*> cases[] = {
        {"name", "name"},
        {"", ""},
        {"a'b", "a''b"},
        {R"(a\"b\\c)", R"(a"b\c)"},
        {"name desc, id", "name desc, id"},
        {"%d%n%s%q", "%d%n%s%q"},
        {"größe 東京", "größe 東京"},
        // Cut at a NUL byte.
        {R"(a\u0000b)", "a"},
    };
    for (const auto& [szKey, szLiteral] : cases)
        expectClause(std::string(R"({"sort_by":")") + szKey + "\"}",
                     {std::string(" order by '") + szLiteral + "'"});
}

TEST_F(Paging, SortsDescendingOnlyForDesc)
{
    const std::string strRequest = R"({"sort_by":"name","sort_direction":)";
    expectClause(strRequest + R"("desc"})", {" order by 'name' DESC"});
    for (const char* szDirection : {R"("DESC")", R"("Desc")", R"("desc ")", R"("desc\u0000")",
                                    R"("des")", R"("asc")", R"("")", "null", "1", "1.5", "true"})
        expectClause(strRequest + szDirection + "}", {" order by 'name' ASC"});
}

// Of any kind, and unchecked.
TEST_F(Paging, WritesLimitAndOffsetAsJson)
{
    const auto expectValue = [this](const std::string& strValue, const std::string& strText) {
        expectClause(R"({"limit":)" + strValue + "}", {" LIMIT " + strText});
        expectClause(R"({"limit":1,"offset":)" + strValue + "}", {" LIMIT 1 OFFSET " + strText});
    };
    for (const char* szValue : {"0",
                                "-1",
                                "2147483648",
                                "-9223372036854775808",
                                "18446744073709551615",
                                "1.5",
                                "10.0",
                                "NaN",
                                R"("10")",
                                R"("")",
                                R"("1; drop table t")",
                                R"("a'b\"c")",
                                R"("%d%n")",
                                R"("a\u0000b")",
                                R"("東京")",
                                "true",
                                "false",
                                "null",
                                "[]",
                                "{}"})
        expectValue(szValue, szValue);
    expectValue("0.1", "0.10000000000000001");
    expectValue(R"({"b": 1, "a": [null, 2]})", R"({"a":[null,2],"b":1})");
}

TEST_F(Paging, LeavesOutCommentsOnTheNumbers)
{
    Json::Value jRequest = json(R"({"limit":10})");
    jRequest["limit"].setComment(std::string("// ten"), Json::commentAfterOnSameLine);
    std::string strOut;
    EXPECT_EQ(0, api_.SqlFilterConditionFromJson(jRequest, strOut));
    EXPECT_EQ(" LIMIT 10", strOut);
}

TEST_F(Paging, RefusesARequestThatIsNotAnObject)
{
    const Lines lines = {
        failed("jFilter.type() != Json::objectValue && jFilter.type() != Json::nullValue")};
    for (bool blStdout : {false, true}) {
        blLogToStdout = blStdout;
        for (const char* szRequest : {"[]", R"([{"limit":1}])", R"("limit")", R"("")", "0", "-1",
                                      "18446744073709551615", "1.5", "true", "false"})
            expectClause(szRequest, {"", "-1", lines});
    }
}

TEST_F(Paging, ThrowsForASortKeyOrDirectionWithoutAText)
{
    for (const char* szKey :
         {"null", "1", "-1", "18446744073709551615", "1.5", "true", "[]", R"(["name"])", "{}"})
        expectClause(std::string(R"({"limit":1,"sort_direction":"desc","sort_by":)") + szKey + "}",
                     {"", "T"});
    // The sort key is written by then.
    for (const char* szDirection : {"{}", R"({"desc":1})", "[]", R"(["desc"])"})
        expectClause(
            std::string(R"({"limit":1,"sort_by":"name","sort_direction":)") + szDirection + "}",
            {" order by 'name'", "T"});
}

TEST_F(Paging, FailsWithoutMemoryForTheSortKey)
{
    const char szRequest[] = R"({"sort_by":"name","sort_direction":"desc","limit":1})";
    expectClause(szRequest, {"", "-1", {failed("!szSql")}, 1});
    expectClause(szRequest, {" order by 'name' DESC LIMIT 1"});
}

}  // namespace
