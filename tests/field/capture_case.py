# SPDX-License-Identifier: Apache-2.0
"""What every test of `orvane-field capture` does: it captures, and requires that the unit is unchanged."""

from __future__ import annotations

import os
import shutil
from pathlib import Path

from car import Done, snapshot
from car_case import CarTest


class CaptureTest(CarTest):
    def capture(self, **given: object) -> Done:
        """Captures into /home/car, and requires that the unit itself is unchanged."""
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
        self.check_record(done, "complete")

    def check_failure(self, done: Done, said: str) -> None:
        self.check_failure_without_record(done, said)
        self.check_record(done, "not complete")

    def check_failure_without_record(self, done: Done, said: str) -> None:
        """For a failure that leaves no room for a record."""
        self.assertEqual((done.status, done.out), (1, ""), done.err)
        self.assertIn(said, done.err)
        self.assertTrue(done.err.endswith("/home/car is not complete\n"), done.err)
        if self.captured("capture.txt").exists():
            self.assertNotIn("complete", self.captured("capture.txt").read_text().splitlines())

    def check_record(self, done: Done, last: str) -> None:
        said = [line.removeprefix("orvane-field: ") for line in done.err.splitlines()
                if line.startswith("orvane-field: ")]
        self.assertEqual(self.captured("capture.txt").read_text().splitlines(), [*said, last])

    def again(self) -> None:
        shutil.rmtree(self.car / "home/car", ignore_errors=True)
