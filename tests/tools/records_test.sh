#!/usr/bin/env bash
# SPDX-FileCopyrightText: 2026 The vornjsondb authors
# SPDX-License-Identifier: MIT
# Tests the commands that read and change records: every output, and what is in the table afterwards.
. "$(dirname "${BASH_SOURCE[0]}")/tool.sh"

cat >notes.json <<'END'
{"name": "notes",
 "create": "create table if not exists notes (id integer primary key, done boolean, tags json text, text text unique)",
 "definition": {"notes": {"member": {"id": {"cpptype": "long long"},
     "done": {"cpptype": "bool", "cppDefaultValue": false},
     "tags": {"cpptype": "Json::arrayValue"},
     "text": {"cpptype": "string"}}}}}
END
# rows EXPECTED: those of the table, in the shell's list form
rows() { same "rows line ${BASH_LINENO[0]}" "$1" "$(sqlite3 n.db 'select * from notes order by id')"; }
n=(n.db notes.json)

# -------------------------------------------------------------------------------------- create
prints '{"done":false,"id":1}' create "${n[@]}" '{"id": 1}'
prints '{"done":true,"id":2,"tags":["a",{"b":null},0.1],"text":"100% Größe '\''\"\\ 語"}' create "${n[@]}" \
    '{"text": "100% Größe '\''\"\\ \u8a9e", "tags": ["a", {"b": null}, 0.1], "id": 2, "done": true}'
prints '{"done":false,"id":3,"text":"\u0001\b\f\n\r\t"}' create "${n[@]}" - <<<'{"text": "\u0001\b\f\n\r\t"}'
# Once it is there, the table's name is enough; the defaults of the file are not known then.
prints '{"id":4,"text":""}' create n.db notes '{"text": ""}'
rows $'1|0||\n2|1|["a",{"b":null},0.10000000000000001]|100% Größe \'"\\ 語\n3|0||\x01\b\f\n\r\t\n4|||'
fails 'duplicate: UNIQUE constraint failed: notes.id' create "${n[@]}" '{"id": 1}'
fails 'duplicate: UNIQUE constraint failed: notes.text' create "${n[@]}" '{"id": 9, "text": ""}'
fails 'member "id": a string, expected an integer from -9223372036854775808 to 9223372036854775807' \
    create "${n[@]}" '{"id": "4"}'
fails 'member "txt": not declared for the table "notes"' create "${n[@]}" '{"txt": "x"}'
fails 'member "text": a string, expected UTF-8 without NUL bytes' create "${n[@]}" '{"text": "a\u0000"}'
fails 'the record is an array, expected an object' create "${n[@]}" '[1]'
fails 'RECORD: not valid JSON: column 1: Syntax error: value, object or array expected.' create "${n[@]}" ''
fails 'RECORD: not valid JSON: column 10: Extra non-whitespace after JSON value.' create "${n[@]}" '{"id":4} x'
fails 'RECORD: member "id": the integer 18446744073709551616 does not fit into 64 bits' \
    create "${n[@]}" '{"id": 18446744073709551616}'
fails "standard input:2: not valid JSON: column 2: Missing '}' or object member name" create "${n[@]}" - <<<$'{\n 1}'
wrong 'expected DATABASE TABLE RECORD' create "${n[@]}"
wrong 'expected DATABASE TABLE RECORD' create "${n[@]}" '{}' '{}'

# ---------------------------------------------------------------------------------------- save
# What a record leaves out stays as it is.
prints '{"done":true,"id":1,"text":"one"}' save "${n[@]}" '{"id": 1, "done": true, "text": "one"}'
prints '{"id":1,"text":"one"}' save "${n[@]}" '{"id": 1, "done": null}'
prints '{"done":false,"id":5,"tags":[]}' save "${n[@]}" '{"id": 5, "tags": []}'
fails 'duplicate: UNIQUE constraint failed: notes.text' save "${n[@]}" '{"id": 5, "text": "one"}'
fails 'member "id": missing, expected the whole key' \
    save "${n[@]}" '{"text": "six"}'
fails 'RECORD: not valid JSON: column 1: Syntax error: value, object or array expected.' save "${n[@]}" x

