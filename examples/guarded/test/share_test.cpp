// SPDX-License-Identifier: MIT
// What one stranger leaves to the others: their ids, their time, and the memory of the host.

#include "examples/guarded/guard.h"
#include "world.h"

#include <ostream>
#include <sstream>
#include <streambuf>

namespace {

constexpr char kFailed[] = R"({"error":"failed"})";

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
    void fill(const std::string& strAuthor, int iNotes)
    {
        run("with recursive n(i) as (select 1 union all select i + 1 from n) "
            "insert into note (author,done,text,topics) select '" +
            strAuthor + "',0,'','[]' from n limit " + std::to_string(iNotes));
    }

    // What was in the file before the host.
    void run(const std::string& strSql)
    {
        {
            const VornJsonDbApi notes = openNotes(database_.get());
        }
        database_.run(strSql);
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
    std::unique_ptr<Host> pHost_;
};

// Those that begin like one of these.
void failStatements(const std::vector<std::string>& beginnings)
{
    doubles::state().exec = [beginnings](sqlite3* pDb, const char* szSql,
                                         doubles::RowCallback callback, void* arg, char** errText) {
        for (const std::string& strBeginning : beginnings)
            if (0 == std::string(szSql).rfind(strBeginning, 0)) return SQLITE_NOMEM;
        return doubles::realExec(pDb, szSql, callback, arg, errText);
    };
}

constexpr char kCreate[] = R"({"op":"create","record":{"author":"Ann","text":"mine"}})";
constexpr char kGet[] = R"({"op":"get","request":{"id":1}})";

TEST_F(Share, NotesBeyond32BitsKeepTheirIds)
{
    run("insert into note values ('Eve',0,2147483647,'eve','[]')");
    const Json::Value jMade = answer(kCreate);
    EXPECT_EQ(2147483648, jMade["record"]["id"].asInt64());
    const std::string strSame = R"("request":{"id":2147483648})";
    EXPECT_EQ(0, result(R"({"op":"update",)" + strSame + R"(,"values":{"text":"changed"}})"));
    EXPECT_EQ("changed", answer(R"({"op":"get",)" + strSame + "}")["record"]["text"].asString());
    EXPECT_EQ(1, result(R"({"op":"delete",)" + strSame + "}"));
    EXPECT_EQ(R"([{"author":"Eve","done":false,"id":2147483647,"text":"eve","topics":[]}])",
              text(answer(R"({"op":"list","request":{}})")["records"]));
}

TEST_F(Share, AuthorsSaveWhatIsTheirs)
{
    EXPECT_EQ(0, result(kCreate));
    EXPECT_EQ(0, result(R"({"op":"save","record":{"id":1,"author":"Ann","text":"again"}})"));
    for (const char* szRecord : {R"({"id":1,"author":"Eve"})", R"({"id":1})", R"({"id":2})",
                                 R"({"author":"Ann"})", R"({"id":2,"author":"Ann"})"})
        EXPECT_EQ("the author has no such note",
                  refusal(std::string(R"({"op":"save","record":)") + szRecord + "}"))
            << szRecord;
    EXPECT_EQ("again", answer(kGet)["record"]["text"].asString());
    EXPECT_EQ(1U, answer(R"({"op":"list","request":{}})")["records"].size());
}

TEST_F(Share, EachAuthorHasAQuota)
{
    for (const char* szAuthor : {"Ann", "nobody"}) fill(szAuthor, kMaxNotes - 1);
    for (const std::string strAuthor : {"Ann", "nobody"}) {
        SCOPED_TRACE(strAuthor);
        // The default is an author, too.
        const std::string strCreate =
            "nobody" == strAuthor ? R"({"op":"create","record":{"text":"mine"}})" : kCreate;
        const Json::Value jMade = answer(strCreate);
        EXPECT_EQ(0, jMade["result"].asInt());
        EXPECT_EQ("the author has too many notes", refusal(strCreate));
        EXPECT_EQ(0, result(R"({"op":"save","record":)" + text(jMade["record"]) + "}"));
        EXPECT_EQ(0, result(R"({"op":"create","record":{"author":"Bob"}})"));
        const std::string strId = text(jMade["record"]["id"]);
        EXPECT_EQ(1, result(R"({"op":"delete","request":{"id":)" + strId + "}}"));
        EXPECT_EQ(0, result(strCreate));
        EXPECT_EQ("the author has too many notes", refusal(strCreate));
    }
}

TEST_F(Share, CrowdDoesNotTurnTheFenceAgainstOthers)
{
    for (int i = 0; i < 40; ++i) fill("crowd" + std::to_string(i), kMaxNotes);
    EXPECT_EQ(0, result(kCreate));
    for (const char* szRequest :
         {R"({"author":"Ann"})", R"({"author":["Ann"]})", R"({"author":"Ann","done":false})",
          R"({"author":"Ann","text":["mine"],"done":false,"topics":[[]]})", R"({"id":40001})",
          R"({"id":[40001],"author":"Ann"})", R"({"author":"Ann","sort_by":"text"})"}) {
        const Json::Value jAnswer =
            answer(std::string(R"({"op":"list","request":)") + szRequest + "}");
        EXPECT_EQ(1U, jAnswer["records"].size()) << szRequest << text(jAnswer);
    }
    // The crowd's own, the whole quota read to the end; and a page of everything.
    EXPECT_EQ(0, result(R"({"op":"list","request":{"author":"crowd7","text":"none"}})"));
    EXPECT_EQ(0, result(R"({"op":"list","request":{"offset":1000}})"));
    EXPECT_EQ(0, result(R"({"op":"save","record":{"id":40001,"author":"Ann"}})"));
    EXPECT_EQ(0, result(R"({"op":"update","request":{"id":40001},"values":{"done":true}})"));
    EXPECT_EQ(1, result(R"({"op":"delete","request":{"id":40001}})"));
}

// SECURITY.md names the figure. An é takes two bytes in a command and six in an answer.
TEST_F(Share, AnswerIsBelowFiveMegabytes)
{
    std::string strMuch;
    for (int i = 0; i < 4050; ++i) strMuch += "é";
    const std::string strCreate = R"({"op":"create","record":{"topics":[")" + strMuch + R"("]}})";
    EXPECT_GT(guard::kMaxLine, strCreate.size());
    EXPECT_LT(guard::kMaxLine - 100, strCreate.size());
    for (unsigned u = 1; u <= guard::kMaxRows; ++u) {
        EXPECT_EQ(0, result(strCreate));
        EXPECT_EQ(0, result(R"({"op":"update","request":{"id":)" + std::to_string(u) +
                            R"(},"values":{"text":")" + strMuch + R"("}})"));
    }
    std::ostringstream stream;
    host().serve(R"({"op":"list","request":{}})", stream);
    EXPECT_LT(4800000U, stream.str().size());
    EXPECT_GT(5000000U, stream.str().size());
}

// Each allocation of operator new fails once.
TEST_F(Share, HostGoesOnAfterALackOfMemory)
{
    EXPECT_EQ(0,
              result(R"({"op":"create","record":{"author":"Ann","topics":["tea",{"cups":2}]}})"));
    const std::string strNote = served(kGet);
    for (const std::string strLine :
         {R"({"op":"list","request":{}})",
          R"({"op":"save","record":{"id":1,"author":"Ann","topics":["tea",{"cups":2}]}})",
          R"({"op":"update","request":{"id":1},"values":{"done":false}})",
          R"({"op":"delete","request":{"id":7}})", R"({"op":"list","request":{"limit":101}})"}) {
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

TEST_F(Share, HostGoesOnAfterALookUpThatFails)
{
    EXPECT_EQ(0, result(R"({"op":"list","request":{}})"));
    failStatements({"SELECT"});
    EXPECT_EQ(kFailed, text(answer(kCreate)));
    doubles::state().exec = nullptr;
    EXPECT_EQ(0, result(kCreate));
    EXPECT_EQ(1, answer(kGet)["record"]["id"].asInt());
}

// Even the rollback may lack memory.
TEST_F(Share, HostGoesOnAfterARollbackThatFails)
{
    EXPECT_EQ(0, result(kCreate));
    failStatements({"commit", "rollback"});
    EXPECT_EQ(kFailed, text(answer(R"({"op":"delete","request":{"id":1}})")));
    doubles::state().exec = nullptr;
    EXPECT_EQ("mine", answer(kGet)["record"]["text"].asString());
    EXPECT_EQ(1, result(R"({"op":"delete","request":{"id":1}})"));
}

}  // namespace
