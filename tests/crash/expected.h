// SPDX-License-Identifier: MIT
// What has to be in the database, by the reports of its writers, and the check that it is.
#pragma once

#include "crash/operation.h"

#include <optional>
#include <string>

// The file descriptor of a writer's reports.
constexpr int kReport = 3;

struct Expected {
    State state;                       // acknowledged
    std::optional<Operation> pending;  // begun and not acknowledged
    int iLastRevision = 0;
    long long iAcknowledged = 0;

    // A line of a writer. False when it is none.
    bool take(const std::string& strLine);
};

struct Verdict {
    enum Pending { kNone, kAbsent, kWhole };

    Pending pending = kNone;
    std::string strWrong;    // what is lost, half there or not as acknowledged
    std::string strCorrupt;  // what SQLite finds
};

// Opens the database as a host would. The pending operation may be absent or there as a whole.
Verdict check(const std::string& strPath, const Expected& expected);
