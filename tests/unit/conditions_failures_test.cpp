// SPDX-License-Identifier: MIT
// SqlExpandMemberList where it fails: results, lines and what stays in the text.

#include "support/database.h"

#include <stdexcept>

namespace {

constexpr char kMembers[] = R"({
    "": {"cpptype": "string"},
    "a": {"cpptype": "string"},
    "b": {"cpptype": "string"},
    "doc": {"cpptype": "Json::Value"},
    "flag": {"cpptype": "bool"},
    "n": {"cpptype": "int"},
    "nul\u0000name": {"cpptype": "string"},
    "z": {"cpptype": "string"}
})";

constexpr int kOr = VORN_SQL_WHERE_TYPE_OR;
constexpr int kAnd = VORN_SQL_WHERE_TYPE_AND;
constexpr int kComma = VORN_SQL_WHERE_TYPE_COMMA;

const std::string kBadKind =
    failed("jRecParam.type() != Json::objectValue && jRecParam.type() != Json::nullValue");
const std::string kBadFilter = failed("!jRecParam[jmFieldName[i]].isString()");
const std::string kBadMatch =
    failed("0 > SqlMakeByMatchField(jmFieldName[i], jTmp, strSqlWhereOut)");
const std::string kBadList =
    failed("0 > SqlMakeByListField(jmFieldName[i].c_str(), jTmp, strSqlWhereOut)");
const std::string kNoText =
    failed(R"(NULL == (szSql = sqlite3_mprintf("%q", jParam.asString().c_str())))");
const std::string kNoJson =
    failed(R"(NULL == (szSql = sqlite3_mprintf("%q", jParam.toString().c_str())))");
const std::string kNoBool = failed(R"(NULL == (szSql = sqlite3_mprintf("%d", jParam.asInt())))");
const std::string kNoItem =
    failed(R"(NULL == (szSql = sqlite3_mprintf("%q", jList[i].asString().c_str())))");
const std::string kNoJsonItem =
    failed(R"(NULL == (szSql = sqlite3_mprintf("%q", jList[i].toString().c_str())))");

class ConditionFailures : public TableTest {
protected:
    // A failing call; strOut is what it left behind the text that was there.
    void expectFailure(const std::string& strRequest, int iJoiner, const std::string& strOut,
                       const Lines& lines)
    {
        SCOPED_TRACE(strRequest);
        Json::Value jRequest = json(strRequest);
        const Json::Value jBefore = jRequest;
        std::string strWritten = "before";
        EXPECT_EQ(-1, table_.api.SqlExpandMemberList(jRequest, strWritten, iJoiner));
        EXPECT_EQ("before" + strOut, strWritten);
        EXPECT_EQ(lines, takeLog());
        EXPECT_EQ(text(jBefore), text(jRequest));
        EXPECT_EQ(Lines(), takeStatements());
    }

    Table table_{database_, kMembers, "a, b, doc, flag, n, z"};
};

TEST_F(ConditionFailures, RequestsOfEveryOtherKind)
{
    for (const char* szRequest : {"[]", "[1]", R"([{"a":"x"}])", R"("x")", R"("")", "0", "1", "-1",
                                  "18446744073709551615", "1.5", "true", "false"})
        for (int iJoiner : {kOr, kAnd, kComma}) expectFailure(szRequest, iJoiner, "", {kBadKind});
}

TEST_F(ConditionFailures, UnknownJoiners)
{
    for (int iJoiner : {3, -1, 4, 2147483647, -2147483647 - 1})
        for (const char* szRequest : {R"({"a":"x"})", "{}", "null"})
            expectFailure(szRequest, iJoiner, "",
                          {error("error andType=" + std::to_string(iJoiner))});
}

TEST_F(ConditionFailures, TheRequestIsLookedAtBeforeTheJoiner)
{
    expectFailure("[1]", 3, "", {kBadKind});
}

TEST_F(ConditionFailures, RawFiltersOfEveryOtherKind)
{
    for (const char* szFilter : {"1", "1.5", "true", "null", "[]", R"(["x"])", R"({"a":"x"})"}) {
        const std::string strFilter = std::string(R"("vornSqlWhereFilter":)") + szFilter;
        expectFailure("{" + strFilter + "}", kAnd, " (", {kBadFilter});
        expectFailure("{" + strFilter + "}", kOr, " (", {kBadFilter});
        expectFailure("{" + strFilter + "}", kComma, "", {kBadFilter});
        expectFailure(R"({"z":"y",)" + strFilter + "}", kAnd, " (", {kBadFilter});
        expectFailure(R"({"a":"x",)" + strFilter + "}", kAnd, " (a='x' and ", {kBadFilter});
        expectFailure(R"({"a":"x",)" + strFilter + "}", kComma, "a='x' , ", {kBadFilter});
    }
}

