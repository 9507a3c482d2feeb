// SPDX-License-Identifier: MIT
// The example's tables, the table of somebody else beside them, and the host behind none, one or
// both of its layers.
#pragma once

#include "support/database.h"

#include "examples/guarded/fence.h"
#include "examples/guarded/host.h"

#include <memory>
#include <string>
#include <vector>

// A line for World::send(): the host itself reads note 1 and saves it again.
inline constexpr char kHostSavesAgain[] = "(the host saves note 1 again)";

class World {
public:
    enum class Layers { kNone, kGuard, kFence, kBoth };

    explicit World(Layers layers, unsigned uMoreNotes = 0);

    // Sends a line and keeps its answer. Without the guard the reader takes what it can.
    void send(const std::string& strLine);

    // Takes the layers away, so that a test can look at the database.
    void stop();

    // The only value of a query; both tables and the schema as text. After stop().
    std::string value(const std::string& strSql) { return database_.value(strSql); }
    std::string contents();

    std::vector<Json::Value> answers;
    bool blThrown = false;       // an exception reached the host
    bool blTransaction = false;  // one was open after the last line
    long long iSteps = 0;        // thousands that SQLite took without a fence
    Database& database() { return database_; }

private:
    Json::Value call(Json::Value& jCommand);
    Json::Value answer(const std::string& strLine);
    void saveAgain();

    Layers layers_;
    Database database_;
    std::unique_ptr<Host> pHost_;            // with both layers
    std::unique_ptr<VornJsonDbApi> pNotes_;  // otherwise
    std::unique_ptr<Fence> pFence_;
};
