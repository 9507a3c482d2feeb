#!/usr/bin/env bash
# SPDX-FileCopyrightText: 2026 The vornjsondb authors
# SPDX-License-Identifier: MIT
# Shared by the tests of the program vornjsondb; sourced, not run, with their arguments: PROGRAM
# WORK-FOLDER [MEMORY]. Leaves the shell in the work folder, which is empty then.
set -euo pipefail
export LC_ALL=C.UTF-8

program=$1
work=$2

command -v sqlite3 >/dev/null || { echo "sqlite3 is not installed"; exit 1; }
rm -rf "$work"
mkdir -p "$work"
cd "$work"

checks=0
failures=0

# same NAME EXPECTED ACTUAL
same() {
    checks=$((checks + 1))
    [[ $2 == "$3" ]] && return
    failures=$((failures + 1))
    printf 'FAILED line %s: %s\n--- expected\n%s\n--- got\n%s\n' "${BASH_LINENO[*]: -2:1}" "$1" "$2" "$3"
}

# What the file holds and one dot, which keeps the newlines before it.
text_of() { cat "$1"; printf .; }

# lines TEXT: the text as a program prints it, and the dot
lines() { printf '%s' "$1${1:+$'\n'}."; }

# run ARGUMENT...: the program; sets $status and leaves what it prints in the files out and err
run() {
    status=0
    "$program" "$@" >out 2>err || status=$?
}

# expect STATUS STDOUT STDERR ARGUMENT...
expect() {
    run "${@:4}"
    same "exit status: ${*:4}" "$1" "$status"
    same "standard output: ${*:4}" "$(lines "$2")" "$(text_of out)"
    same "standard error: ${*:4}" "$(lines "$3")" "$(text_of err)"
}

# prints STDOUT ARGUMENT...: and ends with 0
prints() { expect 0 "$1" '' "${@:2}"; }

# fails MESSAGE COMMAND ARGUMENT...: with exit status 1 and leaves the database as it was
fails() {
    local before=none after=none
    [ -f "$3" ] && before=$(sha256sum <"$3")
    expect 1 '' "vornjsondb: $2: $1" "${@:2}"
    [ -f "$3" ] && after=$(sha256sum <"$3")
    same "file unchanged: ${*:2}" "$before" "$after"
}

# wrong MESSAGE COMMAND ARGUMENT...: wrong usage
wrong() { expect 2 '' "vornjsondb: $2: $1"$'\n'"Try 'vornjsondb --help'." "${@:2}"; }

# finish: the script's last line
finish() {
    echo "$checks checks, $failures failed"
    ((failures == 0))
}
