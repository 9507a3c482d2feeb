# SPDX-FileCopyrightText: 2026 The vornjsondb authors
# SPDX-License-Identifier: MIT
"""All mutants of a source file: each one is a small change that keeps every line in its place."""

import hashlib
import re

from tokens import Source

OPERATORS = {
    "<": "<=", "<=": "<", ">": ">=", ">=": ">", "==": "!=", "!=": "==", "&&": "||", "||": "&&",
    "+": "-", "-": "+", "*": "+", "&": "|", "|": "&", "+=": "=", "++": "--", "--": "++",
}
SWAPPED_WORDS = {"true": "false", "false": "true"}
CHECKS = ("FAILED", "FAILED_AS", "GUARDED", "REPORT")
LABELS = ("case", "default", "public", "private", "protected")
DECLARATION = re.compile(
    r"(?:const|constexpr|static|inline|explicit|using|struct|class|enum|template|operator|auto)\b"
    r"|(?!return\b|throw\b)[A-Za-z_][\w:]*(?:<[^;=]*>)?[&*\s]+[A-Za-z_]\w*\s*[;=({]")
CONDITION_STARTS = {"(", ",", "=", "return", ";", "{", "}", "+=", "<<", "?", ":", "["}


class Mutant:
    def __init__(self, path, source, begin, end, new):
        line_begin = source.text.rfind("\n", 0, begin) + 1
        self.path = path
        self.line = source.text.count("\n", 0, begin) + 1
        self.column = begin - line_begin + 1
        lines = source.text.splitlines()
        self.code = lines[self.line - 1].split("  //")[0].strip()
        self.place = f"{path}, {scope_of(lines, self.line - 1)}"
        self.change = f"{shown(source.text[begin:end])} -> {shown(new)}"
        self.text = mutated(source, begin, end, new)
        self.key = hashlib.sha256((path + "\n" + self.text).encode()).hexdigest()
        self.is_guard = "GUARDED" in self.code


def scope_of(lines, index):
    """The name of the function, type or constant that contains the line."""
    for line in reversed(lines[:index + 1]):
        name = re.match(r"(?=[A-Za-z\[]).*?(?:(?:class|struct) (\w+)|(~?\w+)[({\[]|(\w+) =)", line)
        if name:
            return next(filter(None, name.groups()))
    return "-"


def shown(text):
    return " ".join(text.split()) or "nothing"


def mutated(source, begin, end, new):
    """The file's text with the change applied. The text that a failed check logs stays unchanged."""
    text = source.text
    for i, token in enumerate(source.tokens):
        if token.text not in ("FAILED", "REPORT"):
            continue
        opening, closing = source.tokens[i + 1], source.tokens[source.partner[i + 1]]
        if not (opening.end <= begin and end <= closing.begin):
            continue
        logged = " ".join(text[opening.end:closing.begin].split()).replace("\\", "\\\\").replace('"', '\\"')
        condition = text[opening.end:begin] + new + text[end:closing.begin]
        check = f'FAILED_AS({condition}, "{logged}")'
        if "REPORT" == token.text:
            check = f'if ({condition}) LOG_PLAIN("Failed [%s]", "{logged}")'
        return text[:token.begin] + check + text[closing.end:]
    return text[:begin] + new + text[end:]


def single_tokens(source, enumerators):
    """Operators and constants."""
    texts = [""] * 3 + [token.text for token in source.tokens]
    for i, token in enumerate(source.tokens):
        before, enumeration, previous = texts[i:i + 3]
        if token.text in ("++", "--") or (token.text in OPERATORS and source.is_spaced(i)):
            yield token.begin, token.end, OPERATORS[token.text]
        elif "!" == token.text:
            yield token.begin, token.end, ""
        elif "number" == token.kind:
            yield from numbers(token)
        elif "string" == token.kind:
            yield from strings(token)
        elif "char" == token.kind:
            yield token.begin, token.end, "'~'"
        elif token.text in SWAPPED_WORDS:
            yield token.begin, token.end, SWAPPED_WORDS[token.text]
        elif "::" == previous and "case" != before and (enumeration, token.text) in enumerators:
            yield token.begin, token.end, enumerators[enumeration, token.text]


