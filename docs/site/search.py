# SPDX-FileCopyrightText: 2026 The vornjsondb authors
# SPDX-License-Identifier: MIT
"""search.py SITE: searches the site for each term of search_terms.json; the section that explains it has to be the
first or the second one of the list. Serves the site on this machine, since a page that was opened as a file cannot search."""

import contextlib
import functools
import http.server
import json
import os
import sys
import threading
import time
import urllib.parse

from browser import browser

RESULTS = """const links = [...document.querySelectorAll("a.md-search-result__link")];
return [document.querySelector(".md-search-result__meta").innerText, links.map(link => link.getAttribute("href"))]"""


class Quiet(http.server.SimpleHTTPRequestHandler):
    def log_message(self, *args):
        pass


@contextlib.contextmanager
def served(site):
    server = http.server.ThreadingHTTPServer(("127.0.0.1", 0), functools.partial(Quiet, directory=site))
    threading.Thread(target=server.serve_forever).start()
    try:
        yield f"http://127.0.0.1:{server.server_port}"
    finally:
        server.shutdown()


def sections_found(window, address, term):
    """As PAGE.html#ANCHOR, in the order of the list."""
    window.open(f"{address}/index.html?q={urllib.parse.quote(term)}")
    for _ in range(100):
        text, links = window.run(RESULTS)
        if links or text.startswith("No matching"):
            found = [urllib.parse.urlsplit(link) for link in links]
            return [f"{os.path.basename(link.path)}#{link.fragment}" for link in found if link.fragment]
        time.sleep(0.1)
    sys.exit(f"the search for {term!r} does not end")


def main():
    with open(os.path.join(os.path.dirname(__file__), "search_terms.json"), encoding="utf-8") as file:
        terms = {term: section for section, terms in json.load(file).items() for term in terms}
    wrong = 0
    with served(sys.argv[1]) as address, browser() as window:
        for term, section in terms.items():
            found = sections_found(window, address, term)
            if section not in found[:2]:
                print(f"{term!r} finds {found[:4]}, not {section}")
                wrong += 1
    print(f"{len(terms)} searches, {wrong} without their section among the first two")
    sys.exit(1 if wrong or not terms else 0)


main()
