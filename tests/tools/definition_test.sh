#!/usr/bin/env bash
# SPDX-FileCopyrightText: 2026 The vornjsondb authors
# SPDX-License-Identifier: MIT
# Tests the definitions that `infer` and `describe` print, and what they refuse.
. "$(dirname "${BASH_SOURCE[0]}")/tool.sh"

# definition NAME COLUMNS MEMBER=WORD...: the text of a table file
definition() {
    local member text=
    for member in "${@:3}"; do text+="${text:+,$'\n'}    \"${member%%=*}\": {\"cpptype\":\"${member#*=}\"}"; done
    printf '{"name": "%s",\n "create": "%s %s (%s)",\n "definition": {"%s": {"member": {\n%s}}}}' \
        "$1" "${create:-create table if not exists}" "$1" "$2" "$1" "$text"
}

# infers COLUMNS MEMBER=WORD... : of the JSON lines on standard input
infers() {
    cat >given.jsonl
    prints "$(definition given "$@")" infer given.jsonl
}

# What is said of a bad name.
name='expected letters, digits and "_", and no keyword of SQL'
# refuses MESSAGE ARGUMENT...: for the JSON lines on standard input
refuses() {
    cat >given.jsonl
    fails "$1" infer given.jsonl "${@:2}"
}

# ---------------------------------------------------------------------------------------- infer
# one TYPE WORD VALUE...: each a value of the member m
one() {
    local value
    for value in "${@:3}"; do printf '{"m": %s}\n' "$value"; done |
        infers "id integer primary key, m $1" id='long long' "m=$2"
}
one text string '"a"' '"100% \"wool\" Größe"'
one text string '"7"' null '""'
one integer 'long long' 1 -9223372036854775808 9223372036854775807 null
one boolean bool true null false
one 'json text' Json::objectValue '{}' '{"a": [1.5, {"b": null}]}'
one 'json text' Json::arrayValue '[]' '[[1], "x"]' null
one 'json text' Json::Value null
one 'json text' Json::Value 1.5 2.5
one 'json text' Json::Value 1 2.0
one 'json text' Json::Value 9223372036854775808
one 'json text' Json::Value 1 '"1"'
one 'json text' Json::Value true 1
one 'json text' Json::Value '[]' '{}'
one 'json text' Json::Value '"a\u0000b"'
one 'json text' Json::Value 1 true 1
infers 'a text, b integer, c json text, id integer primary key' a=string b='long long' c=Json::Value id='long long' <<<$'{"b": 1, "c": null}\n\n  {"a": "x"}\r'

# The key: "id", which is added if no record has it, or the member asked for.
infers 'id integer primary key' id='long long' <<<$'{"id": 2}\n{"id": 1}'
infers 'id text not null primary key' id=string <<<$'{"id": "2"}\n{"id": "1"}'
infers 'id integer primary key' id='long long' <<<'{}'
hint='--key names another key, --add-key adds one'
refuses 'given.jsonl:3: member "id": not unique, and it is the key; '"$hint" <<<$'{"id": 2}\n{"id": 1}\n{"id": 2}\n{}'
refuses 'given.jsonl:2: member "id": missing, and it is the key; '"$hint" <<<$'{"id": 2}\n{"x": true}'
refuses 'given.jsonl:1: member "id": missing, and it is the key; '"$hint" <<<$'{"x": true}\n{"id": 2}'
refuses 'given.jsonl:2: member "id": strings and integers, and it is the key; '"$hint" <<<$'{"id": 2}\n{"id": "2"}'
refuses 'given.jsonl:1: member "id": neither a string nor an integer, and it is the key; '"$hint" <<<'{"id": true}'
refuses 'key "id": there is a member "ID"; '"$hint" <<<'{"ID": 1}'
printf '{"code": "a", "id": 1}\n{"code": "b", "id": 1}\n' >codes.json
prints "$(definition codes 'code text not null primary key, id integer' code=string id='long long')" \
    infer codes.json --key code
prints "$(definition codes 'code text, id integer, row integer primary key' code=string id='long long' row='long long')" \
    infer codes.json --add-key row
prints "$(definition t 'code text not null primary key, id integer' code=string id='long long')" \
    infer --table t --key code codes.json
