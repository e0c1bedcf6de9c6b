# SPDX-License-Identifier: Apache-2.0
"""What a disturbed run may leave, and what it may not."""

from __future__ import annotations

import unittest

from drivers.moments.kills import faults_after, is_beginning
from drivers.moments.publisher import either
from model.snapshot import FILE, FOLDER, Entry

OUTPUT = "/tmp/airplay.conf"
INPUT = "/fs/mp/etc/airplay.conf"


def file(content: bytes, mode: int = 0o644) -> Entry:
    return Entry(FILE, content, mode)


class Kills(unittest.TestCase):
    def test_as_before_or_a_beginning(self) -> None:
        before, whole = file(b"old"), file(b"new text")
        for have in (before, file(b""), file(b"new"), whole):
            self.assertTrue(is_beginning(have, before, whole), have)
        self.assertTrue(is_beginning(None, None, whole))
        self.assertTrue(is_beginning(None, None, None))

    def test_anything_else_is_a_fault(self) -> None:
        before, whole = file(b"old"), file(b"new text")
        for have in (None, file(b"ol"), file(b"newold"), file(b"new text and more"), file(b"", 0o600), Entry(FOLDER)):
            self.assertFalse(is_beginning(have, before, whole), have)
        self.assertFalse(is_beginning(file(b""), None, None))

    def test_nothing_but_outputs_may_change(self) -> None:
        tree = {OUTPUT: file(b"old"), INPUT: file(b"stock")}
        self.assertEqual(faults_after(tree, tree, tree), [])
        self.assertEqual(len(faults_after(tree, {**tree, INPUT: file(b"stoc")}, tree)), 1)
        self.assertEqual(len(faults_after(tree, {OUTPUT: file(b"old")}, tree)), 1)
        self.assertEqual(len(faults_after(tree, {**tree, "/tmp/other": file(b"")}, tree)), 1)
        self.assertEqual(len(faults_after(tree, {**tree, OUTPUT: file(b"else")}, tree)), 1)


class Lines(unittest.TestCase):
    FIRST = b"model = one\n# profile\nprofile = 3\ndrive = 1\n"
    SECOND = b"model = two\ndrive = 0\n"

    def assert_allowed(self, is_allowed: bool, *texts: bytes) -> None:
        for text in texts:
            self.assertEqual(bool(either(self.FIRST, self.SECOND).fullmatch(text)), is_allowed, text)

    def test_each_line_of_either_at_its_place(self) -> None:
        self.assert_allowed(True, self.FIRST, self.SECOND, b"model = two\n# profile\nprofile = 3\ndrive = 0\n",
                            b"model = one\ndrive = 0\n", b"model = two\ndrive = 1\n")

    def test_any_other_line(self) -> None:
        self.assert_allowed(False, b"", b"model = one\n", b"model = onw\ndrive = 1\n", b"drive = 1\nmodel = one\n",
                            b"model = one\nprofile = 3\ndrive = 1\n", b"model = one\nmodel = two\ndrive = 1\n",
                            b"model = one\ndrive = 1", self.FIRST + self.SECOND)


if __name__ == "__main__":
    unittest.main()
