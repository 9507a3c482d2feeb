// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// The CPU time of each contender's operations on a table of 1,000 rows, by Google Benchmark. One
// iteration is one pass over all records, in one transaction; setting up the table is not timed.
#include "contender.h"

#include <benchmark/benchmark.h>

#include <string>

namespace {

constexpr int kRows = 1000;

void pass(benchmark::State& state, const char* szContender, bench::Operation operation)
{
    const int calls = bench::callCount(operation, kRows);
    for (auto _ : state) {
        state.PauseTiming();
        auto contender = bench::setUp(szContender, operation, kRows);
        bench::run(contender->connection(), "BEGIN");
        state.ResumeTiming();
        for (int i = 0; i < calls; ++i) bench::call(*contender, operation, i);
        contender->dropResult();
        state.PauseTiming();
        bench::run(contender->connection(), "COMMIT");
        contender.reset();
        state.ResumeTiming();
    }
    const int itemsPerPass = bench::Operation::kList == operation ? kRows : calls;
    state.SetItemsProcessed(state.iterations() * itemsPerPass);
}

}  // namespace

int main(int argc, char** argv)
{
    for (const bench::ContenderEntry& contender : bench::contenders()) {
        for (const bench::OperationEntry& entry : bench::operations()) {
            const std::string strName = std::string(contender.szName) + "/" + entry.szName;
            benchmark::RegisterBenchmark(strName.c_str(), pass, contender.szName, entry.operation)
                ->Unit(benchmark::kMicrosecond);
        }
    }
    benchmark::Initialize(&argc, argv);
    benchmark::RunSpecifiedBenchmarks();
    return 0;
}
