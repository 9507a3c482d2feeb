# SPDX-FileCopyrightText: 2026 The vornjsondb authors
# SPDX-License-Identifier: MIT
"""A headless Chromium, driven over chromedriver's HTTP."""

import contextlib
import json
import socket
import subprocess
import sys
import tempfile
import time
import urllib.request

CHROMIUM = ["--headless", "--no-sandbox", "--disable-gpu", "--disable-quic", "--no-first-run",
            "--disable-background-networking", "--disable-component-update", "--disable-sync", "--hide-scrollbars"]


def free_port():
    with socket.socket() as probe:
        probe.bind(("127.0.0.1", 0))
        return probe.getsockname()[1]


PORT = free_port()


def ask(path, values=None, method=None):
    data = None if values is None else json.dumps(values).encode()
    address = f"http://127.0.0.1:{PORT}/{path}"
    request = urllib.request.Request(address, data, {"Content-Type": "application/json"}, method=method)
    with urllib.request.urlopen(request, timeout=60) as answer:
        return json.load(answer)["value"]


def wait_for_driver():
    for _ in range(100):
        try:
            if ask("status")["ready"]:
                return
        except OSError:
            time.sleep(0.1)
    sys.exit("chromedriver does not answer")


class Browser:
    def __init__(self, profile):
        options = {"args": CHROMIUM + [f"--user-data-dir={profile}"]}
        answer = ask("session", {"capabilities": {"alwaysMatch": {"goog:chromeOptions": options}}})
        self.session = "session/" + answer["sessionId"]

    def open(self, address):
        ask(self.session + "/url", {"url": address})

    def run(self, script, *args):
        return ask(self.session + "/execute/sync", {"script": script, "args": args})

    def devtools(self, command, **parameters):
        return ask(self.session + "/goog/cdp/execute", {"cmd": command, "params": parameters})

    def close(self):
        ask(self.session, method="DELETE")


@contextlib.contextmanager
def browser():
    with tempfile.TemporaryDirectory() as profile:
        driver = subprocess.Popen(["chromedriver", f"--port={PORT}"], stdout=subprocess.DEVNULL)
        try:
            wait_for_driver()
            with contextlib.closing(Browser(profile)) as opened:
                yield opened
        finally:
            driver.terminate()
            driver.wait()
