// SPDX-License-Identifier: MIT
// recCreate: copy, defaults, type check, insert, and the message for the host's user.

#include "support/database.h"

#include <algorithm>

namespace {

const char kDuplicate[] = "DUPLICATE_PRIMARY_KEY";

class Create : public TableTest {
protected:
    std::string insertSql(const std::string& strColumns, const std::string& strValues) const
    {
        return "INSERT INTO " + table_.strName + " (" + strColumns + ") VALUES (" + strValues +
               ";select * from " + table_.strName + " where rowid == last_insert_rowid();";
    }

    // Creates a record that has to fail, with nothing changed but the message; the log.
    Lines refused(Table& table, const std::string& strRecord)
    {
        SCOPED_TRACE(strRecord);
        Json::Value jRecord = json(strRecord);
        Json::Value jStored = "untouched";
        EXPECT_EQ(-1, table.api.recCreate(jRecord, jStored));
        EXPECT_EQ(json(strRecord), jRecord);
        EXPECT_EQ(json(strRecord).type(), jRecord.type());
        EXPECT_EQ(Json::Value("untouched"), jStored);
        return takeLog();
    }

    // The whole log of a duplicate {"id":1}.
    Lines duplicateLog()
    {
        const std::string strSql = insertSql("id,name", "1,'unnamed') ");
        const std::string strError = "UNIQUE constraint failed: " + table_.strName + ".id";
        return {plain("i=0,errno=?, run sql failed, error=" + strError + ", sql=" + strSql),
                failed("0 > runSqlEx(strSql, DbCallBackFillList, &jArrayTmp)"),
                plain(R"(blCreate=1, jRecInOut={"id":1,"name":"unnamed"})"),
                plain("jType=" + text(VORN_JSON_DB::recType(table_.jDefinition, table_.strName))),
                plain("sql error, err=" + strError + ", sql=" + strSql),
                failed("0 > recSave(jParam, true)"),
                plain(R"(call create rec, rec={"id":1,"name":"unnamed"})")};
    }

    static Lines emptyLog(const std::string& strRecord)
    {
        return {failed("jRecIn.empty()"), plain("call create rec, rec=" + strRecord)};
    }

    Table table_{database_,
                 R"({"id":{"cpptype":"int"},
                     "name":{"cpptype":"string","cppDefaultValue":"unnamed"}})",
                 "id integer primary key, name text"};
};

TEST_F(Create, FillsDefaultsAndInserts)
{
    Json::Value jRecord = json(R"({"id":1})");
    Json::Value jStored = json(R"({"left":"over"})");
    EXPECT_EQ(0, table_.api.recCreate(jRecord, jStored));
    EXPECT_EQ(R"({"id":1})", text(jRecord));
    EXPECT_EQ(R"({"id":1,"name":"unnamed"})", text(jStored));
    EXPECT_EQ(std::vector<std::string>{insertSql("id,name", "1,'unnamed') ")}, takeStatements());
    EXPECT_EQ(Lines(), takeLog());
    EXPECT_EQ("", table_.api.getErrMsg());
    EXPECT_EQ((Rows{{"1", "unnamed"}}), database_.rows("select * from " + table_.strName));
}

TEST_F(Create, HandsBackTheStoredRow)
{
    EXPECT_EQ(R"({"id":1,"name":"a"})", text(table_.create(R"({"name":"a"})")));
    EXPECT_EQ(R"({"id":2,"name":"b"})", text(table_.create(R"({"name":"b","other":[1]})")));
    EXPECT_EQ(R"({"id":3,"name":"unnamed"})", text(table_.create(R"({"other":1})")));
    Table bare(database_, R"({"a":{"cpptype":"int"},"b":{"cpptype":"int"}})", "a, b");
    EXPECT_EQ(R"({"b":2})", text(bare.create(R"({"b":2})")));
    EXPECT_EQ(Lines(), takeLog());
}

TEST_F(Create, TakesOneObjectAsRecordAndResult)
{
    Json::Value jRecord = json(R"({"id":1,"other":true})");
    EXPECT_EQ(0, table_.api.recCreate(jRecord, jRecord));
    EXPECT_EQ(R"({"id":1,"name":"unnamed"})", text(jRecord));
    // A failure leaves it alone as well.
    EXPECT_EQ(-1, table_.api.recCreate(jRecord, jRecord));
    EXPECT_EQ(R"({"id":1,"name":"unnamed"})", text(jRecord));
    jRecord = json(R"({"id":2,"name":"x","other":true})");
    EXPECT_EQ(0, table_.api.recCreate(jRecord, jRecord));
    EXPECT_EQ(R"({"id":2,"name":"x"})", text(jRecord));
}

