#!/usr/bin/env bash
# SPDX-License-Identifier: MIT
# Tests examples/records as its user sees it: exit status, standard output and standard error, all
# compared exactly, and what is in the database file afterwards (read with the sqlite3 shell).
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

# What the program says of texts that are not JSON: an open brace, a bare text, nothing.
no_json='not valid JSON: Line 1, Column 2 Missing '\''}'\'' or object member name'
no_container='Line 1, Column 1 A valid JSON document must be either an array or an object value.'
nothing="not valid JSON: Line 1, Column 1 Syntax error: value, object or array expected. $no_container"

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
commands=({erase,Create,'list {}',delete-all,update}' {}' {create,save,get,delete}{,' {} {}'} 'update {} {} {}'
    import{,' a.json key more'} delete-by{,' text'})
for arguments in '' -v u.db {,'-v '}'u.db notes.json' 'u.db -v notes.json create {}' \
    "${commands[@]/#/u.db notes.json }"; do
    # shellcheck disable=SC2086 # several arguments
    expect 2 '' "$usage" $arguments
done
expect 2 '' "$usage" u.db notes.json '' '{}'
same 'wrong arguments make no file' none "$([[ -e u.db ]] && echo made || echo none)"

# -------------------------------------------------------------------------------------- create
on n.db notes.json
prints '{"done":false,"id":1,"tags":[],"text":"none"}' create '{"id": 1}'
prints '{"done":true,"id":2,"tags":["a",{"b":null}],"text":"Größe '\''\"\\ 語"}' create \
    '{"text": "Größe '\''\"\\ \u8a9e", "tags": ["a", {"b": null}], "id": 2, "done": true}'
prints '{"done":false,"id":3,"tags":[],"text":"two\nlines"}' create \
    '{"id": 3, "text": "two\nlines", "unknown": 9}'
rows $'1|0|[]|none\n2|1|["a",{"b":null}]|Größe \'"\\ 語\n3|0|[]|two\nlines'
fails 'id 1: DUPLICATE_PRIMARY_KEY' create '{"id": 1}'
fails "id \"4\": $log" create '{"id": "4"}'
fails "id {\"a\":[1,\"\\n\"]}: $log" create '{"id": {"a": [1, "\n"]}}'
fails "id 4: $log" create '{"id": 4, "done": 1}'
for record in '{"text": 5}' '{}' '[1]'; do fails "the record: $log" create "$record"; done
fails "RECORD-JSON: $nothing" create ''
fails "RECORD-JSON: not valid JSON: $no_container" create '"text"'
fails "RECORD-JSON: not valid JSON: Line 1, Column 8 Missing ',' or '}' in object declaration" create '{"id":4'
fails 'RECORD-JSON: not valid JSON: Line 1, Column 10 Extra non-whitespace after JSON value.' create \
    '{"id":4} x'
fails "RECORD-JSON: not valid JSON: Line 1, Column 9 Duplicate key: 'id'" create '{"id":4,"id":5}'
fails 'Exceeded stackLimit in readValue().' create "$(printf '[%.0s' {1..1001})"

# ---------------------------------------------------------------------------------------- save
prints '{"done":true,"id":4,"tags":[4],"text":"four"}' save \
    '{"id": 4, "done": true, "tags": [4], "text": "four"}'
# Replaces the whole row: what the record lacks is NULL then and absent when read.
prints '{"id":2,"text":"again"}' save '{"id": 2, "text": "again"}'
rows $'1|0|[]|none\n2|||again\n3|0|[]|two\nlines\n4|1|[4]|four'
fails "id 5: $log" save '{"id": 5}'
fails "the record: $log" save '[1]'
fails 'double out of Int64 range' save '{"id": 1e30, "text": "x"}'
fails "RECORD-JSON: $no_json" save '{'

# -------------------------------------------------------------------------------------- import
echo '[{"id": 10}, {"id": 11, "text": "eleven"}]' >plain.json
echo '{"a": 1, "records": [{"id": 12}], "none": []}' >keyed.json
# refuses_import MESSAGE CONTENT: of the file
refuses_import() { printf %s "$2" >in.json; fails "$1" import in.json; }
prints '{"imported":2}' import plain.json
prints '{"imported":1}' import keyed.json records
prints '{"imported":0}' import keyed.json none
rows $'1|0|[]|none\n2|||again\n3|0|[]|two\nlines\n4|1|[4]|four\n10|0|[]|none
11|0|[]|eleven\n12|0|[]|none'
refuses_import 'id 10: DUPLICATE_PRIMARY_KEY' '[{"id": 20}, {"id": 21}, {"id": 10}, {"id": 22}]'
refuses_import "id 21: $log" '[{"id": 20}, {"id": 21, "done": 0}]'
refuses_import "the record: $log" '[{"id": 20}, 7]'
refuses_import 'in.json: not valid JSON: Line 2, Column 1 Syntax error: value, object or array expected.' \
    $'[{"id": 20},\n'
