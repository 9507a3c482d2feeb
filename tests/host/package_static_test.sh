#!/usr/bin/env bash
# SPDX-FileCopyrightText: 2026 The vornjsondb authors
# SPDX-License-Identifier: MIT
# package_static_test.sh SOURCE WORK HOST EXPECTED: installs the static library, moves what was installed, and
# builds hosts with it: the README's, one with a global handle and one whose plugin has the library inside; and
# the shared library is not built over a static SQLite.
. "$(dirname "$0")/package.sh"

sqlite=$(find /usr/lib /usr/local/lib -name libsqlite3.a -print -quit)
[ -n "$sqlite" ] || fail "there is no libsqlite3.a"

built "$work/build" -DBUILD_SHARED_LIBS=OFF
installed "$work/build" "$work/moved"
lists "$work/moved" '/\.so\./d; s/\.so$/.a/'
library=$work/moved/$libdir/libvornjsondb.a

# A host's global may be older than whatever the library would initialise.
objdump -h "$library" >"$work/sections"
grep -q ' \.text' "$work/sections" || fail "objdump shows no sections"
if grep -E ' \.(init_array|ctors)' "$work/sections"; then fail "it has a dynamic initialiser"; fi

# has_inside PROGRAM LIBRARY...: it needs neither the shared library nor these.
has_inside() {
    local library
    readelf -dW "$1" >"$work/dynamic"
    for library in libvornjsondb "${@:2}"; do
        if grep "(NEEDED).*\[$library\." "$work/dynamic"; then fail "$1 has not $library inside"; fi
    done
}

# Found by CMake on its own, over the shared SQLite and over the static one; the global's constructor comes first.
globals="$found_alone
add_executable(global_host $part/global_host.cpp)
target_link_libraries(global_host PRIVATE VornJsonDb::vornjsondb)"
for kind in shared static; do
    options=(-DCMAKE_PREFIX_PATH="$work/moved")
    [ "$kind" = shared ] || options+=(-DSQLite3_LIBRARY="$sqlite")
    host_project "over_$kind" "${options[@]}" <<<"$globals"
    "$work/over_$kind/build/global_host" || fail "the host with a global handle over the $kind SQLite: step $?"
done
has_inside "$work/over_shared/build/host"
has_inside "$work/over_static/build/host" libsqlite3
grep -q '(NEEDED).*libsqlite3' <(readelf -dW "$work/over_shared/build/host") || fail "it is not over the shared SQLite"

# Found by pkg-config.
flags=$(PKG_CONFIG_PATH=$work/moved/$libdir/pkgconfig pkg-config --static --cflags --libs vornjsondb)
# shellcheck disable=SC2086 # several flags
c++ -std=c++17 "$host" $flags -o "$work/host"
has_inside "$work/host"
runs "$work/host"
# shellcheck disable=SC2086 # several flags
c++ -std=c++17 -shared -fPIC "$part/plugin.cpp" $flags -o "$work/plugin.so"

# A plugin with the library inside is used, unloaded, loaded again and used while the process exits; it stays.
configured plugin -DCMAKE_PREFIX_PATH="$work/moved" <<PROJECT || fail "the plugin does not configure"
find_package(VornJsonDb 6 CONFIG REQUIRED)
add_library(plugin MODULE $part/plugin.cpp)
target_link_libraries(plugin PRIVATE VornJsonDb::vornjsondb)
add_executable(plugin_host $part/plugin_host.cpp)
target_include_directories(plugin_host PRIVATE \$<TARGET_PROPERTY:VornJsonDb::vornjsondb,INTERFACE_INCLUDE_DIRECTORIES>)
find_package(Threads REQUIRED)
target_link_libraries(plugin_host PRIVATE JsonCpp::JsonCpp Threads::Threads \${CMAKE_DL_LIBS})
set_target_properties(plugin_host PROPERTIES ENABLE_EXPORTS ON)
PROJECT
quietly "the plugin does not build" cmake --build "$work/plugin/build" -j "$(nproc)"
for plugin in "$work/plugin/build/libplugin.so" "$work/plugin.so"; do
    has_inside "$plugin"
    grep -q 'Flags:.*NODELETE' <(readelf -dW "$plugin") || fail "$plugin can be unloaded"
    "$work/plugin/build/plugin_host" "$plugin" || fail "the host of $plugin: step $?"
done

# A shared library over a static SQLite is refused, even if the host has made SQLite's target.
# refused NAME [OPTION...]: by a host, with SQLite's target as standard input makes it.
refused() {
    if { cat; echo "add_subdirectory($source vornjsondb)"; } | configured "$@"; then
        fail "a shared library over a static SQLite was taken: $1"
    fi
    says "two SQLites" "first call would crash" "-DBUILD_SHARED_LIBS=OFF" "over the shared SQLite"
}
refused found -DSQLite3_LIBRARY="$sqlite" </dev/null
refused amalgamation <<PROJECT
add_library(amalgamation STATIC host.cpp)
add_library(SQLite::SQLite3 ALIAS amalgamation)
PROJECT
refused wrapper <<PROJECT
add_library(SQLite::SQLite3 INTERFACE IMPORTED)
set_target_properties(SQLite::SQLite3 PROPERTIES INTERFACE_LINK_LIBRARIES $sqlite)
PROJECT
