# SPDX-License-Identifier: Apache-2.0
"""What drivers of random units share: the units, a pool of workers, the reports."""

from __future__ import annotations

import argparse
import random
import tempfile
from collections import Counter
from collections.abc import Callable, Sequence
from dataclasses import dataclass
from functools import partial
from pathlib import Path
from typing import Any

from drivers import runner

# How many units a worker gets at a time.
CHUNK = 20

# After this many units with a difference, the rest is skipped.
MOST_DIFFERENCES = 10


@dataclass(frozen=True)
class RandomUnit:
    """A unit as it was made, the arguments of its run, and the generator for further choices.

    `root` is the only entry of its folder, so a check may make files beside it.
    """

    root: Path
    arguments: Sequence[str]
    rng: random.Random


@dataclass(frozen=True)
class Finding:
    """`lines` say what is wrong, `reached` are the outcomes of this unit."""

    lines: Sequence[str]
    reached: frozenset[str]


@dataclass(frozen=True)
class Question:
    """What a driver checks in each unit.

    `make` fills an empty folder and returns the arguments of the run. So does each of `certain`, for the first
    units, which are not random. `check` gets the tools of the driver; it raises BrokenRun if a tool could not
    be run. Some unit must reach each of `outcomes` if there are `enough_units`.
    """

    name: str
    make: Callable[[Path, random.Random], Sequence[str]]
    check: Callable[[RandomUnit, Any], Finding]
    outcomes: Sequence[str]
    enough_units: int = 0
    certain: Sequence[Callable[[Path], Sequence[str]]] = ()

    def fill(self, root: Path, rng: random.Random, index: int) -> Sequence[str]:
        """Makes the unit with this number, and returns the arguments of its run."""
        return self.certain[index](root) if index < len(self.certain) else self.make(root, rng)


@dataclass(frozen=True)
class Report:
    """`broken` says why a unit was not run; there is no finding then."""

    index: int
    arguments: Sequence[str]
    finding: Finding
    broken: str = ""


def generator(seed: str, index: int) -> random.Random:
    return random.Random(f"{seed}:{index}")


def _check(question: Question, tools: Any, seed: str, index: int) -> Report:
    with tempfile.TemporaryDirectory(prefix="orvane unit-") as folder:
        root = Path(folder) / "unit"
        root.mkdir()
        rng = generator(seed, index)
        arguments = question.fill(root, rng, index)
        try:
            return Report(index, arguments, question.check(RandomUnit(root, arguments, rng), tools))
        except runner.BrokenRun as error:
            return Report(index, arguments, Finding((), frozenset()), str(error))


def _keep(question: Question, keep: Path, seed: str, index: int) -> Path:
    """A new copy of the unit, in which nothing has run."""
    root = keep / f"unit-{seed}-{index}"
    if root.exists():
        raise SystemExit(f"{root} is already there")
    root.mkdir(parents=True)
    question.fill(root, generator(seed, index), index)
    return root


def _print_difference(question: Question, report: Report, options: argparse.Namespace,
                      more: Sequence[str]) -> None:
    keep = options.keep or Path(tempfile.mkdtemp(prefix="orvane kept-"))
    print(f"{question.name}: unit {report.index} of seed {options.seed}, "
          f"arguments {list(report.arguments)!r}")
    for line in report.finding.lines:
        print(f"  {line}")
    print(f"  kept, and not run: {_keep(question, keep, options.seed, report.index)}")
    again = runner.again(question.name, options, *more, "--seed", options.seed,
                         "--only", report.index, "--keep", "DIR")
    print(f"  again: {again}")


def _print_outcomes(question: Question, reached: Counter[str]) -> list[str]:
    """Prints how many units had each outcome; returns those that none had."""
    width = max(map(len, question.outcomes))
    for outcome in question.outcomes:
        print(f"  {outcome:{width}} {reached[outcome]:6}")
    return [outcome for outcome in question.outcomes if reached[outcome] == 0]


def add_arguments(parser: argparse.ArgumentParser, units: int) -> None:
    """The arguments of every driver of random units; `units` is the usual number of units."""
    runner.add_arguments(parser)
    parser.add_argument("--units", type=int, default=units, help="how many random ones")
    parser.add_argument("--seed", default="1", help='"random" draws one')
    parser.add_argument("--only", type=int, help="the number of a single unit")
    parser.add_argument("--keep", type=Path, help="folder for units that differ")
    parser.add_argument("--jobs", type=int, default=2)


def ask(question: Question, tools: Any, options: argparse.Namespace, *more: str) -> int:
    """Returns the exit status: 0 no difference, 1 a difference or an outcome that never came up, 2
    a unit was not run. `more` are the driver's arguments beyond those of add_arguments."""
    if options.seed == "random":
        options.seed = str(random.SystemRandom().randrange(10**9))
        print(f"{question.name}: seed {options.seed}")
    single = options.only is not None
    indices = [options.only] if single else range(len(question.certain) + options.units)
    reached: Counter[str] = Counter()
    differing = 0
    with runner.workers(options.jobs) as pool:
        for report in pool.map(partial(_check, question, tools, options.seed), indices, chunksize=CHUNK):
            if report.broken:
                print(f"{question.name}: unit {report.index} was not run: {report.broken}")
                return 2
            if report.finding.lines:
                _print_difference(question, report, options, more)
                differing += 1
                if differing == MOST_DIFFERENCES:
                    print(f"{question.name}: the other units were skipped")
                    return 1
            reached.update(report.finding.reached)
    missing = [] if single else _print_outcomes(question, reached)
    print(f"{question.name}: {len(indices)} units, {differing} with a difference "
          f"(seed {options.seed})")
    if single and options.keep is not None and not differing:
        print(f"  kept, and not run: {_keep(question, options.keep, options.seed, options.only)}")
    if missing and len(indices) >= question.enough_units:
        print("\n".join(f"{question.name}: never {outcome}" for outcome in missing))
        return 1
    return 1 if differing else 0


@dataclass(frozen=True)
class UnitTools(runner.Tools):
    """The tool, and orvane-unit."""

    unit_tool: str


def ask_with_unit_tool(question: Question, description: str, arguments: Sequence[str]) -> int:
    """The main function of a driver of UnitTools. Returns the exit status, as `ask`."""
    parser = argparse.ArgumentParser(question.name, description=description)
    add_arguments(parser, units=1000)
    parser.add_argument("--unit-tool", required=True, help="orvane-unit")
    options = parser.parse_args(arguments)
    common = runner.tools(options)
    tools = UnitTools(common.orvane, common.enter, common.names, options.unit_tool)
    return ask(question, tools, options, "--unit-tool", options.unit_tool)
