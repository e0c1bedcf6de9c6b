# SPDX-License-Identifier: Apache-2.0
"""What a page says, in the words of explain --json and show --json."""

from __future__ import annotations

import re
from collections.abc import Iterable, Sequence
from dataclasses import dataclass
from typing import Any

from drivers.explain.explanation import Output
from drivers.explain.value_reasons import Line
from drivers.page.markup import BadMarkup, Element, shown

STATES = ("generated", "stock", "empty", "kept", "not-asked")
THERE = re.compile(r"After the run, (?:(.+) is there\.|a file is there that this output did not write:)")
CUT = re.compile(r"\((\d+) more bytes?\)")
MORE = re.compile(r"\d+ more lines? \((\d+) bytes?\): ")
KINDS = {"nothing": "nothing", "a folder": "folder", "a device": "other", "an empty file": "file"}
DETAIL = re.compile(r"byte (\d+), (?:(\d) bytes, )?group (\d), raw (\d+|none), default (-?\d+), "
                    r"mask (0x[0-9a-f]{8})(?:: (.*))?")

# The keys and values of a version file.
Entries = list[tuple[bytes, bytes]]

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
    signs = [sign.text() for sign in row.all("small", "sign")]
    if "(left out)" in signs:
        return b""
    text = shown(row.one("code").text())
    return text if signs else text + b"\n"


def _cut(part: Element) -> int:
    """How many bytes more the lines of a part have than it shows."""
    found = 0
    for row in part.all("tr"):
        signs = [sign.text() for sign in row.all("small", "sign")]
        for match in filter(None, map(CUT.fullmatch, signs)):
            found += int(match[1]) + ("(no line end)" not in signs)
    for more in part.all("p", "more"):
        match = MORE.match(more.text())
        if match is None:
            raise BadMarkup(more.text())
        found += int(match[1])
    return found


def _parts(section: Element) -> tuple[Element, Element]:
    """What the section of an output says of its lines, and of what is there after the run."""
    children = section.children
    index = next((index for index, child in enumerate(children)
                  if isinstance(child, Element) and child.name == "p" and "left" in child.classes()), len(children))
    return Element("", {}, children[:index]), Element("", {}, children[index:])


def _left(part: Element, written: bytes) -> tuple[str, bytes | None]:
    """What is at the path after the run, and its content if it is a file."""
    said = part.first("p", "left")
    if said is None:
        return "file", written
    match = THERE.fullmatch(said.text())
    if not match:
        raise BadMarkup(said.text())
    if match[1] is None:
        return "file", b"".join(map(_text, _rows(part.one("table", "left"))))
    kind = KINDS[match[1]]
    return kind, b"" if kind == "file" else None


def _state(element: Element) -> str:
    states = [state for state in STATES if f"state-{state}" in element.classes()]
    if len(states) != 1:
        raise BadMarkup(f"states {states}")
    return states[0]


@dataclass(frozen=True)
class Shown(Output):
    """An output on a page: `lines` and `content` may only begin there, and have so many bytes more."""

    lines_cut: int
    content_cut: int


def outputs(unit: Element) -> tuple[Shown, ...]:
    """The outputs, each with merged lines. Its tile and its section must say the same."""
    found = []
    sections = list(unit.one("section", "outputs").all("section", "output"))
    tiles = list(unit.one("section", "verdict").all("li", "tile"))
    for section, tile in zip(sections, tiles, strict=True):
        path, state = section.attributes["data-path"], _state(section)
        told = (tile.one("a").text(), tile.one("a").attributes["href"], _state(tile), tile.one("strong").text())
        if told != (path, "#" + section.attributes["id"], state, state):
            raise BadMarkup(f"{path}: the tile says {told}")
        written, there = _parts(section)
        lines = [line for table in written.all("table") for line in _lines(table)]
        left, content = _left(there, b"".join(line.text for line in lines))
        found.append(Shown(path, state, "fallback" not in tile.classes(),
                           tuple(item.one("code").text() for item in tile.all("li", "reason")),
                           merged(lines), left, content, _cut(written), _cut(there if there.children else written)))
    return tuple(found)


def completed(shown: Shown, whole: Output) -> Output:
    """What the page shows, and from `whole` what it has no room for; its size must be as the page says."""
    lines, content = shown.lines, shown.content
    if shown.lines_cut:
        rest = _after(whole.lines, len(shown.text()))
        if sum(len(line.text) for line in rest) != shown.lines_cut:
            raise BadMarkup(f"{shown.path}: {shown.lines_cut} bytes are not shown")
        lines = merged([*lines, *rest])
    if shown.content_cut and content is not None:
        more = (whole.content or b"")[len(content):]
        if len(more) != shown.content_cut:
            raise BadMarkup(f"{shown.path}: {shown.content_cut} bytes of what is there are not shown")
        content += more
    return Output(shown.path, shown.outcome, shown.is_intended, shown.reasons, lines, shown.left, content)


def _after(lines: Iterable[Line], size: int) -> list[Line]:
    """The lines without their first bytes."""
    found: list[Line] = []
    for line in lines:
        if found or len(line.text) > size:
            found.append(Line(line.text[size:], line.reasons, line.key))
            size = 0
        else:
            size -= len(line.text)
    return found


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


def _whole(cell: Element, text: bytes, said: bytes) -> bytes:
    """`text` of a cell, and from `said` what there was no room for, which must be as long as the page says."""
    sign = cell.first("small", "sign")
    if sign is None:
        return text
    match = CUT.fullmatch(sign.text())
    if match is None or int(match[1]) != len(said) - len(text):
        raise BadMarkup(f"{sign.text()}: {len(text)} of {len(said)} bytes are shown")
    return text + said[len(text):]


def _more(element: Element) -> int:
    """How many things of an element are not shown."""
    more = next((child for child in element.children
                 if isinstance(child, Element) and child.name == "p" and "more" in child.classes()), None)
    return 0 if more is None else int(more.text().split()[0])


def _record(item: Element, said: Entries) -> Entries:
    rows = _rows(item.one("table"))
    if _more(item) != len(said) - len(rows):
        raise BadMarkup(f"{len(rows)} of {len(said)} keys are shown")
    found = []
    for row, (key, value) in zip(rows, said):
        name, code = row.one("th"), row.one("code")
        begin = "".join(child for child in name.children if isinstance(child, str))
        found.append((_whole(name, shown(begin), key), _whole(row.one("td"), shown(code.text()), value)))
    return found + said[len(rows):]


def versions(unit: Element, said: dict[str, Any]) -> dict[str, Any]:
    """The versions, and from `said` what there was no room for."""
    section = unit.one("section", "versions")
    items = {shown(item.one("h4").text()): item for item in section.all("li", "version")}
    files = []
    for file in said["files"]:
        item = items.pop(file["path"], None)
        files.append(file if item is None else {"path": file["path"], "isChosen": "chosen" in item.classes(),
                                                "record": _record(item, file["record"])})
    left = len(said["files"]) - len(list(section.all("li", "version")))
    if items or _more(section) != left:
        raise BadMarkup(f"version files {list(items)}, and {left} that are not shown")
    text = section.first("code", "version-text")
    return {"hasFolder": section.first("p", "fallback") is None, "files": files,
            "version": b"" if text is None else shown(text.text()),
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
