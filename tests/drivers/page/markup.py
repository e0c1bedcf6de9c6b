# SPDX-License-Identifier: Apache-2.0
"""A page as a tree of elements, and the bytes that it shows."""

from __future__ import annotations

import re
from collections.abc import Iterator
from dataclasses import dataclass, field
from html.parser import HTMLParser

VOID = frozenset(("meta", "br"))

# What kit/host/text.h makes of bytes that are not printable.
ESCAPE = re.compile(rb"\\(?:(n)|(\\)|x([0-9a-f]{2}))")


class BadMarkup(ValueError):
    """The page is not what a careful writer of markup writes."""


@dataclass
class Element:
    name: str
    attributes: dict[str, str]
    children: list[Element | str] = field(default_factory=list)

    def text(self) -> str:
        return "".join(child if isinstance(child, str) else child.text() for child in self.children)

    def classes(self) -> list[str]:
        return self.attributes.get("class", "").split()

    def all(self, name: str, kind: str = "") -> Iterator[Element]:
        """The elements below this one with a name, and with a class if `kind` is one."""
        for child in self.children:
            if isinstance(child, Element):
                if child.name == name and (not kind or kind in child.classes()):
                    yield child
                yield from child.all(name, kind)

    def one(self, name: str, kind: str = "") -> Element:
        found = list(self.all(name, kind))
        if len(found) != 1:
            raise BadMarkup(f"{len(found)} elements {name} {kind!r} in {self.name} {self.attributes}")
        return found[0]

    def first(self, name: str, kind: str = "") -> Element | None:
        return next(self.all(name, kind), None)


class _Reader(HTMLParser):
    def __init__(self) -> None:
        super().__init__(convert_charrefs=True)
        self.root = Element("", {})
        self.open = [self.root]

    def handle_starttag(self, tag: str, attrs: list[tuple[str, str | None]]) -> None:
        names = [name for name, _ in attrs]
        if len(set(names)) < len(names) or any(name.startswith("on") or name == "style" for name in names):
            raise BadMarkup(f"attributes of {tag}: {names}")
        element = Element(tag, {name: value or "" for name, value in attrs})
        self.open[-1].children.append(element)
        if tag not in VOID:
            self.open.append(element)

    def handle_endtag(self, tag: str) -> None:
        if self.open[-1].name != tag:
            raise BadMarkup(f"</{tag}> in {self.open[-1].name}")
        self.open.pop()

    def handle_data(self, data: str) -> None:
        self.open[-1].children.append(data)

    def handle_comment(self, data: str) -> None:
        raise BadMarkup(f"a comment: {data!r}")


def parse(page: bytes) -> Element:
    reader = _Reader()
    reader.feed(page.decode())
    reader.close()
    if len(reader.open) != 1:
        raise BadMarkup(f"{reader.open[-1].name} has no end")
    return reader.root


def shown(text: str) -> bytes:
    """The bytes that are shown as `text`: the inverse of their escapes."""
    def plain(match: re.Match[bytes]) -> bytes:
        if match[1]:
            return b"\n"
        return b"\\" if match[2] else bytes.fromhex(match[3].decode())
    return ESCAPE.sub(plain, text.encode())
