# SPDX-License-Identifier: Apache-2.0
"""The tests run wherever the project is, and without the privileges of the superuser.

A few units and documents each, in a copy of what they need, in a folder with a blank in its name.
"""

from __future__ import annotations

import os
import shutil
import subprocess
import sys
import tempfile
import unittest
from pathlib import Path

PROJECT = Path(__file__).resolve().parents[2]
TAKEN = ("tests/model", "tests/drivers", "tests/documents", "completion", "man", "docs", "CHANGELOG.md",
         "CMakeLists.txt", "src/writers/template_merge.h")
PROGRAMS = ("ORVANE", "ORVANE_ENTER", "ORVANE_UNIT")

# The superuser keeps only the privilege without which it may not even map itself into a user namespace.
UNPRIVILEGED = ["setpriv", "--bounding-set=-all,+setfcap", "--inh-caps=-all"] \
    if os.geteuid() == 0 else []


class PlacesTest(unittest.TestCase):
    def setUp(self) -> None:
        holder = tempfile.TemporaryDirectory(prefix="orvane places-")
        self.addCleanup(holder.cleanup)
        self.project = Path(holder.name) / "a folder"
        for name in TAKEN:
            copy = shutil.copytree if (PROJECT / name).is_dir() else shutil.copyfile
            (self.project / name).parent.mkdir(parents=True, exist_ok=True)
            copy(PROJECT / name, self.project / name)
        self.build = self.project / "build"
        self.build.mkdir()
        for name in PROGRAMS:
            shutil.copy(os.environ[name], self.build)
        self.driver_arguments: list[str | Path] = [
            "--orvane", self.build / "orvane", "--enter", self.build / "orvane-enter"]

    def check(self, *words: str | Path, before: list[str] | None = None) -> None:
        done = subprocess.run([*(before or []), sys.executable, *words], text=True, check=False,
                              stdout=subprocess.PIPE, stderr=subprocess.STDOUT,
                              env={**os.environ, "ORVANE_UNIT": str(self.build / "orvane-unit")})
        self.assertEqual(done.returncode, 0, done.stdout)

    def check_driver(self, name: str, *more: str | Path, before: list[str] | None = None) -> None:
        self.check(self.project / "tests/drivers", name, *self.driver_arguments, *more,
                   before=before)

    def test_a_path_with_a_blank_is_one_path_to_the_drivers(self) -> None:
        self.check_driver("differential", "--units", "4")
        self.check_driver("explain", "--units", "4", "--unit-tool", self.build / "orvane-unit")

    def test_a_path_with_a_blank_is_one_path_to_the_documents(self) -> None:
        self.check("-m", "unittest", "discover", "--start-directory",
                   self.project / "tests/documents")
        self.check(self.project / "tests/documents/run_documents.py", "--path", self.build,
                   self.project / "docs/formats.md", self.project / "docs/deploy.md")

    def test_a_user_without_privilege_can_set_every_limit(self) -> None:
        allowed = subprocess.run([*UNPRIVILEGED, "unshare", "--map-root-user", "true"],
                                 stderr=subprocess.PIPE, text=True, check=False)
        if allowed.returncode != 0:
            self.skipTest("no privilege can be given up, or no user namespace made: "
                          f"{allowed.stderr.strip()}")
        self.check_driver("limits", before=UNPRIVILEGED)


if __name__ == "__main__":
    unittest.main()