fails 'codes.json:2: member "id": not unique, and it is the key' infer codes.json --key id
fails 'key "code": there is a member "code"; '"$hint" infer codes.json --add-key code
fails 'key "Code": there is a member "code"; '"$hint" infer codes.json --add-key Code
fails 'member "order": '"$name" infer codes.json --add-key order
wrong 'expected either --key or --add-key' infer codes.json --add-key row --key code
refuses 'given.jsonl:2: member "id": missing, and it is the key' --key id <<<$'{"id": 1}\n{"x": 1}'
refuses 'given.jsonl:1: member "idd": missing, and it is the key' --key idd <<<$'{"id": 1}\n{"x": 1}'
refuses 'given.jsonl:1: member "id": missing, and it is the key' --key id <<<'{"id": null}'
refuses 'given.jsonl:1: member "id": neither a string nor an integer, and it is the key' --key id <<<'{"id": 1.5}'
refuses 'given.jsonl:2: member "id": strings and integers, and it is the key' --key id <<<$'{"id": 1}\n{"id": "x"}'

# Arrays, standard input and names of files
printf '[{"a": 1},\n {"a": null}]' >array-1.json
prints "$(definition array_1 'a integer, id integer primary key' a='long long' id='long long')" infer array-1.json
printf '{"first": 1, "rows": [{"a": 1}]}' >keyed.json
prints "$(definition keyed 'a integer, id integer primary key' a='long long' id='long long')" infer keyed.json --array rows
prints "$(definition std 'a integer, id integer primary key' a='long long' id='long long')" infer - --table std <array-1.json
printf '\xef\xbb\xbf{"a": 1}' >mark.json
prints "$(definition mark 'a integer, id integer primary key' a='long long' id='long long')" infer mark.json
wrong 'standard input has no name: --table gives the table one' infer -

refuses 'given.jsonl:2: member "order": '"$name" \
    <<<$'{"a": 1}\n{"order": 1}'
refuses 'given.jsonl:1: member "a b": '"$name" \
    <<<'{"a b": 1}'
refuses 'given.jsonl:1: member "x text); drop table y; --": '"$name" \
    <<<'{"x text); drop table y; --": 1}'
refuses 'given.jsonl:2: member "Id": differs from "id" only in case' <<<$'{"id": 1}\n{"Id": 2}'
refuses 'given.jsonl:3: member "a": the integer 9223372036854775808000 does not fit into 64 bits' \
    <<<$'{"a": 1}\n{"a": 1e30}\n{"a": [9223372036854775808000]}'
refuses 'given.jsonl:1: member "a": a string that is not UTF-8' <<<$'{"a": "\xff"}'
refuses 'given.jsonl:1: member "a": a string that is not UTF-8' <<<'{"a": {"\udc00": 1}}'
refuses 'given.jsonl:2: not an object' <<<$'{"a": 1}\n7'
refuses "given.jsonl:3: not valid JSON: column 5: Missing ':' after object member name" <<<$'{"a": 1}\n\n{"a"}'
refuses 'given.jsonl:1: not valid JSON: column 9: Duplicate key: '\''a'\''' <<<'{"a": 1,"a": 2}'
refuses 'given.jsonl:1: JSON of more than 1000 levels' <<<"{\"a\":$(printf '[%.0s' {1..1001})"
refuses 'given.jsonl: no records' <<<''
refuses 'table "select": '"$name" --table select <<<'{"a": 1}'
printf '[{"a": 1},\n{"a":\n 99999999999999999999}]' >large.json
fails 'large.json:3: member "a": the integer 99999999999999999999 does not fit into 64 bits' infer large.json
printf '[{"a": 1},\n{"order":\n 1}]' >names.json
fails 'names.json:2, record 2: member "order": '"$name" infer names.json
printf '[{"a": 1},\n{"a":\n 1} {}]' >broken.json
fails "broken.json:3: not valid JSON: column 5: Missing ',' or ']' in array declaration" infer broken.json
fails 'keyed.json: no array under "first"' infer keyed.json --array first
fails 'keyed.json: no array under "none"' infer keyed.json --array none
fails 'absent.json: No such file or directory' infer absent.json
fails '.: Is a directory' infer .

