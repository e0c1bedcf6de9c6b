# SPDX-License-Identifier: Apache-2.0
"""`orvane-field capture` copies what orvane reads, exactly, and says what it could not copy."""

from __future__ import annotations

import os
import random
import re
import shutil
import subprocess
import tempfile
import unittest
from pathlib import Path

from car import (AREA, CAPTURE_UTILITIES, DISK, IMAGE, ORVANE_UNIT, OUTPUTS, SHELLS, SIGNALLER, VERSIONS,
                 Car, Done, is_root, snapshot)

GIB = 1 << 30
BLOCK = 512
# One-block reads of the search, and what measures and checks the end; see find_end in the script.
MOST_CALLS = 75
GOLDEN = Path(__file__).resolve().parents[1] / "golden"
RECORDER = 'echo "$*" >>/home/calls\nexec /bin/NAME "$@"\n'


class CaptureTest(unittest.TestCase):
    car: Car

    @classmethod
    def setUpClass(cls) -> None:
        cls.car = Car()
        cls.addClassCleanup(cls.car.close)

    def setUp(self) -> None:
        self.car.reset()

    def capture(self, **given: object) -> Done:
        """Captures into /home/car, and requires that the unit itself stays as it is."""
        parts = [self.car / name for name in ("fs", "dev/hd0", "tmp")]
        before = [snapshot(part) for part in parts if os.path.lexists(part)]
        done = self.car.run("capture", "car", **given)
        self.assertEqual([snapshot(part) for part in parts if os.path.lexists(part)], before)
        self.assertFalse((self.car / "home/car/.block").exists())
        self.assertFalse((self.car / "home/car/.byte").exists())
        return done

    def captured(self, path: str) -> Path:
        return self.car / "home/car" / path

    def check_success(self, done: Done) -> None:
        self.assertEqual((done.status, done.out), (0, "captured into /home/car\n"), done.err)

    def check_failure(self, done: Done, said: str) -> None:
        self.assertEqual((done.status, done.out), (1, ""), done.err)
        self.assertIn(said, done.err)
        self.assertTrue(done.err.endswith("/home/car is not complete\n"), done.err)

    def again(self) -> None:
        shutil.rmtree(self.car / "home/car", ignore_errors=True)


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

    def test_several_applications_are_told(self) -> None:
        self.assertNotIn("applications", self.capture().err)
        (self.car / VERSIONS / "b.inf").write_bytes(b" Type = x\nType=MainApplication2")
        (self.car / VERSIONS / "c.inf").write_bytes(b"Type=Application\nType =Other\n")
        self.again()
        done = self.capture()
        self.check_success(done)
        self.assertIn(f"/{VERSIONS}: 2 applications: application.inf b.inf. The unit's own order", done.err)


