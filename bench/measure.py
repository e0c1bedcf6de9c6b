# SPDX-License-Identifier: Apache-2.0
"""One figure of one command in a unit: the command takes turns with others, or a tool watches it."""

from __future__ import annotations

import os
import re
import shutil
import statistics
import subprocess
import tempfile
from collections.abc import Sequence
from dataclasses import dataclass
from pathlib import Path

from place import TOOLS, call

ENVIRONMENT = {"PATH": "/usr/sbin:/usr/bin:/sbin:/bin"}
# Where Debian and other systems keep valgrind's programs.
VALGRIND_FOLDERS = ("/usr/libexec/valgrind", "/usr/lib/x86_64-linux-gnu/valgrind")


@dataclass(frozen=True)
class Timing:
    """The figures of all counted runs of one command."""

    wall: tuple[int, ...]  # nanoseconds
    faults: int  # median

    def followed_by(self, other: Timing) -> Timing:
        return Timing(self.wall + other.wall, max(self.faults, other.faults))

    @property
    def median(self) -> float:
        return statistics.median(self.wall)

    def ratio(self, other: Timing) -> float:
        """The median of the ratios run by run: a slow moment of the machine slows both runs."""
        return statistics.median(a / b for a, b in zip(self.wall, other.wall))


def as_root() -> list[str]:
    """To change the root directory needs the privilege to do so, or a user namespace."""
    return [] if os.geteuid() == 0 else ["unshare", "--map-root-user"]


def with_own_tmp(root: Path) -> list[str | Path]:
    """A command after these words sees a /tmp of its own, empty and in memory, in `root`."""
    return [*(as_root() or ["unshare"]), "--mount", "sh", "-c",
            'mount -t tmpfs tmpfs "$0/tmp" && exec "$@"', root]


def interleave(root: Path, commands: Sequence[str], runs: int, warm_up: int = 5,
               own_tmp: bool = False) -> list[Timing]:
    """Times the commands in turn. A command that fails ends the benchmark."""
    enter = with_own_tmp(root) if own_tmp else as_root()
    lines = call(*enter, TOOLS / "interleave", root, str(runs), str(warm_up), *commands,
                 env=ENVIRONMENT).splitlines()
    wall: list[list[int]] = [[] for _ in commands]
    faults: list[list[int]] = [[] for _ in commands]
    for line in lines:
        index, time, fault, status = map(int, line.split())
        if status != 0:
            raise SystemExit(f"bench: {commands[index]}: exit status {status}")
        wall[index].append(time)
        faults[index].append(fault)
    return [Timing(tuple(times), int(statistics.median(counts)))
            for times, counts in zip(wall, faults)]


def peak(root: Path, command: str) -> int:
    """The most memory that a process of the command had resident, in KiB."""
    return int(call(*as_root(), TOOLS / "peak", root, *command.split()))


def system_calls(root: Path, command: str) -> int:
    """The number of all calls of all the command's processes after its start, which is not counted."""
    with tempfile.NamedTemporaryFile("r") as log:
        call("strace", "-f", "-o", log.name, *as_root(), "chroot", root, *command.split(),
             env=ENVIRONMENT)
        lines = log.read().splitlines()
    program = command.split()[0]
    start = next(number for number, line in enumerate(lines) if f'execve("{program}"' in line)
    return sum(1 for line in lines[start + 1:]
               if re.match(r"\d+ +\w+\(", line) is not None)


def instructions(root: Path, command: str) -> int:
    """The count of callgrind, which runs inside the unit, so that its program must be there."""
    folder = next(Path(name) for name in VALGRIND_FOLDERS if Path(name).is_dir())
    inside = root / "valgrind"
    inside.mkdir(exist_ok=True)
    for name in ("callgrind-amd64-linux", "default.supp"):
        shutil.copy(folder / name, inside / name)
    (root / "proc").mkdir(exist_ok=True)
    script = ('mount --rbind /proc "$0/proc" && chroot=$(command -v chroot) && '
              'exec env -i PATH=/bin VALGRIND_LIB=/valgrind '
              'VALGRIND_LAUNCHER=/valgrind/callgrind-amd64-linux "$chroot" "$0" '
              '/valgrind/callgrind-amd64-linux --tool=callgrind --callgrind-out-file=/valgrind/out "$@"')
    log = subprocess.run([*(as_root() or ["unshare"]), "--mount", "sh", "-c", script, root,
                          *command.split()], check=True, text=True, stderr=subprocess.PIPE,
                         env=ENVIRONMENT).stderr
    found = re.search(r"Collected : (\d+)", log)
    if found is None:
        raise SystemExit(f"bench: callgrind counted nothing:\n{log}")
    return int(found[1])


def size(root: Path, command: str) -> int:
    """The size of the command's program in bytes."""
    return (root / command.split()[0].lstrip("/")).stat().st_size


def emulated(root: Path, command: str) -> tuple[int, int]:
    """Instructions and system calls of an ARM program: the emulator runs the instructions one by one
    and logs each."""
    log = root / "log"
    chroot = [*as_root(), "env", "-i", "PATH=/bin", shutil.which("chroot") or "chroot", root,
              "/bin/emulator"]
    call(*chroot, "-singlestep", "-d", "nochain,exec", "-D", "/log", *command.split())
    with log.open(encoding="ascii", errors="replace") as lines:
        counted = sum(1 for line in lines if line.startswith("Trace"))
    log.unlink()
    calls = subprocess.run([*chroot, "-strace", *command.split()], check=True, text=True,
                           stderr=subprocess.PIPE).stderr
    return counted, len(calls.splitlines())
