// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// The database that the killed writer and the checker share, what the writer does with it, and what
// has to be in it according to the writer's reports.
#pragma once

#include <VornJsonDbApi.h>

#include <map>
#include <optional>
#include <random>
#include <string>
#include <vector>

// Revision by id. What a record holds follows from the two, and no revision is given twice.
using State = std::map<int, int>;

// A host's connection and its handle on the one table.
struct Store {
    explicit Store(const std::string& strPath);
    ~Store();
    Store(const Store&) = delete;
    Store& operator=(const Store&) = delete;

    // Every record, as the library lists them. False when it fails.
    bool list(Json::Value& jRecords);

    sqlite3* pDb;
    std::string strName = "item";
    std::string strCreate;
    Json::Value jDefinition;
    VornJsonDbApi api;
};

struct Step {
    enum Kind { kCreate, kReplace, kUpdate, kUpdateKind, kDelete, kDeleteKind };

    Kind kind;
    int iId;  // for kUpdateKind and kDeleteKind, any id of the kind
    int iRevision;
};

// What a writer does in one go: one step alone, or several in a transaction of the host that is
// committed or rolled back.
struct Operation {
    enum Frame { kAlone, kCommit, kRollback };

    Frame frame = kAlone;
    std::vector<Step> steps;
};

// What is in the database once the operation is acknowledged.
State after(State state, const Operation& operation);

// Takes its revisions, and the ids of new records, from iRevision upwards. A writer and its parent
// plan the same operations, each on its own.
Operation plan(const State& state, std::mt19937& random, int& iRevision);

// False when the library or SQLite fails, or gives back anything but what was written.
bool perform(Store& store, const Operation& operation);

struct Expected {
    State state;                       // acknowledged
    std::optional<Operation> pending;  // begun and not acknowledged
};

struct Verdict {
    enum Pending { kNone, kAbsent, kWhole };

    Pending pending = kNone;
    std::string strWrong;    // what is lost, incomplete or not as acknowledged
    std::string strCorrupt;  // what SQLite finds
};

// Opens the database as a host would. The pending operation may be absent or there as a whole.
Verdict check(const std::string& strPath, const Expected& expected);
