// SPDX-License-Identifier: MIT
// What the guard lets through, and what it reads.

#include "examples/guarded/guard.h"
#include "world.h"

#include <sstream>

namespace {

using Guard = HostTest;

// The reason for refusing a line; empty when it is not refused.
std::string refusal(const std::string& strLine)
{
    try {
        Json::Value jCommand = guard::readCommand(strLine);
        guard::checkCommand(noteTypes(), jCommand);
    } catch (const guard::Refused& refused) {
        return refused.what();
    }
    return std::string();
}

TEST_F(Guard, LetsThroughWhatTheTableCanHold)
{
    for (
        const char* szLine : {
            R"({"op":"create","record":{"author":"Zoë O'Brien","done":true}})",
            R"({"op":"create","record":{"text":"","topics":[]}})",
            R"({"op":"save","record":{"id":-9223372036854775808,"text":""}})",
            R"({"op":"save","record":{"id":9223372036854775807,"topics":["a",1,1.5,null,{"k":[true]}],"text":"\"x\";--"}})",
            R"({"op":"list","request":{}})",
            R"({"op":"list","request":{"author":"Ann","done":false,"id":[5],"text":["x"]}})",
            R"({"op":"list","request":{"author":"Ann","topics":[["a"]],"limit":100}})",
            R"({"op":"list","request":{"id":3000000000,"offset":2147483647}})",
            R"({"op":"list","request":{"author":"Ann","sort_by":"text","sort_direction":"asc"}})",
            R"({"op":"list","request":{"id":1,"sort_by":"id","limit":0}})",
            R"({"op":"get","request":{"id":1}})",
            R"({"op":"update","request":{"id":1},"values":{"text":"x"}})",
            R"({"op":"delete","request":{"id":1}})",
        })
        EXPECT_EQ("", refusal(szLine)) << szLine;
}

TEST_F(Guard, RefusesWithAReason)
{
    const std::string strText = "\"%\" and control characters are not allowed";
    const std::string strKind = "a member has a value of another kind";
    const std::string strOne = "the request names one record by its id";
    const std::string strPage = "\"limit\" and \"offset\" are whole numbers";
    const std::string strIndex = "a list asks for an id or an author";
    const struct {
        const char* szLine;
        std::string strReason;
    } cases[] = {
        {"", "the command is no JSON object"},
        {"[]", "the command is no JSON object"},
        {R"({"op":"list","request":{}} {})", "the command is no JSON object"},
        {R"({"op":"list","request":{},"request":{}})", "the command is no JSON object"},
        {R"({"op":7,"request":{}})", "there is no such operation"},
        {R"({"op":{},"request":{}})", "there is no such operation"},
        {R"({"op":"get","request":{"id":1},"values":{}})", "the command holds a request"},
        {R"({"op":"drop","request":{}})", "there is no such operation"},
        {R"({"op":"list"})", "the command holds a request"},
        {R"({"op":"list","request":{},"record":{}})", "the command holds a request"},
        {R"({"op":"create","request":{}})", "the command holds a record"},
        {R"({"op":"update","request":{"id":1}})", "the command holds a request and values"},
        {R"({"op":"list","request":null})", "a request is an object"},
        {R"({"op":"create","record":{}})", "a record is an object with members"},
        {R"({"op":"create","record":[1]})", "a record is an object with members"},
        {R"({"op":"create","record":{"ID":1}})", "there is no such member"},
        {R"({"op":"update","request":{"id":1},"values":{"vornSqlWhereFilter":"1"}})",
         "there is no such member"},
        {R"({"op":"list","request":{"vornSqlWhereFilter":"1"}})", "SQL is not taken"},
        {R"({"op":"create","record":{"author":"50%"}})", strText},
        {R"({"op":"create","record":{"author":"a\u0000"}})", strText},
        {R"({"op":"create","record":{"author":"a\nb"}})", strText},
        {R"({"op":"create","record":{"author":"a\u007f"}})", strText},
        {R"({"op":"create","record":{"topics":[[{"k":"%"}]]}})", strText},
        {R"({"op":"create","record":{"topics":[{"%s":1}]}})", strText},
        {R"({"op":"list","request":{"author":["%"]}})", strText},
        {R"({"op":"create","record":{"author":5}})", strKind},
        {R"({"op":"create","record":{"author":null}})", strKind},
        {R"({"op":"create","record":{"done":1}})", strKind},
        {R"({"op":"create","record":{"id":"1"}})", strKind},
        {R"({"op":"create","record":{"id":1.0}})", strKind},
        {R"({"op":"save","record":{"id":9223372036854775808}})", strKind},
        {R"({"op":"create","record":{"topics":{}}})", strKind},
        {R"({"op":"list","request":{"topics":["a"]}})", strKind},
        {R"({"op":"list","request":{"id":[]}})", "a list has one item"},
        {R"({"op":"list","request":{"id":[1,2]}})", "a list has one item"},
        {R"({"op":"list","request":{"sort_by":"ID"}})", "\"sort_by\" is the name of a member"},
        {R"({"op":"list","request":{"sort_by":["id"]}})", "\"sort_by\" is the name of a member"},
        {R"({"op":"list","request":{"sort_direction":"DESC"}})",
         "\"sort_direction\" is \"asc\" or \"desc\""},
        {R"({"op":"list","request":{"limit":-1}})", strPage},
        {R"({"op":"list","request":{"limit":"1"}})", strPage},
        {R"({"op":"list","request":{"limit":1.5}})", strPage},
        {R"({"op":"list","request":{"limit":1.0}})", strPage},
        {R"({"op":"list","request":{"limit":[1]}})", strPage},
        {R"({"op":"list","request":{"offset":2147483648}})", strPage},
        {R"({"op":"list","request":{"limit":101}})", "\"limit\" is too large"},
        {R"({"op":"get","request":{"id":"1"}})", strKind},
        {R"({"op":"get","request":{"id":[1]}})", strOne},
        {R"({"op":"get","request":{"id":1,"limit":1}})", strOne},
        {R"({"op":"get","request":{"text":"x"}})", strOne},
        {R"({"op":"delete","request":{}})", strOne},
        {R"({"op":"delete","request":{"id":1,"text":"x"}})", strOne},
        {R"({"op":"update","request":{"done":true},"values":{"done":true}})", strOne},
        {R"({"op":"create","record":{"id":7}})", "\"id\" cannot be set"},
        {R"({"op":"update","request":{"id":1},"values":{"id":1}})", "\"id\" cannot be set"},
        {R"({"op":"update","request":{"id":1},"values":{"author":"Ann"}})",
         "\"author\" cannot be set"},
        {R"({"op":"list","request":{"done":false}})", strIndex},
        {R"({"op":"list","request":{"text":["x"],"limit":1}})", strIndex},
        {R"({"op":"list","request":{"topics":[["a"]]}})", strIndex},
        {R"({"op":"list","request":{"sort_by":"id"}})", strIndex},
    };
    for (const auto& row : cases) EXPECT_EQ(row.strReason, refusal(row.szLine)) << row.szLine;
}

