// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// docs/large-results.md: reading by pages takes as much memory for many records as for few.

#include "docs/recipe_page.h"

#include <malloc.h>
#include <algorithm>
#include <functional>
#include <limits>

namespace {

#include "large-results/Counting.inc"
#include "large-results/PagesByKey.inc"

// The bytes that are allocated. The allocator of a sanitizer or of valgrind is not counted.
std::size_t allocated()
{
    const auto info = mallinfo2();
    return info.uordblks + info.hblkhd;
}

class LargeResults : public RecipePage {
protected:
    LargeResults() : RecipePage("large-results.md")
    {
        // What SQLite keeps of the file does not grow with it.
        database_.run("pragma synchronous=off; pragma journal_mode=wal; pragma cache_size=10");
    }

    // The ids 1 to n.
    void fill(int n)
    {
        database_.run("delete from reading; insert into reading with recursive r(i) as (select 1 " +
                      ("union all select i + 1 from r where i < " + std::to_string(n)) +
                      ") select i, 'city ' || (i % 10), i % 7 from r");
    }

    // What a call that gives one record or list gives, and the rows that SQLite read for it.
    Ended calledOnRows(const Words& call, int nRows)
    {
        int iRows = 0;
        const auto count = [](unsigned, void* pRows, void*, void*) {
            return ++*static_cast<int*>(pRows);
        };
        sqlite3_trace_v2(database_.get(), SQLITE_TRACE_ROW, count, &iRows);
        const Ended ended = called(api_, call);
        sqlite3_trace_v2(database_.get(), 0, nullptr, nullptr);
        EXPECT_EQ(nRows, iRows);
        return ended;
    }

    std::size_t peakOfPages()
    {
        const std::size_t nBefore = allocated();
        std::size_t nPeak = 0;
        int iRecords = 0;
        EXPECT_EQ(0, forEachReading(api_, [&](const Json::Value&) {
                      takeStatements();
                      if (0 == ++iRecords % 1000) nPeak = std::max(nPeak, allocated() - nBefore);
                  }));
        return nPeak;
    }

    std::size_t peakOfOneList()
    {
        const std::size_t nBefore = allocated();
        Json::Value jRequest;
        Json::Value jRecords;
        EXPECT_EQ(0, api_.recList(jRequest, jRecords));
        return allocated() - nBefore;
    }

    Database database_{path("store.db")};
    Table table_{database_, "reading",
                 R"({"id":{"cpptype":"long long"},"city":{"cpptype":"string"},
                     "value":{"cpptype":"int"}})",
                 "id integer primary key, city text, value integer"};
    VornJsonDbApi& api_ = table_.api;
};

}  // namespace

TEST_F(LargeResults, PagesByKey)
{
    std::size_t nPages[2] = {};
    std::size_t nLists[2] = {};
    for (const int i : {0, 0, 1}) {  // the first time for what is kept from then on
        fill(0 == i ? 2000 : 20000);
        nPages[i] = peakOfPages();
        nLists[i] = peakOfOneList();
    }
    EXPECT_LE(nPages[1], nPages[0] + nPages[0] / 20);
    EXPECT_GE(nLists[1], 9 * nLists[0]);
    EXPECT_LE(9 * nPages[1], nLists[1]);

    // Each record once, also those at the ends, and though others are deleted meanwhile.
    fill(1999);
    for (const char* szId : {"-9223372036854775807", "9223372036854775807"})
        table_.create(std::string(R"({"value":0,"id":)") + szId + "}");
    std::vector<Json::Int64> ids;
    EXPECT_EQ(0, forEachReading(api_, [&](const Json::Value& jRecord) {
                  ids.push_back(jRecord["id"].asInt64());
                  if (1 == ids.size()) api_.runSqlEx("delete from reading where id = 1");
              }));
    ASSERT_EQ(2001U, ids.size());
    for (int i = 1; i < 2000; ++i) EXPECT_EQ(i, ids[static_cast<std::size_t>(i)]);

    // By offset, one is left out.
    fill(2000);
    EXPECT_NE("-1", listed(api_, R"({"limit":1000})"));
    EXPECT_EQ(1, deleted(api_, R"({"id":1})"));
    EXPECT_EQ(1002, json(listed(api_, R"({"limit":1000,"offset":1000})"))[0]["id"].asInt());

    // In a transaction, all pages show the same moment.
    for (const bool blTransaction : {false, true}) {
        fill(2000);
        Database other(path("store.db"));
        int iSeen = 0;
        EXPECT_LE(0, api_.runSqlEx(blTransaction ? "begin" : "select 1"));
        EXPECT_EQ(0, forEachReading(api_, [&](const Json::Value&) {
                      if (1 == ++iSeen) other.run("delete from reading where id > 1500");
                  }));
        EXPECT_EQ(blTransaction ? 2000 : 1500, iSeen);
        EXPECT_LE(0, api_.runSqlEx(blTransaction ? "commit" : "select 1"));
    }
}

TEST_F(LargeResults, PagesInAnotherOrder)
{
    database_.run(
        "insert into reading values (7, 'Oslo', 0), (9, 'Oslo', 0), (1, 'Paris', 0), "
        "(8, 'Bergen', 0), (2, 'Oslo', 0), (6, 'Rome', 0)");
    database_.run(example(0, "sql"));
    std::string strIds;
    for (const Json::Value& jRecord : json(listed(api_, example())))
        strIds += jRecord["id"].asString();
    EXPECT_EQ("916", strIds);
    EXPECT_EQ(std::string::npos, takeStatements().back().find("OFFSET"));

    // The plan has one step, a search by the index.
    EXPECT_NE("-1", listed(api_, example()));
    const Rows plan = database_.rows("explain query plan " + takeStatements().back());
    ASSERT_EQ(1U, plan.size());
    EXPECT_NE(std::string::npos, plan[0].back().find("INDEX reading_city"));
}

TEST_F(LargeResults, Counting)
{
    fill(2000);
    const std::pair<const char*, long long> cases[] = {
        {"{}", 2000},
        {R"({"city":"city 3"})", 200},
        {R"({"city":"city 3","value":2})", 29},
        {R"({"city":"nowhere"})", 0},
        {R"({"vornSqlWhereFilter":"id > 1990"})", 10},
        {R"({"limit":10})", 2000},
        {R"({"vornSqlWhereFilter":"id > 1990) order by (id","limit":3})", 10},
    };
    for (const auto& [szRequest, llExpected] : cases) {
        Json::Value jRequest = json(szRequest);
        EXPECT_EQ(llExpected, countReadings(api_, jRequest)) << szRequest;
        jRequest.removeMember("limit");
        EXPECT_EQ(llExpected, json(listed(api_, text(jRequest))).size()) << szRequest;
    }
    for (const char* szRequest : {"[]", R"({"vornSqlWhereFilter":"nonsense"})"}) {
        Json::Value jRequest = json(szRequest);
        EXPECT_EQ(-1, countReadings(api_, jRequest)) << szRequest;
    }
    takeLog();
}

TEST_F(LargeResults, OneRecord)
{
    fill(2000);
    EXPECT_EQ("3", calledOnRows({"recGetOne", example(0), "null"}, 1).jOut["id"].asString());
    EXPECT_EQ("2000", calledOnRows({"recGetOne", example(1), "null"}, 1).jOut["id"].asString());
    calledOnRows({"recGetOne", R"({"city":"city 3"})", "null"}, 200);
}
