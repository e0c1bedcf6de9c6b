# SPDX-License-Identifier: Apache-2.0
"""Runs the tool inside a unit and compares what it left behind with a prediction."""

from __future__ import annotations

import argparse
import contextlib
import os
import shlex
import subprocess
import sys
from collections.abc import Iterator, Mapping, Sequence
from concurrent.futures import ProcessPoolExecutor
from dataclasses import dataclass
from pathlib import Path

from model import snapshot
from model.identity import load_names
from model.prediction import Prediction
from model.snapshot import Entry

# The launcher's status when it could not run the tool, whose own status is always 0.
LAUNCHER_FAILED = 125

# Far longer than any run, so that only a tool that hangs reaches it.
TIME_LIMIT = 60

# The status of a tool that hangs. One that dies has the negative number of the signal.
OUT_OF_TIME = -99


class BrokenRun(Exception):
    """The tool was not run at all, so there is no result."""


def add_arguments(parser: argparse.ArgumentParser) -> None:
    """What every driver needs to run the tool. A path is one word, even with blanks."""
    parser.add_argument("--orvane", required=True, help="the tool")
    parser.add_argument("--enter", required=True,
                        help="launcher of the tool: ENTER ROOT ORVANE ARGUMENTS...")
    parser.add_argument("--emulator", help="runs a launcher for another processor")


@dataclass(frozen=True)
class Tools:
    """`enter` are the words before ROOT ORVANE ARGUMENTS..., `names` the names of the models."""

    orvane: str
    enter: tuple[str, ...]
    names: tuple[str, ...]

    def command(self, root: Path, arguments: Sequence[str], *limits: str) -> list[str]:
        """The command that runs the tool in a unit. `limits` are words for the launcher."""
        return [*self.enter, *limits, str(root), self.orvane, *arguments]


def tools(options: argparse.Namespace) -> Tools:
    emulator = (options.emulator,) if options.emulator else ()
    return Tools(options.orvane, (*emulator, options.enter), tuple(load_names()))


def again(driver: str, options: argparse.Namespace, *more: object) -> str:
    """A driver's command line for a shell: the words of add_arguments, then `more`."""
    emulator = ["--emulator", options.emulator] if options.emulator else []
    return shlex.join(["python3", sys.argv[0], driver, "--orvane", options.orvane,
                       "--enter", options.enter, *emulator, *map(str, more)])


@contextlib.contextmanager
def workers(jobs: int) -> Iterator[ProcessPoolExecutor]:
    """Processes that work side by side. What they have not begun at the end is left out.

    A worker that dies is an error here; multiprocessing.Pool would wait for it for ever. And no signal ends
    a worker, which a handler of this process, being the worker's too, could make it miss.
    """
    executor = ProcessPoolExecutor(jobs)
    try:
        yield executor
    finally:
        executor.shutdown(cancel_futures=True)


@dataclass(frozen=True)
class Run:
    """`after` is the whole unit as the run left it."""

    status: int
    stdout: bytes
    stderr: bytes
    after: Mapping[str, Entry]


def run(command: Sequence[str], root: Path, environment: Mapping[str, str] | None = None) -> Run:
    """`command` starts the tool in `root` through the launcher.

    `environment` adds to the environment of this process.
    """
    try:
        done = subprocess.run(command, stdin=subprocess.DEVNULL, capture_output=True,
                              timeout=TIME_LIMIT, close_fds=False, check=False,
                              env={**os.environ, **(environment or {})})
    except subprocess.TimeoutExpired as error:
        return Run(OUT_OF_TIME, error.stdout or b"", b"(ran out of time)", snapshot.take(root))
    except OSError as error:
        raise BrokenRun(f"{command[0]}: {error.strerror}") from error
    if done.returncode == LAUNCHER_FAILED:
        raise BrokenRun(os.fsdecode(done.stderr).strip())
    return Run(done.returncode, done.stdout, done.stderr, snapshot.take(root))


def differences(before: Mapping[str, Entry], prediction: Prediction, result: Run,
                mask: int) -> list[str]:
    """No lines when the run is as predicted; otherwise its differences from the closest alternative.

    `mask` is the file creation mask of the run.
    """
    found = []
    for what, want, have in (("exit status", prediction.status, result.status),
                             ("standard output", prediction.stdout, result.stdout),
                             ("standard error", prediction.stderr, result.stderr)):
        if want != have:
            found.append(f"{what}: {have!r} instead of {want!r}")
    readings = [
        snapshot.difference(
            snapshot.changed(before, outcome.written, 0o666 & ~mask), result.after)
        for outcome in prediction.alternatives
    ]
    return found + min(readings, key=len)
