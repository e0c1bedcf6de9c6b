# SPDX-License-Identifier: Apache-2.0
"""The product's sources as tokens, and which parts of them no mutant changes."""

from __future__ import annotations

import re
from collections.abc import Iterator
from dataclasses import dataclass
from pathlib import Path

TOKEN = re.compile(
    r"""(?P<comment>//[^\n]*|/\*.*?\*/)
      | (?P<directive>^[ \t]*\#(?:\\\n|[^\n])*)
      | (?P<string>"(?:\\.|[^"\\\n])*")
      | (?P<number>\d(?:'?[\w.])*)
      | (?P<character>'(?:\\.|[^'\\\n])+')
      | (?P<word>[A-Za-z_]\w*)
      | (?P<operator><<=|>>=|\.\.\.|::|->|\+\+|--|<<|>>|<=|>=|==|!=|&&|\|\||[-+*/%&|^]=|[^\s\w])
    """, re.VERBOSE | re.MULTILINE | re.DOTALL)

OPENING = {"(": ")", "{": "}", "[": "]"}

Region = tuple[int, int]


@dataclass(frozen=True)
class Token:
    """A piece of the text from `start` to before `end`."""

    kind: str
    text: str
    start: int
    end: int


@dataclass(frozen=True)
class Source:
    """`path` is relative to the project; `tokens` are without comments and directives."""

    path: str
    text: str
    tokens: tuple[Token, ...]


def tokenize(text: str) -> tuple[Token, ...]:
    found = (Token(str(match.lastgroup), match.group(), match.start(), match.end())
             for match in TOKEN.finditer(text))
    return tuple(token for token in found if token.kind not in ("comment", "directive"))


def read_sources(root: Path) -> list[Source]:
    """All of the product except what is built only for the unit's own system."""
    paths = [path for path in sorted((root / "src").rglob("*")) if path.suffix in (".cpp", ".h")]
    sources = []
    for path in paths:
        name = path.relative_to(root).as_posix()
        if not name.startswith("src/platform/qnx/"):
            text = path.read_text(encoding="utf-8")
            sources.append(Source(name, text, tokenize(text)))
    return sources


def matching(tokens: tuple[Token, ...], index: int) -> int:
    """The index of the bracket that closes the one at `index`."""
    depth = 0
    for at in range(index, len(tokens)):
        if tokens[at].text in OPENING:
            depth += 1
        elif tokens[at].text in OPENING.values():
            depth -= 1
            if depth == 0:
                return at
    raise ValueError(f"{tokens[index].text} at {tokens[index].start} is never closed")


def statement_end(tokens: tuple[Token, ...], index: int) -> int:
    """The index of the semicolon that ends the statement at `index`, whatever brackets it contains."""
    while tokens[index].text != ";":
        index = matching(tokens, index) if tokens[index].text in OPENING else index
        index += 1
    return index


@dataclass(frozen=True)
class Definition:
    """A constexpr function, or a constexpr variable of a source file."""

    path: str
    name: str
    region: Region


def definitions(source: Source) -> Iterator[Definition]:
    tokens = source.tokens
    for index, token in enumerate(tokens):
        if token.text != "constexpr":
            continue
        at = index + 1
        while tokens[at].text not in ("(", "=", "{", "[", ";"):
            at += 1
        name, start = tokens[at - 1].text, token.start
        if tokens[at].text == "(":
            at = matching(tokens, at) + 1
            while tokens[at].text not in ("{", ";"):
                at += 1
            end = matching(tokens, at) if tokens[at].text == "{" else at
            yield Definition(source.path, name, (start, tokens[end].end))
        elif source.path.endswith(".cpp"):
            yield Definition(source.path, name, (start, tokens[statement_end(tokens, at)].end))


def is_inside(position: int, regions: list[Region]) -> bool:
    return any(start <= position < end for start, end in regions)


def unmutated_regions(sources: list[Source]) -> dict[str, list[Region]]:
    """By path: the static assertions, and what exists only for them.

    The compiler checks assertions, so changing one says nothing about the tests.
    """
    regions: dict[str, list[Region]] = {source.path: [] for source in sources}
    for source in sources:
        for index, token in enumerate(source.tokens):
            if token.text == "static_assert":
                end = source.tokens[statement_end(source.tokens, index)].end
                regions[source.path].append((token.start, end))

    # A name that is in no header belongs to its file: another file may have the same name.
    uses: dict[str, list[tuple[str, int]]] = {}
    shared: set[str] = set()
    for source in sources:
        for token in source.tokens:
            if token.kind == "word":
                uses.setdefault(token.text, []).append((source.path, token.start))
                if source.path.endswith(".h"):
                    shared.add(token.text)

    candidates = [definition for source in sources for definition in definitions(source)]
    found = True
    while found:
        found = False
        for definition in list(candidates):
            others = [(path, at) for path, at in uses[definition.name]
                      if (definition.name in shared and path != definition.path) or
                      (path == definition.path and not is_inside(at, [definition.region]))]
            if others and all(is_inside(at, regions[path]) for path, at in others):
                regions[definition.path].append(definition.region)
                candidates.remove(definition)
                found = True
    return regions
