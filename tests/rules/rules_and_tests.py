#!/usr/bin/env python3
# SPDX-License-Identifier: Apache-2.0
"""Says which tests prove each rule of docs/rules.md: python3 tests/rules/rules_and_tests.py [--check]

Writes docs/rules-and-tests.md. With --check it writes nothing, and fails if that document is not what it
would write. Always fails if a rule has a test in fewer than two of the three readings (unit tests, golden
units, the model), if a test names a rule that does not exist, or if the rules are not in order.

A test names its rules in comments directly above it, such as "// Rules: AIR-07, FLD-01 to FLD-04": a unit
test, a function or class of the model, and a golden unit in the comments that begin its description.

Exit status: 0 all is well, 1 something is wrong, 2 wrong arguments.
"""

from __future__ import annotations

import argparse
import ast
import re
import sys
from collections.abc import Iterator, Sequence
from dataclasses import dataclass
from pathlib import Path

PROJECT = Path(__file__).resolve().parents[2]
RULES = Path("docs/rules.md")
MATRIX = Path("docs/rules-and-tests.md")

UNIT, GOLDEN, MODEL = READINGS = ("unit tests", "golden units", "the model")
READINGS_NEEDED = 2

ID = re.compile(r"([A-Z]{2,3})-(\d\d)")
LIKE_AN_ID = re.compile(r"\w+-\w*\d\w*")
ROW = re.compile(r"\| ([^| ]+) \| (.+) \|$")
MARK = re.compile(r"\s*(?://|#) ?Rules:(.*)")
UNIT_TEST = re.compile(r"TEST(?:_F|_P)?\(\s*(\w+),\s*(\w+)\)")


class Faults(Exception):
    """What is wrong, each with its place."""

    def __init__(self, faults: Sequence[str]) -> None:
        super().__init__("\n".join(faults))
        self.faults = list(faults)


@dataclass(frozen=True)
class Mark:
    """One line of ids, and the test that it belongs to."""

    reading: str
    test: str
    ids: str
    place: str


def read_rules(text: str) -> list[str]:
    """The ids of the rules, which must be in order: a prefix in one stretch, its numbers ascending."""
    ids: list[str] = []
    faults = []
    last: dict[str, int] = {}
    for number, line in enumerate(text.split("\n"), 1):
        row = ROW.match(line)
        match = row and ID.fullmatch(row[1])
        if row and not match and LIKE_AN_ID.fullmatch(row[1]):
            faults.append(f"{RULES}:{number}: {row[1]} is no id: two or three letters, and two digits")
        if not match:
            continue
        prefix, count = match[1], int(match[2])
        if count <= last.get(prefix, 0):
            faults.append(f"{RULES}:{number}: {match[0]} is twice there or not in order")
        elif prefix in last and not ids[-1].startswith(prefix + "-"):
            faults.append(f"{RULES}:{number}: {match[0]} is apart from the others of its prefix")
        last[prefix] = max(count, last.get(prefix, 0))
        ids.append(match[0])
    if not ids:
        faults.append(f"{RULES}: no rule")
    if faults:
        raise Faults(faults)
    return ids


def unit_marks(text: str, place: str) -> Iterator[Mark]:
    """The marks of a C++ file: each belongs to the test below it, with comments between them at most."""
    waiting: list[tuple[str, str]] = []
    lines = text.split("\n")
    for number, line in enumerate(lines, 1):
        mark = MARK.match(line)
        if mark:
            waiting.append((mark[1], f"{place}:{number}"))
        elif waiting and not line.lstrip().startswith("//"):
            test = UNIT_TEST.match(" ".join(lines[number - 1:number + 1]))
            name = f"{test[1]}.{test[2]}" if test else ""
            yield from (Mark(UNIT, name, ids, where) for ids, where in waiting)
            waiting = []
    yield from (Mark(UNIT, "", ids, where) for ids, where in waiting)


def golden_marks(text: str, name: str, place: str) -> Iterator[Mark]:
    """The marks in the comments that begin a description. Further below, such a line may be content."""
    for number, line in enumerate(text.split("\n"), 1):
        if not line.startswith("#"):
            return
        mark = MARK.match(line)
        if mark:
            yield Mark(GOLDEN, name, mark[1], f"{place}:{number}")


def model_marks(text: str, module: str, place: str) -> Iterator[Mark]:
    """The marks of a Python file: each belongs to the function or class below it."""
    names: dict[int, str] = {}

    def collect(node: ast.AST, outer: str) -> None:
        for child in ast.iter_child_nodes(node):
            if isinstance(child, ast.FunctionDef | ast.ClassDef):
                first = min([child.lineno, *(each.lineno for each in child.decorator_list)])
                names[first] = f"{outer}.{child.name}"
                collect(child, names[first])

    collect(ast.parse(text), module)
    lines = text.split("\n")
    for number, line in enumerate(lines, 1):
        mark = MARK.match(line)
        if mark:
            below = number + 1
            while below <= len(lines) and lines[below - 1].lstrip().startswith("#"):
                below += 1
            yield Mark(MODEL, names.get(below, ""), mark[1], f"{place}:{number}")


