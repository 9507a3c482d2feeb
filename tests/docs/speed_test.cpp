// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// docs/speed.md: commits, waits for the disk, scanned rows and the library's part, all counted.

#include "docs/section_test.h"

#include <unistd.h>
#include <atomic>
#include <cstdlib>

namespace {

#include "speed/MemoryStatistics.inc"
#include "speed/Transactions.inc"

std::atomic<int> iSyncs{0};

// Without a database: one of the tests needs a process in which SQLite is not initialised.
class Speed : public SectionTest {
protected:
    Speed() : SectionTest("speed.md") {}
};

struct Tasks {
    Database database{Database::Place::kFile};
    Table table{database, R"({"id":{"cpptype":"long long"},"text":{"cpptype":"string"}})",
                "id integer primary key, text text"};
};

// Ten records, the first with this id.
Json::Value tenRecords(int iFirst)
{
    Json::Value jRecords;
    for (int i = 0; i < 10; ++i) {
        jRecords[i]["id"] = iFirst + i;
        jRecords[i]["text"] = "x";
    }
    return jRecords;
}

// The number of instructions of an operation, from the table of docs/performance.md.
double instructions(const std::string& strContender, const std::string& strOperation)
{
    static const MarkdownTable counts = table(readPage("performance.md"), "Instructions", 14);
    for (std::size_t i = 1; i < counts.header.size(); ++i)
        for (const auto& row : counts.rows)
            if (strOperation == counts.header[i] && strContender == row[0])
                return std::stod(replaced(row[i], ",", ""));
    ADD_FAILURE() << strContender << ", " << strOperation;
    return 0;
}

}  // namespace

// What SQLite calls to wait for the disk. The tests do not wait for it.
extern "C" {
int fsync(int /*iFile*/)
{
    ++iSyncs;
    return 0;
}

int fdatasync(int /*iFile*/)
{
    ++iSyncs;
    return 0;
}
}

TEST_F(Speed, LibrarysPart)
{
    for (const auto& row : table(pageOf("speed.md"), "What the library costs", 5).rows) {
        const double dLibrary = instructions("this library", row[0]);
        const double dPart = 100 * (1 - instructions("the floor", row[0]) / dLibrary);
        // The figures of that page change a little with each measurement.
        EXPECT_NEAR(dPart, std::stod(row[1]), 3) << row[0];
    }
}

TEST_F(Speed, Transactions)
{
    Tasks tasks;
    int iCommits = 0;
    const auto count = [](void* pCommits) {
        ++*static_cast<int*>(pCommits);
        return 0;
    };
    sqlite3_commit_hook(tasks.database.get(), count, &iCommits);
    Json::Value jRecords = tenRecords(1);
    for (Json::Value& jRecord : jRecords) tasks.table.create(text(jRecord));
    EXPECT_EQ(10, iCommits);
    jRecords = tenRecords(11);
    EXPECT_TRUE(createAll(tasks.table.api, jRecords));
    EXPECT_EQ(11, iCommits);

    // The last one is there already: none is stored.
    const std::string strBefore = listed(tasks.table.api);
    EXPECT_EQ(20U, json(strBefore).size());
    jRecords = tenRecords(21);
    jRecords[9]["id"] = 20;
    EXPECT_FALSE(createAll(tasks.table.api, jRecords));
    EXPECT_EQ(11, iCommits);
    EXPECT_EQ(strBefore, listed(tasks.table.api));
    EXPECT_TRUE(sqlite3_get_autocommit(tasks.database.get()));
    sqlite3_commit_hook(tasks.database.get(), nullptr, nullptr);
}

TEST_F(Speed, WalAndSynchronous)
{
    Tasks tasks;
    std::string strResult;
    const auto syncsOfTen = [&](bool blTogether) {
        tasks.table.api.recDeleteAll();
        iSyncs = 0;
        if (blTogether) tasks.table.api.runSqlEx("begin immediate");
        for (const Json::Value& jRecord : tenRecords(1)) tasks.table.create(text(jRecord));
        if (blTogether) tasks.table.api.runSqlEx("commit");
        const int iCounted = iSyncs;
        // The settings change nothing about the result.
        const std::string strListed = listed(tasks.table.api);
        if (strResult.empty()) strResult = strListed;
        EXPECT_EQ(strResult, strListed);
        return std::to_string(iCounted);
    };
    for (const auto& row : table(pageOf("speed.md"), "WAL and synchronous", 4).rows) {
        SCOPED_TRACE(row[0] + ", " + row[1]);
        EXPECT_EQ(row[0], tasks.database.value("pragma journal_mode=" + row[0]));
        tasks.database.run("pragma synchronous=" + row[1]);
        EXPECT_EQ(row[2], syncsOfTen(false));
        EXPECT_EQ(row[3], syncsOfTen(true));
    }

    Database again(tasks.database.path());
    again.run(example(0, "sql"));
    EXPECT_EQ("wal", again.value("pragma journal_mode"));
    EXPECT_EQ("1", again.value("pragma synchronous"));
}

TEST_F(Speed, Indexes)
{
    Database database;
    const char kMembers[] =
        R"({"id":{"cpptype":"long long"},"team":{"cpptype":"string"},"text":{"cpptype":"string"}})";
    std::string strName = "task";
    Json::Value jDefinition;
    jDefinition[strName]["member"] = json(kMembers);
    std::string strCreate = example(0, "sql");
    VornJsonDbApi task(database.get(), strName, jDefinition, strCreate);
    for (const char* szTeam : {"blue", "red", "blue", "red", "blue"})
        created(task, std::string(R"({"team":")") + szTeam + R"(","text":"x"})");

    int iScanned = 0;
    const auto ended = [](unsigned, void* pScanned, void* pStatement, void*) {
        *static_cast<int*>(pScanned) += sqlite3_stmt_status(static_cast<sqlite3_stmt*>(pStatement),
                                                            SQLITE_STMTSTATUS_FULLSCAN_STEP, 0);
        return 0;
    };
    sqlite3_trace_v2(database.get(), SQLITE_TRACE_PROFILE, ended, &iScanned);
    const std::string strRed = listed(task, example());
    EXPECT_EQ(2U, json(strRed).size());
    EXPECT_EQ(0, iScanned);
    database.run("drop index task_team");
    iScanned = 0;
    EXPECT_EQ(strRed, listed(task, example()));
    EXPECT_EQ(4, iScanned);
    sqlite3_trace_v2(database.get(), 0, nullptr, nullptr);
}

namespace {

// In a process in which SQLite is not initialised yet.
[[noreturn]] void useSqliteWithoutStatistics()
{
    bool blRight = withoutMemoryStatistics();
    {
        Database database;
        Table table(database, R"({"id":{"cpptype":"int"}})", "id integer primary key");
        blRight = blRight && R"({"id":1})" == text(table.create(R"({"id":1})"));
        blRight = blRight && 0 == sqlite3_memory_used();
        blRight = blRight && !withoutMemoryStatistics();
    }
    exit(blRight ? 0 : 1);
}

}  // namespace

TEST_F(Speed, MemoryStatistics)
{
    testing::GTEST_FLAG(death_test_style) = "threadsafe";
    // Begins this test again in a new process.
    EXPECT_EXIT(useSqliteWithoutStatistics(), testing::ExitedWithCode(0), "");
    EXPECT_LT(0, (Database(), sqlite3_memory_used()));
}
