# SPDX-License-Identifier: Apache-2.0
"""The tables of docs/rules.md are those of the model, which the product is compared with."""

from __future__ import annotations

import unittest

from model import catalogue, record_area, tuning
from model.identity import load_names
from rules.rules_and_tests import PROJECT, RULES

# How the model writes a width.
WIDTHS = {"one byte": "b", "two bytes": "h"}


def cells(line: str) -> list[str]:
    return [cell.strip() for cell in line.strip("|").split("|")]


def table(heading: str) -> list[list[str]]:
    """The rows of the table with this first line."""
    lines = (PROJECT / RULES).read_text(encoding="utf-8").split("\n")
    first = lines.index(heading) + 2
    rows = lines[first:lines.index("", first)]
    return [cells(line) for line in rows]


class TablesTest(unittest.TestCase):
    def test_names_are_those_of_the_model(self) -> None:
        pairs = [pair for row in table("| Code | Name | Code | Name | Code | Name |")
                 for pair in zip(row[::2], row[1::2]) if pair[0]]
        names = [name for _, name in sorted(pairs, key=lambda pair: int(pair[0]))]
        self.assertEqual(names, load_names())

    def test_codes_of_the_parameters_are_those_of_the_model(self) -> None:
        rows = table("| From | Codes |")
        self.assertEqual([int(first) for first, _ in rows], list(range(1, 172, 10)))
        self.assertEqual(" ".join(codes for _, codes in rows).split(), catalogue.CODES.split())

    def test_slots_are_those_of_the_model(self) -> None:
        rows = table("| Id | Slot | Size | Offset |")
        places = [(int(slot.split(",")[0]), (int(size), int(offset))) for _, slot, size, offset in rows]
        self.assertEqual(places, [(slot, record_area.slot_place(slot)) for slot in range(18)])

    def test_fields_are_those_of_the_model(self) -> None:
        rows = []
        for _, key, where, stored, written in table("| Id | Key | Where | Stored as | Written as |"):
            width, kind = stored.split(",")[0], written.split(",")[0]
            place = where.split(",")[0]
            if width == "two bits":
                store = kind[0] + where.split(" ")[2]
            elif kind == "list":
                store = width.split(" ")[0] + "*"
            else:
                store = WIDTHS[width].upper() if kind == "switch" else WIDTHS[width]
            rows.append(f"{key.strip('`').removeprefix('qwa')} {store} {place}")
        self.assertEqual(rows, tuning.LAYOUT.split("\n")[1:-1])


if __name__ == "__main__":
    unittest.main()
