#!/usr/bin/env bash
# SPDX-FileCopyrightText: 2026 The vornjsondb authors
# SPDX-License-Identifier: MIT
# Tests `import`: what it reads, which line it names, and what is in the table if a line fails.
. "$(dirname "${BASH_SOURCE[0]}")/tool.sh"

# table NAME COLUMNS MEMBER=WORD...: the file NAME.json
table() {
    local member text=
    for member in "${@:3}"; do text+="${text:+,}\"${member%%=*}\":{\"cpptype\":\"${member#*=}\"}"; done
    printf '{"name":"%s","create":"create table if not exists %s (%s)","definition":{"%s":{"member":{%s}}}}' \
        "$1" "$1" "$2" "$1" "$text" >"$1.json"
}
table item 'id integer primary key, name text unique' id='long long' name=string
item=(i.db item.json)
ids() { sqlite3 i.db "select ifnull(group_concat(id), '') from (select id from item order by id)"; }

# keeps IDS STATUS OUTPUT MESSAGE ARGUMENT...: imports the lines on standard input into a table with the record 0
keeps() {
    rm -f i.db
    "$program" create "${item[@]}" '{"id": 0, "name": "zero"}' >out
    cat >lines
    expect "$2" "$3" "${4:+vornjsondb: import: $4}" import "${item[@]}" "${@:5}" lines
    same "records line ${BASH_LINENO[0]}" "$1" "$(ids)"
}

# ------------------------------------------------------------------------------ what it reads
keeps 0,1,2 0 '{"imported":2}' '' <<<$'{"id": 1}\n{"id": 2, "name": "100% \'x\'"}'
keeps 0,1,2 0 '{"imported":2}' '' <<<$'\n  {"id": 1}\r\n\t\n{"name": null}'
keeps 0,1,2 0 '{"imported":2}' '' < <(printf '\xef\xbb\xbf{"id":1}\n{"id":2}')
keeps 0,1,2 0 '{"imported":2}' '' <<<$' [\n{"id": 1},\n{"id": 2}]'
keeps 0,1 0 '{"imported":1}' '' --array rows <<<$'{"x": 1,\n"rows": [{"id": 1}]}'
keeps 0 0 '{"imported":0}' '' <<<''
keeps 0 0 '{"imported":0}' '' <<<'[]'
rm i.db
same 'standard input' '{"imported":1}' "$("$program" import "${item[@]}" <<<'{"id": 7}')"
same 'standard input by name' '{"imported":1}' "$("$program" import "${item[@]}" - <<<'{"id": 8}')"
same 'both' 7,8 "$(ids)"

# The example of the manual page for comma-separated values.
table book 'isbn text primary key, title text, year integer' isbn=string title=string year='long long'
printf 'isbn,title,year\n007,"a, ""b""",1999\n008,100%%,\n' >books.csv
made=$(sqlite3 :memory: '.mode csv' '.import books.csv t' '.mode json' \
    "select isbn, title, cast(nullif(year, '') as integer) as year from t" |
    "$program" import library.db book.json)
same 'from comma-separated values' '{"imported":2}' "$made"
same 'what they held' $'{"isbn":"007","title":"a, \\"b\\"","year":1999}\n{"isbn":"008","title":"100%"}' \
    "$("$program" list library.db book)"

# ------------------------------------------------------------------------- which line it names
# A line in each part of a batch: the lines before and after it are good.
# batch LINE TEXT: 2,500 lines, one of which is the text
batch() { seq 1 2500 | sed "s/.*/{\"id\": &, \"name\": \"n&\"}/; $1s/.*/$2/"; }
duplicate='duplicate: UNIQUE constraint failed: item'
for line in 1 100 101 150 1000 1001 2500; do
    keeps 0 1 '' "lines:$line: $duplicate.id" < <(batch $line '{"id": 0}')
    keeps 0 1 '' "lines:$line: member \"nam\": not declared for the table \"item\"" \
        < <(batch $line "{\"id\": $line, \"nam\": 1}")
    keeps 0 1 '' "lines:$line: not valid JSON: column 1: Syntax error: value, object or array expected." \
        < <(batch $line 'x')
done
keeps 0 1 '' "lines:150: $duplicate.name" < <(batch 150 '{"id": 3000, "name": "n140"}')
keeps 0 1 '' "lines:150: $duplicate.id" < <(batch 150 '{"id": 140}')
keeps 0 1 '' 'lines:3: the record is the integer 7, expected an object' <<<$'{"id": 1}\n\n7'
keeps 0 1 '' "lines:2: not valid JSON: column 6: Missing ',' or ']' in array declaration" <<<$'[{"id": 1},\n7, 8 {}]'
keeps 0 1 '' "lines:6, record 3: $duplicate.id" <<<$'\n[\n{"id": 1},\n\n{"id": 2,\n"name": "x"}, {"id": 0},\n{"id": 3}]'
keeps 0 1 '' "lines:3, record 2: $duplicate.id" --array rows <<<$'{"x": 1,\n"rows": [{"id": 1},\n{"id": 0}]}'
keeps 0 1 '' 'lines:1, record 3: member "nam": not declared for the table "item"' <<<'[{"id": 1}, {"id": 2}, {"nam": 3}]'
keeps 0 1 '' 'lines: no array under "row"' --array row <<<'{"rows": []}'
keeps 0 1 '' 'lines:1: not valid JSON: column 2: Missing '\''}'\'' or object member name' <<<$'{\n"id": 1}'
fails 'standard input:2: the record is null, expected an object' import "${item[@]}" <<<$'{"id": 1}\nnull'
fails 'absent.jsonl: No such file or directory' import "${item[@]}" absent.jsonl
fails '.: Is a directory' import "${item[@]}" .
fails 'absent.db: unable to open database file; to make it, give a table file' import absent.db item lines

