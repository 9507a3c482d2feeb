#!/usr/bin/env bash
# SPDX-License-Identifier: MIT
# Tests examples/records on the whole of iso_639-3.json and iso_3166-2.json from the package
# iso-codes and compares every record with its source.
#
# usage: records_iso_codes_test.sh PROGRAM TABLES-FOLDER WORK-FOLDER
. "$(dirname "${BASH_SOURCE[0]}")/records.sh"
cp "$tables"/*.json .

iso_codes=/usr/share/iso-codes/json
declare -A file=([languages]=$iso_codes/iso_639-3.json [subdivisions]=$iso_codes/iso_3166-2.json)
declare -A key=([languages]=639-3 [subdivisions]=3166-2) records count
for name in languages subdivisions; do
    [[ -r ${file[$name]} ]] || { echo "iso-codes is not installed"; exit 1; }
    records[$name]="json_each(readfile('${file[$name]}'), '\$.\"${key[$name]}\"')"
    count[$name]=$(sqlite3 :memory: "select count(*) from ${records[$name]}")
done
same 'there are thousands' yes "$( ((count[languages] > 7000 && count[subdivisions] > 4000)) && echo yes)"

# The members of a source record in the order of a table's columns; what it leaves out reads as an empty text.
# read_as LIST-OF-COLUMNS PREFIX: the SQL expressions, each after PREFIX
read_as() {
    sqlite3 iso.db "select group_concat($2'ifnull(json_extract(value, ''$.' || name || '''), '''')') from ($1)"
}

only_in() { printf 'select count(*) from (select * from %s except select * from %s)' "$@"; }

# compare TABLE: every record of the source is in the table and the other way round, member by member
compare() {
    local columns="select name from pragma_table_info('$1')"
    same "records of $1" "${count[$1]}|${count[$1]}|0|0|0" "$(sqlite3 iso.db "
        create temp table source as select $(read_as "$columns" '') from ${records[$1]};
        select (select count(*) from source), (select count(*) from $1),
            ($(only_in source "$1")), ($(only_in "$1" source)),
            (select count(*) from ${records[$1]} r, json_each(r.value) m where m.key not in ($columns))")"
}

# compare_list TABLE: the list of every record is the source, completed by its defaults, in its order
compare_list() {
    local columns="select name from pragma_table_info('$1') order by name"
    sqlite3 :memory: "select json_object($(read_as "$columns" "'''' || name || ''', ' || ")) from ${records[$1]}" \
        >"wanted_$1"
    run iso.db "$1.json" list
    same "list of $1" same "$(cmp "wanted_$1" out && echo same)"
}

for comparison in compare compare_list; do
    for name in subdivisions languages; do
        on iso.db "$name.json"
        prints "{\"imported\":${count[$name]}}" import "${file[$name]}" "${key[$name]}"
        $comparison "$name"
        [[ $comparison == compare_list ]] || prints "{\"deleted\":${count[$name]}}" delete-all
    done
done
same 'integrity' ok "$(sqlite3 iso.db 'pragma integrity_check')"

fails 'alpha_3 "deu": DUPLICATE_PRIMARY_KEY' \
    create '{"alpha_3": "deu", "name": "German", "scope": "I", "type": "L"}'
fails 'alpha_3 "aaa": DUPLICATE_PRIMARY_KEY' import "${file[languages]}" 639-3
expect 0 '{"code":"AD-02","name":"Canillo","parent":"","type":"Parish (again)"}' '' iso.db \
    subdivisions.json save '{"code": "AD-02", "name": "Canillo", "parent": "", "type": "Parish (again)"}'

# chosen CONDITION: how many languages it selects
chosen() { sqlite3 iso.db "select count(*) from languages where $1"; }
living=$(chosen "type = 'L'")
extinct=$(chosen "type = 'E'")
same 'there are living and extinct ones' yes "$( ((living > 5000 && extinct > 300)) && echo yes)"
run iso.db languages.json list '{"type": "L"}'
same 'list of living languages' same "$(grep '"type":"L"}$' wanted_languages | cmp - out && echo same)"
prints "{\"updated\":$living}" update '{"type": "L"}' '{"type": "living"}'
same 'updated languages' "0|$living" "$(chosen "type = 'L'")|$(chosen "type = 'living'")"
prints "{\"deleted\":$extinct}" delete '{"type": "E"}'
mapfile -t codes < <(sqlite3 iso.db 'select alpha_3 from languages')
same 'what is left' $((count[languages] - extinct)) "${#codes[@]}"
fails "{\"alpha_3\":\"\"}: $log" delete-by alpha_3 "${codes[@]}" ''
prints "{\"deleted\":${#codes[@]}}" delete-by alpha_3 "${codes[@]}"
prints '' list
same 'integrity at the end' ok "$(sqlite3 iso.db 'pragma integrity_check')"

# The last of thousands fails: none of them stays.
sqlite3 :memory: "select json_insert(readfile('${file[languages]}'), '\$.\"639-3\"[#]',
    json('{\"alpha_3\": \"aaa\", \"name\": \"Twice\", \"scope\": \"I\", \"type\": \"L\"}'))" >twice.json
on t.db languages.json
prints '{"alpha_2":"","alpha_3":"qaa","bibliographic":"","common_name":"","inverted_name":"","name":'\
'"Reserved","scope":"I","type":"L"}' create '{"alpha_3": "qaa", "name": "Reserved", "scope": "I", "type": "L"}'
fails 'alpha_3 "aaa": DUPLICATE_PRIMARY_KEY' import twice.json 639-3
rows 'qaa|Reserved|I|L||||'

finish
