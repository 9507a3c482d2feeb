// SPDX-License-Identifier: MIT
#include "faults/files/aftermath.h"

#include "faults/files/fault_vfs.h"

#include <algorithm>
#include <thread>

namespace {

// Asked from another thread, as SQLite's mutexes let their holder in again.
bool isMutexFree(sqlite3* pDb)
{
    sqlite3_mutex* const pMutex = sqlite3_db_mutex(pDb);
    int iStatus = SQLITE_ERROR;
    std::thread([&] {
        iStatus = sqlite3_mutex_try(pMutex);
        if (SQLITE_OK == iStatus) sqlite3_mutex_leave(pMutex);
    }).join();
    return nullptr != pMutex && SQLITE_OK == iStatus;
}

void expectWorking(Table& table, Database& other)
{
    EXPECT_EQ(0, table.api.tableCreate());
    const int iBefore = std::stoi(other.value("select count(*) from records"));
    const char szRecord[] = R"({"id":77,"name":"after","note":"n","tags":{"k":7}})";
    Json::Value jRecord = json(szRecord);
    Json::Value jStored;
    EXPECT_EQ(0, table.api.recCreate(jRecord, jStored));
    EXPECT_EQ(szRecord, text(jStored));
    Json::Value jRequest;
    Json::Value jRecords;
    EXPECT_EQ(0, table.api.recList(jRequest, jRecords));
    EXPECT_EQ(iBefore + 1, static_cast<int>(jRecords.size()));
    EXPECT_EQ(Lines(), takeLog());
}

}  // namespace

void expectNothingLeft(Host& host, const DiskFile& file, const std::vector<std::string>& contents)
{
    EXPECT_EQ(nullptr, sqlite3_next_stmt(host.database.get(), nullptr));
    EXPECT_TRUE(isMutexFree(host.database.get()));
    EXPECT_TRUE(sqlite3_get_autocommit(host.database.get()));
    Database other(file.path(), fault_vfs::name());
    other.run("insert into bystander values (1)");
    EXPECT_EQ("1", other.value("select count(*) from bystander"));
    EXPECT_EQ("ok", other.value("pragma integrity_check"));
    const std::string strFound = ::contents(file);
    EXPECT_TRUE(contents.end() != std::find(contents.begin(), contents.end(), strFound))
        << strFound;
    expectWorking(host.table, other);
}
