# SPDX-FileCopyrightText: 2026 The vornjsondb authors
# SPDX-License-Identifier: MIT
"""Writes performance.md and its plots from what measure.py measured, prints the document, and fails
when a limit is missed.

    report.py RESULTS.json FOLDER
"""

import json
import os
import sys
import textwrap

import plot

TITLES = {
    "create": "create a record and read it back", "fetch": "fetch a record by its key",
    "group": "list a group of ten", "list": "list a row of all", "update": "update a member by key",
    "delete": "delete a record by its key",
}
# The label on the left, the figure's name, the limit, if there is one, and the target beyond it.
LIMITS = [
    ("create, instructions over the floor's", ("count", "create", "floor"), 1.349, 1.30),
    ("fetch, instructions over the floor's", ("count", "fetch", "floor"), 1.273, 1.22),
    ("update, instructions over the floor's", ("count", "update", "floor"), 1.331, 1.25),
    ("delete, instructions over the floor's", ("count", "delete", "floor"), 1.163, 1.15),
    ("a listed row, over the C API by hand with jsoncpp", ("count", "list", "capi"), 0.602, 0.55),
    ("a listed row, over the C API by hand with nlohmann::json", ("count", "list", "nlohmann"), 0.752, None),
    ("a group of ten, over the C API by hand with jsoncpp", ("count", "group", "capi"), 1.029, 1.00),
    ("create, over SQLiteCpp", ("count", "create", "sqlitecpp"), 1.061, None),
    ("fetch, over SQLiteCpp", ("count", "fetch", "sqlitecpp"), 0.984, None),
    ("create, over SOCI, row", ("count", "create", "soci"), 0.818, None),
    ("create, over SOCI, variables", ("count", "create", "soci-variables"), None, None),
    ("fetch, over Poco::Data, record set", ("count", "fetch", "poco"), 0.560, None),
    ("fetch, over Poco::Data, variables", ("count", "fetch", "poco-variables"), None, None),
    ("update, over SQLiteCpp, exec", ("count", "update", "sqlitecpp-exec"), None, None),
    ("delete, over SQLiteCpp, exec", ("count", "delete", "sqlitecpp-exec"), None, None),
    ("a listed row, 1,000,000 rows over 10,000", ("growth", "library"), 1.035, 1.02),
    ("the same of the C API by hand", ("growth", "capi"), None, None),
    ("user CPU time of a listed row, 1,000,000 rows over 10,000", ("time_growth", 1000000, 10000), None, None),
    ("peak memory of a listed row, over the C API by hand", ("memory", "library", "capi"), 0.855, None),
    ("value list of 50 members, one of 1 MiB, over that text and those members alone",
     ("value_list",), 1.10, None),
    ("fetch, two tables in turn over one", ("kept", "fetch, two tables", "fetch"), 1.02, None),
    ("create, two tables in turn over one", ("kept", "create, two tables", "create"), 1.02, None),
    ("fetch, after a table of 2,000 columns over before", ("kept", "fetch, after a wide table", "fetch"), 1.005, None),
    ("create, after a table of 2,000 columns over before", ("kept", "create, after a wide table", "create"), 1.005, None),
    ("a row, NULL in every second over none", ("kept", "rows, NULL in every second", "rows"), 1.02, None),
    ("a member of a row of 100, over one of 7", ("kept", "rows, 100 members", "rows"), 0.85, None),
    ("a row, NULLs in alternating members over none", ("kept", "rows, NULLs in alternating members", "rows"), 1.02, None),
    ("member types of 100,000 tables in turn over 10", ("kept", "types of 100000 tables", "types of 10 tables"), 1.30, None),
    ("adding the types of a table, 100,000 tables over 1,000", ("kept", "adding 100000 tables", "adding 1000 tables"), 1.30, None),
    ("a row with a text of objects, over jsoncpp's parse of the text", ("texts", "objects"), 0.627, 0.56),
    ("a row with a text of nested objects, over jsoncpp's parse", ("texts", "nested"), 0.711, None),
    ("a row with a text of integers, over jsoncpp's parse", ("texts", "integers"), 0.857, None),
    ("a row with a text of doubles, over jsoncpp's parse", ("texts", "doubles"), 0.345, None),
    ("a row with a text of escapes, over jsoncpp's parse", ("texts", "escapes"), 0.900, None),
    ("create through the table, over recCreate", ("front", "create", "create, bare"), 1.285, None),
    ("a record of createMany, over recCreate in a transaction", ("front", "create many", "create many, bare"), 0.383, None),
    ("a row of the table's list, over recList", ("front", "list", "list, bare"), 1.024, None),
    ("a row of the table's each, over recList", ("front", "each", "list, bare"), 1.075, None),
    ("two threads, the floor's speed-up over the library's", ("threads",), None, None),
    ("two threads without SQLite's memory statistics, 2 over the library's speed-up", ("threads_alone",), None, None),
]


