# SPDX-FileCopyrightText: 2026 The vornjsondb authors
# SPDX-License-Identifier: MIT
"""pages.py FOLDER SITE VERSION MANDOC: writes FOLDER/mkdocs.yml and, in FOLDER/pages, the guides and the examples as
MkDocs reads them; the site will be in SITE.

A forge shows a guide as it is. On the site every heading has the name that a forge gives it, a link whose text is a
file name shows the title of that page or section instead, and a file that is linked and is no guide, such as an
example, becomes a page of its own, and so does the manual page of the program, which MANDOC converts."""

import json
import os
import re
import shutil
import subprocess
import sys

PROJECT = os.path.abspath(os.path.join(os.path.dirname(__file__), "..", ".."))
REFERENCE = "reference"
HEADERS = {"include/VornJsonDbApi.h": "VornJsonDbApi_8h.html", "include/VornJsonTable.h": "VornJsonTable_8h.html"}
# In reading order.
NAVIGATION = {
    "": ["README.md", "docs/requests.md", "docs/front.md", "docs/types.md", "docs/limits.md", "docs/log.md"],
    "Running it": ["docs/changing-a-table.md", "docs/large-results.md", "docs/backup.md", "docs/operating.md",
                   "docs/threads-and-processes.md", "docs/speed.md", "docs/performance.md", "docs/reliability.md",
                   "SECURITY.md", "docs/upgrading.md"],
    "Inside": ["docs/design.md", "CONTRIBUTING.md", "CHANGELOG.md"],
    "Appendix": ["contrib/scale-out/scale-out.md"],
}
EXAMPLES = "examples/README.md"
PROGRAM = "man/vornjsondb.1"
LANGUAGES = {".cpp": "cpp", ".h": "cpp", ".sh": "sh", ".json": "json", ".cmake": "cmake"}
FENCE = re.compile(r"^(```.*?^```$)", re.MULTILINE | re.DOTALL)
CODE = re.compile(r"(?<!`)(`+)(?!`)(.+?)(?<!`)\1(?!`)", re.DOTALL)
HEADING = re.compile(r"^(#+) (.+)$", re.MULTILINE)
LINK = re.compile(r"(!?)\[([^\]]*)\]\(([^)\s]+)\)")

CONFIG = {
    "site_name": "vornjsondb",
    "use_directory_urls": False,  # the pages can be opened as files
    "docs_dir": "pages",
    "theme": {
        "name": "material",
        "custom_dir": os.path.join(PROJECT, "docs/site/theme"),
        "font": False,  # nothing is fetched from elsewhere
        "features": ["navigation.top", "navigation.sections", "search.highlight"],
        "palette": [
            {"media": "(prefers-color-scheme: light)", "scheme": "default",
             "toggle": {"icon": "material/brightness-4", "name": "Dark colours"}},
            {"media": "(prefers-color-scheme: dark)", "scheme": "slate",
             "toggle": {"icon": "material/brightness-7", "name": "Light colours"}},
        ],
    },
    "extra": {"generator": False},
    "extra_css": ["style.css"],
    # Words end at the colons of C++ and at the dots of file names, too.
    "plugins": [{"search": {"lang": "en", "separator": r"[\s\-,:.;!=\[\]{}()\"'`/]+"}}],
    "markdown_extensions": ["attr_list", "tables", {"toc": {"permalink": True}}, "pymdownx.highlight",
                            "pymdownx.superfences"],
}


def read(path):
    with open(os.path.join(PROJECT, path), encoding="utf-8") as file:
        return file.read()


def title_of(path):
    return HEADING.search(FENCE.sub("", read(path)))[2]


def anchor_of(heading):
    return re.sub(r"[^\w\- ]", "", heading.lower()).replace(" ", "-")


def section_of(path, anchor):
    """The heading that has this anchor."""
    for match in HEADING.finditer(FENCE.sub("", read(path))):
        if anchor_of(match[2]) == anchor:
            return match[2]
    sys.exit(f"{path} has no section {anchor}")


def is_file_name(text):
    return bool(re.fullmatch(r"`?[\w./-]+\.md`?|CHANGELOG", text))


def page_of(path):
    """The Markdown file of the page."""
    if path == "README.md":
        return "index.md"
    if path == EXAMPLES:
        return "examples.md"
    if path == PROGRAM:
        return "program.md"
    if path.endswith(".md"):
        return os.path.basename(path).lower()
    return "files/" + re.sub(r"[^\w.]", "_", path) + ".md"


