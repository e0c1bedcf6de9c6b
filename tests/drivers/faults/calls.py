# SPDX-License-Identifier: Apache-2.0
"""Reads a trace of one run: which calls the tool makes on its own files."""

from __future__ import annotations

import re
from collections import Counter
from collections.abc import Iterable
from dataclasses import dataclass

OWN_PATHS = re.compile(r"/fs/|/tmp/|/dev/hd0$")

OPERATIONS = {
    "open": "open", "openat": "open", "lseek": "seek", "mmap": "map", "munmap": "unmap",
    "read": "read", "write": "write", "writev": "write", "close": "close", "getdents64": "list",
}

LINE = re.compile(r"(?P<name>\w+)\((?P<arguments>.*)\) += (?P<result>-?\w+|\?)")
QUOTED = re.compile(r'"((?:[^"\\]|\\.)*)"')
PIECE = re.compile(r"iov_len=(\d+)")


@dataclass(frozen=True)
class Call:
    """`number` counts the calls of this name from the start of the traced process, `turn` those that name
    the path or use a descriptor of it: an emulator makes calls of its own between them.

    `occurrence`, `offset` and `pieces` are those of a fault of this call; `moved` is its result,
    the number of bytes transferred.
    """

    name: str
    number: int
    operation: str
    path: str
    occurrence: int
    turn: int
    offset: int = 0
    moved: int = 0
    pieces: tuple[int, ...] = ()


@dataclass
class _Descriptor:
    path: str
    opening: int
    position: int = 0


class _Reader:
    def __init__(self) -> None:
        self.calls: list[Call] = []
        self._numbers: Counter[str] = Counter()
        self._turns: Counter[tuple[str, str]] = Counter()
        self._occurrences: Counter[tuple[str, str]] = Counter()
        self._descriptors: dict[int, _Descriptor] = {}
        self._mappings: dict[str, str] = {}

    def line(self, text: str) -> None:
        match = LINE.match(text)
        if match is None:
            return
        name, arguments, result = match["name"], match["arguments"], match["result"]
        self._numbers[name] += 1
        if name in ("execve", "execveat") and result == "0":
            # Earlier calls belong to the launcher or its start.
            self.calls.clear()
            self._occurrences.clear()
            self._turns.clear()
            self._descriptors.clear()
            return
        operation = OPERATIONS.get(name)
        if operation == "open":
            self._open(name, arguments, int(result))
        elif operation == "map":
            self._map(name, arguments, result)
        elif operation == "unmap" and arguments.split(",")[0] in self._mappings:
            self._add(name, operation, self._mappings[arguments.split(",")[0]])
        elif operation is not None and arguments.split(",")[0].isdigit():
            descriptor = self._descriptors.get(int(arguments.split(",")[0]))
            if descriptor is not None:
                self._use(name, operation, arguments, int(result), descriptor)

    def _add(self, name: str, operation: str, path: str) -> int:
        """A call that is identified by how many of its kind the path has had."""
        key = (operation, path)
        self._occurrences[key] += 1
        self.calls.append(Call(name, self._numbers[name], operation, path,
                               self._occurrences[key], self._turn(name, path)))
        return self._occurrences[key]

    def _turn(self, name: str, path: str) -> int:
        self._turns[name, path] += 1
        return self._turns[name, path]

    def _open(self, name: str, arguments: str, result: int) -> None:
        quoted = QUOTED.search(arguments)
        if quoted is not None and OWN_PATHS.match(quoted[1]):
            opening = self._add(name, "open", quoted[1])
            if result >= 0:
                self._descriptors[result] = _Descriptor(quoted[1], opening)

    def _map(self, name: str, arguments: str, result: str) -> None:
        number = arguments.split(", ")[4]
        descriptor = self._descriptors.get(int(number))
        if descriptor is not None:
            self._add(name, "map", descriptor.path)
            self._mappings[result] = descriptor.path

    def _use(self, name: str, operation: str, arguments: str, result: int,
             descriptor: _Descriptor) -> None:
        if operation == "seek":
            self._add(name, operation, descriptor.path)
            return
        pieces = tuple(map(int, PIECE.findall(arguments)))
        self.calls.append(Call(name, self._numbers[name], operation, descriptor.path,
                               descriptor.opening, self._turn(name, descriptor.path),
                               descriptor.position, max(result, 0), pieces))
        descriptor.position += max(result, 0)
        if operation == "close":
            self._descriptors = {number: other for number, other in self._descriptors.items()
                                 if other is not descriptor}


def own_calls(lines: Iterable[str]) -> list[Call]:
    reader = _Reader()
    for text in lines:
        reader.line(text)
    return reader.calls
