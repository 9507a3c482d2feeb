// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// What threads share: the member types of tables, and a file.

#include "in_threads.h"
#include "support/rows.h"

#include <atomic>
#include <set>

namespace {

using ThreadsTogether = HostTest;

// Each definition may be the first that a name meets. A thread logs what the checks of its own
// definition find, or as it does where it finds the table there.
TEST_F(ThreadsTogether, AgreeOnTheTypesOfANewTable)
{
    const char* const definitions[] = {R"({"$":{"member":{"a":{"cpptype":"int"}}}})",
                                       R"({"$":{"member":{"b":{"cpptype":"bool"},"c":{}}}})",
                                       R"({"$":{"member":{}}})", "null"};
    const auto logged = [](Json::Value& jDefinition, std::string& strName) {
        VORN_JSON_DB::recType(jDefinition, strName);
        std::string strLines;
        for (const std::string& strLine : takeLogWithoutTypes()) strLines += strLine + '\n';
        return strLines;
    };
    const char szAlone[] = "@#~^";  // the names of tables that have one definition each
    std::string loggedAlone[4];
    for (std::size_t i = 0; i < 4; ++i) {
        std::string strName(1, szAlone[i]);
        Json::Value jDefinition = json(replaced(definitions[i], '$', strName));
        loggedAlone[i] = logged(jDefinition, strName);
    }
    constexpr int kNames = 1000;
    std::atomic<int> iReady{0};
    std::vector<std::vector<const Json::Value*>> found(kThreads);
    inThreads(kThreads, [&](int i) {
        for (int iName = 0; iName < kNames; ++iName) {
            std::string strName = "first" + std::to_string(iName);
            const int iFirst = iName % 5;  // all bring the same definition where it is 4
            const std::size_t n = 4 == iFirst ? 0 : static_cast<std::size_t>(i + iFirst) % 4;
            Json::Value jDefinition = json(replaced(definitions[n], '$', strName));
            for (++iReady; iReady < kThreads * (iName + 1);) std::this_thread::yield();
            const std::string strLogged = logged(jDefinition, strName);
            const std::string strOwn = replaced(loggedAlone[n], szAlone[n], strName);
            EXPECT_EQ(strOwn == strLogged ? strOwn : logged(jDefinition, strName), strLogged);
            found[static_cast<std::size_t>(i)].push_back(
                &VORN_JSON_DB::recType(jDefinition, strName));
            takeLog();
        }
    });
    const std::string strWhole = R"({"a":{"cpptype":"int"}})";
    const std::set<std::string> possible = {strWhole, R"({"b":{"cpptype":"bool"}})", "null"};
    for (std::size_t iName = 0; iName < kNames; ++iName) {
        for (const auto& ofThread : found) EXPECT_EQ(found[0][iName], ofThread[iName]);
        const std::string strTypes = text(*found[0][iName]);
        EXPECT_EQ(1U, possible.count(strTypes)) << strTypes;
        EXPECT_TRUE(4 != iName % 5 || strWhole == strTypes) << strTypes;
    }
    printf("figure: threads, first uses of one name at once = %d\n", kNames);
}

// Member types may be changed while no other thread is in the library.
TEST_F(ThreadsTogether, SeeTypesThatWereChangedBefore)
{
    Database database;
    const char szMembers[] = R"({"a":{"cpptype":"int"}})";
    Table table(database, szMembers, "a");
    const auto listedByThreads = [&] {
        std::vector<std::string> listed(kThreads);
        inThreads(kThreads, [&](int i) {
            Database own;
            Table ofThread(own, table.strName, szMembers, "a");
            own.run("insert into " + table.strName + " values (7)");
            listed[static_cast<std::size_t>(i)] = called(ofThread.api, {"recGetOne", "{}"}).whole();
        });
        return std::set<std::string>(listed.begin(), listed.end());
    };
    Json::Value& jType = VORN_JSON_DB::recType(table.jDefinition, table.strName)["a"];
    EXPECT_EQ(std::set<std::string>{R"(1 {"a":7,"kept":1})"}, listedByThreads());
    jType["cpptype"] = "string";
    EXPECT_EQ(std::set<std::string>{R"(1 {"a":"7","kept":1})"}, listedByThreads());
}

TEST_F(ThreadsTogether, StoreTheirRecordsInOneFile)
{
    Database file(Database::Place::kFile);
    file.run("pragma journal_mode=wal");
    const int nRecords = 50 * kMore;
    const auto open = [&](Database& database) {
        return Table(database, "shared", R"({"id":{"cpptype":"int"},"v":{"cpptype":"string"}})",
                     "id integer primary key, v text");
    };
    Table all = open(file);
    inThreads(kThreads, [&](int i) {
        doubles::state().blReallySleep = true;
        Database database(file.path());
        sqlite3_busy_timeout(database.get(), 1000);
        Table table = open(database);
        for (int n = 0; n < nRecords; ++n) {
            const std::string strId = std::to_string(n * kThreads + i);
            const std::string strRecord = R"({"id":)" + strId + R"(,"v":"of )" + strId + "\"}";
            EXPECT_EQ(json(strRecord), table.create(strRecord));
            EXPECT_EQ("1 " + strRecord,
                      called(table.api, {"recGetOne", R"({"id":)" + strId + "}", "{}"}).whole());
        }
        EXPECT_EQ(Lines(), takeLog());
    });
    Json::Value jAll;
    Json::Value jRequest;
    EXPECT_EQ(0, all.api.recList(jRequest, jAll));
    EXPECT_EQ(static_cast<unsigned>(nRecords * kThreads), jAll.size());
}

}  // namespace
