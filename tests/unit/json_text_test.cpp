// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// JSON values as text: how they are stored, read back and logged.

#include "support/database.h"

#include <dlfcn.h>
#include <atomic>
#include <thread>
#include <utility>

namespace {

std::atomic<int> nReaders{0};

}  // namespace

// Counts jsoncpp's readers.
Json::CharReader* Json::CharReaderBuilder::newCharReader() const
{
    using Function = Json::CharReader*(const Json::CharReaderBuilder*);
    static auto* const real = reinterpret_cast<Function*>(
        dlsym(RTLD_NEXT, "_ZNK4Json17CharReaderBuilder13newCharReaderEv"));
    ++nReaders;
    return real(this);
}

namespace {

class JsonText : public TableTest {
protected:
    // How the record is stored; it is read back as it was.
    std::vector<std::string> stored(const std::string& strObject)
    {
        const std::string strRecord = R"({"a":[],"o":)" + strObject + "}";
        EXPECT_EQ(text(json(strRecord)), text(table_.create(strRecord)));
        return database_.rows("select * from " + table_.strName + " order by rowid desc").at(0);
    }

    // The record of a row with these texts.
    Json::Value readBack(const std::string& strArray, const std::string& strObject)
    {
        database_.run("delete from " + table_.strName + "; insert into " + table_.strName +
                      " values ('" + strArray + "','" + strObject + "')");
        Json::Value jRequest;
        Json::Value jRecord;
        EXPECT_EQ(1, table_.api.recGetOne(jRequest, jRecord));
        EXPECT_EQ(Lines(), takeLog());
        return jRecord;
    }

    Table table_{database_,
                 R"({"a":{"cpptype":"Json::arrayValue"},"o":{"cpptype":"Json::objectValue"}})",
                 "a text, o text"};
};

TEST_F(JsonText, IsOneCompactLine)
{
    const std::pair<const char*, const char*> cases[] = {
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
        {R"({"k":[-9223372036854775808,18446744073709551615]})",
         R"({"k":[-9223372036854775808,18446744073709551615]})"},
        {R"({"k":0.1})", R"({"k":0.10000000000000001})"},
        {R"({"k":[NaN,Infinity,-Infinity]})", R"({"k":[NaN,Infinity,-Infinity]})"},
    };
    for (const auto& [szObject, szText] : cases)
        EXPECT_EQ((std::vector<std::string>{"[]", szText}), stored(szObject)) << szObject;
    // Numbers are read back exactly.
    for (const char* szNumber :
         {"0.3333333333333333", "2.5", "-0.0", "-273.15", "1e-300", "5e-324", "1e15", "1e300",
          "123456789.123456789", "1.7976931348623157e308", "1.0000000000000002"})
        stored(std::string(R"({"k":)") + szNumber + "}");
    EXPECT_EQ(Lines(), takeLog());
}

TEST_F(JsonText, LeavesOutTheHostsComments)
{
    Json::Value jRecord = json(R"({"a":[1,2],"o":{"k":1}})");
    const std::string strComment = "// a comment";
    jRecord["a"][0].setComment(strComment, Json::commentBefore);
    jRecord["a"].setComment(strComment, Json::commentAfter);
    jRecord["o"]["k"].setComment(strComment, Json::commentAfterOnSameLine);
    Json::Value jOut;
    EXPECT_EQ(0, table_.api.recCreate(jRecord, jOut));
    EXPECT_EQ((Rows{{"[1,2]", R"({"k":1})"}}), database_.rows("select * from " + table_.strName));
    jRecord["o"] = 5;
    EXPECT_EQ(-1, table_.api.recCreate(jRecord, jOut));
    EXPECT_EQ(plain(R"(call create rec, rec={"a":[1,2],"o":5})"), takeLog().back());
}

TEST_F(JsonText, IsReadWithoutItsComments)
{
    const Json::Value jRecord = readBack("/* a */[/* b */1, 2 // c\n]", "{\"k\":/* d */1} // e");
    EXPECT_EQ(R"({"a":[1,2],"o":{"k":1}})", text(jRecord));
    for (const Json::Value* pjValue :
         {&jRecord["a"], &jRecord["a"][0], &jRecord["a"][1], &jRecord["o"], &jRecord["o"]["k"]})
        for (auto place : {Json::commentBefore, Json::commentAfterOnSameLine, Json::commentAfter})
            EXPECT_FALSE(pjValue->hasComment(place)) << text(*pjValue) << ' ' << place;
}

// A thread has a reader of jsoncpp's once it has read a text that needs one.
TEST_F(JsonText, IsReadWithoutJsoncppIfItIsUsual)
{
    const auto readers = [this](const std::string& strArray) {
        const int nBefore = nReaders;
        std::thread([&] { readBack(strArray, " {\t\"k\"\n:\r1 , \"l\" : { } } "); }).join();
        return nReaders - nBefore;
    };
    for (const char* szText : {
             "[]",
             "[ 1 , 2 ]",
             "[0,-0,-9223372036854775808,9223372036854775807]",
             "[9223372036854775808,18446744073709551615]",
             "[true,false,null]",
             R"([["x"],{"":[]}])",
             R"(["\"\\\/\b\f\n\r\t\u00e9\ud83d\udE00\u0000"])",
             R"([{"a":{"b":1}},{"a":{"b":2}}])",
#ifdef __cpp_lib_to_chars
             "[0.5,-1.25e+3,1E5,2e-7]",
#endif
         })
        EXPECT_EQ(0, readers(szText)) << szText;
    EXPECT_EQ(0, readers(std::string(199, '[') + std::string(199, ']')));
    EXPECT_EQ(1, readers("[/**/]"));
}

