# SPDX-License-Identifier: Apache-2.0
"""Buffered file streams and their failed state."""

from __future__ import annotations

from model.system import Fault, Handle, System


class InputStream:
    def __init__(self, system: System, path: str) -> None:
        self._system = system
        self._handle = system.open_reading(path)
        self.failed = self._handle is None

    def rest(self) -> tuple[bytes, bool]:
        """All bytes, and whether an error ended them."""
        if self._handle is None:
            return b"", False
        return self._system.read_stream(self._handle)

    # Rules: VER-04, VER-13
    def lines(self) -> list[bytes]:
        content, broken = self.rest()
        lines = content.split(b"\n")
        if broken and not self._system.library.unfinished_line_kept:
            lines.pop()
        return lines

    def close(self) -> None:
        """Nothing uses an input after it was closed."""
        if self._handle is not None:
            self._system.close(self._handle)


class OutputStream:
    """Drops writes once it has failed; its file is complete at close."""

    def __init__(self, system: System, path: str) -> None:
        self._system = system
        self._handle: Handle | None = system.open_writing(path)
        self.failed = self._handle is None
        self._content = b""
        self._copied: tuple[int, int] | None = None

    def write(self, content: bytes) -> None:
        if not self.failed:
            self._content += content

    # Rules: MRG-03 to MRG-06
    def copy(self, source: InputStream) -> None:
        """Fails when no byte moves; an empty source is enough for that."""
        if self.failed:
            return
        content, broken = source.rest()
        start = len(self._content)
        self._content += content
        self._copied = (start, len(self._content))
        if not content or (broken and self._system.library.broken_copy_fails):
            self.failed = True

    def close(self) -> None:
        """Completes the file. A stream that never opened has nothing to close."""
        if self._handle is None:
            return
        fault = self._system.transfer_fault("write", self._handle)
        if fault is not None:
            self._apply(fault)
        if self._content:
            self._system.tree.write(self._handle.place, self._content)
        if not self._system.close(self._handle):
            self.failed = True
        self._handle = None

    # Rules: MRG-11
    def _apply(self, fault: Fault) -> None:
        """Sets what the file holds after the write of `fault` failed.

        Earlier content stays. Of the call's own bytes, those that were pending (all of a plain
        write, the first piece of a gathered one) are either tried again at close or lost. Later
        bytes are dropped. One exception: a copy that has already moved a byte doesn't mark its
        destination, so the lines after the copy are still written.

        With a second buffer the call's own bytes are lost. Pending is then the chunk of the first buffer
        that made the second write out its own.
        """
        library, chunk = self._system.library, self._system.streams.chunk
        whole = self._content
        end = fault.offset + fault.length
        pending = fault.pieces[0] if len(fault.pieces) > 1 else fault.length
        kept = whole[:fault.offset]
        if library.pending_kept and chunk:
            start = end - (chunk - 1 if library.chunk_overlaps else 0)
            kept += whole[start:start + chunk]
        elif library.pending_kept:
            kept += whole[fault.offset:fault.offset + pending]
        tail = b""
        fails = True
        if self._copied is not None:
            start, stop = self._copied
            if start < fault.offset + pending and end <= stop:
                tail = whole[stop:]
                fails = end == stop and library.last_write_fails_stream
        self._content = kept + (b"" if fails else tail)
        self.failed = self.failed or fails


# Rules: MRG-08 to MRG-10
def install_stock(system: System, stock_path: str, output_path: str) -> None:
    """Neither opening is checked; the output's is a second one of that path."""
    stock = InputStream(system, stock_path)
    output = OutputStream(system, output_path)
    output.copy(stock)
    stock.close()
    output.close()
