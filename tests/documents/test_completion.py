# SPDX-License-Identifier: Apache-2.0
"""The completion offers what the program accepts."""

from __future__ import annotations

import subprocess
import tempfile
import unittest
from pathlib import Path

import help_text

SCRIPT = Path(__file__).resolve().parents[2] / "completion/orvane-unit.bash"


def offers(*words: str, folder: str = "/") -> list[str]:
    """What the completion offers for the last of the words after the program's name."""
    program = ('source "$SCRIPT"; shift; COMP_WORDS=(orvane-unit "$@"); COMP_CWORD=$#; '
               'cd "$FOLDER"; _orvane_unit; printf "%s\\n" "${COMPREPLY[@]}"')
    result = subprocess.run(["bash", "-c", program, "bash", "-", *words], check=True,
                            capture_output=True, text=True,
                            env={"FOLDER": folder, "SCRIPT": SCRIPT, "PATH": "/usr/bin:/bin"})
    return sorted(result.stdout.split())


class CompletionTest(unittest.TestCase):
    def test_first_word_is_a_command(self) -> None:
        self.assertEqual(offers(""), sorted([*help_text.commands(), "--help", "--version"]))
        self.assertEqual(offers("de"), ["describe"])

    def test_options_are_those_of_the_help(self) -> None:
        for command in help_text.commands():
            with self.subTest(command):
                self.assertEqual(offers(command, "-"), sorted(help_text.options(command)))

    def test_parts_follow_only(self) -> None:
        self.assertEqual(offers("show", "bench", "--only", ""),
                         ["files", "params", "records", "tuning", "versions"])
        self.assertEqual(offers("show", "bench", "--only", "v"), ["versions"])

    def test_keys_follow_the_root_of_set(self) -> None:
        self.assertEqual(offers("set", "bench", ""),
                         ["aux=", "param.", "serial=", "slot.", "tuning."])
        self.assertEqual(offers("set", "bench", "param.1=2", "s"), ["serial=", "slot."])

    def test_roots_are_folders_and_descriptions_are_files(self) -> None:
        with tempfile.TemporaryDirectory() as folder:
            (Path(folder) / "bench").mkdir()
            (Path(folder) / "bench.toml").touch()
            self.assertEqual(offers("explain", "b", folder=folder), ["bench"])
            self.assertEqual(offers("new", "x", "--from", "b", folder=folder),
                             ["bench", "bench.toml"])


if __name__ == "__main__":
    unittest.main()
