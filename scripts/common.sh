# Shared by the scripts; sourced, not run. Leaves the shell in the project's top folder.
set -euo pipefail
cd "$(dirname "${BASH_SOURCE[0]}")/.."

build_packages=(build-essential cmake ninja-build libjsoncpp-dev libsqlite3-dev libgtest-dev
                iso-codes sqlite3)

say() {
    printf '== %s\n' "$*"
}

as_root() {
    if [ "$(id -u)" = 0 ]; then "$@"; else sudo "$@"; fi
}

# need_packages NAME...: installs those that are missing.
need_packages() {
    local missing=() name
    for name in "$@"; do
        [ "$(dpkg-query -W -f '${db:Status-Status}' "$name" 2>/dev/null)" = installed ] || missing+=("$name")
    done
    [ ${#missing[@]} = 0 ] && return
    say "installing ${missing[*]}"
    as_root apt-get update -qq
    as_root env DEBIAN_FRONTEND=noninteractive apt-get install -y -qq --no-install-recommends "${missing[@]}" >/dev/null
}

# build PRESET [OPTION...]: configures and builds build/PRESET.
build() {
    local preset=$1
    shift
    say "building build/$preset"
    cmake --preset "$preset" "$@" >/dev/null
    cmake --build "build/$preset" | tail -n 1
}
