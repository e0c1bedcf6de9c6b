# SPDX-License-Identifier: Apache-2.0
"""The runner of documents distinguishes a wrong document from a right one."""

from __future__ import annotations

import subprocess
import sys
import tempfile
import unittest
from pathlib import Path

import run_documents


def outcome_of(text: str) -> run_documents.Outcome:
    with tempfile.TemporaryDirectory() as folder:
        document = Path(folder) / "document.md"
        document.write_text(text, encoding="utf-8")
        return run_documents.check(document, "/nonexistent")


def console(text: str) -> str:
    return f"```console\n{text}```\n"


class RunDocumentsTest(unittest.TestCase):
    def test_right_output_gives_no_complaint(self) -> None:
        outcome = outcome_of(console("$ echo one; echo two >&2\none\ntwo\n$ true\n"))
        self.assertEqual(outcome.complaints, [])
        self.assertEqual(outcome.ran, 2)

    def test_wrong_missing_and_additional_output_are_reported_with_their_line(self) -> None:
        for shown in ("", "two\n", "one\nmore\n"):
            complaints = outcome_of("text\n\n" + console("$ echo one\n" + shown)).complaints
            self.assertIn("document.md:4: $ echo one", complaints[0], shown)

    def test_dots_stand_for_any_lines_and_for_nothing_else(self) -> None:
        self.assertEqual(outcome_of(console("$ seq 9\n1\n...\n9\n")).complaints, [])
        self.assertNotEqual(outcome_of(console("$ seq 9\n1\n...\n8\n")).complaints, [])

    def test_files_are_written_and_blocks_share_a_folder(self) -> None:
        text = "<!-- file: a/b.txt -->\n```toml\nx = 1\n```\n" + console("$ cat a/b.txt\nx = 1\n")
        self.assertEqual(outcome_of(text + console("$ ls\na\n")).complaints, [])

    def test_command_continues_after_a_backslash(self) -> None:
        for begin in ("  ", ">   "):
            text = console(f"$ echo one \\\n{begin}two\none two\n")
            self.assertEqual(outcome_of(text).complaints, [])

    def test_block_that_is_not_run_is_counted(self) -> None:
        outcome = outcome_of(console("$ true\n") + "<!-- not run: a unit -->\n" + console("$ no\n"))
        self.assertEqual((outcome.ran, outcome.left_out, outcome.complaints), (1, 1, []))

    def test_document_without_a_command_is_reported(self) -> None:
        self.assertIn("shows no command", outcome_of("text\n").complaints[0])

    def test_exit_status_and_environment(self) -> None:
        with tempfile.TemporaryDirectory() as name:
            folder = Path(name)
            (folder / "tool").write_text("#!/bin/sh\necho \"$NO_COLOR\"\n", encoding="utf-8")
            (folder / "tool").chmod(0o755)
            for shown, status in (("1", 0), ("2", 1)):
                document = folder / "document.md"
                document.write_text(console(f"$ tool\n{shown}\n"), encoding="utf-8")
                result = subprocess.run([sys.executable, run_documents.__file__, "--path", folder,
                                         document], capture_output=True, check=False)
                self.assertEqual(result.returncode, status, result.stdout)

    def test_block_without_an_end_and_output_without_a_command_are_refused(self) -> None:
        for text in ("```console\n$ true\n", console("output\n")):
            with self.assertRaises(ValueError):
                outcome_of(text)


if __name__ == "__main__":
    unittest.main()
