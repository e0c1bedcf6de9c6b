#!/usr/bin/env python3
# SPDX-License-Identifier: Apache-2.0
"""Runs a driver: python3 tests/drivers differential|explain|faults|hostile|library|limits|moments|page ARGUMENT...

--help after the name of a driver lists its arguments.
"""

from __future__ import annotations

import sys
from importlib import import_module
from pathlib import Path

NAMES = ("differential", "explain", "faults", "hostile", "library", "limits", "moments", "page")


def main() -> int:
    if len(sys.argv) < 2 or sys.argv[1] not in NAMES:
        print(__doc__, end="", file=sys.stderr)
        return 2
    # Python looks in this folder first. The packages are in the one above it.
    sys.path[0] = str(Path(__file__).resolve().parents[1])
    name = sys.argv[1]
    status: int = import_module(f"drivers.{name}.{name}").main(sys.argv[2:])
    return status


if __name__ == "__main__":
    sys.exit(main())