class Guide:
    def __init__(self, path):
        self.path = path
        self.page = page_of(path)
        self.files = []
        self.pictures = []

    def to(self, target):
        return os.path.relpath(target, os.path.dirname(self.page))

    def link(self, match):
        image, text, target = match.groups()
        if "://" in target:
            return match.group()
        path, _, anchor = target.partition("#")
        path = os.path.normpath(os.path.join(os.path.dirname(self.path), path)) if path else self.path
        if not os.path.isfile(os.path.join(PROJECT, path)):
            sys.exit(f"{self.path}: no such file: {target}")
        if image:
            self.pictures.append(path)
            return f"![{text}]({self.to('pictures/' + os.path.basename(path))})"
        if path in HEADERS:
            return f"[{text}]({self.to(REFERENCE + '/' + HEADERS[path])})"
        if not path.endswith(".md") and path != PROGRAM:
            self.files.append(path)
        elif is_file_name(text):
            text = section_of(path, anchor) if anchor else title_of(path)
        return f"[{text}]({self.to(page_of(path))}{'#' + anchor if anchor else ''})"

    def text(self, text):
        """The text between two blocks of code. Code is put in last, so that nothing changes it."""
        spans = []

        def keep(match):
            spans.append(match[0].replace("\\|", "|"))
            return f"\0{len(spans) - 1}\0"

        text = HEADING.sub(lambda match: f"{match[0]} {{#{anchor_of(match[2])}}}", text)
        text = CODE.sub(keep, text)
        # A link's text may be code.
        text = LINK.sub(lambda match: self.link(match), text)
        return re.sub("\0(\\d+)\0", lambda match: spans[int(match[1])], text)

    def write(self, folder):
        parts = FENCE.split(read(self.path))
        write(folder, self.page, "".join(part if part.startswith("```") else self.text(part) for part in parts))
        for picture in self.pictures:
            os.makedirs(os.path.join(folder, "pictures"), exist_ok=True)
            shutil.copy(os.path.join(PROJECT, picture), os.path.join(folder, "pictures"))


def write(folder, name, text):
    path = os.path.join(folder, name)
    os.makedirs(os.path.dirname(path), exist_ok=True)
    with open(path, "w", encoding="utf-8") as file:
        file.write(text)


def block(path):
    return f"```{LANGUAGES.get(os.path.splitext(path)[1], 'text')}\n{read(path).rstrip()}\n```\n"


def output_of(path):
    """What an example prints, if it is one."""
    name = os.path.splitext(os.path.basename(path))[0]
    expected = f"examples/expected/{name}.txt"
    return expected if os.path.dirname(path) == "examples" and os.path.isfile(os.path.join(PROJECT, expected)) else None


def write_file_page(folder, path, linked_in):
    links = ", ".join(f"[{title_of(guide)}](../{page_of(guide)})" for guide in linked_in)
    text = f"# {path}\n\nSee {links}.\n\n{block(path)}"
    output = output_of(path)
    if output:
        text += f"\n## What it prints\n\n{block(output)}"
    write(folder, page_of(path), text)


def write_program_page(folder, mandoc):
    """With the headings in Markdown, for the table of contents and the search."""
    html = subprocess.run([mandoc, "-Thtml", "-O", "fragment", os.path.join(PROJECT, PROGRAM)],
                          check=True, stdout=subprocess.PIPE, encoding="utf-8").stdout
    html = re.sub(r'<table class="head">.*?<div class="manual-text">|</div>\s*<table class="foot">.*|</?section\b.*?>'
                  r'|</?a\b.*?>| (id|class)=".*?"', "", html, flags=re.DOTALL)
    html = re.sub("<pre>(.*?)</pre>", r"<pre><code>\1</code></pre>", html, flags=re.DOTALL)

    def heading(match):
        text = " ".join(re.sub("<.*?>", "", match[2]).split())
        return f"\n\n{'##' if match[1] == '1' else '###'} {text.capitalize()} {{#{anchor_of(text)}}}\n\n"

    html = re.sub(r"<h([12])>(.*?)</h\1>", heading, html, flags=re.DOTALL)
    write(folder, page_of(PROGRAM), f"# The program vornjsondb\n\n{html}")


def navigation(examples):
    entries = []
    for section, paths in NAVIGATION.items():
        pages = [{("Start" if path == "README.md" else title_of(path)): page_of(path)} for path in paths]
        entries += [{section: pages}] if section else pages
        if not section:
            entries.append({"Examples": [{"Overview": page_of(EXAMPLES)}] +
                            [{os.path.basename(path): page_of(path)} for path in examples]})
            entries.append({"The program vornjsondb": page_of(PROGRAM)})
            entries.append({"Reference": "reference.md"})
    return entries


def main():
    folder, site, version, mandoc = sys.argv[1:]
    pages = os.path.join(folder, "pages")
    linked_in = {}
    for path in [path for paths in NAVIGATION.values() for path in paths] + [EXAMPLES]:
        guide = Guide(path)
        guide.write(pages)
        for file in sorted(set(guide.files)):
            linked_in.setdefault(file, []).append(path)
    for path, guides in linked_in.items():
        write_file_page(pages, path, guides)
    write_program_page(pages, mandoc)
    reference = Guide("docs/site/reference.md")
    reference.write(pages)
    shutil.copy(os.path.join(PROJECT, "docs/site/style.css"), pages)
    examples = sorted(path for path in linked_in if os.path.dirname(path) == "examples" and path.endswith(".cpp"))
    config = dict(CONFIG, site_dir=site, nav=navigation(examples), site_description=f"vornjsondb {version}")
    write(folder, "mkdocs.yml", json.dumps(config, indent=1))


main()
