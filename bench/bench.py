#!/usr/bin/env python3
# SPDX-License-Identifier: Apache-2.0
"""What a whole run of `orvane -a -i` costs on the sample unit, compared with a floor and a script.

Prints its tables; with --write they also replace those of docs/performance.md.
"""

from __future__ import annotations

import argparse
import contextlib
import os
import platform
import shutil
import sys
import tempfile
from collections.abc import Iterator
from pathlib import Path

import growth
import variants
from measure import emulated, instructions, interleave, peak, size, system_calls
from place import PROJECT, build, call, furnish
from report import Table, grouped, put_into

DOCUMENT = PROJECT / "docs/performance.md"
SCRIPT = "/bin/sh /bin/accessory.sh -a -i"
STATIC = "/bin/static -a -i"
DYNAMIC = "/bin/dynamic -a -i"
FLOOR = "/bin/floor -a -i"
NAMES = {FLOOR: "floor, static C", STATIC: "orvane, static", DYNAMIC: "orvane, dynamic",
         SCRIPT: "shell script"}
NONE = "–"
PARTS = {"run", "growth", "variants"}


@contextlib.contextmanager
def memory_folder() -> Iterator[Path]:
    """In memory if there is such a place, as a unit's /tmp is."""
    memory = Path("/dev/shm")
    place = memory if os.access(memory, os.W_OK) else None
    with tempfile.TemporaryDirectory(prefix="orvane-bench-", dir=place) as folder:
        yield Path(folder)


def left_by(root: Path, command: str) -> dict[str, bytes]:
    shutil.rmtree(root / "tmp")
    (root / "tmp").mkdir()
    interleave(root, (command,), 1, warm_up=0)
    return {path.name: path.read_bytes() for path in (root / "tmp").iterdir()}


def compare(root: Path) -> None:
    """Requires that all commands do the same work, or their times can't be compared."""
    expected = left_by(root, STATIC)
    if len(expected) != 6:
        raise SystemExit(f"bench: the tool left {sorted(expected)}")
    for command in (DYNAMIC, SCRIPT):
        found = left_by(root, command)
        if found != expected:
            differing = sorted(name for name in expected.keys() | found.keys()
                               if expected.get(name) != found.get(name))
            raise SystemExit(f"bench: {NAMES[command]} leaves other bytes in {differing}")
    if {name: len(content) for name, content in left_by(root, FLOOR).items()} != \
            {name: len(content) for name, content in expected.items()}:
        raise SystemExit("bench: the floor writes files of other lengths than the tool")


def whole_process(root: Path, runs: int) -> Table:
    compare(root)
    table = Table("", "wall, median", "to the floor", "instructions", "system calls", "page faults",
                  "peak KiB", "stripped bytes")
    timings = dict(zip(NAMES, interleave(root, tuple(NAMES), runs, warm_up=20)))
    for command, name in NAMES.items():
        timing = timings[command]
        is_script = command == SCRIPT
        table.add(name, f"{timing.median / 1000:.0f} µs", f"{timing.ratio(timings[FLOOR]):.2f}",
                  NONE if is_script else grouped(instructions(root, command)),
                  grouped(system_calls(root, command)), grouped(timing.faults),
                  grouped(peak(root, command)), NONE if is_script else grouped(size(root, command)))
    for name in ("static", "dynamic"):
        counted, calls = emulated(root, f"/bin/arm-{name} -a -i")
        table.add(f"orvane, {name}, ARM", NONE, NONE, grouped(counted), grouped(calls), NONE, NONE,
                  grouped(size(root, f"/bin/arm-{name}")))
    against = timings[SCRIPT].ratio(timings[STATIC])
    table.note = f"The script takes {against:.0f} times as long as the static tool."
    return table


def machine(runs: int) -> str:
    model = next((line.split(":")[1].strip() for line in
                  Path("/proc/cpuinfo").read_text().splitlines() if line.startswith("model name")),
                 platform.machine())
    compiler = call("g++", "--version").splitlines()[0]
    return (f"{model}, {os.cpu_count()} processors, Linux {platform.release().split('-')[0]}, "
            f"{compiler}, files in memory; {runs} counted runs of each whole run.")


def main() -> int:
    parser = argparse.ArgumentParser(description=__doc__)
    parser.add_argument("parts", nargs="*", default=sorted(PARTS),
                        help="run, growth, variants; all when none is named")
    parser.add_argument("--runs", type=int, default=500, help="counted runs of each command")
    parser.add_argument("--write", action="store_true", help="put the tables into the document")
    arguments = parser.parse_args()
    unknown = set(arguments.parts) - PARTS
    if unknown:
        parser.error(f"no such part: {', '.join(sorted(unknown))}")
    if arguments.write and set(arguments.parts) != PARTS:
        parser.error("the document's tables come from one run: --write takes no parts")

    programs = build()
    with memory_folder() as folder:
        root = folder / "unit"
        furnish(root, programs)
        tables: dict[str, Table] = {}
        if "run" in arguments.parts:
            tables["run"] = whole_process(root, arguments.runs)
        if "growth" in arguments.parts:
            tables["templates"] = growth.templates(root)
            tables["version files"] = growth.version_files(root)
            tables["long version file"] = growth.long_version_file(root)
        if "variants" in arguments.parts:
            tables["variants"] = variants.compare(root, folder, arguments.runs)
    for name, table in tables.items():
        print(f"\n{table.text()}", flush=True)
        if arguments.write:
            put_into(DOCUMENT, name, table.text())
    print(f"\n{machine(arguments.runs)}")
    if arguments.write:
        put_into(DOCUMENT, "machine", machine(arguments.runs))
    return 0


if __name__ == "__main__":
    sys.exit(main())
