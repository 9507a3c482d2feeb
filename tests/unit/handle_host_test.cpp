// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// Operations of a handle while the host does something unusual: it changes member types, its SQL
// functions run inside a statement, or memory runs out.

#include "support/database.h"

#include <functional>
#include <memory>
#include <new>

namespace {

using doubles::state;

class ChangedTypes : public TableTest {
protected:
    // What the operations make of {"m":5}, and of the row that holds it: each result with the first
    // line of the log or the SQL that was run, and the rows.
    Lines operations(VornJsonDbApi& api)
    {
        Json::Value jRecord = json(R"({"m":5})");
        Json::Value jRequest = jRecord;
        Json::Value jRecords;
        Lines lines;
        const auto add = [this, &lines](int iResult) {
            Lines all = takeLog();
            for (const std::string& strStatement : takeStatements()) all.push_back(strStatement);
            lines.push_back(std::to_string(iResult) + " " + (all.empty() ? "" : all[0]));
        };
        database_.run("delete from " + table_.strName);
        add(api.checkJsonType(jRecord));
        add(api.recSave(jRecord, true));
        database_.run("insert into " + table_.strName + " values (5)");
        add(api.recList(jRequest, jRecords));
        lines.push_back(text(jRecords));
        return lines;
    }

    Table table_{database_, R"({"m":{"cpptype":"int"}})", "m"};
};

TEST_F(ChangedTypes, ApplyFromTheNextStatementOnInEveryHandle)
{
    const std::string strInsert = "0 INSERT INTO " + table_.strName +
                                  " (m) VALUES (5) ;select * from " + table_.strName +
                                  " where rowid == last_insert_rowid();";
    const std::string strSelect = "0 SELECT m FROM " + table_.strName + "  WHERE  (m=5 );";
    const Lines ofAnInteger = {"0 ", strInsert, strSelect, R"([{"m":5},{"m":5}])"};
    const Lines ofABool = {"-1 " + error(R"(type failed, strKey=m, jRecParam={"m":5})"), strInsert,
                           strSelect, R"([{"m":false},{"m":false}])"};
    const Lines ofNoWord = {"-1 " + error("type not found!!, key=m"),
                            "-1 " + error("cannot support this type="),
                            "-1 " + error("type error, strType="), "null"};
    Table second(database_, table_.strName, R"({"m":{"cpptype":"int"}})", "m");
    Json::Value& jType = VORN_JSON_DB::recType(table_.jDefinition, table_.strName)["m"];
    for (VornJsonDbApi* pApi : {&table_.api, &second.api}) {
        const auto expect = [&](const char* szType, const Lines& lines) {
            SCOPED_TRACE(szType);
            jType = json(szType);
            EXPECT_EQ(lines, operations(*pApi));
            EXPECT_EQ(szType, text(jType));
        };
        expect(R"({"cpptype":"int"})", ofAnInteger);
        expect(R"({"cpptype":"bool"})", ofABool);
        expect(R"({"cpptype":"long long"})", ofAnInteger);
        for (const char* szType :
             {R"({"cpptype":""})", "{}", R"({"cppDefaultValue":1})", R"({"type":"int"})", "null",
              "5", "true", R"("int")", "[]", R"([{"cpptype":"int"}])"})
            expect(szType, ofNoWord);
    }
}

class HostFunctions : public TableTest {
protected:
    // Makes it the SQL function host(), which gives 1, or fails with the text that it returns.
    void setFunction(std::function<const char*()> function)
    {
        function_ = std::move(function);
        const auto call = [](sqlite3_context* pContext, int, sqlite3_value**) {
            const auto* pFunction =
                static_cast<std::function<const char*()>*>(sqlite3_user_data(pContext));
            const char* szError = (*pFunction)();
            if (nullptr != szError) return sqlite3_result_error(pContext, szError, -1);
            sqlite3_result_int(pContext, 1);
        };
        EXPECT_EQ(SQLITE_OK, sqlite3_create_function(database_.get(), "host", 0, SQLITE_UTF8,
                                                     &function_, call, nullptr, nullptr));
    }

