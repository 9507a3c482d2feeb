// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// The rules of the host itself, and what one user leaves to the others: their notes, their time and
// the memory of the host.

#include "world.h"

#include <sstream>

namespace {

constexpr char kFailed[] = R"({"error":"failed"})";
const std::string kOne = R"({"id":1})";

// A stream that has room for a line, and allocates nothing.
struct Line : std::ostringstream {
    Line() : std::ostringstream(std::string(64 * 1024, ' ')) {}
    std::string text() { return str().substr(0, static_cast<std::size_t>(tellp())); }
};

class GuardedHost : public HostTest {
protected:
    void fill(const std::string& strAuthor, int iNotes)
    {
        database_.run(
            "with recursive n(i) as (select 1 union all select i + 1 from n) "
            "insert into note (author,body,done,topics) select '" +
            strAuthor + "','',0,'[]' from n limit " + std::to_string(iNotes));
    }

    Json::Value answer(const std::string& strLine) { return ann_.answer(strLine); }
    std::string refusal(const std::string& strLine)
    {
        return answer(strLine)["refused"].asString();
    }
    int result(const std::string& strLine) { return answer(strLine).get("result", -1).asInt(); }
    // As the program writes it.
    std::string served(const std::string& strLine)
    {
        Line line;
        ann_.serve(strLine, line);
        return line.text();
    }

