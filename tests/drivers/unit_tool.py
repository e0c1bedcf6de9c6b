# SPDX-License-Identifier: Apache-2.0
"""What drivers know of orvane-unit: how it marks its units, and what a call of it gives."""

from __future__ import annotations

from dataclasses import dataclass

MARKER = ".orvane-unit"
MARKER_TEXT = b"made by orvane-unit, layout 1\n"


@dataclass(frozen=True)
class Said:
    status: int
    stdout: bytes
    stderr: bytes
