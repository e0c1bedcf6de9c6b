# SPDX-License-Identifier: Apache-2.0
"""The version is defined once, in CMakeLists.txt; every repetition for readers is the same."""

from __future__ import annotations

import os
import re
import subprocess
import unittest
from pathlib import Path

PROJECT = Path(__file__).resolve().parents[2]


def only(pattern: str, path: str) -> tuple[str, ...]:
    """The groups of the pattern's first match in a file of the project."""
    found = re.search(pattern, (PROJECT / path).read_text(encoding="utf-8"), re.MULTILINE)
    if found is None:
        raise AssertionError(f"{path}: nothing like {pattern}")
    return found.groups()


class VersionTest(unittest.TestCase):
    def setUp(self) -> None:
        (self.version,) = only(r"^project\(orvane VERSION ([\d.]+) ", "CMakeLists.txt")
        self.newest, self.date = only(r"^## \[(\d[\d.]*)\] - (\d{4}-\d\d-\d\d)$", "CHANGELOG.md")

    def test_the_newest_entry_of_the_changelog_is_of_this_version(self) -> None:
        self.assertEqual(self.newest, self.version)

    def test_the_manual_pages_name_it_with_its_date(self) -> None:
        for page in ("man/orvane.1", "man/orvane-unit.1"):
            self.assertEqual(only(r'^\.TH \S+ 1 "([\d-]+)" "orvane ([\d.]+)"', page),
                             (self.date, self.version), page)

    def test_orvane_unit_answers_with_it(self) -> None:
        said = subprocess.run([os.environ["ORVANE_UNIT"], "--version"], check=True, text=True,
                              stdout=subprocess.PIPE).stdout
        self.assertEqual(said, f"{self.version}\n")


if __name__ == "__main__":
    unittest.main()
