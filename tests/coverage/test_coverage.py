# SPDX-License-Identifier: Apache-2.0
"""The count of what the unit tests reach notices each kind of gap, and a count of nothing."""

from __future__ import annotations

import copy
import json
import subprocess
import sys
import unittest
from pathlib import Path
from typing import Any

SCRIPT = Path(__file__).with_name("coverage.py")

# One function of a file that is reached whole, in the form of llvm-cov 22.
WHOLE: dict[str, Any] = {
    "filename": "/project/src/a/file.cpp",
    "segments": [[3, 20, 5, True, True, False], [4, 9, 5, True, True, False], [5, 2, 0, False, False, False]],
    "branches": [[4, 9, 4, 10, 2, 3, 0, 0, 6], [4, 14, 4, 15, 1, 1, 0, 0, 6]],
    "mcdc_records": [[4, 9, 4, 15, 1, 2, 0, 0, 5, [True, True], []]],
    "summary": {"lines": {"count": 3, "covered": 3}, "branches": {"count": 4, "covered": 4},
                "mcdc": {"count": 2, "covered": 2}},
}


def count(*files: dict[str, Any]) -> subprocess.CompletedProcess[str]:
    export = json.dumps({"data": [{"files": files}]})
    return subprocess.run([sys.executable, SCRIPT, "/project/src"], input=export, capture_output=True, text=True,
                          check=False)


def changed(**parts: Any) -> dict[str, Any]:
    """The whole file with other parts; of its summary, only what is named changes."""
    file = copy.deepcopy(WHOLE)
    file["summary"].update(parts.pop("summary", {}))
    file.update(parts)
    return file


class CoverageTest(unittest.TestCase):
    def test_a_file_that_is_reached_whole_passes(self) -> None:
        result = count(WHOLE)
        self.assertEqual(result.stdout, "lines: 3 of 3\nbranches: 4 of 4\nconditions: 2 of 2\n")
        self.assertEqual(result.returncode, 0)

    def test_figures_of_files_add_up(self) -> None:
        self.assertIn("lines: 6 of 6\n", count(WHOLE, changed(filename="/project/src/b.h")).stdout)

    def test_a_line_that_is_not_reached(self) -> None:
        segments = [*WHOLE["segments"][:1], [4, 9, 0, True, True, False], *WHOLE["segments"][2:]]
        result = count(changed(segments=segments, summary={"lines": {"count": 3, "covered": 2}}))
        self.assertIn("src/a/file.cpp:4: not reached\n", result.stdout)
        self.assertIn("lines: 2 of 3\n", result.stdout)
        self.assertEqual(result.returncode, 1)

    def test_a_branch_that_goes_one_way_only(self) -> None:
        for taken, not_taken, never in ((0, 3, "true"), (2, 0, "false")):
            branches = [[4, 9, 4, 10, taken, not_taken, 0, 0, 6]]
            result = count(changed(branches=branches, summary={"branches": {"count": 2, "covered": 1}}))
            self.assertIn(f"src/a/file.cpp:4: column 9: never {never}\n", result.stdout)
            self.assertEqual(result.returncode, 1)

    def test_a_condition_that_never_decides_alone(self) -> None:
        records = [[4, 9, 4, 15, 1, 1, 0, 0, 5, [True, False], []]]
        result = count(changed(mcdc_records=records, summary={"mcdc": {"count": 2, "covered": 1}}))
        self.assertIn("src/a/file.cpp:4: condition 2 alone never changed the decision\n", result.stdout)
        self.assertIn("conditions: 1 of 2\n", result.stdout)
        self.assertEqual(result.returncode, 1)

    def test_files_elsewhere_do_not_count(self) -> None:
        other = changed(filename="/project/kit/file.cpp", summary={"lines": {"count": 9, "covered": 0}})
        self.assertEqual(count(WHOLE, other).returncode, 0)

    def test_a_count_of_nothing_is_no_success(self) -> None:
        for files in ((), (changed(filename="/elsewhere/file.cpp"),),
                      (changed(summary={"mcdc": {"count": 0, "covered": 0}}),)):
            self.assertEqual(count(*files).returncode, 2)

    def test_other_input_is_no_success(self) -> None:
        for text in ("", "{}", '{"data": [{"files": [{"filename": "/project/src/a.cpp"}]}]}'):
            result = subprocess.run([sys.executable, SCRIPT, "/project/src"], input=text, capture_output=True,
                                    text=True, check=False)
            self.assertEqual(result.returncode, 2, text)


if __name__ == "__main__":
    unittest.main()
