// SPDX-License-Identifier: MIT
// What one stranger leaves to the others: their ids, their time, and the memory of the host.

#include "examples/guarded/guard.h"
#include "world.h"

#include <ostream>
#include <streambuf>

namespace {

constexpr char kFailed[] = R"({"error":"failed"})";
const std::string kGet = get(R"({"id":1})");
const std::string kMine = create(R"({"author":"Ann","text":"mine"})");

// A stream that allocates nothing.
class Line : private std::streambuf, public std::ostream {
public:
    Line() : std::ostream(static_cast<std::streambuf*>(this))
    {
        setp(cText_, cText_ + sizeof cText_);
    }
    std::string text() const { return std::string(pbase(), pptr()); }

private:
    char cText_[64 * 1024];
};

class Share : public HostTest {
protected:
    Share() { const VornJsonDbApi notes = openNotes(database_.get()); }

    void fill(const std::string& strAuthor, int iNotes)
    {
        database_.run(
            "with recursive n(i) as (select 1 union all select i + 1 from n) "
            "insert into note (author,done,text,topics) select '" +
            strAuthor + "',0,'','[]' from n limit " + std::to_string(iNotes));
    }

    Host& host()
    {
        if (!pHost_) pHost_ = std::make_unique<Host>(database_.get());
        return *pHost_;
    }
    Json::Value answer(const std::string& strLine) { return host().answer(strLine); }
    std::string refusal(const std::string& strLine)
    {
        return answer(strLine)["refused"].asString();
    }
    int result(const std::string& strLine) { return answer(strLine).get("result", -1).asInt(); }
    // As the program writes it.
    std::string served(const std::string& strLine)
    {
        Line line;
        host().serve(strLine, line);
        return line.text();
    }

