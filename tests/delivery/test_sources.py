# SPDX-License-Identifier: Apache-2.0
"""The product's sources use what the oldest compiler of a unit's SDK has: GCC 4.7 and its library.

Newer compilers hold the sources to C++11 (-pedantic-errors), and `orvane-old-library` to the strings of GCC
before 5. This lists what they accept and GCC 4.7 or its library is known to lack.
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

# The language: attributes, storage and alignment, inherited constructors, functions of rvalues.
LANGUAGE = (r"\[\[", r"\bthread_local\b", r"\balignas\b", r"\busing (\w+)::\1;", r"\)(?: const)? &&?(?: \{|;)")
# The library of C++11. Its file streams can't be moved.
LIBRARY = (r"\bemplace(?:_hint|_back)?\b", r"\bstd::(?:regex|get_time|put_time)\b",
           r"\bstd::(?:move|swap)\([\w.>()-]*(?:[Ff]ile|[Ss]tream|[Oo]utput|[Ss]tock)\b",
           r"= std::[io]?fstream\(")
# Parts of C99 that GCC's library leaves out on the units' system because its C library lacks them.
C99 = (r"\bto_w?string\b", r"\bsto(?:i|l|ul|ll|ull|f|d|ld)\b", r"\bv?snprintf\b",
       r"\b(?:strto(?:ll|ull|f|ld)|atoll|llabs|lldiv|_Exit)\b")
ABSENT = (*LANGUAGE, *LIBRARY, *C99)

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

    def test_words_known_to_be_absent_are_not_used(self) -> None:
        for path in sources():
            with self.subTest(path=path.name):
                self.assertEqual(list(absent_words(path.read_text(encoding="utf-8"))), [])

    def test_header_that_is_not_on_the_list_is_seen(self) -> None:
        for line, name in (("#include <charconv>", "<charconv>"), ("# include <string_view>", "<string_view>"),
                           ('  #include "kit/enter/entered_root.h"', '"kit/enter/entered_root.h"'), ("#include <stdio.h>", "<stdio.h>")):
            with self.subTest(line=line):
                self.assertEqual(list(refused_headers(f"#include <array>\n{line}\n")), [name])

    def test_absent_word_is_seen(self) -> None:
        for line in ("[[maybe_unused]] int a;", "thread_local int b;", "using Base::Base;", "int f() const &;",
                     "std::to_string(3)", "to_string(3)", "std::stoi(text)", "snprintf(a, 1, b)",
                     "std::strtoll(a, b, 10)", "map.emplace(1, 2);", "list.emplace_back();",
                     "auto b = std::move(outputFile);", "f(std::move(merge.output));",
                     "std::ofstream a = std::ofstream(path);"):
            with self.subTest(line=line):
                self.assertEqual(len(list(absent_words(line))), 1)

    def test_word_of_a_comment_and_what_looks_alike_are_not_seen(self) -> None:
        for line in ("// std::to_string is missing there", "f(); // [[x]]", "list.push_back(std::move(record));",
                     "using Limits = std::numeric_limits<int>;", "if (isRead(a) && isOpen()) {", "strtol(a, b, 10)"):
            with self.subTest(line=line):
                self.assertEqual(list(absent_words(line)), [])


if __name__ == "__main__":
    unittest.main()
