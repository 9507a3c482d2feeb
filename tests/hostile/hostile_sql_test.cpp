// SPDX-License-Identifier: MIT
// Every hostile string in the roles of a text that becomes SQL as it stands, or decides how values
// are read: the call ends with a result, logs a failure, and handle and connection go on working.

#include "support/hostile_roles.h"

namespace {

class HostileSql : public HostileRoleTest {
protected:
    // As many of the calls that take a request as can read this one.
    void expectRequestEnds(const Json::Value& jAsked)
    {
        Json::Value jRequest = jAsked;
        Json::Value jRecords;
        expectEnds(table_.api.recList(jRequest, jRecords));
        EXPECT_TRUE(jRecords.isNull() || jRecords.isArray());
        Json::Value jValues = json(R"({"s":"new"})");
        expectEnds(table_.api.recUpdateByFilter(jRequest, jValues));
        expectEnds(table_.api.recDelete(jRequest));
        EXPECT_EQ(jAsked, jRequest);
    }

    // The rest of the process sees the table's own types again.
    void restoreTypes()
    {
        VORN_JSON_DB::recType(table_.jDefinition, table_.strName) =
            table_.jDefinition[table_.strName]["member"];
    }
};

TEST_F(HostileSql, ConditionOnANumber)
{
    forEachString([&](const std::string& strHostile) {
        Json::Value jValue(strHostile);
        std::string strField = "n";
        std::string strOut;
        EXPECT_EQ(0, table_.api.SqlMakeByMatchField(strField, jValue, strOut));
        EXPECT_EQ("n=" + doubled(strHostile), strOut);
        expectRequestEnds(member("n", strHostile));
    });
}

TEST_F(HostileSql, ListItemOfANumber)
{
    forEachString([&](const std::string& strHostile) {
        Json::Value jList(Json::arrayValue);
        jList.append(strHostile);
        std::string strOut;
        EXPECT_EQ(0, table_.api.SqlMakeByListField("n", jList, strOut));
        EXPECT_EQ("n in (" + doubled(strHostile) + " )", strOut);
        expectRequestEnds(member("n", jList));
    });
}

TEST_F(HostileSql, RawFilter)
{
    forEachString([&](const std::string& strHostile) {
        Json::Value jRequest = member("vornSqlWhereFilter", strHostile);
        std::string strOut;
        EXPECT_EQ(0, table_.api.SqlExpandMemberList(jRequest, strOut, VORN_SQL_WHERE_TYPE_AND));
        EXPECT_EQ(" ( " + strHostile + "  )", strOut);
        expectRequestEnds(jRequest);
    });
}

TEST_F(HostileSql, ConditionOfAnUpdate)
{
    forEachString([&](const std::string& strHostile) {
        std::string strWhere = strHostile;
        Json::Value jValues = json(R"({"s":"new"})");
        expectEnds(table_.api.recUpdateByWhere(jValues, strWhere));
        EXPECT_EQ(strHostile, strWhere);
    });
}

TEST_F(HostileSql, LimitAndOffset)
{
    forEachString([&](const std::string& strHostile) {
        Json::Value jRequest = member("limit", strHostile);
        jRequest["offset"] = strHostile;
        const std::string strText = text(strHostile);
        std::string strOut;
        EXPECT_EQ(0, table_.api.SqlFilterConditionFromJson(jRequest, strOut));
        EXPECT_EQ(" LIMIT " + strText + " OFFSET " + strText, strOut);
        Json::Value jRecords;
        expectEnds(table_.api.recList(jRequest, jRecords));
    });
}

TEST_F(HostileSql, NameOfAMember)
{
    Json::Value& jTypes = VORN_JSON_DB::recType(table_.jDefinition, table_.strName);
    forEachString([&](const std::string& strHostile) {
        Json::Value jDefinition;
        jDefinition[table_.strName]["member"][strHostile]["cpptype"] = "string";
        jTypes = jDefinition[table_.strName]["member"];
        VornJsonDbApi api(database_.get(), table_.strName, jDefinition, table_.strCreate);

        std::string strOut;
        EXPECT_EQ(0, api.SqlExpandMemberName(strOut));
        EXPECT_EQ(strHostile, strOut);
        std::string strField = strHostile;
        Json::Value jValue = "x";
        strOut.clear();
        EXPECT_EQ(0, api.SqlMakeByMatchField(strField, jValue, strOut));
        EXPECT_EQ(strHostile + "='x'", strOut);

        Json::Value jRecord;
        jRecord[strHostile] = "x";
        expectEnds(api.recSave(jRecord, true));
        jRecord = Json::Value();
        jRecord[strHostile] = "x";
        Json::Value jRecords;
        expectEnds(api.recList(jRecord, jRecords));
        expectEnds(api.recUpdateByFilter(jRecord, jRecord));
        expectEnds(api.recDelete(jRecord));
        std::string strValue = "x";
        expectEnds(api.recDeleteByName(strValue, strHostile.c_str()));
        restoreTypes();
    });
}

TEST_F(HostileSql, TypeWord)
{
    Json::Value& jTypes = VORN_JSON_DB::recType(table_.jDefinition, table_.strName);
    const Json::Value jRecord = json(R"({"s":"x"})");
    forEachString([&](const std::string& strHostile) {
        jTypes["s"]["cpptype"] = strHostile;
        Json::Value jIn = jRecord;
        EXPECT_EQ(-1, table_.api.checkJsonType(jIn));
        EXPECT_EQ(Lines{error("type not found!!, key=s")}, takeLog());
        std::string strOut = "before";
        EXPECT_EQ(-1, table_.api.SqlExpandMemberSymbol(strOut, jIn));
        EXPECT_EQ("before", strOut);
        EXPECT_EQ(Lines{error("cannot support this type=" + upToNul(strHostile))}, takeLog());
        strOut.clear();
        Json::Value jValue = "it's";
        std::string strField = "s";
        EXPECT_EQ(0, table_.api.SqlMakeByMatchField(strField, jValue, strOut));
        EXPECT_EQ("s=it''s", strOut);
        Json::Value jRequest;
        Json::Value jRecords;
        EXPECT_EQ(-1, table_.api.recList(jRequest, jRecords));
        EXPECT_EQ(error("type error, strType=" + upToNul(strHostile)), takeLog().at(0));
        std::string strKey = "one";
        EXPECT_EQ(-1, table_.api.recDeleteByName(strKey, "s"));
        EXPECT_EQ(jRecord, jIn);
        restoreTypes();
    });
}

TEST_F(HostileSql, CreateStatement)
{
    forEachString([&](const std::string& strHostile) {
        Database database;
        database.run(table_.strCreate);
        std::string strCreate = strHostile;
        VornJsonDbApi api(database.get(), table_.strName, table_.jDefinition, strCreate);
        doubles::state().log.clear();
        EXPECT_EQ("", api.getErrMsg());
        expectEnds(api.tableCreate());
        EXPECT_EQ(strHostile, strCreate);
        Json::Value jRecord = json(kSound);
        EXPECT_EQ(0, api.recSave(jRecord, true));
        EXPECT_EQ(json(kSound), jRecord);
        EXPECT_EQ(nullptr, sqlite3_next_stmt(database.get(), nullptr));
    });
}

TEST_F(HostileSql, TextToRun)
{
    const auto ignore = [](void*, int, char**, char**) { return 0; };
    forEachString([&](const std::string& strHostile) {
        Database database;
        VornJsonDbApi api(database.get(), table_.strName, table_.jDefinition, table_.strCreate);
        expectEnds(api.runSqlEx(strHostile));
        expectEnds(api.runSqlEx(strHostile, ignore));
        Json::Value jRecord = json(kSound);
        EXPECT_EQ(0, api.recSave(jRecord, true));
    });
}

// In a process of its own, because the member types of the names would stay.
TEST_F(HostileSql, NameOfATable)
{
    GTEST_FLAG_SET(death_test_style, "threadsafe");
    const auto useName = [&](const std::string& strHostile) {
        std::string strName = strHostile;
        Json::Value jDefinition;
        jDefinition[strName]["member"] = json(R"({"s":{"cpptype":"string"}})");
        std::string strCreate = "create table if not exists " + strName + " (s text)";
        VornJsonDbApi api(database_.get(), strName, jDefinition, strCreate);
        doubles::state().log.clear();
        const Json::Value& jTypes = VORN_JSON_DB::recType(jDefinition, strName);
        EXPECT_EQ(strHostile.empty(), jTypes.isNull());
        doubles::state().log.clear();
        if (strHostile.empty()) return;

        expectEnds(api.tableCreate());
        Json::Value jRecord = json(R"({"s":"x"})");
        Json::Value jOut;
        expectEnds(api.recCreate(jRecord, jOut));
        expectEnds(api.recList(jRecord, jOut = Json::Value()));
        expectEnds(api.recUpdateByFilter(jRecord, jRecord));
        expectEnds(api.recDelete(jRecord));
        expectEnds(api.recDeleteAll());
        EXPECT_EQ(strHostile, strName);
    };
    EXPECT_EXIT(
        {
            forEachString(useName);
            endProcess(database_);
        },
        testing::ExitedWithCode(0), "");
    printFigure("hostile strings in roles, names of tables", hostileStrings().size());
}

}  // namespace
