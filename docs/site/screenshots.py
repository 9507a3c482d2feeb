"""screenshots.py SITE FOLDER: pictures of some pages at the width of a phone and of a desk, by chromium. Fails
when a page is not laid out at that width or is wider than it."""

import base64
import json
import os
import subprocess
import sys
import tempfile
import time
import urllib.request

PAGES = ("index", "classVornJsonDbApi", "limits", "types")
WIDTHS = (390, 1280)
CHROMIUM = ["--headless", "--no-sandbox", "--disable-gpu", "--disable-quic", "--no-first-run",
            "--disable-background-networking", "--disable-component-update", "--disable-sync", "--hide-scrollbars"]
MEASURE = "return [document.documentElement.clientWidth, document.documentElement.scrollWidth]"
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
    wrong = 0
    for width in WIDTHS:
        devtools(session, "Emulation.setDeviceMetricsOverride", width=width, height=844, deviceScaleFactor=1,
                 mobile=width < 800)
        for page in PAGES:
            ask(f"session/{session}/url", {"url": f"file://{site}/{page}.html"})
            laid_out, needed = ask(f"session/{session}/execute/sync", {"script": MEASURE, "args": []})
            picture = devtools(session, "Page.captureScreenshot", captureBeyondViewport=True)["data"]
            path = os.path.join(folder, f"{page}-{width}.png")
            with open(path, "wb") as file:
                file.write(base64.b64decode(picture))
            fine = laid_out == width and needed <= width
            wrong += not fine
            print(f"{path}: laid out at {laid_out} px, needs {needed} px{'' if fine else ': WRONG'}")
    return wrong


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
