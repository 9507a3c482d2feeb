#!/usr/bin/env bash
# SPDX-License-Identifier: MIT
# Tests examples/records as its user sees it: exit status, standard output and standard error, all
# compared exactly, and what stands in the database file afterwards (read with the sqlite3 shell).
#
# usage: records_test.sh PROGRAM TABLES-FOLDER WORK-FOLDER
. "$(dirname "${BASH_SOURCE[0]}")/records.sh"

cat >notes.json <<'EOF'
{"name": "notes", "key": "id",
 "create": "create table if not exists notes (id integer primary key, done int, tags text, text text)",
 "definition": {"notes": {"member": {"id": {"cpptype": "int"},
     "done": {"cpptype": "bool", "cppDefaultValue": false},
     "tags": {"cpptype": "Json::arrayValue", "cppDefaultValue": []},
     "text": {"cpptype": "string", "cppDefaultValue": "none"}}}}}
EOF
# notes_with CREATE-SQL: the same table with another statement and no key for messages
notes_with() {
    sqlite3 :memory: "select json_set(json_remove(readfile('notes.json'), '\$.key'), '\$.create', '$1')"
}

# ------------------------------------------------------------------------------ wrong arguments
usage='usage: records [-v] DATABASE TABLE.json COMMAND [ARGUMENT...]
  -v  show the library'\''s log on standard output
commands:
  create RECORD-JSON
  save RECORD-JSON
  import FILE.json [KEY]
  list [REQUEST-JSON]
  get REQUEST-JSON
  update FILTER-JSON VALUES-JSON
  delete REQUEST-JSON
  delete-all
  delete-by KEY VALUE...'
expect 2 '' "$usage"
expect 2 '' "$usage" -v
expect 2 '' "$usage" u.db
expect 2 '' "$usage" u.db notes.json
expect 2 '' "$usage" -v u.db notes.json
expect 2 '' "$usage" u.db notes.json erase '{}'
expect 2 '' "$usage" u.db notes.json Create '{}'
expect 2 '' "$usage" u.db notes.json '' '{}'
expect 2 '' "$usage" u.db notes.json create
expect 2 '' "$usage" u.db notes.json create '{}' '{}'
expect 2 '' "$usage" u.db notes.json save
expect 2 '' "$usage" u.db notes.json save '{}' '{}'
expect 2 '' "$usage" u.db notes.json import
expect 2 '' "$usage" u.db notes.json import a.json key more
expect 2 '' "$usage" u.db notes.json list '{}' '{}'
expect 2 '' "$usage" u.db notes.json get
expect 2 '' "$usage" u.db notes.json get '{}' '{}'
expect 2 '' "$usage" u.db notes.json update '{}'
expect 2 '' "$usage" u.db notes.json update '{}' '{}' '{}'
expect 2 '' "$usage" u.db notes.json delete
expect 2 '' "$usage" u.db notes.json delete '{}' '{}'
expect 2 '' "$usage" u.db notes.json delete-all '{}'
expect 2 '' "$usage" u.db notes.json delete-by
expect 2 '' "$usage" u.db notes.json delete-by text
expect 2 '' "$usage" u.db -v notes.json create '{}'
same 'wrong arguments make no file' none "$([[ -e u.db ]] && echo made || echo none)"

# -------------------------------------------------------------------------------------- create
create() { expect "$1" "$2" "$3" n.db notes.json create "$4"; }
create 0 '{"done":false,"id":1,"tags":[],"text":"none"}' '' '{"id": 1}'
create 0 '{"done":true,"id":2,"tags":["a",{"b":null}],"text":"Größe '\''\"\\ 語"}' '' \
    '{"text": "Größe '\''\"\\ \u8a9e", "tags": ["a", {"b": null}], "id": 2, "done": true}'
create 0 '{"done":false,"id":3,"tags":[],"text":"two\nlines"}' '' \
    '{"id": 3, "text": "two\nlines", "unknown": 9}'
rows n.db notes $'1|0|[]|none\n2|1|["a",{"b":null}]|Größe \'"\\ 語\n3|0|[]|two\nlines'

