// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// recSave: the statement, the stored row, and every failure.

#include "support/record_calls.h"
#include "support/rows.h"

namespace {

class Save : public RecordsTest {
protected:
    Save() { pTable_ = &people_; }

    Table people_{database_, R"({"id":{"cpptype":"int"},"name":{"cpptype":"string"}})",
                  "id integer primary key, name text"};
};

TEST_F(Save, InsertsOrReplacesAndReadsBackInOneText)
{
    const char szIt[] = R"({"id":7,"name":"it's"})";
    const std::string strInsert =
        "INSERT INTO $ (id,name) VALUES (7,'it''s') ;select * from $ where rowid == "
        "last_insert_rowid();";
    expect(save(szIt, true), {0, strInsert, szIt, "7it's"});
    database_.run("insert into " + people_.strName + " values (7,'Ann')");
    expectSqlFailure(save(szIt, true), strInsert, "UNIQUE constraint failed: $.id");
    expect(save(szIt, false), {0, saved(false, "id,name", "7,'it''s') "), szIt, "7it's"});
    const char szBob[] = R"({"id":8,"name":"Bob"})";
    expect(save(szBob, false), {0, saved(false, "id,name", "8,'Bob') "), szBob, "7Ann,8Bob"});
}

TEST_F(Save, ReplacesEveryConflictingRow)
{
    pTable_ = &table_;
    const char szRecord[] = R"({"flag":true,"id":1,"name":"Bob","tags":[2]})";
    expect(save(szRecord, false), {0, saved(false, "flag,id,name,tags", "1,1,'Bob','[2]') "),
                                   szRecord, "1Bob1,3O'Brien1"});
}

TEST_F(Save, ReturnsTheStoredRow)
{
    const struct {
        const char* szWord;
        const char* szColumn;  // its type and default
        const char* szGiven;   // null if the record has no such member
        const char* szStored;  // null if the row has none
    } members[] = {
        {"int", "integer primary key", nullptr, "1"},
        {"string", "text default 'x'", nullptr, R"("x")"},
        {"int", "", nullptr, nullptr},
        {"string", "", "5", R"("5")"},
        {"string", "integer", R"("0042")", R"("42")"},
        {"int", "text", "42", "42"},
        {"string", "", "null", R"("")"},
        {"int", "", "null", "0"},
        {"int", "", "5000000000", "2147483647"},
        {"unsigned int", "", "4294967295", "2147483647"},
        {"unsigned long long", "", "9223372036854775807", "9223372036854775807"},
        // SQLite holds it as a real number, which is read up to its point.
        {"unsigned long long", "", "9223372036854775808", "9"},
        {"unsigned int", "", "18446744073709551615", "1"},
        {"bool", "", "true", "true"},
        {"bool", "", "7", "false"},
        {"Json::arrayValue", "", R"([1,"x",null])", R"([1,"x",null])"},
        {"Json::objectValue", "", R"({"k":{"l":1.5}})", R"({"k":{"l":1.5}})"},
        {"string", "", R"("x\u0000y")", R"("x")"},
    };
    Json::Value jMembers;
    Json::Value jRecord;
    Json::Value jStored;
    std::string strColumns;
    for (const auto& member : members) {
        const std::string strKey(1, static_cast<char>('a' + jMembers.size()));
        jMembers[strKey]["cpptype"] = member.szWord;
        strColumns += (strColumns.empty() ? "" : ",") + strKey + " " + member.szColumn;
        if (nullptr != member.szGiven) jRecord[strKey] = json(member.szGiven);
        if (nullptr != member.szStored) jStored[strKey] = json(member.szStored);
    }
    jRecord["A"] = jRecord["undeclared"] = json("[3]");
    Table table(database_, text(jMembers), strColumns);
    pTable_ = &table;
    for (const bool blCreate : {true, false})
        expectOutput(save(text(jRecord), blCreate), 0, kAnySql, text(jStored));
}

TEST_F(Save, RefusesListsThatDoNotClose)
{
    for (const bool blCreate : {true, false}) {
        expectSqlFailure(save(R"({"id":1})", blCreate), saved(blCreate, "id,", "1,"),
                         kNearParenthesis);
        for (const char* szRecord : {"{}", R"({"x":1})", "null", "[1]", "\"x\"", "5"})
            expectSqlFailure(save(szRecord, blCreate), saved(blCreate, "", ""), kNearParenthesis);
    }
}

TEST_F(Save, StopsAtAValueThatCannotBeWritten)
{
    Table table(database_, R"({"a":{"cpptype":"int"},"b":{"cpptype":"Json::Value"}})", "a,b");
    pTable_ = &table;
    for (const bool blCreate : {true, false})
        expectFailure(save(R"({"a":1,"b":2})", blCreate),
                      {error("cannot support this type=Json::Value"),
                       failed("0 > SqlExpandMemberSymbol(strSql, jRecInOut)")},
                      0, (blCreate ? "INSERT" : "REPLACE") + std::string(" INTO $ (a,b) VALUES ("));
}

TEST_F(Save, FailsIfTheWrittenRowCannotBeReadBack)
{
    blWritten_ = true;
    Table undeclared(database_, R"({"a":{"cpptype":"int"}})", "a, extra default 5");
    pTable_ = &undeclared;
    for (const bool blCreate : {true, false})
        expectSqlFailure(save(R"({"a":2})", blCreate), saved(blCreate, "a", "2) "), "query aborted",
                         rowRefused(fieldFailed(failed("!jType.isMember(strName)")),
                                    {plain("column_name[1]=extra"), plain("column_value[1]=5")}));
    for (const std::string strWord : {"double", "float", "long", "unsigned long", "unsigned"}) {
        Table table(database_, R"({"a":{"cpptype":")" + strWord + R"("}})", "a");
        pTable_ = &table;
        const bool blReal = "double" == strWord || "float" == strWord;
        expectSqlFailure(save(R"({"a":2})", true), saved(true, "a", blReal ? "2.000000) " : "2) "),
                         "query aborted",
                         rowRefused(fieldFailed(error("type error, strType=" + strWord))));
    }
}

TEST_F(Save, FailsInATableWithoutRowidAfterWritingTheRow)
{
    blWritten_ = true;
    const std::string strName = freshName();
    database_.run("create table " + strName + " (a integer primary key, b text) without rowid");
    Table table(database_, strName, R"({"a":{"cpptype":"int"},"b":{"cpptype":"string"}})", "a, b");
    pTable_ = &table;
    expectSqlFailure(save(R"({"a":1,"b":"x"})", true), saved(true, "a,b", "1,'x') "),
                     "no such column: rowid");
}

TEST_F(Save, FailsWhenTheSelectFindsNoRow)
{
    database_.run("create trigger ignored before insert on " + people_.strName +
                  " begin select raise(ignore); end");
    const std::string strRecord = R"({"id":9,"name":"x"})";
    const Lines causes = {failed("0 == jArrayTmp.size()")};
    for (const bool blCreate : {true, false})
        expectSqlFailure(save(strRecord, blCreate), saved(blCreate, "id,name", "9,'x') "), "",
                         causes);
    expectSqlFailure(create(strRecord), saved(true, "id,name", "9,'x') "), "", causes);
}

TEST_F(Save, TakesTheFirstOfSeveralRows)
{
    prepare_ = [] {
        doubles::state().exec = [](sqlite3*, const char*, doubles::RowCallback callback, void* arg,
                                   char**) {
            return Row{{"id"}, {"1"}}.handTo(callback, arg) ||
                   Row{{"id"}, {"2"}}.handTo(callback, arg);
        };
    };
    expectOutput(save(R"({"id":9,"name":"x"})", true), 0, kAnySql, R"({"id":1})");
}

TEST_F(Save, PassesOnWhatAnAccessorThrows)
{
    expectThrow(save(R"({"id":"5","name":"x"})", true));
}

TEST_F(Save, AppliesNoDefaultsAndNoTypeCheck)
{
    Table table(database_,
                R"({"a":{"cpptype":"string","cppDefaultValue":"d"},"b":{"cpptype":"int"}})", "a,b");
    pTable_ = &table;
    expectOutput(save(R"({"b":true})", true), 0, kAnySql, R"({"b":1})");
    expectOutput(save(R"({"a":5,"b":2.5})", true), 0, kAnySql, R"({"a":"5","b":2})");
}

}  // namespace