refuses_import "in.json: $nothing" ''
fails 'keyed.json: not an array, KEY must name the member that is' import keyed.json
fails 'keyed.json: no array under "a"' import keyed.json a
fails 'keyed.json: no array under "b\n"' import keyed.json $'b\n'
fails 'plain.json: no array under "id"' import plain.json id
fails 'absent.json: No such file or directory' import absent.json

# A transaction that cannot begin: the table's own statement has opened one already.
notes_with 'create table if not exists notes (id, done, tags, text); savepoint host' >begun.json
on n.db begun.json
fails "begin immediate: $log" import plain.json
fails "begin immediate: $log" delete-by text eleven
# One that cannot be committed: a text has to be the id of a note by then.
notes_with 'pragma foreign_keys = on; create table if not exists notes (id text primary key, done,
    tags, text references notes deferrable initially deferred)' >linked.json
echo '[{"id": 1, "text": "2"}, {"id": 2, "text": "1"}]' >linked_in.json
on l.db linked.json
prints '{"imported":2}' import linked_in.json
fails "commit: $log" import plain.json
# One that SQLite rolls back by itself.
notes_with "create table if not exists notes (id, done, tags, text); create trigger if not exists
    eleven before insert on notes when new.id = 11 begin select raise(rollback, ''eleven''); end" >raising.json
on r.db raising.json
prints '{"imported":1}' import keyed.json records
fails "the record: $log" import plain.json
run -v r.db raising.json import plain.json
same 'rolls back by the handle' 1 "$(grep -c 'error=cannot rollback - no transaction is active, sql=rollback$' out)"

# The bar: only where standard error is a terminal.
half=$(printf '#%.0s' {1..25})
# on_terminal NAME EXPECTED DATABASE REDIRECTION: what the terminal shows of an import
on_terminal() {
    script -qec "'$program' $3 notes.json import plain.json $4" /dev/null >terminal </dev/null
    same "$1" "$2" "$(text_of terminal)"
}
on_terminal 'progress bar' "$(printf '\r[%-50s]  50 %% of 2\r[%s] 100 %% of 2\r\n.' "$half" "$half$half")" b.db '>out'
same 'output beside the bar' "$(lines '{"imported":2}')" "$(text_of out)"
on_terminal 'no bar at the first record' $'\r\nrecords: import: id 10: DUPLICATE_PRIMARY_KEY\r\n.' b.db '>out || true'
on_terminal 'only output on the terminal' $'{"imported":2}\r\n.' c.db '2>err'
same 'no bar in a file' "$(lines '')" "$(text_of err)"

# ------------------------------------------------------------------------------- list and get
cat >requests.json <<'EOF'
[{"id": 1, "text": "one"}, {"id": 2, "text": "O'Größe"}, {"id": 3, "done": true, "text": "one"},
 {"id": 4, "tags": ["a", {"b": 1}], "text": "two\nlines"}, {"id": 5, "text": "five"}]
EOF
# fresh_requests: the same five records in a new q.db
fresh_requests() {
    rm -f q.db
    on q.db notes.json
    prints '{"imported":5}' import requests.json
}
fresh_requests
note1='{"done":false,"id":1,"tags":[],"text":"one"}'
note2='{"done":false,"id":2,"tags":[],"text":"O'\''Größe"}'
note3='{"done":true,"id":3,"tags":[],"text":"one"}'
note4='{"done":false,"id":4,"tags":["a",{"b":1}],"text":"two\nlines"}'
note5='{"done":false,"id":5,"tags":[],"text":"five"}'
every=$note1$'\n'$note2$'\n'$note3$'\n'$note4$'\n'$note5

prints "$every" list
for request in '{}' '{"unknown": 1}'; do prints "$every" list "$request"; done
prints "$note1"$'\n'"$note3" list '{"text": "one"}'
prints "$note3" list '{"text": "one", "done": true}'
for request in '{"text": "O'\''Größe"}' '{"text": ["O'\''Größe"]}'; do prints "$note2" list "$request"; done
prints "$note4" list '{"tags": [["a", {"b": 1}]]}'
prints "$note4"$'\n'"$note5" list '{"vornSqlWhereFilter": "id > 3"}'
prints "$note2"$'\n'"$note3" list '{"limit": 2, "offset": 1}'
for request in '{"id": 6}' '{"text": ["one", "five"]}' '{"limit": 0}'; do prints '' list "$request"; done
expect 0 '' '' new.db notes.json list

prints "$note4" get '{"id": 4}'
for request in '{}' '{"limit": 5}'; do prints "$note1" get "$request"; done
prints "$note3" get '{"text": "one", "limit": 0, "offset": 1}'
for request in '{"id": 6}' '{"id": 1, "offset": 1}'; do expect 3 '' '' q.db notes.json get "$request"; done
expect 3 '' '' new.db notes.json get '{}'
# One record is asked for, however many match.
run -v q.db notes.json get '{"vornSqlWhereFilter": "nothing"}'
same 'get asks for one' yes "$(grep -q 'sql=SELECT .* FROM notes  WHERE  ( nothing  ) LIMIT 1;$' out && echo yes)"

