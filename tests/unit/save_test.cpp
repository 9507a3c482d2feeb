// SPDX-License-Identifier: MIT
// recSave: the statement, the stored row, and every failure with its lines.

#include "support/database.h"

namespace {

class Save : public TableTest {
protected:
    static std::string saveSql(const std::string& strVerb, const Table& table,
                               const std::string& strColumns, const std::string& strValues)
    {
        return strVerb + " INTO " + table.strName + " (" + strColumns + ") VALUES (" + strValues +
               ";select * from " + table.strName + " where rowid == last_insert_rowid();";
    }

    // Saves a record that has to be stored; the record as it comes back.
    std::string saved(Table& table, const char* szRecord, bool blCreate)
    {
        Json::Value jRecord = json(szRecord);
        EXPECT_EQ(0, table.api.recSave(jRecord, blCreate)) << szRecord;
        EXPECT_EQ(Lines(), takeLog());
        return text(jRecord);
    }

    // Saves a record that has to fail and stay as it is; the log.
    Lines refused(Table& table, const char* szRecord, bool blCreate)
    {
        Json::Value jRecord = json(szRecord);
        EXPECT_EQ(-1, table.api.recSave(jRecord, blCreate)) << szRecord;
        EXPECT_EQ(json(szRecord), jRecord);
        EXPECT_EQ(json(szRecord).type(), jRecord.type());
        return takeLog();
    }

    // The log of a statement that SQLite refused.
    static Lines sqlFailure(Table& table, const char* szRecord, bool blCreate,
                            const std::string& strError, const std::string& strSql)
    {
        return {plain("i=0,errno=?, run sql failed, error=" + strError + ", sql=" + strSql),
                failed("0 > runSqlEx(strSql, DbCallBackFillList, &jArrayTmp)"),
                plain(std::string("blCreate=") + (blCreate ? "1" : "0") +
                      ", jRecInOut=" + text(json(szRecord))),
                plain("jType=" + text(VORN_JSON_DB::recType(table.jDefinition, table.strName))),
                plain("sql error, err=" + strError + ", sql=" + strSql)};
    }

