#!/usr/bin/env bash
# SPDX-License-Identifier: MIT
# configure_test.sh SOURCE WORK: a plain configuration works with only the library's own dependencies
# installed, and says which tests it leaves out; if all tests are required it fails. And no part of the project
# depends on the name of SQLite's target.
set -euo pipefail
source=$1 work=$2

fail() {
    printf 'configure_test: %s\n' "$*" >&2
    cat "$work/log" >&2
    exit 1
}

configures() {
    rm -rf "$work/build"
    cmake -S "$source" -B "$work/build" "$@" >"$work/log" 2>&1
}

# says TEXT: however its lines are broken.
says() {
    tr -s ' \n' ' ' <"$work/log" | grep -qF -e "$1" || fail "it does not say: $1"
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

rm -rf "$work"
mkdir -p "$work/bin" "$work/modules"

left_out "All tests: left out, GoogleTest was not found" -DCMAKE_DISABLE_FIND_PACKAGE_GTest=ON
left_out "All tests: left out, they are for the shared library" -DBUILD_SHARED_LIBS=OFF

# without PROGRAM [OPTION...]: all programs of the machine are found but this one.
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

# A module that names SQLite's target as CMake 4.3 does, without the older name.
cat >"$work/modules/FindSQLite3.cmake" <<'MODULE'
find_path(SQLite3_INCLUDE_DIR sqlite3.h)
find_library(SQLite3_LIBRARY sqlite3)
set(SQLite3_FOUND TRUE)
set(SQLite3_VERSION 3.999.0)
set(SQLite3_INCLUDE_DIRS ${SQLite3_INCLUDE_DIR})
if(NOT TARGET SQLite3::SQLite3)
  add_library(SQLite3::SQLite3 UNKNOWN IMPORTED)
  set_target_properties(SQLite3::SQLite3 PROPERTIES
    IMPORTED_LOCATION ${SQLite3_LIBRARY} INTERFACE_INCLUDE_DIRECTORIES ${SQLite3_INCLUDE_DIR})
endif()
MODULE
configures -DCMAKE_MODULE_PATH="$work/modules" || fail "it needs the older name of SQLite's target"
if grep "All tests" "$work/log"; then fail "the tests are left out"; fi
