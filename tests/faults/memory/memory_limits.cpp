// SPDX-License-Identifier: MIT
// What docs/limits.md says of a host that runs out of memory.

#include "faults/memory/allocators.h"
#include "faults/memory/store.h"
#include "support/json_text.h"

#include <VornJsonDbApi.h>
#include <gtest/gtest.h>

#include <unistd.h>
#include <cstdlib>
#include <ctime>
#include <set>

namespace {

using allocators::Fault;
using allocators::Kind;

constexpr char kDefinition[] = R"({"plain": {"member": {
    "data": {"cpptype": "Json::objectValue"}, "id": {"cpptype": "int"},
    "name": {"cpptype": "string"}}}})";

// The records of a list that has failed, at each allocation of SQLite in turn: what their last one
// holds.
TEST(MemoryLimits, LastRecordOfAFailedListMayLackMembers)
{
    Store store;
    std::string strName = "plain";
    std::string strCreate = "create table if not exists plain (id integer primary key)";
    Json::Value jDefinition = leftByReader(kDefinition);
    VornJsonDbApi api(store.get(), strName, jDefinition, strCreate);
    Json::Value jRequest;
    Json::Value jAll;
    ASSERT_EQ(0, api.recList(jRequest, jAll));

    std::set<std::string> lasts;
    for (Fault fault{Kind::kSqlite, 1, false};; ++fault.iNth) {
        Json::Value jRecords;
        allocators::arm(fault);
        const int iResult = api.recList(jRequest, jRecords);
        if (0 == allocators::disarm()) break;
        EXPECT_EQ(-1, iResult);
        for (Json::ArrayIndex i = 0; i + 1 < jRecords.size(); ++i) EXPECT_EQ(jAll[i], jRecords[i]);
        if (!jRecords.empty()) lasts.insert(text(jRecords[jRecords.size() - 1]));
    }
    EXPECT_EQ(1U, lasts.count(R"({"data":{"n":1},"name":"the first of the rows alike"})"));
}

// In a process that has not asked for the local time yet.
std::string localTime(bool blHostAskedForTheZone)
{
    if (blHostAskedForTheZone) {
#include "limits/FirstLocalTimeMayBeUtc.inc"
    }
    std::string strTime;
    allocators::arm({Kind::kMalloc, 1, true});
    const int iResult = VORN_JSON_DB::convert2ReadableTime(0, strTime, 4);
    allocators::disarm();
    return 0 == iResult ? strTime : "none";
}

[[noreturn]] void endWith(bool blRight)
{
    _exit(blRight ? 0 : 1);
}

TEST(MemoryLimits, FirstLocalTimeMayBeUtc)
{
    if (!allocators::kOwnMalloc)
        GTEST_SKIP() << "malloc cannot be replaced beside the one of a sanitizer";
    EXPECT_EXIT(endWith("1970-01-01 00:00:00" == localTime(false)), testing::ExitedWithCode(0), "");
    EXPECT_EXIT(endWith("1970-01-01 02:00:00" == localTime(true)), testing::ExitedWithCode(0), "");
}

}  // namespace
