// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// Records handed out one by one, callbacks that throw, and limits.
#include "front/front.h"
#include "support/figures.h"

#include <malloc.h>
#include <stdexcept>

namespace {

constexpr char kMembers[] = R"({
    "id":   {"cpptype": "long long"},
    "rank": {"cpptype": "int"},
    "text": {"cpptype": "string"}})";
constexpr char kColumns[] = "id integer primary key, rank integer, text text";
constexpr int kRecords = 1005;

class Each : public FrontTest {
protected:
    Each()
    {
        database_.run("pragma journal_mode=memory");
        Json::Value jRecords(Json::arrayValue);
        for (int i = 0; i < kRecords; ++i) {
            jRecords[i]["id"] = i;
            if (0 != i % 3) jRecords[i]["rank"] = i % 7;
        }
        EXPECT_EQ(std::to_string(kRecords), front_.createMany(jRecords));
    }

    // The ids in the order of the calls.
    std::string each(const char* szCondition, const char* szOptions, int iMost = -1)
    {
        jIds_ = Json::Value(Json::arrayValue);
        return front_.outcome([&] {
            return front_.table->each(json(szCondition), json(szOptions),
                                      [&](const Json::Value& jRecord) {
                                          jIds_.append(jRecord["id"]);
                                          return static_cast<int>(jIds_.size()) != iMost;
                                      });
        });
    }

    void expectAsListed(const char* szCondition, const char* szOptions)
    {
        SCOPED_TRACE(szOptions);
        EXPECT_EQ(front_.list(json(szCondition), json(szOptions)), each(szCondition, szOptions));
        front_.list(json(szCondition), json(szOptions));
        Json::Value jExpected(Json::arrayValue);
        for (const Json::Value& jRecord : front_.jStored) jExpected.append(jRecord["id"]);
        EXPECT_EQ(jExpected, jIds_);
    }

    Front front_{database_, kMembers, kColumns};
    Json::Value jIds_;
};

TEST_F(Each, HandsOutWhatAListHolds)
{
    for (const char* szOptions :
         {"null", R"({"sort":["rank"]})", R"({"sort":["-rank"]})", R"({"sort":["-rank","id"]})",
          R"({"sort":["rank","-id"]})", R"({"limit":200})", R"({"limit":401,"offset":3})",
          R"({"offset":250,"sort":["-rank"]})", R"({"limit":0})", R"({"limit":5000})",
          R"({"after":{"id":500}})", R"({"after":{"id":500,"rank":3},"offset":9,"limit":300,
             "sort":["rank"]})"})
        for (const char* szCondition : {"{}", R"({"rank":{"$in":[2,null]}})"})
            expectAsListed(szCondition, szOptions);
}

TEST_F(Each, StopsWhenTheCallbackSaysSo)
{
    for (const int iMost : {1, 199, 200, 201, 400})
        EXPECT_EQ(std::to_string(iMost), each("{}", "{}", iMost));
}

TEST_F(Each, ReadsPagesOfTwoHundred)
{
    takeStatements();
    each("{}", "{}");
    int nLists = 0;
    for (const std::string& strSql : takeStatements()) nLists += 0 == strSql.find("SELECT ");
    EXPECT_EQ(6, nLists);
}

TEST_F(Each, CatchesWhatTheCallbackThrows)
{
    const auto outcome = [&](auto thrown) {
        return front_.outcome([&] {
            return front_.table->each({}, {}, [&](const Json::Value&) -> bool { throw thrown; });
        });
    };
    EXPECT_EQ("failed: no more", outcome(std::runtime_error("no more")));
    EXPECT_EQ("failed: the callback threw", outcome(7));
    EXPECT_THROW(outcome(std::bad_alloc()), std::bad_alloc);
    EXPECT_EQ(1, sqlite3_get_autocommit(database_.get()));
}

TEST_F(Each, LetsTheCallbackUseTheTable)
{
    int nRemoved = 0;
    const long long nRecords = front_.table->each({}, {}, [&](const Json::Value& jRecord) {
        Json::Value jCondition;
        jCondition["id"] = jRecord["id"];
        Json::Value jStored;
        EXPECT_EQ(-1, front_.table->create(jRecord, jStored));
        nRemoved += static_cast<int>(front_.table->remove(jCondition));
        return true;
    });
    EXPECT_EQ(kRecords, nRecords);
    EXPECT_EQ(kRecords, nRemoved);
    EXPECT_EQ("", front_.table->reason());
    EXPECT_EQ("0", front_.list({}));
}