for command in list get delete; do
    fails "REQUEST-JSON: $no_json" $command '{'
    for request in '[1]' '{"vornSqlWhereFilter":1}' '{"text":[]}'; do fails "$request: $log" $command "$request"; done
    fails "{\"vornSqlWhereFilter\":\"\\nno\"}: $log" $command '{"vornSqlWhereFilter": "\nno"}'
    fails 'Value is not convertible to Int.' $command '{"done": "x"}'
done
fails 'in Json::Value::asCString(): requires stringValue' list '{"sort_by": 1}'
fails "{\"limit\":\"x\"}: $log" list '{"limit": "x"}'
fails "{\"limit\":2,\"offset\":\"x\"}: $log" get '{"limit": 2, "offset": "x"}'

# -------------------------------------------------------------------------------------- update
prints '{"updated":1}' update '{"id": 1}' '{"text": "Ünder '\'' 100 %d"}'
prints '{"done":false,"id":1,"tags":[],"text":"Ünder '\'' 100 %d"}' get '{"id": 1}'
prints '{"updated":2}' update '{"vornSqlWhereFilter": "id in (3, 5)"}' '{"done": true}'
prints '{"updated":2}' update '{"done": true}' '{"done": true, "unknown": 1}'
prints '{"updated":1}' update '{"id": 4, "unknown": 1}' '{"id": 40, "text": "moved"}'
prints '{"updated":0}' update '{"id": 4}' '{"text": "nobody"}'
prints '{"updated":0}' update '{"text": ["one", "five"]}' '{"text": "nobody"}'
# The paging of a list has no meaning here.
prints '{"updated":3}' update '{"done": false, "limit": 1}' '{"text": "same"}'
rows $'1|0|[]|same\n2|0|[]|same\n3|1|[]|one\n5|1|[]|five\n40|0|["a",{"b":1}]|same'
fails "FILTER-JSON: $no_json" update '{' '{}'
fails "VALUES-JSON: $no_json" update '{}' '{'
for filter in '[1]' '{}' '{"unknown":1}' '{"limit":1}'; do fails "$filter: $log" update "$filter" '{"text": "x"}'; done
for values in '{}' '[1]' '{"unknown": 1}' '{"done": 1}' '{"tags": ["x"]}'; do
    fails "{\"id\":1}: $log" update '{"id": 1}' "$values"
done
fails '{"id":1}: DUPLICATE_PRIMARY_KEY' update '{"id": 1}' '{"id": 2}'
fails '{"done":true}: DUPLICATE_PRIMARY_KEY' update '{"done": true}' '{"id": 7}'

# ------------------------------------------------------------------------------------- deletes
fresh_requests
for request in '{}' '{"unknown":1}' '{"limit":1}'; do fails "$request: $log" delete "$request"; done
for request in '{"id": 6}' '{"text": ["one", "five"]}'; do prints '{"deleted":0}' delete "$request"; done
prints "$every" list
for request in '{"id": 2}' '{"text": ["five"]}' '{"vornSqlWhereFilter": "text like '\''two%'\''"}'; do
    prints '{"deleted":1}' delete "$request"
done
prints '{"deleted":2}' delete '{"text": "one", "limit": 1}'
prints '' list

fresh_requests
prints '{"deleted":0}' delete-by text six '%s' '["one"]'
prints "$every" list
prints '{"deleted":1}' delete-by text "O'Größe"
prints '{"deleted":4}' delete-by text five one $'two\nlines' one six
prints '' list

fresh_requests
fails "{\"text\":\"\"}: $log" delete-by text ''
fails "{\"\":\"one\"}: $log" delete-by '' one
fails "{\"unk\\nown\":\"one\"}: $log" delete-by $'unk\nown' one
fails "{\"vornSqlWhereFilter\":\"1\"}: $log" delete-by vornSqlWhereFilter 1
fails "{\"id\":\"1\"}: $log" delete-by id 1
# All values or none.
fails "{\"text\":\"\"}: $log" delete-by text one five '' "O'Größe"
notes_with "create table if not exists notes (id, done, tags, text); create trigger if not exists
    kept before delete on notes when old.id = 5 begin select raise(abort, ''kept''); end" >kept.json
on k.db kept.json
prints '{"imported":5}' import requests.json
fails "{\"text\":\"five\"}: $log" delete-by text one five
fails "{\"done\":false}: $log" delete '{"done": false}'
fails "every record: $log" delete-all

fresh_requests
prints '{"deleted":5}' delete-all
prints '{"deleted":0}' delete-all
prints '' list

# --------------------------------------------------------------------------- files and database
broken() { expect 1 '' "records: create: $1" "$2" "$3" create '{"id": 1}'; }
broken 'absent.json: No such file or directory' n.db absent.json
: >empty.json
broken "empty.json: $nothing" n.db empty.json
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
same 'full disk' $'1 records: create: standard output cannot be written\n.' "$status $(text_of err)"

# ------------------------------------------------------------------------------------------ -v
# The log, with process ids, line numbers and error texts of the system replaced.
run -v n.db notes.json create '{"id": 1}'
same 'what -v fails with' $'1 records: create: id 1: DUPLICATE_PRIMARY_KEY\n.' "$status $(text_of err)"
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
