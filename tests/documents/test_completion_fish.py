# SPDX-License-Identifier: Apache-2.0
"""The completion for fish offers what the program accepts, in the program's words."""

from __future__ import annotations

import subprocess
import tempfile
import unittest
from pathlib import Path

import help_text

SCRIPT = Path(__file__).resolve().parents[2] / "completion/orvane-unit.fish"


def offers(*words: str, folder: str = "/") -> dict[str, str]:
    """What fish offers for the last of the words after the program's name, with its descriptions."""
    with tempfile.TemporaryDirectory(prefix="orvane fish-") as home:
        result = subprocess.run(
            ["fish", "--no-config", "-c", 'source "$SCRIPT"; cd "$FOLDER"; complete -C "$TYPED"'],
            check=True, capture_output=True, text=True, stdin=subprocess.DEVNULL,
            env={"SCRIPT": str(SCRIPT), "FOLDER": folder, "TYPED": " ".join(("orvane-unit", *words)),
                 "PATH": "/usr/bin:/bin", "HOME": home, "LC_ALL": "C.UTF-8"})
    if result.stderr:
        raise AssertionError(result.stderr)
    entries = (line.partition("\t") for line in result.stdout.splitlines())
    return {word: what for word, _, what in entries}


class FishCompletionTest(unittest.TestCase):
    def test_first_word_is_a_command(self) -> None:
        self.assertEqual(offers(""), help_text.commands())
        self.assertEqual(list(offers("de")), ["describe"])
        self.assertEqual(offers("-"), help_text.options())

    def test_options_are_those_of_the_help(self) -> None:
        for command in help_text.commands():
            with self.subTest(command):
                self.assertEqual(offers(command, "bench", "-"), help_text.options(command))

    def test_parts_follow_only(self) -> None:
        self.assertEqual(sorted(offers("show", "bench", "--only", "")),
                         ["files", "params", "records", "tuning", "versions"])

    def test_keys_follow_the_root_of_set(self) -> None:
        keys = {"aux=", "param.", "serial=", "slot.", "tuning."}
        self.assertFalse(keys & set(offers("set", "")))
        self.assertLessEqual(keys, set(offers("set", "bench", "")))
        self.assertEqual(sorted(offers("set", "bench", "param.1=2", "s")), ["serial=", "slot."])

    def test_roots_are_folders_and_descriptions_are_files(self) -> None:
        with tempfile.TemporaryDirectory() as folder:
            (Path(folder) / "bench").mkdir()
            (Path(folder) / "bench.toml").touch()
            self.assertEqual(list(offers("explain", "b", folder=folder)), ["bench/"])
            self.assertEqual(sorted(offers("new", "x", "--from", "b", folder=folder)),
                             ["bench.toml", "bench/"])


if __name__ == "__main__":
    unittest.main()
