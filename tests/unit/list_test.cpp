// SPDX-License-Identifier: MIT
// Listing: the composed statement, what is appended, wrong kinds and exceptions.

#include "support/records.h"

namespace {

class List : public RecordsTest {
protected:
    int list(const std::string& strRequest, Json::Value& jArray)
    {
        Json::Value jRequest = json(strRequest);
        const int iResult = table_.api.recList(jRequest, jArray);
        EXPECT_EQ(json(strRequest), jRequest) << "the request was changed";
        return iResult;
    }

    static std::string ids(const Json::Value& jArray)
    {
        std::string strIds;
        for (const Json::Value& jRecord : jArray) strIds += jRecord["id"].asString();
        return strIds;
    }
};

TEST_F(List, ComposesOneStatement)
{
    const struct {
        const char* szRequest;
        const char* szTail;
        const char* szIds;
    } cases[] = {
        {"null", ";", "123"},
        {"{}", ";", "123"},
        {R"({"undeclared":1})", ";", "123"},
        {R"({"id":2})", " WHERE  (id=2 );", "2"},
        {R"({"id":"2"})", " WHERE  (id=2 );", "2"},
        {R"({"id":[3]})", " WHERE  (id in (3 ) );", "3"},
        {R"({"id":9})", " WHERE  (id=9 );", ""},
        {R"({"flag":true})", " WHERE  (flag=1 );", "13"},
        {R"({"flag":[true]})", " WHERE  (flag in (true ) );", "13"},
        {R"({"name":"O'Brien"})", " WHERE  (name='O''Brien' );", "3"},
        {R"({"name":["O'Brien"]})", " WHERE  (name in ('O''Brien' ) );", "3"},
        {R"({"name":["Ann","Bob"]})", " WHERE  (name in ('Ann''Bob' ) );", ""},
        {R"({"name":null})", " WHERE  (name='' );", ""},
        {R"({"data":{"k":1}})", R"( WHERE  (data='{"k":1}' );)", "1"},
        {R"({"tags":[[1]]})", " WHERE  (tags in ('[1]' ) );", "1"},
        {R"({"id":1,"flag":true,"undeclared":5})", " WHERE  (flag=1 and id=1 );", "1"},
        {R"({"vornSqlWhereFilter":"id > 1"})", " WHERE  ( id > 1  );", "23"},
        {R"({"vornSqlWhereFilter":"id > 1","flag":true})", " WHERE  (flag=1 and  id > 1  );", "3"},
        {R"({"vornSqlWhereFilter":"id > 1","zz":1})", " WHERE  ( id > 1  );", "23"},
        {R"({"limit":2})", " LIMIT 2;", "12"},
        {R"({"limit":2,"offset":1})", " LIMIT 2 OFFSET 1;", "23"},
        {R"({"limit":0})", " LIMIT 0;", ""},
        {R"({"limit":-1,"offset":2})", " LIMIT -1 OFFSET 2;", "3"},
        {R"({"offset":1})", ";", "123"},
        {R"({"sort_direction":"desc"})", ";", "123"},
        {R"({"sort_by":"name"})", " order by 'name';", "123"},
        // Kept: the key is a text literal, so the rows keep their order.
        {R"({"sort_by":"id","sort_direction":"desc"})", " order by 'id' DESC;", "123"},
        {R"({"sort_by":"a'b","sort_direction":"DESC"})", " order by 'a''b' ASC;", "123"},
        {R"({"flag":true,"limit":1,"offset":1,"sort_by":"id","sort_direction":"asc"})",
         " WHERE  (flag=1 ) order by 'id' ASC LIMIT 1 OFFSET 1;", "3"},
        {R"({"id":2,"vornSqlWhereFilter":"1) or (1"})", " WHERE  (id=2 and  1) or (1  );", "123"},
    };
    for (const auto& row : cases) {
        Json::Value jArray;
        EXPECT_EQ(0, list(row.szRequest, jArray)) << row.szRequest;
        EXPECT_EQ(std::vector<std::string>{select(row.szTail)}, takeStatements()) << row.szRequest;
        EXPECT_EQ(row.szIds, ids(jArray)) << row.szRequest;
        EXPECT_EQ(Lines(), takeLog()) << row.szRequest;
    }
}

TEST_F(List, GivesEveryDeclaredMemberThatIsNotNull)
{
    Json::Value jArray;
    EXPECT_EQ(0, list("null", jArray));
    EXPECT_EQ(json(R"([{"data":{"k":1},"flag":true,"id":1,"name":"Ann","tags":[1]},
                       {"flag":false,"id":2,"name":"Bob"},
                       {"flag":true,"id":3,"name":"O'Brien"}])"),
              jArray);
}

TEST_F(List, ARowOfNullsIsAnEmptyRecord)
{
    Table table(database_, R"({"a":{"cpptype":"string"},"b":{"cpptype":"double"}})", "a, b");
    database_.run("insert into " + table.strName + " values (NULL,NULL)");
    Json::Value jRequest;
    Json::Value jArray;
    EXPECT_EQ(0, table.api.recList(jRequest, jArray));
    EXPECT_EQ("[{}]", text(jArray));
    EXPECT_EQ(Lines(), takeLog());
}

TEST_F(List, ADeclaredMemberOffsetIsConditionAndPagingAtOnce)
{
    Table table(database_, R"({"offset":{"cpptype":"int"}})", "offset integer");
    database_.run("insert into " + table.strName + " values (1),(1),(2)");
    Json::Value jRequest = json(R"({"offset":1})");
    Json::Value jArray;
    EXPECT_EQ(0, table.api.recList(jRequest, jArray));
    EXPECT_EQ(R"([{"offset":1},{"offset":1}])", text(jArray));
    jRequest["limit"] = 5;
    EXPECT_EQ(0, table.api.recList(jRequest, jArray));
    EXPECT_EQ(R"([{"offset":1},{"offset":1},{"offset":1}])", text(jArray));
    EXPECT_EQ(
        (std::vector<std::string>{
            "SELECT offset FROM " + table.strName + "  WHERE  (offset=1 );",
            "SELECT offset FROM " + table.strName + "  WHERE  (offset=1 ) LIMIT 5 OFFSET 1;"}),
        takeStatements());
    EXPECT_EQ(Lines(), takeLog());
}

TEST_F(List, AppendsAndNeverClears)
{
    Json::Value jArray = json(R"(["mine"])");
    EXPECT_EQ(0, list(R"({"id":2})", jArray));
    EXPECT_EQ(0, list(R"({"id":9})", jArray));
    EXPECT_EQ(0, list(R"({"id":2})", jArray));
    EXPECT_EQ(json(R"(["mine",{"flag":false,"id":2,"name":"Bob"},
                       {"flag":false,"id":2,"name":"Bob"}])"),
              jArray);
}

TEST_F(List, ANullArrayBecomesOneWithTheFirstRow)
{
    Json::Value jArray;
    EXPECT_EQ(0, list(R"({"id":9})", jArray));
    EXPECT_TRUE(jArray.isNull());
    EXPECT_EQ(0, list(R"({"id":2})", jArray));
    EXPECT_TRUE(jArray.isArray());
    EXPECT_EQ(1U, jArray.size());

    Json::Value jEmptyArray(Json::arrayValue);
    EXPECT_EQ(0, list(R"({"id":9})", jEmptyArray));
    EXPECT_EQ("[]", text(jEmptyArray));
}

TEST_F(List, RefusesARequestOfAnotherKind)
{
    for (const char* szRequest :
         {R"("x")", R"("")", "[]", "[1]", R"([{"id":1}])", "5", "0", "1.5", "true", "false"}) {
        Json::Value jArray = json("[7]");
        EXPECT_EQ(-1, list(szRequest, jArray)) << szRequest;
        EXPECT_EQ("[7]", text(jArray)) << szRequest;
        EXPECT_EQ((Lines{kNoObjectOrNull, plain(std::string("jRecParam=") + szRequest)}),
                  takeLog());
    }
    EXPECT_EQ(Lines(), takeStatements());
}

TEST_F(List, RefusesAnArrayOfAnotherKind)
{
    // The array is looked at after the request's kind and before what the request holds.
    const std::string strRequest = R"({"sort_by":5,"vornSqlWhereFilter":5})";
    for (const char* szArray : {R"("x")", "{}", R"({"id":1})", "5", "1.5", "true", "false"}) {
        Json::Value jArray = json(szArray);
        EXPECT_EQ(-1, list(strRequest, jArray)) << szArray;
        EXPECT_EQ(json(szArray), jArray) << szArray;
        EXPECT_EQ((Lines{failed("jRecArrayOut.type() != Json::nullValue && "
                                "jRecArrayOut.type() != Json::arrayValue"),
                         plain("jRecParam=" + strRequest)}),
                  takeLog());
        EXPECT_EQ(-1, list("[1]", jArray)) << szArray;
        EXPECT_EQ((Lines{kNoObjectOrNull, plain("jRecParam=[1]")}), takeLog());
    }
    EXPECT_EQ(Lines(), takeStatements());
}

TEST_F(List, WhatAnAccessorThrowsReachesTheHost)
{
    for (const char* szRequest :
         {R"({"sort_by":5})", R"({"sort_by":null})", R"({"sort_by":{}})", R"({"sort_by":["id"]})",
          R"({"sort_by":"id","sort_direction":[]})", R"({"sort_by":"id","sort_direction":{}})",
          R"({"flag":"x"})", R"({"flag":{}})", R"({"flag":1e10})", R"({"name":{}})",
          R"({"name":[{}]})", R"({"id":{}})", R"({"id":[[1]]})"}) {
        Json::Value jArray = json("[7]");
        EXPECT_THROW(list(szRequest, jArray), Json::LogicError) << szRequest;
        EXPECT_EQ("[7]", text(jArray)) << szRequest;
        EXPECT_EQ(Lines(), takeLog()) << szRequest;
        EXPECT_EQ(Lines(), takeStatements()) << szRequest;
        EXPECT_EQ(0, list(R"({"id":2})", jArray)) << szRequest;
        EXPECT_EQ(2U, jArray.size()) << szRequest;
        takeStatements();
    }
}

TEST_F(List, ReadsADirectionOnlyWithAKey)
{
    Json::Value jArray;
    EXPECT_EQ(0, list(R"({"sort_direction":{}})", jArray));
    EXPECT_EQ(0, list(R"({"sort_by":"id","sort_direction":null})", jArray));
    EXPECT_EQ((Lines{select(";"), select(" order by 'id' ASC;")}), takeStatements());
    EXPECT_EQ(6U, jArray.size());
}

}  // namespace
