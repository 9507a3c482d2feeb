#!/usr/bin/env bash
# SPDX-FileCopyrightText: 2026 The vornjsondb authors
# SPDX-License-Identifier: MIT
# package_part_test.sh SOURCE WORK HOST EXPECTED: the library as a part of a host's own build, in every way that
# the README names.
. "$(dirname "$0")/package.sh"

# part_alone FOLDER: the host there, which contains the library, has not built its tests and examples.
part_alone() {
    for option in TESTS EXAMPLES; do
        grep -qx "VORNJSONDB_$option:BOOL=OFF" "$1/build/CMakeCache.txt" || fail "$1 has VORNJSONDB_$option on"
    done
    if find "$1/build" -name tests -o -name examples | grep .; then fail "$1 has built more than the library"; fi
}

project="include(GNUInstallDirs)
add_subdirectory($source vornjsondb)
add_executable(host host.cpp)
target_link_libraries(host PRIVATE VornJsonDb::vornjsondb)
install(TARGETS host)"

# The host's linker refuses undefined symbols, and it installs only itself.
host_project part -DCMAKE_INSTALL_PREFIX=/usr -DCMAKE_SHARED_LINKER_FLAGS=-Wl,-z,defs <<<"$project"
part_alone "$work/part"
DESTDIR=$work/part/stage quietly "the host does not install" cmake --install "$work/part/build"
(cd "$work/part/stage" && find . ! -type d) | diff -u <(echo ./usr/bin/host) - || fail "the host installs more than itself"

# Installed with the host on demand, in the same places.
cmake -S "$work/part" -B "$work/part/build" -DVORNJSONDB_INSTALL=ON -DCMAKE_BUILD_TYPE=Release >"$work/log"
quietly "the host does not build" cmake --build "$work/part/build" -j "$(nproc)"
installed "$work/part/build" "$work/part/moved"
rm -r "$work/part/moved/bin"
# Without the program, which the host has not asked for.
lists "$work/part/moved" "/vornjsondb$/d; /vornjsondb\.1$/d"

# Static.
host_project part_static -DBUILD_SHARED_LIBS=OFF -DCMAKE_EXE_LINKER_FLAGS=-Wl,-z,defs <<<"$project"
if readelf -dW "$work/part_static/build/host" | grep '(NEEDED).*libvornjsondb'; then fail "the library is not static"; fi

host_project fetched <<PROJECT
include(FetchContent)
FetchContent_Declare(vornjsondb SOURCE_DIR $source)
FetchContent_MakeAvailable(vornjsondb)
add_executable(host host.cpp)
target_link_libraries(host PRIVATE VornJsonDb::vornjsondb)
PROJECT
part_alone "$work/fetched"
