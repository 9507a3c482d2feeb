// SPDX-License-Identifier: MIT
// What the terms and the paging clause select in SQLite.

#include "support/database.h"

namespace {

constexpr char kMembers[] = R"({
    "doc": {"cpptype": "Json::Value"},
    "flag": {"cpptype": "bool"},
    "id": {"cpptype": "int"},
    "list": {"cpptype": "Json::arrayValue"},
    "n": {"cpptype": "int"},
    "name": {"cpptype": "string"}
})";

class TermsInSql : public TableTest {
protected:
    TermsInSql()
    {
        database_.run("insert into " + table_.strName + R"( values
            (1, 'O''Brien', 1, 1, '{"k":1}', '[1,2]'),
            (2, '1''2', 7, 0, '"x"', '1'),
            (3, '', 12, 1, 'null', '[]'),
            (4, null, null, null, null, null))");
    }

    std::string query(const std::string& strRequest, int iJoiner = VORN_SQL_WHERE_TYPE_AND)
    {
        Json::Value jRequest = json(strRequest);
        std::string strSql = "select id from " + table_.strName + " where";
        EXPECT_EQ(0, table_.api.SqlExpandMemberList(jRequest, strSql, iJoiner)) << strRequest;
        return strSql;
    }

    // The ids that a statement gives, like "13".
    std::string ids(const std::string& strSql)
    {
        std::string strIds;
        for (const auto& row : database_.rows(strSql)) strIds += row.at(0);
        return strIds;
    }

    // SQLite's own words.
    std::string refusal(const std::string& strSql)
    {
        char* szError = nullptr;
        EXPECT_EQ(SQLITE_ERROR,
                  doubles::realExec(database_.get(), strSql.c_str(), nullptr, nullptr, &szError))
            << strSql;
        const std::string strError = szError ? szError : "";
        sqlite3_free(szError);
        return strError;
    }

    Table table_{database_, kMembers,
                 "id integer primary key, name text, n integer, flag integer, "
                 "doc text, list text"};
};

