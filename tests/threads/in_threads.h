// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// Threads of a host that uses the library in all of them.
#pragma once

#include "support/matrix.h"

#include <cstdlib>
#include <functional>
#include <thread>
#include <vector>

// Soak runs more of everything.
inline const int kMore = nullptr == getenv("VORN_SOAK") ? 1 : 20;
inline constexpr int kThreads = 4;

// Runs the work in so many threads, each of which gets its number.
inline void inThreads(int nThreads, const std::function<void(int)>& work)
{
    std::vector<std::thread> threads;
    for (int i = 0; i < nThreads; ++i) threads.emplace_back(work, i);
    for (std::thread& thread : threads) thread.join();
}
