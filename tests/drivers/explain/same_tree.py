# SPDX-License-Identifier: Apache-2.0
"""Whether two folders hold the same kinds, contents and targets of links; modes and times don't count."""

from __future__ import annotations

import errno
import os
from collections.abc import Iterator
from dataclasses import replace
from hashlib import sha256
from pathlib import Path

from model import snapshot
from model.snapshot import Entry

PAGE = 4096


def data_parts(descriptor: int, size: int) -> Iterator[tuple[int, int]]:
    """The start and end of each part of a file that isn't a hole."""
    end = 0
    while end < size:
        try:
            start = os.lseek(descriptor, end, os.SEEK_DATA)
        except OSError as error:
            if error.errno == errno.ENXIO:
                return
            raise
        end = os.lseek(descriptor, start, os.SEEK_HOLE)
        yield start, end


def digest(path: str) -> bytes:
    """Zeros give the same digest whether they are a hole or not."""
    found = sha256()
    with open(path, "rb", buffering=0) as file:
        size = os.fstat(file.fileno()).st_size
        ahead = 0
        for start, end in data_parts(file.fileno(), size):
            for offset in range(max(ahead, start // PAGE * PAGE), end, PAGE):
                page = os.pread(file.fileno(), PAGE, offset)
                ahead = offset + PAGE
                if page.count(0) < len(page):
                    found.update(b"%d:" % offset + page)
    return b"%d bytes, " % size + found.hexdigest().encode()


def take(root: Path) -> dict[str, Entry]:
    entries = {}
    for path, entry in snapshot.take(root).items():
        if entry.stamp is not None:
            entry = replace(entry, content=digest(os.fspath(root) + path), stamp=None)
        entries[path] = replace(entry, mode=None)
    return entries


def differences(first: Path, second: Path) -> list[str]:
    """One line for each path at which `second` isn't like `first`."""
    return snapshot.difference(take(first), take(second))
