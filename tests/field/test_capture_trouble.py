# SPDX-License-Identifier: Apache-2.0
"""`orvane-field capture` says what it could not copy, and never claims to be complete when it is not."""

from __future__ import annotations

import os
import shutil
import signal
import subprocess
import unittest

from capture_case import CaptureTest
from car import (AREA, CAPTURE_UTILITIES, DISK, IMAGE, OUTPUTS, SHELLS, SIGNALLER, VERSIONS, Done,
                 is_root, snapshot)


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

    @unittest.skipUnless(is_root(), "only root can become another user")
    def test_files_in_a_folder_that_may_not_be_entered(self) -> None:
        for folder, path in (("fs/rwdata", VERSIONS), ("fs/tmpfs", IMAGE), ("fs", IMAGE),
                             ("fs/mp", "fs/mp/etc/mm/iap1.cfg"), ("tmp", "tmp/iap1.cfg")):
            self.car.reset()
            self.again()
            (self.car / folder).chmod(0o700)
            self.check_failure(self.capture(is_ordinary=True), f"/{path}: no permission to look there\n")

    def test_names_that_a_terminal_would_obey(self) -> None:
        for name in ("a\x1b[2J.inf", "b\\033[2J.inf", "c\\c.inf"):
            os.mkfifo(self.car / VERSIONS / name)
        for shell in SHELLS:
            self.again()
            done = self.capture(shell=shell)
            self.check_failure(done, f"/{VERSIONS}/(not printable): a pipe is not read\n")
            self.assertEqual(done.err.count("a pipe is not read\n"), 3)
            self.assertNotIn("\x1b", done.err)

    def test_folders_that_a_terminal_would_obey(self) -> None:
        for name in ("a\x1b[2J", "b\\033[2J", "c\\c", "d\n\ne"):
            for shell in SHELLS:
                with self.subTest(name=name, shell=shell):
                    done = self.car.run("capture", name, shell=shell)
                    self.assertEqual((done.status, done.out), (0, "captured into (not printable)\n"))
                    self.assertTrue((self.car / "home" / name / DISK).is_file())
                    done = self.car.run("capture", name, shell=shell)
                    self.assertEqual((done.status, done.err),
                                     (2, "orvane-field: (not printable) is not empty\n"))
                    shutil.rmtree(self.car / "home" / name)
                    (self.car / DISK).rename(self.car / "home/disk")
                    os.mkfifo(self.car / DISK)
                    done = self.car.run("capture", name, shell=shell)
                    self.assertTrue(done.err.endswith("orvane-field: (not printable) is not complete\n"))
                    (self.car / "home/disk").rename(self.car / DISK)
                    shutil.rmtree(self.car / "home" / name)
                    done = self.car.run("capture", name, shell=shell, largest_file=1)
                    self.assertEqual(done.status, 1)
                    self.assertTrue(done.err.endswith("orvane-field: cannot write (not printable): "
                                                      "(not printable) is not complete\n"))
                    shutil.rmtree(self.car / "home" / name)

    def test_names_that_the_folder_treats_as_one(self) -> None:
        """As on a USB stick that ignores upper and lower case."""
        (self.car / VERSIONS / "b.inf").write_text("Type=x\n")
        path = self.car.wrap('/bin/dd "$@"\ncase $1 in\n*/application.inf)'
                             f" : >/home/car/{VERSIONS}/b.inf ;;\nesac\n", "dd")
        self.check_failure(self.capture(path=path), f"/{VERSIONS}/b.inf: the folder cannot tell its name")

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

    def test_accepted_folders(self) -> None:
        for folder, real in (("/tmp/car", "/tmp/car"), ("-x", "/home/-x"), ("a b/", "/home/a b"),
                             ("/car", "/car"), ("./x/../y", None)):
            done = self.car.run("capture", folder)
            if real is None:
                self.assertEqual(done.status, 2)
            else:
                self.assertEqual((done.status, done.out), (0, f"captured into {real}\n"))
                self.assertTrue((self.car / real[1:] / DISK).is_file())

    def test_a_missing_utility_is_reported_before_anything_else(self) -> None:
        for shell in SHELLS:
            for utility in CAPTURE_UTILITIES:
                with self.subTest(shell=shell, utility=utility):
                    self.car.reset()
                    done = self.car.run("capture", "car", shell=shell, path=self.car.without(utility))
                    self.assertEqual((done.status, done.out, done.err),
                                     (2, "", f"orvane-field: missing here: {utility}\n"))
                    self.assertFalse((self.car / "home/car").exists())

    def test_files_that_may_not_grow_further(self) -> None:
        for number, size in enumerate((0, 1, 100, 511, 512, AREA - 1)):
            shell = list(SHELLS)[number % len(SHELLS)]
            with self.subTest(shell=shell, size=size):
                self.again()
                done = self.capture(shell=shell, largest_file=size)
                self.check_failure_without_record(done, "orvane-field: ")
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
                self.check_failure_without_record(done, "orvane-field: ")
                self.assertNotIn("cannot be read", done.err)
        # The mount is gone with its process, and so is the record.
        self.assertEqual(self.capture(room=("home/car", 4 * AREA)).out, "captured into /home/car\n")

    def test_a_record_that_cannot_be_written(self) -> None:
        for path in (*(self.car / "fs").rglob("*"), self.car / DISK):
            if path.is_file():
                path.write_bytes(b"")
        for name in OUTPUTS:
            (self.car / "tmp" / name).touch()
        whole = len("not complete\n")
        for shell in SHELLS:
            with self.subTest(shell):
                self.again()
                self.check_success(self.capture(shell=shell, largest_file=whole))
                self.again()
                self.check_failure_without_record(self.capture(shell=shell, largest_file=whole - 1),
                                                  "cannot write /home/car/capture.txt")
                # Fails only at its end, so there is a message.
                (self.car / "tmp/iap1.cfg").unlink()
                self.again()
                self.check_failure_without_record(self.capture(shell=shell, largest_file=whole),
                                                  "cannot write /home/car/capture.txt")
                (self.car / "tmp/iap1.cfg").touch()

    def test_a_capture_that_is_killed(self) -> None:
        """No trap helps then, just as with a loss of power."""
        self.car.wrap(SIGNALLER, *CAPTURE_UTILITIES)
        for shell in SHELLS:
            self.again()
            (self.car / "home/count").unlink(missing_ok=True)
            done = self.car.run("capture", "car", shell=shell, path="/wrap:/bin",
                                environment={"AT": "20", "REACHES": "both", "SIGNAL": "KILL"})
            self.assertEqual((done.status, done.out), (-signal.SIGKILL, ""))
            self.assertEqual(self.captured("capture.txt").read_text(), "not complete\n")


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
        # The middle is the search, where all steps are alike.
        for step in [*range(1, 16), *range(16, steps - 12, 11), *range(steps - 12, steps + 1)]:
            shell, name = shells[step % len(shells)], self.SIGNALS[step % len(self.SIGNALS)]
            with self.subTest(step=step, shell=shell, signal=name):
                done = self.interrupted(step, name, shell)
                if step == 1:  # the folder itself may not be there yet
                    self.check_failure_without_record(done, "orvane-field: stopped: ")
                else:
                    self.check_failure(done, "orvane-field: stopped: ")


if __name__ == "__main__":
    unittest.main()
