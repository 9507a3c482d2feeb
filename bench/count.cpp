// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// bench_count CONTENDER OPERATION ROWS, run under
//     valgrind --tool=callgrind --instr-atstart=no
// counts the instructions of an operation's calls on a table of that many rows, including those
// that free what a call returned, but not setting up the table and the input, nor the first pass,
// which fills every cache. Prints a digest of the first pass's results and of the table after the
// second: the same work gives the same digest.
#include "contender.h"

#include <valgrind/callgrind.h>

#include <cstdio>
#include <cstdlib>
#include <functional>
#include <string>

int main(int argc, char** argv)
{
    bench::must(4 == argc, "usage: bench_count CONTENDER OPERATION ROWS");
    const bench::Operation operation = bench::operationOf(argv[2]);
    const int rows = atoi(argv[3]);
    const int calls = bench::callCount(operation, rows);

    std::string strText;
    {
        const auto first = bench::setUp(argv[1], operation, rows);
        for (int i = 0; i < calls; ++i) {
            bench::call(*first, operation, i);
            strText += bench::toText(first->result());
        }
    }

    const auto contender = bench::setUp(argv[1], operation, rows);
    bench::run(contender->connection(), "BEGIN");
    bench::call(*contender, operation, 0);
    bench::run(contender->connection(), "ROLLBACK");
    contender->dropResult();
    bench::run(contender->connection(), "BEGIN");
    CALLGRIND_START_INSTRUMENTATION;
    for (int i = 0; i < calls; ++i) bench::call(*contender, operation, i);
    contender->dropResult();
    CALLGRIND_STOP_INSTRUMENTATION;
    bench::run(contender->connection(), "COMMIT");

    strText += bench::tableText(contender->connection());
    printf(
        "{\"contender\": \"%s\", \"operation\": \"%s\", \"rows\": %d, \"calls\": %d, "
        "\"digest\": \"%zx\"}\n",
        argv[1], argv[2], rows, calls, std::hash<std::string>()(strText));
    return 0;
}
