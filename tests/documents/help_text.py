# SPDX-License-Identifier: Apache-2.0
"""What orvane-unit itself says of its commands and options."""

from __future__ import annotations

import os
import re
import subprocess


def help_of(*words: str) -> str:
    # In a cross build the program starts through binfmt or not at all: these tests run in native ones.
    return subprocess.run([os.environ["ORVANE_UNIT"], *words, "--help"], check=True,
                          capture_output=True, text=True).stdout


def commands() -> list[str]:
    listed = help_of().split("Subcommands:\n", 1)[1].split("\n\n", 1)[0]
    found = re.findall(r"^  (\w+) ", listed, re.MULTILINE)
    if len(found) < 2:
        raise AssertionError(f"no commands in the help: {listed!r}")
    return found


def options(*words: str) -> set[str]:
    """The options as they are typed, without -h, which is --help."""
    found = set()
    for line in help_of(*words).splitlines():
        if head := re.match(r"^  (-[-\w,]+)", line):
            found.update(head[1].split(","))
    return found - {"-h"}
