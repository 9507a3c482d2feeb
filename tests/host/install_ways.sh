#!/usr/bin/env bash
# SPDX-License-Identifier: MIT
# install_ways.sh: runs every block of README's "Install it", word for word: each way ends in the README's
# host, which has to print what the README says, and is then removed again. For a machine that is thrown
# away afterwards; scripts/release/clean-root makes one.
set -euo pipefail
clone=$(cd "$(dirname "$0")/../.." && pwd)
work=$(mktemp -d)
: >"$work/taken"

say() {
    printf '== %s\n' "$*"
}

fail() {
    printf 'install_ways: %s\n' "$*" >&2
    exit 1
}

# blocks: the README's blocks, each line of them as SECTION|LANGUAGE|NUMBER|LINE.
blocks() {
    awk '
        /^```/ && !inside { language = substr($0, 4); number = ++count[section, language] }
        /^```/ { inside = !inside; next }
        inside { print section "|" language "|" number "|" $0 }
        !inside && /^## / { chapter = substr($0, 4) }
        !inside && /^##/ { section = chapter; if (/^###/) section = section ", " substr($0, 5) }
    ' "$clone/README.md"
}

# block SECTION LANGUAGE NUMBER: the text of one.
block() {
    local name="$1|$2|$3|"
    echo "$name" >>"$work/taken"
    blocks | awk -v name="$name" 'index($0, name) == 1 { print substr($0, length(name) + 1); found = 1 }
        END { exit !found }' || fail "the README has no block $name"
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

finds="Install it, A host that finds it"
part="Install it, As a part of the host's own build"

say "what it needs"
in_folder "$clone" "Install it" 1
installed >"$work/before"

way "by CMake"
in_folder "$clone" "Install it, By CMake" 1 unshare --net
folder=$(host found)
block "$finds" cmake 1 >"$folder/CMakeLists.txt"
in_folder "$folder" "$finds" 1
printed
in_folder "$(host pkg_config)" "$finds" 2
printed
in_folder "$clone" "Install it, By CMake" 2
nothing_left

way "by Debian packages"
in_folder "$clone" "Install it, By Debian packages" 1
installed >"$work/before"
in_folder "$clone" "Install it, By Debian packages" 2
folder=$(host packaged)
block "$finds" cmake 1 >"$folder/CMakeLists.txt"
in_folder "$folder" "$finds" 1
printed
in_folder "$(host packaged_pkg_config)" "$finds" 2
printed
in_folder "$clone" "Install it, By Debian packages" 3
nothing_left

for number in 1 2; do
    way "as a part of the host's own build, $number"
    folder=$(host "part_$number")
    git clone --quiet "$clone" "$folder/vornjsondb"
    block "$part" cmake "$number" >"$folder/CMakeLists.txt"
    in_folder "$folder" "$finds" 1
    printed
    nothing_left
done

blocks | grep '^Install it' | cut -d '|' -f 1-3 | LC_ALL=C sort -u >"$work/all"
grep '^Install it' "$work/taken" | cut -d '|' -f 1-3 | LC_ALL=C sort -u | diff "$work/all" - || fail "a block was not run"
rm -r "$work"
