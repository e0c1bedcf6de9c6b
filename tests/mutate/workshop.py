# SPDX-License-Identifier: Apache-2.0
"""Builds the unchanged project once, and then what one mutant changes; runs the suite on it.

Everything lies in one scratch folder: tree/ (a copy of the project), base/ (its build), and a
folder for each job with the sources, objects and programs of the mutant at hand.
"""

from __future__ import annotations

import json
import os
import shlex
import shutil
import subprocess
import sys
import tempfile
import time
from dataclasses import dataclass
from pathlib import Path

from mutate.mutants import Mutant
from mutate.scratch import Broken, call, passes

# The assertions are those of the debug build, which is part of the suite; its sanitizers are left
# out for their time.
CONFIGURATION = ("-DCMAKE_CXX_COMPILER=g++", "-DCMAKE_BUILD_TYPE=Debug",
                 "-DCMAKE_CXX_FLAGS=-O0 -w -D_GLIBCXX_ASSERTIONS", "-DCMAKE_CXX_FLAGS_DEBUG=",
                 "-DCMAKE_EXE_LINKER_FLAGS=-static", "-DORVANE_KIT=ON", "-DORVANE_TESTS=ON",
                 "-DORVANE_TEST_FOLDERS=product;whole_runs",
                 "-DORVANE_FAULTS=ON")
PROGRAMS = ("orvane", "orvane-enter", "orvane_tests", "orvane-short-transfer")

WHOLE_RUNS = "whole_runs"
DIFFERENTIAL = "differential"
DIFFERENTIAL_UNITS = 150

# Every system call fails once: this takes about a minute and comes last.
FAULTS = "faults"
FAULTS_TIME_LIMIT = 900

# A mutant that takes so much longer than the original runs in an endless loop.
TIME_LIMIT = 30
TIME_FACTOR = 10


@dataclass(frozen=True)
class Unit:
    """One translation unit of the base build."""

    source: str
    object: str
    command: tuple[str, ...]
    depends: frozenset[str]


@dataclass(frozen=True)
class Outcome:
    """`by`: "compiler", "time limit", the stage that failed, or "" when nothing noticed."""

    by: str


class Base:
    """The unchanged project, built, and what it is made of."""

    def __init__(self, scratch: Path, jobs: int) -> None:
        self.scratch = scratch
        self.tree = scratch / "tree"
        self.build = scratch / "base"
        call(["cmake", "-S", str(self.tree), "-B", str(self.build), "-G", "Ninja",
              *CONFIGURATION], scratch)
        call(["ninja", "-C", str(self.build), "-j", str(jobs), *PROGRAMS], scratch)
        self.units = self.read_units()
        self.suites = self.read_suites()

    def read_units(self) -> list[Unit]:
        depends: dict[str, set[str]] = {}
        current: set[str] = set()
        for line in call(["ninja", "-C", str(self.build), "-t", "deps"], self.scratch).splitlines():
            if ": #deps" in line:
                current = depends.setdefault(line.split(": #deps")[0], set())
            elif line.strip().startswith(f"{self.tree}/src/"):
                current.add(Path(line.strip()).relative_to(self.tree).as_posix())
        units = []
        for entry in json.loads((self.build / "compile_commands.json").read_text()):
            command = tuple(shlex.split(entry["command"]))
            target = command[command.index("-o") + 1]
            if any(f"{program}.dir/" in target for program in
                   ("orvane", "orvane_core", "orvane_kit", "orvane_tests")) and \
                    not target.endswith(".gch"):
                units.append(Unit(entry["file"], target, command,
                                  frozenset(depends.get(target, set()))))
        return units

    def read_suites(self) -> dict[str, list[str]]:
        """By the folder of their file: the filters of the test suites."""
        listing = self.scratch / "tests.json"
        call([str(self.build / "tests/orvane_tests"), "--gtest_list_tests",
              f"--gtest_output=json:{listing}"], self.scratch)
        suites: dict[str, list[str]] = {}
        for suite in json.loads(listing.read_text())["testsuites"]:
            path = Path(suite["testsuite"][0]["file"]).relative_to(self.tree / "tests")
            suites.setdefault(path.parts[-2], []).append(f"{suite['name']}.*")
        return suites


