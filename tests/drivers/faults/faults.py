# SPDX-License-Identifier: Apache-2.0
"""Lets each system call of orvane on its own files fail once, in every scenario.

A run without faults under strace lists the calls; it must open, position and map its files in the model's
order. Each fault of each call then has its own run: strace injects errors, and short_transfer makes reads
and writes short. Such a run must leave behind an outcome that the model allows.

Exit status: 0 all agree, 1 a difference, 2 the tool could not be run.
"""

from __future__ import annotations

import argparse
import difflib
import os
import shutil
import subprocess
import tempfile
from collections import Counter
from collections.abc import Iterator, Sequence
from dataclasses import dataclass
from pathlib import Path

from drivers import buffers, runner
from drivers.faults.calls import Call, own_calls
from drivers.faults.scenarios import REPEATED, SCENARIOS, Scenario
from model import configuration, snapshot
from model.prediction import predict
from model.system import DISK, Fault, Streams

ERRORS = {
    "open": ("ENOENT", "EACCES", "EMFILE", "EINTR"),
    "seek": ("EINVAL", "EIO", "ESPIPE"),
    "map": ("ENOMEM", "ENODEV"),
    "unmap": ("EINVAL",),
    "read": ("EIO", "EINTR"),
    "write": ("ENOSPC", "EIO", "EINTR"),
    "close": ("EIO", "EINTR"),
    "list": ("EIO", "ENOENT"),
}

# The files that the tool itself seeks in. A library may also do so, when it closes a file that it has read.
SOUGHT = (configuration.IMAGE, DISK)

LIBCXX_STREAMS = Streams(retry_interrupted=False, chunk=buffers.OUTPUT)

MASK = 0o022


@dataclass(frozen=True)
class Tools(runner.Tools):
    """`short_transfer` is empty where it can't be used."""

    short_transfer: str
    streams: Streams


@dataclass(frozen=True)
class Injection:
    scenario: int
    call: Call
    fault: Fault
    tools: Tools

    def __str__(self) -> str:
        fault, call = self.fault, self.call
        what = f"{fault.length} of {call.moved} bytes" if fault.kind == "short" else fault.error
        return (f"{SCENARIOS[self.scenario].name}: {call.name} {call.number} "
                f"({call.operation} {call.path}, {fault.occurrence}, at {fault.offset}): {what}")


def has_effect(fault: Fault) -> bool:
    """Whether it affects what the tool writes; otherwise the model ignores it."""
    if fault.operation == "seek":
        return fault.path in SOUGHT
    return fault.operation != "unmap"