# refuse COMMAND MESSAGE ARGUMENT...
refuse() { refused n.db "records: $1: $2" n.db notes.json "$1" "${@:3}"; }
refuse create 'id 1: DUPLICATE_PRIMARY_KEY' '{"id": 1}'
refuse create "id \"4\": $log" '{"id": "4"}'
refuse create "id {\"a\":[1,\"\\n\"]}: $log" '{"id": {"a": [1, "\n"]}}'
refuse create "id 4: $log" '{"id": 4, "done": 1}'
refuse create "the record: $log" '{"text": 5}'
refuse create "the record: $log" '{}'
refuse create "the record: $log" '[1]'
refuse create 'RECORD-JSON: not valid JSON: Line 1, Column 1 Syntax error: value, object or array'\
' expected. Line 1, Column 1 A valid JSON document must be either an array or an object value.' ''
refuse create 'RECORD-JSON: not valid JSON: Line 1, Column 1 A valid JSON document must be either'\
' an array or an object value.' '"text"'
refuse create "RECORD-JSON: not valid JSON: Line 1, Column 8 Missing ',' or '}' in object declaration" \
    '{"id":4'
refuse create 'RECORD-JSON: not valid JSON: Line 1, Column 10 Extra non-whitespace after JSON value.' \
    '{"id":4} x'
refuse create "RECORD-JSON: not valid JSON: Line 1, Column 9 Duplicate key: 'id'" '{"id":4,"id":5}'
refuse create 'Exceeded stackLimit in readValue().' "$(printf '[%.0s' {1..1001})"

# ---------------------------------------------------------------------------------------- save
save() { expect "$1" "$2" "$3" n.db notes.json save "$4"; }
save 0 '{"done":true,"id":4,"tags":[4],"text":"four"}' '' \
    '{"id": 4, "done": true, "tags": [4], "text": "four"}'
# Replaces the whole row: what the record lacks is NULL then and absent when read.
save 0 '{"id":2,"text":"again"}' '' '{"id": 2, "text": "again"}'
rows n.db notes $'1|0|[]|none\n2|||again\n3|0|[]|two\nlines\n4|1|[4]|four'
refuse save "id 5: $log" '{"id": 5}'
refuse save "the record: $log" '[1]'
refuse save 'double out of Int64 range' '{"id": 1e30, "text": "x"}'
refuse save 'RECORD-JSON: not valid JSON: Line 1, Column 2 Missing '\''}'\'' or object member name' '{'

# -------------------------------------------------------------------------------------- import
echo '[{"id": 10}, {"id": 11, "text": "eleven"}]' >plain.json
echo '{"a": 1, "records": [{"id": 12}], "none": []}' >keyed.json
echo '[{"id": 20}, {"id": 21}, {"id": 10}, {"id": 22}]' >duplicate.json
echo '[{"id": 20}, {"id": 21, "done": 0}]' >mistyped.json
echo '[{"id": 20}, 7]' >odd.json
echo '[{"id": 20}, ' >broken.json
: >empty.json
expect 0 '{"imported":2}' '' n.db notes.json import plain.json
expect 0 '{"imported":1}' '' n.db notes.json import keyed.json records
expect 0 '{"imported":0}' '' n.db notes.json import keyed.json none
rows n.db notes $'1|0|[]|none\n2|||again\n3|0|[]|two\nlines\n4|1|[4]|four\n10|0|[]|none
11|0|[]|eleven\n12|0|[]|none'
refuse import 'id 10: DUPLICATE_PRIMARY_KEY' duplicate.json
refuse import "id 21: $log" mistyped.json
refuse import "the record: $log" odd.json
refuse import 'broken.json: not valid JSON: Line 2, Column 1 Syntax error: value, object or array'\
' expected.' broken.json
refuse import 'empty.json: not valid JSON: Line 1, Column 1 Syntax error: value, object or array'\
' expected. Line 1, Column 1 A valid JSON document must be either an array or an object value.' \
    empty.json
refuse import 'keyed.json: not an array, KEY has to name the member that is' keyed.json
refuse import 'keyed.json: no array under "a"' keyed.json a
refuse import 'keyed.json: no array under "b\n"' keyed.json $'b\n'
refuse import 'plain.json: no array under "id"' plain.json id
refuse import 'absent.json: No such file or directory' absent.json

# A transaction that cannot begin: the table's own statement has opened one already.
notes_with 'create table if not exists notes (id, done, tags, text); savepoint host' >begun.json
refused n.db "records: import: begin immediate: $log" n.db begun.json import plain.json
# One that cannot be committed: a text has to be the id of a note by then.
notes_with 'pragma foreign_keys = on; create table if not exists notes (id text primary key, done,
    tags, text references notes deferrable initially deferred)' >linked.json
echo '[{"id": 1, "text": "2"}, {"id": 2, "text": "1"}]' >linked_in.json
expect 0 '{"imported":2}' '' l.db linked.json import linked_in.json
refused l.db "records: import: commit: $log" l.db linked.json import plain.json
# One that SQLite rolls back by itself.
notes_with "create table if not exists notes (id, done, tags, text); create trigger if not exists
    eleven before insert on notes when new.id = 11 begin select raise(rollback, ''eleven''); end" >raising.json
