// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// docs/threads-and-processes.md: hosts with one thread, with several, and with children.

#include "docs/section_test.h"

#include <sys/wait.h>
#include <unistd.h>
#include <thread>

namespace {

#include "threads-and-processes/ConnectionPerThread.inc"
#include "threads-and-processes/OneThread.inc"
#include "threads-and-processes/Prefork.inc"

using doubles::state;

constexpr int kWriters = 3;
constexpr int kRecords = 30;
const char kMembers[] = R"({"id":{"cpptype":"long long"},"text":{"cpptype":"string"}})";

class ThreadsAndProcesses : public SectionTest {
protected:
    ThreadsAndProcesses() : SectionTest("threads-and-processes.md") {}
    ~ThreadsAndProcesses() override
    {
        for (const char* szEnd : {"-wal", "-shm"}) unlink((strFile_ + szEnd).c_str());
        unlink(strFile_.c_str());
    }

    // Creates the table; as the main thread or the parent does.
    std::string newTable(const std::string& strSetting)
    {
        Database database(strFile_);
        database.run(strSetting);
        return Table(database, kMembers, "id integer primary key, text text").strName;
    }

    const std::string strFile_ = Database(Database::Place::kFile).path();
};

// What a thread or a child does with its connection: the number of records that it stored.
int stored(sqlite3* pDb, const std::string& strTable)
{
    state().blReallySleep = true;
    std::string strName = strTable;
    std::string strCreate = "create table if not exists " + strName + " (id int, text text)";
    Json::Value jDefinition;
    jDefinition[strName]["member"] = json(kMembers);
    VornJsonDbApi task(pDb, strName, jDefinition, strCreate);
    int iStored = 0;
    for (int i = 0; i < kRecords; ++i) {
        Json::Value jRecord = json(R"({"text":"x"})");
        iStored += storeInTurn(task, jRecord);
    }
    return iStored;
}

std::string strChildsTable;

int workOfAChild(const std::string& strPath)
{
    sqlite3* pDb = openInThread(strPath);
    const int iStored = stored(pDb, strChildsTable);
    return SQLITE_OK == sqlite3_close(pDb) ? iStored : 255;
}

}  // namespace

TEST_F(ThreadsAndProcesses, OneThread)
{
    Database database(strFile_);
    Database other(strFile_);
    Table table(database, kMembers, "id integer primary key, text text");
    other.run("begin immediate");
    EXPECT_FALSE(tryBegin(database.get()));
    other.run("rollback");
    EXPECT_TRUE(tryBegin(database.get()));
    EXPECT_EQ(SQLITE_BUSY,
              doubles::realExec(other.get(), "begin immediate", nullptr, nullptr, nullptr));
    table.create(R"({"id":1,"text":"x"})");
    EXPECT_LE(0, table.api.runSqlEx("commit"));
    EXPECT_TRUE(state().sleeps.empty());
}

TEST_F(ThreadsAndProcesses, ConnectionPerThread)
{
    const std::string strTable = newTable(example(0, "sql"));
    std::vector<std::thread> threads;
    for (int i = 0; i < kWriters; ++i)
        threads.emplace_back([&] {
            sqlite3* pDb = openInThread(strFile_);
            EXPECT_EQ(nullptr, sqlite3_db_mutex(pDb));
            EXPECT_EQ(kRecords, stored(pDb, strTable));
            EXPECT_EQ(SQLITE_OK, sqlite3_close(pDb));
        });
    for (std::thread& thread : threads) thread.join();

    Database database(strFile_);
    Table reader(database, strTable, kMembers, "id int");
    EXPECT_EQ(std::to_string(kWriters * kRecords),
              database.value("select count(*) from " + strTable));

    // A reader does not wait for the writer, who does not wait for the reader.
    Database writer(strFile_);
    writer.run("begin immediate; delete from " + strTable + " where id > 1");
    EXPECT_EQ(static_cast<unsigned>(kWriters * kRecords), json(listed(reader.api)).size());
    database.run("begin; select * from " + strTable);
    writer.run("commit");
    database.run("commit");
    EXPECT_EQ(1U, json(listed(reader.api)).size());
    EXPECT_TRUE(state().sleeps.empty());

    // One that waits in vain, before it writes, and one that fails and leaves no transaction open.
    writer.run("begin immediate");
    takeStatements();
    Json::Value jRecord = json(R"({"text":"x"})");
    EXPECT_FALSE(storeInTurn(reader.api, jRecord));
    EXPECT_EQ(std::vector<std::string>(500, "begin immediate"), takeStatements());
    EXPECT_EQ(500U, state().sleeps.size());
    writer.run("rollback");
    jRecord["text"] = 7;
    EXPECT_FALSE(storeInTurn(reader.api, jRecord));
    EXPECT_TRUE(sqlite3_get_autocommit(database.get()));
}

TEST_F(ThreadsAndProcesses, Prefork)
{
    strChildsTable = newTable("pragma journal_mode=wal");
    std::vector<pid_t> children;
    for (int i = 0; i < kWriters; ++i) children.push_back(startChild(strFile_, workOfAChild));
    for (const pid_t child : children) {
        int iStatus = 0;
        EXPECT_EQ(child, waitpid(child, &iStatus, 0));
        EXPECT_TRUE(WIFEXITED(iStatus));
        EXPECT_EQ(kRecords, WEXITSTATUS(iStatus));
    }
    Database database(strFile_);
    EXPECT_EQ(std::to_string(kWriters * kRecords),
              database.value("select count(*) from " + strChildsTable));
    EXPECT_EQ("ok", database.value("pragma integrity_check"));
}

TEST_F(ThreadsAndProcesses, Settings)
{
    // A busy handler is asked in each attempt.
    Database database(strFile_);
    Database other(strFile_);
    Table table(database, kMembers, "id integer primary key, text text");
    int iAsked = 0;
    const auto asked = [](void* pAsked, int) {
        ++*static_cast<int*>(pAsked);
        return 0;
    };
    sqlite3_busy_handler(database.get(), asked, &iAsked);
    other.run("begin exclusive");
    EXPECT_EQ("-1", listed(table.api));
    EXPECT_EQ(500, iAsked);
    other.run("rollback");

    // The default asks nobody: as many attempts, and nothing but the library's own pauses.
    sqlite3_busy_timeout(database.get(), 0);
    EXPECT_EQ("wal", database.value("pragma journal_mode=wal"));
    for (const std::string strBegin : {"begin", "begin immediate"}) {
        state().sleeps.clear();
        const bool blImmediate = "begin" != strBegin;
        EXPECT_LE(0, table.api.runSqlEx(strBegin));
        EXPECT_NE("-1", listed(table.api));
        const std::string strWrite = "insert into " + table.strName + " (text) values ('other')";
        EXPECT_EQ(blImmediate ? SQLITE_BUSY : SQLITE_OK,
                  doubles::realExec(other.get(), strWrite.c_str(), nullptr, nullptr, nullptr));
        EXPECT_EQ(blImmediate, "-1" != created(table.api, R"({"text":"x"})"));
        EXPECT_EQ(blImmediate ? 0U : 500U, state().sleeps.size());
        EXPECT_LE(0, table.api.runSqlEx("rollback"));
    }
}
