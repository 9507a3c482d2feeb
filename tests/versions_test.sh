#!/usr/bin/env bash
# SPDX-License-Identifier: MIT
# versions_test.sh SOURCE WORK JSONCPP_DIR SQLITE_HEADERS CMAKE_OPTION...: the lowest versions of
# CMakeLists.txt are those of the README; with them the project configures, and with a lower one it
# fails and names both. The options name the tools, and SQLite's library.
set -euo pipefail
source=$1 work=$2 jsoncpp=$3 sqlite=$4
shift 4
options=("$@")

fail() {
    printf 'versions_test: %s\n' "$*" >&2
    exit 1
}

# lowest NAME: as CMakeLists.txt has it.
lowest() {
    sed -nE "s/^set\\(VORNJSONDB_$1 ([0-9.]+)\\)$/\\1/p" "$source/CMakeLists.txt"
}

# below VERSION: the version before it.
below() {
    echo "${1%.*}.$((${1##*.} - 1))"
}

# configures JSONCPP SQLITE: with the installed packages, which claim these versions.
configures() {
    rm -rf "$work"
    mkdir -p "$work/include" "$work/jsoncpp"
    echo "include($jsoncpp/jsoncppConfig.cmake)" >"$work/jsoncpp/jsoncppConfig.cmake"
    sed -E "s/[0-9]+\\.[0-9]+\\.[0-9]+/$1/" "$jsoncpp/jsoncppConfigVersion.cmake" \
        >"$work/jsoncpp/jsoncppConfigVersion.cmake"
    sed -E "s/(#define SQLITE_VERSION +\").*\"/\\1$2\"/" "$sqlite/sqlite3.h" >"$work/include/sqlite3.h"
    cmake -S "$source" -B "$work/build" -Djsoncpp_DIR="$work/jsoncpp" -DSQLite3_INCLUDE_DIR="$work/include" \
        -DCMAKE_FIND_USE_CMAKE_SYSTEM_PATH=OFF -DCMAKE_FIND_USE_SYSTEM_ENVIRONMENT_PATH=OFF \
        -DVORNJSONDB_TESTS=OFF -DVORNJSONDB_EXAMPLES=OFF "${options[@]}" >"$work/log" 2>&1
}

# refused NAME LOWER LOWEST
refused() {
    for text in "$1" "$2" "$3"; do
        grep -qF "$text" "$work/log" || { cat "$work/log"; fail "it does not say $text"; }
    done
}

jsoncpp_version=$(lowest JSONCPP)
sqlite_version=$(lowest SQLITE)
cmake_version=$(sed -nE 's/^cmake_minimum_required\(VERSION ([0-9.]+)\)$/\1/p' "$source/CMakeLists.txt")
grep -qF "jsoncpp ($jsoncpp_version or later), SQLite ($sqlite_version or later), CMake ($cmake_version or later)" \
    "$source/README.md" || fail "the README has other versions"

configures "$jsoncpp_version" "$sqlite_version" || { cat "$work/log"; fail "the lowest versions do not do"; }
lower=$(below "$jsoncpp_version")
if configures "$lower" "$sqlite_version"; then fail "jsoncpp $lower was taken"; fi
refused jsoncpp "$lower" "$jsoncpp_version"
lower=$(below "$sqlite_version")
if configures "$jsoncpp_version" "$lower"; then fail "SQLite $lower was taken"; fi
refused SQLite3 "$lower" "$sqlite_version"
