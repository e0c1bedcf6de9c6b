# SPDX-License-Identifier: Apache-2.0
"""The catalogue of parameters and the library's getters, which a run uses only in part."""

from __future__ import annotations

from dataclasses import dataclass

from model import configuration

SIZES = (1, 2, 4, 1, 1, 2, 4, 4, 8)
FIRST_OF_GROUP = (1, 69, 127, 133, 142, 145, 147, 159)
NO_GROUP = 8

# Ten in a row, from parameter 1 on.
CODES = """
    4 5 11 3 12 13 14 15 16 17
    18 1 6 20 19 54 21 22 47 69
    55 25 26 24 28 29 30 31 32 33
    34 35 36 37 38 2 39 40 9 53
    0 41 23 63 64 65 66 70 71 56
    57 58 27 74 76 77 78 79 80 81
    82 83 84 85 86 87 88 90 42 43
    44 52 91 92 93 94 95 96 97 98
    99 100 101 102 89 103 104 106 107 108
    109 110 111 112 113 115 116 117 118 119
    120 121 122 151 152 153 154 155 156 157
    158 160 164 165 166 167 168 180 161 86
    182 183 205 186 187 149 60 59 61 75
    73 206 45 46 172 173 174 48 49 50
    51 62 105 148 124 162 136 137 138 139
    140 141 142 143 144 145 146 147 189 190
    191 192 193 194 195 196 197 198 199 200
    201
"""
DEFAULTS = {9: 1, 126: 5, 133: 1, 147: 10}

# The numbers that have a mask of their own.
MASKS = {
    0x7FFFFFFE: (23, 30, 41, 52, 57, 88, *range(100, 108), 126, 139),
    0x00000003: (38,),
    0x7FFFFFF0: (*range(108, 111), *range(113, 116), *range(135, 138)),
    0x7FFFFFFC: (111,),
    0x7FFFFFEC: (112,),
    0x7FFFFFE0: (116, 117, 118),
    0x00000004: (119,),
    0x7FFFFFC0: (120, 121, *range(159, 170)),
    0x7FFFFF80: (*range(122, 126), 132, 170, 171),
    0x0000001F: (131,),
    0x7FFFFFF8: (146,),
}

OK, UNKNOWN, WRONG_SIZE, NOT_OPEN = 0, 1, 2, 3
NOT_MAPPED, NOT_FOUND = -1, -2


@dataclass(frozen=True)
class Row:
    number: int
    kind: int
    group: int
    offset: int
    id: int
    default: int
    mask: int


# Rules: CAT-03
def type_size(kind: int) -> int:
    return SIZES[kind] if kind < len(SIZES) else 1


# Rules: CAT-01, CAT-02, CAT-04 to CAT-09
def row(number: int) -> Row | None:
    if not 1 <= number <= configuration.PARAMETER_COUNT:
        return None
    return Row(
        number,
        configuration.width(number) - 1,
        sum(first <= number for first in FIRST_OF_GROUP) - 1,
        configuration.offset(number),
        int(CODES.split()[number - 1]) << 16 | 0x00A0,
        DEFAULTS.get(number, 0),
        next((mask for mask, numbers in MASKS.items() if number in numbers), 0xFFFFFFFF),
    )


# Rules: CAT-15
def words() -> list[int]:
    """The catalogue as it is in memory."""
    rows = [found for found in map(row, range(1, configuration.PARAMETER_COUNT + 1)) if found]
    return [*SIZES, *(word for found in rows for word in (
        found.number, found.kind, found.group, found.offset, found.id, found.default, found.mask))]


# Rules: CAT-10, CAT-11
def lookup(number: int) -> tuple[int, int, Row | None]:
    """Status, index, and the row; None if it stays as it was."""
    found = row(number)
    return (UNKNOWN, -1, None) if found is None else (OK, number - 1, found)


# Rules: CAT-12
def group(number: int) -> int:
    found = row(number)
    return NO_GROUP if found is None else found.group


# Rules: CAT-13, CAT-14
def describe(number: int) -> tuple[int, tuple[int, int, int, int] | None]:
    """Status, and number, type, size and group; None if they stay as they were."""
    found = row(number)
    if found is None:
        return UNKNOWN, None
    return OK, (number, found.kind, type_size(found.kind), found.group)


class Store:
    """The handle on an image. `image` is None if there is none."""

    def __init__(self, image: bytes | None) -> None:
        self._image = image
        self.is_open = False
        self.length = 0

    # Rules: PAR-15
    def init(self) -> None:
        self.is_open = False
        self.length = 0

    # Rules: PAR-01 to PAR-03
    def open(self) -> int:
        if self._image is None:
            return NOT_FOUND
        if not self._image:
            return NOT_MAPPED
        self.is_open = True
        self.length = len(self._image)
        return OK

    # Rules: PAR-04
    def close(self) -> None:
        self.is_open = False

    # Rules: PAR-05 to PAR-09
    def get(self, number: int, wanted: int | None) -> tuple[int, bytes | None]:
        """Status and value. `wanted` is the size of the getter's values, None if it takes any."""
        found = row(number)
        if found is None:
            return UNKNOWN, None
        size = type_size(found.kind)
        if wanted not in (None, size):
            return WRONG_SIZE, None
        if not self.is_open or self._image is None:
            return NOT_OPEN, None
        return OK, self._image[found.offset:found.offset + size].ljust(size, b"\0")

    # Rules: PAR-10 to PAR-12
    def get_all(self, count: int) -> tuple[int, list[int]]:
        """Status, and the values from the first on; all others stay as they were."""
        opened = self.open()
        if opened != OK:
            return opened, []
        status, values = OK, []
        for number in range(1, min(count, configuration.PARAMETER_COUNT + 1) + 1):
            status, value = self.get(number, None)
            values.append(int.from_bytes(value or b"", "little"))
        self.close()
        return status, values


# Rules: PAR-13, PAR-14
def fuel_type(store: Store) -> str:
    value = b"\0"
    if store.open() == OK:
        value = store.get(configuration.FUEL_TYPE, 1)[1] or value
        store.close()
    return {1: "diesel", 2: "cng", 3: "electric"}.get(value[0], "gasoline")
