// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// Each allocation of each operation fails in turn: std::bad_alloc or a reason, nothing is left open
// and nothing is written.
#include "front/front.h"

#include <functional>

namespace {

constexpr char kMembers[] = R"({
    "id":   {"cpptype": "long long"},
    "name": {"cpptype": "string"},
    "tags": {"cpptype": "Json::arrayValue", "cppDefaultValue": []}})";
constexpr char kColumns[] = "id integer primary key, name text unique, tags text";

using Operation = std::function<long long(VornJsonTable&)>;

const std::pair<const char*, Operation> kOperations[] = {
    {"create",
     [](VornJsonTable& table) {
         Json::Value jStored;
         return table.create(json(R"({"id":9,"name":"x","tags":["%s"]})"), jStored);
     }},
    {"duplicate",
     [](VornJsonTable& table) {
         Json::Value jStored;
         return table.create(json(R"({"name":"a"})"), jStored);
     }},
    {"createMany",
     [](VornJsonTable& table) {
         return table.createMany(json(R"([{"id":7},{"id":8,"name":"y"},{"id":9,"name":"x"}])"));
     }},
    {"save",
     [](VornJsonTable& table) {
         Json::Value jStored;
         return table.save(json(R"({"id":1,"name":"x"})"), jStored);
     }},
    {"update",
     [](VornJsonTable& table) {
         return table.update(json(R"({"id":{"$lt":9}})"), json(R"({"tags":[1]})"));
     }},
    {"remove", [](VornJsonTable& table) { return table.remove(json(R"({"name":"a"})")); }},
    {"list",
     [](VornJsonTable& table) {
         Json::Value jRecords;
         return table.list(json(R"({"name":{"$in":["a",null]}})"), json(R"({"sort":["-name"]})"),
                           jRecords);
     }},
    {"each",
     [](VornJsonTable& table) {
         return table.each({}, {}, [](const Json::Value&) { return true; });
     }},
    {"count", [](VornJsonTable& table) { return table.count(json(R"({"id":1})")); }},
};

class FrontMemory : public FrontTest {
protected:
    FrontMemory() { EXPECT_EQ("2", front_.createMany(json(kRecords))); }

    // True if the call ended before the allocation that was to fail.
    bool survives(const Operation& operation, int iAllocation)
    {
        const int iAutocommit = sqlite3_get_autocommit(database_.get());
        const Rows before = front_.rows("select * from @");
        doubles::state().iFailNew = iAllocation;
        bool blFailed = false;
        try {
            blFailed = 0 > operation(*front_.table);
        } catch (const std::bad_alloc&) {
            blFailed = true;
        }
        const bool blReached = 0 == doubles::state().iFailNew;
        doubles::state().iFailNew = 0;
        EXPECT_EQ(iAutocommit, sqlite3_get_autocommit(database_.get()));
        EXPECT_EQ(nullptr, sqlite3_next_stmt(database_.get(), nullptr));
        if (blFailed) {
            EXPECT_EQ(before, front_.rows("select * from @"));
        }
        front_.run("delete from @; insert into @ values (1,'a','[]'),(2,'b','[2]')");
        return !blReached;
    }

    void expectSound()
    {
        for (const auto& [szName, operation] : kOperations) {
            SCOPED_TRACE(szName);
            int iAllocation = 1;
            while (!survives(operation, iAllocation) && !HasFailure()) ++iAllocation;
            EXPECT_LT(20, iAllocation);
        }
    }

    static constexpr char kRecords[] = R"([{"id":1,"name":"a"},{"id":2,"name":"b","tags":[2]}])";
    Front front_{database_, kMembers, kColumns};
};

TEST_F(FrontMemory, LeavesNothingOpen)
{
    expectSound();
}

TEST_F(FrontMemory, LeavesTheHostsTransactionAsItWas)
{
    database_.run("begin");
    expectSound();
    database_.run("commit");
}

}  // namespace