TEST_F(TermsInSql, SelectRows)
{
    struct Case {
        const char* szRequest;
        const char* szIds;
    };
    for (const Case& row : {
             Case{R"({"name":"O'Brien"})", "1"},
             Case{R"({"name":["O'Brien"]})", "1"},
             Case{R"({"name":"o'brien"})", ""},
             // Null is written as the empty text: a row without a value is never found.
             Case{R"({"name":null})", "3"},
             Case{R"({"name":[null]})", "3"},
             Case{R"({"n":7})", "2"},
             Case{R"({"n":"7"})", "2"},
             Case{R"({"n":7.0})", "2"},
             Case{R"({"n":[7]})", "2"},
             Case{R"({"n":true})", "1"},
             // A bare text is SQL.
             Case{R"({"n":"n"})", "123"},
             Case{R"({"n":"1 or 1=1"})", "1234"},
             Case{R"({"n":["1,7"]})", "12"},
             Case{R"({"flag":true})", "13"},
             Case{R"({"flag":false})", "2"},
             Case{R"({"flag":null})", "2"},
             Case{R"({"flag":[true]})", "13"},
             Case{R"({"doc":{"k":1}})", "1"},
             Case{R"({"doc":"x"})", "2"},
             Case{R"({"doc":null})", "3"},
             Case{R"({"list":[[1,2]]})", "1"},
             // The array is the list of values, not the value.
             Case{R"({"list":[1]})", "2"},
             Case{R"({"list":{}})", ""},
             Case{R"({"flag":true,"n":12})", "3"},
         })
        EXPECT_EQ(row.szIds, ids(query(row.szRequest))) << row.szRequest;
}

TEST_F(TermsInSql, SeveralItemsReadAsOne)
{
    EXPECT_EQ("2", ids(query(R"({"name":["1","2"]})")));
    EXPECT_EQ("3", ids(query(R"({"n":[1,2]})")));
    EXPECT_EQ("no such column: truefalse", refusal(query(R"({"flag":[true,false]})")));
}

TEST_F(TermsInSql, JoinersAndRawFilters)
{
    EXPECT_EQ("12", ids(query(R"({"name":"O'Brien","n":7})", VORN_SQL_WHERE_TYPE_OR)));
    EXPECT_EQ("", ids(query(R"({"name":"O'Brien","n":7})")));
    EXPECT_EQ("23", ids(query(R"({"vornSqlWhereFilter":"n between 2 and 20"})")));
    EXPECT_EQ("4", ids(query(R"({"vornSqlWhereFilter":"name is null"})")));
    EXPECT_EQ("3", ids(query(R"({"flag":true,"vornSqlWhereFilter":"n > 1"})")));
    // No parentheses stand around the filter: flag=1 and n=1 or n=7.
    EXPECT_EQ("12", ids(query(R"({"flag":true,"vornSqlWhereFilter":"n=1 or n=7"})")));
    EXPECT_EQ("1", ids(query(R"({"flag":true,"vornSqlWhereFilter":"(n=1 or n=7) "})")));
}

TEST_F(TermsInSql, ASetListChangesRows)
{
    Json::Value jValues = json(R"({"name":"it's","n":8,"doc":{"k":"'"},"flag":false})");
    std::string strSql = "update " + table_.strName + " set ";
    EXPECT_EQ(0, table_.api.SqlExpandMemberList(jValues, strSql, VORN_SQL_WHERE_TYPE_COMMA));
    database_.run(strSql + " where id=1");
    EXPECT_EQ((Rows{{R"({"k":"'"})", "0", "8", "it's"}}),
              database_.rows("select doc, flag, n, name from " + table_.strName + " where id=1"));
}

TEST_F(TermsInSql, SomeTermsAreRefused)
{
    const std::string strTooEarly = "near \")\": syntax error";
    EXPECT_EQ(strTooEarly, refusal(query(R"({"flag":true,"name":[]})")));
    EXPECT_EQ(strTooEarly, refusal(query(R"({"name":[]})")));
    EXPECT_EQ(strTooEarly, refusal(query(R"({"n":null})")));
    EXPECT_EQ("no such column: x", refusal(query(R"({"n":"x"})")));
    Json::Value jValues = json(R"({"name":["x"]})");
    std::string strSql = "update " + table_.strName + " set ";
    EXPECT_EQ(0, table_.api.SqlExpandMemberList(jValues, strSql, VORN_SQL_WHERE_TYPE_COMMA));
    EXPECT_EQ(R"(near "in": syntax error)", refusal(strSql));
}

TEST_F(TermsInSql, PagingTakesAPartInTheOrderOfTheTable)
{
    struct Case {
        const char* szRequest;
        const char* szIds;
    };
    for (const Case& row : {
             Case{R"({"limit":2})", "12"},
             Case{R"({"limit":2,"offset":1})", "23"},
             Case{R"({"limit":10,"offset":3})", "4"},
             Case{R"({"limit":10,"offset":4})", ""},
             Case{R"({"limit":0})", ""},
             Case{R"({"limit":-1,"offset":2})", "34"},
             Case{R"({"offset":2})", "1234"},
             // Kept: the sort key is a text literal, the same for every row.
             Case{R"({"sort_by":"id","sort_direction":"desc"})", "1234"},
             Case{R"({"sort_by":"name"})", "1234"},
             Case{R"({"sort_by":"no column","sort_direction":"desc","limit":2,"offset":2})", "34"},
         }) {
        Json::Value jRequest = json(row.szRequest);
        std::string strSql = "select id from " + table_.strName;
        EXPECT_EQ(0, table_.api.SqlFilterConditionFromJson(jRequest, strSql));
        EXPECT_EQ(row.szIds, ids(strSql)) << row.szRequest;
    }
}

}  // namespace