TEST_F(ConditionFailures, AListUnderAnEmptyName)
{
    const Lines lines = {failed("!szField || !szField[0]"), kBadList};
    expectFailure(R"({"":["x"]})", kAnd, " (", lines);
    expectFailure(R"({"":[],"a":"x"})", kComma, "", lines);
}

// The list builder takes the name up to its NUL.
TEST_F(ConditionFailures, AListUnderANameWithANul)
{
    expectFailure(R"({"n":1,"nul\u0000name":["x"]})", kAnd, " (n=1 and ",
                  {failed("!jType.isMember(szField)"), kBadList});
}

TEST_F(ConditionFailures, NoMemoryForATerm)
{
    struct Case {
        const char* szRequest;
        int iFailMprintf;
        int iJoiner;
        const char* szOut;
        Lines lines;
    };
    const Case cases[] = {
        {R"({"a":"x"})", 1, kAnd, " (", {kNoText, kBadMatch}},
        {R"({"a":"x"})", 1, kComma, "", {kNoText, kBadMatch}},
        {R"({"a":"x","b":"y"})", 2, kAnd, " (a='x' and ", {kNoText, kBadMatch}},
        {R"({"a":"x","b":"y"})", 2, kOr, " (a='x' or ", {kNoText, kBadMatch}},
        {R"({"a":"x","b":"y"})", 2, kComma, "a='x' , ", {kNoText, kBadMatch}},
        {R"({"n":7})", 1, kAnd, " (", {kNoText, kBadMatch}},
        {R"({"doc":{"k":1}})", 1, kAnd, " (", {kNoJson, kBadMatch}},
        {R"({"flag":true})", 1, kAnd, " (", {kNoBool, kBadMatch}},
        {R"({"a":["x"]})", 1, kAnd, " (", {kNoItem, kBadList}},
        {R"({"a":"x","n":[1,2,3]})", 4, kAnd, " (a='x' and ", {kNoItem, kBadList}},
        {R"({"doc":[1,2]})", 2, kAnd, " (", {kNoJsonItem, kBadList}},
        {R"({"flag":[true]})", 1, kAnd, " (", {kNoItem, kBadList}},
        {R"({"vornSqlWhereFilter":"1","z":"x"})", 1, kAnd, " ( 1  and ", {kNoText, kBadMatch}},
    };
    for (const Case& row : cases) {
        doubles::state().iFailMprintf = row.iFailMprintf;
        expectFailure(row.szRequest, row.iJoiner, row.szOut, row.lines);
        EXPECT_EQ(0, doubles::state().iFailMprintf) << row.szRequest;
    }
}

TEST_F(ConditionFailures, WorkAgainAfterAFailure)
{
    doubles::state().iFailMprintf = 1;
    expectFailure(R"({"a":"x"})", kAnd, " (", {kNoText, kBadMatch});
    Json::Value jRequest = json(R"({"a":"x"})");
    std::string strOut;
    EXPECT_EQ(0, table_.api.SqlExpandMemberList(jRequest, strOut, kAnd));
    EXPECT_EQ(" (a='x' )", strOut);
}

// What jsoncpp throws for a value of the wrong kind goes to the host; what was appended stays.
TEST_F(ConditionFailures, ExceptionsOfAccessorsReachTheHost)
{
    struct Case {
        const char* szRequest;
        const char* szOut;
    };
    for (const Case& row : {Case{R"({"a":{"k":1}})", " ("}, Case{R"({"flag":"x"})", " ("},
                            Case{R"({"flag":4294967296})", " ("}, Case{R"({"n":{}})", " ("},
                            Case{R"({"a":[{}]})", " ("}, Case{R"({"n":[1,[2]]})", " ("},
                            Case{R"({"a":"x","b":["y",{}]})", " (a='x' and "}}) {
        SCOPED_TRACE(row.szRequest);
        Json::Value jRequest = json(row.szRequest);
        const Json::Value jBefore = jRequest;
        std::string strOut;
        EXPECT_THROW(table_.api.SqlExpandMemberList(jRequest, strOut, kAnd), Json::LogicError);
        EXPECT_EQ(row.szOut, strOut);
        EXPECT_EQ(Lines(), takeLog());
        EXPECT_EQ(text(jBefore), text(jRequest));
    }
    database_.run("insert into " + table_.strName + " (a, n) values ('x', 1)");
    Json::Value jRequest = json(R"({"a":"x","n":1})");
    EXPECT_EQ(1, table_.api.recDelete(jRequest));
    EXPECT_EQ(Lines(), takeLog());
}

// Reading the member types of a table that the definition does not describe. The last line holds
// the types of every table in the process.
class BadDefinition : public TableTest {
protected:
    Lines takeLines()
    {
        Lines lines = takeLog();
        for (std::string& strLine : lines)
            if (0 == strLine.compare(0, 16, "P util: jType={\"")) strLine = "P util: jType=...";
        return lines;
    }

