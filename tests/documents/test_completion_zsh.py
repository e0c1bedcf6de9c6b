# SPDX-License-Identifier: Apache-2.0
"""The completion for zsh offers what the program accepts, in the program's words.

zsh completes at a terminal only. Here its two functions that take the offers print them instead.
"""

from __future__ import annotations

import re
import subprocess
import unittest
from pathlib import Path

import help_text

SCRIPT = Path(__file__).resolve().parents[2] / "completion/_orvane-unit"
PROGRAM = """
_arguments() { [[ $1 = -C ]] && { state=$STATE; [[ $STATE ]] && return }; print -rl -- "$@" }
_describe() { print -rl -- "${(@P)2}" }
complete() { source "$SCRIPT" }
words=("$@") complete
"""


def said(state: str, *words: str) -> list[str]:
    """What the completion says in one of the states that _arguments chooses."""
    result = subprocess.run(["zsh", "-f", "-o", "err_exit", "-c", PROGRAM, "zsh", *words], check=True,
                            capture_output=True, text=True,
                            env={"STATE": state, "SCRIPT": str(SCRIPT), "PATH": "/usr/bin:/bin"})
    if result.stderr:
        raise AssertionError(result.stderr)
    return result.stdout.splitlines()


def options(lines: list[str]) -> dict[str, str]:
    """The options among the arguments of _arguments: (what they exclude)--name[description]."""
    found = (re.match(r"(?:\([^)]*\)|\*)?(--?\w[-\w]*)\[([^]]*)\]", line) for line in lines)
    return {match[1]: match[2] for match in found if match}


class ZshCompletionTest(unittest.TestCase):
    def test_it_is_named_as_zsh_looks_for_it(self) -> None:
        self.assertEqual(SCRIPT.read_text(encoding="utf-8").splitlines()[0], "#compdef orvane-unit")

    def test_first_word_is_a_command(self) -> None:
        self.assertEqual(dict(line.split(":", 1) for line in said("command")), help_text.commands())
        self.assertEqual(options(said("")), help_text.options())

    def test_options_are_those_of_the_help(self) -> None:
        for command in help_text.commands():
            with self.subTest(command):
                self.assertEqual(options(said("argument", command)), help_text.options(command))

    def test_parts_follow_only(self) -> None:
        self.assertTrue(any(line.endswith(":part:(params records tuning versions files)")
                            for line in said("argument", "show")))

    def test_each_command_takes_paths_and_set_takes_keys(self) -> None:
        for command in help_text.commands():
            self.assertTrue(any(re.fullmatch(r"[1*]:[\w, ]+:_files( -/)?", line)
                                for line in said("argument", command)), command)
        self.assertIn("*:assignment:compadd -S '' - param. serial= slot. aux= tuning.",
                      said("argument", "set"))


if __name__ == "__main__":
    unittest.main()
