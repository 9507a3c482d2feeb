# SPDX-FileCopyrightText: 2026 The vornjsondb authors
# SPDX-License-Identifier: MIT
"""Runs the benchmark programs and writes what they measured to a JSON file.

    measure.py BUILD-FOLDER RESULTS.json
"""

import concurrent.futures
import json
import os
import re
import statistics
import subprocess
import sys

ROWS = 1000
SIZES = [1000, 10000, 100000, 1000000]
GROWTH_SIZES = [10000, 1000000]
LARGEST_NEEDS_BYTES = 6 * 1024**3
RUNS = 5
MEBIBYTE = 1048576


def say(text):
    print("== " + text, flush=True)


class Programs:
    def __init__(self, folder):
        self.folder = folder

    def output(self, *command):
        path = os.path.join(self.folder, command[0])
        return subprocess.run([path, *command[1:]], check=True, capture_output=True, text=True).stdout

    def counted(self, *command):
        """The program's JSON line with the instructions that callgrind counted."""
        path = os.path.join(self.folder, command[0])
        valgrind = ["valgrind", "--tool=callgrind", "--instr-atstart=no", "--callgrind-out-file=/dev/null"]
        done = subprocess.run([*valgrind, path, *command[1:]], check=True, capture_output=True, text=True)
        result = json.loads(done.stdout)
        result["instructions"] = int(re.search(r"Collected : (\d+)", done.stderr).group(1))
        return result


def count_operations(programs, contenders, operations):
    say(f"counting the instructions of {len(contenders)} contenders at {ROWS} records")
    jobs = [(c, o) for o in operations for c in contenders]
    with concurrent.futures.ThreadPoolExecutor(os.cpu_count()) as pool:
        counts = list(pool.map(lambda job: programs.counted("bench_count", *job, str(ROWS)), jobs))
    for operation in operations:
        # The floor decodes nothing, so it has no results to compare.
        digests = {c["digest"] for c in counts if c["operation"] == operation and c["contender"] != "floor"}
        if len(digests) != 1:
            sys.exit(f"the contenders did not do the same work: {operation}")
    return counts


def count_value_lists(programs):
    say("counting the instructions of long value lists")
    count = lambda members, size: programs.counted("bench_value_list", str(members), str(size))["instructions"]
    return {"both": count(50, MEBIBYTE), "long_alone": count(1, MEBIBYTE), "many_alone": count(50, 5)}


KEPT = ["fetch", "fetch, two tables", "fetch, after a wide table", "create", "create, two tables",
        "create, after a wide table", "rows", "rows, NULL in every second", "rows, NULLs in alternating members",
        "rows, 100 members",
        "types of 10 tables", "types of 100000 tables", "adding 1000 tables", "adding 100000 tables"]
FRONT = ["create", "create, bare", "create many", "create many, bare", "list", "list, bare", "each"]


def count_cases(programs, program, cases):
    """Instructions of a call for each case of the program."""
    say(f"counting the instructions of the cases of {program}")
    with concurrent.futures.ThreadPoolExecutor(os.cpu_count()) as pool:
        counts = pool.map(lambda case: programs.counted(program, case), cases)
        return {case: count["instructions"] / count["calls"] for case, count in zip(cases, counts)}


TEXTS = ["objects", "nested", "integers", "doubles", "escapes"]
TEXT_SIZES = [3000, 300000]


def count_texts(programs):
    """Instructions of a row with each text, and of jsoncpp's own parse of the text."""
    say("counting the instructions of reading JSON texts")
    jobs = [(kind, size, contender) for kind in TEXTS for size in TEXT_SIZES for contender in ("library", "jsoncpp")]
    with concurrent.futures.ThreadPoolExecutor(os.cpu_count()) as pool:
        counts = pool.map(lambda job: programs.counted("bench_texts", job[2], job[0], str(job[1])), jobs)
        return [{"kind": kind, "bytes": size, "contender": contender, "instructions": count["instructions"] / count["calls"]}
                for (kind, size, contender), count in zip(jobs, counts)]


def time_threads(programs):
    say("taking the times of several threads")
    return {"with": json.loads(programs.output("bench_threads")),
            "without": json.loads(programs.output("bench_threads", "--without-statistics"))}