# ------------------------------------------------------------------------------------- describe
create='CREATE TABLE IF NOT EXISTS'
# describes COLUMNS MEMBER=WORD...: a table d that the shell has made with these columns
describes() {
    rm -f d.db
    sqlite3 d.db "create table d ($1); ${rows:-}"
    prints "$(definition d "$@")" describe d.db D
}
describes 'id integer primary key, name varchar(20) unique, big BIGINT, done boolean, any json text, t text' \
    any=Json::Value big='long long' done=bool id='long long' name=string t=string
describes 'id text primary key, v' id=string v=string
rows="insert into d values (1, 5, null), (2, null, 7)" \
    describes 'id integer primary key, n numeric, u' id='long long' n='long long' u='long long'
# not_described MESSAGE SQL: the table d that it makes
not_described() {
    rm -f d.db
    sqlite3 d.db "$2"
    fails "$1" describe d.db d
}
not_described 'no table "d"' 'create table e (id)'
not_described '"d" is a view, not a table' 'create table e (id); create view d as select * from e'
not_described 'member "v": the column holds integer and text values, which no type word reads exactly' \
    "create table d (id integer primary key, v); insert into d (v) values (1), ('x')"
not_described 'member "v": the column holds blob values, which no type word reads exactly' \
    "create table d (id integer primary key, v blob); insert into d (v) values (x'00')"
not_described 'member "born": column type "date", expected a text column' \
    "create table d (id integer primary key, born date); insert into d (born) values ('2026-01-01')"
not_described 'member "a b": '"$name" \
    'create table d (id integer primary key, "a b" text)'
not_described 'table "d": no primary key' 'create table d (a integer, b text)'
not_described 'table "d": cannot UPDATE generated column "g"' \
    'create table d (a integer primary key, g integer as (a + 1))'
not_described 'member "price": type word "double", expected "string", "int", "long long", "bool", "Json::objectValue", '\
'"Json::arrayValue" or "Json::Value"; fractions as integers of the smallest unit, as text or inside JSON' \
    'create table d (id integer primary key, price real)'
fails 'absent.db: unable to open database file' describe absent.db d
fails 'file is not a database' describe keyed.json d

# What infer prints makes a table that describe reads.
run infer codes.json --key code
cp out codes.def.json
sqlite3 c.db "$(sqlite3 :memory: "select json_extract(readfile('codes.def.json'), '\$.create')")"
prints "$(definition codes \
    'code text not null primary key, id integer' code=string id='long long')" describe c.db codes

# Every kind of member: what is imported is listed as it was, with the file and with the description.
cat >kinds.jsonl <<'END'
{"array":[[1],"x"],"boolean":false,"fraction":-0.0,"integer":9223372036854775807,"key":"B","mixed":"1","object":{"a":{"b":[null,1.5]}}}
{"array":[],"boolean":true,"fraction":0.1,"integer":-9223372036854775808,"key":"a","mixed":1,"none":null,"object":{}}
{"boolean":null,"fraction":1.0,"integer":null,"key":"b","mixed":18446744073709551615,"text":"a'b\u0001%"}
{"fraction":5e-324,"integer":4294967296,"key":"c","mixed":[true]}
{"fraction":null,"key":"ß","mixed":{"":false},"text":""}
END
prints "$(create='create table if not exists' definition kinds 'array json text, boolean boolean, fraction json text, '\
'integer integer, key text not null primary key, mixed json text, none json text, object json text, text text' \
    array=Json::arrayValue boolean=bool fraction=Json::Value integer='long long' key=string mixed=Json::Value \
    none=Json::Value object=Json::objectValue text=string)" infer kinds.jsonl --key key
cp out kinds.json
prints '{"imported":5}' import kinds.db kinds.json kinds.jsonl
listed=$(sed -E 's/"(none|boolean|integer|fraction)":null,//g; s/5e-324/4.94065645841247e-324/' kinds.jsonl)
for table in kinds.json kinds; do
    prints "$listed" list kinds.db $table
    expect 0 '' '' check kinds.db $table
done

wrong 'expected DATABASE TABLE' describe d.db
wrong 'no option of this command: --csv' describe d.db d --csv
finish