    Table table_{database_, R"({"id":{"cpptype":"int"},"name":{"cpptype":"string"}})",
                 "id integer primary key, name text"};
};

TEST_F(Save, InsertsOrReplacesAndReadsBackInOneText)
{
    EXPECT_EQ(R"({"id":1,"name":"Ann"})", saved(table_, R"({"id":1,"name":"Ann"})", true));
    EXPECT_EQ(std::vector<std::string>{saveSql("INSERT", table_, "id,name", "1,'Ann') ")},
              takeStatements());
    EXPECT_EQ(R"({"id":1,"name":"Bob"})", saved(table_, R"({"id":1,"name":"Bob"})", false));
    EXPECT_EQ(std::vector<std::string>{saveSql("REPLACE", table_, "id,name", "1,'Bob') ")},
              takeStatements());
    EXPECT_EQ(R"({"id":2,"name":"Cid"})", saved(table_, R"({"id":2,"name":"Cid"})", false));
    EXPECT_EQ((Rows{{"1", "Bob"}, {"2", "Cid"}}),
              database_.rows("select * from " + table_.strName));
}

TEST_F(Save, WritesTheWholeTextAsAnExampleShows)
{
    Table task(database_, "task_example", R"({"id":{"cpptype":"int"},"name":{"cpptype":"string"}})",
               "id,name");
    saved(task, R"({"id":7,"name":"it's"})", true);
    EXPECT_EQ(
        std::vector<std::string>{
            "INSERT INTO task_example (id,name) VALUES (7,'it''s') ;select * from "
            "task_example where rowid == last_insert_rowid();"},
        takeStatements());
}

TEST_F(Save, ReturnsTheStoredRow)
{
    const struct {
        const char* szName;
        const char* szMembers;
        const char* szColumns;
        const char* szRecord;
        const char* szStored;
    } cases[] = {
        {"a key that SQLite gives", R"({"id":{"cpptype":"int"},"name":{"cpptype":"string"}})",
         "id integer primary key, name", R"({"name":"x"})", R"({"id":1,"name":"x"})"},
        {"a default of SQLite", R"({"a":{"cpptype":"string"},"b":{"cpptype":"int"}})",
         "a text default 'dflt', b", R"({"b":1})", R"({"a":"dflt","b":1})"},
        {"a column that stays NULL", R"({"a":{"cpptype":"string"},"b":{"cpptype":"int"}})", "a, b",
         R"({"b":1})", R"({"b":1})"},
        {"a number in a text member", R"({"a":{"cpptype":"string"}})", "a", R"({"a":5})",
         R"({"a":"5"})"},
        {"column affinity", R"({"a":{"cpptype":"string"}})", "a integer", R"({"a":"0042"})",
         R"({"a":"42"})"},
        {"text affinity", R"({"a":{"cpptype":"int"}})", "a text", R"({"a":42})", R"({"a":42})"},
        {"null as the accessor gives it", R"({"a":{"cpptype":"string"},"b":{"cpptype":"int"}})",
         "a, b", R"({"a":null,"b":null})", R"({"a":"","b":0})"},
        {"an int beyond 32 bits", R"({"a":{"cpptype":"int"}})", "a", R"({"a":5000000000})",
         R"({"a":2147483647})"},
        {"an unsigned int", R"({"a":{"cpptype":"unsigned int"}})", "a", R"({"a":4294967295})",
         R"({"a":2147483647})"},
        {"the largest unsigned number", R"({"a":{"cpptype":"unsigned long long"}})", "a",
         R"({"a":9223372036854775807})", R"({"a":9223372036854775807})"},
        {"bool", R"({"a":{"cpptype":"bool"},"b":{"cpptype":"bool"}})", "a, b",
         R"({"a":true,"b":7})", R"({"a":true,"b":false})"},
        {"JSON", R"({"a":{"cpptype":"Json::arrayValue"},"o":{"cpptype":"Json::objectValue"}})",
         "a, o", R"({"a":[1,"x",null],"o":{"k":{"l":1.5}}})",
         R"({"a":[1,"x",null],"o":{"k":{"l":1.5}}})"},
        {"undeclared members", R"({"a":{"cpptype":"int"}})", "a", R"({"A":1,"a":2,"z":[3]})",
         R"({"a":2})"},
        {"a NUL byte ends a text", R"({"a":{"cpptype":"string"}})", "a", R"({"a":"x\u0000y"})",
         R"({"a":"x"})"},
    };
    for (const auto& c : cases) {
        for (bool blCreate : {true, false}) {
            SCOPED_TRACE(c.szName);
            Table table(database_, c.szMembers, c.szColumns);
            EXPECT_EQ(c.szStored, saved(table, c.szRecord, blCreate));
        }
    }
}

TEST_F(Save, RefusesAKeyThatExistsUnlessItReplaces)
{
    const char szRecord[] = R"({"id":1,"name":"x"})";
    saved(table_, szRecord, true);
    EXPECT_EQ(
        sqlFailure(table_, szRecord, true, "UNIQUE constraint failed: " + table_.strName + ".id",
                   saveSql("INSERT", table_, "id,name", "1,'x') ")),
        refused(table_, szRecord, true));
    // The message for the host's user is recCreate's.
    EXPECT_EQ("", table_.api.getErrMsg());
    EXPECT_EQ(szRecord, saved(table_, szRecord, false));
}

TEST_F(Save, RefusesListsThatDoNotClose)
{
    const struct {
        const char* szRecord;
        const char* szColumns;
        const char* szValues;
        const char* szError;
    } cases[] = {
        {R"({"id":1})", "id,", "1,", "near \")\": syntax error"},
        {"{}", "", "", "near \")\": syntax error"},
        {R"({"x":1})", "", "", "near \")\": syntax error"},
        {"null", "", "", "near \")\": syntax error"},
        {"[1]", "", "", "near \")\": syntax error"},
        {"\"x\"", "", "", "near \")\": syntax error"},
        {"5", "", "", "near \")\": syntax error"},
    };
    for (const auto& c : cases) {
        for (bool blCreate : {true, false}) {
            SCOPED_TRACE(c.szRecord);
            const std::string strSql =
                saveSql(blCreate ? "INSERT" : "REPLACE", table_, c.szColumns, c.szValues);
            EXPECT_EQ(sqlFailure(table_, c.szRecord, blCreate, c.szError, strSql),
                      refused(table_, c.szRecord, blCreate));
            EXPECT_EQ(std::vector<std::string>{strSql}, takeStatements());
        }
    }
    EXPECT_EQ("0", database_.value("select count(*) from " + table_.strName));
}

TEST_F(Save, StopsAtAValueThatCannotBeWritten)
{
    Table table(database_, R"({"a":{"cpptype":"int"},"b":{"cpptype":"Json::Value"}})",
                "a,b unique");
    const std::string strType = text(VORN_JSON_DB::recType(table.jDefinition, table.strName));
    const char szRecord[] = R"({"a":1,"b":2})";
    const Lines lines = {error("cannot support this type=Json::Value"),
                         failed("0 > SqlExpandMemberSymbol(strSql, jRecInOut)"),
                         plain(R"(blCreate=1, jRecInOut={"a":1,"b":2})"),
                         plain("jType=" + strType)};
    EXPECT_EQ(lines, refused(table, szRecord, true));
    EXPECT_EQ(Lines(), takeStatements());

    // After a failed statement its error text comes along, with the text composed so far.
    EXPECT_EQ(-1, table.api.runSqlEx("nonsense"));
    takeLog();
    takeStatements();
    Lines more = lines;
    more.push_back(plain("sql error, err=near \"nonsense\": syntax error, sql=INSERT INTO " +
                         table.strName + " (a,b) VALUES ("));
    EXPECT_EQ(more, refused(table, szRecord, true));
    more[2] = plain(R"(blCreate=0, jRecInOut={"a":1,"b":2})");
    more[4].replace(more[4].find("INSERT"), 6, "REPLACE");
    EXPECT_EQ(more, refused(table, szRecord, false));
    EXPECT_EQ(Lines(), takeStatements());
}

TEST_F(Save, FailsWhereTheRowCannotBeReadThoughItIsWritten)
{
    Table table(database_, R"({"a":{"cpptype":"int"}})", "a, extra default 5");
    const std::string strSql = saveSql("INSERT", table, "a", "1) ");
    const Lines sqlLines = sqlFailure(table, R"({"a":1})", true, "query aborted", strSql);
    Lines expected = {
        failed("!jType.isMember(strName)"),
        failed("0 > (iTmp = DbCallBackFillField(*pjRec, column_name, column_value, i))"),
        plain("column_name[1]=extra"), plain("column_value[1]=5"),
        failed("0 > DbCallBackFillRec(&jTmp, n_column, column_value, column_name)")};
    expected.insert(expected.end(), sqlLines.begin(), sqlLines.end());
    EXPECT_EQ(expected, refused(table, R"({"a":1})", true));
    EXPECT_EQ((Rows{{"1", "5"}}), database_.rows("select * from " + table.strName));
    EXPECT_EQ(-1, [&] {
        Json::Value jRecord = json(R"({"a":2})");
        return table.api.recSave(jRecord, false);
    }());
    EXPECT_EQ("2", database_.value("select count(*) from " + table.strName));
}

TEST_F(Save, FailsOnWordsThatAreWrittenButNotRead)
{
    for (const char* szWord : {"double", "float", "long", "unsigned long", "unsigned"}) {
        SCOPED_TRACE(szWord);
        Json::Value jMembers;
        jMembers["a"]["cpptype"] = szWord;
        Table table(database_, text(jMembers), "a");
        const std::string strLine = std::string("type error, strType=") + szWord;
        EXPECT_EQ(error(strLine), refused(table, R"({"a":2})", true).front());
        EXPECT_EQ("1", database_.value("select a = 2 from " + table.strName));
    }
}

TEST_F(Save, FailsInATableWithoutRowidThoughTheRowIsWritten)
{
    const std::string strName = freshName();
    database_.run("create table " + strName + " (a integer primary key, b text) without rowid");
    Table table(database_, strName, R"({"a":{"cpptype":"int"},"b":{"cpptype":"string"}})", "a, b");
    const std::string strSql = saveSql("INSERT", table, "a,b", "1,'x') ");
    EXPECT_EQ(sqlFailure(table, R"({"a":1,"b":"x"})", true, "no such column: rowid", strSql),
              refused(table, R"({"a":1,"b":"x"})", true));
    EXPECT_EQ((Rows{{"1", "x"}}), database_.rows("select * from " + strName));
}

TEST_F(Save, FailsWhereTheSelectFindsNoRow)
{
    database_.run("create trigger ignored before insert on " + table_.strName +
                  " begin select raise(ignore); end");
    const char szRecord[] = R"({"id":9,"name":"x"})";
    EXPECT_EQ((Lines{failed("0 == jArrayTmp.size()"),
                     plain(R"(blCreate=1, jRecInOut={"id":9,"name":"x"})"),
                     plain(R"(jType={"id":{"cpptype":"int"},"name":{"cpptype":"string"}})")}),
              refused(table_, szRecord, true));
    EXPECT_EQ((Lines{failed("0 == jArrayTmp.size()"),
                     plain(R"(blCreate=0, jRecInOut={"id":9,"name":"x"})"),
                     plain(R"(jType={"id":{"cpptype":"int"},"name":{"cpptype":"string"}})")}),
              refused(table_, szRecord, false));
}

TEST_F(Save, TakesTheFirstOfSeveralRows)
{
    doubles::state().exec = [](sqlite3*, const char*, doubles::RowCallback callback, void* arg,
                               char**) {
        char szId[] = "id", szOne[] = "1", szTwo[] = "2";
        char* names[] = {szId};
        char* first[] = {szOne};
        char* second[] = {szTwo};
        return callback(arg, 1, first, names) || callback(arg, 1, second, names);
    };
    EXPECT_EQ(R"({"id":1})", saved(table_, R"({"id":9,"name":"x"})", true));
}

TEST_F(Save, DoesNotReadBackWhatWasNotWritten)
{
    saved(table_, R"({"id":1,"name":"x"})", true);
    int iRows = 0;
    Json::Value jRecord = json(R"({"id":1,"name":"y"})");
    doubles::state().exec = [&iRows](sqlite3* pDb, const char* szSql, doubles::RowCallback, void*,
                                     char** errText) {
        const auto count = [](void* arg, int, char**, char**) {
            ++*static_cast<int*>(arg);
            return 0;
        };
        return doubles::realExec(pDb, szSql, count, &iRows, errText);
    };
    EXPECT_EQ(-1, table_.api.recSave(jRecord, true));
    EXPECT_EQ(0, iRows);
    EXPECT_EQ((Rows{{"1", "x"}}), database_.rows("select * from " + table_.strName));
}

TEST_F(Save, LetsAnAccessorsExceptionThrough)
{
    Json::Value jRecord = json(R"({"id":"5","name":"x"})");
    const Json::Value jBefore = jRecord;
    EXPECT_THROW(table_.api.recSave(jRecord, true), Json::LogicError);
    EXPECT_EQ(jBefore, jRecord);
    EXPECT_EQ(Lines(), takeLog());
    EXPECT_EQ(Lines(), takeStatements());
    EXPECT_EQ(R"({"id":5,"name":"x"})", saved(table_, R"({"id":5,"name":"x"})", true));
}

TEST_F(Save, AppliesNoDefaultsAndNoTypeCheck)
{
    Table table(database_,
                R"({"a":{"cpptype":"string","cppDefaultValue":"d"},"b":{"cpptype":"int"}})", "a,b");
    EXPECT_EQ(R"({"b":1})", saved(table, R"({"b":true})", true));
    EXPECT_EQ(R"({"a":"5","b":2})", saved(table, R"({"a":5,"b":2.5})", true));
}

}  // namespace