    Database database_;
    std::unique_ptr<Host> pHost_;  // made on what is in the file already
};

// Makes the statements fail that begin like one of these.
void failStatements(const std::vector<std::string>& beginnings)
{
    doubles::state().exec = [beginnings](sqlite3* pDb, const char* szSql,
                                         doubles::RowCallback callback, void* arg, char** errText) {
        for (const std::string& strBeginning : beginnings)
            if (0 == std::string(szSql).rfind(strBeginning, 0)) return SQLITE_NOMEM;
        return doubles::realExec(pDb, szSql, callback, arg, errText);
    };
}

TEST_F(Share, NotesBeyond32BitsKeepTheirIds)
{
    database_.run("insert into note values ('Eve',0,2147483647,'eve','[]')");
    EXPECT_EQ(2147483648, answer(kMine)["record"]["id"].asInt64());
    const std::string strSame = R"({"id":2147483648})";
    EXPECT_EQ(0, result(update(strSame, R"({"text":"changed"})")));
    EXPECT_EQ("changed", answer(get(strSame))["record"]["text"].asString());
    EXPECT_EQ(1, result(erase(strSame)));
    EXPECT_EQ(R"([{"author":"Eve","done":false,"id":2147483647,"text":"eve","topics":[]}])",
              text(answer(list("{}"))["records"]));
}

TEST_F(Share, AuthorsSaveOnlyTheirOwnNotes)
{
    EXPECT_EQ(0, result(kMine));
    EXPECT_EQ(0, result(save(R"({"id":1,"author":"Ann","text":"again"})")));
    for (const char* szRecord : {R"({"id":1,"author":"Eve"})", R"({"id":1})", R"({"id":2})",
                                 R"({"author":"Ann"})", R"({"id":2,"author":"Ann"})"})
        EXPECT_EQ("the author has no such note", refusal(save(szRecord))) << szRecord;
    EXPECT_EQ("again", answer(kGet)["record"]["text"].asString());
    EXPECT_EQ(1U, answer(list("{}"))["records"].size());
}

// The default is an author, too.
TEST_F(Share, EachAuthorHasAQuota)
{
    for (const char* szAuthor : {"Ann", "nobody"}) fill(szAuthor, kMaxNotes - 1);
    for (const std::string& strCreate : {kMine, create(R"({"text":"mine"})")}) {
        SCOPED_TRACE(strCreate);
        const Json::Value jMade = answer(strCreate);
        EXPECT_EQ(0, jMade["result"].asInt());
        EXPECT_EQ("the author has too many notes", refusal(strCreate));
        EXPECT_EQ(0, result(save(text(jMade["record"]))));
        EXPECT_EQ(0, result(create(R"({"author":"Bob"})")));
        EXPECT_EQ(1, result(erase(R"({"id":)" + text(jMade["record"]["id"]) + "}")));
        EXPECT_EQ(0, result(strCreate));
        EXPECT_EQ("the author has too many notes", refusal(strCreate));
    }
}

TEST_F(Share, CrowdDoesNotUseUpTheStepsOfOthers)
{
    for (int i = 0; i < 40; ++i) fill("crowd" + std::to_string(i), kMaxNotes);
    EXPECT_EQ(0, result(kMine));
    for (const char* szRequest :
         {R"({"author":"Ann"})", R"({"author":["Ann"]})", R"({"author":"Ann","done":false})",
          R"({"author":"Ann","text":["mine"],"done":false,"topics":[[]]})", R"({"id":40001})",
          R"({"id":[40001],"author":"Ann"})", R"({"author":"Ann","sort_by":"text"})"})
        EXPECT_EQ(1U, answer(list(szRequest))["records"].size()) << szRequest;
    // The crowd's own, the whole quota read to the end; and a page of everything.
    EXPECT_EQ(0, result(list(R"({"author":"crowd7","text":"none"})")));
    EXPECT_EQ(0, result(list(R"({"offset":1000})")));
    EXPECT_EQ(0, result(save(R"({"id":40001,"author":"Ann"})")));
    EXPECT_EQ(0, result(update(R"({"id":40001})", R"({"done":true})")));
    EXPECT_EQ(1, result(erase(R"({"id":40001})")));
}

// SECURITY.md names the figure. An é takes two bytes in a command and six in an answer.
TEST_F(Share, AnswerIsBelowFiveMegabytes)
{
    const std::string strMuch = repeated(4050, "é");
    const std::string strCreate = create(R"({"topics":[")" + strMuch + R"("]})");
    EXPECT_GT(guard::kMaxLine, strCreate.size());
    EXPECT_LT(guard::kMaxLine - 100, strCreate.size());
    for (unsigned u = 1; u <= guard::kMaxRows; ++u) {
        EXPECT_EQ(0, result(strCreate));
        EXPECT_EQ(0, result(update(R"({"id":)" + std::to_string(u) + "}",
                                   R"({"text":")" + strMuch + R"("})")));
    }
    std::ostringstream stream;
    host().serve(list("{}"), stream);
    EXPECT_LT(4800000U, stream.str().size());
    EXPECT_GT(5000000U, stream.str().size());
}

// Each allocation of operator new fails once.
TEST_F(Share, HostGoesOnAfterRunningOutOfMemory)
{
    const char* kTea = R"({"author":"Ann","topics":["tea",{"cups":2}]})";
    EXPECT_EQ(0, result(create(kTea)));
    const std::string strNote = served(kGet);
    for (const std::string& strLine :
         {list("{}"), save(R"({"id":1,"author":"Ann","topics":["tea",{"cups":2}]})"),
          update(R"({"id":1})", R"({"done":false})"), erase(R"({"id":7})"),
          list(R"({"limit":101})")}) {
        SCOPED_TRACE(strLine);
        const std::string strRight = served(strLine);
        EXPECT_NE(std::string(kFailed) + "\n", strRight);
        int iFailed = 0;
        for (int iNth = 1; 1 == iNth || 0 == doubles::state().iFailNew; ++iNth) {
            ASSERT_GT(10000, iNth);
            Line line;
            doubles::state().statements.clear();  // what records them has room already
            doubles::state().iFailNew = iNth;
            host().serve(strLine, line);
            if (0 != doubles::state().iFailNew) break;
            const bool blFailed = std::string(kFailed) + "\n" == line.text();
            EXPECT_TRUE(blFailed || strRight == line.text()) << iNth << ": " << line.text();
            iFailed += blFailed;
            EXPECT_EQ(1, sqlite3_get_autocommit(database_.get())) << iNth;
            ASSERT_EQ(strNote, served(kGet)) << iNth;
        }
        doubles::state().iFailNew = 0;
        EXPECT_LT(10, iFailed);
    }
}

// Even the rollback may lack memory.
TEST_F(Share, HostGoesOnAfterAFailedStatement)
{
    EXPECT_EQ(0, result(kMine));
    failStatements({"SELECT"});
    EXPECT_EQ(kFailed, text(answer(kMine)));
    failStatements({"commit", "rollback"});
    EXPECT_EQ(kFailed, text(answer(erase(R"({"id":1})"))));
    doubles::state().exec = nullptr;
    EXPECT_EQ("mine", answer(kGet)["record"]["text"].asString());
    EXPECT_EQ(1, result(erase(R"({"id":1})")));
    EXPECT_EQ(2, answer(kMine)["record"]["id"].asInt());
}

}  // namespace
