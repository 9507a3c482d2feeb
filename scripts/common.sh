# SPDX-FileCopyrightText: 2026 The vornjsondb authors
# SPDX-License-Identifier: MIT
# Shared by the scripts; sourced, not run. Leaves the shell in the project's top folder.
set -euo pipefail
cd -P "$(dirname "${BASH_SOURCE[0]}")/.."

build_packages=(build-essential cmake ninja-build libjsoncpp-dev libsqlite3-dev libgtest-dev
                iso-codes pkg-config sqlite3)
# Debian's static SQLite depends on zlib; the fuzz targets build a locale with a decimal comma.
test_packages=("${build_packages[@]}" clang devscripts locales meson python3 zlib1g-dev)

site_packages=(doxygen doxygen-awesome-css mandoc mkdocs mkdocs-material python3)

say() {
    printf '== %s\n' "$*"
}

as_root() {
    if [ "$(id -u)" = 0 ]; then "$@"; else sudo "$@"; fi
}

# missing_packages NAME...: those that are not installed, one per line.
missing_packages() {
    local name
    for name in "$@"; do
        [ "$(dpkg-query -W -f '${db:Status-Status}' "$name" 2>/dev/null)" = installed ] || echo "$name"
    done
}

# need_packages NAME...: installs those that are missing.
need_packages() {
    local missing
    mapfile -t missing < <(missing_packages "$@")
    [ ${#missing[@]} = 0 ] && return
    say "installing ${missing[*]}"
    as_root apt-get update -qq
    as_root env DEBIAN_FRONTEND=noninteractive apt-get -o DPkg::Lock::Timeout=600 install -y -qq \
        --no-install-recommends "${missing[@]}" >/dev/null
}

# need_committed_tree [PATHSPEC...]: fails if something is not committed.
need_committed_tree() {
    local changes
    changes=$(git status --porcelain -- "$@")
    [ -z "$changes" ] && return
    say "not committed:"
    echo "$changes"
    exit 1
}

# within SECONDS WHAT COMMAND...: repeats the command until it succeeds; WHAT is the message if it does not.
within() {
    local end=$((SECONDS + $1)) what=$2
    shift 2
    until "$@"; do
        if ((SECONDS >= end)); then
            say "FAILED: $what"
            return 1
        fi
        sleep 0.2
    done
}

# build PRESET [OPTION...]: configures and builds build/PRESET; its output is shown if it fails.
build() {
    local preset=$1
    shift
    build_in "build/$preset" "$preset" "$@"
}

# build_in FOLDER PRESET [OPTION...]: the same in another folder.
build_in() {
    local folder=$1 preset=$2
    shift 2
    say "building $folder"
    mkdir -p "$folder"
    if ! { cmake --preset "$preset" -B "$folder" "$@" && cmake --build "$folder"; } >"$folder/build.log" 2>&1; then
        cat "$folder/build.log"
        return 1
    fi
}

# build_package FOLDER COMMIT [OPTION...]: clones the commit into FOLDER/vornjsondb, with a build folder like a
# developer's, and builds the Debian packages next to it; the end of the build's output is shown if it fails.
build_package() {
    local folder=$1 commit=$2
    shift 2
    say "building the packages in $folder"
    git clone --quiet --no-checkout . "$folder/vornjsondb"
    git -C "$folder/vornjsondb" checkout --quiet "$commit"
    mkdir "$folder/vornjsondb/build"
    : >"$folder/vornjsondb/build/left"
    if ! (cd "$folder/vornjsondb" && dpkg-buildpackage -us -uc "$@") >"$folder.log" 2>&1; then
        tail -n 200 "$folder.log"
        return 1
    fi
}

# run_preset PRESET: runs its tests; their output is shown if one fails.
run_preset() {
    say "running the tests of the preset $1"
    if ! ctest --preset "$1" -j "$(nproc)" >"build/$1/tests.log" 2>&1; then
        cat "build/$1/tests.log"
        return 1
    fi
    grep 'tests passed' "build/$1/tests.log"
}

# figures FILE...: shows the lines "figure: NAME = NUMBER" printed by the test programs as one table. A test
# that also runs on its own prints smaller numbers then, so the largest number counts.
figures() {
    say "figures"
    awk -F ' = ' '
        /^figure: / {
            name = substr($1, 9)
            if (!(name in value)) names[++count] = name
            if (!(name in value) || $2 > value[name]) value[name] = $2
        }
        END { for (i = 1; i <= count; i++) printf "%-70s %15s\n", names[i], value[names[i]] }' "$@"
}
