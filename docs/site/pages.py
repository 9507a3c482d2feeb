# SPDX-License-Identifier: MIT
"""pages.py FOLDER SITE: writes the guides into FOLDER as Doxygen has to read them, and their pictures into SITE.
pages.py HEADER: prints the header as Doxygen has to read it.

What is plain Markdown on a forge is not quite that to Doxygen: it takes "%s" and quotes in code for marks of its
own, names headings otherwise and knows no link to a heading of another page. So code is escaped, every heading
gets the name that a forge gives it, and links lead to the pages of the site. A file that is linked and is no
guide, such as an example, becomes a page of its own."""

import glob
import html
import os
import re
import shutil
import sys

PROJECT = os.path.abspath(os.path.join(os.path.dirname(__file__), "..", ".."))
HEADER = "include/VornJsonDbApi.h"
FENCE = re.compile(r"^(```.*?^```$)", re.MULTILINE | re.DOTALL)
CODE = re.compile(r"(?<!`)(`+)(?!`)(.+?)(?<!`)\1(?!`)", re.DOTALL)
HEADING = re.compile(r"^(#+) (.+)$", re.MULTILINE)
LINK = re.compile(r"(!?)\[([^\]]*)\]\(([^)\s]+)\)")


def guides():
    first = ["README.md"]
    last = ["contrib/scale-out/scale-out.md", "examples/README.md", "SECURITY.md", "CONTRIBUTING.md", "CHANGELOG.md"]
    return first + sorted(os.path.relpath(path, PROJECT) for path in glob.glob(PROJECT + "/docs/*.md")) + last


def page_of(path):
    """The name of the page without its ".html"."""
    if path == "README.md":
        return "index"
    if path == HEADER:
        return "VornJsonDbApi_8h"
    if path == "examples/README.md":
        return "examples_list"
    if path.endswith(".md"):
        return os.path.basename(path)[:-3].lower()
    return re.sub(r"\W", "_", path)


def anchor_of(heading):
    return re.sub(r"[^\w\- ]", "", heading.lower()).replace(" ", "-")


def code(text):
    """What Doxygen shows unchanged."""
    text = re.sub(r"[\\@#$%*_`|\[\]!]|::|--", r"\\\g<0>", html.escape(text, quote=False))
    text = text.replace('"', "&quot;").replace("'", "&apos;").replace("  ", " &nbsp;")
    return f"<code>{text}</code>"


def read(path):
    with open(os.path.join(PROJECT, path), encoding="utf-8") as file:
        return file.read()


def header(path):
    """Line for line, with the code in its comments escaped; "@p name:" would take the colon for a part of the name."""
    text = re.sub(r"^ *///(?! {5}).*$", lambda line: CODE.sub(lambda match: code(match[2]), line[0]), read(path),
                  flags=re.MULTILINE)
    return re.sub(r"@p((?: |\n *///)+)(\w+)", r"\1<code>\2</code>", text)


class Guide:
    def __init__(self, path):
        self.path = path
        self.title = HEADING.search(read(path))[2]
        self.files = []
        self.pictures = []

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
            return f'@htmlonly<img src="{os.path.basename(path)}" alt="{html.escape(text)}"/>@endhtmlonly'
        if not path.endswith(".md") and path != HEADER:
            self.files.append(path)
        line = re.fullmatch(r"L(\d+)", anchor)
        anchor = f"l{int(line[1]):05}" if line else anchor
        return f"[{text}]({page_of(path)}.html{'#' + anchor if anchor else ''})"

    def heading(self, match):
        marks, text = match.groups()
        if marks != "#":
            return f"\1{anchor_of(text)}\1\n\n{match.group()}"
        if self.path == "README.md":
            return f"# {text} {{#mainpage}}"
        return f"# {text} {{#{page_of(self.path)}}}\n\n[TOC]"

    def text(self, text):
        """The text between two blocks of code. Code and anchors are put in last, so that nothing changes them."""
        spans = []

        def keep(match):
            spans.append(code(match[2].replace("\\|", "|")))
            return f"\0{len(spans) - 1}\0"

        text = CODE.sub(keep, HEADING.sub(self.heading, text))
        text = re.sub(r"[%@\\](?=\w)", r"\\\g<0>", text)
        text = re.sub(r"\*\*([^*]+)\*\*", r"<b>\1</b>", text)
        text = LINK.sub(self.link, text)
        text = re.sub("\1(.+?)\1", r'@htmlonly<a id="\1"></a>@endhtmlonly', text)
        return re.sub("\0(\\d+)\0", lambda match: spans[int(match[1])], text)

    def page(self):
        parts = FENCE.split(read(self.path))
        return "".join(part if part.startswith("```") else self.text(part) for part in parts)


def source_page(path, linked_in):
    command = "include{lineno}" if path.endswith((".cpp", ".h")) else "verbinclude"
    guides = ", ".join(f"[{guide.title}]({page_of(guide.path)}.html)" for guide in linked_in)
    return f"/**\n@page {page_of(path)} {path}\nSee {guides}.\n\n@{command} {os.path.join(PROJECT, path)}\n*/\n"


def write(folder, name, text):
    with open(os.path.join(folder, name), "w", encoding="utf-8") as file:
        file.write(text)


def main():
    if len(sys.argv) == 2:
        print(header(sys.argv[1]), end="")
        return
    folder, site = sys.argv[1:]
    linked_in = {}
    for number, path in enumerate(guides()):
        guide = Guide(path)
        write(folder, f"{number:02}_{page_of(path)}.md", guide.page())
        for file in sorted(set(guide.files)):
            linked_in.setdefault(file, []).append(guide)
        for picture in guide.pictures:
            shutil.copy(os.path.join(PROJECT, picture), site)
    subpages = "".join(f"- @subpage {page_of(path)}\n" for path in sorted(linked_in))
    write(folder, "sources.md", f"# Files shown here {{#sources}}\n\n{subpages}")
    for path, guides_of_it in linked_in.items():
        write(folder, page_of(path) + ".dox", source_page(path, guides_of_it))


main()
