# SPDX-License-Identifier: Apache-2.0
"""`orvane-field capture` copies what orvane reads, and the desk says the same about the copy as about the
unit."""

from __future__ import annotations

import re
import shutil
import subprocess
import tempfile
import unittest
from pathlib import Path

from capture_case import CaptureTest
from car import AREA, DISK, IMAGE, ORVANE_UNIT, OUTPUTS, SHELLS, VERSIONS, is_root

GOLDEN = Path(__file__).resolve().parents[1] / "whole_runs/golden"


class WholeUnitTest(CaptureTest):
    def test_every_input_in_any_shell(self) -> None:
        for name in OUTPUTS[:-1]:
            (self.car / "tmp" / name).write_text(f"an older {name}\n")
        (self.car / "tmp/other").write_text("somebody else's")
        for shell in SHELLS:
            with self.subTest(shell):
                self.again()
                done = self.capture(shell=shell)
                self.check_success(done)
                self.assertEqual(done.err, "orvane-field: /tmp/iap1.cfg: missing\n")
                files = {str(path.relative_to(self.captured("."))): path.read_bytes()
                         for path in self.captured(".").rglob("*") if path.is_file()}
                wanted = {str(path.relative_to(self.car.root)): path.read_bytes()
                          for part in ("fs", "tmp") for path in (self.car / part).rglob("*")
                          if path.is_file() and path.name != "other"}
                wanted[DISK] = (self.car / DISK).read_bytes()[-AREA:]
                wanted["capture.txt"] = b"/tmp/iap1.cfg: missing\ncomplete\n"
                self.assertEqual(files, wanted)

    @unittest.skipUnless(is_root(), "only root can become another user")
    def test_an_ordinary_user(self) -> None:
        self.check_success(self.capture(is_ordinary=True))

    def test_a_folder_that_is_empty_already(self) -> None:
        (self.car / "home/car").mkdir()
        self.check_success(self.capture())

    def test_what_is_missing_stays_missing(self) -> None:
        for path in (IMAGE, DISK, "fs/mp/etc/mm/iap1_static.cfg", VERSIONS, "tmp"):
            with self.subTest(path):
                self.car.reset()
                gone = self.car / path
                if gone.is_dir():
                    shutil.rmtree(gone)
                else:
                    gone.unlink()
                done = self.capture()
                self.check_success(done)
                self.assertIn(f"orvane-field: /{path}: missing\n", done.err)
                self.assertFalse(self.captured(path).exists())

    def test_an_empty_folder_and_an_empty_file_stay_so(self) -> None:
        shutil.rmtree(self.car / VERSIONS)
        (self.car / VERSIONS).mkdir()
        (self.car / IMAGE).write_bytes(b"")
        self.check_success(self.capture())
        self.assertEqual(list(self.captured(VERSIONS).iterdir()), [])
        self.assertEqual(self.captured(IMAGE).read_bytes(), b"")

    def test_folders_in_the_place_of_files_are_folders(self) -> None:
        for path in (IMAGE, DISK, "fs/mp/etc/airplay_static.conf", "tmp/iap2.cfg"):
            if (self.car / path).exists():
                (self.car / path).unlink()
            (self.car / path).mkdir()
        self.check_success(self.capture())
        for path in (IMAGE, DISK, "fs/mp/etc/airplay_static.conf", "tmp/iap2.cfg"):
            self.assertTrue(self.captured(path).is_dir(), path)

    def test_links_are_followed(self) -> None:
        for number, path in enumerate((IMAGE, DISK, "fs/mp/etc/airplay_static.conf")):
            (self.car / path).rename(self.car / f"home/{number}")
            (self.car / path).symlink_to(f"/home/{number}")
        (self.car / "tmp/iap1.cfg").symlink_to("/fs/mp/etc/mm/iap1.cfg")
        (self.car / "tmp/iap2.cfg").symlink_to("/nothing")
        done = self.capture()
        self.check_success(done)
        for path in (IMAGE, DISK, "tmp/iap1.cfg"):
            self.assertFalse(self.captured(path).is_symlink())
        self.assertEqual(self.captured(DISK).stat().st_size, AREA)
        self.assertIn("/tmp/iap1.cfg: a link, whose target is copied\n", done.err)
        self.assertIn("/tmp/iap2.cfg: link to nothing\n", done.err)

    def test_names_of_version_files(self) -> None:
        shutil.rmtree(self.car / VERSIONS)
        (self.car / VERSIONS).mkdir()
        taken = {"a.inf", ".inf", ".hidden.inf", "b.inf.old", "a name *?.inf", "-n.inf", ".inf.inf"}
        for name in (*taken, "a.info"[:-1] + "x", "readme", ".xinf", "INF.INF"):
            (self.car / VERSIONS / name).write_text(f"Name = {name}\n")
        self.check_success(self.capture())
        wanted = taken | {"a.infx"}
        self.assertEqual({path.name for path in self.captured(VERSIONS).iterdir()}, wanted)

    def test_several_applications_are_reported(self) -> None:
        self.assertNotIn("applications", self.capture().err)
        (self.car / VERSIONS / "b.inf").write_bytes(b" Type = x\nType=MainApplication2")
        (self.car / VERSIONS / "c.inf").write_bytes(b"Type=Application\nType =Other\n")
        self.again()
        done = self.capture()
        self.check_success(done)
        self.assertIn(f"/{VERSIONS}: 2 applications: application.inf b.inf. The unit's own order", done.err)


