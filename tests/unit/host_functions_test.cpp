// SPDX-License-Identifier: MIT
// What a host's own SQL functions do while a statement of the library runs.

#include "support/database.h"

#include <memory>

namespace {

class HostFunctions : public TableTest {
protected:
    // Makes the SQL function host() of it, which gives 1, or fails with the text that it returns.
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

    void callFunctionAtInsert()
    {
        database_.run("create trigger t" + table_.strName + " before insert on " + table_.strName +
                      " begin select host(); end");
    }

    // The lines of a duplicate create that show its record.
    Lines recordLines()
    {
        const Lines lines = takeLog();
        EXPECT_EQ(7U, lines.size());
        return {lines.at(2), lines.at(6)};
    }

    const Lines kRecordLines = {plain(R"(blCreate=1, jRecInOut={"id":1,"name":"sent"})"),
                                plain(R"(call create rec, rec={"id":1,"name":"sent"})")};

    std::function<const char*()> function_;
    Table table_{database_, R"({"id":{"cpptype":"int"},"name":{"cpptype":"string"}})",
                 "id integer primary key, name text"};
};

TEST_F(HostFunctions, MayChangeTheRecordOfACreate)
{
    table_.create(R"({"id":1,"name":"first"})");
    Json::Value jRecord;
    setFunction([&] {
        jRecord["name"] = "changed";
        jRecord["more"] = true;
        return nullptr;
    });
    callFunctionAtInsert();
    Json::Value jStored;
    jRecord = json(R"({"id":1,"name":"sent"})");
    EXPECT_EQ(-1, table_.api.recCreate(jRecord, jStored));
    EXPECT_EQ(R"({"id":1,"more":true,"name":"changed"})", text(jRecord));
    EXPECT_EQ(kRecordLines, recordLines());

    jRecord = json(R"({"id":2,"name":"sent"})");
    EXPECT_EQ(0, table_.api.recCreate(jRecord, jStored));
    EXPECT_EQ(R"({"id":2,"more":true,"name":"changed"})", text(jRecord));
    EXPECT_EQ(R"({"id":2,"name":"sent"})", text(jStored));
}

TEST_F(HostFunctions, MayDestroyTheRecordOfACreate)
{
    table_.create(R"({"id":1,"name":"first"})");
    auto pjRecord = std::make_unique<Json::Value>(json(R"({"id":1,"name":"sent"})"));
    setFunction([&] {
        *pjRecord = Json::nullValue;
        pjRecord.reset();
        return nullptr;
    });
    callFunctionAtInsert();
    Json::Value jStored;
    EXPECT_EQ(-1, table_.api.recCreate(*pjRecord, jStored));
    EXPECT_EQ(nullptr, pjRecord);
    EXPECT_EQ(kRecordLines, recordLines());
}

// The attempt that follows decodes the rows by the types of its own table again.
TEST_F(HostFunctions, MayListAnotherTableAndFailAsLocked)
{
    table_.create(R"({"id":1,"name":"a"})");
    Table other(database_, R"({"zone":{"cpptype":"string"}})", "zone text");
    other.create(R"({"zone":"north"})");
    int iCalls = 0;
    setFunction([&]() -> const char* {
        if (0 < iCalls++) return nullptr;
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
    EXPECT_EQ(2, iCalls);
    EXPECT_EQ(1U, doubles::state().sleeps.size());
    EXPECT_EQ(Lines(), takeLog());
}

}  // namespace