// What another program stored in a column of another kind sorts elsewhere than it reads.
TEST_F(Each, NeverReadsAPageTwice)
{
    const struct {
        const char* szWord;
        const char* szType;
        const char* szValue;
    } cases[] = {
        {"int", "int", "3000000000 + i"},
        {"int", "int", "'x' || i"},
        {"string", "text", "cast('x' || i as blob)"},
        {"string", "text", "'x' || char(0) || i"},
    };
    for (const auto& one : cases) {
        SCOPED_TRACE(one.szValue);
        Front front(database_,
                    std::string(R"({"id":{"cpptype":")") + one.szWord +
                        R"("},"nr":{"cpptype":"long long"}})",
                    std::string("nr integer primary key, id ") + one.szType);
        front.run(std::string("with recursive n(i) as (select 1 union all select i + 1 from n "
                              "where i < 500) insert into @ select i, ") +
                  one.szValue + " from n");
        int nCalls = 0;
        const auto each = [&](const char* szOptions) {
            return front.table->each({}, json(szOptions),
                                     [&](const Json::Value&) { return 1000 > ++nCalls; });
        };
        EXPECT_EQ(-1, each(R"({"sort":["id"]})"));
        EXPECT_EQ("the last record of a page reads otherwise than it is stored",
                  front.table->reason());
        EXPECT_EQ(0, nCalls);
        EXPECT_EQ(500, each("{}"));
    }
}

class EachMemory : public FrontTest {
protected:
    // The most that is allocated while each() hands out so many records, of equal size.
    std::size_t peakOf(int nRecords, const char* szOptions)
    {
        Front front(database_, kMembers, kColumns);
        front.run("create index @_i on @ (rank)");
        front.run(
            "with recursive n(i) as (select 1000000 union all select i + 1 from n) insert "
            "into @ select i, i % 7, 'text ' || i from n limit " +
            std::to_string(nRecords));
        std::size_t nPeak = 0;
        const std::size_t nBefore = bytesInUse();
        EXPECT_EQ(nRecords, front.table->each({}, json(szOptions), [&nPeak](const Json::Value&) {
            doubles::state().statements.clear();  // which grow, too
            nPeak = std::max(nPeak, bytesInUse());
            return true;
        }));
        return nPeak - nBefore;
    }

private:
    static std::size_t bytesInUse()
    {
        const struct mallinfo2 info = mallinfo2();
        return info.uordblks + info.hblkhd;
    }
};

// A sanitizer's allocator is not counted. What malloc keeps of freed blocks varies; a hundred times
// the records would need a hundred times as much.
TEST_F(EachMemory, IsThatOfOnePage)
{
    database_.run("pragma cache_size=10");
    for (const char* szOptions : {"{}", R"({"sort":["-rank"]})"}) {
        peakOf(1000, szOptions);  // for what only the first call needs
        const std::size_t nFew = peakOf(1000, szOptions);
        const std::size_t nMany = peakOf(100000, szOptions);
        Figures::of("front, bytes of 1,000 records handed out") = static_cast<long long>(nFew);
        Figures::of("front, bytes of 100,000 records handed out") = static_cast<long long>(nMany);
        EXPECT_GE(3 * nFew, nMany);
    }
}

class FrontLimits : public Each {
protected:
    void limit(std::size_t VornJsonTable::Limits::*pLimit, std::size_t nMost)
    {
        VornJsonTable::Limits limits{0, 0, 0, 0, 0};
        limits.*pLimit = nMost;
        front_.table->setLimits(limits);
    }
};

using Limits = VornJsonTable::Limits;

