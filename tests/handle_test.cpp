// Construction, table creation and the host's message.

#include "support/database.h"

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
}  // namespace
