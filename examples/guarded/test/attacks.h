// SPDX-License-Identifier: MIT
// What a stranger may send to the host of examples/guarded to reach more than he is given.
#pragma once

#include "world.h"

#include <string>
#include <vector>

struct Attack {
    // Where it ends when only SQLite's own means stand around the call.
    enum class Fence { kStops, kLetsThrough };
    // What the guard makes of its first line.
    enum class Guard { kRefuses, kLimits, kLetsThrough };

    std::string strName;
    std::vector<std::string> lines;
    // Whether it reached what it aims at.
    bool (*worked)(World& world);
    Fence fence;
    Guard guard = Guard::kRefuses;
    unsigned uMoreNotes = 0;  // in the table beforehand
};

void PrintTo(const Attack& attack, std::ostream* pStream);

const std::vector<Attack>& attacks();