# Keys that SQLite makes
table log 'id integer primary key, name text unique' id='long long' name=string
rm -f i.db
printf '{"name": "a"}\n{"name": "a"}\n' >lines
expect 1 '' 'vornjsondb: import: lines:2: duplicate: UNIQUE constraint failed: log.name' import i.db log.json lines
prints 0 count i.db log
printf '{"name": "a"}\n{"name": "b"}\n{}\n' >lines
prints '{"imported":3}' import i.db log.json lines
prints $'{"id":1,"name":"a"}\n{"id":2,"name":"b"}\n{"id":3}' list i.db log

# A trigger that changes, ignores or refuses a row, or ends the transaction.
# triggered STATEMENT MESSAGE [LINES]
triggered() {
    rm -f i.db
    "$program" create "${item[@]}" '{"id": 0}' >out
    sqlite3 i.db "create trigger t $1"
    batch 1 '{"id": 1}' >lines
    fails "lines:${3:-1200}: $2" import "${item[@]}" lines
}
triggered 'after insert on item when new.id = 1200 begin update item set name = '\''y'\'' where id = 1200; end' \
    'member "name": the row differs or is gone; see the triggers'
triggered 'before insert on item when new.id = 1200 begin select raise(ignore); end' \
    'a trigger or an "on conflict" clause ignored a record'
triggered 'before insert on item when new.id = 1200 begin select raise(abort, '\''not 1200'\''); end' 'not 1200'
triggered 'before insert on item when new.id = 1200 begin select raise(rollback, '\''record 3: no'\''); end' 'record 3: no'
# It needs a record that has gone with the transaction.
triggered 'before insert on item when exists (select * from item where id = new.id - 1199 and id > 0)
    begin select raise(rollback, '\''too many'\''); end' 'too many' 1200
{ echo -n '['; paste -sd, lines; echo ']'; } | tr -d '\n' >array
fails 'array:1, record 1200: too many' import "${item[@]}" array

# ----------------------------------------------------------------------------------- --batch
# first N: the ids from 0 to N
first() { seq -s, 0 "$1"; }
kept() { printf '; the first %s records were imported before it' "$1"; }
few() { batch "$@" | head -n 30; }
keeps "$(first 2500)" 0 '{"imported":2500}' '' --batch 1300 < <(batch 1 '{"id": 1}')
keeps "$(first 30)" 0 '{"imported":30}' '' --batch 7 < <(few 1 '{"id": 1}')
keeps "$(first 30)" 0 '{"imported":30}' '' --batch 30 < <(few 1 '{"id": 1}')
keeps "$(first 2400)" 1 '' "lines:2450: $duplicate.id$(kept 2400)" --batch 1200 < <(batch 2450 '{"id": 0}')
keeps "$(first 4)" 1 '' "lines:5: $duplicate.id$(kept 4)" --batch 1 < <(few 5 '{"id": 0}')
keeps 0 1 '' "lines:20: $duplicate.id$(kept 0)" --batch 5000 < <(few 20 '{"id": 0}')
keeps "$(first 3)" 1 '' "lines:4: not valid JSON: column 1: Syntax error: value, object or array expected.$(kept 3)" \
    --batch 3 < <(few 4 x)
wrong 'option --batch: "0", expected a number from 1' import "${item[@]}" --batch 0

# -------------------------------------------------------------------------- many, and progress
# Neither the records nor their answer have to fit into memory.
ulimit -v "$3"  # KiB
seq 1 60000 | awk '{ s = sprintf("%2000s", $1); printf "{\"id\": %d, \"name\": \"%s\"}\n", $1, s }' >many.jsonl
rm -f i.db
prints '{"imported":60000}' import "${item[@]}" many.jsonl
"$program" list i.db item | tr -d ' ' >listed
same 'each record comes back' same "$(tr -d ' ' <many.jsonl | cmp - listed && echo same)"
"$program" list i.db item --sort -name | tr -d ' ' | sort >sorted
same 'in another order, too' same "$(sort listed | cmp - sorted && echo same)"
rm many.jsonl i.db

# terminal REDIRECTION: what a terminal shows of an import of 2,500 lines
batch 1 '{"id": 1}' >lines
terminal() { rm -f i.db; script -qec "'$program' import i.db item.json lines $1" /dev/null </dev/null; }
same 'progress' "$(seq 100 100 2500 | sed 's/.*/\r& records/' | tr -d '\n'; printf '\r\n.')" "$(terminal '>out'; printf .)"
same 'the output beside it' "$(lines '{"imported":2500}')" "$(text_of out)"
same 'no progress in a file' $'{"imported":2500}\r' "$(terminal '2>err')"
same 'nothing there' "$(lines '')" "$(text_of err)"
finish
