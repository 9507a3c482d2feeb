// SPDX-License-Identifier: MIT
// The term builders where they fail, and VectorParamToJson.

#include "support/database.h"

#include <stdexcept>

namespace {

constexpr char kMembers[] = R"({
    "arr": {"cpptype": "Json::arrayValue"},
    "doc": {"cpptype": "Json::Value"},
    "flag": {"cpptype": "bool"},
    "n": {"cpptype": "int"},
    "name": {"cpptype": "string"},
    "obj": {"cpptype": "Json::objectValue"},
    "odd": {"cpptype": "no word"}
})";

class TermFailures : public TableTest {
protected:
    void expectBadMatch(const std::string& strField, const char* szValue, const Lines& lines)
    {
        SCOPED_TRACE(strField + ": " + szValue);
        std::string strName = strField;
        Json::Value jValue = json(szValue);
        std::string strOut = "before";
        EXPECT_EQ(-1, table_.api.SqlMakeByMatchField(strName, jValue, strOut));
        EXPECT_EQ("before", strOut);
        EXPECT_EQ(lines, takeLog());
    }

    void expectBadList(const char* szField, const char* szList, const Lines& lines)
    {
        SCOPED_TRACE(std::string(szField ? szField : "(null)") + ": " + szList);
        Json::Value jList = json(szList);
        std::string strOut = "before";
        EXPECT_EQ(-1, table_.api.SqlMakeByListField(szField, jList, strOut));
        EXPECT_EQ("before", strOut);
        EXPECT_EQ(lines, takeLog());
        EXPECT_EQ(text(json(szList)), text(jList));
    }

    Table table_{database_, kMembers, "arr, doc, flag, n, name, obj, odd"};
};

TEST_F(TermFailures, FieldsThatAreNotDeclared)
{
    const Lines lines = {failed("!jType.isMember(strField)")};
    for (const char* szField : {"", "Name", "name ", "vornSqlWhereFilter", "limit"})
        expectBadMatch(szField, R"("x")", lines);
    expectBadMatch(std::string("name\0", 5), R"("x")", lines);
    // The value is not looked at.
    expectBadMatch("other", "{}", lines);
}

TEST_F(TermFailures, ListFieldsWithoutAName)
{
    const Lines lines = {failed("!szField || !szField[0]")};
    expectBadList(nullptr, R"(["x"])", lines);
    expectBadList("", R"(["x"])", lines);
    expectBadList(nullptr, "[]", lines);
    expectBadList("", R"("no list")", lines);
}

TEST_F(TermFailures, ListFieldsThatAreNotDeclared)
{
    const Lines lines = {failed("!jType.isMember(szField)")};
    for (const char* szField : {"Name", "name ", "vornSqlWhereFilter", "limit"})
        expectBadList(szField, R"(["x"])", lines);
    expectBadList("other", "[]", lines);
    expectBadList("other", R"("no list")", lines);
}

TEST_F(TermFailures, ListsOfEveryOtherKind)
{
    for (const char* szField : {"name", "arr", "flag", "n", "odd"})
        for (const char* szList : {"null", R"("x")", "1", "-1", "18446744073709551615", "1.5",
                                   "true", "{}", R"({"0":"x"})"})
            expectBadList(szField, szList, {failed("jList.type() != Json::arrayValue")});
}

TEST_F(TermFailures, NoMemoryForAValue)
{
    struct Case {
        const char* szField;
        const char* szValue;
        const char* szCondition;
    };
    const char* szText = R"(NULL == (szSql = sqlite3_mprintf("%q", jParam.asString().c_str())))";
    const char* szJson = R"(NULL == (szSql = sqlite3_mprintf("%q", jParam.toString().c_str())))";
    const char* szBool = R"(NULL == (szSql = sqlite3_mprintf("%d", jParam.asInt())))";
    for (const Case& row :
         {Case{"name", R"("x")", szText}, Case{"n", "1", szText}, Case{"odd", "1", szText},
          Case{"doc", "1", szJson}, Case{"obj", "{}", szJson}, Case{"arr", "{}", szJson},
          Case{"flag", "true", szBool}}) {
        doubles::state().iFailMprintf = 1;
        expectBadMatch(row.szField, row.szValue, {failed(row.szCondition)});
        EXPECT_EQ(0, doubles::state().iFailMprintf) << row.szField;
    }
}