std::string refusalOfText(const std::string& strText)
{
    return refusal(R"({"op":"list","request":{"author":")" + strText + "\"}}");
}

// The neighbours of what is refused are not.
TEST_F(Guard, RefusesControlCharacters)
{
    const std::string strControl = "\"%\" and control characters are not allowed";
    const struct {
        const char* szBefore;
        std::vector<const char*> refused;
        const char* szAfter;
    } cases[] = {
        {R"(\u007e)",
         {R"(\u007f)", R"(\u0080)", R"(\u0085)", R"(\u009b)", R"(\u009f)"},
         R"(\u00a0)"},
        {R"(\u061b)", {R"(\u061c)"}, R"(\u061d)"},
        {R"(\u200d)", {R"(\u200e)", R"(\u200f)"}, R"(\u2010)"},
        {R"(\u2027)",
         {R"(\u2028)", R"(\u2029)", R"(\u202a)", R"(\u202b)", R"(\u202c)", R"(\u202d)",
          R"(\u202e)"},
         R"(\u202f)"},
        {R"(\u2065)", {R"(\u2066)", R"(\u2067)", R"(\u2068)", R"(\u2069)"}, R"(\u206a)"},
    };
    for (const auto& row : cases) {
        EXPECT_EQ("", refusalOfText(row.szBefore)) << row.szBefore;
        EXPECT_EQ("", refusalOfText(row.szAfter)) << row.szAfter;
        for (const char* szText : row.refused)
            EXPECT_EQ(strControl, refusalOfText(szText)) << szText;
    }
    for (char c = 0x01; c < 0x20; ++c) EXPECT_NE("", refusalOfText(std::string(1, c)));
    EXPECT_EQ(strControl, refusalOfText("\xc2\x9b")) << "unescaped";
}

TEST_F(Guard, RefusesWhatIsNotUtf8)
{
    for (const char* szText : {
             "\x80",
             "\x85\x80",  // begins in the middle
             "\xc3",      // ends there
             "\xc3(",     // goes on with something else
             "\xe2\x82",
             "\xe2\x82(",
             "\xf0\x9f\x98",
             "\xf0\x9f\x98(",
             "\xc1\xbf",          // too long for U+007F,
             "\xe0\x9f\xbf",      // U+07FF
             "\xf0\x8f\xbf\xbf",  // and U+FFFF
             "\xed\xa0\x80",      // the first surrogate
             "\xed\xbf\xbf",      // and the last
             R"(\udc00)",
             "\xf4\x90\x80\x80",  // beyond U+10FFFF
             "\xf8\x88\x80\x80\x80",
             "\xf8\xb0\x80\x80",
             "\xfe",
             "\xff",
         })
        EXPECT_EQ("a text is not UTF-8", refusalOfText(szText)) << testing::PrintToString(szText);
    for (const char* szText :
         {"\xc2\xa0", "\xdf\xbf", "\xe0\xa0\x80", "\xed\x9f\xbf", "\xee\x80\x80", "\xef\xbf\xbf",
          "\xf0\x90\x80\x80", "\xf4\x8f\xbf\xbf", R"(\ud83d\ude00)"})
        EXPECT_EQ("", refusalOfText(szText)) << testing::PrintToString(szText);
}