// Names are shared by all values, but only so many short ones, and objects that begin alike are
// expected to be alike.
TEST_F(JsonText, IsReadWhateverItsNames)
{
    const std::string strLong(33, 'n');
    std::string strArray = "[";
    for (int i = 0; i < 2000; ++i) {
        const std::string strName = std::to_string(i);
        strArray += R"({"a)" + strName + R"(":1,"b":{"c)" + strName + R"(":2},")" + strLong +
                    R"(":{"d":1}},{"z":1,"y":2,"e\u0000)" + strName + R"(":3},{"f":1,"g)" +
                    std::to_string(i % 3) + R"(":2},)";
    }
    strArray.back() = ']';
    EXPECT_EQ(leftByReader(strArray), readBack(strArray, "{}")["a"]);
}

TEST_F(JsonText, IsTheSameInTheLog)
{
    Json::Value jRecord = json(R"({"b":"ž\n","a":[0.1,NaN,{"k":"%s%n"}]})");
    blDebugOutput = true;
    EXPECT_EQ(-1, table_.api.fillDefaultValue(jRecord, true));
    EXPECT_EQ((Lines{error("lost data member=o"),
                     plain(R"(jParam={"a":[0.10000000000000001,NaN,{"k":"%s%n"}],"b":"ž\n"})")}),
              takeLog());
}

TEST_F(JsonText, IsReadAsFarAsTheReaderUnderstandsIt)
{
    const auto expectRead = [this](const std::string& strText, const std::string& strMember) {
        EXPECT_EQ(R"({"a":)" + strMember + R"(,"o":{"k":1}})",
                  text(readBack(strText, R"({"k":1})")))
            << strText.substr(0, 20);
    };
    const auto nested = [](std::size_t nLevels) {
        return std::string(nLevels, '[') + std::string(nLevels, ']');
    };
    for (const std::string& strText : std::vector<std::string>{
             "", "x", "tru", R"("open)", "\xff\xfe", nested(1001), nested(100000)})
        expectRead(strText, "null");
    for (const std::string& strText :
         std::vector<std::string>{nested(1000), "5", "null", R"("x")", "[NaN,-Infinity]"})
        expectRead(strText, strText);
    for (const char* szText : {"[1] x", "[1]]", " [ 1 ] ", "[1] // after"})
        expectRead(szText, "[1]");
    expectRead("[1,", "[1,null]");
    expectRead(R"({"k":1)", R"({"k":1})");
    expectRead(R"({"a":1,"a":2})", R"({"a":2})");
}

}  // namespace
