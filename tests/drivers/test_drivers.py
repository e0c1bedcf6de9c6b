# SPDX-License-Identifier: Apache-2.0
"""What the drivers stand on: units come again from their seed, differences show."""

from __future__ import annotations

import random
import tempfile
import unittest
from dataclasses import replace
from pathlib import Path

from drivers import runner
from drivers.faults.calls import own_calls
from drivers.runner import Run
from drivers.units import make_unit
from model import parts, snapshot
from model.identity import load_names
from model.prediction import predict
from model.test_model import NAMES, UnitCase
from model.tree import Tree

TRACE = """\
execve("./enter", ["./enter"..., "unit"], 0x7fff /* 37 vars */) = 0
openat(AT_FDCWD, "/tmp/elsewhere/orvane", O_RDONLY) = 3
read(3, "\\177ELF"..., 8191)            = 8191
close(3)                                = 0
execveat(3, "", ["orvane", "-a"], 0x7ffe /* 37 vars */, AT_EMPTY_PATH) = 0
openat(AT_FDCWD, "/fs/image", O_RDONLY) = 3
lseek(3, 0, SEEK_END)                   = 179
mmap(NULL, 179, PROT_READ, MAP_PRIVATE, 3, 0) = 0x7f98
munmap(0x7f98, 179)                     = 0
close(3)                                = 0
openat(AT_FDCWD, "/tmp/out", O_WRONLY|O_CREAT|O_TRUNC, 0666) = 3
write(3, "# Default name"..., 120)      = 120
openat(AT_FDCWD, "/fs/none", O_RDONLY)  = -1 ENOENT (No such file or directory)
writev(3, [{iov_base="", iov_len=20}, {iov_base="xxxx"..., iov_len=8191}], 2) = 8211
write(2, "orvane: invalid"..., 30)      = 30
close(3)                                = 0
openat(AT_FDCWD, "/tmp/out", O_WRONLY|O_CREAT|O_TRUNC, 0666) = 3
write(3, "stock"..., 5)                 = 5
getdents64(4, 0x3094d760 /* 3 entries */, 32768) = 88
+++ exited with 0 +++
"""


class Units(unittest.TestCase):
    def make(self, seed: int) -> tuple[Path, list[str]]:
        folder = tempfile.TemporaryDirectory()
        self.addCleanup(folder.cleanup)
        return Path(folder.name), make_unit(Path(folder.name), random.Random(f"test:{seed}"))

    def entries(self, root: Path) -> dict[str, snapshot.Entry]:
        """The times of two units differ; all else may not."""
        return {path: replace(entry, stamp=entry.stamp and (entry.stamp[0], 0))
                for path, entry in snapshot.take(root).items()}

    def test_the_same_seed_makes_the_same_unit(self) -> None:
        for seed in range(20):
            (first, arguments), (second, again) = self.make(seed), self.make(seed)
            self.assertEqual(arguments, again)
            self.assertEqual(self.entries(first), self.entries(second))

    def test_predicting_changes_nothing(self) -> None:
        for seed in range(20):
            root, arguments = self.make(seed)
            before = snapshot.take(root)
            predict(root, arguments, NAMES)
            self.assertEqual(snapshot.take(root), before)

    def test_no_output_is_its_own_template(self) -> None:
        for seed in range(100):
            tree = Tree(self.make(seed)[0])
            for output, template in zip(parts.OUTPUTS, parts.TEMPLATES):
                place = tree.resolve(output)
                if place is not None:
                    self.assertNotEqual(place, tree.resolve(template))


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

    def test_what_the_process_says(self) -> None:
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


class Names(unittest.TestCase):
    def load(self, names: list[str]) -> list[str]:
        with tempfile.NamedTemporaryFile("w", suffix=".txt") as file:
            file.write("".join(f"{name}\n" for name in names))
            file.flush()
            return load_names(Path(file.name))

    def test_shape(self) -> None:
        good = NAMES[:31] + NAMES[:1] + NAMES[32:]
        self.assertEqual(self.load(good), good)
        for bad in (NAMES, good[:-1], good[:1] * 47):
            with self.assertRaises(ValueError):
                self.load(bad)


class Trace(unittest.TestCase):
    def test_own_calls(self) -> None:
        found = [(call.name, call.number, call.operation, call.path, call.occurrence)
                 for call in own_calls(TRACE.splitlines())]
        self.assertEqual(found, [
            ("openat", 2, "open", "/fs/image", 1), ("lseek", 1, "seek", "/fs/image", 1),
            ("mmap", 1, "map", "/fs/image", 1), ("munmap", 1, "unmap", "/fs/image", 1),
            ("close", 2, "close", "/fs/image", 1), ("openat", 3, "open", "/tmp/out", 1),
            ("write", 1, "write", "/tmp/out", 1), ("openat", 4, "open", "/fs/none", 1),
            ("writev", 1, "write", "/tmp/out", 1), ("close", 3, "close", "/tmp/out", 1),
            ("openat", 5, "open", "/tmp/out", 2), ("write", 3, "write", "/tmp/out", 2)])

    def test_bytes_covered(self) -> None:
        found = [(call.offset, call.moved, call.pieces)
                 for call in own_calls(TRACE.splitlines()) if call.operation == "write"]
        self.assertEqual(found, [(0, 120, ()), (120, 8211, (20, 8191)), (0, 5, ())])
