# SPDX-FileCopyrightText: 2026 The vornjsondb authors
# SPDX-License-Identifier: MIT
"""check.py SITE: every link and every picture of the site leads to a file and an anchor that are there, nothing is
fetched from elsewhere, and no mark of Markdown is left in a text."""

import glob
import html.parser
import os
import re
import sys
import urllib.parse

LINKS = ("href", "src", "data")
CODE = re.compile(r"<(code|pre|script)\b.*?</\1>|<div class=\"fragment\">.*?<!-- fragment -->", re.DOTALL)
MARK = re.compile(r"(?<!char )\*\*.{,20}|`.{,20}|\]\(.{,20}|[@\\]\w+only.{,20}")


class Page(html.parser.HTMLParser):
    def __init__(self, path):
        super().__init__()
        self.anchors = set()
        self.links = []
        with open(path, encoding="utf-8") as file:
            text = file.read()
        self.feed(text)
        self.marks = MARK.findall(CODE.sub("", text))

    def handle_starttag(self, tag, attrs):
        for name, value in attrs:
            if name == "id" or (name == "name" and tag == "a"):
                self.anchors.add(value)
            elif name in LINKS and value:
                self.links.append((tag, value))


def links_of_text(path):
    """Those of a script of the search, and of a stylesheet."""
    with open(path, encoding="utf-8") as file:
        text = file.read()
    pattern = r"""['"](\.\./[^'"]+\.html[^'"]*)['"]""" if path.endswith(".js") else r"""url\(['"]?([^'")]+)['"]?\)"""
    return [("text", link) for link in re.findall(pattern, text)]


def main():
    site = os.path.abspath(sys.argv[1])
    pages = {path: Page(path) for path in glob.glob(site + "/**/*.html", recursive=True)}
    links = {path: page.links for path, page in pages.items()}
    for path in glob.glob(site + "/**/*.js", recursive=True) + glob.glob(site + "/**/*.css", recursive=True):
        links[path] = links_of_text(path)
    broken = [f"{os.path.relpath(path, site)}: {mark}" for path, page in pages.items() for mark in page.marks]
    for path, found in links.items():
        for tag, link in found:
            parts = urllib.parse.urlsplit(link)
            if parts.scheme:
                fine = tag == "a" or parts.scheme in ("data", "javascript")
            else:
                target = os.path.join(os.path.dirname(path), urllib.parse.unquote(parts.path)) if parts.path else path
                target = os.path.normpath(target)
                fine = os.path.isfile(target) and target.startswith(site + "/")
                if fine and parts.fragment and target in pages:
                    fine = urllib.parse.unquote(parts.fragment) in pages[target].anchors
            if not fine:
                broken.append(f"{os.path.relpath(path, site)}: {link}")
    print("\n".join(sorted(set(broken))), end="\n" if broken else "")
    count = sum(len(found) for found in links.values())
    print(f"{count:,} links of {len(pages)} pages, {len(set(broken))} broken")
    sys.exit(1 if broken or not pages or not count else 0)


main()
