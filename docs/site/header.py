# SPDX-FileCopyrightText: 2026 The vornjsondb authors
# SPDX-License-Identifier: MIT
"""header.py HEADER: prints the header, line for line, as Doxygen has to read it: it takes "%s" and quotes in the code
of a comment for marks of its own, and the colon of "@p name:" for a part of the name."""

import html
import re
import sys

CODE = re.compile(r"(?<!`)(`+)(?!`)(.+?)(?<!`)\1(?!`)")


def code(match):
    text = re.sub(r"[\\@#$%*_`|\[\]!]|::|--", r"\\\g<0>", html.escape(match[2], quote=False))
    return "<code>" + text.replace('"', "&quot;").replace("'", "&apos;").replace("  ", " &nbsp;") + "</code>"


with open(sys.argv[1], encoding="utf-8") as file:
    header = file.read()
header = re.sub(r"^ *///(?! {5}).*$", lambda line: CODE.sub(code, line[0]), header, flags=re.MULTILINE)
print(re.sub(r"@p((?: |\n *///)+)(\w+)", r"\1<code>\2</code>", header), end="")
