# SPDX-License-Identifier: Apache-2.0
"""What every test of `orvane-field look` does: it looks, and requires that /tmp is unchanged."""

from __future__ import annotations

import subprocess

from car import ORVANE_UNIT, OUTPUTS, Done, snapshot
from car_case import CarTest

OLD = b"of an earlier boot\n" * 200


class LookTest(CarTest):
    def set(self, *assignments: str) -> None:
        marker = self.car / ".orvane-unit"
        marker.write_text("made by orvane-unit, layout 1\n")
        subprocess.run([ORVANE_UNIT, "set", self.car.root, *assignments], check=True)
        marker.unlink()

    def look(self, *words: str, **given: object) -> Done:
        """Looks, and requires that no run changes anything in /tmp."""
        before = snapshot(self.car / "tmp")
        done = self.car.run("look", *words, **given)
        self.assertEqual(snapshot(self.car / "tmp"), before, done)
        return done

    def put_older_outputs(self) -> None:
        for name, mode in zip(OUTPUTS, (0o600, 0o640, 0o644, 0o444, 0o755)):  # all but the last
            (self.car / "tmp" / name).unlink(missing_ok=True)
            (self.car / "tmp" / name).write_bytes(OLD)
            (self.car / "tmp" / name).chmod(mode)
        (self.car / "tmp/other").write_bytes(b"somebody else's")
