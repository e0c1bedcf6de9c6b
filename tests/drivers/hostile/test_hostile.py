# SPDX-License-Identifier: Apache-2.0
"""Each kind of fault is found: a stand-in for orvane-unit commits them one at a time."""

from __future__ import annotations

import random
import tempfile
import unittest
from pathlib import Path

from drivers.hostile import faults, hostile
from drivers.hostile.hostile_units import is_own_folder, outside_of
from drivers.random_units import RandomUnit
from drivers.unit_tool import MARKER
from model import parts, records


class Printed(unittest.TestCase):
    def test_what_a_terminal_shows(self) -> None:
        for text in ("", "line\n\tline\n", "\u540d \u00e9 \\x1b", "\u00a0"):
            self.assertEqual(faults.printed_faults("it", text.encode()), [], text)

    def test_what_a_terminal_obeys(self) -> None:
        for output in (b"\x1b[1m", b"\r", b"\0", b"\x7f", b"\xc2\x9b", b"\xe2\x80\xae", b"\xe2\x81\xa6", b"\xff",
                       b"\xe2\x80\xa8", b"\xc2\xad"):
            self.assertEqual(len(faults.printed_faults("it", b"text " + output)), 1, output)


class Page(unittest.TestCase):
    def test_good_page(self) -> None:
        self.assertEqual(faults.page_faults(b"<p>text</p><script>a < b</script>"), [])

    def test_bad_pages(self) -> None:
        for page in (b"<p>text</p>", b"<p><script></script>", b"<p onclick=x></p><script></script>",
                     b"<script></script><script></script>", b"<p>\xe2\x80\xae</p><script></script>", b"\xff"):
            self.assertEqual(len(faults.page_faults(page)), 1, page)


class Ends(unittest.TestCase):
    def test_good_ends(self) -> None:
        for end in ((0, b"text\n", b""), (1, b"text\n", b""), (2, b"", b"orvane-unit: a\norvane-unit: b\n")):
            self.assertEqual(faults.end_faults("show", *end), [], end)

    def test_check_reports_other_cases_beside_a_bad_one(self) -> None:
        self.assertEqual(faults.end_faults("check", 2, b"case  not checked\n", b"orvane-unit: a\n"), [])

    def test_bad_ends(self) -> None:
        for end in ((-11, b"", b""), (-99, b"", b""), (3, b"", b"orvane-unit: a\n"), (2, b"", b""),
                    (2, b"", b"a\n"), (2, b"", b"orvane-unit: \n"), (0, b"", b"orvane-unit: a\n"),
                    (2, b"half of a report", b"orvane-unit: a\n")):
            self.assertEqual(len(faults.end_faults("show", *end)), 1, end)

    def test_json(self) -> None:
        self.assertEqual(faults.parsed("show", b'{"format":1,"command":"show"}\n')[1], [])
        for output in (b"", b"{", b"[]", b'{"format":1}', b'{"format":2,"command":"show"}',
                       b'{"format":1,"command":"diff"}'):
            self.assertEqual(len(faults.parsed("show", output)[1]), 1, output)


class OwnFolders(unittest.TestCase):
    def test_only_folders_of_the_unit_are_filled(self) -> None:
        with tempfile.TemporaryDirectory() as name:
            root, outside = Path(name) / "unit", Path(name) / "outside"
            (root / "own/below").mkdir(parents=True)
            (outside / "below").mkdir(parents=True)
            (root / "file").touch()
            (root / "link").symlink_to(outside)
            (root / "loop").symlink_to("loop")
            for place in ("", "own", "own/below"):
                self.assertTrue(is_own_folder(root, root / place), place)
            for place in ("file", "none", "link", "link/below", "loop", "loop/below", "file/below"):
                self.assertFalse(is_own_folder(root, root / place), place)


