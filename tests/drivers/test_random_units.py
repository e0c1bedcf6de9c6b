# SPDX-License-Identifier: Apache-2.0
"""A difference is reported and its unit kept; a unit not run or an outcome never reached is not a success."""

from __future__ import annotations

import argparse
import contextlib
import io
import random
import shlex
import tempfile
import unittest
from collections.abc import Callable
from pathlib import Path

from drivers import random_units, runner
from drivers.random_units import MOST_DIFFERENCES, Finding, Question, RandomUnit

GOOD = Finding((), frozenset({"even"}))


def make(root: Path, rng: random.Random) -> list[str]:
    (root / "number").write_text(str(rng.randrange(1000)), encoding="ascii")
    return [f"-{rng.choice('ai')}"]


def make_even(root: Path) -> list[str]:
    (root / "number").write_text("2", encoding="ascii")
    return ["-a"]


def make_odd(root: Path) -> list[str]:
    (root / "number").write_text("3", encoding="ascii")
    return ["-a"]


def number(unit: RandomUnit) -> int:
    return int((unit.root / "number").read_text(encoding="ascii"))


def by_number(unit: RandomUnit, _: object) -> Finding:
    return Finding((), frozenset({"odd" if number(unit) % 2 else "even"}))


def all_good(*_: object) -> Finding:
    return GOOD


def all_bad(unit: RandomUnit, _: object) -> Finding:
    return Finding((f"wrong: {number(unit)}",), frozenset())


def not_run(*_: object) -> Finding:
    raise runner.BrokenRun("no such tool")


class Asking(unittest.TestCase):
    def setUp(self) -> None:
        folder = tempfile.TemporaryDirectory()
        self.addCleanup(folder.cleanup)
        self.keep = Path(folder.name)

    def ask(self, check: Callable[[RandomUnit, object], Finding], *words: str) -> tuple[int, str]:
        parser = argparse.ArgumentParser()
        random_units.add_arguments(parser, units=30)
        options = parser.parse_args(["--orvane", "o", "--enter", "e", "--keep", str(self.keep),
                                     *words])
        question = Question("asked", make, check, ("even", "odd"), enough_units=20)
        with contextlib.redirect_stdout(io.StringIO()) as said:
            status = random_units.ask(question, None, options, "--more", "a b")
        return status, said.getvalue()

    def test_every_outcome_reached(self) -> None:
        status, said = self.ask(by_number)
        self.assertEqual(status, 0)
        self.assertIn("asked: 30 units, 0 with a difference (seed 1)\n", said)

    def test_outcome_that_is_never_reached(self) -> None:
        self.assertEqual(self.ask(all_good)[0], 1)
        self.assertIn("asked: never odd\n", self.ask(all_good, "--units", "20")[1])
        self.assertEqual(self.ask(all_good, "--units", "19")[0], 0)

    def test_a_difference_keeps_the_unit_and_says_how_to_repeat_it(self) -> None:
        status, said = self.ask(all_bad, "--units", "1")
        self.assertEqual(status, 1)
        kept = self.keep / "unit-1-0"
        text = (kept / "number").read_text(encoding="ascii")
        self.assertIn(f"\n  wrong: {text}\n", said)
        self.assertIn(f"kept, and not run: {kept}\n", said)
        again = next(line for line in said.splitlines() if line.startswith("  again: "))
        self.assertEqual(shlex.split(again)[3:],
                         ["asked", "--orvane", "o", "--enter", "e", "--more", "a b", "--seed", "1",
                          "--only", "0", "--keep", "DIR"])

    def test_many_differences_end_the_run(self) -> None:
        status, said = self.ask(all_bad)
        self.assertEqual((status, said.count("\n  wrong: ")), (1, MOST_DIFFERENCES))
        self.assertIn("asked: the other units were skipped\n", said)

    def test_certain_units_come_first(self) -> None:
        question = Question("asked", make, by_number, ("even", "odd"), certain=(make_even, make_odd))
        parser = argparse.ArgumentParser()
        random_units.add_arguments(parser, units=30)
        options = parser.parse_args(["--orvane", "o", "--enter", "e", "--units", "0"])
        with contextlib.redirect_stdout(io.StringIO()) as said:
            self.assertEqual(random_units.ask(question, None, options), 0)
        self.assertIn("asked: 2 units, 0 with a difference (seed 1)\n", said.getvalue())

    def test_a_unit_that_was_not_run(self) -> None:
        status, said = self.ask(not_run)
        self.assertEqual((status, said), (2, "asked: unit 0 was not run: no such tool\n"))

    def test_a_single_unit_is_kept_and_needs_no_other_outcome(self) -> None:
        status, said = self.ask(all_good, "--only", "7", "--units", "1000")
        self.assertEqual(status, 0)
        self.assertIn("asked: 1 units, 0 with a difference (seed 1)\n", said)
        self.assertTrue((self.keep / "unit-1-7/number").exists())

    def test_a_kept_unit_is_not_overwritten(self) -> None:
        self.ask(all_bad, "--units", "1")
        with self.assertRaises(SystemExit):
            self.ask(all_bad, "--units", "1")

    def test_another_seed_makes_other_units(self) -> None:
        self.ask(all_good, "--only", "1")
        self.ask(all_good, "--only", "1", "--seed", "2")
        texts = {(self.keep / f"unit-{seed}-1/number").read_text() for seed in (1, 2)}
        self.assertEqual(len(texts), 2)
