// SPDX-License-Identifier: MIT
// Construction, table creation and the host's message.

#include "support/rows.h"

#include <type_traits>

namespace {

class Handle : public TableTest {
protected:
    std::string strName_ = freshName();
    std::string strCreate_ = "create table " + strName_ + " (a text)";
    Json::Value jDefinition_ =
        json(R"({")" + strName_ + R"(":{"member":{"a":{"cpptype":"string"}}}})");
    std::string strEmpty_;
    Json::Value jEmpty_;
};

TEST_F(Handle, RunsTheCreateStatementUnchangedAndOnce)
{
    VornJsonDbApi api(database_.get(), strName_, jDefinition_, strCreate_);
    EXPECT_EQ(Lines{strCreate_}, takeStatements());
    EXPECT_EQ("0", database_.value("select count(*) from " + strName_));
    EXPECT_EQ(Lines(), takeLog());
    EXPECT_EQ("", api.getErrMsg());
}

TEST_F(Handle, LogsEveryEmptyArgumentAndIsMadeAllTheSame)
{
    VornJsonDbApi api(database_.get(), strEmpty_, jEmpty_, strEmpty_);
    EXPECT_EQ((Lines{plain("Failed [strName.empty()]"), plain("Failed [jTableDef.empty()]"),
                     plain("Failed [strSqlCreate.empty()]"), failed("0 >= strSql.length()"),
                     plain("i=0,errno=?, run sql failed, error=Unknow Error!!, sql="),
                     error("create table failed, sql="),
                     plain("sql error, err=Unknow Error!!, sql="), failed("0 > tableCreate()")}),
              takeLog());
    EXPECT_EQ("", api.getErrMsg());
    EXPECT_EQ(Lines(), takeStatements());
}

TEST_F(Handle, LogsEmptyObjectAndArrayDefinitions)
{
    for (const char* szDefinition : {"{}", "[]"}) {
        database_.run("drop table if exists " + strName_);
        Json::Value jDefinition = json(szDefinition);
        VornJsonDbApi api(database_.get(), strName_, jDefinition, strCreate_);
        EXPECT_EQ(Lines{plain("Failed [jTableDef.empty()]")}, takeLog()) << szDefinition;
    }
}

TEST_F(Handle, SurvivesANullConnection)
{
    VornJsonDbApi api(nullptr, strName_, jDefinition_, strCreate_);
    const Lines lines = takeLog();
    ASSERT_EQ(5U, lines.size());
    EXPECT_EQ(plain("Failed [!pDb]"), lines[0]);
    EXPECT_EQ(plain("i=0,errno=?, run sql failed, error=Unknow Error!!, sql=" + strCreate_),
              lines[1]);
    EXPECT_EQ(error("create table failed, sql=" + strCreate_), lines[2]);
    EXPECT_EQ(plain("sql error, err=Unknow Error!!, sql=" + strCreate_), lines[3]);
    EXPECT_EQ(failed("0 > tableCreate()"), lines[4]);
    Json::Value jRecord = json(R"({"a":"x"})");
    EXPECT_EQ(-1, api.recSave(jRecord, true));
}

TEST_F(Handle, ChecksItsArgumentsInOrder)
{
    VornJsonDbApi api(nullptr, strEmpty_, jEmpty_, strEmpty_);
    Lines lines = takeLog();
    ASSERT_EQ(9U, lines.size());
    lines.resize(5);
    EXPECT_EQ((Lines{plain("Failed [!pDb]"), plain("Failed [strName.empty()]"),
                     plain("Failed [jTableDef.empty()]"), plain("Failed [strSqlCreate.empty()]"),
                     failed("0 >= strSql.length()")}),
              lines);
}

TEST_F(Handle, LogsEachEmptyArgumentForItself)
{
    {
        VornJsonDbApi api(database_.get(), strEmpty_, jDefinition_, strCreate_);
        EXPECT_EQ(Lines{plain("Failed [strName.empty()]")}, takeLog());
    }
    database_.run("drop table " + strName_);
    {
        VornJsonDbApi api(database_.get(), strName_, jEmpty_, strCreate_);
        EXPECT_EQ(Lines{plain("Failed [jTableDef.empty()]")}, takeLog());
    }
    VornJsonDbApi api(database_.get(), strName_, jDefinition_, strEmpty_);
    const Lines lines = takeLog();
    ASSERT_EQ(6U, lines.size());
    EXPECT_EQ(plain("Failed [strSqlCreate.empty()]"), lines[0]);
    EXPECT_EQ(failed("0 > tableCreate()"), lines[5]);
}

TEST_F(Handle, WorksThoughItsTableWasThereAlready)
{
    VornJsonDbApi first(database_.get(), strName_, jDefinition_, strCreate_);
    VornJsonDbApi second(database_.get(), strName_, jDefinition_, strCreate_);
    const std::string strError = "table " + strName_ + " already exists";
    EXPECT_EQ(
        (Lines{plain("i=0,errno=?, run sql failed, error=" + strError + ", sql=" + strCreate_),
               error("create table failed, sql=" + strCreate_),
               plain("sql error, err=" + strError + ", sql=" + strCreate_),
               failed("0 > tableCreate()")}),
        takeLog());
    EXPECT_EQ("", second.getErrMsg());
    Json::Value jRecord = json(R"({"a":"x"})");
    EXPECT_EQ(0, second.recSave(jRecord, true));
    EXPECT_EQ("x", database_.value("select a from " + strName_));
    EXPECT_EQ(Lines(), takeLog());
}

TEST_F(Handle, WorksOnceItsTableIsThere)
{
    std::string strNonsense = "no statement";
    VornJsonDbApi api(database_.get(), strName_, jDefinition_, strNonsense);
    EXPECT_EQ(4U, takeLog().size());
    Json::Value jRecord = json(R"({"a":"x"})");
    EXPECT_EQ(-1, api.recSave(jRecord, true));
    const Lines lines = takeLog();
    EXPECT_EQ(plain("sql error, err=no such table: " + strName_ + ", sql=INSERT INTO " + strName_ +
                    " (a) VALUES ('x') ;select * from " + strName_ +
                    " where rowid == last_insert_rowid();"),
              lines.back());
    database_.run(strCreate_);
    EXPECT_EQ(0, api.recSave(jRecord, true));
}

TEST_F(Handle, CreatesItsTableAgainWhenAsked)
{
    VornJsonDbApi api(database_.get(), strName_, jDefinition_, strCreate_);
    database_.run("drop table " + strName_);
    EXPECT_EQ(0, api.tableCreate());
    EXPECT_EQ((Lines{strCreate_, strCreate_}), takeStatements());
    EXPECT_EQ(Lines(), takeLog());
    EXPECT_EQ(-1, api.tableCreate());
    EXPECT_EQ(3U, takeLog().size());
}

TEST_F(Handle, CreatesItsTableWithoutACallback)
{
    bool blCalled = false;
    doubles::state().exec = [&](sqlite3* pDb, const char*, doubles::RowCallback callback, void* arg,
                                char**) {
        blCalled = true;
        EXPECT_EQ(database_.get(), pDb);
        EXPECT_EQ(nullptr, callback);
        EXPECT_EQ(nullptr, arg);
        return SQLITE_OK;
    };
    VornJsonDbApi api(database_.get(), strName_, jDefinition_, strCreate_);
    EXPECT_TRUE(blCalled);
}

TEST_F(Handle, CreatesWithAnyCountAsSuccessAndAnyFailureAsMinusOne)
{
    VornJsonDbApi api(database_.get(), strName_, jDefinition_, strCreate_);
    doubles::state().exec = execOfStatus(SQLITE_OK, nullptr);
    doubles::state().changes = [] { return 7; };
    EXPECT_EQ(0, api.tableCreate());
    EXPECT_EQ(Lines(), takeLog());
    doubles::state().changes = [] { return -7; };
    EXPECT_EQ(-1, api.tableCreate());
    EXPECT_EQ((Lines{plain("i=0,errno=?, run sql failed, error=Unknow Error!!, sql=" + strCreate_),
                     error("create table failed, sql=" + strCreate_),
                     plain("sql error, err=Unknow Error!!, sql=" + strCreate_)}),
              takeLog());
}

TEST_F(Handle, LogsNoSqlErrorWhereItsTextIsEmpty)
{
    VornJsonDbApi api(database_.get(), strName_, jDefinition_, strCreate_);
    doubles::state().exec = execOfStatus(SQLITE_ERROR, "");
    EXPECT_EQ(-1, api.tableCreate());
    EXPECT_EQ((Lines{plain("i=0,errno=?, run sql failed, error=, sql=" + strCreate_),
                     error("create table failed, sql=" + strCreate_)}),
              takeLog());
}

TEST_F(Handle, KeepsCopiesOfItsArguments)
{
    std::string strName = strName_;
    std::string strCreate = strCreate_;
    Json::Value jDefinition = jDefinition_;
    VornJsonDbApi api(database_.get(), strName, jDefinition, strCreate);
    strName = "other";
    strCreate = "other";
    jDefinition.clear();
    database_.run("drop table " + strName_);
    EXPECT_EQ(0, api.tableCreate());
    Json::Value jRecord = json(R"({"a":"x"})");
    EXPECT_EQ(0, api.recSave(jRecord, true));
    EXPECT_EQ(strName_, database_.value("select name from sqlite_master where type='table'"));
}

TEST_F(Handle, LeavesItsArgumentsAlone)
{
    const std::string strName = strName_;
    const std::string strCreate = strCreate_;
    const Json::Value jDefinition = jDefinition_;
    VornJsonDbApi api(database_.get(), strName_, jDefinition_, strCreate_);
    Json::Value jRecord = json(R"({"a":"x"})");
    EXPECT_EQ(0, api.recSave(jRecord, true));
    EXPECT_EQ(strName, strName_);
    EXPECT_EQ(strCreate, strCreate_);
    EXPECT_EQ(jDefinition, jDefinition_);
}

// The types of a table are read by the first operation that needs them, so a handle that is only
// made cannot spoil them.
TEST_F(Handle, DoesNotReadMemberTypesWhenItIsMade)
{
    Json::Value jBad = json(R"({"other":{}})");
    VornJsonDbApi unused(database_.get(), strName_, jBad, strCreate_);
    EXPECT_EQ(R"({"a":{"cpptype":"string"}})", text(VORN_JSON_DB::recType(jDefinition_, strName_)));
    EXPECT_EQ(Lines(), takeLog());
}

TEST_F(Handle, GivesBackTheMessageOfTheHost)
{
    VornJsonDbApi api(database_.get(), strName_, jDefinition_, strCreate_);
    EXPECT_EQ("", api.getErrMsg());
    const std::string strMessage("a%s\0b", 5);
    api.setErrMsg(strMessage);
    EXPECT_EQ(strMessage, api.getErrMsg());
    api.getErrMsg().clear();
    EXPECT_EQ(strMessage, api.getErrMsg());
    EXPECT_EQ(-1, api.tableCreate());
    EXPECT_EQ(strMessage, api.getErrMsg());
    VornJsonDbApi other(database_.get(), strName_, jDefinition_, strCreate_);
    EXPECT_EQ("", other.getErrMsg());
    api.setErrMsg("");
    EXPECT_EQ("", api.getErrMsg());
}

TEST_F(Handle, LeavesTheConnectionToOthers)
{
    VornJsonDbApi other(database_.get(), strName_, jDefinition_, strCreate_);
    {
        VornJsonDbApi api(database_.get(), strName_, jDefinition_, strCreate_);
    }
    takeLog();
    takeStatements();
    Json::Value jRecord = json(R"({"a":"x"})");
    EXPECT_EQ(0, other.recSave(jRecord, true));
    EXPECT_EQ("1", database_.value("select count(*) from " + strName_));
    EXPECT_EQ(Lines(), takeLog());
}

}  // namespace
