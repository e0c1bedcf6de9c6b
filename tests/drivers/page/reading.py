# SPDX-License-Identifier: Apache-2.0
"""What a page says, in the words of explain --json and show --json."""

from __future__ import annotations

import re
from collections.abc import Iterable, Sequence
from typing import Any

from drivers.explain.explanation import Output
from drivers.explain.value_reasons import Line
from drivers.page.markup import BadMarkup, Element, shown

STATES = ("generated", "stock", "empty", "kept", "not-asked")
THERE = re.compile(r"There after the run(?:: (.+)\.|, and not from this output:)")
KINDS = {"missing": "nothing", "folder": "folder", "device": "other", "an empty file": "file"}
DETAIL = re.compile(r"byte (\d+), (?:(\d) bytes, )?group (\d), raw (\d+|none), default (-?\d+), "
                    r"mask (0x[0-9a-f]{8})(?:: (.*))?")

# The blocks that the page shows field by field.
BLOCKS = (2, 3)


def merged(lines: Iterable[Line]) -> tuple[Line, ...]:
    """Neighbours of one origin as one line. The page shows each line of a template, and explain all as one."""
    found: list[Line] = []
    for line in lines:
        if found and (found[-1].reasons, found[-1].key) == (line.reasons, line.key):
            found[-1] = Line(found[-1].text + line.text, line.reasons, line.key)
        else:
            found.append(line)
    return tuple(found)


def _rows(table: Element) -> list[Element]:
    return list(table.one("tbody").all("tr"))


def _lines(table: Element) -> list[Line]:
    """The lines of an output: their reasons are those of the group in which they stand."""
    return [Line(_text(row), tuple(group.attributes["data-reasons"].split()), shown(row.attributes.get("data-key", "")))
            for group in table.all("tbody") for row in group.all("tr")]


def _text(row: Element) -> bytes:
    sign = row.first("small", "sign")
    if sign is not None and sign.text() == "(left out)":
        return b""
    return shown(row.one("code").text()) + (b"" if sign is not None else b"\n")


def _left(section: Element, written: bytes) -> tuple[str, bytes | None]:
    """What is at the path after the run, and its content if it is a file."""
    said = section.first("p", "left")
    if said is None:
        return "file", written
    match = THERE.fullmatch(said.text())
    if not match:
        raise BadMarkup(said.text())
    if match[1] is None:
        return "file", b"".join(map(_text, _rows(section.one("table", "left"))))
    kind = KINDS[match[1]]
    return kind, b"" if kind == "file" else None


def _state(element: Element) -> str:
    states = [state for state in STATES if f"state-{state}" in element.classes()]
    if len(states) != 1:
        raise BadMarkup(f"states {states}")
    return states[0]


def outputs(unit: Element) -> tuple[Output, ...]:
    """The outputs, each with merged lines. Its tile and its section must say the same."""
    found = []
    sections = list(unit.one("section", "outputs").all("section", "output"))
    tiles = list(unit.one("section", "verdict").all("li", "tile"))
    for section, tile in zip(sections, tiles, strict=True):
        path, state = section.attributes["data-path"], _state(section)
        told = (tile.one("a").text(), tile.one("a").attributes["href"], _state(tile), tile.one("strong").text())
        if told != (path, "#" + section.attributes["id"], state, state):
            raise BadMarkup(f"{path}: the tile says {told}")
        tables = [table for table in section.all("table") if "left" not in table.classes()]
        lines = [line for table in tables for line in _lines(table)]
        left, content = _left(section, b"".join(line.text for line in lines))
        found.append(Output(path, state, "fallback" not in tile.classes(),
                            tuple(item.one("code").text() for item in tile.all("li", "reason")),
                            merged(lines), left, content))
    return tuple(found)


def params(unit: Element) -> list[dict[str, Any]]:
    """The rows of the image, each from the cell of its first byte."""
    cells = list(unit.one("section", "image").all("li", "cell"))
    found = []
    for cell in cells:
        match = DETAIL.fullmatch(cell.one("small").text())
        if match is None:
            continue
        number = int(cell.one("b").text())
        if cell.attributes["data-key"] != f"param.{number}" or f"group-{match[3]}" not in cell.classes():
            raise BadMarkup(f"cell {number}: {cell.attributes}")
        found.append({"number": number, "group": int(match[3]), "offset": int(match[1]), "size": int(match[2] or 1),
                      "raw": None if match[4] == "none" else int(match[4]), "default": int(match[5]),
                      "mask": int(match[6], 16), "meaning": match[7]})
    if sum(row["size"] for row in found) != len(cells):
        raise BadMarkup(f"{len(cells)} cells")
    return found


