# SPDX-License-Identifier: Apache-2.0
"""The names of the models are read, one for each code."""

from __future__ import annotations

import tempfile
import unittest
from pathlib import Path

from model.identity import load_names
from model.unit_case import NAMES


class Names(unittest.TestCase):
    def load(self, names: list[str]) -> list[str]:
        with tempfile.NamedTemporaryFile("w", suffix=".txt") as file:
            file.write("".join(f"{name}\n" for name in names))
            file.flush()
            return load_names(Path(file.name))

    def test_shape(self) -> None:
        good = NAMES[:31] + NAMES[:1] + NAMES[32:]
        self.assertEqual(self.load(good), good)
        for bad in (NAMES, good[:-1], good[:1] * 47):
            with self.assertRaises(ValueError):
                self.load(bad)
