# SPDX-License-Identifier: Apache-2.0
"""The same sources give the same program, wherever they are and wherever they are built."""

from __future__ import annotations

import os
import shutil
import subprocess
import tempfile
import unittest
from pathlib import Path

PROJECT = Path(__file__).resolve().parents[2]


@unittest.skipIf(os.environ.get("ORVANE_PROCESSOR") == "arm", "the compiler is the same, but slower")
class ReproducibleTest(unittest.TestCase):
    def test_two_folders_give_the_same_bytes(self) -> None:
        with tempfile.TemporaryDirectory(prefix="orvane reproducible-") as name:
            # The compiler names its working folder as the system does, without links.
            programs = [self.build(Path(name).resolve() / place) for place in
                        ("here", "a folder/of another name, and deeper")]
        self.assertEqual(programs[0], programs[1])

    def build(self, folder: Path) -> bytes:
        """Not stripped and with debugging records, which contain the names of folders."""
        sources = folder / "sources"
        shutil.copytree(PROJECT, sources,
                        ignore=shutil.ignore_patterns("build", ".git", "__pycache__"))
        build = folder / "build"
        quietly = {"check": True, "stdout": subprocess.DEVNULL}
        subprocess.run(["cmake", "-G", "Ninja", "-S", sources, "-B", build, "-DORVANE_KIT=OFF",
                        "-DCMAKE_BUILD_TYPE=RelWithDebInfo",
                        f"-DCMAKE_CXX_COMPILER={os.environ['ORVANE_COMPILER']}"], **quietly)
        subprocess.run(["cmake", "--build", build, "--target", "orvane"], **quietly)
        return (build / "orvane").read_bytes()


if __name__ == "__main__":
    unittest.main()
