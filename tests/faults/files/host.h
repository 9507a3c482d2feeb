// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// A host on a disk that may fail: a database file of a few records, a connection to it and a
// handle.
#pragma once

#include "support/operations.h"

#include <string>
#include <vector>

enum class Journal { kDelete, kWal };

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
    // What another program sees: everything in the file but the bystander's rows.
    std::string contents() const;
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

    int run(const Operation& operation, Json::Value& jOutput)
    {
        return operation.run(database, table, jOutput);
    }

    // After an operation, whatever failed in it: nothing is stuck, the file has one of these
    // contents, and the handle still works.
    void expectNothingLeft(const DiskFile& file, const std::vector<std::string>& contents);

    Database database;
    Table table;
};
