# SPDX-License-Identifier: Apache-2.0
"""The stripped product stays small on its target: linked by the compiler of a 32-bit ARM system."""

from __future__ import annotations

import os
import subprocess
import tempfile
import unittest
from pathlib import Path

KIB = 1024
DYNAMIC_LIMIT = 32 * KIB
STATIC_LIMIT = 800 * KIB


@unittest.skipUnless(os.environ.get("ORVANE_PROCESSOR") == "arm", "other processors have no limit")
class SizeTest(unittest.TestCase):
    def stripped_size(self, program: str) -> int:
        with tempfile.NamedTemporaryFile(prefix="orvane stripped-") as stripped:
            subprocess.run([os.environ["ORVANE_STRIP"], "-o", stripped.name, program], check=True)
            return Path(stripped.name).stat().st_size

    def test_dynamic(self) -> None:
        self.assertLessEqual(self.stripped_size(os.environ["ORVANE_DYNAMIC"]), DYNAMIC_LIMIT)

    def test_static(self) -> None:
        self.assertLessEqual(self.stripped_size(os.environ["ORVANE"]), STATIC_LIMIT)


if __name__ == "__main__":
    unittest.main()
