# SPDX-License-Identifier: Apache-2.0
"""`orvane-field capture` finds the disk's end, reads little, and copies exactly its last mebibyte."""

from __future__ import annotations

import random
import re
import shutil
import unittest

from capture_case import CaptureTest
from car import AREA, DISK, SHELLS

GIB = 1 << 30
BLOCK = 512
# The search's reads of one block, and those that measure and check the end; see find_end in the script.
MOST_CALLS = 75
RECORDER = 'echo "$*" >>/home/calls\nexec /bin/NAME "$@"\n'


class DiskTest(CaptureTest):
    def make_disk(self, size: int) -> bytes:
        """Makes a disk with bytes only at its end; returns what must be captured."""
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
        """In all, the area is read once, and one block by each other call."""
        (self.car / "home/calls").unlink()
        wanted = self.make_disk(size)
        self.again()
        self.check_success(self.capture(path="/wrap:/bin"))
        self.assertTrue(self.captured(DISK).read_bytes() == wanted)
        calls = (self.car / "home/calls").read_text().splitlines()
        counts = [int(re.search(r"bs=512 .*count=(\d+)", call)[1]) for call in calls
                  if f"if=/{DISK} " in call]
        self.assertLessEqual(len(calls), most + 20)  # the small files as well
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

    def test_an_end_where_dd_may_seek_no_further(self) -> None:
        for size in (2 * GIB, 4 * GIB):
            wanted = self.make_disk(size)
            self.again()
            self.check_failure(self.capture(), "/dev/hd0: ends at 2 or 4 GiB exactly, or dd cannot seek "
                               "further: what is copied may not be its last mebibyte\n")
            self.assertTrue(self.captured(DISK).read_bytes() == wanted)
            known = self.car / "sys/class/block/hd0/size"
            known.parent.mkdir(parents=True)
            known.write_text(f"{size // BLOCK}\n")
            self.again()
            self.check_success(self.capture())
            shutil.rmtree(self.car / "sys")

    def test_a_disk_that_only_dd_can_read(self) -> None:
        """As in a 32-bit shell that cannot get the size of a large disk."""
        wanted = self.make_disk(3 * AREA + 7)
        (self.car / DISK).rename(self.car / "home/disk")
        path = self.car.wrap('for word in "$@"; do\nshift\n[ "$word" != if=/dev/hd0 ] || word=if=/home/disk\n'
                             'set -- "$@" "$word"\ndone\nexec /bin/dd "$@"\n', "dd")
        for shell in SHELLS:
            for is_link in (False, True):
                if is_link:
                    (self.car / DISK).symlink_to("/nothing")
                self.again()
                done = self.capture(shell=shell, path=path)
                self.check_success(done)
                self.assertNotIn(DISK, done.err)
                self.assertTrue(self.captured(DISK).read_bytes() == wanted)
            (self.car / DISK).unlink()

    def failing_dd(self, condition: str) -> str:
        """A dd that fails for some blocks of the disk, as if they could not be read."""
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

    def test_blocks_near_the_end_that_cannot_be_read(self) -> None:
        """Some disks lose eight blocks at once."""
        for blocks in (6144 + 64, 6144 + 1000, 6144 + 2000):
            self.make_disk(blocks * BLOCK)
            self.again()
            done = self.capture(path=self.failing_dd("[ $skip -ge 6144 ] && [ $skip -lt 6152 ]"))
            self.check_failure(done, "/dev/hd0: block 6144 cannot be read, so the end is not found")
            self.assertFalse(self.captured(DISK).exists())

    def test_a_disk_that_cannot_be_read_at_all(self) -> None:
        done = self.capture(path=self.failing_dd("true"))
        self.check_failure(done, "/dev/hd0: cannot be read")
        self.assertFalse(self.captured(DISK).exists())

    def test_an_area_that_is_too_short(self) -> None:
        path = self.car.wrap('case $* in\n*count=2048*) set -- "$1" "$2" count=7 ;;\nesac\n'
                             'exec /bin/dd "$@"\n', "dd")
        self.check_failure(self.capture(path=path), "/dev/hd0: its last mebibyte cannot be copied")
        self.assertFalse(self.captured(DISK).exists())


if __name__ == "__main__":
    unittest.main()
