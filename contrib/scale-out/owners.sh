# SPDX-FileCopyrightText: 2026 The vornjsondb authors
# SPDX-License-Identifier: MIT
# The cases of contrib/scale-out/scale-test with scale_owner; sourced, not run.

owner=build/scale/tests/scale-out/scale_owner

# judged CASE NEXT-OWNER-AFTER NAME...: the databases of these names and what was acknowledged there, through
# both mounts, so that each record is seen by the machine that did not write it.
judged() {
    local name=$1 next=$2 machine file
    shift 2
    for machine in a b; do
        for file in "$@"; do
            judge "${!machine}/$file.db" "$work/$file" || failed "$name: $file cannot be read on $machine"
        done >"$work/verdicts.$machine"
    done
    row "$name" "$(awk -F '|' '{ n += $1 } END { print n + 0 }' "$work/verdicts.b")" \
        "$(awk -F '|' '{ n += $2 } END { print n + 0 }' "$work/verdicts.b")" \
        "$(cut -d '|' -f 3 "$work/verdicts.b" | sort -n | tail -n 1)" "$next"
    [ "$(grep -c '^[1-9][0-9]*|.*|ok$' "$work/verdicts.b")" = $# ] || failed "$name: $(cat "$work/verdicts.b")"
    diff "$work/verdicts.a" "$work/verdicts.b" || failed "$name: the machines do not see the same"
}

# part_gone HOW BACK CASE FILE SETTINGS SECONDS NAME...: while an owner works, parts of the store are killed or
# frozen (HOW) and, some seconds later, started or thawed (BACK).
part_gone() {
    local how=$1 back=$2 case=$3 file=$4 settings=$5 away=$6 name pid
    shift 6
    "$owner" "$a/$file.db" "$settings" "$work/$file" 60 >"$work/$file.said" 2>&1 &
    pid=$!
    sleep 10
    for name in "$@"; do contrib/scale-out/cluster "$how" "$name"; done
    sleep "$away"
    contrib/scale-out/cluster status >"$work/status" || true
    for name in "$@"; do
        grep -qE "^$name (gone|hangs) down\$" "$work/status" || failed "$case: $(grep "^$name " "$work/status")"
        contrib/scale-out/cluster "$back" "$name"
    done
    ended "$pid" 300 || failed "$case: $(tail -n 3 "$work/$file.said")"
    within 120 "$case: not everything is up again" store_up
    judged "$case" '' "$file"
}
store_up() { contrib/scale-out/cluster status >"$work/status"; }

# Tries until the database is free, for two minutes at most.
next_owner() {
    local status=3 end=$((SECONDS + 120))
    while [ "$status" = 3 ] && ((SECONDS < end)); do
        status=0
        timeout 120 "$owner" "$1" "$exclusive_wal" "$2" 0 || status=$?
    done
    return "$status"
}

# owner_ended CASE FILE END LEAST MOST THAW BACK: END ends the owner on one machine, and the next one takes over on
# the other after LEAST to MOST seconds. Then, after THAW, the first has to fail, and BACK brings its machine back.
owner_ended() {
    local case=$1 file=$2 end=$3 least=$4 most=$5 thaw=$6 back=$7
    "$owner" "$a/$file.db" "$exclusive_wal" "$work/$file" 600 >"$work/$file.said" 2>&1 &
    owner_pid=$!
    sleep 10
    ! gone "$owner_pid" || failed "$case: the owner ended too soon: $(tail -n 3 "$work/$file.said")"
    [ -s "$work/$file" ] || failed "$case: the owner wrote nothing"
    "$end"
    timed next_owner "$b/$file.db" "$work/$file" || failed "$case: $(tail -n 3 "$work/said")"
    awk "BEGIN { exit !($least <= $seconds && $seconds <= $most) }" ||
        failed "$case: the next owner after $seconds s, wanted: $least to $most"
    "$thaw"
    ! ended "$owner_pid" 60 || failed "$case: the owner did not fail"
    [ "$thaw" = true ] || grep -E 'disk I/O error|malformed' "$work/$file.said" | tail -n 1 | grep . ||
        failed "$case: what the owner was told: $(tail -n 3 "$work/$file.said")"
    "$back"
    judged "$case" "$seconds" "$file"
}
kill_owner() { kill -KILL "$owner_pid"; }
freeze_machine() { contrib/scale-out/cluster freeze mount.a; }
thaw_machine() { contrib/scale-out/cluster thaw mount.a; }
kill_machine() { contrib/scale-out/cluster kill mount.a; }
start_machine() { contrib/scale-out/cluster start mount.a; }
restart_machine() { kill_machine && start_machine; }

# all_ended CASE PID...: owners that are about to end
all_ended() {
    local pid
    for pid in "${@:2}"; do ended "$pid" 180 || failed "$1: $(tail -n 3 "$work/owners.said")"; done
}

# Two machines write one file, each when the other lets it: SQLite's defaults, two records in a transaction.
one_file() {
    local name="two machines write one file for 20 s" machine pids=()
    for machine in "$a" "$b"; do
        "$owner" "$machine/one-file.db" "$defaults" "$work/one-file" 20 2 20 >>"$work/owners.said" 2>&1 &
        pids+=($!)
    done
    all_ended "$name" "${pids[@]}"
    judged "$name" '' one-file
}

# many COUNT: databases with an owner each, side by side on both machines
many() {
    local name="databases with an owner each, for 20 s: $1" i machine files=() pids=()
    for ((i = 1; i <= $1; ++i)); do
        machine=$a
        ((i % 2)) || machine=$b
        files+=("many-$1-$i")
        "$owner" "$machine/many-$1-$i.db" "$exclusive_wal" "$work/many-$1-$i" 20 >>"$work/owners.said" 2>&1 &
        pids+=($!)
    done
    all_ended "$name" "${pids[@]}"
    judged "$name" '' "${files[@]}"
}

# cost NAME FOLDER SETTINGS ROWS: commits for some seconds
cost() {
    "$owner" "$2/$1-$4.db" "$3" "$work/$1-$4" 3 "$4" || failed "cost: $1, $4"
}

# In turns, so that whatever else the machine does affects both.
costs() {
    local round rows
    cut -d ' ' -f 1 /proc/loadavg >"$work/load"
    for round in 1 2 3; do
        say "measuring the cost of a commit: $round of 3"
        cost local-rollback "$work/local" "$defaults" 1
        cost store-rollback "$a" "$defaults" 1
        for rows in 1 10 100 1000 10000; do
            cost local "$work/local" "$exclusive_wal" "$rows"
            cost store "$a" "$exclusive_wal" "$rows"
        done
    done
    judged "the commits whose cost is measured" '' store-rollback-1 store-{1,10,100,1000,10000}
}