# -------------------------------------------------------------------------- list, get and count
rm n.db
printf '%s\n' '{"id": 1, "text": "one"}' '{"id": 2, "done": true, "text": "two"}' '{"id": 3, "tags": ["x"], "done": null}' \
    '{"id": 4, "text": "50% off"}' | "$program" import "${n[@]}" >out
r1='{"done":false,"id":1,"text":"one"}'
r2='{"done":true,"id":2,"text":"two"}'
r3='{"id":3,"tags":["x"]}'
r4='{"done":false,"id":4,"text":"50% off"}'
# selects IDS ARGUMENT...: the list of these records
selects() {
    local id record wanted=
    for id in $1; do record=r$id wanted+="${wanted:+$'\n'}${!record}"; done
    prints "$wanted" list n.db notes "${@:2}"
}
selects '1 2 3 4'
selects '1 2 3 4' '{}'
selects '1 2 3 4' - <<<'{}'
selects '' '{"id": 5}'
selects '2 4' '{"text": {"$in": ["two", "50% off"]}}'
selects '4' '{"text": {"$like": "%\\%%"}}'
selects '3' '{"text": null}'
selects '1 3' '{"$or": [{"id": 1}, {"tags": ["x"]}]}'
selects '4 3 2 1' --sort -id
selects '3 4 1 2' --sort text
selects '2 1 4 3' --sort=-done,-text
selects '2 3' --limit 2 --offset 1
selects '' --limit 0
selects '3 4' --after '{"id": 2}'
selects '1 2' --sort text --after '{"id": 4, "text": "50% off"}'
selects '4' '{"id": {"$gt": 1}}' --limit=1 --sort -id
fails 'member "idd": not declared for the table "notes"' list n.db notes '{"idd": 1}'
fails 'member "id desc": not declared for the table "notes"' list n.db notes --sort 'id desc'
fails 'member "tags": JSON in option "sort", expected what has an order' list n.db notes --sort tags
fails 'option --after: not valid JSON: column 1: Syntax error: value, object or array expected.' list n.db notes --after x
fails "CONDITION: not valid JSON: column 2: Missing '}' or object member name" list n.db notes '{'
fails 'the condition is an array, expected an object' list n.db notes '[]'
for value in '' x 1x -1 99999999999999999999; do
    wrong "option --limit: \"$value\", expected a number from 0" list n.db notes --limit "$value"
done
wrong 'no option of this command: --csv' list n.db notes --csv

prints "$r4" get n.db notes '{"id": 4}'
prints "$r1" get n.db notes '{}'
expect 3 '' '' get n.db notes '{"id": 5}'
fails 'the condition is a string, expected an object' get n.db notes '"id=1"'
prints 4 count n.db notes
prints 1 count n.db notes '{"done": true}'
prints 0 count n.db notes '{"id": 9}'

# ---------------------------------------------------------------------------- update and delete
prints '{"updated":2}' update n.db notes '{"id": {"$lte": 2}}' '{"tags": ["100%"], "done": null}'
prints '{"updated":0}' update n.db notes '{"id": 9}' '{"done": true}'
prints '{"updated":4}' update n.db notes --all '{"done": true}'
rows $'1|1|["100%"]|one\n2|1|["100%"]|two\n3|1|["x"]|\n4|1||50% off'
fails 'the condition is empty; --all selects every record' update n.db notes '{}' '{"done": true}'
fails 'there are no values to set' update n.db notes '{"id": 1}' '{}'
fails 'duplicate: UNIQUE constraint failed: notes.text' update n.db notes '{"id": 1}' '{"text": "two"}'
fails 'duplicate: UNIQUE constraint failed: notes.text' update n.db notes --all '{"text": "same"}'
fails 'member "done": the integer 1, expected a boolean' update n.db notes '{"id": 1}' '{"done": 1}'
fails 'VALUES: not valid JSON: column 1: Syntax error: value, object or array expected.' update n.db notes '{"id": 1}' x
wrong 'expected either a condition or --all' update n.db notes '{"id": 1}'
wrong 'expected either a condition or --all' update n.db notes --all '{"id": 1}' '{"done": true}'
prints '{"deleted":1}' delete n.db notes '{"text": "two"}'
prints '{"deleted":0}' delete n.db notes '{"text": "two"}'
fails 'the condition is empty; --all selects every record' delete n.db notes '{}'
fails 'the condition is empty; --all selects every record' delete n.db notes null
wrong 'expected either a condition or --all' delete n.db notes
wrong 'expected either a condition or --all' delete n.db notes --all '{}'
prints '{"deleted":3}' delete n.db notes --all
prints '' list n.db notes

