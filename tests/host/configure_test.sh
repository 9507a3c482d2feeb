#!/usr/bin/env bash
# SPDX-FileCopyrightText: 2026 The vornjsondb authors
# SPDX-License-Identifier: MIT
# configure_test.sh SOURCE WORK: a plain configuration works with only the library's own dependencies
# installed, and says which tests it leaves out; if all tests are required it fails. And no part of the project
# depends on the name of SQLite's target.
. "$(dirname "$0")/package.sh"

configures() {
    rm -rf "$work/build"
    cmake -S "$source" -B "$work/build" "$@" >"$work/log" 2>&1
}

# left_out TEXT [OPTION...]: what a configuration says of the tests that it leaves out, and of all that it requires.
left_out() {
    local text=$1
    shift
    configures "$@" || fail "it does not configure where it should leave out: $text"
    grep '^-- ' "$work/log" | grep -qF -e "$text" || fail "it has no status line: $text"
    ! configures -DVORNJSONDB_REQUIRE_TESTS=ON "$@" || fail "it configures where it should require: $text"
    says "$text"
}

left_out "All tests: left out, GoogleTest was not found" -DCMAKE_DISABLE_FIND_PACKAGE_GTest=ON
left_out "All tests: left out, they are for the shared library" -DBUILD_SHARED_LIBS=OFF

# without PROGRAM [OPTION...]: all programs of the machine are found but this one.
mkdir "$work/bin"
ln -s /usr/bin/* "$work/bin"
without() {
    mkdir "$work/$1"
    find "$work/bin" -name "$1*" -exec mv -t "$work/$1" {} +
    PATH=$work/bin left_out "with $1: left out, it was not found" -DCMAKE_IGNORE_PATH="/usr/bin;/bin" "${@:2}"
    if ctest --test-dir "$work/build" -N | grep -F "_$1_"; then fail "a test with $1 is there"; fi
    find "$work/$1" -mindepth 1 -exec mv -t "$work/bin" {} +
}
without clang++ -DVORNJSONDB_HARDENING_CHECK=/usr/bin/true
without hardening-check
without python3 -DVORNJSONDB_HARDENING_CHECK=/usr/bin/true

# As CMake 4.3 names SQLite's target, without the older name.
configures -DCMAKE_MODULE_PATH="$(sqlite_named SQLite3::SQLite3)" || fail "it needs the older name of SQLite's target"
if grep "All tests" "$work/log"; then fail "the tests are left out"; fi
