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
    for (const char* szLine : {
             R"({"op":"create","record":{"author":"Zoë O'Brien","done":true,"id":-2147483648}})",
             R"({"op":"create","record":{"id":2147483647,"text":"","topics":[]}})",
             R"({"op":"save","record":{"topics":["a",1,1.5,null,{"k":[true]}],"text":"\"x\";--"}})",
             R"({"op":"list","request":{}})",
             R"({"op":"list","request":{"author":"Ann","done":false,"id":[5],"text":["x"]}})",
             R"({"op":"list","request":{"topics":[["a"]],"limit":100,"offset":2147483647}})",
             R"({"op":"list","request":{"sort_by":"text","sort_direction":"asc","limit":0}})",
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
        {R"({"op":"create","record":{"id":2147483648}})", strKind},
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
    };
    for (const auto& row : cases) EXPECT_EQ(row.strReason, refusal(row.szLine)) << row.szLine;
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

// A default of the wrong kind, which is the host's own mistake.
TEST_F(Guard, IsNotAskedAboutDefaults)
{
    World world(World::Layers::kBoth);
    Json::Value jNone;
    std::string strTable = "note";
    Json::Value& jDefault = VORN_JSON_DB::recType(jNone, strTable)["done"]["cppDefaultValue"];
    jDefault = "no";
    const std::string strLine = R"({"op":"save","record":{"id":7}})";
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
