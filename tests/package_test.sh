#!/usr/bin/env bash
# SPDX-License-Identifier: MIT
# package_test.sh SOURCE WORK HOST EXPECTED: installs the library as the README says, moves what was
# installed, and builds the README's host against it in every way that the README names, and the
# small examples.
set -euo pipefail
source=$1 work=$2 host=$3 expected=$4

fail() {
    printf 'package_test: %s\n' "$*" >&2
    exit 1
}

# same NAME EXPECTED-FILE FILE
same() {
    diff -u "$2" "$3" || fail "$1 differs"
}

# runs PROGRAM: it prints what the README says.
runs() {
    "$1" >"$work/printed"
    same "what $1 prints" "$expected" "$work/printed"
}

# configured FOLDER [OPTION...]: a project of a host, its CMakeLists.txt on standard input.
configured() {
    local folder=$work/$1
    shift
    mkdir -p "$folder"
    cp "$host" "$folder/host.cpp"
    { printf 'cmake_minimum_required(VERSION 3.22)\nproject(host LANGUAGES CXX)\nset(CMAKE_CXX_STANDARD 17)\n'; cat; } \
        >"$folder/CMakeLists.txt"
    cmake -S "$folder" -B "$folder/build" "$@" >"$folder/log" 2>&1
}

# host_project FOLDER [OPTION...]: the same, built and run.
host_project() {
    configured "$@" || { cat "$work/$1/log"; fail "$1 does not configure"; }
    cmake --build "$work/$1/build" -j "$(nproc)" >"$work/$1/log" 2>&1 || { cat "$work/$1/log"; fail "$1 does not build"; }
    runs "$work/$1/build/host"
}

rm -rf "$work"
mkdir -p "$work"

# The library alone, as it is shipped.
cmake -S "$source" -B "$work/build" -DCMAKE_BUILD_TYPE=Release -DVORNJSONDB_TESTS=OFF \
    -DVORNJSONDB_EXAMPLES=OFF -DCMAKE_INSTALL_PREFIX=/usr >"$work/log"
cmake --build "$work/build" -j "$(nproc)" >>"$work/log" || { cat "$work/log"; fail "the library does not build"; }
DESTDIR=$work/stage cmake --install "$work/build" >>"$work/log"
mv "$work/stage/usr" "$work/moved"

libdir=$(dirname "$(cd "$work/moved" && find . -name libvornjsondb.so)")
(cd "$work/moved" && find . ! -type d | sed "s|^$libdir/|LIBDIR/|; s|^\./||" | LC_ALL=C sort) >"$work/installed"
same "the list of installed files" "$source/tests/data/installed.txt" "$work/installed"
if grep -rlF -e "$source" -e "$work" "$work/moved"; then fail "a path of the build was installed"; fi

library=$work/moved/$libdir/libvornjsondb.so
readelf -dW "$library" >"$work/dynamic"
grep -q 'SONAME.*\[libvornjsondb\.so\.6\]' "$work/dynamic" || fail "another soname"
if grep -E 'RPATH|RUNPATH' "$work/dynamic"; then fail "a run path"; fi
sed -n 's/.*(NEEDED).*\[\(.*\)\]/\1/p' "$work/dynamic" | sed 's/\.so.*//' | LC_ALL=C sort >"$work/needed"
if grep -vxE 'lib(sqlite3|jsoncpp|stdc\+\+|c|gcc_s|m)' "$work/needed"; then fail "it needs more"; fi
for name in sqlite3 jsoncpp stdc++ c; do
    grep -qx "lib$name" "$work/needed" || fail "it does not need $name"
done

# Found by CMake, twice, after the host's own jsoncpp; the examples with it.
host_project found -DCMAKE_PREFIX_PATH="$work/moved" <<PROJECT
find_package(jsoncpp REQUIRED)
find_package(SQLite3 REQUIRED)
find_package(VornJsonDb 6 CONFIG REQUIRED)
find_package(VornJsonDb 6 CONFIG REQUIRED)
add_executable(host host.cpp)
target_link_libraries(host PRIVATE VornJsonDb::vornjsondb SQLite::SQLite3)
enable_testing()
include($source/examples/programs.cmake)
PROJECT
ctest --test-dir "$work/found/build" --no-tests=error --output-on-failure >"$work/found/log" ||
    { cat "$work/found/log"; fail "an example against the installed library"; }

# Of the version that was asked for.
for version in 5 7 6.99; do
    if echo "find_package(VornJsonDb $version CONFIG REQUIRED)" |
        configured "version_$version" -DCMAKE_PREFIX_PATH="$work/moved"; then
        fail "version $version was found"
    fi
done

# Found by pkg-config.
flags=$(PKG_CONFIG_PATH=$work/moved/$libdir/pkgconfig pkg-config --cflags --libs vornjsondb)
# shellcheck disable=SC2086 # several flags
c++ -std=c++17 "$host" $flags -Wl,-rpath,"$work/moved/$libdir" -o "$work/host"
runs "$work/host"

# One example alone, as examples/README.md has it.
mkdir "$work/alone"
ln -s "$source/examples" "$work/alone/examples"
# shellcheck disable=SC2016 # the marks of a block
sed -n '/^```sh$/,/^```$/ { /^```/d; p }' "$source/examples/README.md" >"$work/alone/build.sh"
(cd "$work/alone" && PKG_CONFIG_PATH=$work/moved/$libdir/pkgconfig bash -e build.sh)
LD_LIBRARY_PATH=$work/moved/$libdir \
    bash "$source/examples/example_test.sh" "$source/examples/expected/first_steps.txt" "$work/alone/first_steps"

# Part of the host's own build.
host_project part <<PROJECT
add_subdirectory($source vornjsondb)
find_package(SQLite3 REQUIRED)
add_executable(host host.cpp)
target_link_libraries(host PRIVATE VornJsonDb::vornjsondb SQLite::SQLite3)
PROJECT
host_project fetched <<PROJECT
include(FetchContent)
FetchContent_Declare(vornjsondb SOURCE_DIR $source)
FetchContent_MakeAvailable(vornjsondb)
find_package(SQLite3 REQUIRED)
add_executable(host host.cpp)
target_link_libraries(host PRIVATE VornJsonDb::vornjsondb SQLite::SQLite3)
PROJECT