// A table of somebody else's has other words.
TEST_F(Guard, KnowsTheOtherWords)
{
    const Json::Value jTypes = json(
        R"({"n":{"cpptype":"int"},"o":{"cpptype":"Json::objectValue"},"x":{"cpptype":"double"}})");
    const auto isTaken = [&jTypes](const char* szRecord) {
        Json::Value jCommand = json(std::string(R"({"op":"create","record":)") + szRecord + "}");
        try {
            guard::checkCommand(jTypes, jCommand);
        } catch (const guard::Refused&) {
            return false;
        }
        return true;
    };
    for (const char* szRecord : {R"({"n":-2147483648})", R"({"n":2147483647})", R"({"o":{}})"})
        EXPECT_TRUE(isTaken(szRecord)) << szRecord;
    for (const char* szRecord : {R"({"n":2147483648})", R"({"n":-2147483649})", R"({"n":1.0})",
                                 R"({"o":[]})", R"({"x":1})"})
        EXPECT_FALSE(isTaken(szRecord)) << szRecord;
}

TEST_F(Guard, LimitsTheRowsOfAList)
{
    Json::Value jCommand = json(R"({"op":"list","request":{}})");
    guard::checkCommand(noteTypes(), jCommand);
    EXPECT_EQ(R"({"op":"list","request":{"limit":100}})", text(jCommand));
    jCommand = json(R"({"op":"list","request":{"limit":7}})");
    guard::checkCommand(noteTypes(), jCommand);
    EXPECT_EQ(R"({"op":"list","request":{"limit":7}})", text(jCommand));
}

TEST_F(Guard, CountsLevels)
{
    const auto nested = [](int iLevels) {
        // The command and its record are two of them.
        const auto n = static_cast<std::size_t>(iLevels) - 2;
        return R"({"op":"create","record":{"topics":)" + std::string(n, '[') + std::string(n, ']') +
               "}}";
    };
    EXPECT_EQ("", refusal(nested(guard::kMaxDepth)));
    EXPECT_EQ("the command is nested too deep", refusal(nested(guard::kMaxDepth + 1)));

    // What is let through comes back.
    World world(World::Layers::kBoth);
    world.send(nested(guard::kMaxDepth));
    EXPECT_EQ(0, world.answers.at(0)["result"].asInt());
    EXPECT_FALSE(world.answers.at(0)["record"]["topics"].isNull());
}

TEST_F(Guard, CountsValues)
{
    const auto holding = [](std::size_t nValues) {
        // The command, its operation, the record and its array are four of them.
        std::string strItems = "{\"k\":[]}";
        for (std::size_t n = 6; n < nValues; ++n) strItems += ",0";
        return R"({"op":"create","record":{"topics":[)" + strItems + "]}}";
    };
    EXPECT_EQ("", refusal(holding(guard::kMaxValues)));
    EXPECT_EQ("the command holds too many values", refusal(holding(guard::kMaxValues + 1)));
}

// A default of the wrong kind, which is the host's own mistake.
TEST_F(Guard, IsNotAskedAboutDefaults)
{
    World world(World::Layers::kBoth);
    Json::Value jNone;
    std::string strTable = "note";
    Json::Value& jDefault = VORN_JSON_DB::recType(jNone, strTable)["done"]["cppDefaultValue"];
    jDefault = "no";
    const std::string strLine = R"({"op":"save","record":{"id":1,"author":"Ann"}})";
    world.send(strLine);
    jDefault = false;
    EXPECT_EQ(R"({"error":"failed"})", text(world.answers.at(0)));
    world.send(strLine);
    EXPECT_EQ(0, world.answers.at(1)["result"].asInt());
}

TEST_F(Guard, ReadsLineByLine)
{
    std::istringstream stream("one\n\n" + std::string(guard::kMaxLine, 'x') + "\n" +
                              std::string(3 * guard::kMaxLine, 'y') + "\nlast");
    std::string strLine;
    EXPECT_TRUE(guard::readLine(stream, strLine));
    EXPECT_EQ("one", strLine);
    EXPECT_TRUE(guard::readLine(stream, strLine));
    EXPECT_EQ("", strLine);
    EXPECT_TRUE(guard::readLine(stream, strLine));
    EXPECT_EQ(std::string(guard::kMaxLine, 'x'), strLine);
    EXPECT_EQ("the command is no JSON object", refusal(strLine));
    EXPECT_TRUE(guard::readLine(stream, strLine));
    EXPECT_EQ(std::string(guard::kMaxLine + 1, 'y'), strLine);
    EXPECT_EQ("the command is too long", refusal(strLine));
    EXPECT_TRUE(guard::readLine(stream, strLine));
    EXPECT_EQ("last", strLine);
    EXPECT_FALSE(guard::readLine(stream, strLine));
    EXPECT_FALSE(guard::readLine(stream, strLine));
}

}  // namespace
