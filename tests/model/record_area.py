# SPDX-License-Identifier: Apache-2.0
"""The library's functions for the record area, which a run uses only in part."""

from __future__ import annotations

from model.records import DPS_AREA_SIZE, RECORD_AREA, TUNING_AREA

# The sizes of the slots; all but slot 15 and those after the gap follow one another.
SLOT_SIZES = (1, *[16] * 8, 8, *[1] * 5, 136, 24, 2)
GAP = range(137, 2185)
CHECKED_SLOT = 15

AUX_SIZE = 1024
AUX_AREA = 1045504
TUNING_SIZE = 4096

FAILED_CRC = 0xFFFFFFFF
POLYNOMIAL = 0xEDB88320


# Rules: SLT-01 to SLT-19
def slot_place(slot: int) -> tuple[int, int] | None:
    """Size, and offset from the first byte of the area. None if there is no such slot."""
    if not 0 <= slot < len(SLOT_SIZES):
        return None
    if slot == CHECKED_SLOT:
        return SLOT_SIZES[slot], 1
    offset = sum(size for number, size in enumerate(SLOT_SIZES[:slot]) if number != CHECKED_SLOT)
    return SLOT_SIZES[slot], offset if offset < GAP.start else offset + len(GAP)


# Rules: CRC-02
def crc_step(crc: int, byte: int) -> int:
    crc ^= byte
    for _ in range(8):
        crc = crc >> 1 ^ (POLYNOMIAL if crc & 1 else 0)
    return crc


class Disk:
    """`content` is None if the disk can't be opened, or can't be read."""

    def __init__(self, content: bytes | None) -> None:
        self.content = content
        # What the next read gives at most.
        self.readable: int | None = None

    # Rules: SLT-23, SLT-24
    def _read(self, before_end: int, length: int) -> bytes | None:
        if self.content is None or before_end > len(self.content):
            return None
        start = len(self.content) - before_end
        found = self.content[start:start + length]
        return found if self.readable is None else found[:self.readable]

    # Rules: SLT-25, SLT-28, ARE-04
    def _write(self, before_end: int, data: bytes) -> bool:
        if self.content is None or before_end > len(self.content):
            return False
        start = len(self.content) - before_end
        self.content = self.content[:start] + data + self.content[start + len(data):]
        return True

    # Rules: SLT-20 to SLT-22, SLT-29
    def read_slot(self, slot: int, length: int) -> tuple[int, bytes]:
        """Status, and what the first bytes of the buffer are then; the others stay as they were."""
        if length == 0:
            return -1, b""
        place = slot_place(slot)
        found = None
        if place is not None:
            size, offset = place
            found = self._read(RECORD_AREA - offset, min(size, length))
        return (-1 if found is None else 0), (found or b"").ljust(length, b"\0")

    # Rules: SLT-26 to SLT-29
    def write_slot(self, slot: int, data: bytes) -> int:
        place = slot_place(slot)
        if not data or place is None:
            return -1
        size, offset = place
        return 0 if self._write(RECORD_AREA - offset, data[:size].ljust(size, b"\0")) else -1

    # Rules: ARE-03, ARE-05 to ARE-07
    def read_area(self, name: str, length: int) -> tuple[int, bytes]:
        """Status, and what the first bytes of the buffer are then; the others stay as they were."""
        before_end, size = _area(name)
        found = self._read(before_end, length) if 0 < length <= size else None
        return (-1, b"") if found is None else (0, found)

    # Rules: ARE-04 to ARE-06
    def write_area(self, name: str, data: bytes) -> int:
        before_end, size = _area(name)
        return 0 if 0 < len(data) <= size and self._write(before_end, data) else -1

    def tuning_blocks(self) -> bytes:
        """Zeros in place of what can't be read."""
        return self.read_area("tuning", DPS_AREA_SIZE)[1].ljust(DPS_AREA_SIZE, b"\0")

    # Rules: CRC-01, CRC-03 to CRC-05
    def crc(self) -> int:
        size, offset = SLOT_SIZES[CHECKED_SLOT], 1
        found = self._read(RECORD_AREA - offset, size)
        if found is None:
            return FAILED_CRC
        crc = 0xFFFFFFFF
        for byte in found.ljust(size, b"\0"):
            crc = crc_step(crc, byte)
        return crc


# Rules: SLT-29, ARE-05
def without_buffer() -> int:
    """The status of all six functions."""
    return -1


# Rules: ARE-01, ARE-02
def _area(name: str) -> tuple[int, int]:
    """Distance of its first byte from the end of the disk, and size."""
    return (AUX_AREA, AUX_SIZE) if name == "aux" else (TUNING_AREA, TUNING_SIZE)
