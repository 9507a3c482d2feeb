#!/usr/bin/env bash
# SPDX-License-Identifier: MIT
# Tests examples/records on the whole of iso_639-3.json and iso_3166-2.json from the package
# iso-codes and compares every record with its source.
#
# usage: records_iso_codes_test.sh PROGRAM TABLES-FOLDER WORK-FOLDER
. "$(dirname "${BASH_SOURCE[0]}")/records.sh"

iso_codes=/usr/share/iso-codes/json
for needed in iso_639-3 iso_3166-2; do
    [[ -r $iso_codes/$needed.json ]] || { echo "iso-codes is not installed"; exit 1; }
done

# compare TABLE FILE KEY COUNT: every record of the source stands in the table and the other way
# round, member by member; what the source leaves out reads as an empty text.
compare() {
    local columns values
    columns=$(sqlite3 iso.db "select group_concat(name) from pragma_table_info('$1')")
    values=$(sqlite3 iso.db "select group_concat('ifnull(json_extract(value, ''$.' || name || '''), '''')')
        from pragma_table_info('$1')")
    sqlite3 iso.db "create temp table source as
            select $values from json_each(readfile('$iso_codes/$2'), '\$.\"$3\"');
        select 'source', count(*) from source;
        select 'table', count(*) from $1;
        select 'only in the source', count(*) from (select * from source except select $columns from $1);
        select 'only in the table', count(*) from (select $columns from $1 except select * from source);
        select 'members without a column', count(*)
            from json_each(readfile('$iso_codes/$2'), '\$.\"$3\"') r, json_each(r.value) m
            where m.key not in (select name from pragma_table_info('$1'));" >compared
    same "records of $1" "source|$4
table|$4
only in the source|0
only in the table|0
members without a column|0" "$(cat compared)"
}

cp "$tables"/*.json .
count() {
    sqlite3 :memory: "select json_array_length(readfile('$iso_codes/$1'), '\$.\"$2\"')"
}
languages=$(count iso_639-3.json 639-3)
subdivisions=$(count iso_3166-2.json 3166-2)
same 'there are thousands' yes "$( ((languages > 7000 && subdivisions > 4000)) && echo yes)"

expect 0 "{\"imported\":$languages}" '' iso.db languages.json import "$iso_codes/iso_639-3.json" 639-3
expect 0 "{\"imported\":$subdivisions}" '' \
    iso.db subdivisions.json import "$iso_codes/iso_3166-2.json" 3166-2
compare languages iso_639-3.json 639-3 "$languages"
compare subdivisions iso_3166-2.json 3166-2 "$subdivisions"
same 'integrity' ok "$(sqlite3 iso.db 'pragma integrity_check')"

refused iso.db 'records: create: alpha_3 "deu": DUPLICATE_PRIMARY_KEY' \
    iso.db languages.json create '{"alpha_3": "deu", "name": "German", "scope": "I", "type": "L"}'
refused iso.db 'records: import: alpha_3 "aaa": DUPLICATE_PRIMARY_KEY' \
    iso.db languages.json import "$iso_codes/iso_639-3.json" 639-3
expect 0 '{"code":"AD-02","name":"Canillo","parent":"","type":"Parish (again)"}' '' iso.db \
    subdivisions.json save '{"code": "AD-02", "name": "Canillo", "parent": "", "type": "Parish (again)"}'

# The last of thousands fails: nothing of them stays.
sqlite3 :memory: "select json_insert(readfile('$iso_codes/iso_639-3.json'), '\$.\"639-3\"[#]',
    json('{\"alpha_3\": \"aaa\", \"name\": \"Twice\", \"scope\": \"I\", \"type\": \"L\"}'))" >twice.json
expect 0 '{"alpha_2":"","alpha_3":"qaa","bibliographic":"","common_name":"","inverted_name":"","name":'\
'"Reserved","scope":"I","type":"L"}' '' \
    t.db languages.json create '{"alpha_3": "qaa", "name": "Reserved", "scope": "I", "type": "L"}'
refused t.db 'records: import: alpha_3 "aaa": DUPLICATE_PRIMARY_KEY' \
    t.db languages.json import twice.json 639-3
rows t.db languages 'qaa|Reserved|I|L||||'

# listed TABLE FILE KEY: the list of every record is the source, completed by its defaults, in its
# order
listed() {
    local members
    members=$(sqlite3 iso.db "select group_concat('''' || name || ''', ' ||
            'ifnull(json_extract(value, ''$.' || name || '''), '''')')
        from (select name from pragma_table_info('$1') order by name)")
    sqlite3 :memory: "select json_object($members)
        from json_each(readfile('$iso_codes/$2'), '\$.\"$3\"')" >"wanted_$1"
    "$program" iso.db "$1.json" list >out 2>err
    same "list of $1" same "$(cmp "wanted_$1" out && echo same)"
}
expect 0 "{\"deleted\":$languages}" '' iso.db languages.json delete-all
expect 0 "{\"deleted\":$subdivisions}" '' iso.db subdivisions.json delete-all
expect 0 "{\"imported\":$languages}" '' iso.db languages.json import "$iso_codes/iso_639-3.json" 639-3
expect 0 "{\"imported\":$subdivisions}" '' \
    iso.db subdivisions.json import "$iso_codes/iso_3166-2.json" 3166-2
listed languages iso_639-3.json 639-3
listed subdivisions iso_3166-2.json 3166-2

# chosen CONDITION: how many languages it selects
chosen() { sqlite3 iso.db "select count(*) from languages where $1"; }
living=$(chosen "type = 'L'")
extinct=$(chosen "type = 'E'")
same 'there are living and extinct ones' yes "$( ((living > 5000 && extinct > 300)) && echo yes)"
"$program" iso.db languages.json list '{"type": "L"}' >out
same 'list of living languages' same "$(grep '"type":"L"}$' wanted_languages | cmp - out && echo same)"
expect 0 "{\"updated\":$living}" '' iso.db languages.json update '{"type": "L"}' '{"type": "living"}'
same 'updated languages' "0|$living" "$(chosen "type = 'L'")|$(chosen "type = 'living'")"
expect 0 "{\"deleted\":$extinct}" '' iso.db languages.json delete '{"type": "E"}'
mapfile -t codes < <(sqlite3 iso.db 'select alpha_3 from languages')
same 'what is left' $((languages - extinct)) "${#codes[@]}"
refused iso.db "records: delete-by: {\"alpha_3\":\"\"}: $log" \
    iso.db languages.json delete-by alpha_3 "${codes[@]}" ''
expect 0 "{\"deleted\":${#codes[@]}}" '' iso.db languages.json delete-by alpha_3 "${codes[@]}"
expect 0 '' '' iso.db languages.json list
same 'integrity at the end' ok "$(sqlite3 iso.db 'pragma integrity_check')"

finish
