// SPDX-License-Identifier: MIT
// What the loops have counted.
#pragma once

#include "point.h"

#include <string>

struct Figures {
    int iPoints = 0;
    int iFindings = 0;
    int iEndings[static_cast<int>(Ending::kEndings)] = {};

    void add(const Point& point);
    // A line per figure: "figure: NAME, points failed = 4211".
    void print(const std::string& strName) const;
};

// Fails each allocation of the case, from the first to the last, and adds up. Returns what went
// wrong, a line each.
using AtPoint = Point (*)(const Case& row, const allocators::Fault& fault);
std::string failEach(const Case& row, allocators::Fault fault, AtPoint atPoint, Figures& figures);

// What the figures call the allocations that fail.
std::string nameOf(const allocators::Fault& fault);
