# SPDX-License-Identifier: Apache-2.0
"""A list of mutants, each with its reason."""

from __future__ import annotations

import re
from dataclasses import dataclass
from pathlib import Path

from mutate.mutants import Key

# An entry's keys, and the marks at the start of its lines.
MARKS = ("@ ", "- ", "+ ", "= ")
PLACE = re.compile(r"(?P<path>\S+)(?: \((?P<occurrence>\d+)\))?")


class EntryError(Exception):
    """The list can't be read."""


@dataclass(frozen=True)
class Entry:
    """`line` is the entry's line in the list; the rest is as in a mutant."""

    line: int
    path: str
    occurrence: int
    before: str
    after: str
    reason: str

    def key(self) -> Key:
        return self.path, self.occurrence, self.before, self.after


def parse_entries(text: str, name: str) -> list[Entry]:
    """`name` is the list's name, for complaints."""
    entries = []
    numbered = [(number, line.rstrip()) for number, line in enumerate(text.splitlines(), 1)
                if line.strip() and not line.startswith("#")]
    for at in range(0, len(numbered), len(MARKS)):
        group = numbered[at:at + len(MARKS)]
        number = group[0][0]
        if [line[:2] for _, line in group] != list(MARKS):
            raise EntryError(f"{name}:{number}: not the four lines @ - + = of an entry")
        place, before, after, reason = (line[2:].strip() for _, line in group)
        match = PLACE.fullmatch(place)
        if not match:
            raise EntryError(f"{name}:{number}: not a path: {place}")
        entries.append(Entry(number, match["path"], int(match["occurrence"] or 1), before, after,
                             reason))
    keys = [entry.key() for entry in entries]
    for index, entry in enumerate(entries):
        if entry.key() in keys[:index]:
            raise EntryError(f"{name}:{entry.line}: is listed twice")
        if not entry.reason:
            raise EntryError(f"{name}:{entry.line}: no reason")
    return entries


def read_entries(path: Path) -> list[Entry]:
    return parse_entries(path.read_text(encoding="utf-8"), path.name)