TEST_F(TermFailures, NoMemoryForAnItem)
{
    struct Case {
        const char* szField;
        const char* szList;
        const char* szCondition;
    };
    const char* szText = R"(NULL == (szSql = sqlite3_mprintf("%q", jList[i].asString().c_str())))";
    const char* szJson = R"(NULL == (szSql = sqlite3_mprintf("%q", jList[i].toString().c_str())))";
    for (const Case& row :
         {Case{"name", R"(["x","y","z"])", szText}, Case{"n", "[1,2,3]", szText},
          Case{"odd", "[1,2,3]", szText}, Case{"flag", "[true,false,true]", szText},
          Case{"doc", "[1,2,3]", szJson}, Case{"obj", "[{},{},{}]", szJson},
          Case{"arr", "[[],[],[]]", szJson}})
        for (int iItem : {1, 2, 3}) {
            doubles::state().iFailMprintf = iItem;
            expectBadList(row.szField, row.szList, {failed(row.szCondition)});
            EXPECT_EQ(0, doubles::state().iFailMprintf) << row.szField;
        }
}

TEST_F(TermFailures, GoToStandardOutputWhereTheHostAsks)
{
    blLogToStdout = true;
    expectBadMatch("other", R"("x")", {failed("!jType.isMember(strField)")});
    expectBadList("", R"(["x"])", {failed("!szField || !szField[0]")});
}

TEST_F(TermFailures, LeaveTheHandleSoundWhereAnAccessorThrows)
{
    Json::Value jList = json(R"(["x","y",{"k":1}])");
    std::string strOut = "before";
    EXPECT_THROW(table_.api.SqlMakeByListField("name", jList, strOut), Json::LogicError);
    EXPECT_EQ("before", strOut);
    std::string strField = "flag";
    Json::Value jValue = json(R"("true")");
    EXPECT_THROW(table_.api.SqlMakeByMatchField(strField, jValue, strOut), Json::LogicError);
    EXPECT_EQ("before", strOut);
    EXPECT_EQ(Lines(), takeLog());
    EXPECT_EQ("", table_.api.getErrMsg());
    jValue = true;
    EXPECT_EQ(0, table_.api.SqlMakeByMatchField(strField, jValue, strOut));
    EXPECT_EQ("beforeflag=1", strOut);
    database_.run("insert into " + table_.strName + " (flag, n) values (1, 5)");
    Json::Value jRequest = json(R"({"flag":true})");
    Json::Value jRecords;
    EXPECT_EQ(0, table_.api.recList(jRequest, jRecords));
    EXPECT_EQ(R"([{"flag":true,"n":5}])", text(jRecords));
}

// Whatever way a call ends, SQLite has every buffer back.
TEST_F(TermFailures, ReleaseEveryBuffer)
{
    Json::Value jGood = json(R"(["x","y","z"])");
    Json::Value jBad = json(R"(["x","y",{}])");
    Json::Value jText = json(R"("x")");
    Json::Value jSort = json(R"({"sort_by":"x"})");
    Json::Value jBadSort = json(R"({"sort_by":"x","sort_direction":{}})");
    std::string strField = "name";
    std::string strOut;
    const sqlite3_int64 iUsed = sqlite3_memory_used();
    EXPECT_LT(0, iUsed);
    EXPECT_EQ(0, table_.api.SqlMakeByMatchField(strField, jText, strOut));
    EXPECT_EQ(iUsed, sqlite3_memory_used());
    EXPECT_EQ(0, table_.api.SqlMakeByListField("name", jGood, strOut));
    EXPECT_EQ(iUsed, sqlite3_memory_used());
    EXPECT_THROW(table_.api.SqlMakeByListField("name", jBad, strOut), Json::LogicError);
    EXPECT_EQ(iUsed, sqlite3_memory_used());
    doubles::state().iFailMprintf = 3;
    EXPECT_EQ(-1, table_.api.SqlMakeByListField("name", jGood, strOut));
    EXPECT_EQ(iUsed, sqlite3_memory_used());
    EXPECT_EQ(0, table_.api.SqlFilterConditionFromJson(jSort, strOut));
    EXPECT_EQ(iUsed, sqlite3_memory_used());
    EXPECT_THROW(table_.api.SqlFilterConditionFromJson(jBadSort, strOut), Json::LogicError);
    EXPECT_EQ(iUsed, sqlite3_memory_used());
    takeLog();
}

