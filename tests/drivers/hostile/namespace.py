# SPDX-License-Identifier: Apache-2.0
"""A namespace of its own for the driver: mounts and processes in it end with it."""

from __future__ import annotations

import ctypes
import os
import subprocess
import sys
from collections.abc import Sequence
from pathlib import Path

INSIDE = "--inside"

# With the privileges of root, or else as root of a user namespace. In a changed root, mounts can't be made
# private; the driver removes those that it makes.
WAYS = (("--mount",), ("--mount", "--propagation", "unchanged"), ("--map-root-user", "--mount"))
OWN_PROCESSES = ("--pid", "--fork", "--kill-child")

MS_BIND = 4096
MNT_DETACH = 2
PR_CAPBSET_DROP = 24
# The capabilities that let root read and write what its permission bits forbid.
CAP_DAC_OVERRIDE, CAP_DAC_READ_SEARCH = 1, 2

_C = ctypes.CDLL(None, use_errno=True)


def enter(arguments: Sequence[str]) -> int:
    """Becomes this program in a namespace; returns the exit status 2 if there can be none."""
    for way in WAYS:
        words = ["unshare", *way, *OWN_PROCESSES]
        if subprocess.run([*words, "true"], stderr=subprocess.DEVNULL, check=False).returncode == 0:
            sys.stdout.flush()
            os.execvp(words[0], [*words, sys.executable, sys.argv[0], "hostile", INSIDE, *arguments])
    print("hostile: no namespace with mounts is possible here", file=sys.stderr)
    return 2


def put_device(source: str, place: Path) -> None:
    """Makes the host's device `source` appear at `place`: only root of the system may make one."""
    place.touch()
    if _C.mount(os.fsencode(source), os.fsencode(place), None, MS_BIND, None) != 0:
        raise OSError(ctypes.get_errno(), "cannot mount", str(place))


def remove_devices(root: Path) -> None:
    """Unmounts everything below `root`."""
    prefix = os.fsencode(root) + b"/"
    with open("/proc/self/mountinfo", "rb") as mounts:
        places = [line.split(b" ")[4].decode("unicode_escape").encode("latin-1") for line in mounts]
    for place in places:
        if place.startswith(prefix):
            _C.umount2(place, MNT_DETACH)


def drop_privileges() -> None:
    """Permission bits then apply to whatever this process executes, even as root."""
    for capability in (CAP_DAC_OVERRIDE, CAP_DAC_READ_SEARCH):
        _C.prctl(PR_CAPBSET_DROP, capability, 0, 0, 0)
