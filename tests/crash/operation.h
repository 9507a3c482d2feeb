// SPDX-License-Identifier: MIT
// What the writer does in one go, as it plans it, tells it and does it.
#pragma once

#include "crash/store.h"

#include <random>
#include <string>
#include <vector>

struct Step {
    enum Kind { kCreate, kReplace, kUpdate, kUpdateKind, kDelete, kDeleteKind, kEnd };

    Kind kind;
    int iId;  // the two of a kind mean all records of its kind
    int iRevision;
};

// One step alone, or several in a transaction of the host that is committed or rolled back.
struct Operation {
    enum Frame { kAlone, kCommit, kRollback };

    Frame frame = kAlone;
    std::vector<Step> steps;
};

// One line without its end, and back. False when it is no such line.
std::string toLine(const Operation& operation);
bool fromLine(const std::string& strLine, Operation& operation);

// What stands in the database once the operation is acknowledged.
State after(State state, const Operation& operation);

// Takes its revisions, and the ids of new records, from iRevision upwards.
Operation plan(const State& state, std::mt19937& random, int& iRevision);

// False when the library or SQLite fails, or gives back anything but what was written.
bool perform(Store& store, const Operation& operation);
