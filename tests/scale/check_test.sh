#!/usr/bin/env bash
# SPDX-License-Identifier: MIT
# check_test.sh OWNER WORK: what scripts/scale-test judges by, on a local file: it counts what is there,
# and notices what is not.
set -euo pipefail
. "$(dirname "${BASH_SOURCE[0]}")/judge.sh"
owner=$1 work=$2

rm -rf "$work"
mkdir -p "$work"
cd "$work"

# expect WANTED: of the judge, without the seconds
expect() {
    local got
    got=$(judge records.db acknowledged | sed -E 's/\|[0-9]+\.[0-9]\|/|/')
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
sqlite3 records.db 'create index texts on record (text)' 'pragma writable_schema = on' \
    "update sqlite_schema set sql = 'create index texts on record (id)' where name = 'texts'"
[[ $(judge records.db acknowledged) != *ok ]] || { echo 'a damaged index was not noticed'; exit 1; }

# A second owner is told.
mkfifo end
sqlite3 taken.db "$exclusive_wal" 'create table record (id)' '.shell : >taken; read line <end' &
until [ -e taken ]; do sleep 0.1; done
status=0
"$owner" taken.db "$exclusive_wal" acknowledged 0 2>message || status=$?
echo >end
wait
[ "$status" = 3 ] || { echo "the second owner: exit status $status"; cat message; exit 1; }
