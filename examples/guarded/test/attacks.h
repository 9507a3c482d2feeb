// SPDX-License-Identifier: MIT
// What a stranger may send to the host of examples/guarded to get more than is granted.
#pragma once

#include "world.h"

#include <functional>
#include <string>
#include <vector>

struct Attack {
    std::string strName;
    std::string strLines;
    // Whether it reached its aim in a world that was stopped.
    std::function<bool(World& world)> worked;
    unsigned uMoreNotes = 0;  // in the table beforehand
    // What the guard makes of the first line.
    enum class Guard { kRefuses, kLimits, kLetsThrough } guard = Guard::kRefuses;
    // What becomes of it if only SQLite's own means surround the call.
    enum class Fence { kStops, kLetsThrough } fence = Fence::kLetsThrough;
};

const std::vector<Attack>& attacks();
