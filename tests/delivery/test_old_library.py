# SPDX-License-Identifier: Apache-2.0
"""The stand-in for older libraries behaves like one; otherwise comparing with it would mean nothing."""

from __future__ import annotations

import os
import re
import subprocess
import unittest


def symbols(program: str) -> dict[str, str]:
    """The kinds that nm prints, by name: T is defined here, W is weak."""
    listing = subprocess.run(["nm", "--demangle", program], check=True, text=True, stdout=subprocess.PIPE)
    found = re.findall(r"^[0-9a-f]* +(\w) (.+)$", listing.stdout, re.MULTILINE)
    return {name: kind for kind, name in found}


@unittest.skipUnless(os.environ.get("ORVANE_OLD_LIBRARY"), "one build has it")
class OldLibraryTest(unittest.TestCase):
    def setUp(self) -> None:
        self.old = symbols(os.environ["ORVANE_OLD_LIBRARY"])
        self.own = symbols(os.environ["ORVANE"])

    def test_streams_ignore_their_buffers(self) -> None:
        name = "std::basic_filebuf<char, std::char_traits<char> >::setbuf(char*, long)"
        self.assertEqual(self.old[name], "T")
        self.assertEqual(self.own[name], "W")

    def test_strings_share_what_they_hold(self) -> None:
        self.assertIn("orvane::getUnitSerial(std::string&)", self.old)
        self.assertFalse([name for name in self.old if name.startswith("orvane::") and "__cxx11" in name])


if __name__ == "__main__":
    unittest.main()