class Results:
    def __init__(self, path):
        with open(path) as file:
            self.all = json.load(file)
        self.titles = {c["name"]: c["title"] for c in self.all["contenders"]}
        self.operations = self.all["operations"]
        # Instructions for each call; a list has one call and counts by its rows.
        self.counts = {
            (c["contender"], c["operation"]):
                c["instructions"] / (c["rows"] if c["operation"] == "list" else c["calls"])
            for c in self.all["counts"]}
        self.listings = {(r["contender"], r["rows"]): r for r in self.all["listings"]}
        self.sizes = sorted({r["rows"] for r in self.all["listings"]})

    def listing(self, contender, rows, field):
        found = self.listings.get((contender, rows))
        return found[field] if found else None

    def text(self, kind, size, contender):
        return next(t["instructions"] for t in self.all["texts"]
                    if (t["kind"], t["bytes"], t["contender"]) == (kind, size, contender))

    def times(self, rival, operation):
        """How many times as fast the library is as the rival."""
        return self.counts[rival, operation] / self.counts["library", operation]

    def figure(self, kind, *keys):
        """The measured ratio, None where it was not measured."""
        if kind == "count":
            operation, other = keys
            pair = self.counts.get(("library", operation)), self.counts.get((other, operation))
        elif kind == "growth":
            counts = {g["rows"]: g["instructions"] for g in self.all["growth"] if g["contender"] == keys[0]}
            pair = counts.get(1000000), counts.get(10000)
        elif kind == "time_growth":
            pair = [self.listing("library", rows, "user_ns_per_row") for rows in keys]
        elif kind == "memory":
            pair = [self.listing(c, self.sizes[-1], "peak_bytes_per_row") for c in keys]
        elif kind in ("kept", "front"):
            pair = [self.all[kind][key] for key in keys]
        elif kind == "texts":
            # Of the two sizes, the dearer one.
            return max(t["instructions"] / self.text(keys[0], t["bytes"], "jsoncpp")
                       for t in self.all["texts"] if t["kind"] == keys[0] and t["contender"] == "library")
        elif kind == "threads":
            pair = 1, min(t["ratio"] for t in self.all["threads"]["with"] if t["threads"] == 2)
        elif kind == "threads_alone":
            pair = 2, min(t["library"] for t in self.all["threads"]["without"] if t["threads"] == 2)
        else:
            lists = self.all["value_lists"]
            pair = lists["both"], lists["long_alone"] + lists["many_alone"]
        return pair[0] / pair[1] if None not in pair else None


def table(header, rows):
    """A Markdown table; all columns but the first are numbers."""
    widths = [max(len(row[i]) for row in [header, *rows]) for i in range(len(header))]
    pad = lambda row: "| " + " | ".join(
        cell.ljust(width) if i == 0 else cell.rjust(width) for i, (cell, width) in enumerate(zip(row, widths))) + " |"
    rule = "|" + "|".join("-" * (w + 2) if i == 0 else "-" * (w + 1) + ":" for i, w in enumerate(widths)) + "|"
    return "\n".join([pad(header), rule, *map(pad, rows)])


def verdict(value, limit, aim):
    if value is None:
        return "not measured"
    if limit is None:
        return "no limit"
    if value > limit:
        return "MISSED"
    return "ok, aim reached" if aim and value <= aim else "ok"


def limits_table(results):
    rows = []
    for what, figure, limit, aim in LIMITS:
        value = results.figure(*figure)
        rows.append((what, "-" if value is None else f"{value:.3f}", f"{limit:.3f}" if limit else "",
                     f"{aim:.2f}" if aim else "", verdict(value, limit, aim)))
    return table(("figure", "measured", "at most", "aim", ""), rows)


def operations_table(results, value_of, number):
    return table(("", *results.operations),
                 [(title, *(number(value_of(name, o)) for o in results.operations))
                  for name, title in results.titles.items()])


