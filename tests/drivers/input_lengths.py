# SPDX-License-Identifier: Apache-2.0
"""Lengths of inputs at which the tool has to read again.

They come from its source, so that they can't fall behind when its buffer changes.
"""

from __future__ import annotations

import re
from pathlib import Path

SOURCE = Path(__file__).resolve().parents[2] / "src/writers/template_merge.h"


def _buffer_size() -> int:
    found = re.findall(r"INPUT_BUFFER_SIZE = (\d+);", SOURCE.read_text())
    if len(found) != 1:
        raise SystemExit(f"{SOURCE} must give INPUT_BUFFER_SIZE as one number, not {found}")
    return int(found[0])


# What one read of a copied file gives; a library that keeps no byte of the buffer back reads one more.
ONE_READ = _buffer_size() - 1

# One below, at and above one read and two, and beyond.
AROUND = (ONE_READ - 1, ONE_READ, ONE_READ + 1, ONE_READ + 2,
          2 * ONE_READ - 1, 2 * ONE_READ, 2 * ONE_READ + 1, 2 * ONE_READ + 37_856)

LONGEST = 10 * 2**20