class ToTheDeskTest(CaptureTest):
    """What the desk says about the captured folder holds for the unit."""

    def tool(self, *words: object, status: tuple[int, ...] = (0, 1)) -> str:
        done = subprocess.run([ORVANE_UNIT, *map(str, words)], capture_output=True, text=True, check=False)
        self.assertIn(done.returncode, status, done.stderr)
        # On a shorter disk, the area begins elsewhere.
        return re.sub(r"(disk bytes from|block \d, disk byte|disk byte) \d+", r"\1", done.stdout)

    def check_explanations(self, desk: Path) -> None:
        wanted = self.tool("explain", self.car.root, "--all")
        self.assertEqual(self.tool("explain", self.captured("."), "--all"), wanted)
        self.tool("capture", self.captured("."), desk, status=(0,))
        self.assertEqual(self.tool("explain", desk, "--all"), wanted)
        self.assertFalse((desk / "capture.txt").exists())

    def test_explanations_are_the_same(self) -> None:
        for name in ("airplay-image-absent", "airplay-image-empty", "airplay-template-folder",
                     "airplay-output-folder", "disk-one-byte-less", "disk-empty", "tuning-disk-absent",
                     "iap-serial-odd-bytes", "iap-all-templates-missing", "tmp-absent",
                     "version-with-nul", "version-marker-inside-name", "iap-templates-binary"):
            with self.subTest(name), tempfile.TemporaryDirectory(prefix="orvane-field-") as folder:
                self.tool("new", f"{folder}/unit", "--from", GOLDEN / name / "unit.toml", status=(0,))
                self.car.reset()
                self.car.replace_unit(Path(folder) / "unit")
                self.check_success(self.capture())
                self.check_explanations(Path(folder) / "desk")

    def test_the_record_is_not_part_of_the_unit(self) -> None:
        self.check_success(self.capture())
        with tempfile.TemporaryDirectory(prefix="orvane-field-") as folder:
            self.tool("capture", self.captured("."), f"{folder}/desk", status=(0,))
            self.assertEqual(self.tool("diff", self.captured("."), f"{folder}/desk", status=(0,)), "")
            self.tool("set", f"{folder}/desk", "serial=ZZ", status=(0,))
            self.assertIn("ZZ", self.tool("diff", self.captured("."), f"{folder}/desk", status=(1,)))

    def test_the_captured_tmp_is_compared_with_a_run(self) -> None:
        with tempfile.TemporaryDirectory(prefix="orvane-field-") as folder:
            # The boot ran before the image was there.
            image = (self.car / IMAGE).read_bytes()
            (self.car / IMAGE).unlink()
            self.car.program("home/boot", "/bin/orvane -a -i\n")
            (self.car / ".orvane-unit").write_text("made by orvane-unit, layout 1\n")
            self.tool("run", self.car.root, "--", "-a", "-i", status=(0,))
            (self.car / ".orvane-unit").unlink()
            (self.car / IMAGE).write_bytes(image)
            self.check_success(self.capture())
            desk = Path(folder) / "desk"
            self.tool("capture", self.captured("."), desk, status=(0,))
            for path in self.captured("tmp").iterdir():
                shutil.copy(path, desk / "tmp")
            shown = self.tool("run", desk, "--", "-a", "-i", status=(0,))
            self.assertIn("\n-model = VOXA\n+model = Quarion Velmira\n", shown)
            self.assertNotIn("serial", [line[1:7] for line in shown.splitlines() if line[:1] in "+-"])


if __name__ == "__main__":
    unittest.main()
