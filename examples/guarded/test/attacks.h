// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// What a stranger may send to get more than is granted.
#pragma once

#include "world.h"

#include <functional>
#include <set>
#include <string>
#include <vector>

struct Attack {
    std::string strName;
    std::string strLines;
    // Whether it reached its aim.
    std::function<bool(World& world)> worked;
    unsigned uMoreNotes = 0;  // in the table beforehand
};

const std::vector<Attack>& attacks();

// All names and texts in them.
std::set<std::string> attackTexts();