// A lack of memory in C++ goes to the host; nothing was written, and nothing leaks.
TEST_F(TermFailures, LeaveTheTextAloneWhereMemoryRunsOut)
{
    const std::string strLong(100, 'x');
    Json::Value jValue = strLong;
    Json::Value jList(Json::arrayValue);
    jList.append(strLong);
    jList.append(strLong);
    std::string strField = "name";
    std::string strOut = "before";
    int iThrown = 0;
    for (int iNew = 1; iNew < 20; ++iNew) {
        for (bool blList : {false, true}) {
            strOut = "before";
            doubles::state().iFailNew = iNew;
            try {
                if (blList)
                    table_.api.SqlMakeByListField("name", jList, strOut);
                else
                    table_.api.SqlMakeByMatchField(strField, jValue, strOut);
            } catch (const std::bad_alloc&) {
                ++iThrown;
                EXPECT_EQ("before", strOut) << iNew;
            }
            doubles::state().iFailNew = 0;
        }
    }
    EXPECT_LT(2, iThrown);
    EXPECT_EQ(Lines(), takeLog());
}

class VectorParam : public TableTest {
protected:
    int convert(const std::vector<std::string>& strings, const char* szKey, Json::Value& jOut)
    {
        std::vector<std::string> strVector = strings;
        const int iResult = table_.api.VectorParamToJson(strVector, szKey, jOut);
        EXPECT_EQ(strings, strVector);
        EXPECT_EQ(Lines(), takeStatements());
        return iResult;
    }

    Table table_{database_, R"({"name":{"cpptype":"string"}})", "name"};
};

TEST_F(VectorParam, BecomesAnArrayUnderTheKey)
{
    struct Case {
        std::vector<std::string> strings;
        const char* szKey;
        const char* szBefore;
        const char* szAfter;
    };
    const Case cases[] = {
        {{"x"}, "name", "null", R"({"name":["x"]})"},
        {{"x"}, "name", "{}", R"({"name":["x"]})"},
        {{"b", "a", "b", ""}, "name", "null", R"({"name":["b","a","b",""]})"},
        {{}, "name", "null", R"({"name":[]})"},
        {{"x"}, "name", R"({"name":"old","n":1})", R"({"n":1,"name":["x"]})"},
        {{"x"}, "name", R"({"name":["old","er"]})", R"({"name":["x"]})"},
        {{}, "name", R"({"name":["old"]})", R"({"name":[]})"},
        {{"O'Brien", "%d", "7"},
         "not declared",
         "null",
         R"({"not declared":["O'Brien","%d","7"]})"},
        {{std::string("a\0b", 3)}, "name", "null", R"({"name":["a\u0000b"]})"},
    };
    for (const Case& row : cases) {
        SCOPED_TRACE(row.szAfter);
        Json::Value jOut = json(row.szBefore);
        EXPECT_EQ(0, convert(row.strings, row.szKey, jOut));
        EXPECT_EQ(row.szAfter, text(jOut));
        EXPECT_EQ(Lines(), takeLog());
    }
}

TEST_F(VectorParam, SelectsByList)
{
    Json::Value jRequest;
    EXPECT_EQ(0, convert({"1", "2"}, "name", jRequest));
    std::string strOut;
    EXPECT_EQ(0, table_.api.SqlExpandMemberList(jRequest, strOut, VORN_SQL_WHERE_TYPE_AND));
    EXPECT_EQ(" (name in ('1''2' ) )", strOut);
}

TEST_F(VectorParam, NeedsAnObjectOrNull)
{
    const Lines lines = {
        failed("jParamOut.type() != Json::objectValue && jParamOut.type() != Json::nullValue")};
    for (const char* szOut :
         {"[]", R"(["x"])", R"("x")", "1", "-1", "18446744073709551615", "1.5", "true", "false"})
        for (const char* szKey : {"name", "", static_cast<const char*>(nullptr)}) {
            SCOPED_TRACE(szOut);
            Json::Value jOut = json(szOut);
            EXPECT_EQ(-1, convert({"x"}, szKey, jOut));
            EXPECT_EQ(text(json(szOut)), text(jOut));
            EXPECT_EQ(lines, takeLog());
        }
}

TEST_F(VectorParam, NeedsAKey)
{
    for (const char* szOut : {"null", "{}", R"({"name":"old"})"})
        for (const char* szKey : {"", static_cast<const char*>(nullptr)}) {
            SCOPED_TRACE(szOut);
            Json::Value jOut = json(szOut);
            EXPECT_EQ(-1, convert({"x"}, szKey, jOut));
            EXPECT_EQ(text(json(szOut)), text(jOut));
            EXPECT_EQ(Lines{failed("!szKey || !szKey[0]")}, takeLog());
        }
}

}  // namespace
