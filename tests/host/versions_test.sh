#!/usr/bin/env bash
# SPDX-FileCopyrightText: 2026 The vornjsondb authors
# SPDX-License-Identifier: MIT
# versions_test.sh SOURCE WORK JSONCPP_DIR SQLITE_HEADERS CMAKE_OPTION...: the lowest versions of
# CMakeLists.txt are those of the README; with them the project configures, and with a lower one it
# fails and names both. The options name the tools, and SQLite's library.
. "$(dirname "$0")/package.sh"
jsoncpp=$3 sqlite=$4
options=("${@:5}")

# lowest NAME: as CMakeLists.txt has it.
lowest() {
    sed -nE "s/^set\\(VORNJSONDB_$1 ([0-9.]+)\\)$/\\1/p" "$source/CMakeLists.txt"
}

# below VERSION: one before it.
below() {
    local major minor patch number
    IFS=. read -r major minor patch <<<"$1"
    number=$(((major * 1000 + minor) * 1000 + patch - 1))
    echo "$((number / 1000000)).$((number / 1000 % 1000)).$((number % 1000))"
}

# configures JSONCPP SQLITE [FOLDER]: the project, or the host in FOLDER, with the installed packages, which claim
# these versions.
configures() {
    rm -rf "$work/build" "$work/include" "$work/jsoncpp"
    mkdir -p "$work/include" "$work/jsoncpp"
    echo "include($jsoncpp/jsoncppConfig.cmake)" >"$work/jsoncpp/jsoncppConfig.cmake"
    sed -E "s/[0-9]+\\.[0-9]+\\.[0-9]+/$1/" "$jsoncpp/jsoncppConfigVersion.cmake" \
        >"$work/jsoncpp/jsoncppConfigVersion.cmake"
    sed -E "s/(#define SQLITE_VERSION +\").*\"/\\1$2\"/" "$sqlite/sqlite3.h" >"$work/include/sqlite3.h"
    cmake -S "${3:-$source}" -B "$work/build" -Djsoncpp_DIR="$work/jsoncpp" -DSQLite3_INCLUDE_DIR="$work/include" \
        -DCMAKE_FIND_USE_CMAKE_SYSTEM_PATH=OFF -DCMAKE_FIND_USE_SYSTEM_ENVIRONMENT_PATH=OFF \
        "${alone[@]}" -DVornJsonDb_DIR="$work/package" "${options[@]}" >"$work/log" 2>&1
}

# host NAME: a host in a folder of this name, which finds jsoncpp before the line on standard input.
host() {
    mkdir -p "$work/$1"
    { printf 'cmake_minimum_required(VERSION 3.22)\nproject(host LANGUAGES CXX)\nfind_package(jsoncpp REQUIRED)\n'; cat; } \
        >"$work/$1/CMakeLists.txt"
}

[ "$(below 1.10.0)" = 1.9.999 ] || fail "another version is below 1.10.0"
jsoncpp_version=$(lowest JSONCPP)
sqlite_version=$(lowest SQLITE)
cmake_version=$(sed -nE 's/^cmake_minimum_required\(VERSION ([0-9.]+)\)$/\1/p' "$source/CMakeLists.txt")
grep -qF "jsoncpp $jsoncpp_version, SQLite $sqlite_version, CMake $cmake_version and" \
    "$source/README.md" || fail "the README has other versions"

configures "$jsoncpp_version" "$sqlite_version" || fail "the lowest versions do not do"
mkdir "$work/package"
cp "$work"/build/VornJsonDbConfig*.cmake "$work/package"
lower=$(below "$jsoncpp_version")
if configures "$lower" "$sqlite_version"; then fail "jsoncpp $lower was taken"; fi
says jsoncpp "$lower" "$jsoncpp_version"
host part <<<"add_subdirectory($source vornjsondb)"
host found <<<"find_package(VornJsonDb CONFIG REQUIRED)"
for name in part found; do
    if configures "$lower" "$sqlite_version" "$work/$name"; then fail "the host's jsoncpp $lower was taken"; fi
    says jsoncpp "$lower" "$jsoncpp_version"
done
configures "$jsoncpp_version" "$sqlite_version" "$work/part" || fail "the host's lowest version does not do"
lower=$(below "$sqlite_version")
if configures "$jsoncpp_version" "$lower"; then fail "SQLite $lower was taken"; fi
says SQLite3 "$lower" "$sqlite_version"
