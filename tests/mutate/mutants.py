# SPDX-License-Identifier: Apache-2.0
"""Makes mutants: the product's sources with one thing changed."""

from __future__ import annotations

import difflib
import re
from collections.abc import Iterator
from dataclasses import dataclass

from mutate.source import Region, Source, Token, is_inside, unmutated_regions
from mutate.statements import swaps

# The sources are formatted: a binary operator has blanks around it; a template's bracket, a pointer's
# asterisk and a sign do not.
BINARY = {
    "<": ("<=", ">="), "<=": ("<", ">"), ">": (">=", "<="), ">=": (">", "<"),
    "==": ("!=",), "!=": ("==",), "&&": ("||",), "||": ("&&",),
    "+": ("-",), "-": ("+",), "*": ("+",), "/": ("*",), "%": ("/",),
    "<<": (">>",), ">>": ("<<",), "&": ("|",), "|": ("&",), "^": ("|",),
    "+=": ("-=",), "-=": ("+=",),
}
UNARY = {"!": "", "-": "", "++": "--", "--": "++"}
COMPARISONS = ("<", "<=", ">", ">=", "==", "!=", "&&", "||", "!")

# Names of constants that have a natural opposite. Another constant gets the next one of its file.
NAMES = {
    "true": ("false",), "false": ("true",),
    "O_RDONLY": ("O_WRONLY", "O_RDWR"), "O_WRONLY": ("O_RDONLY", "O_RDWR"),
    "SEEK_SET": ("SEEK_CUR", "SEEK_END"), "SEEK_END": ("SEEK_SET", "SEEK_CUR"),
    "PROT_READ": ("PROT_WRITE", "PROT_READ | PROT_WRITE"), "MAP_PRIVATE": ("MAP_SHARED",),
    "MAP_FAILED": ("nullptr",), "EINVAL": ("ENOENT",),
    "SUCCESS": ("FAILURE",), "FAILURE": ("SUCCESS",),
}
CONSTANT_NAME = re.compile(r"[A-Z][A-Z0-9]*_[A-Z0-9_]*|[A-Z]{3,}")

ROW = re.compile(r'[ \t]*(?:\{[^{}\n]*\}|"(?:\\.|[^"\\\n])*"|0x[0-9A-F]+(?:, 0x[0-9A-F]+)*),'
                 r'[ \t]*(?://[^\n]*)?\n')
# A file with at least this many rows is a catalogue: its rows are sampled.
CATALOGUE_ROWS = 20


# Path, occurrence, and the changed lines before and after: they identify a mutant.
Key = tuple[str, int, str, str]


@dataclass(frozen=True)
class Change:
    """Replaces the text from `start` to before `end`."""

    start: int
    end: int
    replacement: str


@dataclass(frozen=True)
class Mutant:
    """`before` and `after` are the changed lines, with blanks collapsed.

    `occurrence` distinguishes mutants that look alike. `is_row`: it changes a row of a catalogue.
    """

    path: str
    line: int
    before: str
    after: str
    occurrence: int
    is_row: bool
    text: str

    def key(self) -> Key:
        return self.path, self.occurrence, self.before, self.after

    def diff(self, original: str) -> str:
        return "".join(difflib.unified_diff(
            original.splitlines(keepends=True), self.text.splitlines(keepends=True),
            f"a/{self.path}", f"b/{self.path}"))


def other_numbers(text: str) -> Iterator[str]:
    digits = text.rstrip("uUlL")
    suffix = text[len(digits):]
    plain = digits.replace("'", "")
    if plain[:2] in ("0x", "0X"):
        width = len(plain) - 2
        value, limit = int(plain, 16), 16 ** width
        flips = [1 << 16] if width >= 8 else []
        others = [(value + 1) % limit, (value - 1) % limit, *(value ^ flip for flip in flips)]
        yield from dict.fromkeys(f"0x{other:0{width}X}{suffix}" for other in others)
    elif plain.isdigit():
        is_octal = len(plain) > 1 and plain[0] == "0"
        value = int(plain, 8 if is_octal else 10)
        for other in (value + 1, value - 1):
            if other >= 0:
                yield (f"0{other:o}" if is_octal else str(other)) + suffix


def other_texts(text: str) -> Iterator[str]:
    """Texts with another character in the middle, and with one character less."""
    units = re.findall(r"\\.|[^\\]", text[1:-1], re.DOTALL)
    if not units:
        yield '"?"'
        return
    middle = len(units) // 2
    units[middle], kept = "Y" if units[middle] == "X" else "X", units[middle]
    yield '"' + "".join(units) + '"'
    units[middle] = kept
    yield '"' + "".join(units[:-1]) + '"'


def enumerators(sources: list[Source]) -> dict[str, list[str]]:
    """The enumerators of each scoped enumeration, in order."""
    found: dict[str, list[str]] = {}
    for source in sources:
        tokens = source.tokens
        for index, token in enumerate(tokens[:-2]):
            if token.text == "enum" and tokens[index + 1].text == "class":
                at = index + 2
                while tokens[at].text != "{":
                    at += 1
                names = found.setdefault(tokens[index + 2].text, [])
                while tokens[at].text != "}":
                    at += 1
                    if tokens[at].kind == "word":
                        names.append(tokens[at].text)
    return found


