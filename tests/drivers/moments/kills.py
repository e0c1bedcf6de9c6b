# SPDX-License-Identifier: Apache-2.0
"""Kills a run before each of its system calls."""

from __future__ import annotations

import signal
from collections.abc import Mapping
from dataclasses import dataclass

from drivers import runner
from drivers.faults.scenarios import SCENARIOS
from drivers.moments.call_stops import Tools, WholeRun, made_unit, run_with
from model import parts, snapshot
from model.snapshot import Entry

KILLED = 128 + signal.SIGKILL


@dataclass(frozen=True)
class Kill:
    scenario: int
    number: int
    whole: WholeRun
    tools: Tools

    def __str__(self) -> str:
        return f"{SCENARIOS[self.scenario].name}, killed before call {self.number} of {self.whole.calls}"


def is_beginning(have: Entry | None, before: Entry | None, whole: Entry | None) -> bool:
    """Whether an output may be so at the end of a killed run: as it was, or a beginning of what a whole run leaves."""
    if have == before:
        return True
    return (have is not None and whole is not None and (have.kind, have.mode) == (whole.kind, whole.mode) and
            whole.content.startswith(have.content))


def faults_after(before: Mapping[str, Entry], after: Mapping[str, Entry], whole: Mapping[str, Entry]) -> list[str]:
    """What a killed run must not have done."""
    lines = [f"{path}: neither as before nor a beginning of what a whole run leaves" for path in parts.OUTPUTS
             if not is_beginning(after.get(path), before.get(path), whole.get(path))]
    others = [{path: entry for path, entry in tree.items() if path not in parts.OUTPUTS} for tree in (before, after)]
    return lines + snapshot.difference(*others)


def outputs_of(tree: Mapping[str, Entry]) -> dict[str, Entry]:
    return {path: entry for path, entry in tree.items() if path in parts.OUTPUTS}


def check(kill: Kill) -> tuple[Kill, list[str]]:
    """No lines when the killed run leaves what it may, and the next one what a first run leaves."""
    scenario, tools = SCENARIOS[kill.scenario], kill.tools
    with made_unit(scenario) as root:
        before = snapshot.take(root)
        killed, calls = run_with(tools, scenario, root, kill.number, "kill -KILL $1")
        again = runner.run(tools.command(root, scenario.arguments), root)
    lines = faults_after(before, killed.after, kill.whole.after)
    if (killed.status, calls) != (KILLED, kill.number):
        lines.append(f"status {killed.status} after {calls} calls")
    if (again.status, again.stdout, again.stderr) != (0, b"", kill.whole.stderr):
        lines.append(f"the next run: status {again.status}, {again.stdout!r}, {again.stderr!r}")
    return kill, lines + [f"the next run: {line}" for line in
                          snapshot.difference(outputs_of(kill.whole.after), outputs_of(again.after))]
