# SPDX-License-Identifier: Apache-2.0
"""The manual pages are well-formed and complete."""

from __future__ import annotations

import os
import re
import subprocess
import unittest
from pathlib import Path

import help_text

MAN = Path(__file__).resolve().parents[2] / "man"
PAGES = ("orvane.1", "orvane-unit.1")


def render(page: str) -> subprocess.CompletedProcess[str]:
    environment = {**os.environ, "LC_ALL": "C.UTF-8", "MANWIDTH": "80", "MAN_KEEP_FORMATTING": ""}
    return subprocess.run(["man", "--warnings", "-E", "UTF-8", "-l", MAN / page], check=True,
                          capture_output=True, text=True, env=environment, stdin=subprocess.DEVNULL)


class ManTest(unittest.TestCase):
    def test_pages_give_no_warning(self) -> None:
        for page in PAGES:
            with self.subTest(page):
                self.assertEqual(render(page).stderr, "")

    def test_every_command_and_option_is_described(self) -> None:
        words = set(re.findall(r"[-\w]+", render("orvane-unit.1").stdout.replace("\u2010", "-")))
        for command in help_text.commands():
            self.assertIn(command, words)
            for option in help_text.options(command):
                self.assertIn(option, words, command)
        for option in help_text.options():
            self.assertIn(option, words)

    def test_page_of_the_tool_names_its_options_and_files(self) -> None:
        text = render("orvane.1").stdout
        for name in ("-a", "-i", "airplay.conf", "iap2_device.cfg", "iap2.cfg", "iap1.cfg",
                     "telephony_FFFF.txt", "speechrec_FFFF.txt", "Always 0"):
            self.assertIn(name, text)


if __name__ == "__main__":
    unittest.main()
