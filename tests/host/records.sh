# SPDX-License-Identifier: MIT
# Shared by the tests of examples/records; sourced, not run, with their arguments: PROGRAM
# TABLES-FOLDER WORK-FOLDER. Leaves the shell in the work folder, which is empty then.
set -euo pipefail
export LC_ALL=C.UTF-8

program=$1
tables=$2
work=$3

for needed in sqlite3 script; do
    command -v "$needed" >/dev/null || { echo "$needed is not installed"; exit 1; }
done
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
    printf 'FAILED line %s: %s\n--- expected\n%s\n--- got\n%s\n' "${BASH_LINENO[-2]}" "$1" "$2" "$3"
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

# refused DATABASE STDERR ARGUMENT...: a failure with exit status 1 that leaves every byte of the
# database as it was
refused() {
    cp "$1" before.db
    expect 1 '' "$2" "${@:3}"
    same "file unchanged: ${*:3}" 'same' "$(cmp -s before.db "$1" && echo same || echo changed)"
    same "integrity: ${*:3}" ok "$(sqlite3 "$1" 'pragma integrity_check')"
}

# on DATABASE TABLE.json: what the commands that follow work with
on() { database=$1 table=$2; }

# prints STDOUT COMMAND ARGUMENT...
prints() { expect 0 "$1" '' "$database" "$table" "${@:2}"; }

# fails MESSAGE COMMAND ARGUMENT...
fails() { refused "$database" "records: $2: $1" "$database" "$table" "${@:2}"; }

# rows EXPECTED: those of the table that its file is named after, in the shell's list form
rows() { same "rows of $table" "$1" "$(sqlite3 "$database" "select * from ${table%.json} order by rowid")"; }

# what a message says when only the log knows the reason
log='failed (-v shows the log)'

# finish: the script's last line
finish() {
    echo "$checks checks, $failures failed"
    ((failures == 0))
}
