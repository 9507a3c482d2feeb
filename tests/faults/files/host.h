// SPDX-License-Identifier: MIT
// A host on a disk that may fail: a database file of a few records, a connection to it and a
// handle.
#pragma once

#include "support/database.h"

#include <string>

enum class Journal { kDelete, kWal };

// The columns of the table "records".
constexpr char kWithKeys[] = "id integer primary key, name text unique, note text, tags text";
constexpr char kWithoutKeys[] = "id integer, name text, note text, tags text";

constexpr int kRecords = 12;

// A database file that is brought back to its first state before each trial.
class DiskFile {
public:
    struct Form {
        Journal journal = Journal::kDelete;
        // Otherwise there is only the table of the bystander.
        bool blWithRecords = true;
        int iPageSize = 512;
        const char* szColumns = kWithKeys;
    };

    explicit DiskFile(const Form& form);
    ~DiskFile();
    DiskFile(const DiskFile&) = delete;
    DiskFile& operator=(const DiskFile&) = delete;

    void restore() const;
    const std::string& path() const { return strPath_; }

private:
    std::string strFolder_;
    std::string strFirstState_;
    std::string strPath_;
};

// With a connection that has not read anything yet and keeps next to nothing in memory, so that
// every operation goes to the disk.
class Host {
public:
    explicit Host(const DiskFile& file);

    Database database;
    Table table;
};

// What another program sees: everything in the file but the bystander's rows.
std::string contents(const DiskFile& file);
