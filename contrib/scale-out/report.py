# SPDX-FileCopyrightText: 2026 The vornjsondb authors
# SPDX-License-Identifier: MIT
"""Writes what contrib/scale-out/scale-test measured into its page, between the marks, and the plot beside it.

    report.py WORK-FOLDER PAGE.md
"""

import datetime
import os
import re
import statistics
import subprocess
import sys
import textwrap

sys.path.insert(0, os.path.join(os.path.dirname(os.path.abspath(__file__)), "../../bench"))
import plot

BEGIN, END = "<!-- measured: written by contrib/scale-out/scale-test -->", "<!-- end of measured -->"
ROWS = [1, 10, 100, 1000, 10000]


def table(header, rows):
    rule = "|---|" + "---:|" * (len(header) - 1)
    return "\n".join(["| " + " | ".join(header) + " |", rule, *("| " + " | ".join(row) + " |" for row in rows)])


def cases(work):
    with open(os.path.join(work, "cases"), encoding="utf-8") as file:
        for line in file:
            name, acknowledged, missing, longest, following = line.rstrip("\n").split("|")
            yield name, f"{int(acknowledged):,}", missing, longest, following or "–"


def milliseconds(work, name, rows):
    """The median of a transaction."""
    with open(os.path.join(work, f"{name}-{rows}")) as file:
        return 1000 * statistics.median(float(line.split()[0]) for line in file)


def commits(work):
    local, store = ("local-rollback", "local"), ("store-rollback", "store")
    for title, index in (("rollback journal, normal locking", 0), ("WAL, exclusive locking", 1)):
        a, b = milliseconds(work, local[index], 1), milliseconds(work, store[index], 1)
        yield title, f"{a:.2f}", f"{b:.2f}", f"{b / a:.1f}"


def batches(work):
    for rows in ROWS:
        a, b = milliseconds(work, "local", rows), milliseconds(work, "store", rows)
        yield f"{rows:,}", f"{a:.2f}", f"{b:.2f}", f"{1000 * rows / a:,.0f}", f"{1000 * rows / b:,.0f}"


def output(*command):
    return subprocess.run(command, check=True, capture_output=True, text=True).stdout


def machine(work):
    processor = re.search(r"^Model name: *(.*)$", output("lscpu"), re.MULTILINE).group(1)
    with open("/proc/meminfo") as file:
        gibibytes = int(re.search(r"MemTotal: *(\d+)", file.read()).group(1)) / 1024**2
    with open(os.path.join(work, "load")) as file:
        load = file.read().strip()
    versions = output("dpkg-query", "-W", "-f", "${Package} ${Version}, ", "ceph-osd", "libsqlite3-0")
    return textwrap.fill(
        f"Measured on {datetime.date.today()} on one machine that ran the store, both mounts and the owners: "
        f"{processor}, {os.cpu_count()} cores, {gibibytes:.0f} GiB; {versions.rstrip(', ')}. "
        f"Its load average was {load} before the commits were measured.", 115)


def measured(work, picture):
    return f"""{BEGIN}
{table(("case", "acknowledged", "missing", "longest call, s", "next owner after, s"), cases(work))}

The time of a commit in milliseconds, one record in each (median):

{table(("settings", "local file", "replicated", "times"), commits(work))}

Several records in a transaction, WAL and exclusive locking (median):

{table(("records", "local file, ms", "replicated, ms", "local file, records/s", "replicated, records/s"), batches(work))}

![What a commit costs by the records in it, on a local file and replicated]({picture})

{machine(work)}
{END}"""


def main():
    work, page = sys.argv[1:]
    with open(page, encoding="utf-8") as file:
        before, rest = file.read().split(BEGIN)
    picture = os.path.join(os.path.dirname(page), "commit-cost.svg")
    cost = lambda name: [(rows, milliseconds(work, name, rows)) for rows in ROWS]
    with open(picture, "w", encoding="utf-8") as file:
        file.write(plot.lines(
            "What a commit costs by the records in it", "records in a transaction",
            "milliseconds for the transaction", [("", "replicated", cost("store")), ("", "local file", cost("local"))],
            lambda value: f"{value:g}", logarithmic=True))
    with open(page, "w", encoding="utf-8") as file:
        file.write(before + measured(work, os.path.relpath(picture, os.path.dirname(page))) + rest.split(END)[1])


main()