def is_constant_use(tokens: tuple[Token, ...], index: int) -> bool:
    """Whether the token at `index` is a constant's name, and not its declaration."""
    token = tokens[index]
    if token.kind != "word" or not CONSTANT_NAME.fullmatch(token.text):
        return False
    before, after = tokens[index - 1], tokens[index + 1]
    is_declared = before.kind == "word" and before.text not in ("return", "case", "sizeof")
    return not is_declared and before.text not in (">", "*", "&") and after.text != "="


class Mutator:
    """All changes of one source."""

    def __init__(self, source: Source, enums: dict[str, list[str]]) -> None:
        self.source = source
        self.enums = enums
        self.constants = list(dict.fromkeys(
            token.text for index, token in enumerate(source.tokens)
            if is_constant_use(source.tokens, index)))

    def changes(self) -> Iterator[Change]:
        tokens = self.source.tokens
        for index, token in enumerate(tokens):
            others = self.others(index)
            yield from (Change(token.start, token.end, other) for other in others)
        yield from self.negations()
        for first, second in [*swaps(tokens), *self.row_pairs()]:
            text = self.source.text
            swapped = (text[second[0]:second[1]] + text[first[1]:second[0]] +
                       text[first[0]:first[1]])
            yield Change(first[0], second[1], swapped)

    def others(self, index: int) -> Iterator[str]:
        """The possible replacements of one token."""
        token = self.source.tokens[index]
        if token.kind == "number":
            yield from other_numbers(token.text)
        elif token.kind == "string":
            yield from other_texts(token.text)
        elif token.kind == "character":
            yield "'X'"
        elif token.kind == "operator":
            yield from self.other_operators(index)
        elif token.text in NAMES:
            yield from NAMES[token.text]
        else:
            yield from self.other_names(index)

    def other_operators(self, index: int) -> Iterator[str]:
        text, token = self.source.text, self.source.tokens[index]
        is_binary = text[token.start - 1].isspace() and text[token.end].isspace()
        is_output = token.text == "<<" and self.source.tokens[index + 1].kind != "number"
        if is_binary and not is_output:
            yield from BINARY.get(token.text, ())
        elif token.text in UNARY:
            yield UNARY[token.text]

    def other_names(self, index: int) -> Iterator[str]:
        tokens, name = self.source.tokens, self.source.tokens[index].text
        group = self.enums.get(tokens[index - 2].text, []) if tokens[index - 1].text == "::" else []
        if name not in group and is_constant_use(tokens, index):
            group = self.constants
        if name in group and len(group) > 1:
            yield group[(group.index(name) + 1) % len(group)]

    def negations(self) -> Iterator[Change]:
        """Negates conditions without a comparison that could itself be changed."""
        tokens = self.source.tokens
        for index, token in enumerate(tokens):
            if token.text not in ("if", "while") or tokens[index + 1].text != "(":
                continue
            depth, at, is_plain = 1, index + 2, True
            while depth:
                depth += {"(": 1, ")": -1}.get(tokens[at].text, 0)
                is_plain = is_plain and tokens[at].text not in (*COMPARISONS, "=")
                at += 1
            start, end = tokens[index + 1].end, tokens[at - 1].start
            if is_plain:
                yield Change(start, end, f"!({self.source.text[start:end]})")

    def rows(self) -> list[Region]:
        return [(match.start(), match.end()) for match in
                re.compile(f"^{ROW.pattern}", re.MULTILINE).finditer(self.source.text)]

    def row_pairs(self) -> Iterator[tuple[Region, Region]]:
        rows = self.rows()
        for first, second in zip(rows, rows[1:]):
            if first[1] == second[0]:
                yield first, second


def changed_lines(original: str, mutated: str) -> tuple[int, str, str]:
    """The first changed line's number, and the changed lines of both, with blanks collapsed."""
    old, new = original.split("\n"), mutated.split("\n")
    head = 0
    while old[head] == new[head]:
        head += 1
    tail = 0
    while old[-1 - tail] == new[-1 - tail]:
        tail += 1
    before, after = (" ".join(" ".join(lines[head:len(lines) - tail]).split())
                     for lines in (old, new))
    return head + 1, before, after


def make_mutants(sources: list[Source]) -> list[Mutant]:
    """Every mutant of every source, in the order of the files and of the places in them."""
    regions = unmutated_regions(sources)
    enums = enumerators(sources)
    made = []
    for source in sources:
        mutator = Mutator(source, enums)
        rows = mutator.rows()
        catalogue = rows if len(rows) >= CATALOGUE_ROWS else []
        seen: set[str] = set()
        counts: dict[tuple[str, str], int] = {}
        for change in sorted(mutator.changes(), key=lambda each: (each.start, each.end)):
            text = source.text[:change.start] + change.replacement + source.text[change.end:]
            if text == source.text or text in seen or is_inside(change.start, regions[source.path]):
                continue
            seen.add(text)
            line, before, after = changed_lines(source.text, text)
            counts[before, after] = counts.get((before, after), 0) + 1
            made.append(Mutant(source.path, line, before, after, counts[before, after],
                               is_inside(change.start, catalogue), text))
    return made
