# SPDX-License-Identifier: Apache-2.0
"""Builds the unchanged project once, and then the programs that one mutant changes.

Everything is in one scratch folder: tree/ (a copy of the project), base/ (its build), and a folder
for each job with the sources, objects and programs of its current mutant.
"""

from __future__ import annotations

import json
import os
import shlex
import shutil
import tempfile
from collections.abc import Sequence
from dataclasses import dataclass
from pathlib import Path

from mutate.mutants import Mutant
from mutate.scratch import call

# The assertions are those of the debug build, which is part of the suite; its sanitizers would take too long.
CONFIGURATION = ("-DCMAKE_CXX_COMPILER=g++", "-DCMAKE_BUILD_TYPE=Debug",
                 "-DCMAKE_CXX_FLAGS_DEBUG=",
                 "-DCMAKE_EXE_LINKER_FLAGS=-static", "-DORVANE_KIT=ON", "-DORVANE_TESTS=ON",
                 "-DORVANE_TEST_FOLDERS=product;whole_runs",
                 "-DORVANE_FAULTS_EVERY=5")


CXX_FLAGS = "-O0 -w -D_GLIBCXX_ASSERTIONS"


@dataclass(frozen=True)
class Program:
    """`targets` are the build's targets whose objects it is linked from, `words` follow them."""

    name: str
    targets: tuple[str, ...]
    words: tuple[str, ...] = ()

    def holds(self, compiled: str) -> bool:
        return any(f"/{target}.dir/" in compiled for target in self.targets)


ORVANE = Program("orvane", ("orvane", "orvane_core"))


@dataclass(frozen=True)
class TranslationUnit:
    """A translation unit of the base build. `depends` are the sources of the product that it includes."""

    source: str
    object: str
    command: tuple[str, ...]
    depends: frozenset[str]


class Base:
    """The unchanged project, built, and its parts.

    `programs` are rebuilt for each mutant, `others` only here. `more_flags` are the compiler's.
    """

    def __init__(self, scratch: Path, jobs: int, programs: Sequence[Program],
                 others: Sequence[str], more_flags: str = "") -> None:
        self.scratch = scratch
        self.tree = scratch / "tree"
        self.build = scratch / "base"
        self.programs = programs
        call(["cmake", "-S", str(self.tree), "-B", str(self.build), "-G", "Ninja",
              *CONFIGURATION, f"-DCMAKE_CXX_FLAGS={CXX_FLAGS} {more_flags}"], scratch)
        call(["ninja", "-C", str(self.build), "-j", str(jobs),
              *(program.name for program in programs), *others], scratch)
        self.units = self.read_units()

    def read_units(self) -> list[TranslationUnit]:
        """The product's own come first, so that a mutant that does not compile ends soon."""
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
            if any(program.holds(target) for program in self.programs) and \
                    not target.endswith(".gch"):
                units.append(TranslationUnit(entry["file"], target, command,
                                             frozenset(depends.get(target, set()))))
        return sorted(units, key=lambda unit: not unit.object.startswith("src/"))


class Job:
    """Makes one mutant at a time, and programs from it."""

    def __init__(self, base: Base, number: int) -> None:
        self.base = base
        self.folder = base.scratch / f"job{number}"
        shutil.rmtree(self.folder, ignore_errors=True)
        self.folder.mkdir(parents=True)
        # Disk images and trees of small files: in memory if possible.
        memory = Path("/dev/shm")
        place = memory if os.access(memory, os.W_OK) else self.folder
        self.temporary = Path(tempfile.mkdtemp(prefix="orvane-mutate-", dir=place))
        self.mutated = ""
        # Replacements by the base's object: for every mutant, and for this mutant.
        self.own: dict[str, str] = {}
        self.changed: dict[str, str] = {}

    def close(self) -> None:
        shutil.rmtree(self.temporary, ignore_errors=True)

    def lay(self, mutant: Mutant | None) -> None:
        """From here on programs are built from this mutant, or from the unchanged sources."""
        overlay = self.folder / "overlay"
        for folder in (overlay, self.folder / "changed"):
            shutil.rmtree(folder, ignore_errors=True)
        self.changed = {}
        self.mutated = ""
        if mutant is not None:
            self.mutated = mutant.path
            (overlay / mutant.path).parent.mkdir(parents=True)
            (overlay / mutant.path).write_text(mutant.text, encoding="utf-8")

    def command(self, unit: TranslationUnit, target: Path) -> list[str]:
        """The base's compile command, but with the mutated file."""
        overlay = self.folder / "overlay"
        words = list(unit.command)
        words[words.index("-o") + 1] = str(target)
        if unit.source == str(self.base.tree / self.mutated):
            words[words.index("-c") + 1] = str(overlay / self.mutated)
        return [words[0], f"-I{overlay / 'src'}", *words[1:]]

    def compile(self, unit: TranslationUnit, kind: str) -> str:
        target = self.folder / kind / unit.object
        target.parent.mkdir(parents=True, exist_ok=True)
        call(self.command(unit, target), self.base.build)
        return str(target)

    def object(self, unit: TranslationUnit) -> str:
        """The object of `unit`, compiled for this mutant if it includes the changed file."""
        if self.mutated in unit.depends and unit.object not in self.changed:
            self.changed[unit.object] = self.compile(unit, "changed")
        return self.changed.get(unit.object) or self.own.get(unit.object) or unit.object

    def build(self, *programs: Program) -> None:
        """Raises Broken if the compiler refuses the mutant."""
        objects = {unit.object: self.object(unit) for unit in self.base.units
                   if any(program.holds(unit.object) for program in programs)}
        for program in programs:
            call(["g++", "-static",
                  *(made for name, made in objects.items() if program.holds(name)),
                  *program.words, "-o", str(self.folder / program.name)], self.base.build)
