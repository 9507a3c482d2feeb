# SPDX-FileCopyrightText: 2026 The vornjsondb authors
# SPDX-License-Identifier: MIT
"""Mutation testing of src/: every mutant, or a sample of them, judged by the tests.

Results are kept next to the build, so a run can be stopped and later continues where it stopped. A killed
mutant is tried again when its file changes, a survivor also when the tests change.
"""

import argparse
import concurrent.futures
import glob
import hashlib
import json
import os
import queue
import random

from judge import Build, Judge
from mutants import enumerators, mutants

PROJECT = os.getcwd()
FOLDER = os.path.join(PROJECT, "build", "mutation")
LISTED = "scripts/dev/mutation/survivors.txt"


class State:
    """The results so far, one line each."""

    def __init__(self, path, tests):
        self.path = path
        self.tests = tests
        self.results = {}
        if os.path.exists(path):
            with open(path) as file:
                for line in file:
                    entry = json.loads(line)
                    self.results[entry["key"]] = entry

    def result(self, mutant):
        return self.results.get(mutant.key, {}).get("result")

    def is_pending(self, mutant):
        entry = self.results.get(mutant.key)
        return entry is None or ("survived" == entry["result"] and entry["tests"] != self.tests)

    def keep(self, mutant, result):
        entry = {"key": mutant.key, "result": result, "tests": self.tests}
        self.results[mutant.key] = entry
        with open(self.path, "a") as file:
            file.write(json.dumps(entry) + "\n")


def texts_of(pattern):
    texts = {}
    for path in sorted(glob.glob(pattern, recursive=True)):
        with open(path) as file:
            texts[path] = file.read()
    return texts


def sample_of(found, count, seed):
    """A sample with the same proportion of each file's mutants, and at least one mutant per file."""
    chosen = []
    total = sum(len(of_file) for of_file in found.values())
    for path, of_file in found.items():
        share = min(len(of_file), max(1, round(count * len(of_file) / total)))
        chosen += random.Random(f"{seed} {path}").sample(of_file, share)
    return sorted(chosen, key=lambda mutant: (mutant.path, mutant.line, mutant.column))


def judge_all(pending, state, build, workers, paths):
    judges = queue.Queue()
    first = Judge(build, os.path.join(FOLDER, "worker-1"))
    first.measure(paths)
    for i in range(workers):
        judge = Judge(build, os.path.join(FOLDER, f"worker-{i + 1}"))
        judge.seconds = first.seconds
        judges.put(judge)

    def judged(mutant):
        judge = judges.get()
        try:
            return judge.judge(mutant)
        finally:
            judges.put(judge)

    with concurrent.futures.ThreadPoolExecutor(workers) as executor:
        running = {executor.submit(judged, mutant): mutant for mutant in pending}
        try:
            for number, future in enumerate(concurrent.futures.as_completed(running), 1):
                mutant = running[future]
                state.keep(mutant, future.result())
                print(f"{number}/{len(pending)} {mutant.path}:{mutant.line}:{mutant.column}: "
                      f"{mutant.change}: {future.result()}", flush=True)
        except BaseException:
            executor.shutdown(cancel_futures=True)
            raise


def listed_survivors():
    """Maps (file and function, line of code, change) of each known survivor to the reason."""
    reasons = {}
    places, changes = [], []
    with open(LISTED) as file:
        for line in file:
            text = line.strip()
            if not text or text.startswith("# "):
                places, changes = [], []
            elif line.startswith("    "):
                reasons.update({(*where, change): text for where in places for change in changes})
                changes = []
            elif line.startswith("  "):
                changes.append(text)
            else:
                places.append(text.split(": ", 1))
    return reasons


def place(mutant):
    return mutant.place, mutant.code, mutant.change


def report(chosen, found, guards, state):
    """Prints the tables; returns true if the list names exactly the survivors."""
    results = {mutant.key: state.result(mutant) for mutant in chosen}
    valid = [mutant for mutant in chosen if results[mutant.key] not in (None, "invalid")]
    survivors = [mutant for mutant in valid if "survived" == results[mutant.key]]
    row = "{:40} {:>8} {:>8} {:>8} {:>8} {:>8} {:>8}"
    print(row.format("file", "mutants", "killed", "survived", "invalid", "not run", "guards"))
    for path in [*sorted({mutant.path for mutant in chosen}), "all"]:
        mine = [mutant.key for mutant in chosen if path in (mutant.path, "all")]
        lived = sum("survived" == results[key] for key in mine)
        invalid = sum("invalid" == results[key] for key in mine)
        pending = sum(results[key] is None for key in mine)
        count = len(mine) - invalid - pending
        guarded = sum(guards.values()) if "all" == path else guards[path]
        print(row.format(path, count, count - lived, lived, invalid, pending, guarded))

    reasons = listed_survivors()
    print("\nsurvivors:")
    for mutant in survivors:
        reason = reasons.get(place(mutant), "NOT LISTED")
        print(f"{mutant.path}:{mutant.line}:{mutant.column}: {mutant.change}\n    {mutant.code}\n    {reason}")
    alive = {place(mutant) for mutant in survivors}
    # A sample says nothing about the other mutants.
    unknown = {place(mutant) for of_file in found.values() for mutant in of_file if results.get(mutant.key) is None}
    stale = [listed for listed in reasons if listed[0].split(",")[0] in found and listed not in alive | unknown]
    for listed in stale:
        print("listed, but no survivor: " + ": ".join(listed))
    score = 100 * (len(valid) - len(survivors)) / len(valid) if valid else 0
    print(f"figure: mutation, mutants = {len(valid)}")
    print(f"figure: mutation, survivors = {len(survivors)}")
    print(f"figure: mutation, score = {score:.1f}")
    return alive <= set(reasons) and not stale


def main():
    parser = argparse.ArgumentParser(prog="scripts/dev/mutate", description=__doc__)
    parser.add_argument("--sample", type=int, metavar="N", help="about N mutants, spread over all files")
    parser.add_argument("--seed", default="1", help="of the sample (1)")
    parser.add_argument("--workers", type=int, default=2, help="mutants judged at the same time (2)")
    parser.add_argument("--report", action="store_true", help="judge nothing, show what is known")
    parser.add_argument("files", nargs="*", metavar="FILE", help="of src/; all of them when none is named")
    options = parser.parse_args()

    texts = {**texts_of("src/**/*.cpp"), **texts_of("src/**/*.h")}
    known = enumerators(texts.values())
    paths = [os.path.relpath(path) for path in options.files] or list(texts)
    found = {path: mutants(path, texts[path], known) for path in paths}
    guards = {path: sum(mutant.is_guard for mutant in found[path]) for path in paths}
    found = {path: [mutant for mutant in found[path] if not mutant.is_guard] for path in paths}
    chosen = [mutant for path in paths for mutant in found[path]]
    if options.sample:
        chosen = sample_of(found, options.sample, options.seed)

    tests = "".join(texts_of("tests/**/*.cpp").values()) + "".join(texts_of("tests/**/*.h").values())
    state = State(os.path.join(FOLDER, "results.jsonl"), hashlib.sha256(tests.encode()).hexdigest())
    pending = [mutant for mutant in chosen if state.is_pending(mutant)]
    if pending and not options.report:
        judge_all(pending, state, Build(PROJECT, os.path.join(FOLDER, "build"), texts), options.workers, paths)
    if not report(chosen, found, guards, state):
        raise SystemExit(1)


main()
