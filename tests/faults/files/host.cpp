// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
#include "faults/files/host.h"

#include "faults/files/fault_vfs.h"
#include "support/connection.h"

#include <unistd.h>
#include <algorithm>
#include <filesystem>

namespace fs = std::filesystem;

namespace {

// Pages are small, so that a dozen records need many of them; the cache holds one page, so that
// changed pages are written before the end of a statement; the file shrinks with its contents.
std::string firstState(const DiskFile::Form& form)
{
    std::string strSql = "pragma page_size=" + std::to_string(form.iPageSize) + ";";
    strSql += "pragma auto_vacuum=full; pragma default_cache_size=1;";
    strSql += Journal::kWal == form.journal ? "pragma journal_mode=wal;" : "";
    strSql += "create table bystander (a);";
    return form.blWithRecords ? strSql + recordsSql(form.szColumns) : strSql;
}

// The handle's CREATE statement is not run, so that the operation under trial is the first to
// touch the file.
Table untouched(Database& database)
{
    doubles::state().exec = [](auto...) { return SQLITE_OK; };
    struct Restore {
        ~Restore() { doubles::state().exec = nullptr; }
    } restore;
    return Table(database, "records", kMembers, kWithKeys);
}

}  // namespace

DiskFile::DiskFile(const Form& form)
{
    static int iCount = 0;
    strFolder_ = fs::temp_directory_path() /
                 ("vornjsondb-faults-" + std::to_string(getpid()) + "-" + std::to_string(++iCount));
    strFirstState_ = strFolder_ + "/first";
    strPath_ = strFolder_ + "/db";
    fs::remove_all(strFolder_);  // of a killed process that had the same id
    fs::create_directory(strFolder_);
    Database(strFirstState_, fault_vfs::name()).run(firstState(form));
    restore();
}

DiskFile::~DiskFile()
{
    fs::remove_all(strFolder_);
}

void DiskFile::restore() const
{
    for (const char* szTail : {"", "-journal", "-wal", "-shm"}) fs::remove(strPath_ + szTail);
    fs::copy_file(strFirstState_, strPath_);
}

std::string DiskFile::contents() const
{
    Database other(strPath_, fault_vfs::name());
    const std::string strSchema =
        sqlite::value(other.get(), "select name, sql, ';' from sqlite_master order by name");
    if (std::string::npos == strSchema.find("records")) return strSchema;
    return strSchema + sqlite::value(other.get(),
                                     "select id, '|', name, '|', note, '|', tags, ';' from records "
                                     "order by rowid");
}

Host::Host(const DiskFile& file)
    : database(file.path(), fault_vfs::name()), table(untouched(database))
{
    // WAL: every commit is copied into the database at once.
    sqlite3_wal_autocheckpoint(database.get(), 1);
}

void Host::expectNothingLeft(const DiskFile& file, const std::vector<std::string>& contents)
{
    Database other(file.path(), fault_vfs::name());
    EXPECT_EQ("", sqlite::whatIsStuck(database.get(), other.get()));
    const std::string strFound = file.contents();
    EXPECT_TRUE(contents.end() != std::find(contents.begin(), contents.end(), strFound))
        << strFound;

    EXPECT_EQ(0, table.api.tableCreate());
    const int iBefore = std::stoi(other.value("select count(*) from records"));
    const char szRecord[] = R"({"id":77,"name":"after","note":"n","tags":{"k":7}})";
    EXPECT_EQ(szRecord, text(table.create(szRecord)));
    Json::Value jRequest;
    Json::Value jRecords;
    EXPECT_EQ(0, table.api.recList(jRequest, jRecords));
    EXPECT_EQ(iBefore + 1, static_cast<int>(jRecords.size()));
    EXPECT_EQ(Lines(), takeLog());
}
