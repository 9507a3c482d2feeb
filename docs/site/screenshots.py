# SPDX-License-Identifier: MIT
"""screenshots.py SITE FOLDER: pictures of some pages at the width of a phone and of a desk, by chromium, from the
top on. Fails when any page of the site is not laid out at that width or is wider than it."""

import base64
import glob
import json
import os
import subprocess
import sys
import tempfile
import time
import urllib.request

PAGES = ("index", "classVornJsonDbApi", "limits", "types")
WIDTHS = (390, 1280)
HIGHEST = 6000
CHROMIUM = ["--headless", "--no-sandbox", "--disable-gpu", "--disable-quic", "--no-first-run",
            "--disable-background-networking", "--disable-component-update", "--disable-sync", "--hide-scrollbars"]
MEASURE = "const all = document.documentElement; return [all.clientWidth, all.scrollWidth, all.scrollHeight]"
PORT = 9595


def ask(path, values=None):
    data = None if values is None else json.dumps(values).encode()
    request = urllib.request.Request(f"http://127.0.0.1:{PORT}/{path}", data, {"Content-Type": "application/json"})
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


def devtools(session, command, **parameters):
    return ask(f"session/{session}/goog/cdp/execute", {"cmd": command, "params": parameters})


def pictures(session, site, folder):
    pages = sorted(os.path.relpath(path, site)[:-5] for path in glob.glob(site + "/*.html"))
    wrong = 0
    for width in WIDTHS:
        devtools(session, "Emulation.setDeviceMetricsOverride", width=width, height=844, deviceScaleFactor=1,
                 mobile=width < 800)
        for page in pages:
            ask(f"session/{session}/url", {"url": f"file://{site}/{page}.html"})
            laid_out, needed, height = ask(f"session/{session}/execute/sync", {"script": MEASURE, "args": []})
            if laid_out != width or needed > width:
                print(f"{page} at {width} px: laid out at {laid_out} px, needs {needed} px")
                wrong += 1
            if page in PAGES:
                clip = {"x": 0, "y": 0, "width": width, "height": min(height, HIGHEST), "scale": 1}
                picture = devtools(session, "Page.captureScreenshot", captureBeyondViewport=True, clip=clip)["data"]
                with open(os.path.join(folder, f"{page}-{width}.png"), "wb") as file:
                    file.write(base64.b64decode(picture))
    print(f"{len(pages)} pages at {' and '.join(map(str, WIDTHS))} px, {wrong} wrong; pictures in {folder}")
    return wrong or not pages


def main():
    site, folder = (os.path.abspath(path) for path in sys.argv[1:])
    os.makedirs(folder, exist_ok=True)
    with tempfile.TemporaryDirectory() as profile:
        driver = subprocess.Popen(["chromedriver", f"--port={PORT}"], stdout=subprocess.DEVNULL)
        try:
            wait_for_driver()
            options = {"args": CHROMIUM + [f"--user-data-dir={profile}"]}
            session = ask("session", {"capabilities": {"alwaysMatch": {"goog:chromeOptions": options}}})["sessionId"]
            try:
                wrong = pictures(session, site, folder)
            finally:
                urllib.request.urlopen(urllib.request.Request(
                    f"http://127.0.0.1:{PORT}/session/{session}", method="DELETE"), timeout=60)
        finally:
            driver.terminate()
            driver.wait()
    sys.exit(1 if wrong else 0)


main()
