# SPDX-License-Identifier: Apache-2.0
"""Finds pairs of adjacent statements, and of adjacent data members, that can be swapped."""

from __future__ import annotations

import re
from collections.abc import Iterator

from mutate.source import Region, Token, matching

# The order of two of these never matters.
QUIET_DECLARATION = re.compile(
    r"(?:(?:static|const|constexpr|\[\[ maybe_unused \]\]) )*"
    r"(?:\w+ :: )*\w+(?: < [^()]* >)?(?: [*&])?(?: const)? \w+(?: \[ (?:\w+ )?\])?"
    r"(?: = -? ?[\w.']+| = \"[^\"]*\"| = '[^']*'| \{ \}| ) ?;")

LABELS = ("case", "default", "public", "private", "protected")


def scope_kind(tokens: tuple[Token, ...], index: int, start: int) -> str:
    """What the brace at `index` opens, in the statement that began at `start`."""
    words = [token.text for token in tokens[start:index]]
    if "namespace" in words:
        return "namespace"
    if "enum" in words:
        return "value"
    if words and words[0] in ("struct", "class"):
        return "members"
    before = words[-1] if words else "{"
    return "body" if before in (")", "else", "try", "do", "const", "{", "override") else "value"


def is_swap(kind: str, first: tuple[Token, ...], second: tuple[Token, ...]) -> bool:
    if kind == "members":
        return not any(token.text in ("(", "using") for token in first + second)
    texts = (" ".join(token.text for token in statement) for statement in (first, second))
    return kind == "body" and not all(QUIET_DECLARATION.fullmatch(text) for text in texts)


def swaps(tokens: tuple[Token, ...]) -> Iterator[tuple[Region, Region]]:
    """The regions of both, without the text between them."""
    scopes = ["namespace"]
    start = 0
    former: tuple[Token, ...] | None = None
    index = 0
    while index < len(tokens):
        text = tokens[index].text
        if text in ("(", "["):
            index = matching(tokens, index)
        elif text == "{":
            kind = scope_kind(tokens, index, start)
            if kind == "value":
                index = matching(tokens, index)
            else:
                scopes.append(kind)
                start, former = index + 1, None
        elif text == "}":
            scopes.pop()
            start, former = index + 1, None
        elif text == ":" and tokens[start].text in LABELS:
            start, former = index + 1, None
        elif text == ";":
            statement = tokens[start:index + 1]
            if former and len(statement) > 1 and is_swap(scopes[-1], former, statement):
                yield (former[0].start, former[-1].end), (statement[0].start, statement[-1].end)
            former = statement if len(statement) > 1 else None
            start = index + 1
        index += 1
