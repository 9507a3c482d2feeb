#!/usr/bin/env python3
# SPDX-FileCopyrightText: 2026 The vornjsondb authors
# SPDX-License-Identifier: MIT
"""evaluate.py PROGRAM...: judges what the table selects, by what docs/front.md says, with plain Python over
the records. The program is that of the tests. It writes a line for each table and each of its answers."""

import functools
import json
import operator
import os
import re
import subprocess
import sys

LISTS = {"$or": any, "$and": all}
ORDERS = {"$gt": operator.gt, "$gte": operator.ge, "$lt": operator.lt, "$lte": operator.le}


def lowered(text):
    return re.sub("[A-Z]", lambda match: match[0].lower(), text)


@functools.lru_cache(None)
def pattern(text):
    """The regular expression of a pattern; one that ends inside an escape fits nothing."""
    parts = re.findall(r"\\?.|\\", lowered(text), re.DOTALL)
    wild = {"%": ".*", "_": ".", "\\": "(?!)"}
    return re.compile("".join(wild.get(part, re.escape(part[-1])) for part in parts), re.DOTALL)


class Table:
    def __init__(self, members, columns, records):
        self.records = records
        self.json = {name for name, member in members.items() if member["cpptype"].startswith("Json::")}
        self.nocase = re.findall(r"(\w+) text collate nocase", columns)
        several = re.search(r"primary key \((.+?)\)", columns)
        self.key = several[1].split(", ") if several else re.findall(r"(\w+) integer primary key", columns)

    def comparable(self, member, value):
        if member in self.json:
            return json.dumps(value, sort_keys=True)
        if isinstance(value, str):
            return (lowered(value) if member in self.nocase else value).encode()
        return value

    def holds(self, member, name, operand, value):
        if name == "$in":
            return any(self.holds(member, "$eq", each, value) for each in operand)
        if name == "$ne":
            return not self.holds(member, "$eq", operand, value)
        if value is None or operand is None:
            return name == "$eq" and value is operand
        if name == "$like":
            return pattern(operand).fullmatch(lowered(value)) is not None
        return ORDERS.get(name, operator.eq)(self.comparable(member, value), self.comparable(member, operand))

    def fits(self, member, wanted, value):
        if not isinstance(wanted, dict) or (member in self.json and not any(name[0] == "$" for name in wanted)):
            wanted = {"$eq": wanted}
        return all(self.holds(member, name, operand, value) for name, operand in wanted.items())

    def selects(self, condition, record):
        return all(
            LISTS[name](self.selects(each, record) for each in wanted)
            if name in LISTS
            else self.fits(name, wanted, record.get(name))
            for name, wanted in (condition or {}).items()
        )

    def place(self, member, record):
        """Where a record stands in the order of a member: without it, before all others."""
        value = record.get(member)
        return (0,) if value is None else (1, self.comparable(member, value))

    def comes_after(self, order, record, last):
        for member, descending in order:
            places = self.place(member, record), self.place(member, last)
            if places[0] != places[1]:
                return (places[0] < places[1]) if descending else (places[0] > places[1])
        return False

    def page(self, records, options):
        order = [(name.lstrip("-"), name[0] == "-") for name in options.get("sort", [])]
        direction = order[-1][1] if order else False
        order += [(name, direction) for name in self.key if name not in dict(order)]
        for member, descending in reversed(order):
            records = sorted(records, key=functools.partial(self.place, member), reverse=descending)
        if "after" in options:
            records = [record for record in records if self.comes_after(order, record, options["after"])]
        records = records[options.get("offset", 0) :]
        return records[: options.get("limit", len(records))]

    def judge(self, answer):
        """What should have been answered instead; None if nothing."""
        records = [record for record in self.records if self.selects(answer["condition"], record)]
        ids = [record["id"] for record in self.page(records, answer["options"])]
        right = {"ids": ids, "count": len(records)}
        return None if right == {"ids": answer.get("ids", []), "count": answer["count"]} else right


def main():
    reading, writing = os.pipe()
    command = sys.argv[1:] + ["--gtest_filter=Oracle.*"]
    environment = dict(os.environ, VORN_FRONT_ANSWERS=f"/dev/fd/{writing}")
    program = subprocess.Popen(command, env=environment, pass_fds=[writing])
    os.close(writing)
    requests = rows = differences = 0
    with open(reading, encoding="utf-8") as lines:
        for line in map(json.loads, lines):
            if "records" in line:
                table = Table(**line)
                continue
            right = table.judge(line)
            requests += 1
            rows += len(line.get("ids", []))
            if right is not None:
                differences += 1
                print(f"answered: {line}\nevaluated: {right}")
    print(f"figure: evaluated requests = {requests}, rows = {rows}, differences = {differences}")
    return 1 if program.wait() or differences or not rows else 0


if __name__ == "__main__":
    sys.exit(main())
