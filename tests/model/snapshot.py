# SPDX-License-Identifier: Apache-2.0
"""Everything in a unit, as plain values that can be compared."""

from __future__ import annotations

import os
import stat
from collections.abc import Mapping
from dataclasses import dataclass, replace
from pathlib import Path

FOLDER = "folder"
FILE = "file"
LINK = "link"

# A larger file (a disk, which is mostly a hole) is compared by its size and its time of change alone.
MAX_READ = 1 << 19


@dataclass(frozen=True)
class Entry:
    """`mode` is None if any mode is right; `stamp` is size and time of a large file."""

    kind: str
    content: bytes = b""
    mode: int | None = None
    stamp: tuple[int, int] | None = None


def take(root: Path, path: str = "") -> dict[str, Entry]:
    """Maps absolute unit paths to entries, from `path` downwards."""
    entries: dict[str, Entry] = {}
    ahead = [path]
    while ahead:
        here = ahead.pop()
        real = os.fspath(root) + here
        try:
            status = os.lstat(real)
        except FileNotFoundError:
            continue
        mode = stat.S_IMODE(status.st_mode)
        if stat.S_ISDIR(status.st_mode):
            entries[here] = Entry(FOLDER, mode=mode)
            ahead.extend(f"{here}/{name}" for name in os.listdir(real))
        elif stat.S_ISLNK(status.st_mode):
            entries[here] = Entry(LINK, os.fsencode(os.readlink(real)))
        elif status.st_size > MAX_READ:
            entries[here] = Entry(FILE, mode=mode, stamp=(status.st_size, status.st_mtime_ns))
        else:
            with open(real, "rb") as file:
                entries[here] = Entry(FILE, file.read(), mode)
    return entries


# Rules: RUN-04, RUN-05, RUN-07, RUN-08
def changed(before: Mapping[str, Entry], written: Mapping[str, bytes],
            new_mode: int | None = None) -> dict[str, Entry]:
    """What `before` becomes when `written` is written; an existing file keeps its mode."""
    after = dict(before)
    for path, content in written.items():
        old = before.get(path, Entry(FILE, mode=new_mode))
        after[path] = replace(old, content=content, stamp=None)
    return after


def difference(expected: Mapping[str, Entry], found: Mapping[str, Entry]) -> list[str]:
    """One line for each path that isn't as expected."""
    lines = []
    for path in sorted(expected.keys() | found.keys()):
        want, have = expected.get(path), found.get(path)
        if want is None or have is None:
            lines.append(f"{path}: {'missing' if have is None else 'not expected'}")
        elif want != have:
            lines.append(f"{path}: {_entry_difference(want, have)}")
    return lines


def _entry_difference(want: Entry, have: Entry) -> str:
    if want.kind != have.kind:
        return f"a {have.kind} instead of a {want.kind}"
    if want.content != have.content:
        return bytes_difference(want.content, have.content)
    if want.mode != have.mode:
        return f"mode {have.mode!r} instead of {want.mode!r}"
    return f"size and time {have.stamp} instead of {want.stamp}"


def bytes_difference(want: bytes, have: bytes, margin: int = 24) -> str:
    """The first place at which two texts differ, with the bytes around it."""
    at = next((i for i, pair in enumerate(zip(want, have)) if pair[0] != pair[1]),
              min(len(want), len(have)))
    start = max(0, at - margin)
    return (f"differs at byte {at} (lengths: {len(want)} expected, {len(have)} found)\n"
            f"    expected {want[start:at + margin]!r}\n"
            f"    found    {have[start:at + margin]!r}")