TEST_F(Create, TakesARecordThatIsPartOfTheResultAndTheOtherWayRound)
{
    Json::Value jResult = json(R"({"record":{"id":1,"name":"x"}})");
    EXPECT_EQ(0, table_.api.recCreate(jResult["record"], jResult));
    EXPECT_EQ(R"({"id":1,"name":"x"})", text(jResult));
    jResult = json(R"({"record":{"id":1,"name":"x"}})");
    EXPECT_EQ(-1, table_.api.recCreate(jResult["record"], jResult));
    EXPECT_EQ(R"({"record":{"id":1,"name":"x"}})", text(jResult));

    Json::Value jRecord = json(R"({"id":2,"name":"y","stored":5})");
    EXPECT_EQ(0, table_.api.recCreate(jRecord, jRecord["stored"]));
    EXPECT_EQ(R"({"id":2,"name":"y","stored":{"id":2,"name":"y"}})", text(jRecord));
    EXPECT_EQ(-1, table_.api.recCreate(jRecord, jRecord["stored"]));
    EXPECT_EQ(R"({"id":2,"name":"y","stored":{"id":2,"name":"y"}})", text(jRecord));
    jRecord = json(R"({"id":3,"name":"z"})");
    EXPECT_EQ(0, table_.api.recCreate(jRecord, jRecord["name"]));
    EXPECT_EQ(R"({"id":3,"name":{"id":3,"name":"z"}})", text(jRecord));
}

// A host may change what recType refers to. Each of the four look-ups logs its four lines.
TEST_F(Create, LogsEveryLookUpWhereTheTypesAreAList)
{
    VORN_JSON_DB::recType(table_.jDefinition, table_.strName) = json("[1]");
    const Lines lines = refused(table_, R"({"id":1,"name":"x"})");
    EXPECT_EQ(4, std::count(lines.begin(), lines.end(),
                            utilFailed("jType[strJsonName].type() != Json::objectValue")));
    ASSERT_EQ(16U + 6U, lines.size());
    EXPECT_EQ((Lines{failed("!jType.isMember(strKey)"),
                     failed("0 > SqlExpandMemberSymbol(strSql, jRecInOut)"),
                     plain(R"(blCreate=1, jRecInOut={"id":1,"name":"x"})"), plain("jType=[1]"),
                     failed("0 > recSave(jParam, true)"),
                     plain(R"(call create rec, rec={"id":1,"name":"x"})")}),
              Lines(lines.begin() + 16, lines.end()));
}

TEST_F(Create, RefusesAnEmptyRecord)
{
    for (const char* szRecord : {"null", "{}", "[]"}) {
        EXPECT_EQ(emptyLog(szRecord), refused(table_, szRecord));
        EXPECT_EQ(std::vector<std::string>(), takeStatements());
        EXPECT_EQ("", table_.api.getErrMsg());
    }
}

TEST_F(Create, RefusesWhatIsNoObject)
{
    for (const char* szRecord : {"[1]", "\"x\"", "\"\"", "5", "0", "1.5", "true", "false"}) {
        EXPECT_EQ((Lines{failed("!jRecParam.isObject()"), failed("0 > checkJsonType(jParam)"),
                         plain(std::string("call create rec, rec=") + szRecord)}),
                  refused(table_, szRecord));
        EXPECT_EQ(std::vector<std::string>(), takeStatements());
    }
}

TEST_F(Create, RefusesABadTypeAndLogsTheFilledRecord)
{
    EXPECT_EQ((Lines{error(R"(type failed, strKey=id, jRecParam={"id":"5","name":"unnamed"})"),
                     failed("0 > checkJsonType(jParam)"),
                     plain(R"(call create rec, rec={"id":"5","name":"unnamed"})")}),
              refused(table_, R"({"id":"5"})"));
    EXPECT_EQ((Lines{error(R"(type failed, strKey=name, jRecParam={"id":1,"name":null})"),
                     failed("0 > checkJsonType(jParam)"),
                     plain(R"(call create rec, rec={"id":1,"name":null})")}),
              refused(table_, R"({"id":1,"name":null})"));
    EXPECT_EQ(std::vector<std::string>(), takeStatements());
    EXPECT_EQ("", table_.api.getErrMsg());
}

