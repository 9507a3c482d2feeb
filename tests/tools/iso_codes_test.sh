#!/usr/bin/env bash
# SPDX-FileCopyrightText: 2026 The vornjsondb authors
# SPDX-License-Identifier: MIT
# Infers a table for every file of the package iso-codes, imports the file and compares each record.
. "$(dirname "${BASH_SOURCE[0]}")/tool.sh"

folder=/usr/share/iso-codes/json
[[ -r $folder/iso_639-3.json ]] || { echo "iso-codes is not installed"; exit 1; }
for file in "$folder"/iso_*.json; do
    array=$(sqlite3 :memory: "select key from json_each(readfile('$file'))")
    records="json_each(readfile('$file'), '\$.\"$array\"')"
    count=$(sqlite3 :memory: "select count(*) from $records")
    key=$(sqlite3 :memory: "select key from (select value from $records limit 1) r, json_each(r.value)
        where key in ('alpha_3', 'alpha_4', 'code') limit 1")
    name=$(basename "$file" .json | tr - _)
    run infer "$file" --array "$array" ${key:+--key "$key"}
    same "infer $name" '0 ' "$status $(cat err)"
    cp out "$name.json"
    prints "{\"imported\":$count}" import iso.db "$name.json" "$file" --array "$array"
    run describe iso.db "$name"
    same "describe $name" "$(grep -v '"create"' "$name.json")" "$(grep -v '"create"' out)"
    columns="select name from pragma_table_info('$name')"
    members=$(sqlite3 iso.db "select group_concat('json_extract(value, ''\$.' || name || ''')') from ($columns)")
    same "records of $name" "$count|0|0" "$(sqlite3 iso.db "create temp table source as select $members from $records;
        select (select count(*) from $name), (select count(*) from (select * from source except select * from $name)),
            (select count(*) from $records r, json_each(r.value) m where m.key not in ($columns))")"
    expect 0 '' '' check iso.db "$name"
    run list iso.db "$name.json"
    same "list of $name" "$count" "$(wc -l <out)"
done
same 'thousands' yes "$( (($(sqlite3 iso.db 'select count(*) from iso_639_3') > 7000)) && echo yes)"
finish
