// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// bench_threads [--without-statistics]: how many times as much work threads with a database each do
// as one of them alone, from 2 threads to one for each processor; the library and the floor in
// turn, the median of nine. The option switches SQLite's global memory statistics off, whose lock
// all threads share. Each thread has a processor of its own: a scheduler that lets two of them
// begin on the same one would be measured with them.
#include "contender.h"

#include <pthread.h>
#include <sched.h>
#include <sqlite3.h>

#include <algorithm>
#include <atomic>
#include <chrono>
#include <cstdio>
#include <cstring>
#include <memory>
#include <string>
#include <thread>
#include <vector>

namespace {

constexpr int kRows = 1000;
constexpr int kRuns = 9;
// Of each thread; a list is one call, of a thousand rows.
constexpr int kCallsOfCreate = 8000;
constexpr int kCallsOfList = 120;

void runOnProcessor(int iProcessor)
{
    cpu_set_t processors;
    CPU_ZERO(&processors);
    CPU_SET(iProcessor, &processors);
    bench::must(0 == pthread_setaffinity_np(pthread_self(), sizeof(processors), &processors),
                "pthread_setaffinity_np");
}

// Of the passes over all records that each thread makes at the same time as the others.
double secondsOf(const char* szContender, bench::Operation operation, int nThreads)
{
    const int nCalls = bench::callCount(operation, kRows);
    const int nPasses = 1 == nCalls ? kCallsOfList : kCallsOfCreate / nCalls;
    std::atomic<int> iReady{0};
    std::atomic<bool> blGo{false};
    std::vector<std::unique_ptr<bench::Contender>> contenders;
    for (int iThread = 0; iThread < nThreads; ++iThread)
        contenders.push_back(bench::setUp(szContender, operation, kRows));
    std::vector<std::thread> threads;
    for (int iThread = 0; iThread < nThreads; ++iThread)
        threads.emplace_back([&, iThread] {
            runOnProcessor(iThread);
            const auto& contender = contenders[static_cast<std::size_t>(iThread)];
            ++iReady;
            while (!blGo) std::this_thread::yield();
            for (int iPass = 0; iPass < nPasses; ++iPass) {
                bench::run(contender->connection(), "BEGIN");
                for (int i = 0; i < nCalls; ++i) bench::call(*contender, operation, i);
                contender->dropResult();
                bench::run(contender->connection(), "ROLLBACK");
            }
        });
    while (iReady < nThreads) std::this_thread::yield();
    const auto begin = std::chrono::steady_clock::now();
    blGo = true;
    for (std::thread& thread : threads) thread.join();
    return std::chrono::duration<double>(std::chrono::steady_clock::now() - begin).count();
}

// Of the fastest of three turns each: what else the machine does is no part of it.
double speedUp(const char* szContender, bench::Operation operation, int nThreads)
{
    double dAlone = secondsOf(szContender, operation, 1);
    double dTogether = secondsOf(szContender, operation, nThreads);
    for (int i = 1; i < 3; ++i) {
        dAlone = std::min(dAlone, secondsOf(szContender, operation, 1));
        dTogether = std::min(dTogether, secondsOf(szContender, operation, nThreads));
    }
    return nThreads * dAlone / dTogether;
}

double median(std::vector<double> values)
{
    std::sort(values.begin(), values.end());
    return values[values.size() / 2];
}

}  // namespace

int main(int argc, char** argv)
{
    if (1 < argc && 0 == strcmp("--without-statistics", argv[1]))
        bench::must(SQLITE_OK == sqlite3_config(SQLITE_CONFIG_MEMSTATUS, 0), "sqlite3_config");
    const int nProcessors = static_cast<int>(std::max(2U, std::thread::hardware_concurrency()));
    const char* szComma = "";
    printf("[");
    for (const char* szOperation : {"create", "fetch", "list"})
        for (int nThreads = 2; nThreads <= nProcessors; ++nThreads) {
            const bench::Operation operation = bench::operationOf(szOperation);
            std::vector<double> library;
            std::vector<double> floor;
            std::vector<double> ratios;
            for (int i = 0; i < kRuns; ++i) {
                library.push_back(speedUp("library", operation, nThreads));
                floor.push_back(speedUp("floor", operation, nThreads));
                ratios.push_back(library.back() / floor.back());
            }
            printf(
                "%s\n{\"operation\": \"%s\", \"threads\": %d, \"library\": %.3f, \"floor\": %.3f, "
                "\"ratio\": %.3f}",
                szComma, szOperation, nThreads, median(library), median(floor), median(ratios));
            szComma = ",";
        }
    printf("\n]\n");
    return 0;
}
