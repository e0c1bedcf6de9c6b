#!/usr/bin/env python3
# SPDX-License-Identifier: Apache-2.0
"""Tries mutants of the product: python3 tests/mutate [--explain] ARGUMENT...

Without --explain, on the test suite. With it, on the agreement of orvane-unit's explain with a run.
--help at the end lists the arguments of either.
"""

from __future__ import annotations

import sys
from pathlib import Path


def main() -> int:
    # Python looks in this folder first. The packages are in the one above it.
    sys.path[0] = str(Path(__file__).resolve().parents[1])
    words = sys.argv[1:]
    if words[:1] == ["--explain"]:
        from mutate import explain
        return explain.main(words[1:])
    from mutate import mutate
    return mutate.main(words)


if __name__ == "__main__":
    sys.exit(main())
