// SPDX-License-Identifier: MIT
// Lists that a host makes in C++: of strings, and with holes (a[2] = 5 with nothing before it),
// which are written as null and stay in the host's value.

#include "support/matrix.h"

#include <functional>

namespace {

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

class Holes : public TableTest {
protected:
    // A list whose last item alone is set.
    static Json::Value request(const char* szMember, const Json::Value& jLast)
    {
        Json::Value jRequest;
        jRequest[szMember] = Json::Value(Json::arrayValue);
        jRequest[szMember][2] = jLast;
        return jRequest;
    }

    Table table_{database_,
                 R"({"id":{"cpptype":"int"},"name":{"cpptype":"string"},
                     "tags":{"cpptype":"Json::arrayValue"}})",
                 "id integer primary key, name text, tags text"};
};

TEST_F(Holes, StayInARequest)
{
    VornJsonDbApi& api = table_.api;
    Json::Value jOut;
    Json::Value jValues = json(R"({"id":2})");
    std::string strWhere = "id = 1";
    std::string strOut;
    // Every operation that takes a request, with its result where the list is written.
    const struct {
        const char* szEnd;
        std::function<int(Json::Value&)> call;
    } operations[] = {
        {"-1", [&](Json::Value& jRequest) { return api.recUpdateByWhere(jRequest, strWhere); }},
        {"0", [&](Json::Value& jRequest) { return api.recList(jRequest, jOut); }},
        {"0", [&](Json::Value& jRequest) { return api.recGetOne(jRequest, jOut); }},
        {"0", [&](Json::Value& jRequest) { return api.recDelete(jRequest); }},
        {"0", [&](Json::Value& jRequest) { return api.recUpdateByFilter(jRequest, jValues); }},
        {"0",
         [&](Json::Value& jRequest) {
             return api.SqlExpandMemberList(jRequest, strOut, VORN_SQL_WHERE_TYPE_COMMA);
         }},
        {"0",
         [&](Json::Value& jRequest) {
             return api.SqlMakeByListField("name", jRequest["name"], strOut);
         }},
    };
    for (const auto& operation : operations)
        // An item without a text throws.
        for (const Json::Value& jLast : {Json::Value("x"), Json::Value(Json::objectValue)}) {
            Json::Value jRequest = request("name", jLast);
            jOut = Json::Value();
            EXPECT_EQ(jLast.isString() ? operation.szEnd : "T",
                      endOf([&] { return operation.call(jRequest); }));
            EXPECT_TRUE(request("name", jLast) == jRequest);
        }
    EXPECT_EQ("name in ('''''x' )name in ('''''x' )", strOut);
}

TEST_F(Holes, StayInAJsonMember)
{
    Json::Value jFilter = json(R"({"id":1})");
    Json::Value jValues = request("tags", 5);
    takeStatements();
    EXPECT_EQ(-1, table_.api.recUpdateByFilter(jFilter, jValues));
    EXPECT_EQ("UPDATE " + table_.strName + " SET tags in ('null''null''5' ) WHERE  (id=1 );",
              takeStatements().at(0));
    EXPECT_TRUE(request("tags", 5) == jValues);

    jValues["id"] = 1;
    Json::Value jRecord = jValues;
    Json::Value jStored;
    EXPECT_EQ(0, table_.api.recCreate(jRecord, jStored));
    EXPECT_TRUE(jValues == jRecord);
    EXPECT_EQ(R"({"id":1,"tags":[null,null,5]})", text(jStored));
}

}  // namespace
