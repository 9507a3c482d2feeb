// SPDX-License-Identifier: MIT
// docs/limits.md, what reaches beyond one call: threads, definitions, the reader.

#include "support/limits.h"

#include <json/reader.h>

#include <functional>
#include <locale>
#include <mutex>
#include <thread>

namespace {

// SQL function of a host: lists another table while a statement runs.
void listOther(sqlite3_context* pContext, int, sqlite3_value**)
{
    auto* pOther = static_cast<VornJsonDbApi*>(sqlite3_user_data(pContext));
    Json::Value jRequest;
    Json::Value jRecords;
    EXPECT_EQ(0, pOther->recList(jRequest, jRecords));
    sqlite3_result_int(pContext, 1);
}

// SQL function of a host: makes a handle of another table while a statement runs.
void makeHandle(sqlite3_context* pContext, int, sqlite3_value**)
{
    auto* pOther = static_cast<Table*>(sqlite3_user_data(pContext));
    VornJsonDbApi(sqlite3_context_db_handle(pContext), pOther->strName, pOther->jDefinition,
                  pOther->strCreate);
    sqlite3_result_int(pContext, 1);
}

}  // namespace

TEST_F(Limits, OneThread)
{
    table_.create(R"({"id":1,"text":"x"})");
    Table other(database_, R"({"name":{"cpptype":"string"}})", "name text");
    other.create(R"({"name":"y"})");
    EXPECT_EQ(SQLITE_OK, sqlite3_create_function(database_.get(), "list_other", 0, SQLITE_UTF8,
                                                 &other.api, listOther, nullptr, nullptr));
    // Rows of the page's table are looked up among the members of the other one.
    Json::Value jNested;
    jNested["vornSqlWhereFilter"] = "list_other()";
    EXPECT_EQ("-1", ids(jNested));
    EXPECT_EQ(failed("!jType.isMember(strName)"), takeLog().at(0));

    // So are the rows that follow the making of a handle.
    table_.create(R"({"id":2,"text":"x"})");
    EXPECT_EQ(SQLITE_OK, sqlite3_create_function(database_.get(), "make_handle", 0, SQLITE_UTF8,
                                                 &other, makeHandle, nullptr, nullptr));
    jNested["vornSqlWhereFilter"] = "id = 1 or make_handle()";
    Json::Value jFollowed;
    EXPECT_EQ(-1, table_.api.recList(jNested, jFollowed));
    EXPECT_EQ("[" + stored(1) + "]", text(jFollowed));
    EXPECT_EQ(failed("!jType.isMember(strName)"), takeLog().at(0));
    database_.run("delete from " + table_.strName + " where id = 2");

    // One after the other; two threads with one lock around every call.
    std::mutex vornMutex;
    const auto listMany = [&vornMutex](VornJsonDbApi& task, const std::string& strExpected) {
        for (int i = 0; i < 200; ++i) {
            Json::Value jRequest;
            Json::Value jRecords;
#include "limits/OneThread.inc"
            EXPECT_EQ(strExpected, text(jRecords));
        }
    };
    const std::string strStored = "[" + stored(1) + "]";
    std::thread thread(listMany, std::ref(other.api), R"([{"name":"y"}])");
    listMany(table_.api, strStored);
    thread.join();
}

TEST_F(Limits, FirstDefinitionWins)
{
    const std::string strSecond = R"({"id":{"cpptype":"int"},"zone":{"cpptype":"string"}})";
    Database database;
    database.run("create table " + table_.strName + " (id integer primary key, zone text)");
    EXPECT_EQ("", ids(Json::nullValue));  // the first definition is read
    Table second(database, table_.strName, strSecond, "id integer");
    Json::Value jRecord = json(R"({"id":1,"zone":"north"})");
    Json::Value jStored;
    EXPECT_EQ(-1, second.api.recCreate(jRecord, jStored));
    EXPECT_EQ("0", database.value("select count(*) from " + table_.strName));
    takeLog();

    Table named(database, strSecond, "id integer primary key, zone text");
    EXPECT_EQ(text(jRecord), text(named.create(text(jRecord))));

    Json::Value& jDefinition = second.jDefinition;
    std::string& strName = second.strName;
#include "limits/FirstDefinitionWins.inc"
    Table replaced(database, table_.strName, strSecond, "id integer");
    EXPECT_EQ(text(jRecord), text(replaced.create(text(jRecord))));
}

