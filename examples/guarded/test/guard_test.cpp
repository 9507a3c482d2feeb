// SPDX-License-Identifier: MIT
// What the guard lets through, and what it reads.

#include "examples/guarded/guard.h"
#include "world.h"

#include <sstream>

namespace {

using Guard = HostTest;

constexpr char kText[] = "\"%\" and control characters are not allowed";

// The reason for refusing a line; empty when it is not refused.
std::string refusal(const std::string& strLine, const Json::Value& jTypes = noteTypes())
{
    try {
        Json::Value jCommand = guard::readCommand(strLine);
        guard::checkCommand(jTypes, jCommand);
    } catch (const guard::Refused& refused) {
        return refused.what();
    }
    return std::string();
}

// The same for a text in quotes.
std::string refusalOfText(const std::string& strText)
{
    return refusal(list(R"({"author":")" + strText + "\"}"));
}

// Those without a reason are let through.
TEST_F(Guard, RefusesWithAReason)
{
    const std::pair<const char*, std::vector<std::string>> cases[] = {
        {"",
         {create(R"({"author":"Zoë O'Brien","done":true})"), create(R"({"text":"","topics":[]})"),
          save(R"({"id":-9223372036854775808,"text":""})"),
          save(
              R"({"id":9223372036854775807,"topics":["a",1,1.5,null,{"k":[true]}],"text":"\"x\";--"})"),
          list("{}"), list(R"({"author":"Ann","done":false,"id":[5],"text":["x"]})"),
          list(R"({"author":"Ann","topics":[["a"]],"limit":100})"),
          list(R"({"id":3000000000,"offset":2147483647})"),
          list(R"({"author":"Ann","sort_by":"text","sort_direction":"asc"})"),
          list(R"({"id":1,"sort_by":"id","limit":0})"), get(R"({"id":1})"),
          update(R"({"id":1})", R"({"text":"x"})"), erase(R"({"id":1})")}},
        {"the command is not a JSON object",
         {"", "[]", list("{}") + " {}", R"({"op":"list","request":{},"request":{}})"}},
        {"there is no such operation",
         {R"({"op":7,"request":{}})", R"({"op":{},"request":{}})", Command{"drop"}("{}")}},
        {"the command holds a request",
         {get(R"({"id":1},"values":{})"), R"({"op":"list"})", list(R"({},"record":{})")}},
        {"the command holds a record", {R"({"op":"create","request":{}})"}},
        {"the command holds a request and values", {update(R"({"id":1})")}},
        {"a request is an object", {list("null")}},
        {"a record is an object with members", {create("{}"), create("[1]")}},
        {"there is no such member",
         {create(R"({"ID":1})"), update(R"({"id":1})", R"({"vornSqlWhereFilter":"1"})")}},
        {"SQL is not taken", {list(R"({"vornSqlWhereFilter":"1"})")}},
        {kText,
         {create(R"({"author":"50%"})"), create(R"({"author":"a\u0000"})"),
          create(R"({"author":"a\nb"})"), create(R"({"author":"a\u007f"})"),
          create(R"({"topics":[[{"k":"%"}]]})"), create(R"({"topics":[{"%s":1}]})"),
          list(R"({"author":["%"]})")}},
        {"a member has a value of another kind",
         {create(R"({"author":5})"), create(R"({"author":null})"), create(R"({"done":1})"),
          create(R"({"id":"1"})"), create(R"({"id":1.0})"), save(R"({"id":9223372036854775808})"),
          create(R"({"topics":{}})"), list(R"({"topics":["a"]})"), get(R"({"id":"1"})")}},
        {"a list has one item", {list(R"({"id":[]})"), list(R"({"id":[1,2]})")}},
        {"\"sort_by\" is the name of a member",
         {list(R"({"sort_by":"ID"})"), list(R"({"sort_by":["id"]})")}},
        {"\"sort_direction\" is \"asc\" or \"desc\"", {list(R"({"sort_direction":"DESC"})")}},
        {"\"limit\" and \"offset\" are whole numbers",
         {list(R"({"limit":-1})"), list(R"({"limit":"1"})"), list(R"({"limit":1.5})"),
          list(R"({"limit":1.0})"), list(R"({"limit":[1]})"), list(R"({"offset":2147483648})")}},
        {"\"limit\" is too large", {list(R"({"limit":101})")}},
        {"the request names one record by its id",
         {get(R"({"id":[1]})"), get(R"({"id":1,"limit":1})"), get(R"({"text":"x"})"), erase("{}"),
          erase(R"({"id":1,"text":"x"})"), update(R"({"done":true})", R"({"done":true})")}},
        {"\"id\" cannot be set", {create(R"({"id":7})"), update(R"({"id":1})", R"({"id":1})")}},
        {"\"author\" cannot be set", {update(R"({"id":1})", R"({"author":"Ann"})")}},
        {"a list asks for an id or an author",
         {list(R"({"done":false})"), list(R"({"text":["x"],"limit":1})"),
          list(R"({"topics":[["a"]]})"), list(R"({"sort_by":"id"})")}},
    };
    for (const auto& [szReason, lines] : cases)
        for (const std::string& strLine : lines) EXPECT_EQ(szReason, refusal(strLine)) << strLine;
}

