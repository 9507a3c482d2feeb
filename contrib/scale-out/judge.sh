# SPDX-FileCopyrightText: 2026 The vornjsondb authors
# SPDX-License-Identifier: MIT
# What contrib/scale-out/scale-test and check_test.sh judge by; sourced, not run.

# One owner at a time: the lock stays until the owner is gone.
exclusive_wal='pragma locking_mode=exclusive; pragma journal_mode=wal'

# judge DATABASE ACKNOWLEDGED: one line "RECORDS|MISSING|SECONDS|INTEGRITY": how many records scale_owner
# saw acknowledged, how many of them are not there as they were written or were acknowledged twice (the
# first is lost then), the longest transaction, and what integrity_check says. It fails, without that line, where
# one of the files is missing or the database has no such table; a database is not made.
judge() {
    sqlite3 -bail "file:$1?mode=rw" "$exclusive_wal" \
        'create temp table acknowledged (seconds real, first int, last int)' \
        '.separator " "' ".import '$2' acknowledged" '.separator |' \
        "with recursive wanted (id, last) as (
             select first, last from acknowledged union all select id + 1, last from wanted where id < last)
         select count(*), count(*) filter (where record.text is not printf('%0180d', wanted.id))
                 + count(*) - count(distinct wanted.id),
             (select printf('%.1f', max(seconds)) from acknowledged),
             (select group_concat(integrity_check, '; ') from pragma_integrity_check)
         from wanted left join record using (id)" | tail -n +3
}
