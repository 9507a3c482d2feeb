// SPDX-License-Identifier: MIT
// The database that the killed writer and the checker share, what the writer does with it, and what
// has to be in it according to the writer's reports.
#pragma once

#include "support/connection.h"

#include <VornJsonDbApi.h>

#include <map>
#include <optional>
#include <random>
#include <string>
#include <vector>

// The file descriptor of a writer's reports.
constexpr int kReport = 3;

// Revision by id. What a record holds follows from the two, and no revision is given twice.
using State = std::map<int, int>;

// A host's connection and its handle on the one table.
class Store {
public:
    explicit Store(const std::string& strPath);
    // False if a statement was left open.
    bool close();
    ~Store() { close(); }
    Store(const Store&) = delete;
    Store& operator=(const Store&) = delete;

    VornJsonDbApi& api() { return api_; }
    sqlite3* connection() const { return pDb_; }
    // Statements of the host itself; false when SQLite refuses.
    bool run(const std::string& strSql) { return sqlite::value(pDb_, strSql).empty(); }
    // Every record, as the library lists them. False when it fails.
    bool list(Json::Value& jRecords);

private:
    sqlite3* pDb_;
    std::string strName_ = "item";
    std::string strCreate_;
    Json::Value jDefinition_;
    VornJsonDbApi api_;
};

struct Step {
    enum Kind { kCreate, kReplace, kUpdate, kUpdateKind, kDelete, kDeleteKind, kEnd };

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

// An operation as one line without its end, and back. False if it is not such a line.
std::string toLine(const Operation& operation);
bool fromLine(const std::string& strLine, Operation& operation);

// What is in the database once the operation is acknowledged.
State after(State state, const Operation& operation);

// Takes its revisions, and the ids of new records, from iRevision upwards.
Operation plan(const State& state, std::mt19937& random, int& iRevision);

// False when the library or SQLite fails, or gives back anything but what was written.
bool perform(Store& store, const Operation& operation);

struct Expected {
    State state;                       // acknowledged
    std::optional<Operation> pending;  // begun and not acknowledged
    int iLastRevision = 0;
    long long iAcknowledged = 0;

    // A line of a writer. False when it is not one.
    bool take(const std::string& strLine);
};

struct Verdict {
    enum Pending { kNone, kAbsent, kWhole };

    Pending pending = kNone;
    std::string strWrong;    // what is lost, incomplete or not as acknowledged
    std::string strCorrupt;  // what SQLite finds
};

// Opens the database as a host would. The pending operation may be absent or there as a whole.
Verdict check(const std::string& strPath, const Expected& expected);