expect 0 '{"imported":1}' '' r.db raising.json import keyed.json records
refused r.db "records: import: the record: $log" r.db raising.json import plain.json
"$program" -v r.db raising.json import plain.json >out 2>err || true
same 'rolls back by the handle' 1 \
    "$(grep -c 'error=cannot rollback - no transaction is active, sql=rollback$' out)"

# The bar: only where standard error is a terminal.
printf -v half '%25s' ''
half=${half// /#}
script -qec "'$program' b.db notes.json import plain.json >out" /dev/null >terminal </dev/null
same 'progress bar' "$(printf '\r[%-50s]  50 %% of 2\r[%s] 100 %% of 2\r\n.' "$half" "$half$half")" \
    "$(text_of terminal)"
same 'output beside the bar' "$(lines '{"imported":2}')" "$(text_of out)"
script -qec "'$program' b.db notes.json import plain.json >out || true" /dev/null >terminal </dev/null
same 'no bar at the first record' \
    $'\r\nrecords: import: id 10: DUPLICATE_PRIMARY_KEY\r\n.' "$(text_of terminal)"
script -qec "'$program' c.db notes.json import plain.json 2>err" /dev/null >terminal </dev/null
same 'no bar in a file' "$(lines '')" "$(text_of err)"
same 'only output on the terminal' $'{"imported":2}\r\n.' "$(text_of terminal)"

# ------------------------------------------------------------------------------- list and get
cat >requests.json <<'EOF'
[{"id": 1, "text": "one"}, {"id": 2, "text": "O'Größe"}, {"id": 3, "done": true, "text": "one"},
 {"id": 4, "tags": ["a", {"b": 1}], "text": "two\nlines"}, {"id": 5, "text": "five"}]
EOF
# fresh_requests: the same five records in a new q.db
fresh_requests() {
    rm -f q.db
    expect 0 '{"imported":5}' '' q.db notes.json import requests.json
}
fresh_requests
note1='{"done":false,"id":1,"tags":[],"text":"one"}'
note2='{"done":false,"id":2,"tags":[],"text":"O'\''Größe"}'
note3='{"done":true,"id":3,"tags":[],"text":"one"}'
note4='{"done":false,"id":4,"tags":["a",{"b":1}],"text":"two\nlines"}'
note5='{"done":false,"id":5,"tags":[],"text":"five"}'
every=$note1$'\n'$note2$'\n'$note3$'\n'$note4$'\n'$note5

# list EXPECTED [REQUEST-JSON]
list() { expect 0 "$1" '' q.db notes.json list "${@:2}"; }
list "$every"
list "$every" '{}'
list "$every" '{"unknown": 1}'
list "$note1"$'\n'"$note3" '{"text": "one"}'
list "$note3" '{"text": "one", "done": true}'
list "$note2" '{"text": "O'\''Größe"}'
list "$note2" '{"text": ["O'\''Größe"]}'
list "$note4" '{"tags": [["a", {"b": 1}]]}'
list "$note4"$'\n'"$note5" '{"vornSqlWhereFilter": "id > 3"}'
list "$note2"$'\n'"$note3" '{"limit": 2, "offset": 1}'
list '' '{"id": 6}'
list '' '{"text": ["one", "five"]}'
list '' '{"limit": 0}'
expect 0 '' '' new.db notes.json list

# get STATUS EXPECTED REQUEST-JSON
get() { expect "$1" "$2" '' q.db notes.json get "$3"; }
get 0 "$note4" '{"id": 4}'
get 0 "$note1" '{}'
get 0 "$note1" '{"limit": 5}'
get 0 "$note3" '{"text": "one", "limit": 0, "offset": 1}'
get 3 '' '{"id": 6}'
get 3 '' '{"id": 1, "offset": 1}'
expect 3 '' '' new.db notes.json get '{}'
# One record is asked for, however many match.
"$program" -v q.db notes.json get '{"vornSqlWhereFilter": "nothing"}' >out 2>err || true
same 'get asks for one' yes \
    "$(grep -q 'sql=SELECT .* FROM notes  WHERE  ( nothing  ) LIMIT 1;$' out && echo yes)"

# turned COMMAND MESSAGE ARGUMENT...: a request that fails and leaves the file as it was
turned() { refused q.db "records: $1: $2" q.db notes.json "$1" "${@:3}"; }
no_json='not valid JSON: Line 1, Column 2 Missing '\''}'\'' or object member name'
for command in list get delete; do
    turned $command "REQUEST-JSON: $no_json" '{'
    turned $command "[1]: $log" '[1]'
    turned $command "{\"vornSqlWhereFilter\":\"\\nno\"}: $log" '{"vornSqlWhereFilter": "\nno"}'
    turned $command "{\"vornSqlWhereFilter\":1}: $log" '{"vornSqlWhereFilter": 1}'
    turned $command "{\"text\":[]}: $log" '{"text": []}'
    turned $command 'Value is not convertible to Int.' '{"done": "x"}'