# What a host could use instead, as it comes.
RIVALS = ["capi", "sqlitecpp", "soci", "poco"]


def speed_table(results):
    return table(("as fast as", *(TITLES[o] for o in results.operations)),
                 [(results.titles[rival], *(f"{results.times(rival, o):.2f}" for o in results.operations))
                  for rival in RIVALS if rival in results.titles])


def listing_table(results, field, number):
    rows = [(title, *(number(results.listing(name, size, field)) for size in results.sizes))
            for name, title in listed(results)]
    return table(("", *(f"{size:,}" for size in results.sizes)), rows)


def threads_table(results):
    rows = [(entry["operation"], entry["threads"], *(f"{entry[name]:.2f}" for name in ("library", "floor")),
             *(f"{free[name]:.2f}" for name in ("library", "floor")))
            for entry, free in zip(*results.all["threads"].values())]
    return table(("operation", "threads", "this library", "the floor", "library, without", "floor, without"),
                 [tuple(str(field) for field in row) for row in rows])


def texts_table(results):
    number = lambda t: f"{t['instructions'] / t['bytes']:.1f}"
    pairs = [(results.all["texts"][i], results.all["texts"][i + 1]) for i in range(0, len(results.all["texts"]), 2)]
    return table(("text", "bytes", "this library", "jsoncpp's parse", "times as fast"),
                 [(own["kind"], f"{own['bytes']:,}", number(own), number(other),
                   f"{other['instructions'] / own['instructions']:.2f}") for own, other in pairs])


def listed(results):
    return [(n, t.replace(", kept", "")) for n, t in results.titles.items()
            if (n, results.sizes[0]) in results.listings]


def plots(results):
    thousands = lambda value: f"{value / 1000:,.1f} k"
    microseconds = lambda nanoseconds: f"{nanoseconds / 1000:,.1f} µs".replace(".0 ", " ")
    largest = results.sizes[-1]
    yield "speed.svg", plot.bars(
        "Instructions of each operation, relative to this library",
        [(TITLES[o], [(n, results.titles[n], results.times(n, o)) for n in ["library", *RIVALS] if n in results.titles])
         for o in results.operations], lambda value: f"{value:.2f}")
    yield "operations.svg", plot.bars(
        "Instructions of each operation",
        [(TITLES[o], [(n, t, results.counts[n, o]) for n, t in results.titles.items()])
         for o in results.operations], thousands)
    yield "listing.svg", plot.lines(
        "User CPU time of a listed row", "rows in the table", "microseconds for each row",
        [(n, t, [(s, results.listing(n, s, "user_ns_per_row") / 1000) for s in results.sizes])
         for n, t in listed(results)], lambda value: f"{value:g}")
    yield "memory.svg", plot.bars(
        "Peak memory of a listed row",
        [(f"bytes for each of {largest:,} rows",
          [(n, t, results.listing(n, largest, "peak_bytes_per_row")) for n, t in listed(results)])],
        lambda value: f"{value:,.0f}")


def summary(results):
    times = results.times
    return f"""Listing many rows, this library is {times("capi", "list"):.1f} times as fast as a loop over SQLite's C API with
prepared statements and jsoncpp; a list of ten rows takes as long as that loop ({times("capi", "group"):.2f}), and a
single record by its key takes {1 / times("capi", "fetch"):.1f} times as long, because every call prepares its statement.
Compared with libraries that prepare for each call too, it is {times("sqlitecpp", "fetch"):.2f} times as fast as
SQLiteCpp at fetching a record, {times("soci", "fetch"):.1f} times as fast as SOCI and {times("poco", "fetch"):.1f} times
as fast as Poco::Data. Updates and deletes cost up to {1 / times("sqlitecpp", "update"):.1f} times as much as with
SQLiteCpp, whose host writes the statement by hand."""


