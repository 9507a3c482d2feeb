// SPDX-License-Identifier: MIT
// A list that a host makes in C++ may have holes (a[2] = 5 with nothing before it). They are
// written as null, and the host's value keeps them.

#include "support/database.h"

namespace {

class Holes : public TableTest {
protected:
    // The last item alone is set.
    static Json::Value list(const Json::Value& jLast)
    {
        Json::Value jList(Json::arrayValue);
        jList[2] = jLast;
        return jList;
    }

    static Json::Value request(const char* szMember, const Json::Value& jLast)
    {
        Json::Value jRequest;
        jRequest[szMember] = list(jLast);
        return jRequest;
    }

    Table table_{database_,
                 R"({"id":{"cpptype":"int"},"name":{"cpptype":"string"},
                     "tags":{"cpptype":"Json::arrayValue"}})",
                 "id integer primary key, name text, tags text"};
};

// Every operation that takes a request, with the number of its result where the list is written.
const struct {
    const char* szName;
    int (*call)(VornJsonDbApi& api, Json::Value& jRequest);
    int iResult;
} kOperations[] = {
    {"recUpdateByWhere",
     [](VornJsonDbApi& api, Json::Value& jRequest) {
         std::string strWhere = "id = 1";
         return api.recUpdateByWhere(jRequest, strWhere);
     },
     -1},
    {"recList",
     [](VornJsonDbApi& api, Json::Value& jRequest) {
         Json::Value jRecords;
         return api.recList(jRequest, jRecords);
     },
     0},
    {"recGetOne",
     [](VornJsonDbApi& api, Json::Value& jRequest) {
         Json::Value jRecord;
         return api.recGetOne(jRequest, jRecord);
     },
     0},
    {"recDelete", [](VornJsonDbApi& api, Json::Value& jRequest) { return api.recDelete(jRequest); },
     0},
    {"recUpdateByFilter",
     [](VornJsonDbApi& api, Json::Value& jRequest) {
         Json::Value jValues;
         jValues["id"] = 2;
         return api.recUpdateByFilter(jRequest, jValues);
     },
     0},
    {"SqlExpandMemberList",
     [](VornJsonDbApi& api, Json::Value& jRequest) {
         std::string strOut;
         const int iResult = api.SqlExpandMemberList(jRequest, strOut, VORN_SQL_WHERE_TYPE_AND);
         EXPECT_EQ(" (name in ('''''x' ) )", strOut);
         return iResult;
     },
     0},
    {"SqlMakeByListField",
     [](VornJsonDbApi& api, Json::Value& jRequest) {
         std::string strOut;
         const int iResult = api.SqlMakeByListField("name", jRequest["name"], strOut);
         EXPECT_EQ("name in ('''''x' )", strOut);
         return iResult;
     },
     0},
};

TEST_F(Holes, OfARequestStayWhereTheListIsWritten)
{
    for (const auto& operation : kOperations) {
        SCOPED_TRACE(operation.szName);
        Json::Value jRequest = request("name", "x");
        EXPECT_EQ(operation.iResult, operation.call(table_.api, jRequest));
        EXPECT_TRUE(request("name", "x") == jRequest);
    }
}

TEST_F(Holes, OfARequestStayWhereAnItemHasNoText)
{
    for (const auto& operation : kOperations) {
        SCOPED_TRACE(operation.szName);
        Json::Value jRequest = request("name", Json::objectValue);
        EXPECT_THROW(operation.call(table_.api, jRequest), Json::LogicError);
        EXPECT_TRUE(request("name", Json::objectValue) == jRequest);
    }
}

TEST_F(Holes, OfAJsonMemberStay)
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
