#!/usr/bin/env bash
# SPDX-FileCopyrightText: 2026 The vornjsondb authors
# SPDX-License-Identifier: MIT
# sharded_test.sh PROGRAM EXPECTED WORK: what examples/sharded says if a tenant's file is not a database,
# belongs to another owner or cannot be made, and that the other files are as they were.
. "$(dirname "${BASH_SOURCE[0]}")/../../scripts/common.sh"
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

# whole TENANT...: their files hold the three invoices
whole() {
    local tenant
    for tenant in "$@"; do
        sqlite3 "tenants/tenant-$tenant.db" 'select id, customer from invoice order by id; pragma integrity_check' |
            diff - <(printf '1|Ada\n2|Grace\n3|Hedy\nok\n')
    done
}

"$program" | diff "$expected" -
whole {1..8}
"$program" tenants | diff "$expected" -

echo 'no database' >file
fails file/tenants 'filesystem error: cannot create directories: Not a directory [file/tenants]'

head -c 200 /dev/zero | tr '\0' x >tenants/tenant-3.db
fails tenants 'tenants/tenant-3.db: file is not a database'
whole 1 2 {4..8}
rm tenants/tenant-3.db
"$program" tenants | diff "$expected" -

mkfifo end
sqlite3 tenants/tenant-2.db 'pragma locking_mode=exclusive; begin immediate' \
    '.shell : >taken; timeout 60 cat end' >mode &
within 60 'the lock is not taken' test -e taken
fails tenants 'tenants/tenant-2.db: database is locked'
echo >end
wait
whole {1..8}
"$program" tenants | diff "$expected" -
whole {1..8}