def document(results, notes):
    facts = results.all["machine"]
    skipped = ("\n**Skipped:** the table of 1,000,000 rows, because less than 6 GB of memory were free.\n"
               if results.all["largest_skipped"] else "")
    return f"""# Performance

## Which is faster, and by how much?

{textwrap.fill(summary(results), 120)}

How many times as fast this library is, by instructions (below 1: slower):

{speed_table(results)}

![Instructions of each operation, relative to this library](performance/speed.svg)

## What is compared

This page is generated by `scripts/dev/bench` from its measurements; to change the notes, edit `bench/notes.md` and
run it again.

The workload uses a table `task` with seven members (two strings, one of them indexed in groups of ten, an integer
key, a 64-bit integer, a boolean, an array of two strings, and an object with two members). The table is in memory,
and all writes are in one transaction. Every contender receives its records and requests as JSON that was prepared
beforehand, and returns JSON: a created record is read back as stored, and tags and meta are parsed. `bench_check`
compares the contenders' results and tables.

For each operation, the library builds one SQL string and runs it through `sqlite3_exec`. The *floor* is that same
string, ready-made, with a callback that discards the rows: anything above the floor is the library's own cost.
"Kept" means that statements are prepared once and reused, as in the handwritten contenders; SQLiteCpp, SOCI and
Poco::Data are shown both with statements that are prepared for each call, as in their own examples, and with kept
ones; "exec" runs updates and deletes as one text, which SQLiteCpp's examples do. A host that keeps its statements
saves the cost of preparing them, which is most of a small operation; this library's interface cannot do that.

SOCI and Poco::Data are used in two ways: with the type that each provides for rows of any table (`soci::row`,
`Poco::Data::RecordSet`), and with variables bound to the columns. Both find columns by position. The limits apply
to the first way, because this library also works with any table; the figures for a host that is written for one
table and binds variables are shown next to them.

The table of [front.md](front.md) stands on this interface; the limits compare it with the same calls made without it,
on the same table.

## Limits

{limits_table(results)}
{skipped}
## Instructions

Instructions counted by callgrind with {results.all["rows"]:,} records, per call, or per row when all rows are
listed. The count includes freeing what a call returned.

{operations_table(results, lambda n, o: results.counts[n, o], lambda v: f"{v:,.0f}")}

![Instructions of each operation](performance/operations.svg)

## JSON texts

Instructions for each byte of the text of a JSON member: listing the row, and jsoncpp's own parse of the text alone,
with a reader that is kept.

{texts_table(results)}

## Time

Microseconds of CPU time on the machine described below, per call or per listed row, measured with Google Benchmark
(median of three runs).

{operations_table(results, lambda n, o: results.all["times"][f"{n}/{o}"], lambda v: f"{v:.1f}")}

## Threads

How many times as much work several threads do as one alone, each with its own database in memory (median of nine,
the library and the floor in turn), and the same without SQLite's global memory statistics.

{threads_table(results)}

SQLite counts the memory of the whole process under one lock, which small operations of several threads spend most of
their time waiting for, the floor's as well. A host that does not need these figures can call
`sqlite3_config(SQLITE_CONFIG_MEMSTATUS, 0)` before it opens its first connection. The price is that
`sqlite3_memory_used`, `sqlite3_memory_highwater` and the heap limits no longer work.

## Long lists

User CPU time per listed row in microseconds, by table size (median of five runs, each in its own process; at
1,000,000 rows, the other contenders have a single run).

{listing_table(results, "user_ns_per_row", lambda v: f"{v / 1000:.2f}")}

![User CPU time of a listed row](performance/listing.svg)

Growth of the kernel's memory high-water mark while the table is listed, in bytes per row.

{listing_table(results, "peak_bytes_per_row", lambda v: f"{v:,.0f}")}

![Peak memory of a listed row](performance/memory.svg)

## Where the rest of the cost is

{notes}
## Machine

{facts["processor"]}, {facts["cores"]} cores, {facts["memory_gib"]} GiB, {facts["system"]}, {facts["compiler"]},
all of our own code compiled with -O2.

{chr(10).join("- " + package for package in facts["packages"])}
"""


def main():
    results, folder = Results(sys.argv[1]), sys.argv[2]
    with open(os.path.join(os.path.dirname(os.path.abspath(__file__)), "notes.md"), encoding="utf-8") as file:
        notes = file.read()
    os.makedirs(os.path.join(folder, "performance"), exist_ok=True)
    for name, svg in plots(results):
        with open(os.path.join(folder, "performance", name), "w", encoding="utf-8") as file:
            file.write(svg)
    text = document(results, notes)
    with open(os.path.join(folder, "performance.md"), "w", encoding="utf-8") as file:
        file.write(text)
    print(text)
    missed = [what for what, figure, limit, aim in LIMITS
              if verdict(results.figure(*figure), limit, aim) == "MISSED"]
    if missed:
        sys.exit("limits missed: " + "; ".join(missed))


main()
