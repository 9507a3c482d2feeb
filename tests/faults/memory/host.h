// SPDX-License-Identifier: MIT
// What the host process gives the library besides memory: the flags, the log, the clock, the wait.
#pragma once

namespace host {

// What time() answers.
constexpr long kNow = 1700000000;

// How often the library has waited for a lock. It does not wait in earnest.
int waits();

}  // namespace host
