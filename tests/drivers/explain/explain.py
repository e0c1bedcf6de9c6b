# SPDX-License-Identifier: Apache-2.0
"""Holds orvane-unit's explain, describe and new against random units and runs of orvane in them.

For each unit: explain says what the run then leaves behind; each output and each
value has the reason codes of the faults that were laid; and the unit's description
makes the same unit.

The units are made where TMPDIR says. In memory that is several times as fast, and what
stands as a folder for the disk or the image fails there at another call.

Exit status: 0 all agree, 1 a difference or a code that never came up, 2 a tool could
not be run.
"""

from __future__ import annotations

import argparse
import multiprocessing
import os
import random
import subprocess
import tempfile
from collections import Counter
from collections.abc import Sequence
from dataclasses import dataclass, field
from pathlib import Path

from drivers import runner
from drivers.differential.differential import generator
from drivers.explain import explanation, reasons, same_tree
from drivers.units import make_unit
from model import snapshot
from model.identity import load_names
from model.prediction import parse_options
from model.tree import Tree

MARKER = ".orvane-unit"
MARKER_TEXT = b"made by orvane-unit, layout 1\n"

# From this many units on, a code that never came up is an error.
ENOUGH_UNITS = 1000

# So many units go to a worker at a time.
CHUNK = 20

# Units with a difference before the rest is left alone.
MOST_DIFFERENCES = 10


@dataclass
class Report:
    """`reached` holds the reason codes that the unit must have, each once."""

    index: int
    lines: list[str]
    letters: str
    broken: bool = False
    reached: Counter[str] = field(default_factory=Counter)


@dataclass(frozen=True)
class Task:
    index: int
    seed: str
    orvane: str
    enter: tuple[str, ...]
    unit_tool: str
    names: tuple[str, ...]


@dataclass(frozen=True)
class Said:
    status: int
    stdout: bytes
    stderr: bytes


def ask(command: Sequence[str]) -> Said:
    try:
        done = subprocess.run(command, stdin=subprocess.DEVNULL, capture_output=True,
                              timeout=runner.TIME_LIMIT, close_fds=False, check=False)
    except subprocess.TimeoutExpired:
        return Said(-1, b"", b"(ran out of time)")
    except OSError as error:
        raise runner.BrokenRun(f"{command[0]}: {error.strerror}") from error
    return Said(done.returncode, done.stdout, done.stderr)


def make_marked_unit(root: Path, seed: str, index: int) -> str:
    """Returns the letters of the run: those in the arguments, else one of each."""
    arguments = make_unit(root, generator(seed, index))
    (root / MARKER).write_bytes(MARKER_TEXT)
    return "".join(parse_options(arguments)[0]) or "ai"


def flags(letters: str) -> list[str]:
    return [f"-{letter}" for letter in letters]


def explained(task: Task, root: Path, letters: str,
              stages: Sequence[reasons.Stage]) -> tuple[explanation.Explanation | None, list[str]]:
    said = ask([task.unit_tool, "explain", str(root), "--json", "--content", *flags(letters)])
    if said.stderr or said.status not in (0, 1):
        return None, [f"explain: status {said.status}, said {said.stderr!r}"]
    try:
        found = explanation.parse(said.stdout)
    except (ValueError, KeyError, TypeError) as error:
        return None, [f"explain: {error!r}: {said.stdout[:explanation.SHOWN]!r}"]
    lines = explanation.own_faults(found, os.fsencode(root), letters, said.status)
    return found, [f"explain: {line}" for line in
                   lines + explanation.reason_faults(found, stages)]


def described(task: Task, root: Path, folder: Path) -> list[str]:
    said = ask([task.unit_tool, "describe", str(root)])
    if said.status != 0 or said.stderr:
        return [f"describe: status {said.status}, said {said.stderr!r}"]
    text, copy = folder / "unit.toml", folder / "copy"
    text.write_bytes(said.stdout)
    said = ask([task.unit_tool, "new", str(copy), "--from", str(text)])
    if said.status != 0 or said.stderr:
        return [f"new: status {said.status}, said {said.stderr!r}"]
    return [f"described and made again: {line}" for line in same_tree.differences(root, copy)]