TEST_F(FrontLimits, EndACallWithAReason)
{
    limit(&Limits::nRequestMembers, 3);
    EXPECT_EQ("0", front_.list(json(R"({"id":{"$in":[-1]}})")));
    const std::string strMembers = "limit: the request has more than 3 values";
    EXPECT_EQ(strMembers, front_.list(json(R"({"id":{"$in":[-1,-2]}})")));
    EXPECT_EQ(strMembers, front_.list(json(R"({"id":-1})"), json(R"({"sort":["id","rank"]})")));
    EXPECT_EQ(strMembers, front_.createMany(json(R"([{"id":-1},{"id":-2}])")));
    limit(&Limits::nRequestBytes, 8);
    EXPECT_EQ("0", front_.create(json(R"({"text":"1234"})")));
    EXPECT_EQ("limit: the request has more than 8 bytes",
              front_.create(json(R"({"text":"12345"})")));
    limit(&Limits::nAnswerRows, 5);
    EXPECT_EQ("5", front_.list({}, json(R"({"limit":5})")));
    EXPECT_EQ("5", front_.list(json(R"({"id":{"$lt":5}})")));
    EXPECT_EQ("limit: the answer has more than 5 records; use the option \"limit\"",
              front_.list({}));
    EXPECT_EQ("limit: option \"limit\": more than 5 records",
              front_.list(json(R"({"id":-1})"), json(R"({"limit":6})")));
    EXPECT_EQ("1", front_.get({}));
    limit(&Limits::nAnswerBytes, 12);
    EXPECT_EQ("5", front_.list(json(R"({"id":{"$lt":5}})"), {}));
    EXPECT_EQ("limit: the answer has more than 12 bytes", front_.list({}));
}

TEST_F(FrontLimits, BoundThePagesOfEach)
{
    limit(&Limits::nAnswerRows, 7);
    EXPECT_EQ(std::to_string(kRecords), each("{}", "{}"));
    EXPECT_EQ("20", each("{}", R"({"limit":20})"));
}

// The host's own statements run to their end.
TEST_F(FrontLimits, EndWithTheCall)
{
    front_.table->setLimits({0, 0, 0, 0, 100});
    EXPECT_EQ("limit: a statement takes more than 100 steps", front_.list({}));
    EXPECT_EQ(std::to_string(kRecords), database_.value(front_.named("select count(*) from @")));
    EXPECT_EQ("1", front_.get(json(R"({"id":7})")));
    EXPECT_EQ("0", database_.value(front_.named("select count(*) from @ where text = 'x'")));
}

TEST_F(FrontLimits, HaveDefaultsForStrangers)
{
    front_.table->setLimits({});
    EXPECT_EQ("limit: the answer has more than 1000 records; use the option \"limit\"",
              front_.list({}));
    Json::Value jMany;
    for (int i = 0; i < 1000; ++i) jMany["id"]["$in"][i] = i;
    EXPECT_EQ("limit: the request has more than 1000 values", front_.list(jMany));
}

// EAGAIN in errno looks like a lock to the library.
TEST_F(FrontLimits, StopStatementsOnce)
{
    const auto again = [](sqlite3_context*, int, sqlite3_value**) { errno = EAGAIN; };
    sqlite3_create_function(database_.get(), "again", 0, SQLITE_UTF8, nullptr, again, nullptr,
                            nullptr);
    front_.run("create trigger @_t before delete on @ begin select again(); end");
    front_.table->setLimits({0, 0, 0, 0, 5000});
    EXPECT_EQ("limit: a statement takes more than 5000 steps",
              front_.outcome([&] { return front_.table->removeAll(); }));
    EXPECT_TRUE(doubles::state().sleeps.empty());
}

TEST_F(FrontLimits, StopStatementsThatTakeTooManySteps)
{
    VornJsonTable::Limits limits{0, 0, 0, 0, 5000};
    front_.table->setLimits(limits);
    const std::string strSteps = "limit: a statement takes more than 5000 steps";
    for (int i = 0; i < 3; ++i) {
        errno = EAGAIN;
        EXPECT_EQ(strSteps, front_.list({}, json(R"({"sort":["-text"]})")));
        EXPECT_EQ(strSteps,
                  front_.outcome([&] { return front_.table->updateAll(json(R"({"text":"x"})")); }));
        EXPECT_EQ("1", front_.get(json(R"({"id":7})")));
    }
    EXPECT_TRUE(doubles::state().sleeps.empty());
    limits.nSteps = 1;
    front_.table->setLimits(limits);
    EXPECT_EQ("limit: a statement takes more than 1 steps", front_.get(json(R"({"id":7})")));
    database_.run("begin");
    Json::Value jStored;
    limits.nSteps = 5000;
    front_.table->setLimits(limits);
    EXPECT_EQ(-1, front_.table->updateAll(json(R"({"text":"x"})")));
    EXPECT_EQ(0U, front_.table->reason().find("a statement takes more than 5000 steps"));
    if (0 == sqlite3_get_autocommit(database_.get())) database_.run("rollback");
    front_.table->setLimits({0, 0, 0, 0, 0});
    EXPECT_EQ("0", front_.outcome([&] { return front_.table->count(json(R"({"text":"x"})")); }));
}

}  // namespace
