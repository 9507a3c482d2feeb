// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// What ends a command early: thrown by its parts, turned into a message and an exit status in main.
#pragma once

#include <stdexcept>

namespace tool {

enum Status { kDone = 0, kFailed = 1, kUsage = 2, kNothingFound = 3 };

// The command failed; the text says what with and why.
struct Failure : std::runtime_error {
    using std::runtime_error::runtime_error;
};

// The command line is wrong.
struct UsageError : std::runtime_error {
    using std::runtime_error::runtime_error;
};

// Whoever reads the output has had enough of it.
struct ClosedPipe {};

}  // namespace tool
