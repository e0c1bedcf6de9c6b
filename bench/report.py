# SPDX-License-Identifier: Apache-2.0
"""Tables that read well as plain text and as Markdown, and the document with those of the last run."""

from __future__ import annotations

import re
from pathlib import Path

MARK = "<!-- bench: {} -->"


class Table:
    def __init__(self, *head: str) -> None:
        self.rows: list[tuple[str, ...]] = [head]
        self.note = ""

    def add(self, *cells: str) -> None:
        assert len(cells) == len(self.rows[0])
        self.rows.append(cells)

    def text(self) -> str:
        widths = [max(len(row[column]) for row in self.rows) for column in range(len(self.rows[0]))]
        lines = ["| " + " | ".join(cell.ljust(width) if not column else cell.rjust(width)
                                   for column, (cell, width) in enumerate(zip(row, widths))) + " |"
                 for row in self.rows]
        rule = "|" + "|".join("-" * (width + 2) if not column else "-" * (width + 1) + ":"
                              for column, width in enumerate(widths)) + "|"
        return "\n".join([lines[0], rule, *lines[1:], *(["", self.note] if self.note else [])])


def time_text(nanoseconds: float) -> str:
    for unit, size in (("s", 1e9), ("ms", 1e6), ("µs", 1e3)):
        if nanoseconds >= size:
            return f"{nanoseconds / size:.3g} {unit}" if nanoseconds < 1000 * size else \
                f"{nanoseconds / size:.0f} {unit}"
    return f"{nanoseconds:.0f} ns"


def bytes_text(size: int) -> str:
    for unit, shift in (("MiB", 20), ("KiB", 10)):
        if size >= 1 << shift:
            return f"{size >> shift} {unit}"
    return f"{size} B"


def grouped(number: int) -> str:
    return f"{number:,}"


def put_into(document: Path, name: str, text: str) -> None:
    """Puts the text between the two marks of this name."""
    mark = re.escape(MARK.format(name))
    old = document.read_text(encoding="utf-8")
    new, count = re.subn(f"({mark}\n)(?:.*?\n)?({mark})",
                         lambda found: f"{found[1]}{text}\n{found[2]}", old, flags=re.DOTALL)
    if count != 1:
        raise SystemExit(f"bench: {document.name} has no place for {name!r}")
    document.write_text(new, encoding="utf-8")
