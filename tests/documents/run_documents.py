#!/usr/bin/env python3
# SPDX-License-Identifier: Apache-2.0
"""Runs the commands that Markdown documents show, and compares what they print.

A fenced block of the language console holds "$ command" lines, each followed by what it prints; after a
backslash, a command continues on the next line, with or without "> ". The blocks of a document run one after
the other in one temporary folder. A fenced block right after

    <!-- file: NAME -->         is written to NAME there first,
    <!-- not run: REASON -->    is skipped, and counted.

A line "..." in the expected text stands for any lines. Exit status: 0 all is as shown,
1 a difference or a document without a command, 2 wrong use.
"""

from __future__ import annotations

import argparse
import difflib
import os
import re
import subprocess
import sys
import tempfile
from collections.abc import Iterator
from dataclasses import dataclass, field
from pathlib import Path

FENCE = re.compile(r"^```(\w*)\s*$")
NOTE = re.compile(r"^<!-- (file|not run): (.+) -->$")
ANY_LINES = "..."
TIMEOUT = 60  # seconds


@dataclass
class Block:
    line: int  # of the opening fence, from 1
    language: str
    lines: list[str]
    note: str = ""
    argument: str = ""


@dataclass
class Command:
    line: int  # in the document, from 1
    text: str
    expected: list[str] = field(default_factory=list)


def blocks(text: str) -> Iterator[Block]:
    block: Block | None = None
    note, argument = "", ""
    for number, line in enumerate(text.splitlines(), 1):
        if block is not None:
            if line.rstrip() == "```":
                yield block
                block = None
            else:
                block.lines.append(line)
        elif fence := FENCE.match(line):
            block = Block(number, fence[1], [], note, argument)
            note, argument = "", ""
        elif found := NOTE.match(line.strip()):
            note, argument = found[1], found[2]
        elif line.strip():
            note, argument = "", ""
    if block is not None:
        raise ValueError(f"the block in line {block.line} has no end")


def commands(block: Block) -> list[Command]:
    found: list[Command] = []
    is_open = False
    for number, line in enumerate(block.lines, block.line + 1):
        if is_open:
            found[-1].text += "\n" + line.removeprefix("> ")
            is_open = line.endswith("\\")
        elif line.startswith("$ "):
            found.append(Command(number, line[2:]))
            is_open = line.endswith("\\")
        elif not found:
            raise ValueError(f"line {number}: output before any command")
        else:
            found[-1].expected.append(line)
    return found


def matches(expected: list[str], printed: list[str]) -> bool:
    pattern = "".join("(?:.*\n)*?" if line == ANY_LINES else re.escape(line) + "\n"
                      for line in expected)
    return re.fullmatch(pattern, "".join(line + "\n" for line in printed)) is not None


def run(command: str, folder: Path, path: str) -> list[str]:
    environment = {"PATH": f"{path}:{os.environ['PATH']}", "LC_ALL": "C.UTF-8", "NO_COLOR": "1",
                   "HOME": str(folder)}
    result = subprocess.run(["bash", "-c", command], cwd=folder, env=environment,
                            stdin=subprocess.DEVNULL, stdout=subprocess.PIPE,
                            stderr=subprocess.STDOUT, timeout=TIMEOUT, check=False)
    return result.stdout.decode(errors="backslashreplace").splitlines()


@dataclass
class Outcome:
    ran: int = 0
    left_out: int = 0
    complaints: list[str] = field(default_factory=list)
    printed: dict[int, tuple[int, list[str]]] = field(default_factory=dict)


def check(document: Path, path: str) -> Outcome:
    outcome = Outcome()
    with tempfile.TemporaryDirectory(prefix="orvane documents-") as name:
        folder = Path(name)
        for block in blocks(document.read_text(encoding="utf-8")):
            if block.note == "not run":
                outcome.left_out += 1
            elif block.note == "file":
                target = folder / block.argument
                target.parent.mkdir(parents=True, exist_ok=True)
                target.write_text("".join(line + "\n" for line in block.lines), encoding="utf-8")
            elif block.language == "console":
                for command in commands(block):
                    printed = run(command.text, folder, path)
                    outcome.ran += 1
                    outcome.printed[command.line] = (len(command.expected), printed)
                    if not matches(command.expected, printed):
                        outcome.complaints.append(f"{document}:{command.line}: $ {command.text}")
                        outcome.complaints += difflib.unified_diff(
                            command.expected, printed, "shown", "printed", lineterm="")
    if outcome.ran == 0:
        outcome.complaints.append(f"{document}: shows no command")
    return outcome


def update(document: Path, outcome: Outcome) -> None:
    """Replaces the shown output by the printed one, except at "..."."""
    lines = document.read_text(encoding="utf-8").splitlines()
    for line, (shown, printed) in sorted(outcome.printed.items(), reverse=True):
        while lines[line - 1].endswith("\\"):
            line += 1
        if ANY_LINES not in lines[line:line + shown]:
            lines[line:line + shown] = printed
    document.write_text("".join(line + "\n" for line in lines), encoding="utf-8")


def main() -> int:
    parser = argparse.ArgumentParser(description=__doc__.splitlines()[0])
    parser.add_argument("--path", required=True, type=Path, help="folder of the built programs")
    parser.add_argument("--update", action="store_true", help="write the printed output into the documents")
    parser.add_argument("documents", nargs="+", type=Path)
    options = parser.parse_args()
    failed = False
    for document in options.documents:
        outcome = check(document, str(options.path.resolve()))
        if options.update:
            update(document, outcome)
        elif outcome.complaints:
            failed = True
            print("\n".join(outcome.complaints))
        print(f"{document}: {outcome.ran} commands run, {outcome.left_out} blocks not run")
    return 1 if failed else 0


if __name__ == "__main__":
    sys.exit(main())
