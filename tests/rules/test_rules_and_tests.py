# SPDX-License-Identifier: Apache-2.0
from __future__ import annotations

import contextlib
import io
import tempfile
import unittest
from pathlib import Path

from rules import rules_and_tests

RULES = ("# The rules\n\n| Id | Rule |\n|---|---|\n| AIR-01 | One. |\n| AIR-02 | Two. |\n"
         "| FLD-01 | `a` | 0 | b |\n")
UNIT = "// Rules: AIR-01, AIR-02\nTEST(Suite, Name) {\n}\n"
GOLDEN = "# What it is.\n# Rules: AIR-01, FLD-01\n[image]\n"
MODEL = "# Rules: AIR-02, FLD-01\ndef reading() -> None:\n    pass\n"


class RulesAndTestsTest(unittest.TestCase):
    """A small project, in which everything is right until a test changes it."""

    def setUp(self) -> None:
        folder = tempfile.TemporaryDirectory(prefix="orvane rules-")
        self.addCleanup(folder.cleanup)
        self.project = Path(folder.name)
        self.put("docs/rules.md", RULES)
        self.put("tests/product/some_test.cpp", UNIT)
        self.put("tests/whole_runs/golden/some-unit/unit.toml", GOLDEN)
        self.put("tests/model/some.py", MODEL)
        self.assertEqual(self.run_script(), (0, ""))

    def put(self, name: str, text: str) -> None:
        place = self.project / name
        place.parent.mkdir(parents=True, exist_ok=True)
        place.write_text(text, encoding="utf-8")

    def run_script(self, *arguments: str) -> tuple[int, str]:
        said = io.StringIO()
        with contextlib.redirect_stderr(said):
            return rules_and_tests.main(arguments, self.project), said.getvalue()

    def matrix(self) -> str:
        return (self.project / "docs/rules-and-tests.md").read_text(encoding="utf-8")

    def expect_fault(self, text: str) -> None:
        """The script fails with this text in either way, and writes nothing."""
        before = self.matrix()
        for arguments in ((), ("--check",)):
            status, said = self.run_script(*arguments)
            self.assertEqual(status, 1)
            self.assertIn(text, said)
        self.assertEqual(self.matrix(), before)

    def test_matrix_names_the_tests_of_each_rule(self) -> None:
        self.assertEqual(self.matrix().split("|---|---|---|---|\n")[1],
                         "| AIR-01 | `Suite.Name` | `some-unit` | |\n"
                         "| AIR-02 | `Suite.Name` | | `some.reading` |\n"
                         "| FLD-01 | | `some-unit` | `some.reading` |\n")

    def test_check_accepts_its_own_matrix(self) -> None:
        self.assertEqual(self.run_script("--check"), (0, ""))

    def test_check_refuses_a_stale_matrix(self) -> None:
        self.put("tests/product/other_test.cpp", "// Rules: FLD-01\nTEST_F(Other, Name) {}\n")
        before = self.matrix()
        self.assertEqual(self.run_script("--check")[0], 1)
        self.assertEqual(self.matrix(), before)
        self.assertEqual(self.run_script(), (0, ""))
        self.assertIn("| FLD-01 | `Other.Name` |", self.matrix())

    def test_check_refuses_a_missing_matrix(self) -> None:
        (self.project / "docs/rules-and-tests.md").unlink()
        self.assertEqual(self.run_script("--check")[0], 1)

    def test_rule_with_one_reading_is_a_gap(self) -> None:
        self.put("tests/model/some.py", MODEL.replace("AIR-02, ", ""))
        self.expect_fault("AIR-02 has a test in unit tests only")

    def test_two_tests_of_one_reading_are_one_reading(self) -> None:
        self.put("tests/model/some.py", MODEL.replace("AIR-02, ", ""))
        self.put("tests/product/other_test.cpp", "// Rules: AIR-02\nTEST(Other, Name) {}\n")
        self.expect_fault("AIR-02 has a test in unit tests only")

    def test_rule_without_a_test_is_a_gap(self) -> None:
        self.put("docs/rules.md", RULES + "| FLD-02 | New. |\n")
        self.expect_fault("FLD-02 has a test in nothing only")

    def test_unknown_id_is_refused_in_every_reading(self) -> None:
        for name, text in (("tests/product/some_test.cpp", UNIT), ("tests/model/some.py", MODEL),
                           ("tests/whole_runs/golden/some-unit/unit.toml", GOLDEN)):
            with self.subTest(name):
                self.put(name, text.replace("AIR-0", "AIR-3"))
                self.expect_fault("there is no rule 'AIR-3")
                self.expect_fault(name + ":")
                self.put(name, text)

    def test_mark_that_is_no_list_of_ids_is_refused(self) -> None:
        for ids in ("", "AIR-01 AIR-02", "AIR-01,", "AIR-02 to AIR-01", "AIR-01 to FLD-01",
                    "AIR-01 to AIR-02 to AIR-02"):
            with self.subTest(ids):
                self.put("tests/model/some.py", MODEL.replace("AIR-02, FLD-01", ids))
                self.expect_fault("tests/model/some.py:1: ")

    def test_range_stands_for_all_its_rules(self) -> None:
        self.put("tests/model/some.py", MODEL.replace("AIR-02", "AIR-01 to AIR-02"))
        self.assertEqual(self.run_script(), (0, ""))
        self.assertIn("| AIR-01 | `Suite.Name` | `some-unit` | `some.reading` |", self.matrix())

    def test_id_twice_above_a_test_is_refused(self) -> None:
        self.put("tests/product/some_test.cpp", "// Rules: AIR-01\n" + UNIT)
        self.expect_fault("AIR-01 is named twice above Suite.Name")

    def test_unit_mark_without_its_test_is_refused(self) -> None:
        for text in (UNIT.replace("TEST(", "int f("), UNIT.replace("TEST", "\nTEST"),
                     "// Rules: AIR-01\n"):
            with self.subTest(text):
                self.put("tests/product/some_test.cpp", UNIT + text)
                self.expect_fault("tests/product/some_test.cpp:4: no test is below")

    def test_model_mark_without_its_function_is_refused(self) -> None:
        self.put("tests/model/some.py", MODEL + "# Rules: AIR-01\nTABLE = 1\n")
        self.expect_fault("tests/model/some.py:4: no test is below")

    def test_marks_above_other_comments_and_decorators_count(self) -> None:
        self.put("tests/product/some_test.cpp",
                 "// Rules: AIR-01\n// Rules: AIR-02\n/// Why.\nTEST_P(Suite,\n       Name) {}\n")
        self.put("tests/model/some.py", "class Outer:\n    # Rules: AIR-02, FLD-01\n    # Why.\n    @property\n"
                 "    def reading(self) -> int:\n        return 1\n")
        self.assertEqual(self.run_script(), (0, ""))
        self.assertIn("| AIR-02 | `Suite.Name` | | `some.Outer.reading` |", self.matrix())

    def test_content_of_a_golden_unit_is_not_a_mark(self) -> None:
        self.put("tests/whole_runs/golden/some-unit/unit.toml", GOLDEN + "# Rules: AIR-99\n")
        self.assertEqual(self.run_script("--check"), (0, ""))

    def test_tests_of_the_model_are_not_a_reading(self) -> None:
        self.put("tests/model/test_some.py", "# Rules: AIR-01\ndef f() -> None: ...\n")
        self.assertEqual(self.run_script("--check"), (0, ""))

    def test_rules_that_are_not_in_order_are_refused(self) -> None:
        for text, fault in (
                (RULES + "| FLD-01 | Again. |\n", "FLD-01 is twice there or not in order"),
                (RULES.replace("AIR-01 | One", "AIR-09 | One"), "AIR-02 is twice there or not in order"),
                (RULES + "| AIR-03 | Apart. |\n", "AIR-03 is apart from the others"),
                ("# The rules\n", "no rule")):
            with self.subTest(fault):
                self.put("docs/rules.md", text)
                self.expect_fault(fault)

    def test_row_with_what_is_nearly_an_id_is_refused(self) -> None:
        for wrong in ("AIR-100", "AIR-3", "AIR-1x", "air-03", "AIRP-03"):
            self.put("docs/rules.md", f"{RULES}| {wrong} | A rule. |\n")
            self.expect_fault(f"{wrong} is no id")

    def test_number_of_a_rule_that_is_gone_may_be_left_out(self) -> None:
        self.put("docs/rules.md", RULES.replace("| AIR-01 | One. |\n", ""))
        for name, text in (("tests/product/some_test.cpp", UNIT),
                           ("tests/whole_runs/golden/some-unit/unit.toml", GOLDEN)):
            self.put(name, text.replace("AIR-01, ", ""))
        self.assertEqual(self.run_script(), (0, ""))


if __name__ == "__main__":
    unittest.main()
