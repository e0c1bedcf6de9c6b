# SPDX-License-Identifier: Apache-2.0
"""Tries every command of orvane-unit on random hostile units: pipes, devices, links that lead out, odd names,
sizes and modes at every path that a run opens.

Whatever the unit is, a command ends with status 0, 1 or 2 in time, prints nothing that a terminal obeys, prints
valid JSON, changes nothing but what it is asked to change, and leaves nothing behind; and a captured unit is
explained as the unit itself.

Exit status: 0 all is so, 1 something is not, or some status of some command never came up, 2 a tool could not
be run, or no namespace with mounts is possible.
"""

from __future__ import annotations

import argparse
import contextlib
import os
import shutil
import signal
import stat
import subprocess
import sys
from collections.abc import Callable, Sequence
from dataclasses import dataclass
from pathlib import Path
from typing import Any

from drivers import random_units, runner
from drivers.explain.same_tree import differences as tree_differences
from drivers.hostile import faults, namespace
from drivers.hostile.hostile_units import make_hostile_unit, outside_of
from drivers.random_units import Finding, Question, RandomUnit
from drivers.unit_tool import Said
from model import records

# Far longer than any command takes, so that only one that hangs reaches it. In seconds.
TIME_LIMIT = 20

# The statuses of each command that some unit must reach.
OUTCOMES = (
    "explain 0", "explain 1", "explain 2", "show 0", "show 2", "describe 0", "describe 2", "new 0", "new 2",
    "diff 0", "diff 1", "diff 2", "impact 0", "impact 2", "report 0", "report 1", "report 2", "capture 0", "capture 2", "set 0", "set 2", "run 0",
    "run 2", "check 0", "check 1", "check 2",
    "captured unit explained as the unit", "serial redacted",
)


@dataclass(frozen=True)
class Tools:
    orvane: str
    unit_tool: str


# A longer file may be a template, of which a run copies every byte.
MOST_COPIED = 1 << 24


def may_wait(root: Path) -> bool:
    """Whether a run may take for ever: orvane opens pipes, and reads a device or a long file to its end."""
    states = [os.lstat(path) for path in faults.state(root)]
    return any(stat.S_ISFIFO(state.st_mode) or stat.S_ISCHR(state.st_mode) or state.st_size > MOST_COPIED
               for state in states)


def essence(document: Any) -> list[Any]:
    """What an explanation says of a run, without places and without what stood at the outputs before."""
    return [(output["path"], output["outcome"], output["isIntended"], output["reasons"],
             [(line["text"], line["reasons"], line["key"]) for line in output["lines"]])
            for output in document["outputs"]]


def serial_in(disk: Path) -> bytes:
    """The serial on a disk, without the blanks around it."""
    if not disk.is_file() or disk.is_symlink():
        return b""
    with open(disk, "rb") as file:
        start = file.seek(0, os.SEEK_END) - records.RECORD_AREA + records.SERIAL_OFFSET
        if start < 0:
            return b""
        file.seek(start)
        return file.read(records.SERIAL_SIZE).split(b"\0")[0].strip(b" ")


class OutOfTime(Exception):
    """The unit makes a command wait for ever, so most likely others, too."""