def check_unit(task: Task, folder: Path) -> Report:
    root = folder / "unit"
    letters = make_marked_unit(root, task.seed, task.index)
    stages = reasons.stages(root, letters, task.names)
    before = snapshot.take(root)
    try:
        found, lines = explained(task, root, letters, stages)
        lines += described(task, root, folder)
        lines += [f"explain or describe: {line}"
                  for line in snapshot.difference(before, snapshot.take(root))]
        result = runner.run([*task.enter, str(root), task.orvane, *flags(letters)], root)
    except runner.BrokenRun as error:
        return Report(task.index, [str(error)], letters, broken=True)
    if (result.status, result.stdout, result.stderr) != (0, b"", b""):
        lines.append(f"orvane: status {result.status}, said {result.stdout!r} {result.stderr!r}")
    if found is not None:
        lines += [f"after the run: {line}"
                  for line in explanation.left_faults(found, Tree(root))]
    # Every output has text of its own as soon as it is generated.
    reached = {code for stage in stages
               for codes in (stage.reasons, *(line.reasons for line in stage.lines))
               for code in codes}
    if any(stage.outcome == "generated" for stage in stages):
        reached |= set(explanation.FIXED)
    return Report(task.index, lines, letters, reached=Counter(reached))


def check(task: Task) -> Report:
    with tempfile.TemporaryDirectory(prefix="orvane unit-") as folder:
        return check_unit(task, Path(folder))


def keep_unit(keep: Path, seed: str, index: int) -> Path:
    """A fresh copy of the unit, not run in."""
    root = keep / f"unit-{seed}-{index}"
    if root.exists():
        raise SystemExit(f"{root} is already there")
    root.mkdir(parents=True)
    make_marked_unit(root, seed, index)
    return root


def print_difference(report: Report, options: argparse.Namespace) -> None:
    keep = options.keep or Path(tempfile.mkdtemp(prefix="orvane kept-"))
    print(f"explain: unit {report.index} of seed {options.seed}, "
          f"{' '.join(flags(report.letters))}")
    for line in report.lines:
        print(f"  {line}")
    print(f"  kept, and not run: {keep_unit(keep, options.seed, report.index)}")
    again = runner.again("explain", options, "--unit-tool", options.unit_tool,
                         "--seed", options.seed, "--only", report.index, "--keep", "DIR")
    print(f"  again: {again}")


def print_coverage(reached: Counter[str]) -> list[str]:
    """Prints how many units had each code; returns the codes that none had."""
    for code in reasons.CODES:
        print(f"  {code:24} {reached[code]:6}")
    return [code for code in reasons.CODES if reached[code] == 0]


def parse_arguments(arguments: Sequence[str]) -> argparse.Namespace:
    parser = argparse.ArgumentParser("explain", description=__doc__)
    runner.add_arguments(parser)
    parser.add_argument("--unit-tool", required=True, help="orvane-unit")
    parser.add_argument("--units", type=int, default=1000)
    parser.add_argument("--seed", default="1", help='"random" draws one')
    parser.add_argument("--only", type=int, help="the number of one single unit")
    parser.add_argument("--keep", type=Path, help="where a unit that differs is kept")
    parser.add_argument("--jobs", type=int, default=2)
    options = parser.parse_args(arguments)
    if options.seed == "random":
        options.seed = str(random.SystemRandom().randrange(10**9))
        print(f"explain: seed {options.seed}")
    return options


def main(arguments: Sequence[str]) -> int:
    options = parse_arguments(arguments)
    names = tuple(load_names())
    enter = runner.launcher(options)
    indices = range(options.units) if options.only is None else [options.only]
    tasks = [Task(index, options.seed, options.orvane, enter, options.unit_tool, names)
             for index in indices]
    reached: Counter[str] = Counter()
    differing = 0
    with multiprocessing.Pool(options.jobs) as pool:
        for report in pool.imap(check, tasks, CHUNK):
            if report.broken:
                print(f"explain: unit {report.index} was not run: {report.lines[0]}")
                return 2
            if report.lines:
                print_difference(report, options)
                differing += 1
                if differing == MOST_DIFFERENCES:
                    print("explain: the other units were left alone")
                    return 1
            reached += report.reached
    missing = print_coverage(reached) if options.only is None else []
    print(f"explain: {len(tasks)} units, {differing} with a difference (seed {options.seed})")
    if options.only is not None and options.keep is not None and not differing:
        print(f"  kept, and not run: {keep_unit(options.keep, options.seed, options.only)}")
    if missing and len(tasks) >= ENOUGH_UNITS:
        print("\n".join(f"explain: never {code}" for code in missing))
        return 1
    return 1 if differing else 0