done
turned list 'in Json::Value::asCString(): requires stringValue' '{"sort_by": 1}'
turned list "{\"limit\":\"x\"}: $log" '{"limit": "x"}'
turned get "{\"limit\":2,\"offset\":\"x\"}: $log" '{"limit": 2, "offset": "x"}'

# -------------------------------------------------------------------------------------- update
# update COUNT FILTER-JSON VALUES-JSON
update() { expect 0 "{\"updated\":$1}" '' q.db notes.json update "$2" "$3"; }
update 1 '{"id": 1}' '{"text": "Ünder '\'' 100 %d"}'
get 0 '{"done":false,"id":1,"tags":[],"text":"Ünder '\'' 100 %d"}' '{"id": 1}'
update 2 '{"vornSqlWhereFilter": "id in (3, 5)"}' '{"done": true}'
update 2 '{"done": true}' '{"done": true, "unknown": 1}'
update 1 '{"id": 4, "unknown": 1}' '{"id": 40, "text": "moved"}'
update 0 '{"id": 4}' '{"text": "nobody"}'
update 0 '{"text": ["one", "five"]}' '{"text": "nobody"}'
# The paging of a list has no meaning here.
update 3 '{"done": false, "limit": 1}' '{"text": "same"}'
rows q.db notes $'1|0|[]|same\n2|0|[]|same\n3|1|[]|one\n5|1|[]|five\n40|0|["a",{"b":1}]|same'
turned update "FILTER-JSON: $no_json" '{' '{}'
turned update "VALUES-JSON: $no_json" '{}' '{'
turned update "{}: $log" '{}' '{"text": "x"}'
turned update "{\"unknown\":1}: $log" '{"unknown": 1}' '{"text": "x"}'
turned update "{\"limit\":1}: $log" '{"limit": 1}' '{"text": "x"}'
turned update "[1]: $log" '[1]' '{"text": "x"}'
turned update "{\"id\":1}: $log" '{"id": 1}' '{}'
turned update "{\"id\":1}: $log" '{"id": 1}' '[1]'
turned update "{\"id\":1}: $log" '{"id": 1}' '{"unknown": 1}'
turned update "{\"id\":1}: $log" '{"id": 1}' '{"done": 1}'
turned update "{\"id\":1}: $log" '{"id": 1}' '{"tags": ["x"]}'
turned update '{"id":1}: DUPLICATE_PRIMARY_KEY' '{"id": 1}' '{"id": 2}'
turned update '{"done":true}: DUPLICATE_PRIMARY_KEY' '{"done": true}' '{"id": 7}'

# ------------------------------------------------------------------------------------- deletes
fresh_requests
# delete COUNT REQUEST-JSON
delete() { expect 0 "{\"deleted\":$1}" '' q.db notes.json delete "$2"; }
turned delete "{}: $log" '{}'
turned delete "{\"unknown\":1}: $log" '{"unknown": 1}'
turned delete "{\"limit\":1}: $log" '{"limit": 1}'
delete 0 '{"id": 6}'
delete 0 '{"text": ["one", "five"]}'
list "$every"
delete 1 '{"id": 2}'
delete 1 '{"text": ["five"]}'
delete 1 '{"vornSqlWhereFilter": "text like '\''two%'\''"}'
delete 2 '{"text": "one", "limit": 1}'
list ''

fresh_requests
# delete_by COUNT KEY VALUE...
delete_by() { expect 0 "{\"deleted\":$1}" '' q.db notes.json delete-by "${@:2}"; }
delete_by 0 text six '%s' '["one"]'
list "$every"
delete_by 1 text "O'Größe"
delete_by 4 text five one $'two\nlines' one six
list ''

fresh_requests
turned delete-by "{\"text\":\"\"}: $log" text ''
turned delete-by "{\"\":\"one\"}: $log" '' one
turned delete-by "{\"unk\\nown\":\"one\"}: $log" $'unk\nown' one
turned delete-by "{\"vornSqlWhereFilter\":\"1\"}: $log" vornSqlWhereFilter 1
turned delete-by "{\"id\":\"1\"}: $log" id 1
# All values or none.
turned delete-by "{\"text\":\"\"}: $log" text one five '' "O'Größe"
notes_with "create table if not exists notes (id, done, tags, text); create trigger if not exists
    kept before delete on notes when old.id = 5 begin select raise(abort, ''kept''); end" >kept.json
