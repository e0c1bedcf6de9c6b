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


def commands() -> dict[str, str]:
    """What each command is said to do."""
    listed = help_of().split("Subcommands:\n", 1)[1].split("\n\n", 1)[0]
    found = dict(re.findall(r"^  (\w+) +(.+)$", listed, re.MULTILINE))
    if len(found) < 2:
        raise AssertionError(f"no commands in the help: {listed!r}")
    return found


def options(*words: str) -> dict[str, str]:
    """What each option is said to do, as it is typed, without -h, which is --help."""
    listed = help_of(*words).split("Options:\n", 1)[1].split("\n\n", 1)[0]
    found = {}
    for names, what in re.findall(r"^  (-[-\w,]+)[^\n]*?\s{2,}(\S.*)$", listed, re.MULTILINE):
        found.update({name: what for name in names.split(",") if name != "-h"})
    return found
