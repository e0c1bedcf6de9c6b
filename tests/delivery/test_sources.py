# SPDX-License-Identifier: Apache-2.0
"""The product's sources use what the oldest compiler of a unit's SDK has: GCC 4.7 and its library.

Newer compilers hold the sources to C++11 (-pedantic-errors). What they let pass and GCC 4.7 or its
library does not have is listed here.
"""

from __future__ import annotations

import re
import unittest
from collections.abc import Iterator
from pathlib import Path

from shipped import PROJECT

SOURCES = PROJECT / "src"

STANDARD = {"algorithm", "array", "cerrno", "cstddef", "cstdint", "cstdlib", "cstring", "fstream",
            "iosfwd", "iterator", "limits", "map", "memory", "string", "utility", "vector"}
POSIX = {"dirent.h", "fcntl.h", "sys/mman.h", "sys/types.h", "unistd.h"}

# By what is missing: the language, the library of C++11, and, on the units' system, what GCC's library
# leaves out where it finds the C library without C99.
ABSENT = (r"\[\[", r"\bthread_local\b", r"\balignas\b",
          r"\bemplace(_hint|_back)?\b", r"\bstd::(move|swap)\(\w*([Ff]ile|[Ss]tream|[Oo]utput)\b",
          r"\bstd::(regex|get_time|put_time)\b",
          r"\bstd::(to_w?string|sto(i|l|ul|ll|ull|f|d|ld))\b", r"\bstd::v?snprintf\b")

INCLUDE = re.compile(r'^[ \t]*#[ \t]*include[ \t]*(?:<([^>]+)>|"([^"]+)")', re.MULTILINE)
COMMENT = re.compile(r"//[^\n]*")


def sources() -> list[Path]:
    return [path for path in sorted(SOURCES.rglob("*")) if path.suffix in (".cpp", ".h")]


def refused_headers(text: str) -> Iterator[str]:
    for system, own in INCLUDE.findall(text):
        if system and system not in STANDARD | POSIX:
            yield f"<{system}>"
        if own and not (SOURCES / own).is_file():
            yield f'"{own}"'


def absent_words(text: str) -> Iterator[str]:
    code = COMMENT.sub("", text)
    for pattern in ABSENT:
        yield from (match.group() for match in re.finditer(pattern, code))


class SourcesTest(unittest.TestCase):
    def test_every_header_is_on_the_list(self) -> None:
        self.assertGreater(len(sources()), 30)
        for path in sources():
            with self.subTest(path=path.name):
                self.assertEqual(list(refused_headers(path.read_text(encoding="utf-8"))), [])

    def test_nothing_is_used_that_the_oldest_compiler_lacks(self) -> None:
        for path in sources():
            with self.subTest(path=path.name):
                self.assertEqual(list(absent_words(path.read_text(encoding="utf-8"))), [])

    def test_header_that_is_not_on_the_list_is_seen(self) -> None:
        for line, name in (("#include <charconv>", "<charconv>"), ("# include <string_view>", "<string_view>"),
                           ('  #include "kit/root.h"', '"kit/root.h"'), ("#include <stdio.h>", "<stdio.h>")):
            with self.subTest(line=line):
                self.assertEqual(list(refused_headers(f"#include <array>\n{line}\n")), [name])

    def test_word_that_the_oldest_compiler_lacks_is_seen(self) -> None:
        for line in ("[[maybe_unused]] int a;", "std::to_string(3)", "map.emplace(1, 2);", "std::stoi(text)",
                     "list.emplace_back();", "auto b = std::move(outputFile);"):
            with self.subTest(line=line):
                self.assertEqual(len(list(absent_words(line))), 1)
        self.assertEqual(list(absent_words("// std::to_string is missing there\nf(); // [[x]]")), [])


if __name__ == "__main__":
    unittest.main()
