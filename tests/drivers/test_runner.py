# SPDX-License-Identifier: Apache-2.0
"""Each difference of a run from its prediction is found."""

from __future__ import annotations

import os
import signal
import time
import unittest
from concurrent.futures.process import BrokenProcessPool
from dataclasses import replace

from drivers import runner
from drivers.runner import Run
from model import snapshot
from model.unit_case import UnitCase


class Differences(UnitCase):
    def setUp(self) -> None:
        super().setUp()
        self.before = snapshot.take(self.root)
        self.prediction = self.predict("-xa")
        written = self.prediction.alternatives[0].written
        after = snapshot.changed(self.before, written, 0o644)
        self.run_as_predicted = Run(0, b"", b"orvane: invalid option -- 'x'\n", after)

    def differences(self, run: Run) -> list[str]:
        return runner.differences(self.before, self.prediction, run, 0o022)

    def test_none(self) -> None:
        self.assertEqual(self.differences(self.run_as_predicted), [])

    def test_what_the_process_prints(self) -> None:
        for changes in ({"status": 1}, {"status": -11}, {"stdout": b"x"}, {"stderr": b""}):
            self.assertEqual(len(self.differences(replace(self.run_as_predicted, **changes))), 1)

    def test_what_it_leaves_behind(self) -> None:
        good = self.run_as_predicted.after
        output = good["/tmp/airplay.conf"]
        for path, entry in (
                ("/tmp/airplay.conf", replace(output, content=output.content + b"\n")),
                ("/tmp/airplay.conf", replace(output, mode=0o600)),
                ("/tmp/airplay.conf", replace(output, kind=snapshot.LINK)),
                ("/tmp/other", output),
                ("/fs/mp/etc/airplay.conf", output)):
            changed = replace(self.run_as_predicted, after={**good, path: entry})
            self.assertEqual(len(self.differences(changed)), 1)
        gone = {path: entry for path, entry in good.items() if path != "/tmp/airplay.conf"}
        self.assertEqual(len(self.differences(replace(self.run_as_predicted, after=gone))), 1)


class Launching(UnitCase):
    def test_a_tool_that_was_not_run_is_no_result(self) -> None:
        for command in (["sh", "-c", "echo why >&2; exit 125"], [str(self.root / "none")]):
            with self.assertRaises(runner.BrokenRun):
                runner.run(command, self.root)


def end_like(number: int) -> None:
    if number == 1:
        os.kill(os.getpid(), signal.SIGKILL)


class Workers(unittest.TestCase):
    def test_a_worker_that_dies_is_no_silence(self) -> None:
        with self.assertRaises(BrokenProcessPool):
            with runner.workers(2) as pool:
                list(pool.map(end_like, range(3)))

    def test_what_is_not_begun_is_left_out(self) -> None:
        with runner.workers(1) as pool:
            asked = [pool.submit(time.sleep, 0.01) for _ in range(100)]
            asked[0].result()
        self.assertTrue(all(each.done() for each in asked))
        self.assertTrue(asked[-1].cancelled())