TEST_F(Create, RefusesDefaultsThatTheTypeCheckDoesNotTake)
{
    const struct {
        const char* szMember;
        const char* szLine;
    } cases[] = {
        {R"({"cpptype":"double","cppDefaultValue":1.5})", "type not found!!, key=v"},
        {R"({"cpptype":"unsigned int","cppDefaultValue":1})", "type not found!!, key=v"},
        {R"({"cpptype":"Json::Value","cppDefaultValue":{}})", "type not found!!, key=v"},
        {R"({"cpptype":"int","cppDefaultValue":null})",
         R"(type failed, strKey=v, jRecParam={"a":1,"v":null})"},
        {R"({"cpptype":"string","cppDefaultValue":null})",
         R"(type failed, strKey=v, jRecParam={"a":1,"v":null})"},
        {R"({"cpptype":"bool","cppDefaultValue":null})",
         R"(type failed, strKey=v, jRecParam={"a":1,"v":null})"},
        {R"({"cpptype":"int","cppDefaultValue":"5"})",
         R"(type failed, strKey=v, jRecParam={"a":1,"v":"5"})"},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(c.szMember);
        Table table(database_, std::string(R"({"a":{"cpptype":"int"},"v":)") + c.szMember + "}",
                    "a, v");
        const Lines lines = refused(table, R"({"a":1})");
        ASSERT_EQ(3U, lines.size());
        EXPECT_EQ(error(c.szLine), lines[0]);
        EXPECT_EQ(failed("0 > checkJsonType(jParam)"), lines[1]);
    }
}

TEST_F(Create, FailsOnWordsThatTheCheckTakesAndTheListDoesNot)
{
    for (const char* szWord : {"uid_t", "time_t"}) {
        Json::Value jMembers;
        jMembers["v"]["cpptype"] = szWord;
        Table table(database_, text(jMembers), "v");
        EXPECT_EQ(
            (Lines{error(std::string("cannot support this type=") + szWord),
                   failed("0 > SqlExpandMemberSymbol(strSql, jRecInOut)"),
                   plain(R"(blCreate=1, jRecInOut={"v":5})"), plain("jType=" + text(jMembers)),
                   failed("0 > recSave(jParam, true)"), plain(R"(call create rec, rec={"v":5})")}),
            refused(table, R"({"v":5})"));
    }
}

TEST_F(Create, TellsADuplicateKey)
{
    table_.create(R"({"id":1})");
    for (const char* szRecord : {R"({"id":1})", R"({"id":1,"name":"unnamed"})"}) {
        table_.api.setErrMsg("");
        EXPECT_EQ(duplicateLog(), refused(table_, szRecord));
        EXPECT_EQ(kDuplicate, table_.api.getErrMsg());
    }
    EXPECT_EQ("1", database_.value("select count(*) from " + table_.strName));
}

TEST_F(Create, TellsADuplicateOfAnyUniqueColumn)
{
    Table table(database_, R"({"a":{"cpptype":"int"},"b":{"cpptype":"string"}})",
                "a integer primary key, b text unique");
    table.create(R"({"a":1,"b":"x"})");
    refused(table, R"({"a":2,"b":"x"})");
    EXPECT_EQ(kDuplicate, table.api.getErrMsg());
}

TEST_F(Create, KeepsTheMessageThroughOtherFailures)
{
    Table table(database_, R"({"a":{"cpptype":"int"},"b":{"cpptype":"string"}})",
                "a integer not null, b text check (b <> 'bad')");
    table.api.setErrMsg("the host's");
    EXPECT_NE(std::string::npos, refused(table, R"({"b":"x"})").front().find("NOT NULL"));
    EXPECT_EQ("the host's", table.api.getErrMsg());
    refused(table, R"({"a":1,"b":"bad"})");
    EXPECT_EQ("the host's", table.api.getErrMsg());
    refused(table, R"({"a":"1"})");
    refused(table, "{}");
    EXPECT_EQ("the host's", table.api.getErrMsg());
}

