// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// docs/backup.md: copies made while a host writes, what they contain, and what a copied file lacks.

#include "docs/recipe_page.h"

#include <sys/resource.h>
#include <sys/wait.h>
#include <atomic>
#include <chrono>
#include <csignal>
#include <cstdio>
#include <cstdlib>
#include <thread>

namespace {

#include "backup/ASmallerCopy.inc"
#include "backup/CheckTheCopy.inc"
#include "backup/WhileAHostWrites.inc"

// A connection of a host, and its handle.
struct Host {
    explicit Host(const std::string& strFile) : database(strFile)
    {
        database.run("pragma synchronous=off");
    }

    void create(int iId)
    {
        const std::string strData = R"({"n":)" + std::to_string(iId) + "}";
        table.create(R"({"data":)" + strData + R"(,"id":)" + std::to_string(iId) + "}");
    }
    void createRange(int iFirst, int iLast)
    {
        EXPECT_LE(0, table.api.runSqlEx("begin immediate"));
        for (int i = iFirst; i <= iLast; ++i) create(i);
        EXPECT_LE(0, table.api.runSqlEx("commit"));
    }
    std::string mode(const std::string& strMode)
    {
        return database.value("pragma journal_mode=" + strMode);
    }

    Database database;
    Table table{database, "backed_up",
                R"({"data":{"cpptype":"Json::objectValue"},"id":{"cpptype":"int"}})",
                "id integer primary key, data text"};
    VornJsonDbApi& api = table.api;
};

class Backup : public RecipePage {
protected:
    Backup() : RecipePage("backup.md") {}

    const std::string strStore_ = path("tasks.db");
    const std::string strBackup_ = path("backup.db");
};

std::string recordsOf(const std::string& strFile)
{
    Host host(strFile);
    const std::string strRecords = listed(host.api);
    EXPECT_EQ(json(strRecords).size(), countSound(host.api));
    return strRecords;
}

// Whether a process that backs up was killed when its copy was half as large as the database.
bool isKilledHalfway(const std::string& strFrom, const std::string& strTo)
{
    const pid_t pid = fork();
    if (0 == pid) {
        const rlim_t nHalf = std::filesystem::file_size(strFrom) / 2;
        const rlimit half = {nHalf, nHalf};
        const rlimit none = {0, 0};
        if (0 != setrlimit(RLIMIT_CORE, &none) || 0 != setrlimit(RLIMIT_FSIZE, &half)) _exit(2);
        _exit(backUp(strFrom, strTo) ? 0 : 1);
    }
    int iStatus = 0;
    EXPECT_EQ(pid, waitpid(pid, &iStatus, 0));
    return WIFSIGNALED(iStatus) && SIGXFSZ == WTERMSIG(iStatus);
}

}  // namespace

TEST_F(Backup, WhileAHostWrites)
{
    for (const char* szMode : {"delete", "wal"}) {
        SCOPED_TRACE(szMode);
        Host host(strStore_);
        EXPECT_EQ(szMode, host.mode(szMode));
        EXPECT_LE(0, host.api.recDeleteAll());
        std::atomic<int> iAcknowledged{0};
        std::atomic<bool> blStop{false};
        // Ten records in each transaction.
        std::thread writer([&] {
            doubles::state().blReallySleep = true;
            Host writing(strStore_);
            while (!blStop) {
                const int iLast = iAcknowledged + 10;
                writing.createRange(iLast - 9, iLast);
                iAcknowledged = iLast;
                std::this_thread::sleep_for(std::chrono::milliseconds(1));
            }
        });
        doubles::state().blReallySleep = true;
        for (int i = 0; i < 20; ++i) {
            while (0 == iAcknowledged) std::this_thread::yield();
            const int iBefore = iAcknowledged;
            EXPECT_TRUE(backUp(strStore_, strBackup_));
            const int iAfter = iAcknowledged;
            const Json::Value jRecords = json(recordsOf(strBackup_));
            const int iRecords = static_cast<int>(jRecords.size());
            EXPECT_EQ(0, iRecords % 10);
            EXPECT_LE(iBefore, iRecords);
            EXPECT_GE(iAfter + 10, iRecords);  // committed and not yet acknowledged
            for (int n = 1; n <= iRecords; ++n) {
                const std::string strId = std::to_string(n);
                EXPECT_EQ(R"({"data":{"n":)" + strId + R"(},"id":)" + strId + "}",
                          text(jRecords[static_cast<Json::ArrayIndex>(n - 1)]));
            }
        }
        blStop = true;
        writer.join();
    }

    // One that fails leaves the backup before it alone.
    const std::string strKept = path("kept.db");
    const std::string strSmall = path("small.db");
    Host(strSmall).createRange(1, 10);
    EXPECT_TRUE(backUp(strSmall, strKept));
    const std::string strRecords = recordsOf(strKept);
    EXPECT_FALSE(backUp(path("nowhere.db"), strKept));
    EXPECT_EQ(strRecords, recordsOf(strKept));

    // So does a process that is killed while it copies: the file alone is complete.
    const std::string strLarge = path("large.db");
    Host(strLarge).createRange(1, 2000);
    EXPECT_TRUE(isKilledHalfway(strLarge, strKept));
    const std::string strAlone = path("alone.db");
    std::filesystem::copy_file(strKept, strAlone);
    EXPECT_EQ(strRecords, recordsOf(strAlone));
    EXPECT_TRUE(backUp(strLarge, strKept));
    EXPECT_EQ(recordsOf(strLarge), recordsOf(strKept));
}

