# SPDX-License-Identifier: Apache-2.0
"""The folders of `kit` and `orvane_unit` have an order: each includes only those before it."""

from __future__ import annotations

import re
import unittest
from collections.abc import Iterator
from pathlib import Path, PurePosixPath

from shipped import PROJECT

ROOMS = ("kit/host", "kit/enter", "kit/tuning", "kit/description", "kit/unit",
         "orvane_unit/explain", "orvane_unit/show", "orvane_unit/compare", "orvane_unit/check", "orvane_unit/report",
         "orvane_unit/page", "orvane_unit")

INCLUDE = re.compile(r'^[ \t]*#[ \t]*include[ \t]*"([^"]+)"', re.MULTILINE)


def sources() -> list[Path]:
    return [path for folder in ("kit", "orvane_unit") for path in sorted((PROJECT / folder).rglob("*"))
            if {".cpp", ".h"} & set(path.suffixes)]


def room_of(path: str) -> str:
    return str(PurePosixPath(path).parent)


def included_from_later_rooms(path: str, text: str) -> Iterator[str]:
    """What the project's file `path` includes from a room after its own; headers of `src` are in no room."""
    for included in INCLUDE.findall(text):
        room = room_of(included)
        if room.split("/", maxsplit=1)[0] not in ("kit", "orvane_unit"):
            continue
        if ROOMS.index(room) > ROOMS.index(room_of(path)):
            yield included


class RoomsTest(unittest.TestCase):
    def test_every_folder_is_a_room(self) -> None:
        found = {room_of(path.relative_to(PROJECT).as_posix()) for path in sources()}
        self.assertEqual(found, set(ROOMS))

    def test_no_room_includes_a_later_one(self) -> None:
        for path in sources():
            name = path.relative_to(PROJECT).as_posix()
            with self.subTest(name=name):
                self.assertEqual(list(included_from_later_rooms(name, path.read_text(encoding="utf-8"))), [])

    def test_product_includes_no_room(self) -> None:
        product = [path for path in sorted((PROJECT / "src").rglob("*")) if path.suffix in (".cpp", ".h")]
        self.assertGreater(len(product), 30)
        for path in product:
            with self.subTest(name=path.name):
                included = INCLUDE.findall(path.read_text(encoding="utf-8"))
                self.assertEqual([name for name in included if name.startswith(("kit/", "orvane_unit/"))], [])

    def test_include_from_a_later_room_is_seen(self) -> None:
        for path, included in (("kit/host/text.h", "kit/enter/entered_root.h"),
                               ("kit/tuning/a.cpp", "kit/description/toml_text.h"),
                               ("kit/unit/marker.cpp", "orvane_unit/command_line.h"),
                               ("orvane_unit/compare/text_diff.cpp", "orvane_unit/report/terminal.h"),
                               ("orvane_unit/report/json.h", "orvane_unit/command_line.h")):
            for line in (f'#include "{included}"', f' #  include "{included}"'):
                with self.subTest(path=path, line=line):
                    self.assertEqual(list(included_from_later_rooms(path, f"#pragma once\n{line}\n")), [included])

    def test_include_from_an_earlier_room_is_allowed(self) -> None:
        for path, line in (("kit/enter/entered_root.h", '#include "kit/host/descriptor.h"'),
                           ("kit/enter/entered_root.cpp", '#include "kit/enter/entered_root.h"'),
                           ("kit/host/text.h", "#include <kit/unit/edit.h>"),
                           ("kit/host/text.h", '// #include "kit/unit/edit.h"'),
                           ("kit/tuning/a.cpp", '#include "tuning/dps_block.h"'),
                           ("orvane_unit/main.cpp", '#include "orvane_unit/report/json.h"')):
            with self.subTest(path=path, line=line):
                self.assertEqual(list(included_from_later_rooms(path, line + "\n")), [])

    def test_unknown_room_is_refused(self) -> None:
        with self.assertRaises(ValueError):
            list(included_from_later_rooms("kit/host/text.h", '#include "kit/attic/x.h"\n'))


if __name__ == "__main__":
    unittest.main()
