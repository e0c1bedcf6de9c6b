# SPDX-License-Identifier: Apache-2.0
"""The same seed makes the same units."""

from __future__ import annotations

import random
import tempfile
import unittest
from dataclasses import replace
from pathlib import Path

from drivers.units import make_unit
from model import parts, snapshot
from model.prediction import predict
from model.tree import Tree
from model.unit_case import NAMES


class Units(unittest.TestCase):
    def make(self, seed: int) -> tuple[Path, list[str]]:
        folder = tempfile.TemporaryDirectory()
        self.addCleanup(folder.cleanup)
        return Path(folder.name), make_unit(Path(folder.name), random.Random(f"test:{seed}"))

    def entries(self, root: Path) -> dict[str, snapshot.Entry]:
        """The times of two units differ; nothing else may."""
        return {path: replace(entry, stamp=entry.stamp and (entry.stamp[0], 0))
                for path, entry in snapshot.take(root).items()}

    def test_the_same_seed_makes_the_same_unit(self) -> None:
        for seed in range(20):
            (first, arguments), (second, again) = self.make(seed), self.make(seed)
            self.assertEqual(arguments, again)
            self.assertEqual(self.entries(first), self.entries(second))

    def test_predicting_changes_nothing(self) -> None:
        for seed in range(20):
            root, arguments = self.make(seed)
            before = snapshot.take(root)
            predict(root, arguments, NAMES)
            self.assertEqual(snapshot.take(root), before)

    def test_no_output_is_its_own_template(self) -> None:
        for seed in range(100):
            tree = Tree(self.make(seed)[0])
            for output, template in zip(parts.OUTPUTS, parts.TEMPLATES):
                place = tree.resolve(output)
                if place is not None:
                    self.assertNotEqual(place, tree.resolve(template))
