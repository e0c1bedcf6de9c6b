# SPDX-License-Identifier: Apache-2.0
"""The unit tool's driver: reason codes worked out by hand, and every difference is found."""

from __future__ import annotations

import copy
import json
import os
import tempfile
import unittest
from collections.abc import Callable
from pathlib import Path
from typing import Any

from drivers import runner
from drivers.explain import explain, explanation, same_tree
from drivers.explain.explanation import left_faults, own_faults, reason_faults
from drivers.explain.reasons import Stage
from drivers.explain.value_reasons import Line
from drivers.random_units import generator
from model import parts
from model.unit_case import UnitCase
from model.tree import Tree

ASKED = ["profile-not-generated"]
PRODUCT = "/fs/mp/etc/airplay.conf"
SAID: dict[str, Any] = {
    "format": 1, "command": "explain", "root": "/bench", "letters": "a", "isIntended": False,
    "outputs": [
        {"path": "/tmp/telephony_FFFF.txt", "outcome": "not-asked", "isIntended": True,
         "reasons": ASKED, "lines": [], "left": "file", "content": {"hex": "ff"}},
        {"path": "/tmp/speechrec_FFFF.txt", "outcome": "not-asked", "isIntended": True,
         "reasons": ASKED, "lines": [], "left": "folder", "content": None},
        {"path": "/tmp/airplay.conf", "outcome": "stock", "isIntended": False,
         "reasons": ["template-missing"],
         "lines": [{"text": "b\nc", "reasons": ["from-stock"], "key": f"file.{PRODUCT}",
                    "detail": PRODUCT}],
         "left": "file", "content": "b\nc"},
        {"path": "/tmp/iap1.cfg", "outcome": "generated", "isIntended": False,
         "reasons": ["generated"],
         "lines": [{"text": "# fixed\n", "reasons": ["fixed-text"], "key": None, "detail": ""},
                   {"text": "serial=\n", "reasons": ["serial-blank"], "key": "slot.9",
                    "detail": ""}],
         "left": "file", "content": "# fixed\nserial=\n"},
    ]}
STAGES = (
    Stage("/tmp/telephony_FFFF.txt", "not-asked", ("profile-not-generated",)),
    Stage("/tmp/speechrec_FFFF.txt", "not-asked", ("profile-not-generated",)),
    Stage("/tmp/airplay.conf", "stock", ("template-missing",),
          (Line(b"b\nc", ("from-stock",), b"file." + PRODUCT.encode()),)),
    Stage("/tmp/iap1.cfg", "generated", ("generated",),
          (Line(b"serial=\n", ("serial-blank",), b"slot.9"),)),
)

Change = Callable[[dict[str, Any]], object]


def put(path: str, value: Any) -> Change:
    """Puts `value` at a path such as "outputs.2.left" of what was said."""
    def change(document: Any) -> None:
        *way, last = (int(name) if name.isdigit() else name for name in path.split("."))
        for name in way:
            document = document[name]
        document[last] = value
    return change


class Explanations(UnitCase):
    def setUp(self) -> None:
        super().setUp()
        parts.put(self.root, "/tmp/telephony_FFFF.txt", b"\xff")
        parts.put_folder(self.root, "/tmp/speechrec_FFFF.txt")
        parts.put(self.root, "/tmp/airplay.conf", b"b\nc")
        parts.put(self.root, "/tmp/iap1.cfg", b"# fixed\nserial=\n")

    def said(self, change: Change = lambda document: None) -> explanation.Explanation:
        document = copy.deepcopy(SAID)
        change(document)
        return explanation.parse(json.dumps(document).encode())

    def own(self, change: Change = lambda document: None, status: int = 1) -> list[str]:
        return own_faults(self.said(change), b"/bench", "a", status)

    def test_no_differences(self) -> None:
        self.assertEqual(self.own(), [])
        self.assertEqual(reason_faults(self.said(), STAGES), [])
        self.assertEqual(left_faults(self.said(), Tree(self.root)), [])

    def test_contradictions(self) -> None:
        self.assertEqual(len(self.own(status=0)), 1)
        for path, value in (
                ("root", "/other"), ("letters", "ai"), ("outputs.0.isIntended", False),
                ("outputs.2.isIntended", True), ("outputs.3.isIntended", True),
                ("outputs.3.lines.1.reasons", []), ("outputs.0.reasons", []),
                ("outputs.0.reasons", ["no-such-code"]), ("outputs.0.reasons", ASKED * 2)):
            with self.subTest(path=path, value=value):
                self.assertEqual(len(self.own(put(path, value))), 1)
        self.assertEqual(len(self.own(put("isIntended", True))), 2)

    def test_reasons(self) -> None:
        for path, value in (
                ("outputs", SAID["outputs"][1:]), ("outputs", SAID["outputs"][::-1]),
                ("outputs.2.outcome", "empty"),
                ("outputs.2.reasons", ["template-missing", "stock-empty"]),
                ("outputs.2.lines", []), ("outputs.3.lines.1.key", "slot.8"),
                ("outputs.3.lines.1.key", None), ("outputs.3.lines.1.text", "serial=1\n"),
                ("outputs.3.lines.1.reasons", ["from-record"]),
                ("outputs.3.lines.0.reasons", ["from-record"]),
                ("outputs.3.lines.0.text", "two\nlines\n"), ("outputs.3.lines.0.text", "no end"),
                ("outputs.3.lines.0.text", "")):
            with self.subTest(path=path, value=value):
                self.assertGreater(len(reason_faults(self.said(put(path, value)), STAGES)), 0)

    def test_left(self) -> None:
        for path, value in (
                ("outputs.0.left", "nothing"), ("outputs.1.left", "other"),
                ("outputs.0.content", {"hex": "fe"}), ("outputs.2.content", "b\nd"),
                ("outputs.2.content", None), ("outputs.1.content", ""),
                ("outputs.2.lines.0.text", "b\n"), ("outputs.3.lines", []),
                ("outputs.0.lines", SAID["outputs"][2]["lines"]),
                ("outputs.1.outcome", "empty")):
            with self.subTest(path=path, value=value):
                found = left_faults(self.said(put(path, value)), Tree(self.root))
                self.assertEqual(len(found), 1)

    def test_the_last_of_one_place_counts(self) -> None:
        self.remove("/tmp/airplay.conf")
        parts.put_link(self.root, "/tmp/airplay.conf", "iap1.cfg")
        content = put("outputs.2.content", "# fixed\nserial=\n")
        self.assertEqual(left_faults(self.said(content), Tree(self.root)), [])

    def test_text_that_is_not_an_explanation(self) -> None:
        for change in (put("format", 2), put("command", "show"), put("outputs.0.content", {}),
                       put("outputs.0.content", {"hex": "61"}), put("outputs.0.content", 1),
                       lambda document: document["outputs"][0].pop("content")):
            with self.assertRaises((ValueError, KeyError, TypeError)):
                self.said(change)
        with self.assertRaises(ValueError):
            explanation.parse(b"{")


