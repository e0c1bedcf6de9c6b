#!/usr/bin/env python3
# SPDX-License-Identifier: Apache-2.0
"""debian_changelog.py CHANGELOG OUTPUT: writes CHANGELOG, in Markdown, as the compressed file that Debian
requires of a package, with the same entries."""

from __future__ import annotations

import datetime
import gzip
import re
import sys
import textwrap
from pathlib import Path

MAINTAINER = "orvane developers <orvane@example.org>"
VERSION = re.compile(r"^## \[(?P<version>[^]]+)\] - (?P<date>\d{4}-\d\d-\d\d)$")


class Unreadable(Exception):
    """A line that no Debian changelog can have."""


def as_debian(markdown: str) -> str:
    """What precedes the first version is about the file itself, so it is left out."""
    blocks: list[str] = []
    signature = ""
    for block in re.findall(r"(?m)^\S.*(?:\n +\S.*)*", markdown):
        if found := VERSION.match(block):
            date = datetime.date.fromisoformat(found["date"]).strftime("%a, %d %b %Y 00:00:00 +0000")
            blocks += [signature, f"orvane ({found['version']}) unstable; urgency=medium\n"]
            signature = f"\n -- {MAINTAINER}  {date}\n"
        elif block.startswith("## "):
            raise Unreadable(f"not a version with its date: {block}")
        elif block.startswith("### "):
            above = "" if blocks[-1].endswith("\n") else "\n"
            blocks.append(f"{above}  [ {block.removeprefix('### ')} ]")
        elif signature:
            # Debian asks for at most 80 characters in a line.
            blocks.append(textwrap.fill(" ".join(block.removeprefix("- ").split()), 80, initial_indent="  * ",
                                        subsequent_indent="    ", break_long_words=False, break_on_hyphens=False))
    return "\n".join([*blocks[1:], signature])


def main() -> int:
    text = as_debian(Path(sys.argv[1]).read_text(encoding="utf-8"))
    Path(sys.argv[2]).write_bytes(gzip.compress(text.encode(), 9, mtime=0))
    return 0


if __name__ == "__main__":
    sys.exit(main())
