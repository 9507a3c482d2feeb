// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// A page costs the same wherever it is, if its order is that of an index in one direction.
#include "front/front.h"

namespace {

constexpr char kMembers[] = R"({
    "code":    {"cpptype": "string"},
    "created": {"cpptype": "long long"},
    "id":      {"cpptype": "long long"}})";
constexpr int kRows = 20000;
constexpr int kStepsOfAPage = 3000;

struct Case {
    const char* szColumns;
    const char* szIndex;
    const char* szOptions;
};

const Case kCases[] = {
    {"code text, created integer, id integer primary key", "", "{}"},
    {"code text, created integer, id integer primary key", "", R"({"sort":["-id"]})"},
    {"code text, created integer, id integer primary key", "create index @_i on @ (created)",
     R"({"sort":["created"]})"},
    {"code text, created integer, id integer primary key", "create index @_i on @ (created)",
     R"({"sort":["-created"]})"},
    {"code text, created integer, id integer, primary key (code, id)) without rowid --",
     "create index @_i on @ (created, code, id)", R"({"sort":["-created"]})"},
    {"code text, created integer, id integer, primary key (code, id)",
     "create index @_i on @ (created, code, id)", R"({"sort":["created"]})"},
};

class PageCost : public FrontTest, public testing::WithParamInterface<Case> {
protected:
    PageCost()
    {
        front_.run("with recursive n(i) as (select 1 union all select i + 1 from n where i < " +
                   std::to_string(kRows) +
                   ") insert into @ (id, created, code) select i, "
                   "case when i % 2 then i / 20 end, 'c' || i % 7 from n");
        front_.run(GetParam().szIndex);
    }

    std::string pageAfter(const Json::Value& jLast, int nSteps)
    {
        front_.table->setLimits({0, 0, 0, 0, nSteps});
        Json::Value jOptions = json(GetParam().szOptions);
        jOptions["after"] = jLast;
        jOptions["limit"] = 10;
        return front_.list({}, jOptions);
    }

    Front front_{database_, kMembers, GetParam().szColumns};
};

TEST_P(PageCost, IsTheSameEverywhere)
{
    EXPECT_EQ(std::to_string(kRows), front_.list({}, json(GetParam().szOptions)));
    const Json::Value jAll = front_.jStored;
    for (const Json::ArrayIndex uLast : {0U, 4999U, 9995U, 10000U, 15000U, 19989U}) {
        SCOPED_TRACE(uLast);
        ASSERT_EQ("10", pageAfter(jAll[uLast], kStepsOfAPage));
        for (Json::ArrayIndex u = 0; u < 10; ++u) EXPECT_EQ(jAll[uLast + 1 + u], front_.jStored[u]);
    }
    // Skipping as many rows takes more.
    Json::Value jOptions = json(GetParam().szOptions);
    jOptions["limit"] = 10;
    jOptions["offset"] = 19989;
    EXPECT_EQ("limit: a statement takes more than 3000 steps", front_.list({}, jOptions));
}

INSTANTIATE_TEST_SUITE_P(Orders, PageCost, testing::ValuesIn(kCases));

}  // namespace