def take_times(programs):
    say("taking the times of the operations")
    output = programs.output("bench_times", "--benchmark_format=json", "--benchmark_min_time=0.02",
                             "--benchmark_repetitions=3", "--benchmark_report_aggregates_only=true")
    times = {}
    for benchmark in json.loads(output)["benchmarks"]:
        if benchmark["aggregate_name"] == "median":
            contender, operation = benchmark["run_name"].split("/")
            times[f"{contender}/{operation}"] = 1e6 / benchmark["items_per_second"]
    return times


def available_bytes():
    with open("/proc/meminfo") as meminfo:
        return 1024 * int(re.search(r"MemAvailable:\s+(\d+)", meminfo.read()).group(1))


def list_tables(programs, contenders):
    """The median of the runs for each contender and size, each run in a process of its own."""
    sizes = list(SIZES)
    skipped = available_bytes() < LARGEST_NEEDS_BYTES
    if skipped:
        sizes.remove(max(SIZES))
        say(f"SKIPPED: {max(SIZES)} rows, because less than 6 GB of memory are free")
    listings = []
    for size in sizes:
        say(f"listing {size} rows")
        for contender in contenders:
            # The largest size takes long; only the library's figure there has a limit.
            runs = RUNS if size < max(SIZES) or contender == "library" else 1
            results = [json.loads(programs.output("bench_listing", contender, str(size))) for _ in range(runs)]
            listings.append({"contender": contender, "rows": size, "runs": runs}
                            | {field: statistics.median(r[field] for r in results)
                               for field in ("user_ns_per_row", "peak_bytes_per_row")})
    return listings, skipped


def count_growth(programs, skipped):
    """Instructions of a listed row, by contender and size of the table."""
    sizes = [size for size in GROWTH_SIZES if not skipped or size < max(SIZES)]
    say("counting the instructions of long lists")
    jobs = [(contender, size) for size in sizes for contender in ("library", "capi")]
    with concurrent.futures.ThreadPoolExecutor(os.cpu_count()) as pool:
        counts = pool.map(lambda job: programs.counted("bench_listing", job[0], str(job[1])), jobs)
        return [{"contender": contender, "rows": size, "instructions": count["instructions"] / size}
                for (contender, size), count in zip(jobs, counts)]


def machine():
    def first(pattern, path):
        with open(path) as file:
            return re.search(pattern, file.read(), re.MULTILINE).group(1)

    packages = ["libsqlite3-0", "libjsoncpp25", "libsqlitecpp-dev", "libsoci-dev", "libpoco-dev",
                "nlohmann-json3-dev", "libbenchmark-dev", "valgrind"]
    query = ["dpkg-query", "-W", "-f", "${Package} ${Version}\n", *packages]
    compiler = subprocess.run(["c++", "--version"], capture_output=True, text=True).stdout.splitlines()[0]
    return {
        "processor": first(r"^model name\s*: (.*)$", "/proc/cpuinfo"),
        "cores": os.cpu_count(),
        "memory_gib": round(int(first(r"^MemTotal:\s+(\d+)", "/proc/meminfo")) / 1024**2, 1),
        "system": first(r'^PRETTY_NAME="(.*)"$', "/etc/os-release"),
        "compiler": compiler,
        "packages": subprocess.run(query, capture_output=True, text=True).stdout.split("\n")[:-1],
    }


def main():
    programs = Programs(os.path.join(sys.argv[1], "bench"))
    lists = json.loads(programs.output("bench_check", "--lists"))
    names = [c["name"] for c in lists["contenders"]]
    # Long lists are taken of one host for each library; keeping statements makes no difference to them.
    listed = [name for name in names if not name.endswith(("-exec", "-kept", "-variables"))]
    results = dict(lists)
    results["rows"] = ROWS
    results["counts"] = count_operations(programs, names, lists["operations"])
    results["value_lists"] = count_value_lists(programs)
    results["kept"] = count_cases(programs, "bench_kept", KEPT)
    results["front"] = count_cases(programs, "bench_front", FRONT)
    results["texts"] = count_texts(programs)
    results["times"] = take_times(programs)
    results["threads"] = time_threads(programs)
    results["listings"], results["largest_skipped"] = list_tables(programs, listed)
    results["growth"] = count_growth(programs, results["largest_skipped"])
    results["machine"] = machine()
    with open(sys.argv[2], "w") as file:
        json.dump(results, file, indent=1)


main()
