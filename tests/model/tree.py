# SPDX-License-Identifier: Apache-2.0
"""A unit's files below a folder that stands for "/"; what is written is kept separately."""

from __future__ import annotations

import os
import stat
from dataclasses import dataclass
from pathlib import Path

FILE = "file"
FOLDER_PLACE = "folder"
FREE = "free"

# The kernel follows at most this many links in one path.
MAX_LINKS = 40


@dataclass(frozen=True)
class Place:
    """Where a path leads: `path` is absolute in the unit and free of links."""

    kind: str
    path: str


class Tree:
    """Reads the real files; never changes them. Writes go to `written`."""

    def __init__(self, root: Path) -> None:
        self.root = root
        self.written: dict[str, bytes] = {}

    def _real(self, path: str) -> str:
        return os.fspath(self.root) + path

    # Rules: RUN-10
    def resolve(self, path: str) -> Place | None:
        """None if a part of the path is missing, not a folder, or a loop of links.

        An absolute link starts again at the unit's root, and ".." doesn't leave it.
        """
        ahead = path.split("/")[::-1]
        done: list[str] = []
        kind = FOLDER_PLACE
        links = 0
        while ahead:
            name = ahead.pop()
            if name in ("", "."):
                continue
            if kind != FOLDER_PLACE:
                return None
            if name == "..":
                del done[-1:]
                continue
            here = "/" + "/".join([*done, name])
            kind, target = self._look(here)
            if target is not None:
                links += 1
                if links > MAX_LINKS:
                    return None
                if target.startswith("/"):
                    done = []
                kind = FOLDER_PLACE
                ahead.extend(target.split("/")[::-1])
                continue
            done.append(name)
        return Place(kind, "/" + "/".join(done))

    def _look(self, path: str) -> tuple[str, str | None]:
        if path in self.written:
            return FILE, None
        try:
            mode = os.lstat(self._real(path)).st_mode
        except (FileNotFoundError, NotADirectoryError):
            return FREE, None
        if stat.S_ISLNK(mode):
            return FILE, os.readlink(self._real(path))
        return (FOLDER_PLACE if stat.S_ISDIR(mode) else FILE), None

    def size(self, place: Place) -> int:
        if place.path in self.written:
            return len(self.written[place.path])
        return os.stat(self._real(place.path)).st_size

    def read(self, place: Place, offset: int = 0, count: int | None = None) -> bytes:
        """`count` avoids reading a large sparse file whole."""
        if place.path in self.written:
            content = self.written[place.path][offset:]
            return content if count is None else content[:count]
        with open(self._real(place.path), "rb") as file:
            file.seek(offset)
            return file.read() if count is None else file.read(count)

    def write(self, place: Place, content: bytes) -> None:
        self.written[place.path] = content

    def names(self, place: Place) -> list[str]:
        """scandir and readdir give the same order."""
        with os.scandir(self._real(place.path)) as entries:
            return [entry.name for entry in entries]
