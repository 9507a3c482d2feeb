#!/usr/bin/env bash
# SPDX-FileCopyrightText: 2026 The vornjsondb authors
# SPDX-License-Identifier: MIT
# check_test.sh OWNER WORK: what contrib/scale-out/scale-test judges by, on a local file: it counts what is there,
# and notices what is not.
. "$(dirname "${BASH_SOURCE[0]}")/../../scripts/common.sh"
. contrib/scale-out/judge.sh
owner=$1 work=$2

rm -rf "$work"
mkdir -p "$work"
cd "$work"

# expect WANTED [ACKNOWLEDGED]: the judge's line, without the seconds
expect() {
    local got
    got=$(judge records.db "${2-acknowledged}" | sed -E 's/\|[0-9]+\.[0-9]\|/|/')
    [ "$got" = "$1" ] || { echo "line ${BASH_LINENO[0]}: wanted $1, got $got"; exit 1; }
}

"$owner" records.db "$exclusive_wal" acknowledged 0
"$owner" records.db "$exclusive_wal" acknowledged 0 20
expect '21|0|ok'

sqlite3 records.db 'delete from record where id = 7'
expect '21|1|ok'
sqlite3 records.db "update record set text = 'changed' where id = 21"
expect '21|2|ok'
echo '0.1 5 5' >>acknowledged
expect '22|3|ok'
: >nothing
expect '0|0|ok' nothing
sqlite3 records.db 'create index texts on record (text)' '.dbconfig defensive off' 'pragma writable_schema = on' \
    "update sqlite_schema set sql = 'create index texts on record (id)' where name = 'texts'" >/dev/null
[[ $(judge records.db acknowledged) != *ok ]] || { echo 'a damaged index was not noticed'; exit 1; }

# refused DATABASE ACKNOWLEDGED MESSAGE: the judge fails and says nothing else
refused() {
    local status=0 got
    got=$(judge "$1" "$2" 2>message) || status=$?
    [[ $status != 0 && -z $got ]] && grep -qF "$3" message ||
        { echo "line ${BASH_LINENO[0]}: exit status $status: $got"; cat message; exit 1; }
}

refused missing.db acknowledged 'unable to open database'
[ ! -e missing.db ] || { echo 'the judge made a database'; exit 1; }
: >empty.db
refused empty.db acknowledged 'no such table: record'
sqlite3 other.db 'create table other (id)'
refused other.db acknowledged 'no such table: record'
refused records.db missing 'cannot open "missing"'

# Two owners that compete: each continues after the other.
"$owner" both.db '' both 1 2 20 &
"$owner" both.db '' both 1 2 20
wait $!
[[ $(judge both.db both) = [1-9]*'|0|'*'|ok' ]] || { judge both.db both; exit 1; }

# A second owner gets an error.
mkfifo end
sqlite3 taken.db "$exclusive_wal" 'create table record (id)' '.shell : >taken; timeout 60 cat end' &
within 60 'the lock is not taken' test -e taken
status=0
"$owner" taken.db "$exclusive_wal" acknowledged 0 2>message || status=$?
echo >end
wait
[ "$status" = 3 ] || { echo "the second owner: exit status $status"; cat message; exit 1; }
