#!/usr/bin/env python3
# SPDX-License-Identifier: Apache-2.0
"""Counts the lines, branches and conditions of the product that its unit tests reach.

Reads what `llvm-cov export` prints. A condition counts as reached when one of its two values alone has changed the
decision that it is part of (modified condition/decision coverage). Prints what was missed, and three closing lines.

Exit status: 0 nothing was missed, 1 something was, 2 the input doesn't say.
"""

from __future__ import annotations

import argparse
import json
import sys
from collections.abc import Iterator, Mapping, Sequence
from pathlib import Path
from typing import Any

# A name of ours, and that of llvm-cov.
COUNTED = {"lines": "lines", "branches": "branches", "conditions": "mcdc"}


class NothingCounted(Exception):
    """The input has no figure for something that must be counted."""


def files_under(export: Mapping[str, Any], folder: Path) -> list[Mapping[str, Any]]:
    return [file for data in export["data"] for file in data["files"]
            if Path(file["filename"]).is_relative_to(folder)]


def missed(file: Mapping[str, Any]) -> Iterator[tuple[int, str]]:
    """The line of each thing that was missed, and what it is."""
    for line, _, count, has_count, is_entry, is_gap in file["segments"]:
        if has_count and is_entry and not is_gap and count == 0:
            yield line, "not reached"
    for line, column, _, _, taken, not_taken, *_ in file["branches"]:
        if taken == 0 or not_taken == 0:
            yield line, f"column {column}: never {'true' if taken == 0 else 'false'}"
    for record in file["mcdc_records"]:
        for number, is_shown in enumerate(record[9], 1):
            if not is_shown:
                yield record[0], f"condition {number} alone never changed the decision"


def total(files: Sequence[Mapping[str, Any]], kind: str) -> tuple[int, int]:
    """How many were reached, and how many there are."""
    summaries = [file["summary"][kind] for file in files]
    count = sum(summary["count"] for summary in summaries)
    if count == 0:
        raise NothingCounted(f"no {kind} were counted")
    return sum(summary["covered"] for summary in summaries), count


def report(export: Mapping[str, Any], folder: Path) -> bool:
    """Prints what was missed in the files of the folder, and whether nothing was."""
    files = files_under(export, folder)
    for file in files:
        name = Path(file["filename"]).relative_to(folder.parent)
        for line, what in sorted(missed(file)):
            print(f"{name}:{line}: {what}")
    totals = {name: total(files, kind) for name, kind in COUNTED.items()}
    for name, (reached, count) in totals.items():
        print(f"{name}: {reached} of {count}")
    return all(reached == count for reached, count in totals.values())


def main() -> int:
    parser = argparse.ArgumentParser(description=__doc__, formatter_class=argparse.RawDescriptionHelpFormatter)
    parser.add_argument("folder", type=Path, help="the folder whose files count")
    folder = parser.parse_args().folder.resolve()
    try:
        return 0 if report(json.load(sys.stdin), folder) else 1
    except (ValueError, KeyError, NothingCounted) as error:
        print(f"coverage: {error!r}", file=sys.stderr)
        return 2


if __name__ == "__main__":
    sys.exit(main())
