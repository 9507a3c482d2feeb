# SPDX-FileCopyrightText: 2026 The vornjsondb authors
# SPDX-License-Identifier: MIT
"""Splits C++ source text into tokens and matches the brackets."""

import re

TOKEN = re.compile(r"""
    (?P<comment>//[^\n]*|/\*.*?\*/)
  | (?P<directive>(?m:^)[ \t]*\#(?:[^\n\\]|\\.|\\\n)*)
  | (?P<attribute>__attribute__\(\((?:[^()]|\([^()]*\))*\)\))
  | (?P<string>"(?:[^"\\\n]|\\.)*")
  | (?P<char>'(?:[^'\\\n]|\\.)*')
  | (?P<number>\d[\w.]*)
  | (?P<word>[A-Za-z_]\w*)
  | (?P<sign>->|\+\+|--|<<|>>|<=|>=|==|!=|&&|\|\||[-+*/%&|^]=|::|\.\.\.|[^\s\w])
""", re.VERBOSE | re.DOTALL)

CLOSING = {"(": ")", "[": "]", "{": "}"}


class Token:
    def __init__(self, match):
        self.kind = match.lastgroup
        self.text = match.group()
        self.begin = match.start()
        self.end = match.end()


class Source:
    """A file's text, its tokens (without comments, directives and attributes), and each bracket's partner."""

    def __init__(self, text):
        self.text = text
        found = [Token(match) for match in TOKEN.finditer(text)]
        self.tokens = [token for token in found if token.kind not in ("comment", "directive", "attribute")]
        self.partner = {}
        opened = []
        for i, token in enumerate(self.tokens):
            if token.text in CLOSING:
                opened.append(i)
            elif token.text in CLOSING.values():
                self.partner[opened[-1]] = i
                self.partner[i] = opened.pop()

    def text_of(self, i):
        return self.tokens[i].text if i < len(self.tokens) else ""

    def at_top(self, begin, end):
        """The tokens between two others that are not inside further brackets."""
        i = begin
        while i < end:
            yield i
            i = self.partner.get(i, i) + 1

    def is_spaced(self, i):
        """Whether there are spaces on both sides; the formatter puts them only around binary operators."""
        token = self.tokens[i]
        return self.text[token.begin - 1].isspace() and self.text[token.end].isspace()