    std::function<const char*()> function_;
    int iCalls_ = 0;
    Table table_{database_, R"({"id":{"cpptype":"int"},"name":{"cpptype":"string"}})",
                 "id integer primary key, name text"};
};

TEST_F(HostFunctions, MayChangeOrDestroyTheRecordOfACreate)
{
    database_.run("create trigger host_function before insert on " + table_.strName +
                  " begin select host(); end");
    std::unique_ptr<Json::Value> pjRecord;
    setFunction([&] {
        (*pjRecord)["name"] = "changed";
        if (2 == ++iCalls_) pjRecord.reset();
        return nullptr;
    });
    Json::Value jStored;
    for (int iResult : {0, -1, -1}) {
        pjRecord = std::make_unique<Json::Value>(json(R"({"id":1,"name":"sent"})"));
        EXPECT_EQ(iResult, table_.api.recCreate(*pjRecord, jStored));
        EXPECT_EQ(2 == iCalls_ ? "" : R"({"id":1,"name":"changed"})",
                  pjRecord ? text(*pjRecord) : "");
        EXPECT_EQ(R"({"id":1,"name":"sent"})", text(jStored));
        const Lines lines = takeLog();
        if (0 == iResult) continue;
        // The lines of a duplicate create show what was sent.
        ASSERT_EQ(7U, lines.size());
        EXPECT_EQ(plain(R"(blCreate=1, jRecInOut={"id":1,"name":"sent"})"), lines[2]);
        EXPECT_EQ(plain(R"(call create rec, rec={"id":1,"name":"sent"})"), lines[6]);
    }
}

// The attempt that follows decodes the rows by the types of its own table again.
TEST_F(HostFunctions, MayListAnotherTableAndFailAsLocked)
{
    table_.create(R"({"id":1,"name":"a"})");
    Table other(database_, R"({"zone":{"cpptype":"string"}})", "zone text");
    other.create(R"({"zone":"north"})");
    setFunction([&]() -> const char* {
        if (0 < iCalls_++) return nullptr;
        Json::Value jRequest;
        Json::Value jRecords;
        EXPECT_EQ(0, other.api.recList(jRequest, jRecords));
        return "database is locked";
    });
    Json::Value jRequest;
    jRequest["vornSqlWhereFilter"] = "host()";
    Json::Value jRecords;
    EXPECT_EQ(0, table_.api.recList(jRequest, jRecords));
    EXPECT_EQ(R"([{"id":1,"name":"a"}])", text(jRecords));
    EXPECT_EQ(2, iCalls_);
    EXPECT_EQ(1U, state().sleeps.size());
    EXPECT_EQ(Lines(), takeLog());
}

using Memory = TableTest;

// JSON text is never cut, and no part of an unfinished text gets into the next one.
TEST_F(Memory, ShortageLeavesNoPartialTextInAValueList)
{
    Table table(database_, R"({"j":{"cpptype":"Json::objectValue"}})", "j text");
    // Longer than the initial capacity of a JSON text.
    const std::string strJson =
        R"({"first":"a text that is not short","second":")" + std::string(200, 'x') + "\"}";
    const Json::Value jBefore = json("{\"j\":" + strJson + "}");
    const std::string strBefore = "a text that is not short (";
    // Whether it is composed even though the n-th allocation fails.
    const auto isComposed = [&](int n) {
        Json::Value jRecord = jBefore;
        std::string strSql = strBefore;
        state().iFailNew = n;
        try {
            const int iResult = table.api.SqlExpandMemberSymbol(strSql, jRecord);
            state().iFailNew = 0;
            EXPECT_EQ(0, iResult);
            EXPECT_EQ(strBefore + "'" + strJson + "') ", strSql);
            return true;
        } catch (const std::bad_alloc&) {
            EXPECT_EQ(strBefore, strSql);
            EXPECT_EQ(jBefore, jRecord);
            return false;
        }
    };
    int n = 1;
    for (; !isComposed(n); ++n) EXPECT_TRUE(isComposed(0)) << n;
    EXPECT_LT(1, n);
    EXPECT_EQ(Lines(), takeLog());
}

}  // namespace
