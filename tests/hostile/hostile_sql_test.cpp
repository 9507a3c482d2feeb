// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// Every hostile string in the roles of a text that becomes SQL as it is, or decides how values are
// read: the call ends with a result, logs a failure, and handle and connection go on working.

#include "hostile/hostile_roles.h"

namespace {

class HostileSql : public HostileRoleTest {
protected:
    // All calls that take a record or a request, with one member.
    static void expectRecordEnds(VornJsonDbApi& api, const std::string& strMember)
    {
        const Json::Value jAsked = member(strMember, "x");
        Json::Value jRecord;
        Json::Value jOut;
        expectEnds(api.recSave(jRecord = jAsked, true));
        expectEnds(api.recCreate(jRecord = jAsked, jOut));
        expectEnds(api.recList(jRecord = jAsked, jOut = Json::Value()));
        expectEnds(api.recUpdateByFilter(jRecord, jRecord));
        expectEnds(api.recDelete(jRecord));
        EXPECT_EQ(jAsked, jRecord);
    }

    Json::Value& types() { return VORN_JSON_DB::recType(table_.jDefinition, table_.strName); }
    const Json::Value jTypes_ = types();
};

TEST_F(HostileSql, EndsCleanlyInARequest)
{
    forEachString(5, [&](const std::string& strHostile) {
        const std::string strNumber = doubled(strHostile);
        const std::string strPage = text(strHostile);
        Json::Value jPage = member("limit", strHostile);
        jPage["offset"] = strHostile;
        const std::pair<Json::Value, std::string> requests[] = {
            {member("n", strHostile), " WHERE  (n=" + strNumber + " );"},
            {member("n", listOf(strHostile)), " WHERE  (n in (" + strNumber + " ) );"},
            {member("vornSqlWhereFilter", strHostile), " WHERE  ( " + strHostile + "  );"},
            {jPage, " LIMIT " + strPage + " OFFSET " + strPage + ";"},
        };
        for (const auto& [jAsked, strTail] : requests) {
            takeStatements();
            Json::Value jRequest = jAsked;
            Json::Value jRecords;
            expectEnds(table_.api.recList(jRequest, jRecords));
            EXPECT_TRUE(jRecords.isNull() || jRecords.isArray());
            EXPECT_EQ(upToNul("SELECT n,o,s FROM " + table_.strName + " " + strTail),
                      takeStatements().at(0));
            Json::Value jValues = member("s", "new");
            expectEnds(table_.api.recUpdateByFilter(jRequest, jValues));
            expectEnds(table_.api.recDelete(jRequest));
            EXPECT_EQ(jAsked, jRequest);
        }
        std::string strWhere = strHostile;
        Json::Value jValues = member("s", "new");
        expectEnds(table_.api.recUpdateByWhere(jValues, strWhere));
        EXPECT_EQ(strHostile, strWhere);
    });
}

TEST_F(HostileSql, EndsCleanlyInTheNameOfAMember)
{
    forEachString(1, [&](const std::string& strHostile) {
        types() = member(strHostile, member("cpptype", "string"));
        Json::Value jDefinition = member(table_.strName, member("member", types()));
        VornJsonDbApi api(database_.get(), table_.strName, jDefinition, table_.strCreate);
        std::string strOut;
        EXPECT_EQ(0, api.SqlExpandMemberName(strOut));
        EXPECT_EQ(strHostile, strOut);
        std::string strField = strHostile;
        Json::Value jValue = "x";
        strOut.clear();
        EXPECT_EQ(0, api.SqlMakeByMatchField(strField, jValue, strOut));
        EXPECT_EQ(strHostile + "='x'", strOut);
        expectRecordEnds(api, strHostile);
        std::string strValue = "x";
        expectEnds(api.recDeleteByName(strValue, strHostile.c_str()));
        types() = jTypes_;
    });
}

TEST_F(HostileSql, EndsCleanlyInATypeWord)
{
    const Json::Value jRecord = json(R"({"s":"x"})");
    forEachString(1, [&](const std::string& strHostile) {
        types()["s"]["cpptype"] = strHostile;
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
        types() = jTypes_;
    });
}

TEST_F(HostileSql, EndsCleanlyInACreateStatementAndInSqlToRun)
{
    const auto ignore = [](void*, int, char**, char**) { return 0; };
    forEachString(2, [&](const std::string& strHostile) {
        Database database;
        database.run(table_.strCreate);
        std::string strCreate = strHostile;
        VornJsonDbApi api(database.get(), table_.strName, table_.jDefinition, strCreate);
        doubles::state().log.clear();
        EXPECT_EQ("", api.getErrMsg());
        expectEnds(api.tableCreate());
        EXPECT_EQ(strHostile, strCreate);
        expectEnds(api.runSqlEx(strHostile));
        expectEnds(api.runSqlEx(strHostile, ignore));
        if (0 == sqlite3_get_autocommit(database.get())) database.run("rollback");
        expectSound(database, api, kSound);
    });
}

// In a process of its own, because the member types of the names would stay.
TEST_F(HostileSql, EndsCleanlyInTheNameOfATable)
{
    GTEST_FLAG_SET(death_test_style, "threadsafe");
    const auto useName = [&](const std::string& strHostile) {
        std::string strName = strHostile;
        Json::Value jDefinition;
        jDefinition[strName]["member"] = json(R"({"s":{"cpptype":"string"}})");
        std::string strCreate = "create table if not exists " + strName + " (s text)";
        VornJsonDbApi api(database_.get(), strName, jDefinition, strCreate);
        const Json::Value& jTypes = VORN_JSON_DB::recType(jDefinition, strName);
        EXPECT_EQ(strHostile.empty(), jTypes.isNull());
        doubles::state().log.clear();
        if (strHostile.empty()) return;
        expectEnds(api.tableCreate());
        expectRecordEnds(api, "s");
        expectEnds(api.recDeleteAll());
        EXPECT_EQ(strHostile, strName);
    };
    EXPECT_EXIT(
        {
            forEachString(1, useName);
            endProcess(database_);
        },
        testing::ExitedWithCode(0), "");
}

}  // namespace