class Redacted(unittest.TestCase):
    def test_a_serial_is_found_anywhere(self) -> None:
        with tempfile.TemporaryDirectory() as name:
            folder = Path(name)
            parts.put(folder, "/sub/far", b"")
            with open(folder / "sub/far", "r+b") as file:
                file.seek(1 << 30)
                file.write(b"..SN004217..")
            parts.put(folder, "/SN004217.inf", b"")
            parts.put_link(folder, "/link", "to-SN004217")
            parts.put(folder, "/other", b"SN004218")
            self.assertEqual(len(faults.places_of(b"SN004217", folder)), 3)

    def test_the_serial_is_read_from_the_disk(self) -> None:
        with tempfile.TemporaryDirectory() as name:
            disk = Path(name) / "dev/hd0"
            for written, serial in ((b"SN004217", b"SN004217"), (b" SN42\0xx", b"SN42"), (b"", b"")):
                parts.put_disk(Path(name), records.RECORD_AREA + 5, written)
                self.assertEqual(hostile.serial_in(disk), serial)
            parts.put_disk(Path(name), 100)
            self.assertEqual(hostile.serial_in(disk), b"")


class Commands(unittest.TestCase):
    def setUp(self) -> None:
        folder = tempfile.TemporaryDirectory()
        self.addCleanup(folder.cleanup)
        self.folder = Path(folder.name)
        self.root = self.folder / "unit"
        parts.put(self.root, f"/{MARKER}", b"")
        parts.put(outside_of(self.root), "/canary", b"")
        unit = RandomUnit(self.root, (), random.Random(1))
        self.tool = self.folder / "tool"
        self.scene = hostile.Scene(unit, hostile.Tools("orvane", str(self.tool)))
        self.scene.is_weak = False

    def ask(self, script: str, *words: str, changes: Path | None = None, makes: str = "") -> list[str]:
        """What is said of a tool that does this."""
        self.tool.write_text(f"#!/bin/sh\n{script}\n", encoding="ascii")
        self.tool.chmod(0o755)
        self.scene.lines = []
        self.scene.ask(*(words or ("show", str(self.root))), changes=changes, makes=makes)
        return self.scene.lines

    def test_nothing_is_wrong(self) -> None:
        self.assertEqual(self.ask("echo text"), [])
        self.assertEqual(self.scene.reached, {"show 0"})

    def test_a_change_outside_the_unit(self) -> None:
        for script in ("echo x > canary", "touch new", "chmod 0 canary", "rm canary", "touch canary"):
            self.assertNotEqual(self.ask(script, "run", changes=self.root), [], script)

    def test_a_change_of_the_unit(self) -> None:
        script = "echo x > ../unit/new"
        self.assertNotEqual(self.ask(script), [])
        self.assertEqual(self.ask(f"{script}er", "set", changes=self.root), [])

    def test_what_is_left_behind(self) -> None:
        self.assertEqual(len(self.ask('echo x > "$TMPDIR/left"')), 1)
        (self.scene.temporary / "left").unlink()
        self.assertEqual(len(self.ask("mkdir ../made/.copy.unfinished-1", "capture", makes="copy")), 1)
        self.assertEqual(self.ask("mkdir ../made/copy", "capture", makes="copy"), [])
        self.assertEqual(len(self.ask("mkdir ../made/again; echo orvane-unit: no >&2; exit 2", "new", makes="again")),
                         1)

    def test_a_signal(self) -> None:
        self.assertIn("status -9", self.ask("kill -9 $$")[0])

    def test_a_refusal_to_capture_what_can_be_explained(self) -> None:
        explained = '{"format":1,"command":"explain","outputs":[]}'
        self.tool.write_text("#!/bin/sh\n"
                             f"[ $1 != explain ] || {{ echo '{explained}'; exit; }}\n"
                             "echo 'orvane-unit: cannot read /x: Permission denied' >&2; exit 2\n", encoding="ascii")
        self.tool.chmod(0o755)
        parts.put(self.root, "/fs/mp/etc/airplay.conf", b"stock")
        file, folder = self.root / "fs/mp/etc/airplay.conf", self.root / "empty"
        folder.mkdir()
        for is_weak, mode, place, faults_found in (
                (True, 0o644, file, 1), (True, 0o222, file, 0), (False, 0o222, file, 1),
                (True, 0o444, folder, 0), (True, 0o555, folder, 1)):
            place.chmod(mode)
            self.scene.is_weak, self.scene.lines = is_weak, []
            self.scene.states = {}
            self.scene.capture()
            self.assertEqual(len(self.scene.lines), faults_found, (is_weak, oct(mode), place))
            place.chmod(0o755)