def numbers(token):
    digits, suffix = re.fullmatch(r"(0[xX][0-9a-fA-F]+|\d+)([uUlL]*)", token.text).groups()
    value = int(digits, 0)
    yield token.begin, token.end, f"{value + 1}{suffix}"
    yield token.begin, token.end, f"{value - 1}{suffix}" if 0 < value else f"(-1{suffix})"


def strings(token):
    """The string emptied, and the string without its last character."""
    if '""' == token.text:
        yield token.begin, token.end, '"x"'
        return
    yield token.begin, token.end, '""'
    shorter = re.sub(r'(\\.|[^\\])"$', '"', token.text)
    if '""' != shorter:
        yield token.begin, token.end, shorter


def conditions(source):
    """Negated conditions of checks, if, while, for and "?"."""
    for i, token in enumerate(source.tokens):
        if token.text in CHECKS or token.text in ("if", "while"):
            begin, end = i + 2, source.partner[i + 1]
        elif "for" == token.text:
            ends = [j for j in range(i + 1, source.partner[i + 1]) if ";" == source.tokens[j].text]
            begin, end = (ends[0] + 1, ends[1]) if 2 == len(ends) else (0, 0)
        elif "?" == token.text:
            begin, end = i, i
            while source.tokens[begin - 1].text not in CONDITION_STARTS:
                begin = source.partner.get(begin - 1, begin - 1)
        else:
            continue
        if "FAILED_AS" == token.text:
            end = next(j for j in source.at_top(begin, end) if "," == source.tokens[j].text)
        if begin < end and not is_turned_otherwise(source, begin, end):
            first, last = source.tokens[begin].begin, source.tokens[end - 1].end
            yield first, last, f"!({source.text[first:last]})"


def is_turned_otherwise(source, begin, end):
    """Whether another mutant has the same effect, as for a single comparison, a lone "!" or a check. A
    condition that declares a variable cannot be negated."""
    texts = [source.tokens[j].text for j in source.at_top(begin, end)]
    if "const" == texts[0]:
        return True
    if "&&" in texts or "||" in texts:
        return False
    return texts[0] in ("!", *CHECKS) or "==" in texts or "!=" in texts


def statements(source):
    """Removed statements, except declarations."""
    begin = 0
    i = 0
    enclosing = []
    while i < len(source.tokens):
        token = source.tokens[i]
        if "{" == token.text:
            enclosing.append(begin)
            begin = i + 1
        elif "}" == token.text:
            # After a lambda or a list of values, the statement continues.
            begin = enclosing.pop()
            if source.text_of(i + 1) not in (",", ")", ";", "("):
                begin = i + 1
        elif token.text in ("if", "for", "while", "switch") and "(" == source.text_of(i + 1):
            i = source.partner[i + 1]
            begin = i + 1
        elif token.text in ("else", "do", "try"):
            begin = i + 1
        elif ":" == token.text and source.tokens[begin].text in LABELS:
            begin = i + 1
        elif ";" == token.text:
            first, last = source.tokens[begin].begin, token.end
            statement = source.text[first:last]
            is_declaration = DECLARATION.match(statement) or source.text_of(i - 1) in ("delete", "default")
            if begin < i and enclosing and not is_declaration:
                yield first, last, ";" + "\n" * statement.count("\n")
            begin = i + 1
        i += 1


def mutants(path, text, enumerators):
    source = Source(text)
    changes = [*single_tokens(source, enumerators), *conditions(source), *statements(source)]
    found = {mutant.key: mutant for mutant in (Mutant(path, source, *change) for change in changes)}
    return sorted(found.values(), key=lambda mutant: (mutant.line, mutant.column, mutant.change))


def enumerators(texts):
    """Maps each scoped enumerator to the next one in its enumeration."""
    following = {}
    for text in texts:
        for name, body in re.findall(r"enum class (\w+) \{([^}]*)\}", text):
            words = re.findall(r"\w+", body)
            following.update({(name, word): words[(i + 1) % len(words)] for i, word in enumerate(words)})
    return following
