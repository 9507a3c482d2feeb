#!/usr/bin/env bash
# SPDX-FileCopyrightText: 2026 The vornjsondb authors
# SPDX-License-Identifier: MIT
# example_test.sh EXPECTED PROGRAM [ARGUMENT...]: runs an example, which has to succeed and to print
# EXPECTED, standard error included. In log lines PID and LINE stand for the numbers, and TIME for those of a clock.
set -euo pipefail
expected=$1
shift
"$@" 2>&1 |
    sed -E 's/^(statement,) [0-9]+ ms/\1 TIME ms/; s/^(host_statement_seconds_total) .*/\1 TIME/
        /(VornJsonDbApi|util):[0-9]+/ { s/(VornJsonDbApi|util):[0-9]+/\1:LINE/g; s/\([0-9]+\)/(PID)/ }' |
    diff -u "$expected" -
