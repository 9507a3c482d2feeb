# SPDX-FileCopyrightText: 2026 The vornjsondb authors
# SPDX-License-Identifier: MIT
# The cases of contrib/scale-out/scale-test with the programs that work on a local file; sourced, not run.

records=build/scale/tools/vornjsondb
sharded=build/scale/examples/example_sharded
holder=build/scale/tests/locks/lock_holder
languages=examples/tables/languages.json
iso_codes=/usr/share/iso-codes/json/iso_639-3.json
reserved='{"alpha_3":"qaa","name":"Reserved","scope":"I","type":"L"}'

# members FORMAT: the format once for each member of a language, in the order of a list.
members() {
    sqlite3 :memory: "select group_concat(printf('$1', key, key), ', ') from
        (select key from json_each(readfile('$languages'), '\$.definition.languages.member') order by key)"
}

# stored FILE: the languages there, as vornjsondb lists them.
stored() {
    looked_up "$1" "select json_object($(members "''%s'', %s")) from languages"
}

# differing FILE FILE: how many lines are in one of them only.
differing() {
    LC_ALL=C comm -3 <(LC_ALL=C sort "$1") <(LC_ALL=C sort "$2") | wc -l
}

# languages_row CASE ACKNOWLEDGED COUNT FOUND: ACKNOWLEDGED has to be COUNT, and FOUND what was wanted.
languages_row() {
    row "$1" "$2" "$(differing "$work/wanted" "$4")" "$seconds"
    [ "$2" = "$3" ] || failed "$1: $2 in place of $3: $(tail -n 3 "$work/said")"
}

# changed CASE COUNT FILE SEEN COMMAND ARGUMENT...: a command of vornjsondb on a file, which is SEEN by another machine.
changed() {
    timed "$records" "$5" "$3" "$languages" "${@:6}" || failed "$1: its exit status"
    stored "$4" >"$work/found" || failed "$1: $4 cannot be read"
    languages_row "$1" "$(sed -n 's/^{"[a-z]*":\([0-9]*\)}$/\1/p' "$work/said")" "$2" "$work/found"
}

# the_examples WHERE FOLDER SEEN: the programs on a folder, and what they did as it is SEEN by another machine.
the_examples() {
    local name file=$2/languages.db seen=$3/languages.db tenant
    sqlite3 :memory: "select json_object($(members "''%s'', ifnull(value ->> ''%s'', '''')"))
        from json_each(readfile('$iso_codes'), '\$.\"639-3\"')" >"$work/wanted"
    (($(wc -l <"$work/wanted") > 7000)) || failed "the source of the languages"
    changed "vornjsondb $1: import" "$(wc -l <"$work/wanted")" "$file" "$seen" \
        import "$iso_codes" --array 639-3

    name="vornjsondb $1: list"
    timed "$records" list "$file" "$languages" || failed "$name: its exit status"
    languages_row "$name" "$(wc -l <"$work/said")" "$(wc -l <"$work/wanted")" "$work/said"

    cp "$work/wanted" "$work/before"
    sed -i 's/"type":"L"}$/"type":"living"}/' "$work/wanted"
    changed "vornjsondb $1: update" "$(grep -c '"type":"L"}$' "$work/before")" "$file" "$seen" \
        update '{"type": "L"}' '{"type": "living"}'
    sed -i '/"type":"E"}$/d' "$work/wanted"
    changed "vornjsondb $1: delete" "$(grep -c '"type":"E"}$' "$work/before")" "$file" "$seen" \
        delete '{"type": "E"}'

    say "vornjsondb $1: every command and refusal"
    bash tests/tools/iso_codes_test.sh "$PWD/$records" "$2/iso_codes" ||
        failed "vornjsondb $1"

    name="examples/sharded $1: eight files"
    timed "$sharded" "$2/tenants" || failed "$name: its exit status"
    diff examples/expected/sharded.txt "$work/said" || failed "$name"
    for tenant in {1..8}; do
        printf "$tenant|%s\n" '1|Ada' '2|Grace' '3|Hedy' >&3
        looked_up "$3/tenants/tenant-$tenant.db" "select $tenant, id, customer from invoice" ||
            failed "$name: tenant-$tenant.db cannot be read"
    done 3>"$work/wanted" >"$work/found"
    row "$name" "$(sed -n 's/^together: \([0-9]*\) invoices$/\1/p' "$work/said")" \
        "$(differing "$work/wanted" "$work/found")" "$seconds"
}

# Another machine holds the lock: the call gives up after 500 attempts. Once it is free the call succeeds.
second_owner() {
    local name="locked by another machine: the call gives up" pid
    stored "$b/languages.db" >"$work/wanted"
    mkfifo "$work/end"
    "$holder" "$b/languages.db" 'begin immediate' <"$work/end" >"$work/held" &
    pid=$!
    exec 3>"$work/end"
    within 60 "the other machine does not get the lock" test -s "$work/held"
    ! timed "$records" -v create "$a/languages.db" "$languages" "$reserved" || failed "$name: it did not"
    [ "$(grep -c 'retry, .*error=database is locked' "$work/said")" = 500 ] || failed "$name: not after 500 attempts"
    exec 3>&-
    ended "$pid" 60 || failed "$name: the holder"
    stored "$b/languages.db" >"$work/found"
    languages_row "$name" "$(grep -c '^{' "$work/said")" 0 "$work/found"

    name="the same call once it is free"
    timed "$records" create "$a/languages.db" "$languages" "$reserved" || failed "$name: its exit status"
    cat "$work/said" >>"$work/wanted"
    stored "$b/languages.db" >"$work/found"
    languages_row "$name" "$(grep -c '^{' "$work/said")" 1 "$work/found"
}
