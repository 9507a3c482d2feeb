# SPDX-FileCopyrightText: 2026 The vornjsondb authors
# SPDX-License-Identifier: MIT
# Shared by the tests that configure and install the library; sourced, not run. Their arguments begin with SOURCE
# WORK. Those that build hosts go on with HOST EXPECTED: the README's host, and what it prints.
set -euo pipefail
source=$1 work=$2 host=${3:-} expected=${4:-}
part=$source/tests/host
alone=(-DVORNJSONDB_TESTS=OFF -DVORNJSONDB_EXAMPLES=OFF)

# fail MESSAGE: shows what was run last without showing it.
fail() {
    cat "$work/log" >&2
    printf '%s: %s\n' "$(basename "$0" .sh)" "$1" >&2
    exit 1
}

# quietly WHAT COMMAND...: what it says is shown when it fails.
quietly() {
    "${@:2}" >"$work/log" 2>&1 || fail "$1"
}

# says TEXT...: what was run last, however its lines are broken.
says() {
    local text
    for text in "$@"; do
        tr -s ' \n' ' ' <"$work/log" | grep -qF -e "$text" || fail "it does not say: $text"
    done
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
    quietly "the library does not configure" cmake -S "$source" -B "$1" "${alone[@]}" \
        -DCMAKE_BUILD_TYPE=Release -DCMAKE_INSTALL_PREFIX=/usr "${@:2}"
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
    cmake -S "$work/$1" -B "$work/$1/build" "${@:2}" >"$work/log" 2>&1
}

# host_project FOLDER [OPTION...]: the same, built and run.
host_project() {
    configured "$@" || fail "$1 does not configure"
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
: >"$work/log"
