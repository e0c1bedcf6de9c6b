# SPDX-License-Identifier: Apache-2.0
"""The bill of materials names all that is in a program, or is not made. test_package.py and
check_tarball.py look at the bills of whole packages."""

from __future__ import annotations

import copy
import os
import re
import shutil
import sys
import tempfile
import unittest
from pathlib import Path
from typing import Any
from unittest import mock

import bill_rules
from shipped import BILL, PROJECT

sys.path.insert(0, str(PROJECT / "packaging"))
import bill_of_materials  # noqa: E402


@unittest.skipIf(os.environ.get("ORVANE_PROCESSOR") == "arm", "orvane-unit is not built in its tests")
class BillOfMaterialsTest(unittest.TestCase):
    content: dict[str, Path]
    bill: dict[str, Any]

    @classmethod
    def setUpClass(cls) -> None:
        build = Path(os.environ["ORVANE_BUILD"])
        cls.content = {"bin/orvane": build / "orvane", "bin/orvane-unit": build / "orvane-unit",
                       "share/LICENSE": PROJECT / "LICENSE"}
        with mock.patch.dict(os.environ, SOURCE_DATE_EPOCH="1"):
            cls.bill = cls.make()

    @classmethod
    def make(cls, build: Path | None = None, ninja: str = "ninja") -> dict[str, Any]:
        return bill_of_materials.document(
            bill_of_materials.Build(build or Path(os.environ["ORVANE_BUILD"]).resolve(), PROJECT, ninja),
            "orvane-test", "1", cls.content, BILL)

    def broken(self, bill: dict[str, Any]) -> list[str]:
        return bill_rules.broken_rules(bill, {name: path.read_bytes() for name, path in self.content.items()})

    def test_it_keeps_the_rules(self) -> None:
        self.assertEqual(self.broken(self.bill), [])

    def test_a_bill_with_something_missing_breaks_a_rule(self) -> None:
        for section in ("packages", "files", "relationships"):
            for index in range(len(self.bill[section])):
                changed = copy.deepcopy(self.bill)
                del changed[section][index]
                with self.subTest(section=section, index=index):
                    self.assertNotEqual(self.broken(changed), [])

    def test_a_package_without_a_licence_in_the_table_is_refused_by_name(self) -> None:
        names = [package["name"] for package in self.bill["packages"][1:]]
        self.assertEqual(len(names), len(bill_of_materials.LICENCES))
        for name in names:
            package = bill_of_materials.debian_package(name)
            fewer = {pattern: licence for pattern, licence in bill_of_materials.LICENCES.items()
                     if not re.fullmatch(pattern, name)}
            with self.subTest(name=name), mock.patch.object(bill_of_materials, "LICENCES", fewer), \
                    self.assertRaisesRegex(bill_of_materials.Incomplete, f"licence of {re.escape(name)} is not known"):
                self.assertEqual(package.licence, "")

    def test_there_is_no_bill_without_the_licence_of_a_library(self) -> None:
        with mock.patch.dict(bill_of_materials.LICENCES), \
                self.assertRaisesRegex(bill_of_materials.Incomplete, "the licence of libdtl-dev is not known"):
            del bill_of_materials.LICENCES["libdtl-dev"]
            self.make()

    def test_a_file_of_no_package_is_refused_by_name(self) -> None:
        with tempfile.NamedTemporaryFile(suffix=".h") as header, \
                self.assertRaisesRegex(bill_of_materials.Incomplete, header.name):
            bill_of_materials.owning_packages({header.name, "/usr/include/stdio.h"})

    def test_a_program_without_a_map_is_refused(self) -> None:
        with tempfile.TemporaryDirectory() as name, \
                self.assertRaisesRegex(bill_of_materials.Incomplete, "orvane.map is missing"):
            self.make(Path(name))

    def test_an_object_of_which_the_headers_are_not_known_is_refused(self) -> None:
        """Ninja forgets them when its log is removed, until the object is compiled again."""
        with tempfile.TemporaryDirectory() as name:
            build = Path(name)
            for file in ("build.ninja", "CMakeFiles/rules.ninja", "orvane.map"):
                (build / file).parent.mkdir(exist_ok=True)
                shutil.copy(Path(os.environ["ORVANE_BUILD"]) / file, build / file)
            with self.assertRaisesRegex(bill_of_materials.Incomplete, "does not say what the compiler read"):
                self.make(build)

    def test_the_same_bill_has_the_same_name_and_another_another(self) -> None:
        with mock.patch.dict(os.environ, SOURCE_DATE_EPOCH="1"):
            self.assertEqual(self.make(), self.bill)
        with mock.patch.dict(os.environ, SOURCE_DATE_EPOCH="2"):
            self.assertNotEqual(self.make()["documentNamespace"], self.bill["documentNamespace"])


if __name__ == "__main__":
    unittest.main()