# ---------------------------------------------------------------------------- export and check
rm n.db
printf '%s\n' '{"id": 1, "text": "a,\"b\"\nc"}' '{"id": 2, "done": true, "tags": ["x", 1], "text": ""}' \
    '{"id": 3, "done": null, "text": " Größe"}' | "$program" import "${n[@]}" >out
prints $'done,id,tags,text\nfalse,1,,"a,""b""\nc"\ntrue,2,"[""x"",1]",""\n,3,, Größe' export n.db notes --csv
prints $'done,id,tags,text\ntrue,2,"[""x"",1]",""' export n.db notes '{"id": 2}' --csv
prints $'{"done":true,"id":2,"tags":["x",1],"text":""}\n{"id":3,"text":" Größe"}' export n.db notes --offset 1
"$program" export n.db notes --csv >n.csv
same 'a shell reads the CSV' $'a,"b"\nc' "$(sqlite3 :memory: '.import --csv n.csv t' 'select text from t where id = 1')"
expect 0 '' '' check n.db
expect 0 '' '' check n.db notes
sqlite3 n.db "insert into notes values (4, 2, 'no', x'00'), (5, null, '{}', cast(x'ff' as text)), (6, 'x', '[1', 'a' || char(0))"
flaws='{"member":"done","reason":"the integer 2, expected an integer from 0 to 1","record":{"id":4},"table":"notes"}
{"member":"tags","reason":"text: not valid JSON: column 1: Syntax error: value, object or array expected.","record":{"id":4},"table":"notes"}
{"member":"text","reason":"a blob, expected text","record":{"id":4},"table":"notes"}
{"member":"tags","reason":"JSON, but no array","record":{"id":5},"table":"notes"}
{"member":"text","reason":"text that is not UTF-8","record":{"id":5},"table":"notes"}
{"member":"done","reason":"text, expected an integer from 0 to 1","record":{"id":6},"table":"notes"}
{"member":"tags","reason":"text: not valid JSON: column 3: Missing '\'','\'' or '\'']'\'' in array declaration","record":{"id":6},"table":"notes"}
{"member":"text","reason":"text with a NUL byte","record":{"id":6},"table":"notes"}'
expect 1 "$flaws" 'vornjsondb: check: not read as they are: 8' check n.db notes.json
sqlite3 n.db 'delete from notes; create table price (p real);
    create table plain (v int); create table u (v integer primary key, w int); insert into u (w) values (1.5), ('\''x'\'')'
run check n.db
same 'every table' '1 vornjsondb: check: not read as they are: 4' "$status $(cat err)"
same 'a table that cannot be described' 1 "$(grep -c '"reason":"member \\"p\\": type word' out)"
same 'a table without a key' 1 "$(grep -c '{"reason":"table \\"plain\\": no primary key","table":"plain"}' out)"
same 'values of another kind' 2 "$(grep -c '"record":{"v":[12]},"table":"u"' out)"
fails 'no table "absent"' check n.db absent
fails 'table "plain": no primary key' list n.db plain

# SQLite lets NULL into keys that are not integers.
sqlite3 nulls.db "create table k (code text primary key); insert into k select null from generate_series(1, 1001)"
prints '{"code":"x"}' create nulls.db k '{"code": "x"}'
prints '{"code":"x"}' list nulls.db k '{"code": "x"}'
fails 'member "code": null in the key of a record, which no page can follow' list nulls.db k '{"code": null}'
run check nulls.db
same 'null in a key' '1 vornjsondb: check: not read as they are: 1001' "$status $(cat err)"
same 'the first of them' '{"member":"code","reason":"null in the key","record":{"code":null},"table":"k"}' "$(head -n 1 out)"
finish
