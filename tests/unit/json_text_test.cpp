// SPDX-License-Identifier: MIT
// JSON values as text: how they are stored, read back and logged.

#include "support/database.h"

#include <json/reader.h>

#include <cmath>
#include <limits>
#include <memory>

namespace {

class JsonText : public TableTest {
protected:
    Table table_{database_,
                 R"({"a":{"cpptype":"Json::arrayValue"},"o":{"cpptype":"Json::objectValue"}})",
                 "a text, o text"};

    // Creates a record of both members; the text as it is stored in "o".
    std::string stored(const Json::Value& jObject)
    {
        Json::Value jRecord;
        jRecord["a"] = Json::Value(Json::arrayValue);
        jRecord["o"] = jObject;
        Json::Value jOut;
        EXPECT_EQ(0, table_.api.recCreate(jRecord, jOut));
        EXPECT_EQ(text(jObject), text(jOut["o"]));
        return database_.value("select o from " + table_.strName + " order by rowid desc limit 1");
    }

    // The record as a row with the texts in its columns is read.
    Json::Value readBack(const std::string& strArray)
    {
        database_.run("drop trigger if exists given");
        char* szText = sqlite3_mprintf("%Q", strArray.c_str());
        database_.run("create trigger given after insert on " + table_.strName + " begin update " +
                      table_.strName + " set a = " + szText + " where rowid = new.rowid; end");
        sqlite3_free(szText);
        return table_.create(R"({"a":[],"o":{"k":1}})");
    }
};

TEST_F(JsonText, IsOneCompactLine)
{
    const struct {
        const char* szObject;
        const char* szText;
    } cases[] = {
        {"{ }", "{}"},
        {R"({ "b" : [ 1 , 2 ] , "a" : { "c" : null } })", R"({"a":{"c":null},"b":[1,2]})"},
        {R"({"k":[ ]})", R"({"k":[]})"},
        {R"({"t":true,"f":false})", R"({"f":false,"t":true})"},
        {R"({"k":"ž 🐎 \u017e"})", R"({"k":"ž 🐎 ž"})"},
        {R"({"ž":1})", R"({"ž":1})"},
        {R"({"k":"a\"b\\c/d\n\t\r\b\f"})", R"({"k":"a\"b\\c/d\n\t\r\b\f"})"},
        {R"({"k":"\u0001\u001f"})", R"({"k":"\u0001\u001f"})"},
        {R"({"k":"\u0000"})", R"({"k":"\u0000"})"},
        {R"({"k":"it's"})", R"({"k":"it's"})"},
        {R"({"k":-9223372036854775808,"l":18446744073709551615})",
         R"({"k":-9223372036854775808,"l":18446744073709551615})"},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(c.szObject);
        EXPECT_EQ(c.szText, stored(json(c.szObject)));
    }
    EXPECT_EQ(Lines(), takeLog());
}

TEST_F(JsonText, KeepsEveryNumberExactly)
{
    for (double dValue : {0.1, 1.0 / 3, 2.5, -0.0, 1e-300, 1e300, 5e-324, 123456789.123456789,
                          std::numeric_limits<double>::max(), std::nextafter(1.0, 2.0), 1e15,
                          9007199254740993.0, -273.15}) {
        SCOPED_TRACE(dValue);
        Json::Value jRecord = json(R"({"a":[],"o":{}})");
        jRecord["o"]["k"] = dValue;
        Json::Value jOut;
        EXPECT_EQ(0, table_.api.recCreate(jRecord, jOut));
        const double dRead = jOut["o"]["k"].asDouble();
        EXPECT_EQ(dValue, dRead);
        EXPECT_EQ(std::signbit(dValue), std::signbit(dRead));
    }
    EXPECT_EQ(R"({"k":0.10000000000000001})", stored(json(R"({"k":0.1})")));
}

TEST_F(JsonText, KeepsNanAndInfinities)
{
    const double dInfinity = std::numeric_limits<double>::infinity();
    Json::Value jRecord = json(R"({"o":{}})");
    jRecord["a"].append(std::numeric_limits<double>::quiet_NaN());
    jRecord["a"].append(dInfinity);
    jRecord["a"].append(-dInfinity);
    Json::Value jOut;
    EXPECT_EQ(0, table_.api.recCreate(jRecord, jOut));
    EXPECT_EQ("[NaN,Infinity,-Infinity]", database_.value("select a from " + table_.strName));
    ASSERT_EQ(3U, jOut["a"].size());
    EXPECT_TRUE(std::isnan(jOut["a"][0].asDouble()));
    EXPECT_EQ(dInfinity, jOut["a"][1].asDouble());
    EXPECT_EQ(-dInfinity, jOut["a"][2].asDouble());
}

