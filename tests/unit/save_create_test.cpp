// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// recCreate: defaults, type check, insert, and the message for the host's user.

#include "support/record_calls.h"
#include "support/rows.h"

namespace {

class Create : public RecordsTest {
protected:
    Create() { pTable_ = &people_; }

    Table people_{database_,
                  R"({"id":{"cpptype":"int"},
                      "name":{"cpptype":"string","cppDefaultValue":"unnamed"}})",
                  "id integer primary key, name text"};
};

TEST_F(Create, FillsDefaultsAndInserts)
{
    expect(create(R"({"id":1})"), {0, saved(true, "id,name", "1,'unnamed') "),
                                   R"({"id":1,"name":"unnamed"})", "1unnamed"});
    expect(create(R"({"other":1})"),
           {0, saved(true, "name", "'unnamed') "), R"({"id":1,"name":"unnamed"})", "1unnamed"});
    expect(create(R"({"name":"b","other":[1]})"),
           {0, saved(true, "name", "'b') "), R"({"id":1,"name":"b"})", "1b"});
}

TEST_F(Create, TakesARecordAndAResultThatShareAnObject)
{
    const struct {
        const char* szObject;
        const char* szRecord;  // the member that is the record; null for the object itself
        const char* szResult;
        const char* szAfter;
    } cases[] = {
        {R"({"id":1,"name":"v","other":true})", nullptr, nullptr, R"({"id":1,"name":"v"})"},
        {R"({"record":{"id":2,"name":"x"}})", "record", nullptr, R"({"id":2,"name":"x"})"},
        {R"({"id":3,"name":"y","stored":5})", nullptr, "stored",
         R"({"id":3,"name":"y","stored":{"id":3,"name":"y"}})"},
        {R"({"id":4,"name":"z"})", nullptr, "name", R"({"id":4,"name":{"id":4,"name":"z"}})"},
    };
    for (const auto& row : cases) {
        // The second call fails, and leaves the object alone.
        for (const int iResult : {0, -1}) {
            Json::Value jObject = json(row.szObject);
            Json::Value& jRecord = nullptr == row.szRecord ? jObject : jObject[row.szRecord];
            Json::Value& jResult = nullptr == row.szResult ? jObject : jObject[row.szResult];
            EXPECT_EQ(iResult, people_.api.recCreate(jRecord, jResult));
            EXPECT_EQ(0 == iResult ? row.szAfter : row.szObject, text(jObject));
        }
    }
}

TEST_F(Create, RefusesWhatIsNotARecord)
{
    for (const char* szRecord : {"null", "{}", "[]"})
        expectFailure(create(szRecord), {failed("jRecIn.empty()")});
    for (const char* szRecord : {"[1]", R"("x")", R"("")", "5", "0", "1.5", "true", "false"})
        expectFailure(create(szRecord),
                      {failed("!jRecParam.isObject()"), failed("0 > checkJsonType(jParam)")});
}

TEST_F(Create, RefusesABadTypeAndLogsTheFilledRecord)
{
    for (const char* szMember : {R"("5")", "null", "1.5"}) {
        const std::string strRecord = std::string(R"({"id":)") + szMember;
        const std::string strFilled = strRecord + R"(,"name":"unnamed"})";
        expectFailure(create(strRecord + "}"),
                      {error("type failed, strKey=id, jRecParam=" + strFilled),
                       failed("0 > checkJsonType(jParam)")});
    }
}

TEST_F(Create, ChecksTheDefaultsToo)
{
    const struct {
        std::string strWord;
        std::string strDefault;
        bool blKnown;  // whether the check knows the word
    } cases[] = {
        {"double", "1.5", false}, {"unsigned int", "1", false}, {"Json::Value", "{}", false},
        {"int", "null", true},    {"string", "null", true},     {"bool", "null", true},
        {"int", R"("5")", true},
    };
    for (const auto& row : cases) {
        Table table(database_,
                    R"({"a":{"cpptype":"int"},"v":{"cpptype":")" + row.strWord +
                        R"(","cppDefaultValue":)" + row.strDefault + "}}",
                    "a, v");
        pTable_ = &table;
        const std::string strFilled = R"({"a":1,"v":)" + row.strDefault + "}";
        expectFailure(create(R"({"a":1})"),
                      {error(row.blKnown ? "type failed, strKey=v, jRecParam=" + strFilled
                                         : "type not found!!, key=v"),
                       failed("0 > checkJsonType(jParam)")});
    }
}

TEST_F(Create, FailsOnWordsThatTheCheckAcceptsAndTheListDoesNot)
{
    for (const std::string strWord : {"uid_t", "time_t"}) {
        Table table(database_, R"({"v":{"cpptype":")" + strWord + R"("}})", "v");
        pTable_ = &table;
        expectFailure(create(R"({"v":5})"),
                      {error("cannot support this type=" + strWord),
                       failed("0 > SqlExpandMemberSymbol(strSql, jRecInOut)")},
                      0, "INSERT INTO $ (v) VALUES (");
    }
}

TEST_F(Create, ReportsADuplicateInAnyUniqueColumnAndNoOtherError)
{
    Table table(database_, R"({"a":{"cpptype":"int"},"b":{"cpptype":"string"}})",
                "a integer primary key not null, b text unique check (b <> 'bad')");
    pTable_ = &table;
    table.create(R"({"a":1,"b":"x"})");
    expectSqlFailure(create(R"({"a":1,"b":"y"})"), saved(true, "a,b", "1,'y') "),
                     "UNIQUE constraint failed: $.a");
    expectSqlFailure(create(R"({"a":2,"b":"x"})"), saved(true, "a,b", "2,'x') "),
                     "UNIQUE constraint failed: $.b");
    expectSqlFailure(create(R"({"a":2,"b":"bad"})"), saved(true, "a,b", "2,'bad') "),
                     "CHECK constraint failed: b <> 'bad'");
}

TEST_F(Create, FindsTheDuplicateAnywhereInTheErrorText)
{
    for (const char* szError :
         {"UNIQUE constraint failed", "trigger: UNIQUE constraint failed: t.a, t.b",
          "unique constraint failed: t.a", "UNIQUE constraint", "UNIQUE constraint faile",
          "PRIMARY KEY must be unique"}) {
        prepare_ = [=] { doubles::state().exec = execOfStatus(SQLITE_CONSTRAINT, szError); };
        expectSqlFailure(create(R"({"id":1,"name":"x"})"), saved(true, "id,name", "1,'x') "),
                         szError);
    }
}

}  // namespace
