// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// What docs/limits.md says of a host that runs out of memory, in processes that have not used the
// library before.

#include "faults/memory/allocators.h"
#include "faults/memory/store.h"
#include "support/json_text.h"

#include <VornJsonDbApi.h>
#include <gtest/gtest.h>

#include <unistd.h>
#include <ctime>
#include <set>

namespace {

using allocators::Fault;
using allocators::Kind;

void expectInChild(bool (*isRight)())
{
    EXPECT_EXIT(_exit(isRight() ? 0 : 1), testing::ExitedWithCode(0), "");
}

// The list fails at each allocation of SQLite in turn.
TEST(MemoryLimits, LastRecordOfAFailedListMayLackMembers)
{
    expectInChild([] {
        Store store;
        std::string strName = "plain";
        std::string strCreate = "create table if not exists plain (id integer primary key)";
        Json::Value jDefinition = leftByReader(kDefinition);
        VornJsonDbApi api(store.get(), strName, jDefinition, strCreate);
        std::set<std::string> lasts;
        for (Fault fault{Kind::kSqlite, 1, false};; ++fault.iNth) {
            Json::Value jRequest;
            Json::Value jRecords;
            allocators::arm(fault);
            const int iResult = api.recList(jRequest, jRecords);
            if (0 == allocators::disarm()) break;
            if (-1 != iResult) return false;
            if (!jRecords.empty()) lasts.insert(text(jRecords[jRecords.size() - 1]));
        }
        return 1U == lasts.count(R"({"data":{"n":1},"name":"the first of the rows alike"})");
    });
}

// The first local time of a process.
std::string localTime()
{
    std::string strTime;
    allocators::arm({Kind::kMalloc, 1, true});
    const int iResult = VORN_JSON_DB::convert2ReadableTime(0, strTime, 4);
    allocators::disarm();
    return 0 == iResult ? strTime : "none";
}

TEST(MemoryLimits, FirstLocalTimeMayBeUtc)
{
    if (!allocators::kOwnMalloc)
        GTEST_SKIP() << "malloc cannot be replaced beside the one of a sanitizer";
    expectInChild([] { return "1970-01-01 00:00:00" == localTime(); });
    expectInChild([] {
#include "limits/FirstLocalTimeMayBeUtc.inc"
        return "1970-01-01 02:00:00" == localTime();
    });
}

}  // namespace