def read_marks(project: Path) -> list[Mark]:
    marks: list[Mark] = []
    for path in sorted((project / "tests").rglob("*_test.cpp")):
        place = path.relative_to(project).as_posix()
        marks += unit_marks(path.read_text(encoding="utf-8"), place)
    for path in sorted((project / "tests/whole_runs/golden").glob("*/unit.toml")):
        place = path.relative_to(project).as_posix()
        marks += golden_marks(path.read_text(encoding="utf-8"), path.parent.name, place)
    for path in sorted((project / "tests/model").glob("*.py")):
        if not path.name.startswith("test_"):
            place = path.relative_to(project).as_posix()
            marks += model_marks(path.read_text(encoding="utf-8"), path.stem, place)
    return marks


def expand(text: str, rules: Sequence[str]) -> list[str]:
    """The ids of a mark: "AIR-07, FLD-01 to FLD-04". Raises ValueError for anything else."""
    ids: list[str] = []
    for part in text.split(","):
        ends = part.strip().split(" to ")
        for end in ends:
            if end not in rules:
                raise ValueError(f"there is no rule {end!r}")
        if len(ends) > 2 or ends[0][:-2] != ends[-1][:-2] or ends[0] > ends[-1]:
            raise ValueError(f"{part.strip()!r} is not a range of rules")
        ids += [each for each in rules if each[:-2] == ends[0][:-2] and ends[0] <= each <= ends[-1]]
    return ids


Proofs = dict[str, dict[str, list[str]]]


def prove(rules: Sequence[str], marks: Sequence[Mark]) -> Proofs:
    """The tests of each rule by reading. Raises Faults for a wrong mark, and for a rule that lacks one."""
    proofs: Proofs = {rule: {reading: [] for reading in READINGS} for rule in rules}
    faults = []
    for mark in marks:
        try:
            ids = expand(mark.ids, rules)
        except ValueError as error:
            faults.append(f"{mark.place}: {error}")
            continue
        if not mark.test:
            faults.append(f"{mark.place}: no test is below these rules")
        for rule in ids:
            tests = proofs[rule][mark.reading]
            if mark.test in tests:
                faults.append(f"{mark.place}: {rule} is named twice above {mark.test}")
            else:
                tests.append(mark.test)
    for rule, readings in proofs.items():
        found = [reading for reading in READINGS if readings[reading]]
        if len(found) < READINGS_NEEDED:
            faults.append(f"{RULES}: {rule} has a test in {' and '.join(found) or 'nothing'} only, "
                          f"and needs {READINGS_NEEDED} of {', '.join(READINGS)}")
    if faults:
        raise Faults(faults)
    return proofs


def matrix(proofs: Proofs) -> str:
    lines = [
        "# The rules and their tests",
        "",
        "Each rule of [rules.md](rules.md) has a test in at least two of three readings: unit tests of the",
        "product; golden units, whose results are written by hand; and the model, which states the rules",
        "once more in Python. `tests/rules/rules_and_tests.py` writes this table from the tests, and",
        "`./dev test` fails if it is not up to date.",
        "",
        "| Rule | Unit tests | Golden units | Model |",
        "|---|---|---|---|",
    ]
    for rule, readings in proofs.items():
        cells = ("<br>".join(f"`{test}`" for test in sorted(readings[reading])) for reading in READINGS)
        lines.append(f"| {rule} | {' | '.join(cells)} |".replace("|  |", "| |"))
    return "\n".join(lines) + "\n"


def main(arguments: Sequence[str], project: Path = PROJECT) -> int:
    parser = argparse.ArgumentParser(description=__doc__,
                                     formatter_class=argparse.RawDescriptionHelpFormatter)
    parser.add_argument("--check", action="store_true", help="write nothing, and fail if there is need to")
    options = parser.parse_args(arguments)
    try:
        rules = read_rules((project / RULES).read_text(encoding="utf-8"))
        text = matrix(prove(rules, read_marks(project)))
    except Faults as error:
        print(error, file=sys.stderr)
        return 1
    place = project / MATRIX
    if not options.check:
        place.write_text(text, encoding="utf-8")
    elif not place.exists() or place.read_text(encoding="utf-8") != text:
        print(f"{MATRIX}: is not up to date: python3 tests/rules/rules_and_tests.py writes it",
              file=sys.stderr)
        return 1
    return 0


if __name__ == "__main__":
    sys.exit(main(sys.argv[1:]))
