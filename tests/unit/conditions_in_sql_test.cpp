// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// What conditions, SET lists and the paging clause do in SQLite.

#include "support/matrix.h"

#include <functional>
#include <utility>

namespace {

constexpr int kComma = VORN_SQL_WHERE_TYPE_COMMA;

class ConditionsInSql : public TableTest {
protected:
    ConditionsInSql()
    {
        database_.run("insert into " + table_.strName + R"( values
            (1, 'O''Brien', 1, 1, '{"k":1}', '[1,2]'),
            (2, '1''2', 7, 0, '"x"', '1'),
            (3, '', 12, 1, 'null', '[]'),
            (4, null, null, null, null, null))");
    }

    // The ids that the statement returns, like "13", or SQLite's error text if it does not run.
    std::string outcome(const std::string& strSql)
    {
        std::string strIds;
        const auto collect = [](void* arg, int, char** values, char**) {
            static_cast<std::string*>(arg)->append(values[0]);
            return 0;
        };
        char* szError = nullptr;
        doubles::realExec(database_.get(), strSql.c_str(), collect, &strIds, &szError);
        const std::string strError = szError ? szError : "";
        sqlite3_free(szError);
        return strError.empty() ? strIds : strError;
    }

    // A statement that ends with what SqlExpandMemberList makes of the request.
    std::string composed(std::string strSql, const char* szRequest, int iJoiner)
    {
        Json::Value jRequest = json(szRequest);
        EXPECT_EQ(0, table_.api.SqlExpandMemberList(jRequest, strSql, iJoiner)) << szRequest;
        return strSql;
    }

    Table table_{database_,
                 R"({"doc":{"cpptype":"Json::Value"}, "flag":{"cpptype":"bool"},
                     "id":{"cpptype":"int"}, "list":{"cpptype":"Json::arrayValue"},
                     "n":{"cpptype":"int"}, "name":{"cpptype":"string"}})",
                 "id integer primary key, name text, n integer, flag integer, "
                 "doc text, list text"};
    const std::string strSelect_ = "select id from " + table_.strName;
    const std::string strUpdate_ = "update " + table_.strName + " set ";
};

TEST_F(ConditionsInSql, SelectRows)
{
    const struct {
        const char* szRequest;
        const char* szOutcome;
        int iJoiner = VORN_SQL_WHERE_TYPE_AND;
    } cases[] = {
        {R"({"name":"O'Brien"})", "1"},
        {R"({"name":"o'brien"})", ""},
        // Null is written as the empty text: a row without a value is never found.
        {R"({"name":null})", "3"},
        {R"({"name":[null]})", "3"},
        {R"({"n":"7"})", "2"},
        {R"({"n":7.0})", "2"},
        {R"({"n":[7]})", "2"},
        {R"({"n":true})", "1"},
        // A bare text is SQL.
        {R"({"n":"1 or 1=1"})", "1234"},
        {R"({"n":["1,7"]})", "12"},
        {R"({"n":"x"})", "no such column: x"},
        {R"({"n":null})", "near \")\": syntax error"},
        {R"({"flag":true})", "13"},
        {R"({"flag":null})", "2"},
        {R"({"flag":[true]})", "13"},
        {R"({"doc":{"k":1}})", "1"},
        {R"({"doc":null})", "3"},
        {R"({"list":[[1,2]]})", "1"},
        // The array is the list of values, not the value.
        {R"({"list":[1]})", "2"},
        {R"({"list":{}})", ""},
        // Several items read as one, and an empty list leaves a gap.
        {R"({"name":["1","2"]})", "2"},
        {R"({"n":[1,2]})", "3"},
        {R"({"flag":[true,false]})", "no such column: truefalse"},
        {R"({"name":[]})", "near \")\": syntax error"},
        {R"({"name":"O'Brien","n":7})", "12", VORN_SQL_WHERE_TYPE_OR},
        {R"({"name":"O'Brien","n":7})", ""},
        {R"({"vornSqlWhereFilter":"n between 2 and 20"})", "23"},
        {R"({"flag":true,"vornSqlWhereFilter":"n > 1"})", "3"},
        // The filter gets no parentheses: flag=1 and n=1 or n=7.
        {R"({"flag":true,"vornSqlWhereFilter":"n=1 or n=7"})", "12"},
        {R"({"flag":true,"vornSqlWhereFilter":"(n=1 or n=7) "})", "1"},
    };
    for (const auto& c : cases)
        EXPECT_EQ(c.szOutcome, outcome(composed(strSelect_ + " where", c.szRequest, c.iJoiner)))
            << c.szRequest;
}

TEST_F(ConditionsInSql, UpdateRowsWithASetList)
{
    const char szValues[] = R"({"name":"it's","n":8,"doc":{"k":"'"},"flag":false})";
    database_.run(composed(strUpdate_, szValues, kComma) + " where id=1");
    EXPECT_EQ((Rows{{R"({"k":"'"})", "0", "8", "it's"}}),
              database_.rows("select doc, flag, n, name from " + table_.strName + " where id=1"));
    EXPECT_EQ(R"(near "in": syntax error)",
              outcome(composed(strUpdate_, R"({"name":["x"]})", kComma)));
}

TEST_F(ConditionsInSql, PageThroughRowsInTableOrder)
{
    const std::pair<const char*, const char*> cases[] = {
        {R"({"limit":2,"offset":1})", "23"},
        {R"({"limit":10,"offset":4})", ""},
        {R"({"limit":-1,"offset":2})", "34"},
        {R"({"offset":2})", "1234"},
        // Kept: the sort key is a text literal, the same for every row.
        {R"({"sort_by":"id","sort_direction":"desc"})", "1234"},
        {R"({"sort_by":"no column","sort_direction":"desc","limit":2,"offset":2})", "34"},
    };
    for (const auto& [szRequest, szIds] : cases) {
        Json::Value jRequest = json(szRequest);
        std::string strSql = strSelect_;
        EXPECT_EQ(0, table_.api.SqlFilterConditionFromJson(jRequest, strSql));
        EXPECT_EQ(szIds, outcome(strSql)) << szRequest;
    }
}

// A list that a host makes in C++ may have holes (a[2] = 5 with nothing before it). They are
// written as null, and the host's value keeps them.
class Holes : public TableTest {
protected:
    // A list in which only the last item is set.
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
    // Every operation that takes a request, with its result if the list is written.
    const struct {
        const char* szEnd;
        std::function<int(Json::Value&)> call;
    } operations[] = {
        {"-1", [&](auto& jIn) { return api.recUpdateByWhere(jIn, strWhere); }},
        {"0", [&](auto& jIn) { return api.recList(jIn, jOut); }},
        {"0", [&](auto& jIn) { return api.recGetOne(jIn, jOut); }},
        {"0", [&](auto& jIn) { return api.recDelete(jIn); }},
        {"0", [&](auto& jIn) { return api.recUpdateByFilter(jIn, jValues); }},
        {"0", [&](auto& jIn) { return api.SqlExpandMemberList(jIn, strOut, kComma); }},
        {"0", [&](auto& jIn) { return api.SqlMakeByListField("name", jIn["name"], strOut); }},
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