def _content(cell: Element, size: int) -> str | None:
    if cell.text() == "can't be read":
        return None
    content = b"" if cell.text() == "zeros" else bytes.fromhex(cell.one("code").text())
    return content.ljust(size, b"\0").hex(" ")


def records(unit: Element) -> dict[str, Any]:
    """The record area without the slot that repeats others."""
    section = unit.one("section", "records")
    found: dict[str, Any] = {"slots": []}
    for row in _rows(section.one("table", "slots")):
        offset, size, content, *_ = row.all("td")
        key = row.attributes["data-key"]
        if key == "aux":
            found["aux"] = _content(content, int(size.text()))
        elif not content.text().startswith("repeats "):
            found["slots"].append({"number": int(key.removeprefix("slot.")), "size": int(size.text()),
                                   "offset": int(offset.text()), "bytes": _content(content, int(size.text()))})
    crc = section.one("p", "crc")
    return {**found, "crc": int(crc.one("code").text(), 16), "crcVerdict": crc.one("strong").text()}


def _field(cell: Element) -> Any:
    numbers = cell.first("span", "numbers")
    if numbers is not None:
        return [int(number) for number in numbers.text().split(", ")]
    code = int("".join(child for child in cell.children if isinstance(child, str)))
    word = cell.first("span", "word")
    return code if word is None else {"code": code, "word": "" if "no-word" in word.classes() else word.text()}


def tuning(unit: Element) -> list[dict[str, Any]] | None:
    """The fields of BLOCKS; None where the disk can't be read."""
    section = unit.one("section", "tuning")
    if section.first("p", "fallback") is not None:
        return None
    blocks: dict[int, dict[str, Any]] = {block: {} for block in BLOCKS}
    for row in _rows(section.one("table", "fields")):
        values = []
        for cell in row.all("td"):
            if "data-key" in cell.attributes:
                _, block, name = cell.attributes["data-key"].split(".")
                if name != row.one("th").text():
                    raise BadMarkup(f"{name} is called {row.one('th').text()}")
                blocks[int(block)][name] = _field(cell)
                values.append(_field(cell))
        if ("differs" in row.classes()) != (values[0] != values[1]):
            raise BadMarkup(f"{row.one('th').text()}: {values}")
    return [blocks[block] for block in BLOCKS]


def versions(unit: Element) -> dict[str, Any]:
    section = unit.one("section", "versions")
    files = []
    for item in section.all("li", "version"):
        rows = [(shown(row.one("th").text()), shown(row.one("code").text())) for row in _rows(item.one("table"))]
        files.append({"path": shown(item.one("h4").text()), "isChosen": "chosen" in item.classes(), "record": rows})
    return {"hasFolder": section.first("p", "fallback") is None, "files": files,
            "version": shown(section.one("code", "version-text").text()),
            "digits": shown(section.one("code", "version-digits").text())}


def files(unit: Element) -> list[dict[str, Any]]:
    found = []
    for row in _rows(unit.one("section", "files").one("table")):
        role, there = (cell.text() for cell in row.all("td"))
        size = re.fullmatch(r"(\d+) bytes?", there)
        kind = next(name for name in row.classes()).removeprefix("kind-")
        found.append({"path": row.one("th").text(), "role": role, "kind": kind,
                      "size": int(size[1]) if size else 0})
    return found


def expected_versions(said: dict[str, Any], to_bytes: Any) -> dict[str, Any]:
    """What show says of the versions, in the form of `versions`."""
    return {"hasFolder": said["hasFolder"],
            "files": [{"path": to_bytes(file["path"]), "isChosen": file["isChosen"],
                       "record": [(to_bytes(row["key"]), to_bytes(row["value"])) for row in file["record"]]}
                      for file in said["files"]],
            "version": to_bytes(said["version"]), "digits": to_bytes(said["digits"])}


def differences(what: str, page: Sequence[Any] | dict[str, Any] | None,
                said: Sequence[Any] | dict[str, Any] | None) -> list[str]:
    if page == said:
        return []
    if isinstance(page, dict) and isinstance(said, dict) and page.keys() == said.keys():
        return [line for key in page for line in differences(f"{what}.{key}", page[key], said[key])]
    if isinstance(page, (list, tuple)) and isinstance(said, (list, tuple)) and len(page) == len(said):
        return [line for index, (one, other) in enumerate(zip(page, said))
                for line in differences(f"{what}.{index}", one, other)]
    return [f"{what}: the page has {repr(page)[:300]}, not {repr(said)[:300]}"]
