# SPDX-License-Identifier: Apache-2.0
"""A copy of the project, and programs with limits."""

from __future__ import annotations

import os
import resource
import shlex
import shutil
import signal
import subprocess
from pathlib import Path

# Everything except this is copied: tests read documents, too.
NOT_COPIED = ("build", ".git", "__pycache__")

# Limits for an endless loop; the tests themselves make disks of 5 GiB.
MEMORY_LIMIT = 8 << 30
FILE_LIMIT = 6 << 30


class Broken(Exception):
    """The project itself does not build, or its suite fails."""


def call(command: list[str], folder: Path) -> str:
    done = subprocess.run(command, cwd=folder, capture_output=True, text=True, check=False)
    if done.returncode != 0:
        raise Broken(f"{shlex.join(command)}\n{done.stdout}{done.stderr}")
    return done.stdout


def copy_tree(source: Path, target: Path) -> None:
    """Makes `target` equal to `source`; an equal file keeps its time, so nothing is rebuilt for it."""
    wanted = set()
    for folder, folders, names in os.walk(source):
        folders[:] = sorted(set(folders).difference(NOT_COPIED))
        for name in names:
            path = Path(folder, name)
            relative = path.relative_to(source)
            wanted.add(relative)
            copy = target / relative
            if not copy.exists() or copy.read_bytes() != path.read_bytes():
                copy.parent.mkdir(parents=True, exist_ok=True)
                shutil.copyfile(path, copy)
    for path in list(target.rglob("*")):
        if path.is_file() and path.relative_to(target) not in wanted:
            path.unlink()


def limit_resources() -> None:
    for what, limit in ((resource.RLIMIT_AS, MEMORY_LIMIT), (resource.RLIMIT_FSIZE, FILE_LIMIT),
                        (resource.RLIMIT_CORE, 0)):
        resource.setrlimit(what, (limit, limit))


def passes(command: list[str], output: Path, scratch: Path, limit: float) -> bool:
    """Whether the command succeeds; it prints to `output`. Raises TimeoutExpired after `limit` seconds."""
    with output.open("wb") as said, \
            subprocess.Popen(command, cwd=output.parent, stdin=subprocess.DEVNULL, stdout=said,
                             stderr=said, start_new_session=True, preexec_fn=limit_resources,
                             env={**os.environ, "TMPDIR": str(scratch)}) as process:
        try:
            return process.wait(limit) == 0
        finally:
            try:
                os.killpg(process.pid, signal.SIGKILL)
            except ProcessLookupError:
                pass
