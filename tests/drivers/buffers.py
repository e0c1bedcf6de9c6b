# SPDX-License-Identifier: Apache-2.0
"""The lengths of the tool's buffers, and of inputs at which it has to read again.

They come from its source, so that they can't fall behind when it changes.
"""

from __future__ import annotations

import re
from pathlib import Path

SOURCE = Path(__file__).resolve().parents[2] / "src/writers/template_merge.h"


def _constant(name: str) -> int:
    found = re.findall(rf"\b{name} = (\d+);", SOURCE.read_text())
    if len(found) != 1:
        raise SystemExit(f"{SOURCE} must give {name} as one number, not {found}")
    return int(found[0])


# Of an output.
OUTPUT = _constant("OUTPUT_BUFFER_SIZE")

# What one read of a copied file gives; a library that keeps no byte of the buffer back reads one more.
ONE_READ = _constant("INPUT_BUFFER_SIZE") - 1

# One below, at and above one read and two, and beyond.
AROUND = (ONE_READ - 1, ONE_READ, ONE_READ + 1, ONE_READ + 2,
          2 * ONE_READ - 1, 2 * ONE_READ, 2 * ONE_READ + 1, 2 * ONE_READ + 37_856)

LONGEST = 10 * 2**20
