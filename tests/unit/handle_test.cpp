// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// Construction, table creation and the host's message.

#include "support/matrix.h"
#include "support/rows.h"

namespace {

using doubles::state;

class Handle : public TableTest {
protected:
    // The given lines, and then those of a table that was not created.
    static Lines createFailed(const std::string& strError, const std::string& strSql,
                              Lines lines = {})
    {
        lines.push_back(runFailed(strError, strSql));
        lines.push_back(error("create table failed, sql=" + strSql));
        if (!strError.empty())
            lines.push_back(plain("sql error, err=" + strError + ", sql=" + strSql));
        return lines;
    }

    void expectSaved(VornJsonDbApi& api)
    {
        Json::Value jRecord = json(R"({"a":"x"})");
        EXPECT_EQ(0, api.recSave(jRecord, true));
        EXPECT_EQ("x", database_.value("select a from " + strName_));
        EXPECT_EQ(Lines(), takeLog());
    }

    std::string strName_ = freshName();
    std::string strCreate_ = "create table " + strName_ + " (a text)";
    Json::Value jDefinition_ =
        json(R"({")" + strName_ + R"(":{"member":{"a":{"cpptype":"string"}}}})");
};

TEST_F(Handle, ReportsEachMissingArgument)
{
    for (sqlite3* pDb : {database_.get(), static_cast<sqlite3*>(nullptr)})
        for (std::string strName : {strName_, std::string()})
            for (Json::Value jDefinition :
                 {json(R"({"other":{}})"), json("null"), json("{}"), json("[]"), jDefinition_})
                for (std::string strCreate : {strCreate_, std::string()}) {
                    VornJsonDbApi api(pDb, strName, jDefinition, strCreate);
                    Lines lines;
                    if (nullptr == pDb) lines.push_back(plain("Failed [!pDb]"));
                    if (strName.empty()) lines.push_back(plain("Failed [strName.empty()]"));
                    if (jDefinition.empty()) lines.push_back(plain("Failed [jTableDef.empty()]"));
                    if (strCreate.empty()) {
                        lines.push_back(plain("Failed [strSqlCreate.empty()]"));
                        lines.push_back(failed("0 >= strSql.length()"));
                    }
                    if (nullptr == pDb || strCreate.empty()) {
                        lines = createFailed("Unknow Error!!", strCreate, lines);
                        lines.push_back(failed("0 > tableCreate()"));
                    }
                    EXPECT_EQ(lines, takeLog());
                    EXPECT_EQ(strCreate.empty() ? Lines() : Lines{strCreate}, takeStatements());
                    EXPECT_EQ("", api.getErrMsg());
                    database_.run("drop table if exists " + strName_);
                }
    // Merely making a handle does not read member types, so a bad definition spoils none.
    VornJsonDbApi api(nullptr, strName_, jDefinition_, strCreate_);
    Json::Value jRecord = json(R"({"a":"x"})");
    EXPECT_EQ(-1, api.recSave(jRecord, true));
    EXPECT_EQ(R"({"a":{"cpptype":"string"}})", text(VORN_JSON_DB::recType(jDefinition_, strName_)));
}

// What composes SQL does so on the same handle.
TEST_F(Handle, FailsToRunSqlWithoutAConnection)
{
    VornJsonDbApi api(nullptr, strName_, jDefinition_, strCreate_);
    takeLog();
    for (const std::string& strCall :
         split(R"(tableCreate|runSqlEx pragma|runSqlEx pragma callback|recSave {"a":"x"} insert|)"
               R"(recCreate {"a":"x"}|recList null|recGetOne null|recUpdateByWhere {"a":"x"} 1|)"
               R"(recUpdateByFilter {"a":"x"} {"a":"y"}|recDelete {"a":"x"}|recDeleteAll|)"
               R"(recDeleteByArray ["x"] a|recDeleteByName x a)",
               '|')) {
        EXPECT_EQ("-1", called(api, split(strCall, ' ')).whole()) << strCall;
        EXPECT_NE(Lines(), takeLog()) << strCall;
        EXPECT_EQ("", api.getErrMsg()) << strCall;
    }
    EXPECT_EQ("0  (a='x' )", called(api, {"SqlExpandMemberList", R"({"a":"x"})", "", "1"}).whole());
}

TEST_F(Handle, WorksIfItsTableExistsAlready)
{
    VornJsonDbApi first(database_.get(), strName_, jDefinition_, strCreate_);
    VornJsonDbApi second(database_.get(), strName_, jDefinition_, strCreate_);
    Lines lines = createFailed("table " + strName_ + " already exists", strCreate_);
    lines.push_back(failed("0 > tableCreate()"));
    EXPECT_EQ(lines, takeLog());
    EXPECT_EQ("", second.getErrMsg());
    expectSaved(second);
}

TEST_F(Handle, WorksOnceItsTableExists)
{
    std::string strNonsense = "no statement";
    VornJsonDbApi api(database_.get(), strName_, jDefinition_, strNonsense);
    EXPECT_EQ(4U, takeLog().size());
    Json::Value jRecord = json(R"({"a":"x"})");
    EXPECT_EQ(-1, api.recSave(jRecord, true));
    EXPECT_EQ(plain("sql error, err=no such table: " + strName_ + ", sql=INSERT INTO " + strName_ +
                    " (a) VALUES ('x') ;select * from " + strName_ +
                    " where rowid == last_insert_rowid();"),
              takeLog().back());
    database_.run(strCreate_);
    expectSaved(api);
}

TEST_F(Handle, CreatesItsTableWithoutACallback)
{
    VornJsonDbApi api(database_.get(), strName_, jDefinition_, strCreate_);
    struct Case {
        End end;
        int iCount;
        Lines lines;
    };
    for (const Case& row : {Case{{SQLITE_OK}, 7, {}},
                            {{SQLITE_OK}, -7, createFailed("Unknow Error!!", strCreate_)},
                            {{SQLITE_ERROR, ""}, 0, createFailed("", strCreate_)}}) {
        state().changes = [&row] { return row.iCount; };
        state().exec = [&](sqlite3* pDb, const char*, doubles::RowCallback callback, void* arg,
                           char** errText) {
            EXPECT_EQ(database_.get(), pDb);
            EXPECT_EQ(nullptr, callback);
            EXPECT_EQ(nullptr, arg);
            return row.end.leaveIn(errText);
        };
        EXPECT_EQ(row.lines.empty() ? 0 : -1, api.tableCreate());
        EXPECT_EQ(row.lines, takeLog());
    }
    EXPECT_EQ(Lines(4, strCreate_), takeStatements());
}

TEST_F(Handle, CopiesItsArgumentsAndLeavesThemAlone)
{
    std::string strName = strName_;
    std::string strCreate = strCreate_;
    Json::Value jDefinition = jDefinition_;
    VornJsonDbApi api(database_.get(), strName, jDefinition, strCreate);
    expectSaved(api);
    EXPECT_EQ(strName_, strName);
    EXPECT_EQ(strCreate_, strCreate);
    EXPECT_EQ(jDefinition_, jDefinition);
    strName = "other";
    strCreate = "other";
    jDefinition.clear();
    database_.run("drop table " + strName_);
    EXPECT_EQ(0, api.tableCreate());
    expectSaved(api);
}

TEST_F(Handle, ReturnsTheHostsMessage)
{
    VornJsonDbApi api(database_.get(), strName_, jDefinition_, strCreate_);
    const std::string strMessage("a%s\0b", 5);
    api.setErrMsg(strMessage);
    api.getErrMsg().clear();
    EXPECT_EQ(strMessage, api.getErrMsg());
    EXPECT_EQ(-1, api.tableCreate());
    EXPECT_EQ(strMessage, api.getErrMsg());
    VornJsonDbApi other(database_.get(), strName_, jDefinition_, strCreate_);
    EXPECT_EQ("", other.getErrMsg());
    api.setErrMsg("");
    EXPECT_EQ("", api.getErrMsg());
}

}  // namespace
