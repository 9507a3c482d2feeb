#!/usr/bin/env bash
# SPDX-License-Identifier: MIT
# example_test.sh EXPECTED PROGRAM [ARGUMENT...]: runs an example, which has to succeed and to print
# EXPECTED, standard error included. In log lines PID and LINE stand for the numbers.
set -euo pipefail
expected=$1
shift
"$@" 2>&1 |
    sed -E '/(VornJsonDbApi|util):[0-9]+/ { s/(VornJsonDbApi|util):[0-9]+/\1:LINE/g; s/\([0-9]+\)/(PID)/ }' |
    diff -u "$expected" -