TEST_F(Guard, RefusesControlCharacters)
{
    const std::pair<int, int> refused[] = {{0, 0x1f},       {'%', '%'},       {0x7f, 0x9f},
                                           {0x61c, 0x61c},  {0x200e, 0x200f}, {0x2028, 0x202e},
                                           {0x2066, 0x2069}};
    for (int i = 0; i < 0x2100; ++i) {
        bool blRefused = false;
        for (const auto& [iFirst, iLast] : refused)
            blRefused = blRefused || (iFirst <= i && i <= iLast);
        char szText[8];
        snprintf(szText, sizeof szText, "\\u%04x", static_cast<unsigned>(i));
        EXPECT_EQ(blRefused ? kText : "", refusalOfText(szText)) << szText;
    }
    for (char c = 0x01; c < 0x20; ++c) EXPECT_NE("", refusalOfText(std::string(1, c)));
    EXPECT_EQ(kText, refusalOfText("\xc2\x9b")) << "unescaped";
}

// The second list has the neighbours of what is refused.
TEST_F(Guard, RefusesInvalidUtf8)
{
    for (const char* szText :
         {// Begins in the middle, ends too early, or goes on with something else.
          "\x80", "\x85\x80", "\xc3", "\xc3(", "\xe2\x82", "\xe2\x82(", "\xf0\x9f\x98",
          "\xf0\x9f\x98(",
          // Too long for U+007F, U+07FF and U+FFFF; surrogates; beyond U+10FFFF.
          "\xc1\xbf", "\xe0\x9f\xbf", "\xf0\x8f\xbf\xbf", "\xed\xa0\x80", "\xed\xbf\xbf",
          R"(\udc00)", "\xf4\x90\x80\x80", "\xf8\x88\x80\x80\x80", "\xf8\xb0\x80\x80", "\xfe",
          "\xff"})
        EXPECT_EQ("a text is not UTF-8", refusalOfText(szText)) << testing::PrintToString(szText);
    for (const char* szText :
         {"\xc2\xa0", "\xdf\xbf", "\xe0\xa0\x80", "\xed\x9f\xbf", "\xee\x80\x80", "\xef\xbf\xbf",
          "\xf0\x90\x80\x80", "\xf4\x8f\xbf\xbf", R"(\ud83d\ude00)"})
        EXPECT_EQ("", refusalOfText(szText)) << testing::PrintToString(szText);
}

// Another table may have other words.
TEST_F(Guard, KnowsTheOtherTypeWords)
{
    const Json::Value jTypes = json(
        R"({"n":{"cpptype":"int"},"o":{"cpptype":"Json::objectValue"},"x":{"cpptype":"double"}})");
    for (const char* szRecord : {R"({"n":-2147483648})", R"({"n":2147483647})", R"({"o":{}})"})
        EXPECT_EQ("", refusal(create(szRecord), jTypes)) << szRecord;
    for (const char* szRecord : {R"({"n":2147483648})", R"({"n":-2147483649})", R"({"n":1.0})",
                                 R"({"o":[]})", R"({"x":1})"})
        EXPECT_NE("", refusal(create(szRecord), jTypes)) << szRecord;
}

// The command and its record are two levels.
TEST_F(Guard, CountsLevels)
{
    const auto nested = [](std::size_t n) {
        return create(R"({"topics":)" + std::string(n - 2, '[') + std::string(n - 2, ']') + "}");
    };
    EXPECT_EQ("the command is nested too deep", refusal(nested(guard::kMaxDepth + 1)));
    // What is let through comes back.
    World world(World::Layers::kBoth);
    world.send(nested(guard::kMaxDepth));
    EXPECT_EQ(0, world.answers.at(0)["result"].asInt());
    EXPECT_FALSE(world.answers.at(0)["record"]["topics"].isNull());
}

// The command, its operation, the record, its array, and two in that are six values.
TEST_F(Guard, CountsValues)
{
    const auto holding = [](unsigned uValues) {
        return create(R"({"topics":[{"k":[]})" + repeated(uValues - 6, ",0") + "]}");
    };
    EXPECT_EQ("", refusal(holding(guard::kMaxValues)));
    EXPECT_EQ("the command holds too many values", refusal(holding(guard::kMaxValues + 1)));
}

// A default of the wrong kind, which is the host's own mistake.
TEST_F(Guard, DoesNotCheckDefaults)
{
    World world(World::Layers::kBoth);
    Json::Value jNone;
    std::string strTable = "note";
    Json::Value& jDefault = VORN_JSON_DB::recType(jNone, strTable)["done"]["cppDefaultValue"];
    jDefault = "no";
    const std::string strLine = save(R"({"id":1,"author":"Ann"})");
    world.send(strLine);
    jDefault = false;
    EXPECT_EQ(R"({"error":"failed"})", text(world.answers.at(0)));
    world.send(strLine);
    EXPECT_EQ(0, world.answers.at(1)["result"].asInt());
}

TEST_F(Guard, ReadsLineByLine)
{
    const std::string strLongest(guard::kMaxLine, 'x');
    std::istringstream stream("one\n\n" + strLongest + "\n" + strLongest + strLongest + "\nlast");
    std::string strLine;
    for (const std::string& strExpected :
         {std::string("one"), std::string(), strLongest, strLongest + "x", std::string("last")}) {
        EXPECT_TRUE(guard::readLine(stream, strLine));
        EXPECT_EQ(strExpected, strLine);
    }
    for (int i = 0; i < 2; ++i) EXPECT_FALSE(guard::readLine(stream, strLine));
    EXPECT_EQ("the command is not a JSON object", refusal(strLongest));
    EXPECT_EQ("the command is too long", refusal(strLongest + "x"));
}

}  // namespace
