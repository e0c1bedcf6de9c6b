# SPDX-License-Identifier: Apache-2.0
"""A rule of the product is in `src` alone: none of its texts is repeated in `kit` or `orvane_unit`.

Paths, labels, words and markers of the product are literals of `src`. Other code uses their names, so that a
change in `src` changes everything.
"""

from __future__ import annotations

import re
import unittest
from collections.abc import Iterable, Iterator
from pathlib import Path

from shipped import PROJECT

# Shorter literals are separators, and words of any text.
LEAST_LENGTH = 3

# Literals of the product that are ordinary words elsewhere, with the reason.
OTHER_MEANINGS = {
    "model": "a word of reports and reason codes",
    "name": "a word of reports and reason codes",
    "serial": "a key of `orvane-unit set`, and a word of reports",
    "0123456789abcdef": "digits",
}

# A key's name in the example of a help text is not a rule.
EXAMPLES = re.compile(r'"orvane-unit set bench [^"]*"')

COMMENT = re.compile(r'//[^\n]*|("(?:[^"\\\n]|\\.)*")|(?P<char>\'(?:[^\'\\\n]|\\.)+\')')
INCLUDE = re.compile(r"^[ \t]*#[^\n]*", re.MULTILINE)
ESCAPE = re.compile(r"\\[nrt0\"\\]")


def literals(text: str) -> Iterator[str]:
    """The string literals of C++ code that has no raw ones; neighbours are not joined."""
    for match in COMMENT.finditer(INCLUDE.sub("", text)):
        if match.group(1):
            yield match.group(1)[1:-1]


def rules(texts: Iterable[str]) -> set[str]:
    """The contents of the product's literals, split at escapes and stripped."""
    return {part for text in texts for literal in literals(text)
            for part in (piece.strip(" =;:()#\"") for piece in ESCAPE.split(literal))
            if len(part) >= LEAST_LENGTH and part not in OTHER_MEANINGS}


def repeated(text: str, known: set[str]) -> list[str]:
    """The rules in the literals of `text`, as whole words."""
    code = "\n".join(literals(EXAMPLES.sub('""', text)))
    return sorted(rule for rule in known
                  if rule in code and re.search(rf"(?<![\w-]){re.escape(rule)}(?![\w-])", code))


def sources(*folders: str) -> list[Path]:
    return [path for folder in folders for path in sorted((PROJECT / folder).rglob("*"))
            if path.suffix in (".cpp", ".h")]


class RulesOnceTest(unittest.TestCase):
    known = rules(path.read_text(encoding="utf-8") for path in sources("src"))

    def test_rules_are_found(self) -> None:
        self.assertGreater(len(self.known), 150)
        for rule in ("N/A", "Genereated config from DPS", "/tmp/airplay.conf", "qwaOn", ".inf", "Application",
                     "/dev/hd0", "qwaAECSwitch", "rightHandDrive", "QUARION", "ABCD1234abc"):
            self.assertTrue(any(rule in known for known in self.known), rule)

    def test_no_rule_is_repeated(self) -> None:
        for path in sources("kit", "orvane_unit"):
            with self.subTest(path=path.relative_to(PROJECT).as_posix()):
                self.assertEqual(repeated(path.read_text(encoding="utf-8"), self.known), [])

    def test_repeated_rule_is_seen(self) -> None:
        for line, rule in (('f("/dev/hd0");', "/dev/hd0"), ('if (text == "N/A") {', "N/A"),
                           ('const char* a = "the file \\".inf\\"";', ".inf")):
            with self.subTest(line=line):
                self.assertEqual(repeated(line, self.known), [rule])

    def test_comments_includes_and_longer_words_are_not_seen(self) -> None:
        for line in ('// "N/A"', '#include "tuning/N/A"', 'f("N/AB");', "char a = '\"'; // \"N/A\"",
                     'addCommand("orvane-unit set bench tuning.3.qwaNRAtten=-40");'):
            with self.subTest(line=line):
                self.assertEqual(repeated(line, self.known), [])


if __name__ == "__main__":
    unittest.main()
