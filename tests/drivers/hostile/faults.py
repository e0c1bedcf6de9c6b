# SPDX-License-Identifier: Apache-2.0
"""What may be wrong with what a command prints and leaves."""

from __future__ import annotations

import json
import os
import stat
import sys
import unicodedata
from collections.abc import Iterator, Mapping
from pathlib import Path
from typing import Any

from drivers.explain.same_tree import data_parts
from drivers.page import markup

# Characters of an output in a report.
SHOWN = 160

PROGRAM = "orvane-unit: "

# What a terminal obeys or hides instead of showing it: control and format characters but for the ends of lines
# and tabs, and the separators of lines and paragraphs.
UNSEEN = frozenset(character for character in map(chr, range(sys.maxunicode + 1))
                   if unicodedata.category(character) in ("Cc", "Cf", "Zl", "Zp") and character not in "\n\t")

State = Mapping[bytes, tuple[object, ...]]


def printed_faults(what: str, output: bytes) -> list[str]:
    try:
        text = output.decode()
    except UnicodeDecodeError as error:
        return [f"{what} is not UTF-8: {output[max(0, error.start - 20):error.start + 20]!r}"]
    return [f"{what} has {character!r}: {text[max(0, place - 40):place + 20]!r}"
            for character in sorted(UNSEEN & set(text)) for place in [text.index(character)]]


def page_faults(page: bytes) -> list[str]:
    """What is wrong with a page: markup that its writer does not write, or what no reader should obey."""
    try:
        scripts = len(list(markup.parse(page).all("script")))
    except ValueError as error:
        return [f"the page is not well-formed: {error}"]
    return [*printed_faults("the page", page), *([] if scripts == 1 else [f"the page has {scripts} scripts"])]


def end_faults(command: str, status: int, stdout: bytes, stderr: bytes) -> list[str]:
    """Status 2 comes with complaints, and no other status does.

    Only `check` prints a report with it: a bad case does not keep it from the others.
    """
    if status not in (0, 1, 2):
        return [f"status {status}, said {stderr[:SHOWN]!r}"]
    lines = stderr.decode(errors="replace").splitlines()
    complaints = [line for line in lines if line.startswith(PROGRAM) and len(line) > len(PROGRAM)]
    if (status == 2) != bool(lines) or complaints != lines:
        return [f"status {status}, and says {stderr[:SHOWN]!r}"]
    return [] if not (status == 2 and stdout) or command == "check" else [f"status 2, and prints {stdout[:SHOWN]!r}"]


def parsed(command: str, stdout: bytes) -> tuple[Any, list[str]]:
    """The JSON document that a command prints, and what is wrong with it."""
    try:
        document = json.loads(stdout)
        if (document["format"], document["command"]) == (1, command):
            return document, []
        return None, [f"format {document['format']}, command {document['command']!r}"]
    except (ValueError, KeyError, TypeError) as error:
        return None, [f"not its JSON: {error!r}: {stdout[:SHOWN]!r}"]


def state(folder: Path) -> State:
    """Everything below `folder`, with all that changes when it is written to."""
    entries: dict[bytes, tuple[object, ...]] = {}
    ahead = [os.fsencode(folder)]
    while ahead:
        here = ahead.pop()
        for entry in os.scandir(here):
            status = entry.stat(follow_symlinks=False)
            if stat.S_ISCHR(status.st_mode):  # the host's own, which others may use
                entries[entry.path] = (status.st_mode, status.st_rdev)
                continue
            target = os.readlink(entry.path) if entry.is_symlink() else b""
            entries[entry.path] = (status.st_mode, status.st_ino, status.st_nlink, status.st_size,
                                   status.st_mtime_ns, status.st_ctime_ns, target)
            if entry.is_dir(follow_symlinks=False):
                ahead.append(entry.path)
    return entries


def has_unreadable(folder: Path) -> bool:
    """Whether something below `folder` can't be read by an owner to whom permission bits apply."""
    for here, folders, files in os.walk(folder):
        for name in (*folders, *files):
            mode = os.lstat(os.path.join(here, name)).st_mode
            wanted = stat.S_IRUSR | stat.S_IXUSR if stat.S_ISDIR(mode) else stat.S_IRUSR
            if not stat.S_ISLNK(mode) and mode & wanted != wanted:
                return True
    return False


def changes(before: State, after: State) -> list[str]:
    return [f"changes {path!r}" for path in sorted(before.keys() | after.keys())
            if before.get(path) != after.get(path)]


def _parts(path: bytes) -> Iterator[bytes]:
    """The name, the target of a link, and the parts of a file that are not holes."""
    yield path.rsplit(b"/", 1)[1]
    if os.path.islink(path):
        yield os.readlink(path)
    elif os.path.isfile(path):
        with open(path, "rb") as file:
            for start, end in data_parts(file.fileno(), os.fstat(file.fileno()).st_size):
                yield os.pread(file.fileno(), end - start, start)


def places_of(text: bytes, folder: Path) -> list[str]:
    """Where `text`, which has no zero byte, stands below `folder`."""
    return [repr(path) for path in state(folder) if any(text in part for part in _parts(path))]
