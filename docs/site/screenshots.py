# SPDX-FileCopyrightText: 2026 The vornjsondb authors
# SPDX-License-Identifier: MIT
"""screenshots.py SITE FOLDER: pictures of the main pages at the width of a phone and of a desk, in light and in dark
colours, from the top on. Fails if any page of the site is wider than the window, or has a block of code that is cut."""

import base64
import glob
import os
import sys

from browser import browser

PAGES = ("index", "requests", "front", "types", "limits", "log", "performance", "operating", "design",
         "reference/classVornJsonDbApi")
WIDTHS = (400, 1280)
COLOURS = ("light", "dark")
HIGHEST = 6000
MEASURE = """const all = document.documentElement;
const cut = [...document.querySelectorAll("pre, pre > code, div.fragment")].filter(e => e.scrollWidth > e.clientWidth + 1);
const back = getComputedStyle(document.body).backgroundColor.match(/\\d+/g).slice(0, 3).map(Number);
return [all.clientWidth, all.scrollWidth, all.scrollHeight, cut.length && cut[0].innerText.slice(0, 60),
        Math.max(...back) < 128 ? "dark" : "light"]"""


def check(window, page, width, colour):
    laid_out, needed, height, cut, colours = window.run(MEASURE)
    faults = [f"laid out at {laid_out} px"] if laid_out != width else []
    faults += [f"needs {needed} px"] if needed > width else []
    faults += [f"cuts the code {cut!r}"] if cut else []
    faults += [f"is {colours}"] if colours != colour else []
    for fault in faults:
        print(f"{page} at {width} px in {colour}: {fault}")
    return height, len(faults)


def take(window, width, height, path):
    clip = {"x": 0, "y": 0, "width": width, "height": min(height, HIGHEST), "scale": 1}
    picture = window.devtools("Page.captureScreenshot", captureBeyondViewport=True, clip=clip)["data"]
    with open(path, "wb") as file:
        file.write(base64.b64decode(picture))


def look_at(window, site, folder, pages, width, colour):
    wrong = 0
    window.devtools("Emulation.setDeviceMetricsOverride", width=width, height=844, deviceScaleFactor=1,
                    mobile=width < 800)
    for page in pages:
        window.open(f"file://{site}/{page}.html")
        height, faults = check(window, page, width, colour)
        wrong += faults
        if page in PAGES:
            take(window, width, height, f"{folder}/{page.replace('/', '_')}-{width}-{colour}.png")
    return wrong


def main():
    site, folder = (os.path.abspath(path) for path in sys.argv[1:])
    os.makedirs(folder, exist_ok=True)
    pages = sorted(os.path.relpath(path, site)[:-5] for path in glob.glob(site + "/**/*.html", recursive=True)
                   if not path.startswith(site + "/reference/search/"))
    wrong = len(set(PAGES) - set(pages))
    for colour in COLOURS:
        with browser() as window:  # a new one: a page keeps the colours of the last visit
            window.devtools("Emulation.setEmulatedMedia", features=[{"name": "prefers-color-scheme", "value": colour}])
            for width in WIDTHS:
                wrong += look_at(window, site, folder, pages, width, colour)
    print(f"{len(pages)} pages at {' and '.join(map(str, WIDTHS))} px in {' and '.join(COLOURS)}, {wrong} wrong; "
          f"pictures in {folder}")
    sys.exit(1 if wrong or not pages else 0)


main()