TEST_F(JsonText, HasNoCommentsOfTheHostsReader)
{
    const std::string strText =
        "// before\n{\"a\":[1, // one\n2] /* behind */,\"o\":{\"k\":1 // "
        "last\n}}\n// end";
    Json::CharReaderBuilder builder;
    builder["collectComments"] = true;
    const std::unique_ptr<Json::CharReader> pReader(builder.newCharReader());
    Json::Value jRecord;
    ASSERT_TRUE(pReader->parse(strText.data(), strText.data() + strText.size(), &jRecord, nullptr));
    ASSERT_TRUE(jRecord.hasComment(Json::commentBefore));
    Json::Value jOut;
    EXPECT_EQ(0, table_.api.recCreate(jRecord, jOut));
    EXPECT_EQ((Rows{{"[1,2]", R"({"k":1})"}}), database_.rows("select * from " + table_.strName));
    jRecord["o"] = 5;
    EXPECT_EQ(-1, table_.api.recCreate(jRecord, jOut));
    EXPECT_EQ(plain(R"(call create rec, rec={"a":[1,2],"o":5})"), takeLog().back());
}

TEST_F(JsonText, LosesTheCommentsOfAStoredText)
{
    database_.run("insert into " + table_.strName +
                  " values ('/* a */[/* b */1, 2 // c\n]', '{\"k\":/* d */1} // e')");
    Json::Value jRequest;
    Json::Value jRecords;
    EXPECT_EQ(0, table_.api.recList(jRequest, jRecords));
    ASSERT_EQ(1U, jRecords.size());
    EXPECT_EQ(R"({"a":[1,2],"o":{"k":1}})", text(jRecords[0]));
    for (const Json::Value* pjValue :
         {&jRecords[0]["a"], &jRecords[0]["a"][0], &jRecords[0]["a"][1], &jRecords[0]["o"],
          &jRecords[0]["o"]["k"]})
        for (auto place : {Json::commentBefore, Json::commentAfterOnSameLine, Json::commentAfter})
            EXPECT_FALSE(pjValue->hasComment(place)) << text(*pjValue) << ' ' << place;
    Json::Value jRecord = jRecords[0];
    EXPECT_EQ(0, table_.api.recSave(jRecord, true));
    EXPECT_EQ((Rows{{"[1,2]", R"({"k":1})"}}),
              database_.rows("select * from " + table_.strName + " where rowid = 2"));
}

TEST_F(JsonText, IsTheSameInTheLog)
{
    Json::Value jRecord = json(R"({"b":"ž\n","a":[0.1,NaN,{"k":"%s%n"}]})");
    EXPECT_EQ(-1, table_.api.fillDefaultValue(jRecord, true));
    takeLog();
    blDebugOutput = true;
    EXPECT_EQ(-1, table_.api.fillDefaultValue(jRecord, true));
    EXPECT_EQ((Lines{error("lost data member=o"),
                     plain(R"(jParam={"a":[0.10000000000000001,NaN,{"k":"%s%n"}],"b":"ž\n"})")}),
              takeLog());
}

TEST_F(JsonText, IsReadUpToTheReadersDepth)
{
    const auto nested = [](int iLevels) {
        return std::string(static_cast<std::size_t>(iLevels), '[') +
               std::string(static_cast<std::size_t>(iLevels), ']');
    };
    for (int iLevels : {1, 999, 1000}) {
        SCOPED_TRACE(iLevels);
        const Json::Value jRow = readBack(nested(iLevels));
        EXPECT_EQ(nested(iLevels), text(jRow["a"]));
        EXPECT_EQ(R"({"k":1})", text(jRow["o"]));
    }
    for (int iLevels : {1001, 100000}) {
        SCOPED_TRACE(iLevels);
        const Json::Value jRow = readBack(nested(iLevels));
        EXPECT_TRUE(jRow.isMember("a"));
        EXPECT_TRUE(jRow["a"].isNull());
        EXPECT_EQ(R"({"k":1})", text(jRow["o"]));
    }
    EXPECT_EQ(Lines(), takeLog());
    EXPECT_EQ("[1]", text(readBack("[1]")["a"]));
}

TEST_F(JsonText, KeepsTheMemberWhereItIsNone)
{
    const struct {
        const char* szText;
        const char* szMember;
    } cases[] = {
        {"", "null"},
        {"x", "null"},
        {"tru", "null"},
        {"[1] x", "[1]"},
        {"[1,", "[1,null]"},
        {R"({"k":1)", R"({"k":1})"},
        {R"("open)", "null"},
        {"[1]]", "[1]"},
        {"\xff\xfe", "null"},
        {"5", "5"},
        {"null", "null"},
        {R"("x")", R"("x")"},
        {" [ 1 ] ", "[1]"},
        {R"({"a":1,"a":2})", R"({"a":2})"},
        {"[1] // behind", "[1]"},
        {"[NaN,-Infinity]", "[NaN,-Infinity]"},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(c.szText);
        EXPECT_EQ(c.szMember, text(leftByReader(c.szText)));
        const Json::Value jRow = readBack(c.szText);
        EXPECT_TRUE(jRow.isMember("a"));
        EXPECT_EQ(c.szMember, text(jRow["a"]));
        EXPECT_EQ(R"({"k":1})", text(jRow["o"]));
        EXPECT_EQ(Lines(), takeLog());
    }
}

}  // namespace