// Kept: the duplicate is searched on every failure, in the text of the last failed statement.
TEST_F(Create, TellsAnEarlierDuplicateAgain)
{
    table_.create(R"({"id":1})");
    refused(table_, R"({"id":1})");
    for (const char* szRecord : {"{}", "null", "[]", "[1]", "\"x\"", R"({"id":"x"})"}) {
        table_.api.setErrMsg("");
        refused(table_, szRecord);
        EXPECT_EQ(kDuplicate, table_.api.getErrMsg()) << szRecord;
    }
    // A success empties the error text, but not the message.
    EXPECT_EQ(R"({"id":2,"name":"unnamed"})", text(table_.create(R"({"id":2})")));
    EXPECT_EQ(kDuplicate, table_.api.getErrMsg());
    table_.api.setErrMsg("");
    EXPECT_EQ(emptyLog("{}"), refused(table_, "{}"));
    EXPECT_EQ("", table_.api.getErrMsg());
    refused(table_, R"({"id":"x"})");
    EXPECT_EQ("", table_.api.getErrMsg());
}

TEST_F(Create, TellsADuplicateOfOtherOperationsOfTheHandle)
{
    table_.create(R"({"id":1})");
    Json::Value jRecord = json(R"({"id":1,"name":"x"})");
    EXPECT_EQ(-1, table_.api.recSave(jRecord, true));
    EXPECT_EQ("", table_.api.getErrMsg());
    takeLog();
    EXPECT_EQ(emptyLog("{}"), refused(table_, "{}"));
    EXPECT_EQ(kDuplicate, table_.api.getErrMsg());

    // Handles do not share their error texts.
    Table other(database_, R"({"id":{"cpptype":"int"}})", "id");
    refused(other, "{}");
    EXPECT_EQ("", other.api.getErrMsg());
}

TEST_F(Create, FindsTheDuplicateAnywhereInTheErrorText)
{
    const struct {
        const char* szError;
        const char* szMessage;
    } cases[] = {
        {"UNIQUE constraint failed: t.a", kDuplicate},
        {"UNIQUE constraint failed", kDuplicate},
        {"trigger: UNIQUE constraint failed: t.a, t.b", kDuplicate},
        {"unique constraint failed: t.a", ""},
        {"UNIQUE constraint", ""},
        {"UNIQUE constraint faile", ""},
        {"", ""},
        {"PRIMARY KEY must be unique", ""},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(c.szError);
        table_.api.setErrMsg("");
        doubles::state().exec = [&c](sqlite3*, const char*, doubles::RowCallback, void*,
                                     char** errText) {
            *errText = doubles::errorText(c.szError);
            return SQLITE_CONSTRAINT;
        };
        refused(table_, R"({"id":1})");
        EXPECT_EQ(c.szMessage, table_.api.getErrMsg());
    }
}

TEST_F(Create, FailsWhereNoRowComesBack)
{
    doubles::state().exec = [](sqlite3*, const char*, doubles::RowCallback, void*, char**) {
        return SQLITE_OK;
    };
    EXPECT_EQ(
        (Lines{failed("0 == jArrayTmp.size()"),
               plain(R"(blCreate=1, jRecInOut={"id":1,"name":"unnamed"})"),
               plain("jType=" + text(VORN_JSON_DB::recType(table_.jDefinition, table_.strName))),
               failed("0 > recSave(jParam, true)"),
               plain(R"(call create rec, rec={"id":1,"name":"unnamed"})")}),
        refused(table_, R"({"id":1})"));
}

TEST_F(Create, KeepsAWrittenRowThatItCannotReadBack)
{
    const std::string strName = freshName();
    database_.run("create table " + strName + " (a integer primary key, extra default 'e')");
    Table table(database_, strName, R"({"a":{"cpptype":"int"}})", "a");
    const Lines lines = refused(table, R"({"a":1})");
    EXPECT_EQ(failed("!jType.isMember(strName)"), lines.front());
    EXPECT_EQ(plain(R"(call create rec, rec={"a":1})"), lines.back());
    EXPECT_EQ((Rows{{"1", "e"}}), database_.rows("select * from " + strName));
}

TEST_F(Create, WritesItsFailureLinesWithoutTheDebugFlag)
{
    table_.create(R"({"id":1})");
    const Lines expected = duplicateLog();
    for (bool blStdout : {false, true}) {
        blLogToStdout = blStdout;
        EXPECT_EQ(expected, refused(table_, R"({"id":1})"));
    }
    blLogToStdout = false;
    blDebugOutput = true;
    Lines debug = expected;
    debug.insert(debug.begin() + 1,
                 plain("run sql fail, err=UNIQUE constraint failed: " + table_.strName + ".id"));
    EXPECT_EQ(debug, refused(table_, R"({"id":1})"));
}

}  // namespace
