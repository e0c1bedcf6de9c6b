# SPDX-License-Identifier: Apache-2.0
"""Whether orvane-unit's explain says what a run of orvane leaves behind, in units that are made once."""

from __future__ import annotations

import os
import shutil
from collections.abc import Callable, Mapping, Sequence
from dataclasses import dataclass
from pathlib import Path

from drivers import runner
from drivers.explain.explain import ask_explain, make_marked_unit
from drivers.explain.explanation import Explanation, left_faults
from drivers.random_units import generator
from model import snapshot
from model.prediction import parse_options
from model.snapshot import Entry
from model.tree import Tree
from mutate.mutants import Mutant
from mutate.scratch import Broken, call
from mutate.workshop import ORVANE, Base, Job, Program

UNIT_TOOL = Program("orvane-unit", ("orvane-unit", "orvane_unit", "orvane_kit", "orvane_core"))

# A mutant may write out memory that it never set. Such bytes must not differ between two programs.
SAME_MEMORY = "-ftrivial-auto-var-init=zero"

RANDOM_UNITS = 50
RANDOM_SEED = "1"

# The results of a mutant.
COMPILER = "compiler"    # refused
BROKEN = "broken"        # no run that ends changes an output; others crash, or one never ends
UNCHANGED = "unchanged"  # every output is the same as with the unchanged tool
EXPLAINED = "explained"  # explain agrees with the run in every unit
DIFFERS = "differs"


@dataclass(frozen=True)
class Finding:
    """`lines` say in which unit explain and the run differ, and how."""

    word: str
    lines: tuple[str, ...] = ()

    def changes_an_output(self) -> bool:
        return self.word in (EXPLAINED, DIFFERS)


@dataclass(frozen=True)
class Recipe:
    """`make` makes a unit at a free path, and returns the arguments of a run in it."""

    name: str
    make: Callable[[Path], list[str]]


def golden_recipe(case: Path, unit_tool: Path) -> Recipe:
    def make(root: Path) -> list[str]:
        call([str(unit_tool), "new", str(root), "--from", str(case / "unit.toml")], case)
        return (case / "arguments").read_text(encoding="utf-8").splitlines()

    return Recipe(case.name, make)


def random_recipe(index: int) -> Recipe:
    def make(root: Path) -> list[str]:
        root.mkdir()
        return make_marked_unit(root, generator(RANDOM_SEED, index))

    return Recipe(f"random unit {index}", make)


def recipes(base: Base) -> list[Recipe]:
    """The recipes of every golden unit, and of some random ones."""
    golden = sorted((base.tree / "tests/whole_runs/golden").iterdir())
    return [*(golden_recipe(case, base.build / UNIT_TOOL.name) for case in golden),
            *(random_recipe(index) for index in range(RANDOM_UNITS))]


def changed_paths(before: Mapping[str, Entry], after: Mapping[str, Entry]) -> list[str]:
    return sorted(path for path in before.keys() | after.keys()
                  if before.get(path) != after.get(path))


def undo_writes(root: Path, before: Mapping[str, Entry], after: Mapping[str, Entry]) -> bool:
    """Undoes what a run did to files; False if it did more than that."""
    for path in changed_paths(before, after):
        was, has = before.get(path), after.get(path)
        place = os.fspath(root) + path
        if has is None or has.kind != snapshot.FILE:
            return False
        if was is None:
            os.unlink(place)
        elif was.kind == snapshot.FILE and was.stamp is None and was.mode == has.mode:
            Path(place).write_bytes(was.content)
        else:
            return False
    return True