    Lines typeLines(const std::string& strCheck) const
    {
        return {utilFailed(strCheck), utilPlain("strJsonName=" + strName_),
                utilPlain("jTableDef=" + text(jDefinition_)), utilPlain("jType=...")};
    }

    std::string strName_ = freshName();
    Json::Value jDefinition_ = json(R"({"other":{"member":{"a":{"cpptype":"string"}}}})");
    std::string strCreate_ = "create table " + strName_ + " (a text)";
    VornJsonDbApi api_{database_.get(), strName_, jDefinition_, strCreate_};
    Json::Value jRequest_ = json(R"({"a":"x"})");
    std::string strOut_ = "before";
};

TEST_F(BadDefinition, LogsTheTypesOnceACallAndFindsNoTerm)
{
    // Makes sure that the process knows one table at least.
    Table known(database_, R"({"a":{"cpptype":"string"}})", "a");
    VORN_JSON_DB::recType(known.jDefinition, known.strName);
    EXPECT_EQ(1, api_.SqlExpandMemberList(jRequest_, strOut_, kAnd));
    EXPECT_EQ("before", strOut_);
    EXPECT_EQ(typeLines("!jTableDef.isMember(strJsonName)"), takeLines());
    EXPECT_EQ(1, api_.SqlExpandMemberList(jRequest_, strOut_, kAnd));
    EXPECT_EQ("before", strOut_);
    EXPECT_EQ(typeLines("jType[strJsonName].type() != Json::objectValue"), takeLines());
}

TEST_F(BadDefinition, LeavesTheRawFilterUsable)
{
    VORN_JSON_DB::recType(jDefinition_, strName_);
    takeLog();
    jRequest_ = json(R"({"a":"x","vornSqlWhereFilter":"1"})");
    EXPECT_EQ(0, api_.SqlExpandMemberList(jRequest_, strOut_, kAnd));
    EXPECT_EQ("before ( 1  )", strOut_);
    EXPECT_EQ(typeLines("jType[strJsonName].type() != Json::objectValue"), takeLines());
}

TEST_F(BadDefinition, IsReadBeforeTheRequestAndTheJoiner)
{
    VORN_JSON_DB::recType(jDefinition_, strName_);
    takeLog();
    Lines lines = typeLines("jType[strJsonName].type() != Json::objectValue");
    jRequest_ = json("[1]");
    EXPECT_EQ(-1, api_.SqlExpandMemberList(jRequest_, strOut_, 3));
    lines.push_back(kBadKind);
    EXPECT_EQ(lines, takeLines());
    jRequest_ = json("null");
    EXPECT_EQ(-1, api_.SqlExpandMemberList(jRequest_, strOut_, 3));
    lines.back() = error("error andType=3");
    EXPECT_EQ(lines, takeLines());
    EXPECT_EQ("before", strOut_);
}

TEST_F(BadDefinition, LogsTheTypesBeforeTheTermBuildersOwnChecks)
{
    VORN_JSON_DB::recType(jDefinition_, strName_);
    takeLog();
    const Lines types = typeLines("jType[strJsonName].type() != Json::objectValue");
    std::string strField = "a";
    EXPECT_EQ(-1, api_.SqlMakeByMatchField(strField, jRequest_, strOut_));
    Lines lines = types;
    lines.push_back(failed("!jType.isMember(strField)"));
    EXPECT_EQ(lines, takeLines());
    EXPECT_EQ(-1, api_.SqlMakeByListField("a", jRequest_, strOut_));
    lines.back() = failed("!jType.isMember(szField)");
    EXPECT_EQ(lines, takeLines());
    EXPECT_EQ(-1, api_.SqlMakeByListField(nullptr, jRequest_, strOut_));
    lines.back() = failed("!szField || !szField[0]");
    EXPECT_EQ(lines, takeLines());
    EXPECT_EQ("before", strOut_);
}

// A member without a type word ends the reading: those before it are known, without a line later.
TEST_F(BadDefinition, KnowsTheMembersBeforeABadOne)
{
    const std::string strName = freshName();
    Json::Value jDefinition = json("{\"" + strName + R"(":{"member":{"a":{"cpptype":"string"},
        "b":{},"c":{"cpptype":"string"}}}})");
    std::string strTable = strName;
    VORN_JSON_DB::recType(jDefinition, strTable);
    takeLog();
    VornJsonDbApi api(database_.get(), strTable, jDefinition, strCreate_);
    takeLog();
    jRequest_ = json(R"({"a":"x","b":"y","c":"z"})");
    EXPECT_EQ(0, api.SqlExpandMemberList(jRequest_, strOut_, kAnd));
    EXPECT_EQ("before (a='x' )", strOut_);
    EXPECT_EQ(Lines(), takeLog());
}

}  // namespace
