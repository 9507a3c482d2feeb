#!/usr/bin/env bash
# SPDX-License-Identifier: MIT
# package_test.sh SOURCE WORK HOST EXPECTED: installs the library as the README says, moves what was
# installed, and builds the README's host against it in every way that the README names, and the
# examples.
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

# installed_files FOLDER: what is below it, with LIBDIR for the folder of the library.
installed_files() {
    local libdir
    libdir=$(dirname "$(cd "$1" && find . -name libvornjsondb.so)")
    (cd "$1" && find . ! -type d | sed "s|^$libdir/|LIBDIR/|; s|^\./||" | LC_ALL=C sort)
}

# part_alone FOLDER: a host that the library is a part of has not built its tests and examples.
part_alone() {
    for option in TESTS EXAMPLES; do
        grep -qx "VORNJSONDB_$option:BOOL=OFF" "$1/build/CMakeCache.txt" || fail "$1 has VORNJSONDB_$option on"
    done
    if find "$1/build" -name tests -o -name examples | grep .; then fail "$1 has built more than the library"; fi
}

rm -rf "$work"
mkdir -p "$work"
[ "$(wc -l <"$host")" -le 30 ] || fail "the host has more than 30 lines"

# The library alone, as it is shipped.
cmake -S "$source" -B "$work/build" -DCMAKE_BUILD_TYPE=Release -DVORNJSONDB_TESTS=OFF \
    -DVORNJSONDB_EXAMPLES=OFF -DCMAKE_INSTALL_PREFIX=/usr >"$work/log"
cmake --build "$work/build" -j "$(nproc)" >>"$work/log" || { cat "$work/log"; fail "the library does not build"; }
DESTDIR=$work/stage cmake --install "$work/build" >>"$work/log"
mv "$work/stage/usr" "$work/moved"

libdir=$(dirname "$(cd "$work/moved" && find . -name libvornjsondb.so)")
installed_files "$work/moved" >"$work/installed"
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
add_executable(records $source/examples/records.cpp)
add_executable(guarded $source/examples/guarded/guard.cpp $source/examples/guarded/fence.cpp
  $source/examples/guarded/host.cpp $source/examples/guarded/main.cpp)
foreach(name IN ITEMS records guarded)
  target_link_libraries(\${name} PRIVATE VornJsonDb::vornjsondb SQLite::SQLite3)
endforeach()
PROJECT
ctest --test-dir "$work/found/build" --no-tests=error --output-on-failure >"$work/found/log" ||
    { cat "$work/found/log"; fail "an example against the installed library"; }
bash "$source/tests/records_test.sh" "$work/found/build/records" "$source/examples/tables" "$work/found/records_test" \
    >"$work/found/log" 2>&1 || { cat "$work/found/log"; fail "records against the installed library"; }
(cd "$source/examples/guarded" && "$work/found/build/guarded" :memory: <commands.txt >"$work/found/answers.txt")
same "what guarded answers" "$source/examples/guarded/answers.txt" "$work/found/answers.txt"

# Found by CMake, twice, and all that it needs with it.
host_project found_alone -DCMAKE_PREFIX_PATH="$work/moved" <<PROJECT
find_package(VornJsonDb 6 CONFIG REQUIRED)
find_package(VornJsonDb 6 CONFIG REQUIRED)
add_executable(host host.cpp)
target_link_libraries(host PRIVATE VornJsonDb::vornjsondb SQLite::SQLite3)
PROJECT

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

# In folders that are not below the prefix, pkg-config names them as they stand.
cmake -S "$source" -B "$work/absolute" -DVORNJSONDB_TESTS=OFF -DVORNJSONDB_EXAMPLES=OFF \
    -DCMAKE_INSTALL_PREFIX=/usr -DCMAKE_INSTALL_LIBDIR=/opt/lib -DCMAKE_INSTALL_INCLUDEDIR=/srv/include >>"$work/log"
for variable in libdir=/opt/lib includedir=/srv/include; do
    [ "$(pkg-config --variable="${variable%%=*}" "$work/absolute/vornjsondb.pc")" = "${variable#*=}" ] ||
        fail "pkg-config has not $variable"
done

# One example alone, as examples/README.md has it.
mkdir "$work/alone"
ln -s "$source/examples" "$work/alone/examples"
# shellcheck disable=SC2016 # the marks of a block
sed -n '/^```sh$/,/^```$/ { /^```/d; p }' "$source/examples/README.md" >"$work/alone/build.sh"
(cd "$work/alone" && PKG_CONFIG_PATH=$work/moved/$libdir/pkgconfig bash -e build.sh)
LD_LIBRARY_PATH=$work/moved/$libdir \
    bash "$source/examples/example_test.sh" "$source/examples/expected/first_steps.txt" "$work/alone/first_steps"

# Part of the host's own build, and installed with it in the same places.
host_project part -DCMAKE_INSTALL_PREFIX=/usr -DCMAKE_BUILD_TYPE=Release <<PROJECT
include(GNUInstallDirs)
add_subdirectory($source vornjsondb)
find_package(SQLite3 REQUIRED)
add_executable(host host.cpp)
target_link_libraries(host PRIVATE VornJsonDb::vornjsondb SQLite::SQLite3)
PROJECT
part_alone "$work/part"
DESTDIR=$work/part/stage cmake --install "$work/part/build" >>"$work/log"
installed_files "$work/part/stage/usr" >"$work/part/installed"
same "the list of what a host installs" "$source/tests/data/installed.txt" "$work/part/installed"
host_project fetched <<PROJECT
include(FetchContent)
FetchContent_Declare(vornjsondb SOURCE_DIR $source)
FetchContent_MakeAvailable(vornjsondb)
find_package(SQLite3 REQUIRED)
add_executable(host host.cpp)
target_link_libraries(host PRIVATE VornJsonDb::vornjsondb SQLite::SQLite3)
PROJECT
part_alone "$work/fetched"
