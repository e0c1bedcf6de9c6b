# SPDX-License-Identifier: Apache-2.0
"""Checks orvane-unit's explain, describe and new against random units and runs of orvane in them.

For each unit: explain says what the run then leaves behind; each output and each value has the
reason codes of the faults in the unit; and the unit's description makes the same unit.

The units are made in TMPDIR. In memory that is several times as fast, and a folder in place of the
disk or the image fails there at another call.

Exit status: 0 all agree, 1 a difference or a code that never came up, 2 a tool could
not be run.
"""

from __future__ import annotations

import os
import random
import subprocess
from collections.abc import Callable, Sequence
from functools import partial
from pathlib import Path

from drivers import random_units, runner
from drivers.certain_units import CERTAIN_UNITS
from drivers.explain import explanation, reasons, same_tree
from drivers.random_units import Finding, Question, RandomUnit, UnitTools
from drivers.unit_tool import MARKER, MARKER_TEXT, Said
from drivers.units import make_unit
from model import snapshot
from model.prediction import parse_options
from model.tree import Tree


def ask(command: Sequence[str]) -> Said:
    try:
        done = subprocess.run(command, stdin=subprocess.DEVNULL, capture_output=True,
                              timeout=runner.TIME_LIMIT, close_fds=False, check=False)
    except subprocess.TimeoutExpired:
        return Said(-1, b"", b"(ran out of time)")
    except OSError as error:
        raise runner.BrokenRun(f"{command[0]}: {error.strerror}") from error
    return Said(done.returncode, done.stdout, done.stderr)


def make_marked_unit(root: Path, rng: random.Random) -> list[str]:
    """Returns the options of the run: those in the drawn arguments, or one of each if there are none."""
    arguments = make_unit(root, rng)
    mark(root)
    return [f"-{letter}" for letter in parse_options(arguments)[0] or "ai"]


def mark(root: Path) -> None:
    (root / MARKER).write_bytes(MARKER_TEXT)


def make_and_mark(make: Callable[[Path], Sequence[str]], root: Path) -> Sequence[str]:
    arguments = make(root)
    mark(root)
    return arguments


def letters_of(options: Sequence[str]) -> str:
    return "".join(option[1:] for option in options)


def ask_explain(unit_tool: str, root: Path, options: Sequence[str]
                ) -> tuple[explanation.Explanation | None, int, list[str]]:
    """What explain says, its exit status, and, if it says nothing usable, why."""
    said = ask([unit_tool, "explain", str(root), "--json", "--content", *options])
    if said.stderr or said.status not in (0, 1):
        return None, said.status, [f"explain: status {said.status}, said {said.stderr!r}"]
    try:
        return explanation.parse(said.stdout), said.status, []
    except (ValueError, KeyError, TypeError) as error:
        shown = said.stdout[:explanation.SHOWN]
        return None, said.status, [f"explain: {error!r}: {shown!r}"]


def explained(unit_tool: str, root: Path, options: Sequence[str],
              stages: Sequence[reasons.Stage]) -> tuple[explanation.Explanation | None, list[str]]:
    found, status, lines = ask_explain(unit_tool, root, options)
    if found is not None:
        faults = [*explanation.own_faults(found, os.fsencode(root), letters_of(options), status),
                  *explanation.reason_faults(found, stages)]
        lines = [f"explain: {line}" for line in faults]
    return found, lines


def described(unit_tool: str, root: Path, folder: Path) -> list[str]:
    said = ask([unit_tool, "describe", str(root)])
    if said.status != 0 or said.stderr:
        return [f"describe: status {said.status}, said {said.stderr!r}"]
    text, copy = folder / "unit.toml", folder / "copy"
    text.write_bytes(said.stdout)
    said = ask([unit_tool, "new", str(copy), "--from", str(text)])
    if said.status != 0 or said.stderr:
        return [f"new: status {said.status}, said {said.stderr!r}"]
    return [f"described and made again: {line}" for line in same_tree.differences(root, copy)]


def check(unit: RandomUnit, tools: UnitTools) -> Finding:
    root, options = unit.root, unit.arguments
    stages = reasons.stages(root, letters_of(options), tools.names)
    before = snapshot.take(root)
    found, lines = explained(tools.unit_tool, root, options, stages)
    lines += described(tools.unit_tool, root, root.parent)
    lines += [f"explain or describe: {line}"
              for line in snapshot.difference(before, snapshot.take(root))]
    result = runner.run(tools.command(root, options), root)
    if (result.status, result.stdout, result.stderr) != (0, b"", b""):
        lines.append(f"orvane: status {result.status}, said {result.stdout!r} {result.stderr!r}")
    if found is not None:
        lines += [f"after the run: {line}"
                  for line in explanation.left_faults(found, Tree(root))]
    reached = {code for stage in stages
               for codes in (stage.reasons, *(line.reasons for line in stage.lines))
               for code in codes}
    # Every generated output has its own text.
    if any(stage.outcome == "generated" for stage in stages):
        reached |= set(explanation.FIXED)
    return Finding(lines, frozenset(reached))


QUESTION = Question("explain", make_marked_unit, check, tuple(reasons.CODES),
                    certain=tuple(partial(make_and_mark, make) for make in CERTAIN_UNITS))


def main(arguments: Sequence[str]) -> int:
    return random_units.ask_with_unit_tool(QUESTION, __doc__ or "", arguments)
