// SPDX-License-Identifier: MIT
#include "faults/files/host.h"

#include "faults/files/fault_vfs.h"

#include <unistd.h>
#include <filesystem>

namespace fs = std::filesystem;

namespace {

const char kMembers[] = R"({"id":   {"cpptype": "int"},
                            "name": {"cpptype": "string"},
                            "note": {"cpptype": "string", "cppDefaultValue": "none"},
                            "tags": {"cpptype": "Json::objectValue", "cppDefaultValue": {}}})";

// Pages are small, so that a dozen records need many of them; the cache holds one page, so that
// changed pages are written before the end of a statement; the file shrinks with its contents.
std::string firstState(const DiskFile::Form& form)
{
    std::string strSql = "pragma page_size=" + std::to_string(form.iPageSize) + ";";
    strSql += "pragma auto_vacuum=full; pragma default_cache_size=1;";
    strSql += Journal::kWal == form.journal ? "pragma journal_mode=wal;" : "";
    strSql += "create table bystander (a);";
    if (!form.blWithRecords) return strSql;
    return strSql + "create table records (" + form.szColumns + ");" +
           "with recursive n(i) as (select 1 union all select i+1 from n where i < " +
           std::to_string(kRecords) +
           ") insert into records select i, 'name' || i, printf('%.300c', 'x'), '{\"k\":1}' from "
           "n;";
}

void removeFiles(const std::string& strPath)
{
    for (const char* szTail : {"", "-journal", "-wal", "-shm"}) fs::remove(strPath + szTail);
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
    fs::remove_all(strFolder_);  // of a process that had this number and was killed
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
    removeFiles(strPath_);
    fs::copy_file(strFirstState_, strPath_);
}

Host::Host(const DiskFile& file)
    : database(file.path(), fault_vfs::name()), table(untouched(database))
{
    // WAL: every commit is carried over into the database at once.
    sqlite3_wal_autocheckpoint(database.get(), 1);
}

std::string contents(const DiskFile& file)
{
    Database other(file.path(), fault_vfs::name());
    const auto append = [](std::string& strOut, const Rows& rows) {
        for (const auto& row : rows) {
            for (const std::string& strValue : row) strOut.append(strValue).append("|");
            strOut += "\n";
        }
    };
    std::string strOut;
    const Rows schema = other.rows("select name, sql from sqlite_master order by name");
    append(strOut, schema);
    for (const auto& row : schema)
        if ("records" == row[0]) append(strOut, other.rows("select * from records order by rowid"));
    return strOut;
}
