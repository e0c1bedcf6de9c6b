# SPDX-License-Identifier: Apache-2.0
"""The unit's system calls: files, how calls are counted, and the faults that disturb them."""

from __future__ import annotations

from collections import Counter
from collections.abc import Sequence
from dataclasses import dataclass

from model.tree import FILE, FOLDER_PLACE, FREE, Place, Tree

DISK = "/dev/hd0"


@dataclass(frozen=True)
class Fault:
    """One disturbed system call.

    `occurrence` counts from 1. For open, seek and map it is the number of that operation on `path`
    in the run. For read, write, close and list it is the number of the opening whose descriptor the
    call used: the library decides how many transfers a stream makes with one opening, so such a
    call is identified by the bytes it covered in an undisturbed run, `offset` and `length`.
    `pieces` are the lengths of a gathered write. A list fault's offset is 0 when no entry had been
    delivered and positive when all of them had. A short transfer moves only `length` bytes.
    """

    operation: str
    path: str
    occurrence: int
    kind: str = "error"
    error: str = "EIO"
    offset: int = 0
    length: int = 0
    pieces: tuple[int, ...] = ()


@dataclass(frozen=True)
class Streams:
    """How a C++ library has built its file streams.

    `retry_interrupted`: a stream repeats a read or write that a signal interrupted. `chunk` is the length
    of a stream's own buffer where what it holds goes through a second buffer, that of a C stream; 0 where
    there is none.
    """

    retry_interrupted: bool = True
    chunk: int = 0


@dataclass(frozen=True)
class Library:
    """What a C++ library may do when a call under a stream fails.

    Each of these is consulted only if the fault makes it matter, so a run without faults has one
    outcome whatever is chosen here.
    """

    # A C stream that has read some bytes of what it was asked for gives them, and no error: the next read
    # goes on behind them. Only with a second buffer.
    read_error_forgotten: bool = False
    # Reading fails after the first byte of a copy: one library throws inside (which marks the destination
    # failed), another sees a plain end.
    broken_copy_fails: bool = False
    # The same within a line: the thrown error drops the unfinished line, the plain end keeps it.
    unfinished_line_kept: bool = False
    # Close retries bytes that a failed write left pending; they are lost if close itself wrote them.
    pending_kept: bool = False
    # The last write of a file may come from the copy (which has already moved bytes, so doesn't mark the
    # stream) or from close (which does).
    last_write_fails_stream: bool = False
    # A second buffer that is full has all of the pending chunk but its last byte, or nothing of it: that
    # depends on whether the stream has begun with a chunk of a single byte.
    chunk_overlaps: bool = False


# Which of them may matter when this operation fails.
CHOICES = {
    "read": ("read_error_forgotten", "broken_copy_fails", "unfinished_line_kept"),
    "write": ("pending_kept", "last_write_fails_stream", "chunk_overlaps"),
}


@dataclass(frozen=True)
class Handle:
    path: str
    opening: int
    place: Place


class System:
    """The tree as the tool's calls see it, in the order of the calls."""

    def __init__(self, tree: Tree, faults: Sequence[Fault], library: Library,
                 streams: Streams = Streams()) -> None:
        self.tree = tree
        self.library = library
        self.streams = streams
        self.met: set[Fault] = set()
        self._faults = tuple(faults)
        # Every open, seek and map, in order.
        self.calls: list[tuple[str, str]] = []
        self._counts: Counter[tuple[str, str]] = Counter()

    def _fault(self, operation: str, path: str, occurrence: int) -> Fault | None:
        path = path.rstrip("/")
        for fault in self._faults:
            if (fault.operation, fault.path.rstrip("/"), fault.occurrence) == (
                    operation, path, occurrence):
                self.met.add(fault)
                return fault
        return None

    def _count(self, operation: str, path: str) -> int:
        key = (operation, path.rstrip("/"))
        self.calls.append(key)
        self._counts[key] += 1
        return self._counts[key]

    def _succeeds(self, operation: str, path: str) -> bool:
        return self._fault(operation, path, self._count(operation, path)) is None

    # Rules: MRG-07
    def open_reading(self, path: str) -> Handle | None:
        """Folders can be opened for reading, too; reading them fails."""
        opening = self._count("open", path)
        if self._fault("open", path, opening):
            return None
        place = self.tree.resolve(path)
        if place is None or place.kind == FREE:
            return None
        return Handle(path, opening, place)

    # Rules: RUN-09, RUN-11 to RUN-13, MRG-01
    def open_writing(self, path: str) -> Handle | None:
        """Creates or truncates; a failed opening changes nothing."""
        opening = self._count("open", path)
        if self._fault("open", path, opening):
            return None
        place = self.tree.resolve(path)
        if place is None or place.kind not in (FILE, FREE):
            return None
        self.tree.write(place, b"")
        return Handle(path, opening, place)

    def seek(self, path: str) -> bool:
        return self._succeeds("seek", path)

    def map(self, path: str) -> bool:
        return self._succeeds("map", path)

    def close(self, handle: Handle) -> bool:
        return self._fault("close", handle.path, handle.opening) is None

    def transfer_fault(self, operation: str, handle: Handle) -> Fault | None:
        """The fault that permanently disturbs a transfer of this opening, if any."""
        fault = self._fault(operation, handle.path, handle.opening)
        if fault is None or handle.path == DISK:
            return fault
        if fault.kind == "short":
            return None  # a stream continues with the rest
        if fault.error == "EINTR" and self.streams.retry_interrupted:
            return None
        return fault

    def read_stream(self, handle: Handle) -> tuple[bytes, bool]:
        """Everything that a stream reads from a file, and whether an error ended it."""
        content = b"" if handle.place.kind == FOLDER_PLACE else self.tree.read(handle.place)
        fault = self.transfer_fault("read", handle)
        if fault is not None and not self._forgets(fault):
            return content[:fault.offset], True
        return content, handle.place.kind == FOLDER_PLACE

    def _forgets(self, fault: Fault) -> bool:
        return (self.library.read_error_forgotten and self.streams.chunk > 0 and fault.offset > 0)

    # Rules: VER-01, VER-16, VER-21
    def list_folder(self, path: str) -> list[str]:
        """Entry names in the order of the listing; nothing if it can't be opened."""
        handle = self.open_reading(path)
        if handle is None or handle.place.kind != FOLDER_PLACE:
            return []
        self.close(handle)
        fault = self._fault("list", path, handle.opening)
        if fault is not None and fault.offset == 0:
            return []
        return self.tree.names(handle.place)
