#!/usr/bin/env bash
# SPDX-FileCopyrightText: 2026 The vornjsondb authors
# SPDX-License-Identifier: MIT
# memory_test.sh PROGRAM WORK: that examples/guarded, with any amount of memory that it starts with at all,
# either lists the largest notes that strangers can make or says that it failed, and then goes on. Nor does a
# long line end it.
. "$(dirname "${BASH_SOURCE[0]}")/../../../scripts/common.sh"
program=$1 work=$2

most=100000 # KB of address space, more than enough
step=2000
list='{"op":"list","condition":{},"options":{}}'
get='{"op":"get","condition":{"id":60}}'

rm -rf "$work"
mkdir -p "$work"
cd "$work"

# repeated COUNT TEXT
repeated() {
    printf "$2%.0s" $(seq "$1")
}

# under KB COMMAND...: the answers
under() {
    (ulimit -v "$1" && printf '%s\n' "${@:2}" | "$program" notes.db Ann 2>err)
}

topics="$(repeated 190 '0,')\"$(repeated 3800 é)\""
text=$(repeated 4050 é)
for id in $(seq 60); do
    echo "{\"op\":\"create\",\"record\":{\"topics\":[$topics]}}"
    echo "{\"op\":\"update\",\"condition\":{\"id\":$id},\"values\":{\"body\":\"$text\"}}"
done | "$program" notes.db Ann >made
[ "$(grep -c '"result":[01]' made)" = 120 ] || { echo "the notes were not made"; exit 1; }
right_list=$(under unlimited "$list")
right_get=$(under unlimited "$get")

failed=0 went_on=0
for ((limit = step; limit <= most; limit += step)); do
    [ "$(under $limit "$get" 2>/dev/null)" = "$right_get" ] || continue # it does not start
    under $limit "$list" "$get" >answers || { echo "$limit KB: exit status $?"; cat err; exit 1; }
    { read -r first && read -r second; } <answers || { echo "$limit KB: no two answers"; exit 1; }
    [ "$first" != "$right_list" ] || break
    [ "$first" = '{"error":"failed"}' ] || { echo "$limit KB: ${first:0:200}"; exit 1; }
    failed=$((failed + 1))
    [ "$second" != "$right_get" ] || went_on=$((went_on + 1))
done

# From the least memory with which it answers even a short line.
long="$get$(repeated 8000 ' ')"
started=0
for ((fine = step; fine <= most && started < 20; fine += 16)); do
    under $fine "$get" >answers 2>/dev/null || continue
    under $fine "$long" "$get" >answers || { echo "$fine KB, long line: exit status $?"; cat err; exit 1; }
    [ "$(wc -l <answers)" = 2 ] || { echo "$fine KB, long line: no two answers"; exit 1; }
    ! grep -vxF -e "$right_get" -e '{"error":"failed"}' answers || { echo "$fine KB, long line"; exit 1; }
    started=$((started + 1))
done
[ "$started" = 20 ] || { echo "it started $started times of 20"; exit 1; }
echo "enough: $limit KB; failed below: $failed times, answered then: $went_on"
[ "$limit" -le "$most" ] && [ "$failed" -ge 5 ] && [ "$went_on" -ge 5 ]
