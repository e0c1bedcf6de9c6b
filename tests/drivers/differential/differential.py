# SPDX-License-Identifier: Apache-2.0
"""Runs orvane in random units and compares each with what the model predicts.

Exit status: 0 all agree, 1 a difference or an outcome that never came up, 2 the
tool could not be run.
"""

from __future__ import annotations

import argparse
import multiprocessing
import os
import random
import tempfile
from collections import Counter
from collections.abc import Sequence
from dataclasses import dataclass, field
from pathlib import Path

from drivers import runner
from drivers.units import make_unit
from model import parts, snapshot
from model.identity import load_names
from model.prediction import predict

# From this many units on, an outcome that never came up is an error.
ENOUGH_UNITS = 200

# So many units go to a worker at a time.
CHUNK = 20

# Neither of these may make a difference, beyond the modes of files.
ENVIRONMENTS = ({}, {}, {"POSIXLY_CORRECT": "1"}, {"LC_ALL": "de_DE.UTF-8", "TMPDIR": "/fs"})
MASKS = (0o022, 0o022, 0o000, 0o027, 0o077, 0o002)


@dataclass
class Report:
    """`reached` counts units by output and by how that output came about."""

    index: int
    lines: list[str]
    arguments: list[str]
    broken: bool = False
    reached: Counter[tuple[str, str]] = field(default_factory=Counter)


@dataclass(frozen=True)
class Task:
    index: int
    seed: str
    orvane: str
    enter: tuple[str, ...]
    names: tuple[str, ...]


def generator(seed: str, index: int) -> random.Random:
    return random.Random(f"{seed}:{index}")


def check_unit(task: Task, root: Path) -> Report:
    """Makes the unit in `root`, which is left as the run leaves it."""
    rng = generator(task.seed, task.index)
    arguments = make_unit(root, rng)
    mask = rng.choice(MASKS)
    environment = rng.choice(ENVIRONMENTS)
    prediction = predict(root, arguments, task.names)
    before = snapshot.take(root)
    os.umask(mask)
    try:
        result = runner.run([*task.enter, str(root), task.orvane, *arguments], root, environment)
    except runner.BrokenRun as error:
        return Report(task.index, [str(error)], arguments, broken=True)
    finally:
        os.umask(0o022)
    lines = runner.differences(before, prediction, result, mask)
    reached = Counter(prediction.alternatives[0].ways.items())
    return Report(task.index, lines, arguments, reached=reached)


def check(task: Task) -> Report:
    with tempfile.TemporaryDirectory(prefix="orvane unit-") as folder:
        return check_unit(task, Path(folder))


def keep_unit(keep: Path, seed: str, index: int) -> Path:
    """A fresh copy of the unit, not run in."""
    root = keep / f"unit-{seed}-{index}"
    if root.exists():
        raise SystemExit(f"{root} is already there")
    root.mkdir(parents=True)
    make_unit(root, generator(seed, index))
    return root


def print_coverage(reached: Counter[tuple[str, str]]) -> list[str]:
    """Prints how often each output came about in each way; returns what is missing.

    The fallback of a tuning file is that of a disk that can't be read.
    """
    missing = []
    for output in parts.OUTPUTS:
        counts = {way: reached[output, way] for way in ("generated", "fallback")}
        print(f"  {output:26}" + "".join(f"  {way} {n:6}" for way, n in counts.items()))
        missing += [f"{output}: never {way}" for way, n in counts.items() if n == 0]
    return missing


def print_difference(report: Report, options: argparse.Namespace) -> None:
    keep = options.keep or Path(tempfile.mkdtemp(prefix="orvane kept-"))
    print(f"differential: unit {report.index} of seed {options.seed}, "
          f"arguments {report.arguments!r}")
    for line in report.lines:
        print(f"  {line}")
    print(f"  kept, and not run: {keep_unit(keep, options.seed, report.index)}")
    again = runner.again("differential", options, "--seed", options.seed,
                         "--only", report.index, "--keep", "DIR")
    print(f"  again: {again}")


def parse_arguments(arguments: Sequence[str]) -> argparse.Namespace:
    parser = argparse.ArgumentParser("differential", description=__doc__)
    runner.add_arguments(parser)
    parser.add_argument("--units", type=int, default=500)
    parser.add_argument("--seed", default="1", help='"random" draws one')
    parser.add_argument("--only", type=int, help="the number of one single unit")
    parser.add_argument("--keep", type=Path, help="where a unit that differs is kept")
    parser.add_argument("--jobs", type=int, default=2)
    options = parser.parse_args(arguments)
    if options.seed == "random":
        options.seed = str(random.SystemRandom().randrange(10**9))
        print(f"differential: seed {options.seed}")
    return options


def main(arguments: Sequence[str]) -> int:
    options = parse_arguments(arguments)
    names = tuple(load_names())
    enter = runner.launcher(options)
    indices = range(options.units) if options.only is None else [options.only]
    tasks = [Task(index, options.seed, options.orvane, enter, names)
             for index in indices]
    reached: Counter[tuple[str, str]] = Counter()
    with multiprocessing.Pool(options.jobs) as pool:
        for report in pool.imap(check, tasks, CHUNK):
            if report.broken:
                print(f"differential: unit {report.index} was not run: {report.lines[0]}")
                return 2
            if report.lines:
                print_difference(report, options)
                return 1
            reached += report.reached
    missing = print_coverage(reached) if options.only is None else []
    print(f"differential: {len(tasks)} units, 0 differences (seed {options.seed})")
    if options.only is not None and options.keep is not None:
        print(f"  kept, and not run: {keep_unit(options.keep, options.seed, options.only)}")
    if missing and len(tasks) >= ENOUGH_UNITS:
        print("\n".join(f"differential: {line}" for line in missing))
        return 1
    return 0