class SameTree(unittest.TestCase):
    def setUp(self) -> None:
        folder = tempfile.TemporaryDirectory()
        self.addCleanup(folder.cleanup)
        self.first, self.second = Path(folder.name, "1"), Path(folder.name, "2")
        for root in (self.first, self.second):
            parts.put(root, "/file", b"text")
            parts.put(root, "/folder/.orvane-unit", b"mark")
            parts.put_link(root, "/link", "file")
            parts.put_disk(root, serial=b"12345678", area=b"\1" * 1880)

    def differing(self, change: Callable[[Path], object]) -> int:
        change(self.second)
        return len(same_tree.differences(self.first, self.second))

    def test_the_same(self) -> None:
        def other_mode(root: Path) -> None:
            (root / "file").chmod(0o600)
            (root / "folder").chmod(0o700)
            os.utime(root / "dev/hd0", (1, 1))
        self.assertEqual(self.differing(other_mode), 0)

    def test_zeros_and_holes_are_the_same(self) -> None:
        def whole(root: Path) -> None:
            disk = root / "dev/hd0"
            content = disk.read_bytes()
            disk.unlink()
            disk.write_bytes(content)
        self.assertEqual(self.differing(whole), 0)

    def test_differences(self) -> None:
        def disk_byte(root: Path) -> None:
            with open(root / "dev/hd0", "r+b") as file:
                file.seek(70_000)
                file.write(b"\1")

        def link(root: Path) -> None:
            (root / "link").unlink()
            (root / "link").symlink_to("folder")

        def folder(root: Path) -> None:
            (root / "file").unlink()
            (root / "file").mkdir()

        for change in (
                disk_byte, link, folder,
                lambda root: os.truncate(root / "dev/hd0", 2**21 + 1),
                lambda root: (root / "file").write_bytes(b"tex."),
                lambda root: (root / "folder/.orvane-unit").unlink(),
                lambda root: (root / "more").mkdir()):
            with self.subTest(change=change):
                self.setUp()
                self.assertEqual(self.differing(change), 1)


class Driver(UnitCase):
    def tool(self, script: str) -> str:
        tool = self.root / "tool"
        tool.write_text(f"#!/bin/sh\n{script}\n", encoding="ascii")
        tool.chmod(0o700)
        return str(tool)

    def test_failing_explain(self) -> None:
        for script in ("exit 1", "exit 2", "echo '{}'; exit 1", "echo x >&2; exit 1"):
            found, lines = explain.explained(self.tool(script), self.root, ["-a"], ())
            self.assertEqual((found, len(lines)), (None, 1))

    def test_failing_describe_and_new(self) -> None:
        with tempfile.TemporaryDirectory() as folder:
            for script in ("exit 2", "echo x >&2", "[ $1 = describe ]", "[ $1 = describe ] || "
                           "mkdir $2"):
                lines = explain.described(self.tool(script), self.root, Path(folder))
                self.assertGreater(len(lines), 0)

    def test_missing_tool(self) -> None:
        with self.assertRaises(runner.BrokenRun):
            explain.ask([str(self.root / "none")])

    def test_units_have_options_and_a_mark(self) -> None:
        for index in range(50):
            with tempfile.TemporaryDirectory() as folder:
                options = explain.make_marked_unit(Path(folder), generator("test", index))
                self.assertRegex(" ".join(options), "^-[ai]( -[ai])*$")
                self.assertEqual((Path(folder) / ".orvane-unit").read_bytes(),
                                 b"made by orvane-unit, layout 1\n")
