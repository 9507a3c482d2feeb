#!/usr/bin/env bash
# SPDX-FileCopyrightText: 2026 The vornjsondb authors
# SPDX-License-Identifier: MIT
# Tests how the program ends: usage, help, the log, outputs that cannot be written, and locks.
project=$(realpath "$(dirname "${BASH_SOURCE[0]}")/../..")
. "$(dirname "${BASH_SOURCE[0]}")/tool.sh"

cat >item.json <<'END'
{"name": "item", "create": "create table if not exists item (id integer primary key, name text)",
 "definition": {"item": {"member": {"id": {"cpptype": "long long"}, "name": {"cpptype": "string"}}}}}
END
seq 1 20000 | sed 's/.*/{"id":&,"name":"the name of item &"}/' >lines
prints '{"imported":20000}' import i.db item.json lines

# ------------------------------------------------------------------------------ usage and files
hint=$'\n'"Try 'vornjsondb --help'."
expect 2 '' "vornjsondb: no command$hint"
expect 2 '' "vornjsondb: no command$hint" -v
wrong 'no such command' erase i.db item
wrong 'no such command' records
wrong 'expected DATABASE TABLE CONDITION' get i.db item
expect 2 '' "vornjsondb: option -x: unknown$hint" list i.db item -x
expect 2 '' "vornjsondb: option --erase: unknown$hint" list i.db item --erase
expect 2 '' "vornjsondb: option --limit: no value$hint" list i.db item --limit
run --version
same 'version' yes "$([[ $status$(cat out) =~ ^0vornjsondb\ [0-9.]+$ ]] && echo yes)"
run --help
same 'help' '0 ' "$status $(cat err)"
for command in import export list get count create save update delete check describe infer; do
    same "help names $command" 1 "$(grep -c "^  $command " out)"
    same "the manual page names $command" 1 "$(grep -c "^\.It Cm $command " "$project/man/vornjsondb.1")"
done

# -------------------------------------------------------------------------------- completion
. "$project/tools/completion/vornjsondb"
compopt() { true; }
# completes WORDS EXPECTED: what may stand in place of the last word
completes() {
    read -ra COMP_WORDS <<<"$1"
    [[ $1 == *' ' ]] && COMP_WORDS+=('')
    COMP_CWORD=$((${#COMP_WORDS[@]} - 1))
    _vornjsondb
    same "completion of $1" "$2" "${COMPREPLY[*]}"
}
completes 'vornjsondb im' import
completes 'vornjsondb -v de' 'delete describe'
completes 'vornjsondb --ver' '--version --verbose'
completes 'vornjsondb update --' '--all --verbose'
completes 'vornjsondb list i.db it' 'item.json item'
completes 'vornjsondb list --limit 3 i.db it' 'item.json item'
completes 'vornjsondb list --limit ' ''
completes 'vornjsondb import i.db item li' lines
completes 'vornjsondb list i.db item li' ''

# ------------------------------------------------------------------------------------- files
fails 'absent.db: unable to open database file' list absent.db item.json
fails 'no table "task"' list i.db task
fails 'no.json: No such file or directory' list i.db no.json
echo '{"name": "item"}' >part.json
fails 'part.json: expected "name", "create" and "definition"' list i.db part.json
sqlite3 empty.db 'create table other (id)'
fails 'no table "item"' list empty.db item.json
fails 'file is not a database' list lines item.json
sed 's/create table/create tabel/' item.json >wrong.json
fails 'near "tabel": syntax error' list i.db wrong.json

# --------------------------------------------------------------------------------------- the log
run create i.db item '{"id": 1}'
same 'no log' '1 vornjsondb: create: duplicate: UNIQUE constraint failed: item.id' "$status $(cat out err)"
run -v create i.db item '{"id": 1}'
same 'no log in the output' '' "$(cat out)"
same 'the log, and then the reason' yes "$([[ $(head -1 err) == *'run sql failed, error=UNIQUE'* && \
    $(tail -1 err) == 'vornjsondb: create: duplicate: UNIQUE constraint failed: item.id' ]] && echo yes)"
run list -v i.db item '{"id": 7}'
same 'only records in the output' '{"id":7,"name":"the name of item 7"}' "$(cat out)"
status=0
"$program" -v get i.db item '{"id": 7}' >out 2>&- || status=$?
same 'the log where standard error is closed' '0 {"id":7,"name":"the name of item 7"}' "$status $(cat out)"

# ------------------------------------------------------------------------------------ the output
# ends STATUS MESSAGE COMMAND...: of the shell, in which $program prints to what it likes
ends() {
    status=0
    eval "${*:3}" 2>err || status=$?
    same "exit status: ${*:3}" "$1" "$status"
    same "standard error: ${*:3}" "$(lines "$2")" "$(text_of err)"
}
full='standard output: No space left on device'
for command in 'list i.db item' 'export i.db item --csv' 'get i.db item "{}"' 'describe i.db item' 'infer lines' \
    'count i.db item' 'save i.db item "{\"id\":5}"'; do
    ends 1 "vornjsondb: ${command%% *}: $full" '"$program"' "$command" '>/dev/full'
    ends 1 "vornjsondb: ${command%% *}: standard output: Bad file descriptor" '"$program"' "$command" '>&-'
done
ends 1 "vornjsondb: $full" '"$program" --help >/dev/full'
# A reader that has had enough: nothing is said about it.
for command in 'list i.db item' 'list i.db item --sort name' 'export i.db item --csv'; do
    ends 0 '' "{ \"\$program\" $command; echo \$? >ended; } | head -n 1 >first; true"
    same "closed pipe: $command" 1 "$(cat ended)"
    same "a line before it: $command" 1 "$(wc -l <first)"
done
# A slow reader of a pipe that does not block gets every line once.
same 'slow reader' "$(sha256sum <lines)" "$(python3 -c 'import os, subprocess, sys, time
reader, writer = os.pipe2(os.O_NONBLOCK)
tool = subprocess.Popen([sys.argv[1], "list", "i.db", "item"], stdout=writer)
os.close(writer)
os.set_blocking(reader, True)
time.sleep(0.2)
while part := os.read(reader, 65536): os.write(1, part)
sys.exit(tool.wait())' "$program" | sha256sum)"

# -------------------------------------------------------------------------------------- locks
# Another program writes meanwhile: what reads goes on, what writes waits and gives up.
mkfifo commands
sqlite3 i.db <commands >locked &
holder=$!
exec 4>commands
echo 'begin immediate; select 1;' >&4
until [[ -s locked ]]; do sleep 0.05; done
prints 20000 count i.db item
prints '{"id":7,"name":"the name of item 7"}' list i.db item '{"id": 7}'
for command in "create i.db item '{\"id\": 0}'" 'import i.db item lines' "update i.db item --all '{\"name\": null}'"; do
    { eval "\"\$program\" $command" >"out.${command%% *}" 2>"err.${command%% *}" || echo $? >"status.${command%% *}"; } &
    writers+=($!)
done
wait "${writers[@]}"
same 'create' '1 vornjsondb: create: locked: database is locked' "$(cat status.create err.create out.create | paste -sd' ')"
same 'import' '1 vornjsondb: import: database is locked' "$(cat status.import err.import out.import | paste -sd' ')"
same 'update' '1 vornjsondb: update: locked: database is locked' "$(cat status.update err.update out.update | paste -sd' ')"
echo 'rollback;' >&4
exec 4>&-
wait $holder
prints '{"id":0}' create i.db item '{"id": 0}'
finish
