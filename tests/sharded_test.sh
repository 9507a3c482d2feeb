#!/usr/bin/env bash
# SPDX-License-Identifier: MIT
# sharded_test.sh PROGRAM EXPECTED WORK: what examples/sharded says where a tenant's file is no database,
# belongs to another owner or cannot be made, and that the other files are as they were.
set -euo pipefail
program=$1 expected=$2 work=$3

rm -rf "$work"
mkdir -p "$work"
cd "$work"

# fails FOLDER MESSAGE: with this one line on standard error and nothing else
fails() {
    local status=0
    "$program" "$1" >out 2>err || status=$?
    [ "$status" = 1 ] || { echo "exit status $status for: $2"; exit 1; }
    diff - out </dev/null
    diff - err <<<"sharded: $2"
}

"$program" | diff "$expected" -
"$program" tenants | diff "$expected" -

echo 'no database' >file
fails file/tenants 'filesystem error: cannot create directories: Not a directory [file/tenants]'

head -c 200 /dev/zero | tr '\0' x >tenants/tenant-3.db
fails tenants 'tenants/tenant-3.db: file is not a database'
rm tenants/tenant-3.db
"$program" tenants | diff "$expected" -

mkfifo end
sqlite3 tenants/tenant-2.db 'pragma locking_mode=exclusive; begin immediate' \
    '.shell : >taken; read line <end' >mode &
until [ -e taken ]; do sleep 0.1; done
fails tenants 'tenants/tenant-2.db: database is locked'
echo >end
wait
"$program" tenants | diff "$expected" -
[ "$(sqlite3 tenants/tenant-2.db 'pragma integrity_check')" = ok ]
