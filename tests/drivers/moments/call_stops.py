# SPDX-License-Identifier: Apache-2.0
"""Runs the tool, and does something when it is about to make one of its system calls."""

from __future__ import annotations

import contextlib
import tempfile
from collections.abc import Iterator
from dataclasses import dataclass
from pathlib import Path

from drivers import runner
from drivers.faults.scenarios import Scenario
from model import snapshot
from model.prediction import predict
from model.snapshot import Entry

# An action that leaves the run alone.
NOTHING = "true"

# The file creation mask of the runs.
MASK = 0o022


@dataclass(frozen=True)
class Tools(runner.Tools):
    at_call: str


@contextlib.contextmanager
def made_unit(scenario: Scenario) -> Iterator[Path]:
    """The root of a unit of the scenario, in a temporary folder with room beside it."""
    with tempfile.TemporaryDirectory(prefix="orvane moment-") as folder:
        root = Path(folder) / "unit"
        root.mkdir()
        scenario.make(root)
        yield root


def run_with(tools: Tools, scenario: Scenario, root: Path, number: int = 0,
             action: str = NOTHING) -> tuple[runner.Run, int]:
    """The run, in which the shell ran `action` right before a call, and the number of its calls."""
    report = root.with_name("report")
    command = tools.command(root, scenario.arguments)
    result = runner.run([tools.at_call, str(report), str(number), action, *command], root)
    return result, int(report.read_text())


@dataclass(frozen=True)
class WholeRun:
    """A run that nothing disturbs."""

    calls: int
    before: dict[str, Entry]
    after: dict[str, Entry]
    stderr: bytes


def whole_run(tools: Tools, scenario: Scenario) -> WholeRun:
    """It must be as the model predicts, or nothing can be said about the others."""
    with made_unit(scenario) as root:
        prediction = predict(root, scenario.arguments, tools.names)
        before = snapshot.take(root)
        result, calls = run_with(tools, scenario, root)
    lines = runner.differences(before, prediction, result, MASK)
    if lines or calls == 0:
        raise runner.BrokenRun(f"{scenario.name}, undisturbed, {calls} calls:\n  " + "\n  ".join(lines))
    return WholeRun(calls, before, dict(result.after), result.stderr)