class DiskTest(CaptureTest):
    def make_disk(self, size: int) -> bytes:
        """The last bytes of a disk that is a hole before them; returns what must be captured."""
        content = random.Random(size).randbytes(min(size, AREA + 3 * BLOCK))
        with open(self.car / DISK, "wb") as disk:
            disk.truncate(size)
            disk.seek(size - len(content))
            disk.write(content)
        return content[-AREA:]

    def test_sizes(self) -> None:
        sizes = (0, 1, BLOCK - 1, BLOCK, BLOCK + 1, 5 * BLOCK, AREA - 1, AREA, AREA + 1,
                 AREA + BLOCK - 1, AREA + BLOCK, 2 * AREA + 1, 3 * AREA, 5 * GIB + 37, 64 * GIB)
        shells = list(SHELLS)
        for number, size in enumerate(sizes):
            for shell in (shells if size == 5 * GIB + 37 else [shells[number % len(shells)]]):
                with self.subTest(size=size, shell=shell):
                    wanted = self.make_disk(size)
                    self.again()
                    self.check_success(self.capture(shell=shell))
                    self.assertTrue(self.captured(DISK).read_bytes() == wanted)

    def check_calls(self, size: int, most: int) -> None:
        """What is read of the disk in all is the area, and a block for each other call."""
        (self.car / "home/calls").unlink()
        wanted = self.make_disk(size)
        self.again()
        self.check_success(self.capture(path="/wrap:/bin"))
        self.assertTrue(self.captured(DISK).read_bytes() == wanted)
        calls = (self.car / "home/calls").read_text().splitlines()
        counts = [int(re.search(r"bs=512 .*count=(\d+)", call)[1]) for call in calls
                  if f"if=/{DISK} " in call]
        self.assertLessEqual(len(calls), most + 20)  # the small files, too
        self.assertLessEqual(len(counts), most)
        self.assertEqual(sorted(counts)[:-1], [1] * (len(counts) - 1))
        self.assertLessEqual(max(counts), AREA // BLOCK + 1)

    def test_little_is_read(self) -> None:
        self.car.wrap(RECORDER, "dd")
        (self.car / "home/calls").touch()
        for size in (8 * GIB, 8 * GIB + 511, 500 * GIB):
            with self.subTest(size):
                self.check_calls(size, MOST_CALLS)

    def test_a_size_that_the_system_knows_saves_the_search(self) -> None:
        self.car.wrap(RECORDER, "dd")
        known = self.car / "sys/class/block/hd0/size"
        known.parent.mkdir(parents=True)
        for number, most in ((8 * GIB // BLOCK, 5), (8 * GIB // BLOCK - 1, MOST_CALLS),
                             (8 * GIB // BLOCK + 1, MOST_CALLS), ("", MOST_CALLS),
                             ("9" * 12, MOST_CALLS)):
            with self.subTest(number):
                (self.car / "home/calls").touch()
                known.write_text(f"{number}\n")
                self.check_calls(8 * GIB, most)

    def test_no_end(self) -> None:
        for shell in SHELLS:
            self.again()
            path = self.car.wrap('for word in "$@"; do\ncase $word in\nof=*) out=${word#of=} ;;\n'
                                 "esac\ndone\necho block >$out\n", "dd")
            done = self.capture(shell=shell, path=path)
            self.check_failure(done, "/dev/hd0: has no end within 512 GiB, or dd wraps around")
            self.assertFalse(self.captured(DISK).exists())

    def test_dd_that_seeks_no_further_than_2_gib(self) -> None:
        self.make_disk(2 * GIB)
        self.assertIn("ends at 2 or 4 GiB exactly, or dd cannot seek further", self.capture().err)

    def failing_dd(self, condition: str) -> str:
        """A dd that fails for some blocks of the disk, as it does where one can't be read."""
        return self.car.wrap(
            "skip=-1\nfor word in \"$@\"; do\ncase $word in\nskip=*) skip=${word#skip=} ;;\nesac\ndone\n"
            f"case $1 in\nif=/dev/hd0) if [ $skip -ge 0 ] && {condition}; then exit 1; fi ;;\n"
            "esac\nexec /bin/dd \"$@\"\n", "dd")

    def test_a_system_that_refuses_to_seek_behind_the_end(self) -> None:
        wanted = self.make_disk(3 * AREA)
        self.check_success(self.capture(path=self.failing_dd(f"[ $skip -ge {3 * AREA // BLOCK} ]")))
        self.assertTrue(self.captured(DISK).read_bytes() == wanted)

    def test_an_unreadable_block_is_not_taken_for_the_end(self) -> None:
        self.make_disk(3 * AREA)
        done = self.capture(path=self.failing_dd("[ $skip -eq 256 ]"))
        self.check_failure(done, "/dev/hd0: block 256 cannot be read, so the end is not found")
        self.assertFalse(self.captured(DISK).exists())

    def test_a_disk_that_cannot_be_read_at_all(self) -> None:
        done = self.capture(path=self.failing_dd("true"))
        self.check_failure(done, "/dev/hd0: cannot be read")
        self.assertFalse(self.captured(DISK).exists())

    def test_an_area_that_comes_short(self) -> None:
        path = self.car.wrap('case $* in\n*count=2048*) set -- "$1" "$2" count=7 ;;\nesac\n'
                             'exec /bin/dd "$@"\n', "dd")
        self.check_failure(self.capture(path=path), "/dev/hd0: its last mebibyte cannot be copied")
        self.assertFalse(self.captured(DISK).exists())


class TroubleTest(CaptureTest):
    def test_what_is_neither_a_file_nor_a_disk(self) -> None:
        for path in (IMAGE, DISK, "fs/mp/etc/airplay.conf", f"{VERSIONS}/a.inf", "tmp/iap1.cfg"):
            (self.car / path).unlink(missing_ok=True)
            os.mkfifo(self.car / path)
        for shell in SHELLS:
            self.again()
            done = self.capture(shell=shell)
            for path in (IMAGE, DISK, "fs/mp/etc/airplay.conf", f"{VERSIONS}/a.inf", "tmp/iap1.cfg"):
                self.check_failure(done, f"orvane-field: /{path}: a pipe is not read\n")
                self.assertFalse(self.captured(path).exists())

    def test_a_character_device_has_no_end(self) -> None:
        (self.car / DISK).unlink()
        try:
            os.mknod(self.car / DISK, 0o666 | 0o020000, os.makedev(1, 5))  # zeros for ever
        except PermissionError:
            self.skipTest("devices can't be made here")
        self.check_failure(self.capture(), "/dev/hd0: a character device is not read")

    @unittest.skipUnless(is_root(), "only root can become another user")
    def test_no_permission(self) -> None:
        for path in (IMAGE, DISK, f"{VERSIONS}/application.inf"):
            (self.car / path).chmod(0o600)
        done = self.capture(is_ordinary=True)
        for path in (IMAGE, DISK, f"{VERSIONS}/application.inf"):
            self.check_failure(done, f"orvane-field: /{path}: no permission to read it\n")
            self.assertFalse(self.captured(path).exists())
        self.again()
        (self.car / VERSIONS).chmod(0o700)
        self.check_failure(self.capture(is_ordinary=True), f"/{VERSIONS}: no permission to list it")

    def test_a_file_that_cannot_be_read_to_its_end(self) -> None:
        path = self.car.wrap('/bin/dd "$@"\ncase $1 in\n*/airplay.conf) echo "I/O error" >&2; exit 1 ;;\n'
                             "esac\n", "dd")
        self.check_failure(self.capture(path=path), "/fs/mp/etc/airplay.conf: cannot be copied: ")
        self.assertFalse(self.captured("fs/mp/etc/airplay.conf").exists())

    def test_refused_folders(self) -> None:
        (self.car / "home/full").mkdir()
        (self.car / "home/full/.hidden").touch()
        (self.car / "home/file").touch()
        (self.car / "home/broken").symlink_to("/nothing")
        (self.car / "home/link").symlink_to("/fs/mp/etc")
        for folder, why in (("full", "is not empty"), ("file", "is not a folder"),
                            ("broken", "is not a folder"), ("", "FOLDER is empty"),
                            ("no/car", "no/car: there is no folder above it"), ("/", "is not empty"),
                            ("/dev/car", "lies in /dev, which is captured"),
                            ("/fs/mp/etc/mm/car", "lies in /fs/mp/etc, which is captured"),
                            ("link/car", "lies in /fs/mp/etc, which is captured"),
                            ("../fs/tmpfs/car/", "lies in /fs/tmpfs, which is captured"),
                            (f"/{VERSIONS}/car.inf", f"lies in /{VERSIONS}, which is captured"),
                            ("/tmp/iap1.cfg", "is a file of orvane")):
            for shell in SHELLS:
                with self.subTest(folder=folder, shell=shell):
                    before = snapshot(self.car.root)
                    done = self.car.run("capture", folder, shell=shell)
                    self.assertEqual((done.status, done.out), (2, ""))
                    self.assertTrue(done.err.endswith(f"{why}\n"), done.err)
                    after = snapshot(self.car.root)
                    self.assertEqual({k: v for k, v in after.items() if k not in ("pid", "dev/null")},
                                     {k: v for k, v in before.items() if k not in ("pid", "dev/null")})

    def test_folders_that_are_taken(self) -> None:
        for folder, real in (("/tmp/car", "/tmp/car"), ("-x", "/home/-x"), ("a b/", "/home/a b"),
                             ("/car", "/car"), ("./x/../y", None)):
            done = self.car.run("capture", folder)
            if real is None:
                self.assertEqual(done.status, 2)
            else:
                self.assertEqual((done.status, done.out), (0, f"captured into {real}\n"))
                self.assertTrue((self.car / real[1:] / DISK).is_file())

    def test_a_missing_utility_is_told_before_anything_else(self) -> None:
        for shell in SHELLS:
            for utility in CAPTURE_UTILITIES:
                with self.subTest(shell=shell, utility=utility):
                    self.car.reset()
                    done = self.car.run("capture", "car", shell=shell, path=self.car.without(utility))
                    self.assertEqual((done.status, done.out, done.err),
                                     (2, "", f"orvane-field: missing here: {utility}\n"))
                    self.assertFalse((self.car / "home/car").exists())

    def test_files_that_may_grow_no_further(self) -> None:
        for number, size in enumerate((0, 1, 100, 511, 512, AREA - 1)):
            shell = list(SHELLS)[number % len(SHELLS)]
            with self.subTest(shell=shell, size=size):
                self.again()
                done = self.capture(shell=shell, largest_file=size)
                self.check_failure(done, "orvane-field: ")
                self.assertNotIn("cannot be read", done.err)
                self.assertFalse(self.captured(DISK).exists() and
                                 self.captured(DISK).stat().st_size > 0)
        self.again()
        self.check_success(self.capture(largest_file=AREA))

    def test_a_full_disk(self) -> None:
        (self.car / "home/car").mkdir()
        for number, size in enumerate((4096, 16384, 1 << 16, 1 << 19, AREA, AREA + 16384)):
            shell = list(SHELLS)[number % len(SHELLS)]
            with self.subTest(shell=shell, size=size):
                try:
                    done = self.capture(shell=shell, room=("home/car", size))
                except subprocess.SubprocessError:
                    self.skipTest("nothing can be mounted here")
                self.check_failure(done, "orvane-field: ")
                self.assertNotIn("cannot be read", done.err)
        self.check_success(self.capture(room=("home/car", 4 * AREA)))


class InterruptedTest(CaptureTest):
    SIGNALS = ("INT", "TERM", "HUP", "QUIT", "PIPE")

    def interrupted(self, step: int, name: str, shell: str) -> Done:
        self.again()
        (self.car / "home/count").unlink(missing_ok=True)
        return self.capture(shell=shell, path="/wrap:/bin",
                            environment={"AT": str(step), "REACHES": "both", "SIGNAL": name})

    def test_every_kind_of_step(self) -> None:
        self.car.wrap(SIGNALLER, *CAPTURE_UTILITIES)
        self.check_success(self.interrupted(0, "INT", "dash"))
        steps = int((self.car / "home/count").read_text())
        shells = list(SHELLS)
        # The middle is the search, where each step is like the next.
        for step in [*range(1, 16), *range(16, steps - 12, 11), *range(steps - 12, steps + 1)]:
            shell, name = shells[step % len(shells)], self.SIGNALS[step % len(self.SIGNALS)]
            with self.subTest(step=step, shell=shell, signal=name):
                done = self.interrupted(step, name, shell)
                self.check_failure(done, "orvane-field: stopped: ")


class ToTheDeskTest(CaptureTest):
    """From the car to the reason: what the desk says of the captured folder holds for the unit."""

    def tool(self, *words: object, status: tuple[int, ...] = (0, 1)) -> str:
        done = subprocess.run([ORVANE_UNIT, *map(str, words)], capture_output=True, text=True, check=False)
        self.assertIn(done.returncode, status, done.stderr)
        # The disk's area begins elsewhere on a shorter disk.
        return re.sub(r"(disk bytes from|block \d, disk byte|disk byte) \d+", r"\1", done.stdout)

    def check_explanations(self, desk: Path) -> None:
        wanted = self.tool("explain", self.car.root, "--all")
        self.assertEqual(self.tool("explain", self.captured("."), "--all"), wanted)
        self.tool("capture", self.captured("."), desk, status=(0,))
        self.assertEqual(self.tool("explain", desk, "--all"), wanted)

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

    def test_what_stood_in_tmp_is_compared_with_a_run(self) -> None:
        with tempfile.TemporaryDirectory(prefix="orvane-field-") as folder:
            # The boot came before the image was there.
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