class Scene:
    """A unit with what stands around it: `outside`, the working directory; `temporary`, for the commands; and
    `made`, for what they make."""

    def __init__(self, unit: RandomUnit, tools: Tools) -> None:
        self.root, self.rng, self.tools = unit.root, unit.rng, tools
        self.outside = outside_of(unit.root)
        self.temporary, self.made = unit.root.parent / "temporary", unit.root.parent / "made"
        self.temporary.mkdir()
        self.made.mkdir()
        self.is_weak = self.rng.random() < 0.2
        self.states = {folder: faults.state(folder) for folder in (self.root, self.outside)}
        self.lines: list[str] = []
        self.reached: set[str] = set()

    def _start(self, words: Sequence[str]) -> Said:
        prepare: Callable[[], None] | None = namespace.drop_privileges if self.is_weak else None
        try:
            done = subprocess.run([self.tools.unit_tool, *words], stdin=subprocess.DEVNULL, capture_output=True,
                                  timeout=TIME_LIMIT, check=False, cwd=self.outside, preexec_fn=prepare,
                                  env={**os.environ, "TMPDIR": os.fspath(self.temporary)})
        except subprocess.TimeoutExpired:
            return Said(runner.OUT_OF_TIME, b"", b"(ran out of time)")
        except OSError as error:
            raise runner.BrokenRun(f"{self.tools.unit_tool}: {error.strerror}") from error
        return Said(done.returncode, done.stdout, done.stderr)

    def ask(self, *words: str | Path, changes: Path | None = None, makes: str = "") -> Said:
        """Runs a command, which may change the folder `changes`, and make the entry `makes` of `made`."""
        expected = {*os.listdir(self.made)}
        line = [os.fspath(word) for word in words]
        said = self._start(line)
        wrong = [*faults.end_faults(line[0], said.status, said.stdout, said.stderr),
                 *faults.printed_faults("standard output", said.stdout),
                 *faults.printed_faults("standard error", said.stderr)]
        for folder, state in self.states.items():
            now = faults.state(folder)
            wrong += faults.changes(state, now) if folder != changes else []
            self.states[folder] = now
        wrong += [f"leaves {name!r} for temporary files" for name in os.listdir(self.temporary)]
        if makes and said.status in (0, 1):
            expected.add(makes)
        wrong += [f"makes {name!r}" for name in {*os.listdir(self.made)} - expected]
        self.lines += [f"{' '.join(line)!r}: {fault}" for fault in wrong]
        self.reached.add(f"{line[0]} {said.status}")
        if said.status == runner.OUT_OF_TIME:
            raise OutOfTime
        return said

    def ask_json(self, *words: str | Path) -> tuple[Said, Any]:
        said = self.ask(*words, "--json")
        if said.status not in (0, 1):
            return said, None
        document, wrong = faults.parsed(str(words[0]), said.stdout)
        self.lines += [f"{words[0]}: {fault}" for fault in wrong]
        return said, document

    def look(self) -> None:
        self.ask("explain", self.root, *self.rng.choice(((), ("-a",), ("-i", "-a"), ("--all",))))
        self.ask("show", self.root)
        self.ask_json("show", self.root)
        said, _ = self.ask_json("diff", self.root, self.root)
        if said.status == 1:
            self.lines.append("diff: the unit differs from itself")
        self.ask("diff", self.root, self.outside)
        if self.rng.random() < 0.3:
            self.ask_json("impact", self.root, self.rng.choice(("param.22", "param.36", "slot.9.0")))

    def report(self) -> None:
        page = self.made / "page.html"
        for words in ((), ("--redact-serial",)):
            said = self.ask("report", self.root, "-o", page, *words, makes="page.html")
            if said.status == 2:
                self.lines += ["report: a page in spite of an error"] if page.exists() else []
                continue
            self.lines += [f"report: {fault}" for fault in faults.page_faults(page.read_bytes())]
            page.unlink()

    def describe(self) -> None:
        said = self.ask("describe", self.root)
        if said.status != 0:
            return
        text = self.made / "unit.toml"
        text.write_bytes(said.stdout)
        again = self.ask("new", self.made / "again", "--from", text, makes="again")
        if again.status != 0:
            self.lines.append(f"new: can't make the described unit: {again.stderr!r}")
            return
        self.lines += [f"described and made again: {line}"
                       for line in tree_differences(self.root, self.made / "again")]
        self.check(text)
        # Whatever stands in a description, nothing but a description is made of it.
        damaged = bytearray(said.stdout)
        for _ in range(self.rng.randrange(1, 4)):
            damaged[self.rng.randrange(len(damaged))] = self.rng.randrange(256)
        text.write_bytes(damaged)
        self.ask("new", self.made / "damaged", "--from", text, makes="damaged")

    def check(self, description: Path) -> None:
        if self.rng.random() < 0.5 or may_wait(self.root):
            return
        case = self.made / "cases" / "\x1b[1mcase"
        (case / "expected").mkdir(parents=True)
        shutil.copy(description, case / "unit.toml")
        os.symlink(self.outside, case / "expected" / "tmp")
        self.ask("check", case.parent, "--orvane", self.tools.orvane)
        self.ask("check", case.parent, "--orvane", self.tools.orvane, "--update")
        shutil.rmtree(case / "expected")
        self.ask("check", case.parent, "--orvane", self.tools.orvane, "--update")
        said, _ = self.ask_json("check", case.parent, "--orvane", self.tools.orvane)
        if said.status == 1:
            self.lines.append(f"check: an updated case is not as expected: {said.stdout!r}")

    def capture(self) -> None:
        source, explained = self.ask_json("explain", self.root, "--content")
        copy = self.made / "copy"
        captured = self.ask("capture", self.root, copy, makes="copy")
        if explained is not None and captured.status != 0 and not self.may_refuse_to_capture(captured):
            self.lines.append(f"explained, but not captured: {captured.stderr!r}")
        if captured.status != 0:
            return
        again, of_copy = self.ask_json("explain", copy, "--content")
        if explained is not None:
            if of_copy is None or essence(of_copy) != essence(explained):
                self.lines.append(f"captured, it is explained in another way: {again.stdout!r} {again.stderr!r}"
                                  f" instead of {source.stdout!r}")
            self.reached.add("captured unit explained as the unit")
        self.redact(serial_in(copy / "dev/hd0"))

    def may_refuse_to_capture(self, said: Said) -> bool:
        """A run that needs no stock file is explained whatever stands there; capture copies them all."""
        is_denied = said.stderr.endswith(b": Permission denied\n")
        return may_wait(self.root) or (is_denied and self.is_weak and faults.has_unreadable(self.root))

    def redact(self, serial: bytes) -> None:
        redacted = self.made / "redacted"
        said = self.ask("capture", self.root, redacted, "--redact-serial", makes="redacted")
        if said.status == 0 and serial.strip(b"X"):
            self.lines += [f"redacted, the serial {serial!r} still stands in {place}"
                           for place in faults.places_of(serial, redacted)]
            self.reached.add("serial redacted")

    def change(self) -> None:
        self.ask("set", self.root, "param.22=1", "slot.9=SN9", "tuning.3.qwaNRAtten=-12", changes=self.root)
        if not may_wait(self.root):
            words = ("run", self.root, "--orvane", self.tools.orvane, *self.rng.choice(((), ("--brief",))))
            self.ask(*words, "--", "-a", "-i", changes=self.root)


def check(unit: RandomUnit, tools: Tools) -> Finding:
    try:
        scene = Scene(unit, tools)
        with contextlib.suppress(OutOfTime):
            for step in (scene.look, scene.report, scene.describe, scene.capture, scene.change):
                step()
        return Finding(scene.lines, frozenset(scene.reached))
    finally:
        namespace.remove_devices(unit.root)


QUESTION = Question("hostile", make_hostile_unit, check, OUTCOMES, enough_units=200)


def main(arguments: Sequence[str]) -> int:
    parser = argparse.ArgumentParser(QUESTION.name, description=__doc__)
    random_units.add_arguments(parser, units=200)
    parser.add_argument("--unit-tool", required=True, help="orvane-unit")
    parser.add_argument(namespace.INSIDE, action="store_true", help=argparse.SUPPRESS)
    options = parser.parse_args(arguments)
    if not options.inside:
        return namespace.enter(arguments)
    # The first process of a namespace gets no signal that it has no handler for.
    signal.signal(signal.SIGTERM, lambda *_: sys.exit(2))
    os.umask(0o022)
    tools = Tools(os.path.realpath(options.orvane), os.path.realpath(options.unit_tool))
    return random_units.ask(QUESTION, tools, options, "--unit-tool", options.unit_tool)