expect 0 '{"imported":5}' '' k.db kept.json import requests.json
refused k.db "records: delete-by: {\"text\":\"five\"}: $log" k.db kept.json delete-by text one five
refused k.db "records: delete: {\"done\":false}: $log" k.db kept.json delete '{"done": false}'
refused k.db "records: delete-all: every record: $log" k.db kept.json delete-all
refused n.db "records: delete-by: begin immediate: $log" n.db begun.json delete-by text eleven

expect 0 '{"deleted":5}' '' q.db notes.json delete-all
expect 0 '{"deleted":0}' '' q.db notes.json delete-all
list ''

# --------------------------------------------------------------------------- files and database
broken() { expect 1 '' "records: create: $1" "$2" "$3" create '{"id": 1}'; }
broken 'absent.json: No such file or directory' n.db absent.json
broken 'empty.json: not valid JSON: Line 1, Column 1 Syntax error: value, object or array expected.'\
' Line 1, Column 1 A valid JSON document must be either an array or an object value.' n.db empty.json
incomplete='"name", "create" and "definition" have to be there'
broken "plain.json: $incomplete" n.db plain.json
for member in name create definition; do
    sqlite3 :memory: "select json_set(readfile('notes.json'), '\$.$member', 1)" >"no_$member.json"
    broken "no_$member.json: $incomplete" n.db "no_$member.json"
done
broken '.: unable to open database file' . notes.json
broken 'absent/n.db: unable to open database file' absent/n.db notes.json
cp notes.json text.db
broken 'text.db: file is not a database' text.db notes.json
notes_with 'create tabel notes (id)' >wrong.json
broken 'n.db: near "tabel": syntax error' n.db wrong.json
notes_with 'create table if not exists other (id, done, tags, text)' >other.json
broken "the record: $log" o.db other.json

status=0
"$program" n.db notes.json create '{"id": 30}' >/dev/full 2>err || status=$?
same 'exit status: full disk' 1 "$status"
same 'standard error: full disk' $'records: create: standard output cannot be written\n.' \
    "$(text_of err)"

# ------------------------------------------------------------------------------------------ -v
# The log, with process ids, line numbers and error texts of the system replaced.
status=0
"$program" -v n.db notes.json create '{"id": 1}' >out 2>err || status=$?
same 'exit status: -v' 1 "$status"
same 'standard error: -v' $'records: create: id 1: DUPLICATE_PRIMARY_KEY\n.' "$(text_of err)"
sed -E 's/^\([0-9]+\)/(PID)/; s/VornJsonDbApi:[0-9]+/VornJsonDbApi:N/g; s/errno=[0-9]+/errno=N/
    s/\)\([^()]*\)Failed/)(TEXT)Failed/; s/, err=[A-Z][a-z ]*$/, err=TEXT/' out >log
record='{"done":false,"id":1,"tags":[],"text":"none"}'
types='{"done":{"cppDefaultValue":false,"cpptype":"bool"},"id":{"cpptype":"int"},"tags":'\
'{"cppDefaultValue":[],"cpptype":"Json::arrayValue"},"text":{"cppDefaultValue":"none",'\
'"cpptype":"string"}}'
sql="INSERT INTO notes (done,id,tags,text) VALUES (0,1,'[]','none') ;select * from notes where"\
' rowid == last_insert_rowid();'
unique='UNIQUE constraint failed: notes.id'
same 'log' "(PID) VornJsonDbApi:N i=0,errno=N, run sql failed, error=$unique, sql=$sql
(PID) VornJsonDbApi:N run sql fail, err=$unique
(PID) VornJsonDbApi:N (VornJsonDbApi:N)(TEXT)Failed [0 > runSqlEx(strSql, DbCallBackFillList, &jArrayTmp)], err=TEXT

(PID) VornJsonDbApi:N blCreate=1, jRecInOut=$record
(PID) VornJsonDbApi:N jType=$types
(PID) VornJsonDbApi:N sql error, err=$unique, sql=$sql
(PID) VornJsonDbApi:N (VornJsonDbApi:N)(TEXT)Failed [0 > recSave(jParam, true)], err=TEXT

(PID) VornJsonDbApi:N call create rec, rec=$record
." "$(text_of log)"
expect 0 '{"done":false,"id":31,"tags":[],"text":"none"}' '' -v n.db notes.json create '{"id": 31}'

finish
