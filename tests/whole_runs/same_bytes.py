#!/usr/bin/env python3
# SPDX-License-Identifier: Apache-2.0
"""Runs several builds of orvane in every golden unit: all must leave the same bytes behind.

usage: same_bytes.py ORVANE_UNIT GOLDEN_FOLDER ORVANE ORVANE...
"""

from __future__ import annotations

import subprocess
import sys
import tempfile
from multiprocessing.pool import ThreadPool
from pathlib import Path


def leave(unit_tool: str, case: Path, orvane: str) -> dict[str, bytes | None]:
    """What the build leaves in /tmp: contents by name, None for a folder."""
    with tempfile.TemporaryDirectory(prefix="orvane same-") as folder:
        root = Path(folder) / "unit"
        subprocess.run([unit_tool, "new", root, "--from", case / "unit.toml"], check=True,
                       stdout=subprocess.DEVNULL)
        arguments = (case / "arguments").read_text().splitlines()
        subprocess.run([unit_tool, "run", root, "--orvane", orvane, "--", *arguments], check=True,
                       capture_output=True)
        tmp = root / "tmp"
        return {str(path.relative_to(tmp)): path.read_bytes() if path.is_file() else None
                for path in tmp.rglob("*")}


def main() -> int:
    unit_tool, golden, *builds = sys.argv[1:]
    if len(builds) < 2:
        print(__doc__)
        return 2
    cases = sorted(path for path in Path(golden).iterdir() if path.is_dir())

    def differing(case: Path) -> list[str]:
        first = leave(unit_tool, case, builds[0])
        return [build for build in builds[1:] if leave(unit_tool, case, build) != first]

    with ThreadPool(2) as pool:
        results = list(zip(cases, pool.map(differing, cases)))
    for case, others in results:
        for build in others:
            print(f"same bytes: {case.name}: {build} differs from {builds[0]}")
    failed = sum(1 for _, others in results if others)
    print(f"same bytes: {len(builds)} builds, {len(cases)} units, {failed} with a difference")
    return 1 if failed or not cases else 0


if __name__ == "__main__":
    sys.exit(main())