def faults_of(call: Call, tools: Tools) -> Iterator[Fault]:
    for error in ERRORS[call.operation]:
        yield Fault(call.operation, call.path, call.occurrence, "error", error,
                    call.offset, call.moved, call.pieces)
    if tools.short_transfer and call.operation in ("read", "write") and call.moved > 1:
        yield Fault(call.operation, call.path, call.occurrence, "short", "",
                    call.offset, call.moved // 2, call.pieces)


def inject(injection: Injection, root: Path, report: Path) -> tuple[runner.Run, int]:
    """The run, and how many times the call was disturbed."""
    fault, call, tools = injection.fault, injection.call, injection.tools
    command = tools.command(root, SCENARIOS[injection.scenario].arguments)
    if fault.kind == "short":
        result = runner.run([tools.short_transfer, str(report), call.name, str(call.number),
                             str(fault.length), *command], root)
        return result, report.read_text().split().count(str(fault.length))
    # A call without a path or descriptor is told by its number.
    told = (["-P", call.path, "-P", f"{root.resolve()}{call.path.rstrip('/')}"], call.turn)
    paths, when = told if fault.operation != "unmap" else ([], call.number)
    strace = ["strace", "-o", str(report), "-s", "0", *paths, "-e", f"trace={call.name}",
              "-e", f"inject={call.name}:error={fault.error}:when={when}"]
    result = runner.run([*strace, *command], root)
    return result, report.read_text(errors="replace").count("(INJECTED)")


def check(injection: Injection) -> tuple[Injection, list[str]]:
    """No lines when the run agrees with the model."""
    scenario = SCENARIOS[injection.scenario]
    with tempfile.TemporaryDirectory(prefix="orvane fault-") as folder:
        root = Path(folder) / "unit"
        root.mkdir()
        scenario.make(root)
        faults = (injection.fault,) if has_effect(injection.fault) else ()
        prediction = predict(root, scenario.arguments, injection.tools.names, faults,
                             injection.tools.streams)
        before = snapshot.take(root)
        result, count = inject(injection, root, Path(folder) / "report")
    lines = runner.differences(before, prediction, result, MASK)
    if count != 1:
        lines.append(f"disturbed {count} times instead of once")
    lines += [f"the model knows no such operation: {fault}" for fault in prediction.unmet]
    return injection, lines


def order_differences(want: Sequence[tuple[str, str]], calls: Sequence[Call]) -> list[str]:
    """Streams may seek as they like."""
    have = [(call.operation, call.path.rstrip("/")) for call in calls
            if call.operation in ("open", "map") or (call.operation == "seek" and call.path in SOUGHT)]
    texts = ([f"{operation} {path}\n" for operation, path in each] for each in (want, have))
    return [line.rstrip("\n") for line in difflib.unified_diff(*texts, "as the model says", "as it was")]


def calls_of(scenario: Scenario, tools: Tools) -> list[Call]:
    """The tool's calls in an undisturbed run, which must itself be as predicted."""
    with tempfile.TemporaryDirectory(prefix="orvane fault-") as folder:
        root, report = Path(folder) / "unit", Path(folder) / "report"
        root.mkdir()
        scenario.make(root)
        prediction = predict(root, scenario.arguments, tools.names)
        before = snapshot.take(root)
        result = runner.run(["strace", "-o", str(report), "-s", "32", "-e", "trace=all",
                             *tools.command(root, scenario.arguments)], root)
        lines = runner.differences(before, prediction, result, MASK)
        calls = own_calls(report.read_text(errors="replace").splitlines())
        lines += order_differences(prediction.alternatives[0].calls, calls)
        if lines:
            raise SystemExit(f"faults: {scenario.name}, undisturbed:\n  " + "\n  ".join(lines))
        return calls


def build_short_transfer(folder: str) -> str:
    """Needs a compiler for x86-64, the only processor that the helper supports."""
    program = os.path.join(folder, "short_transfer")
    source = Path(__file__).with_name("short_transfer.cpp")
    subprocess.run([os.environ.get("CXX", "c++"), "-std=c++17", "-O1", "-o", program, source],
                   check=True)
    return program


def print_table(injected: Counter[tuple[int, str]], agreed: Counter[tuple[int, str]]) -> None:
    names = sorted({name for _, name in injected})
    print(f"{'injected/agreed':24}" + "".join(f"{name:>12}" for name in names))
    for index, scenario in enumerate(SCENARIOS):
        cells = (f"{injected[index, name]}/{agreed[index, name]}" for name in names)
        print(f"{scenario.name:24}" + "".join(f"{cell:>12}" for cell in cells))


def parse_arguments(arguments: Sequence[str]) -> argparse.Namespace:
    parser = argparse.ArgumentParser("faults", description=__doc__)
    runner.add_arguments(parser)
    parser.add_argument("--short-transfer",
                        help="short_transfer, built if not given; not used with an emulator")
    parser.add_argument("--libcxx", action="store_true", help="the tool's C++ library is libc++")
    parser.add_argument("--jobs", type=int, default=2)
    parser.add_argument("--every", type=int, default=1, help="only every N-th fault, and one of each kind")
    return parser.parse_args(arguments)


def sample(injections: Sequence[Injection], every: int) -> list[Injection]:
    """Every N-th, and the first of each kind that would be left out before it."""
    chosen = []
    kinds = set()
    for number, each in enumerate(injections):
        kind = (each.call.operation, each.fault.kind, each.fault.error)
        if number % every == 0 or kind not in kinds:
            chosen.append(each)
            kinds.add(kind)
    return chosen


def run_all(tools: Tools, jobs: int, every: int) -> int:
    calls_of(REPEATED, tools)
    all_of_them = [
        Injection(index, call, fault, tools)
        for index, scenario in enumerate(SCENARIOS)
        for call in calls_of(scenario, tools)
        for fault in faults_of(call, tools)
    ]
    injections = sample(all_of_them, every)
    injected: Counter[tuple[int, str]] = Counter()
    agreed: Counter[tuple[int, str]] = Counter()
    with runner.workers(jobs) as pool:
        for injection, lines in pool.map(check, injections, chunksize=8):
            key = (injection.scenario, injection.call.name)
            injected[key] += 1
            agreed[key] += not lines
            if lines:
                print(f"faults: {injection}")
                print("\n".join(f"  {line}" for line in lines))
    print_table(injected, agreed)
    print(f"faults: {injected.total()} injected, {agreed.total()} agreed")
    return 0 if injected.total() == agreed.total() > 0 else 1


def main(arguments: Sequence[str]) -> int:
    options = parse_arguments(arguments)
    if shutil.which("strace") is None:
        print("faults: strace is not installed")
        return 2
    os.umask(MASK)
    with tempfile.TemporaryDirectory(prefix="orvane fault-") as folder:
        helper = "" if options.emulator else options.short_transfer or build_short_transfer(folder)
        common = runner.tools(options)
        tools = Tools(common.orvane, common.enter, common.names, helper,
                      LIBCXX_STREAMS if options.libcxx else Streams())
        try:
            return run_all(tools, options.jobs, options.every)
        except runner.BrokenRun as error:
            print(f"faults: the tool was not run: {error}")
            return 2
