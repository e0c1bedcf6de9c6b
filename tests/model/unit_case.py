# SPDX-License-Identifier: Apache-2.0
"""The common start of tests of the model and of the drivers."""

from __future__ import annotations

import tempfile
import unittest
from pathlib import Path

from model import parts, snapshot
from model.prediction import Outcome, Prediction, predict

NAMES = [f"MARL Model {code}" for code in range(1, 48)]
STATIC, STOCK = parts.TEMPLATES, parts.STOCK_FILES


class UnitCase(unittest.TestCase):
    """A unit with product files, and no image, disk or version file."""

    def setUp(self) -> None:
        folder = tempfile.TemporaryDirectory()
        self.addCleanup(folder.cleanup)
        self.root = Path(folder.name)
        parts.put_base(self.root)
        parts.put_product_files(self.root)

    def predict(self, *arguments: str) -> Prediction:
        return predict(self.root, arguments, NAMES)

    def outcome(self, *arguments: str) -> Outcome:
        prediction = self.predict(*arguments)
        self.assertEqual((prediction.status, prediction.stdout), (0, b""))
        self.assertEqual(len(prediction.alternatives), 1)
        return prediction.alternatives[0]

    def output(self, argument: str, name: str) -> bytes:
        tmp = self.outcome(argument).tmp
        assert tmp is not None
        self.assertEqual(tmp[name].kind, snapshot.FILE)
        return tmp[name].content

    def content(self, path: str) -> bytes:
        return Path(parts.real(self.root, path)).read_bytes()

    def remove(self, *paths: str) -> None:
        for path in paths:
            Path(parts.real(self.root, path)).unlink()
