#!/usr/bin/env bash
# SPDX-FileCopyrightText: 2026 The vornjsondb authors
# SPDX-License-Identifier: MIT
# package_test.sh SOURCE WORK HOST EXPECTED HARDENING-CHECK MESON: installs the library as the README says,
# moves what was installed, and builds the README's host against it in every way that the README
# names, and the examples; then removes it. Either program may be missing.
. "$(dirname "$0")/package.sh"
[ "$(wc -l <"$host")" -le 30 ] || fail "the host has more than 30 lines"

built "$work/build"
installed "$work/build" "$work/moved"
lists "$work/moved"
if grep -l SQLite "$work/moved/$libdir"/cmake/VornJsonDb/VornJsonDbTargets*; then fail "SQLite's target has a fixed name"; fi

library=$work/moved/$libdir/libvornjsondb.so
readelf -dW "$library" >"$work/dynamic"
grep -q 'SONAME.*\[libvornjsondb\.so\.6\]' "$work/dynamic" || fail "another soname"
if grep -E 'RPATH|RUNPATH' "$work/dynamic"; then fail "a run path"; fi
sed -n 's/.*(NEEDED).*\[\(.*\)\]/\1/p' "$work/dynamic" | sed 's/\.so.*//' | LC_ALL=C sort >"$work/needed"
if grep -vxE 'lib(sqlite3|jsoncpp|stdc\+\+|c|gcc_s|m)' "$work/needed"; then fail "it needs more"; fi
for name in sqlite3 jsoncpp stdc++ c; do
    grep -qx "lib$name" "$work/needed" || fail "it does not need $name"
done

# The linker does not refuse undefined symbols here, so ask the loader: the host has these two, and the library's
# dependencies have all others.
ldd -r "$library" 2>&1 | sed -n 's/^undefined symbol: \([^[:space:]]*\).*/\1/p' | LC_ALL=C sort >"$work/undefined"
printf 'blDebugOutput\nblLogToStdout\n' | diff -u - "$work/undefined" || fail "other symbols than the host's two flags are undefined"

# Hardened as Debian's packages are. Debian's own start files lack the mark that hardening-check reads, so one
# function is checked instead. The compilers for other processors do not know the option.
if [ -x "$5" ]; then
    "$5" "$library" >"$work/log" 2>&1 || true
    says "Stack protected: yes" "Fortify Source functions: yes" "Read-only relocations: yes" "Immediate binding: yes"
    if [[ $(readelf -h "$library") == *X86-64* ]]; then
        objdump -dC "$library" | grep -A 1 '<VornJsonDbApi::tableCreate()>:$' | grep endbr64 ||
            fail "no control flow protection"
    fi
fi

# Found by CMake, twice, after the host's own jsoncpp; the examples with it.
host_project found -DCMAKE_PREFIX_PATH="$work/moved" <<PROJECT
find_package(jsoncpp REQUIRED)
find_package(VornJsonDb 6 CONFIG REQUIRED)
find_package(VornJsonDb 6 CONFIG REQUIRED)
add_executable(host host.cpp)
target_link_libraries(host PRIVATE VornJsonDb::vornjsondb)
enable_testing()
include($source/examples/programs.cmake)
add_executable(guarded $source/examples/guarded/host.cpp $source/examples/guarded/main.cpp)
target_link_libraries(guarded PRIVATE VornJsonDb::vornjsondb)
PROJECT
quietly "an example against the installed library" \
    ctest --test-dir "$work/found/build" --no-tests=error --output-on-failure
(cd "$source/examples/guarded" && "$work/found/build/guarded" :memory: Ann <commands.txt >"$work/found/answers.txt")
same "what guarded answers" "$source/examples/guarded/answers.txt" "$work/found/answers.txt"

# Found on its own, whichever name SQLite's target has.
host_project found_alone -DCMAKE_PREFIX_PATH="$work/moved" <<<"$found_alone"
for target in SQLite::SQLite3 SQLite3::SQLite3; do
    host_project "found_${target%%:*}" -DCMAKE_PREFIX_PATH="$work/moved" \
        -DCMAKE_MODULE_PATH="$(sqlite_named "$target")" <<<"$found_alone"
done

# Not found for any other version.
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

# Found by Meson.
if [ -x "$6" ]; then
    mkdir "$work/meson"
    cp "$host" "$work/meson/host.cpp"
    # shellcheck disable=SC2016 # the marks of a block
    sed -n '/^```meson$/,/^```$/ { /^```/d; p }' "$source/README.md" >"$work/meson/meson.build"
    PKG_CONFIG_PATH=$work/moved/$libdir/pkgconfig quietly "Meson does not configure" \
        "$6" setup "$work/meson/build" "$work/meson"
    quietly "Meson does not build" "$6" compile -C "$work/meson/build"
    LD_LIBRARY_PATH=$work/moved/$libdir runs "$work/meson/build/host"
fi

# pkg-config names folders outside the prefix as they were given.
quietly "absolute folders do not configure" cmake -S "$source" -B "$work/absolute" "${alone[@]}" \
    -DCMAKE_INSTALL_PREFIX=/usr -DCMAKE_INSTALL_LIBDIR=/opt/lib -DCMAKE_INSTALL_INCLUDEDIR=/srv/include
for variable in libdir=/opt/lib includedir=/srv/include; do
    [ "$(pkg-config --variable="${variable%%=*}" "$work/absolute/vornjsondb.pc")" = "${variable#*=}" ] ||
        fail "pkg-config has not $variable"
done

# One example on its own, as in examples/README.md.
mkdir "$work/alone"
ln -s "$source/examples" "$work/alone/examples"
# shellcheck disable=SC2016 # the marks of a block
sed -n '/^```sh$/,/^```$/ { /^```/d; p }' "$source/examples/README.md" >"$work/alone/build.sh"
(cd "$work/alone" && PKG_CONFIG_PATH=$work/moved/$libdir/pkgconfig bash -e build.sh)
LD_LIBRARY_PATH=$work/moved/$libdir \
    bash "$source/examples/example_test.sh" "$source/examples/expected/first_steps.txt" "$work/alone/first_steps"

# Installed twice, with and without DESTDIR, and removed as the README says: what was there before stays, even an
# empty folder.
mkdir -p "$work/removed/usr/include" "$work/removed/usr/share/man"
: >"$work/removed/usr/include/other.h"
(cd "$work/removed" && find . | LC_ALL=C sort) >"$work/before"
# shellcheck disable=SC2016 # the marks of a block
sed -n '/^To uninstall it, /,/^ldconfig$/p' "$source/README.md" |
    sed -n '/^xargs/p' | sed "s|build/install/|$work/build/|" >"$work/remove.sh"
[ "$(wc -l <"$work/remove.sh")" = 2 ] || fail "the README removes it otherwise"
for _ in 1 2; do
    quietly "it does not install" cmake --install "$work/build" --prefix "$work/removed/usr"
done
[ -d "$work/removed/usr/share/man/man3" ] || fail "it was installed elsewhere"
bash -e "$work/remove.sh"
(cd "$work/removed" && find . | LC_ALL=C sort) | diff -u "$work/before" - || fail "the README's removal differs"
