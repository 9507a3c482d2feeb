// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// bench_listing CONTENDER ROWS lists a table of that many rows, in a process of its own, and prints
// the user CPU time and the growth of the peak memory for each listed row. Small tables are listed
// again and again, each result dropped outside the measured time, to hide the clock's granularity.
#include "contender.h"

#include <sys/resource.h>
#include <valgrind/callgrind.h>
#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <fstream>

namespace {

constexpr int kLeastRowsListed = 100000;

double userSeconds()
{
    rusage usage = {};
    bench::must(0 == getrusage(RUSAGE_SELF, &usage), "getrusage");
    return static_cast<double>(usage.ru_utime.tv_sec) +
           static_cast<double>(usage.ru_utime.tv_usec) / 1e6;
}

// In bytes: "VmHWM" is the kernel's high-water mark, "VmRSS" what the process holds now.
double memory(const std::string& strField)
{
    std::ifstream status("/proc/self/status");
    std::string strLine;
    while (std::getline(status, strLine))
        if (0 == strLine.compare(0, strField.size() + 1, strField + ":"))
            return 1024 * strtod(strLine.c_str() + strField.size() + 1, nullptr);
    bench::must(false, "read /proc/self/status");
    return 0;
}

}  // namespace

int main(int argc, char** argv)
{
    bench::must(3 == argc, "usage: bench_listing CONTENDER ROWS");
    const int rows = atoi(argv[2]);
    bench::must(0 < rows, "a number of rows");

    // What only the first call needs is not part of the rows' cost.
    bench::setUp(argv[1], bench::Operation::kList, 1)->listAll();
    const auto contender = bench::setUp(argv[1], bench::Operation::kList, rows);

    const double heldBefore = memory("VmRSS");
    double seconds = -userSeconds();
    CALLGRIND_START_INSTRUMENTATION;
    contender->listAll();
    CALLGRIND_STOP_INSTRUMENTATION;
    seconds += userSeconds();
    const double peak = memory("VmHWM") - heldBefore;
    CALLGRIND_START_INSTRUMENTATION;
    contender->dropResult();
    CALLGRIND_STOP_INSTRUMENTATION;

    const int passes = std::max(1, kLeastRowsListed / rows);
    for (int i = 1; i < passes; ++i) {
        contender->dropResult();
        const double start = userSeconds();
        contender->listAll();
        seconds += userSeconds() - start;
    }

    printf(
        "{\"contender\": \"%s\", \"rows\": %d, \"user_ns_per_row\": %.1f, "
        "\"peak_bytes_per_row\": %.1f}\n",
        argv[1], rows, seconds * 1e9 / passes / rows, peak / rows);
    fflush(stdout);
    // Destroying a million records is not part of the measurement.
    _Exit(0);
}
