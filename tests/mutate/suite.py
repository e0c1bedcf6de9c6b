# SPDX-License-Identifier: Apache-2.0
"""Runs the suite on a mutant: the unit tests, then random units, then failing system calls."""

from __future__ import annotations

import json
import shutil
import subprocess
import sys
import time
from dataclasses import dataclass
from pathlib import Path

from mutate.mutants import Mutant
from mutate.scratch import Broken, call, passes
from mutate.workshop import ORVANE, Base, Job, Program, TranslationUnit

TESTS = Program("orvane_tests", ("orvane_tests", "orvane_kit", "orvane_core"),
                ("tests/liborvane_gtest.a", "-Wl,--no-warnings"))

WHOLE_RUNS = "whole_runs"
DIFFERENTIAL = "differential"
DIFFERENTIAL_UNITS = 150

# Every system call fails once: this takes about a minute and comes last.
FAULTS = "faults"
FAULTS_TIME_LIMIT = 900

# A mutant is in an endless loop if it takes over TIME_LIMIT seconds and over TIME_FACTOR times the original's time.
TIME_LIMIT = 30
TIME_FACTOR = 10


def build_base(scratch: Path, jobs: int) -> Base:
    return Base(scratch, jobs, (ORVANE, TESTS), ("orvane-enter", "orvane-short-transfer"))


def read_suites(base: Base) -> dict[str, list[str]]:
    """By the folder of their file: the filters of the test suites."""
    listing = base.scratch / "tests.json"
    call([str(base.build / "tests/orvane_tests"), "--gtest_list_tests",
          f"--gtest_output=json:{listing}"], base.scratch)
    suites: dict[str, list[str]] = {}
    for suite in json.loads(listing.read_text())["testsuites"]:
        path = Path(suite["testsuite"][0]["file"]).relative_to(base.tree / "tests")
        suites.setdefault(path.parts[-2], []).append(f"{suite['name']}.*")
    return suites


@dataclass(frozen=True)
class Outcome:
    """`by`: "compiler", "time limit", the stage that failed, or "" when nothing noticed."""

    by: str


class SuiteJob(Job):
    """Its tool is where the tests look for it."""

    def __init__(self, base: Base, suites: dict[str, list[str]], number: int) -> None:
        super().__init__(base, number)
        self.suites = suites
        self.limits: dict[str, float] = {}
        self.own = {unit.object: self.compile(unit, "own") for unit in base.units
                    if "ORVANE_BINARY" in Path(unit.source).read_text(encoding="utf-8")}

    def command(self, unit: TranslationUnit, target: Path) -> list[str]:
        return [word.replace(f"{self.base.build}/orvane\"", f"{self.folder}/orvane\"")
                for word in super().command(unit, target)]

    def make(self, mutant: Mutant | None) -> None:
        """Raises Broken if the compiler refuses it."""
        self.lay(mutant)
        self.build(ORVANE, TESTS)

    def stages(self, folder: str) -> list[tuple[str, list[str]]]:
        """The tests next to `folder` come first, whole runs of the tool last."""
        suites = self.suites
        near = suites.get(folder, [])
        rest = [suite for name, group in sorted(suites.items()) if name != WHOLE_RUNS
                for suite in group if suite not in near]
        tests = str(self.folder / "orvane_tests")
        stages = [(name, [tests, "--gtest_fail_fast", f"--gtest_filter={':'.join(chosen)}"])
                  for name, chosen in ((folder, near), ("the rest", rest),
                                       (WHOLE_RUNS, suites.get(WHOLE_RUNS, []))) if chosen]
        return [*stages, (DIFFERENTIAL, [*self.driver(DIFFERENTIAL),
                                         "--units", str(DIFFERENTIAL_UNITS)])]

    def driver(self, name: str) -> list[str]:
        """The command of a driver, with this job's tool."""
        return [sys.executable, str(self.base.tree / "tests/drivers"), name, "--jobs", "1",
                "--orvane", str(self.folder / "orvane"),
                "--enter", str(self.base.build / "orvane-enter")]

    def faults(self) -> tuple[str, list[str]]:
        """The stage in which each system call fails once."""
        shorten = str(self.base.build / "tests/orvane-short-transfer")
        return FAULTS, [*self.driver(FAULTS), "--short-transfer", shorten]

    def run(self, command: list[str], limit: float) -> bool:
        scratch = self.temporary / "tmp"
        shutil.rmtree(scratch, ignore_errors=True)
        scratch.mkdir()
        return passes(command, self.folder / "output", scratch, limit)

    def check_original(self) -> None:
        """The whole suite must pass on the unchanged sources; this also measures its time."""
        self.make(None)
        self.check(self.stages(""))

    def check(self, stages: list[tuple[str, list[str]]]) -> None:
        for stage, command in stages:
            start = time.monotonic()
            try:
                if not self.run(command, FAULTS_TIME_LIMIT):
                    said = (self.folder / "output").read_text(errors="replace").splitlines()
                    raise Broken("\n".join([f"fails without any change: {stage}", *said[-40:]]))
            except subprocess.TimeoutExpired as error:
                raise Broken(f"does not end without any change: {stage}") from error
            self.limits[stage] = max(TIME_LIMIT, TIME_FACTOR * (time.monotonic() - start))

    def attempt(self, mutant: Mutant) -> Outcome:
        try:
            self.make(mutant)
        except Broken:
            return Outcome("compiler")
        return self.outcome(self.stages(mutant.path.split("/")[1]))

    def outcome(self, stages: list[tuple[str, list[str]]]) -> Outcome:
        for stage, command in stages:
            try:
                if not self.run(command, self.limits.get(stage, TIME_LIMIT)):
                    return Outcome(stage)
            except subprocess.TimeoutExpired:
                return Outcome("time limit")
        return Outcome("")

    def check_original_faults(self) -> None:
        self.make(None)
        self.check([self.faults()])

    def attempt_faults(self, mutant: Mutant) -> Outcome:
        """The result of the slowest tests, for a mutant that all others let pass."""
        self.make(mutant)
        self.limits[FAULTS] = FAULTS_TIME_LIMIT
        return self.outcome([self.faults()])
