#!/usr/bin/env bash
# SPDX-FileCopyrightText: 2026 The vornjsondb authors
# SPDX-License-Identifier: MIT
# install_ways.sh: runs every block of README's "Install it", word for word: each way ends in the README's
# host, which has to print what the README says, and is then removed again. For a machine that is thrown
# away afterwards; scripts/release/clean-root makes one.
set -euo pipefail
clone=$(cd "$(dirname "$0")/../.." && pwd)
work=$(mktemp -d)

say() {
    printf '== %s\n' "$*"
}

fail() {
    printf 'install_ways: %s\n' "$*" >&2
    exit 1
}

# block SECTION LANGUAGE NUMBER: the text of one block of the README.
block() {
    awk -v name="$1|$2|$3" '
        /^```/ && !inside { language = substr($0, 4); block = section "|" language "|" (++count[section, language]) }
        /^```/ { inside = !inside; next }
        inside && block == name { print; found = 1 }
        !inside && /^## / { chapter = substr($0, 4) }
        !inside && /^##/ { section = chapter; if (/^###/) section = section ", " substr($0, 5) }
        END { exit !found }' "$clone/README.md" || fail "the README has no block $1|$2|$3"
}

# in_folder FOLDER SECTION NUMBER [COMMAND...]: the shell block, as a user types it, run by COMMAND; what it says
# is shown when it fails.
in_folder() {
    local text
    text=$(block "$2" sh "$3")
    sed 's/^/$ /' <<<"$text"
    (cd "$1" && "${@:4}" bash -euo pipefail -c "$text") >"$work/log" 2>&1 || { cat "$work/log"; fail "a command failed"; }
}

# host NAME: the folder of a new host.
host() {
    mkdir "$work/$1"
    block "A host in 30 lines" cpp 1 >"$work/$1/host.cpp"
    echo "$work/$1"
}

# printed: the block that ran last ended with what the README says.
printed() {
    block "A host in 30 lines" "" 1 >"$work/expected"
    tail -n "$(wc -l <"$work/expected")" "$work/log" | diff -u "$work/expected" - || fail "the host prints something else"
    say "the host prints what the README says"
}

# installed: files and folders.
installed() {
    find /usr /etc /opt | LC_ALL=C sort
}

# way NAME: begins a way.
way() {
    say "$1"
    way=$1 began=$SECONDS
}

# nothing_left: everything is as it was before the way, which ends here.
nothing_left() {
    installed | diff "$work/before" - || fail "not everything was removed"
    say "removed"
    echo "figure: seconds $way = $((SECONDS - began))"
}

# found_by_hosts NAME: the README's host is built and run, by CMake, pkg-config and Meson.
found_by_hosts() {
    local folder
    folder=$(host "$1")
    block "Install it, A host that finds it" cmake 1 >"$folder/CMakeLists.txt"
    in_folder "$folder" "Install it, A host that finds it" 1
    printed
    in_folder "$(host "$1_pkg_config")" "Install it, A host that finds it" 2
    printed
    folder=$(host "$1_meson")
    block "Install it, A host that finds it" meson 1 >"$folder/meson.build"
    in_folder "$folder" "Install it, A host that finds it" 3
    printed
}

# way_as_part NUMBER: with the CMakeLists.txt on standard input.
way_as_part() {
    local folder
    way "as a part of the host's own build, $1"
    folder=$(host "part_$1")
    git clone --quiet "$clone" "$folder/vornjsondb"
    cat >"$folder/CMakeLists.txt"
    in_folder "$folder" "Install it, A host that finds it" 1
    printed
    nothing_left
}

say "what it needs"
in_folder "$clone" "Install it" 1
installed >"$work/before"

way "by CMake"
in_folder "$clone" "Install it, By CMake" 1 unshare --net
found_by_hosts installed
in_folder "$clone" "Install it, By CMake" 2
nothing_left

way "by Debian packages"
in_folder "$clone" "Install it, By Debian packages" 1
installed >"$work/before"
in_folder "$clone" "Install it, By Debian packages" 2
found_by_hosts packaged
in_folder "$clone" "Install it, By Debian packages" 3
nothing_left

block "Install it, As a part of the host's own build" cmake 1 | way_as_part 1
block "Install it, As a part of the host's own build" cmake 2 | way_as_part 2
rm -r "$work"