class Case:
    """A unit in which runs are made and undone. `left` is what the unchanged tool leaves behind."""

    def __init__(self, recipe: Recipe, root: Path, enter: Path, original: Path) -> None:
        self.name = recipe.name
        self.recipe = recipe
        self.root = root
        self.enter = enter
        self.original = original
        self.make()

    def make(self) -> None:
        # Explain takes no unknown letters, so the run gets none either: both are asked the same.
        self.options = [f"-{letter}" for letter in parse_options(self.recipe.make(self.root))[0]]
        self.before = snapshot.take(self.root)
        self.left = self.run(self.original).after
        if not undo_writes(self.root, self.before, self.left):
            raise Broken(f"{self.name}: what the unchanged tool does can't be undone")

    def run(self, orvane: Path) -> runner.Run:
        """Must be followed by `undo`."""
        return runner.run([str(self.enter), str(self.root), str(orvane), *self.options],
                          self.root)

    def undo(self, after: Mapping[str, Entry]) -> None:
        if not undo_writes(self.root, self.before, after):
            shutil.rmtree(self.root)
            self.make()

    def run_and_undo(self, orvane: Path) -> runner.Run:
        result = self.run(orvane)
        self.undo(result.after)
        return result


def run_faults(case: Case, said: Explanation | None, after: Mapping[str, Entry]) -> list[str]:
    """Where the run, not undone yet, left something other than explain says, or somewhere else."""
    outputs = said.outputs if said else ()
    tree = Tree(case.root)
    places = [tree.resolve(output.path) for output in outputs]
    named = {place.path for place in places if place is not None}
    return [*(left_faults(said, tree) if said else ()),
            *(f"{path}: the run changes it, and explain does not name it"
              for path in changed_paths(case.before, after) if path not in named)]


def faults(case: Case, orvane: Path, unit_tool: Path) -> list[str] | None:
    """How explain and a run differ in a unit; None if the run does not end by itself.

    Explain needs an option: for arguments without one, no output may change.
    """
    said: Explanation | None = None
    lines: list[str] = []
    if case.options:
        said, _, lines = ask_explain(str(unit_tool), case.root, case.options)
    result = case.run(orvane)
    try:
        if result.status < 0:
            return None
        return lines or run_faults(case, said, result.after)
    finally:
        case.undo(result.after)


def first_change(cases: Sequence[Case], orvane: Path) -> Case | str:
    """The first unit whose output differs from the unchanged tool's, or why there is none."""
    word = UNCHANGED
    for case in cases:
        result = case.run_and_undo(orvane)
        if result.status == runner.OUT_OF_TIME:
            return BROKEN
        if result.status < 0:
            word = BROKEN
        elif result.after != case.left:
            return case
    return word


def compare(cases: Sequence[Case], first: Case, orvane: Path, unit_tool: Path) -> Finding:
    """`first` is compared first: a difference is most likely where an output changes."""
    for case in [first, *(case for case in cases if case is not first)]:
        found = faults(case, orvane, unit_tool)
        if found:
            return Finding(DIFFERS, (f"{case.name}: {' '.join(case.options)}", *found))
    return Finding(EXPLAINED)


class AgreementJob(Job):
    """Has its own units."""

    def __init__(self, base: Base, number: int) -> None:
        super().__init__(base, number)
        units = self.temporary / "units"
        units.mkdir()
        self.cases = [Case(recipe, units / str(index), base.build / "orvane-enter",
                           base.build / ORVANE.name)
                      for index, recipe in enumerate(recipes(base))]

    def check_original(self) -> None:
        for case in self.cases:
            found = faults(case, self.base.build / ORVANE.name, self.base.build / UNIT_TOOL.name)
            if found is None or found:
                raise Broken("\n".join([f"explain fails without any change: {case.name}",
                                        *(found or ["the run does not end"])]))

    def is_built(self, program: Program) -> bool:
        try:
            self.build(program)
        except Broken:
            return False
        return True

    def attempt(self, mutant: Mutant) -> Finding:
        """The unit tool takes longer to build, so it is built only if an output changes."""
        self.lay(mutant)
        orvane, unit_tool = self.folder / ORVANE.name, self.folder / UNIT_TOOL.name
        if not self.is_built(ORVANE):
            return Finding(COMPILER)
        first = first_change(self.cases, orvane)
        if isinstance(first, str):
            return Finding(first)
        if not self.is_built(UNIT_TOOL):
            return Finding(COMPILER)
        return compare(self.cases, first, orvane, unit_tool)


def build_base(scratch: Path, jobs: int) -> Base:
    return Base(scratch, jobs, (ORVANE, UNIT_TOOL), ("orvane-enter",), SAME_MEMORY)
