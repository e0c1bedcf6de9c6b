# SPDX-License-Identifier: Apache-2.0
"""Two runs at once on one unit."""

from __future__ import annotations

import subprocess
from collections.abc import Mapping, Sequence
from dataclasses import dataclass
from pathlib import Path

from drivers import runner
from drivers.faults.scenarios import SCENARIOS, Scenario
from drivers.moments.call_stops import MASK, made_unit
from model import snapshot
from model.prediction import predict


@dataclass(frozen=True)
class Pair:
    scenario: int
    number: int
    tools: runner.Tools

    def __str__(self) -> str:
        return f"{SCENARIOS[self.scenario].name}, pair {self.number}"


def start(tools: runner.Tools, scenario: Scenario, root: Path) -> subprocess.Popen[bytes]:
    return subprocess.Popen(tools.command(root, scenario.arguments), stdin=subprocess.DEVNULL,
                            stdout=subprocess.PIPE, stderr=subprocess.PIPE)


def results(root: Path, processes: Sequence[subprocess.Popen[bytes]]) -> list[runner.Run]:
    said = [process.communicate(timeout=runner.TIME_LIMIT) for process in processes]
    after: Mapping[str, snapshot.Entry] = snapshot.take(root)
    return [runner.Run(process.returncode, *output, after) for process, output in zip(processes, said)]


def check(pair: Pair) -> tuple[Pair, list[str]]:
    """No lines when both are as one alone would be, and so is what they leave together."""
    scenario, tools = SCENARIOS[pair.scenario], pair.tools
    with made_unit(scenario) as root:
        prediction = predict(root, scenario.arguments, tools.names)
        before = snapshot.take(root)
        both = results(root, [start(tools, scenario, root) for _ in range(2)])
    return pair, [line for each in both for line in runner.differences(before, prediction, each, MASK)]
