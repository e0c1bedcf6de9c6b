# SPDX-License-Identifier: Apache-2.0
"""One-byte and two-byte parameters of the vehicle configuration image."""

from __future__ import annotations

from model.system import System
from model.tree import FILE

IMAGE = "/fs/tmpfs/VS_DIAG_SERVICE_CONFIG_SHARED_MEM"

RIGHT_HAND_DRIVE = 22
BRAND = 36
FUEL_TYPE = 50
AUDIO_PROFILE = 134
MODEL = 139

PARAMETER_COUNT = 171
TWO_BYTES_WIDE = frozenset({134, 142, 143, 144, 152, 153, 154, 158})


def width(number: int) -> int:
    return 2 if number in TWO_BYTES_WIDE else 1


# Rules: VEH-01, VEH-06, VEH-10, PRO-01
def offset(number: int) -> int:
    """The image is packed: a parameter directly follows those before it."""
    return sum(width(before) for before in range(1, number))


# Rules: IMG-01 to IMG-04, IMG-06 to IMG-10
def parameter(system: System, number: int) -> int | None:
    """Opens, measures, maps, reads and closes; None without a readable image.

    The length is never checked: past the end of a short image, the rest of the mapping's page reads
    as zeros.
    """
    handle = system.open_reading(IMAGE)
    if handle is None:
        return None
    value = None
    # Rewind, measure, rewind: all three are done, only the measuring counts.
    system.seek(IMAGE)
    measured = system.seek(IMAGE)
    system.seek(IMAGE)
    if measured and system.map(IMAGE) and handle.place.kind == FILE:
        if system.tree.size(handle.place) > 0:
            stored = system.tree.read(handle.place, offset(number), width(number))
            value = int.from_bytes(stored, "little")
    system.close(handle)
    return value