namespace {

// [[[...]]] of that many levels.
std::string nested(std::size_t nLevels)
{
    return std::string(nLevels, '[') + std::string(nLevels, ']');
}

// As a host reads a text that is deeper than jsoncpp's default allows.
Json::Value readDeep(const std::string& strText)
{
    Json::CharReaderBuilder builder;
    builder["stackLimit"] = 10000;
    const std::unique_ptr<Json::CharReader> pReader(builder.newCharReader());
    Json::Value jValue;
    EXPECT_TRUE(pReader->parse(strText.data(), strText.data() + strText.size(), &jValue, nullptr));
    return jValue;
}

}  // namespace

TEST_F(Limits, DeepJsonReadsBackAsNull)
{
    for (std::size_t nLevels : {1000U, 1001U}) {
        Json::Value jRecord;
        jRecord["id"] = static_cast<int>(nLevels);
        jRecord["tags"] = readDeep(nested(nLevels));
        jRecord["text"] = nested(nLevels);
        Json::Value jStored;
        EXPECT_EQ(0, table_.api.recCreate(jRecord, jStored));
        EXPECT_EQ(1000U == nLevels, jStored["tags"].isArray()) << nLevels;
        EXPECT_EQ(1001U == nLevels, jStored["tags"].isNull()) << nLevels;
        EXPECT_EQ(nested(nLevels), database_.value("select tags from " + table_.strName +
                                                   " where id = " + std::to_string(nLevels)));
        EXPECT_TRUE(jRecord["tags"] == readDeep(jStored["text"].asString())) << nLevels;
    }
}

namespace {

struct DecimalComma : std::numpunct<char> {
    char do_decimal_point() const override { return ','; }
    char do_thousands_sep() const override { return '.'; }
    std::string do_grouping() const override { return "\3"; }
};

// The global C++ locale with a decimal comma, for as long as it lives.
class CommaLocale {
public:
    CommaLocale() : before_(std::locale::global(std::locale(std::locale(), new DecimalComma))) {}
    ~CommaLocale() { std::locale::global(before_); }
    CommaLocale(const CommaLocale&) = delete;
    CommaLocale& operator=(const CommaLocale&) = delete;

private:
    std::locale before_;
};

}  // namespace

TEST_F(Limits, GlobalLocaleWithADecimalComma)
{
    Table table(database_, R"({"o":{"cpptype":"Json::objectValue"}})", "o text");
    const auto create = [&](const Json::Value& jObject) {
        Json::Value jRecord;
        jRecord["o"] = jObject;
        Json::Value jStored;
        EXPECT_EQ(0, table.api.recCreate(jRecord, jStored));
        return text(jStored["o"]);
    };
    const Json::Value jFraction = jExample(0);
    const Json::Value jText = jExample(1);
    {
        const CommaLocale locale;
        const bool blByLocale = JSONCPP_VERSION_HEXA < 0x01090800;
        EXPECT_EQ(blByLocale ? R"({"rate":null})" : R"({"rate":1.5,"unit":"EUR"})",
                  create(jFraction));
        EXPECT_EQ(R"({"rate":"1.5","unit":"EUR"})", create(jText));
        EXPECT_EQ(R"({"rate":12345,"unit":"EUR"})", create(json(R"({"rate":12345,"unit":"EUR"})")));
        EXPECT_EQ(Lines(), takeLog());
    }
    EXPECT_EQ(R"({"rate":1.5,"unit":"EUR"})", create(jFraction));
    EXPECT_EQ((Rows{{R"({"rate":1.5,"unit":"EUR"})"},
                    {R"({"rate":"1.5","unit":"EUR"})"},
                    {R"({"rate":12345,"unit":"EUR"})"},
                    {R"({"rate":1.5,"unit":"EUR"})"}}),
              database_.rows("select o from " + table.strName));
}