class Job:
    """Makes and tries one mutant at a time. Its tool lies where its tests look for it."""

    def __init__(self, base: Base, number: int) -> None:
        self.base = base
        self.folder = base.scratch / f"job{number}"
        shutil.rmtree(self.folder, ignore_errors=True)
        self.folder.mkdir(parents=True)
        # Disk images and trees of small files: in memory where there is such a place.
        memory = Path("/dev/shm")
        place = memory if os.access(memory, os.W_OK) else self.folder
        self.temporary = Path(tempfile.mkdtemp(prefix="orvane-mutate-", dir=place))
        self.own = {unit.object: self.compile(unit, "", "own") for unit in base.units
                    if "ORVANE_BINARY" in Path(unit.source).read_text(encoding="utf-8")}
        self.objects: dict[str, str] = {}
        self.limits: dict[str, float] = {}

    def close(self) -> None:
        shutil.rmtree(self.temporary, ignore_errors=True)

    def command(self, unit: Unit, mutated: str, target: Path) -> list[str]:
        """As the base compiles it, but with the mutated file, and with this job's tool."""
        tree, overlay = self.base.tree, self.folder / "overlay"
        words = [word.replace(f"{self.base.build}/orvane\"", f"{self.folder}/orvane\"")
                 for word in unit.command]
        words[words.index("-o") + 1] = str(target)
        if unit.source == str(tree / mutated):
            words[words.index("-c") + 1] = str(overlay / mutated)
        return [words[0], f"-I{overlay / 'src'}", *words[1:]]

    def compile(self, unit: Unit, mutated: str, kind: str) -> str:
        target = self.folder / kind / unit.object
        target.parent.mkdir(parents=True, exist_ok=True)
        call(self.command(unit, mutated, target), self.base.build)
        return str(target)

    def link(self) -> None:
        def objects(*programs: str) -> list[str]:
            return [self.objects.get(unit.object) or self.own.get(unit.object) or unit.object
                    for unit in self.base.units
                    if any(f"/{program}.dir/" in unit.object for program in programs)]

        for target, parts in (
                ("orvane", objects("orvane", "orvane_core")),
                ("orvane_tests", [*objects("orvane_tests", "orvane_kit", "orvane_core"),
                                  "tests/liborvane_gtest.a", "-Wl,--no-warnings"])):
            call(["g++", "-static", *parts, "-o", str(self.folder / target)], self.base.build)

    def make(self, mutant: Mutant) -> None:
        """Broken when the compiler refuses it."""
        overlay = self.folder / "overlay"
        for folder in (overlay, self.folder / "changed"):
            shutil.rmtree(folder, ignore_errors=True)
        (overlay / mutant.path).parent.mkdir(parents=True)
        (overlay / mutant.path).write_text(mutant.text, encoding="utf-8")
        self.objects = {}
        # The product's own objects come first, so that what can't be compiled ends soon.
        for unit in sorted(self.base.units, key=lambda each: not each.object.startswith("src/")):
            if mutant.path in unit.depends:
                self.objects[unit.object] = self.compile(unit, mutant.path, "changed")
        self.link()

    def stages(self, folder: str) -> list[tuple[str, list[str]]]:
        """The tests that stand next to `folder` come first, whole runs of the tool last."""
        suites = self.base.suites
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
        """A driver, on this job's tool."""
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
        """The whole suite on the unchanged sources must pass; it also says how long it takes."""
        self.objects = {}
        self.link()
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
        self.objects = {}
        self.link()
        self.check([self.faults()])

    def attempt_faults(self, mutant: Mutant) -> Outcome:
        """What the slowest tests say of a mutant that all others let pass."""
        self.make(mutant)
        self.limits[FAULTS] = FAULTS_TIME_LIMIT
        return self.outcome([self.faults()])
