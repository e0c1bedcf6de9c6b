# SPDX-License-Identifier: Apache-2.0
"""The reserved area at the end of the boot disk."""

from __future__ import annotations

from model.system import DISK, System
from model.tree import FILE

RECORD_AREA = 0x100000
SERIAL_OFFSET = 129
SERIAL_SIZE = 8
TUNING_AREA = 0xFF000
DPS_AREA_SIZE = 1880


# Rules: SER-05, SER-06, TUN-05
def _read_from_end(system: System, distance: int, count: int) -> bytes | None:
    """One transfer, `distance` bytes before the end; a short one is a success."""
    handle = system.open_reading(DISK)
    if handle is None:
        return None
    result = None
    if system.seek(DISK) and handle.place.kind == FILE:
        start = system.tree.size(handle.place) - distance
        if start >= 0:
            fault = system.transfer_fault("read", handle)
            if fault is None:
                result = system.tree.read(handle.place, start, count)
            elif fault.kind == "short":
                result = system.tree.read(handle.place, start, min(count, fault.length))
    system.close(handle)
    return result


# Rules: SER-01, SER-07
def serial_record(system: System) -> bytes | None:
    return _read_from_end(system, RECORD_AREA - SERIAL_OFFSET, SERIAL_SIZE)


# Rules: TUN-01, TUN-05, TUN-06
def tuning_blocks(system: System) -> bytes | None:
    """Always as long as the blocks; zeros replace what a short read didn't give."""
    blocks = _read_from_end(system, TUNING_AREA, DPS_AREA_SIZE)
    return None if blocks is None else blocks.ljust(DPS_AREA_SIZE, b"\0")