    Database database_;
    Host ann_{database_.get(), "Ann"};
    Host eve_{database_.get(), "Eve"};
};

TEST_F(GuardedHost, RefusesWithAReason)
{
    EXPECT_EQ(0, result(create("{}")));
    const std::pair<const char*, std::vector<std::string>> cases[] = {
        {"the command is not a JSON object",
         {"", "[]", get(kOne) + " {}", R"({"op":"get","op":"get"})"}},
        {"the command is too long", {std::string(kMaxLine + 1, ' ')}},
        {"there is no such operation", {R"({"op":7})", R"({"op":{}})", Command{"drop"}("{}")}},
        {"the command has other members",
         {R"({"op":"delete"})", R"({"op":"list","condition":{}})", get(R"({},"values":{})"),
          R"({"op":"create","condition":{}})"}},
        {"the record is not an object", {create("[]"), save("7")}},
        {"the condition is not an object", {get("null"), list(R"("id")")}},
        {"the options is not an object", {list("{}", "[]")}},
        {"a condition in a list is empty", {get("{}"), erase("{}"), update("{}", "{}")}},
        {"there are no values to set", {update(kOne, "{}")}},
        {"there is no such note", {save("{}"), save(R"({"id":2})"), save(R"({"id":null})")}},
        {"\"author\" cannot be set",
         {create(R"({"author":"Ann"})"), save(R"({"id":1,"author":"Ann"})"),
          update(kOne, R"({"author":"Eve"})")}},
        {"\"id\" cannot be set", {create(R"({"id":null})"), update(kOne, kOne)}},
        {"the patterns are too long",
         {list(R"({"$or":[{"title":{"$like":"%1234567890%"}},{"id":{"$ne":7},"body":{"$like":)"
               R"("%123456789012345678"}}]})")}},
        {"the request has more than 200 values",
         {list(R"({"id":{"$in":[1)" + repeated(198, ",1") + "]}}")}},
    };
    for (const auto& [szReason, lines] : cases)
        for (const std::string& strLine : lines) EXPECT_EQ(szReason, refusal(strLine)) << strLine;
}

TEST_F(GuardedHost, ReachesOnlyTheNotesOfTheAuthor)
{
    EXPECT_EQ(0, result(create(R"({"title":"Ann's"})")));
    const std::string strBefore = text(answer(get(kOne)));
    for (const char* szCondition :
         {"{}", R"({"id":1})", R"({"id":{"$ne":7}})", R"({"author":"Ann"})",
          R"({"author":{"$ne":"Eve"}})", R"({"$or":[{"id":1},{"author":"Ann"}]})"}) {
        SCOPED_TRACE(szCondition);
        EXPECT_EQ(0U, eve_.answer(list(szCondition))["records"].size());
        EXPECT_TRUE(eve_.answer(get(szCondition))["record"].isNull());
        EXPECT_FALSE(eve_.answer(update(szCondition, R"({"body":"x"})"))["result"].asBool());
        EXPECT_FALSE(eve_.answer(erase(szCondition))["result"].asBool());
    }
    EXPECT_EQ(strBefore, text(answer(get(kOne))));
}

TEST_F(GuardedHost, GivesEachAuthorAQuota)
{
    fill("Eve", kMaxNotes);
    fill("Ann", kMaxNotes - 1);
    const std::string strLast = text(answer(create("{}"))["record"]["id"]);
    EXPECT_EQ("there are too many notes", refusal(create("{}")));
    EXPECT_EQ(0, result(save(R"({"body":"x","id":)" + strLast + "}")));
    EXPECT_EQ(1, result(erase(R"({"id":)" + strLast + "}")));
    EXPECT_EQ(0, result(create("{}")));
}

// A condition that is tried on each note of the author to its end, and a value that moves each.
TEST_F(GuardedHost, WorstRequestIsWithinTheSteps)
{
    fill("crowd", 40 * kMaxNotes);
    fill("Ann", kMaxNotes);
    std::string strWorst = R"({"$or":[{"id":0})";
    strWorst += R"(,{"title":{"$like":"%1234567890%"}},{"body":{"$like":"%1234567890123456"}})";
    for (int i = 0; i < 44; ++i) strWorst += R"(,{"title":{"$gt":"x","$ne":null}})";
    strWorst += "]}";
    for (const std::string& strLine :
         {list(strWorst, R"({"sort":["-body","title","done"],"offset":900})"), get(strWorst),
          update(strWorst, R"({"body":"x"})"), erase(strWorst)}) {
        const Json::Value jAnswer = answer(strLine);
        EXPECT_TRUE(jAnswer.isMember("result")) << text(jAnswer);
    }
    EXPECT_EQ(kMaxNotes, result(update(R"({"id":{"$gt":0}})", R"({"title":"x"})")));
    EXPECT_TRUE(doubles::state().log.empty());
}

// SECURITY.md names the figure. An é takes two bytes in a command and six in an answer.
TEST_F(GuardedHost, AnswerIsBelowThreeMegabytes)
{
    const std::string strMuch = repeated(4050, "é");
    for (int i = 1; i <= 100; ++i) {
        EXPECT_EQ(0, result(create(R"({"title":")" + strMuch + R"("})")));
        EXPECT_EQ(1, result(update(R"({"id":)" + std::to_string(i) + "}",
                                   R"({"body":")" + strMuch + R"("})")));
    }
    const std::string strLimit = "the answer has more than 1000000 bytes";
    EXPECT_EQ(strLimit, refusal(list("{}", R"({"limit":62})")));
    std::ostringstream stream;
    ann_.serve(list("{}", R"({"limit":61})"), stream);
    EXPECT_LT(2900000U, stream.str().size());
    EXPECT_GT(3000000U, stream.str().size());
}

// Each allocation of operator new fails once.
TEST_F(GuardedHost, GoesOnAfterRunningOutOfMemory)
{
    EXPECT_EQ(0, result(create(R"({"topics":["tea",{"cups":2}]})")));
    const std::string strNote = served(get(kOne));
    for (const std::string& strLine :
         {list("{}"), save(R"({"id":1,"topics":["tea",{"cups":2}]})"), erase(R"({"id":7})")}) {
        SCOPED_TRACE(strLine);
        const std::string strRight = served(strLine);
        int iFailed = 0;
        for (int iNth = 1; 1 == iNth || 0 == doubles::state().iFailNew; ++iNth) {
            Line line;
            doubles::state().statements.clear();  // what records them has room already
            doubles::state().iFailNew = iNth;
            ann_.serve(strLine, line);
            if (0 != doubles::state().iFailNew) break;
            const bool blFailed = std::string(kFailed) + "\n" == line.text();
            EXPECT_TRUE(blFailed || strRight == line.text()) << iNth << ": " << line.text();
            iFailed += blFailed;
            ASSERT_EQ(strNote, served(get(kOne))) << iNth;
        }
        doubles::state().iFailNew = 0;
        EXPECT_LT(10, iFailed);
    }
}

// What SQLite says is not for users.
TEST_F(GuardedHost, GoesOnAfterAFailure)
{
    EXPECT_EQ(0, result(create("{}")));
    doubles::state().exec = [](auto...) { return SQLITE_IOERR; };
    EXPECT_EQ(kFailed, text(answer(get(kOne))));
    doubles::state().exec = nullptr;
    EXPECT_EQ(1, result(get(kOne)));
}

TEST_F(GuardedHost, ReadsLineByLine)
{
    const std::string strLongest(kMaxLine, 'x');
    std::istringstream stream("one\n\n" + strLongest + "\n" + strLongest + strLongest + "\nlast");
    std::string strLine;
    for (const std::string& strExpected :
         {std::string("one"), std::string(), strLongest, strLongest + "x", std::string("last")}) {
        EXPECT_TRUE(readLine(stream, strLine));
        EXPECT_EQ(strExpected, strLine);
    }
    for (int i = 0; i < 2; ++i) EXPECT_FALSE(readLine(stream, strLine));
}

}  // namespace