TEST_F(Backup, CheckTheCopy)
{
    Host host(strStore_);
    host.createRange(1, 100);
    EXPECT_EQ(100, countSound(host.api));

    // A record that cannot be read, in a sound file.
    host.database.run(
        "pragma writable_schema=on;"
        "update sqlite_master set sql = replace(sql, 'data', 'date');");
    Host second(strStore_);
    EXPECT_EQ(-1, countSound(second.api));
    takeLog();

    // A damaged file, although every record can still be read.
    const std::string strDamaged = path("damaged.db");
    Host damaged(strDamaged);
    damaged.createRange(1, 100);
    damaged.database.run(
        "create index data_index on backed_up (data); pragma writable_schema=on;"
        "update sqlite_master set sql = replace(sql, '(data)', '(id)')"
        "    where name = 'data_index'");
    Host reader(strDamaged);
    EXPECT_EQ(100U, json(listed(reader.api)).size());
    EXPECT_EQ(-1, countSound(reader.api));
}

TEST_F(Backup, ASmallerCopy)
{
    Host host(strStore_);
    host.createRange(1, 2000);
    EXPECT_EQ(1900, deleted(host.api, R"({"vornSqlWhereFilter":"id > 100"})"));
    host.database.run("pragma user_version=3");
    const std::string strRecords = listed(host.api);
    for (const char* szMode : {"delete", "wal"}) {
        EXPECT_EQ(szMode, host.mode(szMode));
        const std::string strSmall = path(std::string("it's ") + szMode + ".db");
        EXPECT_TRUE(backUpSmall(host.database.get(), strSmall));
        EXPECT_EQ(strRecords, recordsOf(strSmall));
        EXPECT_EQ("3", Database(strSmall).value("pragma user_version"));
        EXPECT_LT(4 * std::filesystem::file_size(strSmall), std::filesystem::file_size(strStore_));
        EXPECT_FALSE(backUpSmall(host.database.get(), strSmall));
    }
    host.database.run("begin");
    EXPECT_FALSE(backUpSmall(host.database.get(), path("in a transaction.db")));
    host.database.run("rollback");
}

TEST_F(Backup, Restore)
{
    const std::string& strBackup = strBackup_;
    const std::string& strStore = strStore_;
    const auto restore = [&] {
#include "backup/Restore.inc"
        return true;
    };
    for (const char* szMode : {"delete", "wal"}) {
        SCOPED_TRACE(szMode);
        Host host(strStore_);
        EXPECT_EQ(szMode, host.mode(szMode));
        EXPECT_LE(0, host.api.recDeleteAll());
        host.createRange(1, 500);
        EXPECT_TRUE(backUp(strStore_, strBackup_));
        const std::string strRecords = listed(host.api);
        EXPECT_EQ(400, deleted(host.api, R"({"vornSqlWhereFilter":"id > 100"})"));
        host.createRange(501, 900);
        EXPECT_TRUE(restore());
        EXPECT_EQ(strRecords, listed(host.api));
        host.create(501);
        EXPECT_EQ(501, countSound(host.api));
    }
    std::filesystem::remove(strBackup_);
    EXPECT_FALSE(restore());
    Host host(strStore_);
    EXPECT_EQ(501, countSound(host.api));
}

TEST_F(Backup, DoNotCopyTheFile)
{
    const std::string strCopy = path("copy.db");
    const std::string strCommand =
        "cd '" + std::filesystem::path(strStore_).parent_path().string() + "'\n" + example(0, "sh");
    Host host(strStore_);
    host.createRange(1, 1000);
    EXPECT_EQ(0, system(strCommand.c_str()));
    EXPECT_EQ(1000U, json(recordsOf(strCopy)).size());

    // In WAL mode, records are missing, and nothing tells.
    EXPECT_EQ("wal", host.mode("wal"));
    host.createRange(1001, 1100);
    EXPECT_EQ(0, system(strCommand.c_str()));
    EXPECT_EQ(1000U, json(recordsOf(strCopy)).size());

    // A backup copied over a database whose -wal is there is damaged by it.
    EXPECT_TRUE(backUp(strStore_, strBackup_));
    const std::string strRecords = recordsOf(strBackup_);
    host.createRange(1101, 2000);
    const std::string strKilled = path("killed.db");
    std::filesystem::copy_file(strStore_ + "-wal", strKilled + "-wal");
    std::filesystem::copy_file(strBackup_, strKilled);
    Host killed(strKilled);
    EXPECT_NE(strRecords, listed(killed.api));

    // In the middle of a transaction.
    EXPECT_EQ("delete", host.mode("delete"));
    host.database.run("pragma cache_size=1; begin; update backed_up set data = '{\"n\":0}'");
    EXPECT_EQ(0, system(strCommand.c_str()));
    host.database.run("rollback");
    Database copy(strCopy);
    EXPECT_NE("0", copy.value("select count(*) from backed_up where data = '{\"n\":0}'"));
}
