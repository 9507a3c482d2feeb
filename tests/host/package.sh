# SPDX-License-Identifier: MIT
# Shared by the tests of what is installed; sourced, not run. They have the same arguments: SOURCE WORK HOST
# EXPECTED, where HOST is the README's host, and EXPECTED what it prints.
source=$1 work=$2 host=$3 expected=$4
test_name=$(basename "$0" .sh)
part=$source/tests/host

fail() {
    printf '%s: %s\n' "$test_name" "$*" >&2
    exit 1
}

# quietly WHAT COMMAND...: what it says is shown when it fails.
quietly() {
    "${@:2}" >"$work/log" 2>&1 || { cat "$work/log"; fail "$1"; }
}

# same NAME EXPECTED-FILE FILE
same() {
    diff -u "$2" "$3" || fail "$1 differs"
}

# runs PROGRAM: it prints what the README says.
runs() {
    "$1" >"$work/printed" || fail "$1 failed"
    same "what $1 prints" "$expected" "$work/printed"
}

# built FOLDER [OPTION...]: the library, as it is shipped.
built() {
    quietly "the library does not configure" cmake -S "$source" -B "$1" -DCMAKE_BUILD_TYPE=Release \
        -DVORNJSONDB_TESTS=OFF -DVORNJSONDB_EXAMPLES=OFF -DCMAKE_INSTALL_PREFIX=/usr "${@:2}"
    quietly "the library does not build" cmake --build "$1" -j "$(nproc)"
}

# installed BUILD FOLDER: installs what was built, moved to FOLDER; sets $libdir.
installed() {
    DESTDIR=$work/stage quietly "it does not install" cmake --install "$1"
    mv "$work/stage/usr" "$2"
    libdir=$(dirname "$(cd "$2" && find . -name 'libvornjsondb.so' -o -name 'libvornjsondb.a')")
}

# lists FOLDER [EDIT]: below the folder is what installed.txt, edited by sed, names, with LIBDIR for that of the library.
lists() {
    (cd "$1" && find . ! -type d | sed "s|^$libdir/|LIBDIR/|; s|^\./||" | LC_ALL=C sort) >"$work/installed"
    sed "${2:-}" "$part/installed.txt" >"$work/to_install"
    same "the list of installed files" "$work/to_install" "$work/installed"
    if grep -rlF -e "$source" -e "$work" "$1"; then fail "a path of the build was installed"; fi
}

# configured FOLDER [OPTION...]: a project of a host, its CMakeLists.txt on standard input.
configured() {
    mkdir -p "$work/$1"
    cp "$host" "$work/$1/host.cpp"
    { printf 'cmake_minimum_required(VERSION 3.22)\nproject(host LANGUAGES CXX)\nset(CMAKE_CXX_STANDARD 17)\n'; cat; } \
        >"$work/$1/CMakeLists.txt"
    cmake -S "$work/$1" -B "$work/$1/build" "${@:2}" >"$work/$1/log" 2>&1
}

# host_project FOLDER [OPTION...]: the same, built and run.
host_project() {
    configured "$@" || { cat "$work/$1/log"; fail "$1 does not configure"; }
    quietly "$1 does not build" cmake --build "$work/$1/build" -j "$(nproc)"
    runs "$work/$1/build/host"
}

# sqlite_named TARGET: a folder with a module that finds SQLite under this target name only.
sqlite_named() {
    mkdir -p "$work/modules/${1%%:*}"
    cat >"$work/modules/${1%%:*}/FindSQLite3.cmake" <<MODULE
find_path(SQLite3_INCLUDE_DIR sqlite3.h)
find_library(SQLite3_LIBRARY sqlite3)
set(SQLite3_FOUND TRUE)
if(NOT TARGET $1)
  add_library($1 UNKNOWN IMPORTED)
  set_target_properties($1 PROPERTIES
    IMPORTED_LOCATION \${SQLite3_LIBRARY} INTERFACE_INCLUDE_DIRECTORIES \${SQLite3_INCLUDE_DIR})
endif()
MODULE
    echo "$work/modules/${1%%:*}"
}

# The whole of the README's host by find_package.
found_alone='find_package(VornJsonDb 6 CONFIG REQUIRED)
add_executable(host host.cpp)
target_link_libraries(host PRIVATE VornJsonDb::vornjsondb)'

rm -rf "$work"
mkdir -p "$work"
