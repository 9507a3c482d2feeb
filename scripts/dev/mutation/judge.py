# SPDX-FileCopyrightText: 2026 The vornjsondb authors
# SPDX-License-Identifier: MIT
"""Builds the library with a mutant in it and lets the tests judge it."""

import glob
import json
import os
import re
import resource
import shlex
import shutil
import signal
import subprocess

SUITES = ("unit", "exhaustive", "hostile", "docs", "host")
HOSTS = (("malloc_host",), ("cxx11_host",), ("plugin_host", "libplugin.so"))
CORPORA = ("json", "column", "definition", "formatter", "record", "request")
GIBIBYTE = 1 << 30
# The limit for a mutant is in CPU time, so that a busy machine makes no difference.
TIMES_THE_NORMAL_RUN = 10
WAITING_SECONDS = 3600


class Build:
    """A complete build folder: its commands, its tests, and which sources depend on which header."""

    def __init__(self, project, folder, texts):
        self.project = project
        self.folder = folder
        self.tests = os.path.join(folder, "tests")
        sources = os.path.join(project, "src")
        with open(os.path.join(folder, "compile_commands.json")) as file:
            commands = {os.path.relpath(entry["file"], project): entry["command"] for entry in json.load(file)
                        if entry["file"].startswith(sources)}
        self.compile = {path: self.without_options(command) for path, command in commands.items()}
        link = subprocess.run(["ninja", "-C", folder, "-t", "commands", "src/libvornjsondb.so"], check=True,
                              capture_output=True, text=True).stdout
        link = next(line for line in link.splitlines() if " -shared " in line)
        self.link = [word for word in shlex.split(link) if word not in (":", "&&")]
        self.users = {path: [user for user in self.compile if self.stands_on(texts, user, path)] for path in texts}
        self.filters = {path: self.matching_tests(path) for path in texts}

    @staticmethod
    def without_options(command):
        """The command without warnings, debug information and compiler cache; only a missing return is an error."""
        words = [word for word in shlex.split(command) if not word.startswith("-W") and "-g" != word]
        return [*words[next(i for i, word in enumerate(words) if word.endswith("++")):], "-Werror=return-type"]

    def stands_on(self, texts, user, path):
        if user == path:
            return True
        included = [os.path.join("src", name) for name in re.findall(r'#include "([^"]+)"', texts[user])]
        return any(self.stands_on(texts, name, path) for name in included)

    def matching_tests(self, path):
        """The filter for the unit tests whose files are named after the source; they are tried first."""
        stem = os.path.splitext(os.path.basename(path))[0]
        names = set()
        for name in glob.glob(os.path.join(self.project, "tests", "unit", stem + "*_test.cpp")):
            with open(name) as file:
                names.update(re.findall(r"^TEST(?:_[FP])?\((\w+),", file.read(), re.MULTILINE))
        return ":".join(f"{name}.*:*/{name}.*:*/{name}/*" for name in sorted(names))


class Judge:
    """A folder with a copy of the mutated file and the library built from it."""

    def __init__(self, build, folder):
        self.build = build
        self.folder = folder
        self.library = os.path.join(folder, "lib", "libvornjsondb.so.6")
        self.seconds = {}

    def prepare(self):
        for name in ("src", "lib", "objects", "tmp"):
            shutil.rmtree(os.path.join(self.folder, name), ignore_errors=True)
            os.makedirs(os.path.join(self.folder, name))

    def measure(self, paths):
        """Judges the unchanged library, which must pass, and records the time of each stage."""
        self.prepare()
        if not self.make_library([]):
            raise SystemExit("the library cannot be linked")
        for name, command in self.stages(None) + [("matching", self.suite("unit", self.build.filters[path])) for path in paths]:
            before = resource.getrusage(resource.RUSAGE_CHILDREN)
            if not self.passes(command, WAITING_SECONDS):
                raise SystemExit(f"the unchanged library fails: {' '.join(command)}")
            after = resource.getrusage(resource.RUSAGE_CHILDREN)
            used = after.ru_utime + after.ru_stime - before.ru_utime - before.ru_stime
            self.seconds[name] = max(used, self.seconds.get(name, 1))

    def judge(self, mutant):
        """"invalid", "survived", or the stage that killed the mutant."""
        self.prepare()
        copy = os.path.join(self.folder, mutant.path)
        os.makedirs(os.path.dirname(copy), exist_ok=True)
        with open(copy, "w") as file:
            file.write(mutant.text)
        if not self.make_library(self.build.users[mutant.path]):
            return "invalid"
        for name, command in self.stages(mutant.path):
            if not self.passes(command, TIMES_THE_NORMAL_RUN * self.seconds[name]):
                return name
        return "survived"

    def stages(self, path):
        stages = [(suite, self.suite(suite, "*")) for suite in SUITES]
        stages[1:1] = [("corpus " + corpus, self.corpus(corpus)) for corpus in CORPORA]
        stages += [(host[0], [os.path.join(self.build.tests, "host", word) for word in host]) for host in HOSTS]
        if path and self.build.filters[path]:
            stages.insert(0, ("matching", self.suite("unit", self.build.filters[path])))
        return stages

    def suite(self, name, chosen):
        program = os.path.join(self.build.tests, name, name + "_tests")
        return [program, "--gtest_fail_fast", "--gtest_brief=1", "--gtest_filter=" + chosen]

    def corpus(self, name):
        return [os.path.join(self.build.folder, "fuzz", "fuzz_replay_" + name),
                os.path.join(self.build.project, "fuzz", "corpus", name)]

    def make_library(self, sources):
        objects = {}
        for source in sources:
            command = list(self.build.compile[source])
            output = command.index("-o") + 1
            target = os.path.join(self.folder, "objects", os.path.basename(source) + ".o")
            objects[command[output]] = target
            command[output] = target
            copy = os.path.join(self.folder, source)
            if os.path.exists(copy):
                command[command.index("-c") + 1] = copy
            command.insert(1, "-I" + os.path.join(self.folder, "src"))
            if not self.succeeds(command):
                return False
        link = [objects.get(word, word) for word in self.build.link]
        link[link.index("-o") + 1] = self.library
        return self.succeeds(link)

    def succeeds(self, command):
        return 0 == subprocess.run(command, cwd=self.build.folder, stdout=subprocess.DEVNULL,
                                   stderr=subprocess.DEVNULL).returncode

    def passes(self, command, seconds):
        """Whether the program exits with 0 within its limits for time, memory and file size."""
        def bounds():
            resource.setrlimit(resource.RLIMIT_CPU, (int(seconds) + 1, int(seconds) + 5))
            resource.setrlimit(resource.RLIMIT_AS, (4 * GIBIBYTE, 4 * GIBIBYTE))
            resource.setrlimit(resource.RLIMIT_FSIZE, (GIBIBYTE, GIBIBYTE))
            resource.setrlimit(resource.RLIMIT_CORE, (0, 0))

        environment = dict(os.environ, LD_LIBRARY_PATH=os.path.dirname(self.library),
                           TMPDIR=os.path.join(self.folder, "tmp"))
        process = subprocess.Popen(command, cwd=self.folder, env=environment, stdin=subprocess.DEVNULL,
                                   stdout=subprocess.DEVNULL, stderr=subprocess.DEVNULL,
                                   start_new_session=True, preexec_fn=bounds)
        try:
            return 0 == process.wait(WAITING_SECONDS)
        except subprocess.TimeoutExpired:
            return False
        finally:
            # Processes that the tests started are killed with them.
            try:
                os.killpg(process.pid, signal.SIGKILL)
            except ProcessLookupError:
                pass
            process.wait()
