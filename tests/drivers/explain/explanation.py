# SPDX-License-Identifier: Apache-2.0
"""What orvane-unit says about a run, and what is wrong with it."""

from __future__ import annotations

import json
from collections.abc import Sequence
from dataclasses import dataclass
from typing import Any

from drivers.explain.reasons import CODES, Stage, is_intended
from drivers.explain.value_reasons import Codes, Line
from model.snapshot import bytes_difference
from model.tree import FILE, FOLDER_PLACE, Tree

FORMAT = 1
FIXED = ("fixed-text",)

# Characters of a value in a report.
SHOWN = 300

WRITTEN = ("generated", "stock", "empty")


@dataclass(frozen=True)
class Output:
    path: str
    outcome: str
    is_intended: bool
    reasons: Codes
    lines: tuple[Line, ...]
    left: str
    content: bytes | None

    def text(self) -> bytes:
        return b"".join(line.text for line in self.lines)


@dataclass(frozen=True)
class Explanation:
    root: bytes
    letters: str
    is_intended: bool
    outputs: tuple[Output, ...]


def to_bytes(value: Any) -> bytes:
    """Bytes that are not UTF-8 are in hex; no others may be."""
    if isinstance(value, str):
        return value.encode()
    if list(value) != ["hex"]:
        raise ValueError(f"neither a text nor hex: {value!r}")
    content = bytes.fromhex(value["hex"])
    try:
        content.decode()
    except UnicodeDecodeError:
        return content
    raise ValueError(f"a text in hex: {content!r}")


def _line(line: Any) -> Line:
    key = b"" if line["key"] is None else to_bytes(line["key"])
    return Line(to_bytes(line["text"]), tuple(line["reasons"]), key)


def _output(output: Any) -> Output:
    content = output["content"]
    return Output(output["path"], output["outcome"], output["isIntended"],
                  tuple(output["reasons"]), tuple(map(_line, output["lines"])), output["left"],
                  None if content is None else to_bytes(content))


def parse(text: bytes) -> Explanation:
    """Raises ValueError, KeyError or TypeError when the text is not an explanation."""
    document = json.loads(text)
    if (document["format"], document["command"]) != (FORMAT, "explain"):
        raise ValueError(f"format {document['format']}, command {document['command']}")
    return Explanation(to_bytes(document["root"]), document["letters"], document["isIntended"],
                       tuple(map(_output, document["outputs"])))


def _differs(what: str, want: object, have: object) -> list[str]:
    if want == have:
        return []
    if isinstance(want, bytes) and isinstance(have, bytes):
        return [f"{what} {bytes_difference(want, have)}"]
    return [f"{what}: {repr(have)[:SHOWN]} instead of {repr(want)[:SHOWN]}"]


def own_faults(said: Explanation, root: bytes, letters: str, status: int) -> list[str]:
    """Where the explanation contradicts itself or the request."""
    found = _differs("root", root, said.root) + _differs("letters", letters, said.letters)
    for output in said.outputs:
        for codes in (output.reasons, *(line.reasons for line in output.lines)):
            if not codes or len(set(codes)) < len(codes) or not CODES.keys() >= set(codes):
                found.append(f"{output.path}: reasons {codes!r}")
                return found
        good = is_intended(output.reasons) and all(is_intended(line.reasons)
                                                   for line in output.lines)
        found += _differs(f"{output.path}: isIntended", good, output.is_intended)
    good = all(output.is_intended for output in said.outputs)
    found += _differs("isIntended", good, said.is_intended)
    return found + _differs("exit status", 0 if said.is_intended else 1, status)


def _line_faults(where: str, line: Line, expected: Line) -> list[str]:
    return (_differs(f"{where}: key", expected.key, line.key)
            + _differs(f"{where}: reasons of {line.key!r}", expected.reasons, line.reasons)
            + _differs(f"{where}: text of {line.key!r}", expected.text, line.text))


def reason_faults(said: Explanation, stages: Sequence[Stage]) -> list[str]:
    """Where the explanation differs from what is known about the unit."""
    found = _differs("outputs", [stage.path for stage in stages],
                     [output.path for output in said.outputs])
    if found:
        return found
    for number, (output, stage) in enumerate(zip(said.outputs, stages), 1):
        where = f"{output.path}, output {number}"
        found += _differs(f"{where}: outcome", stage.outcome, output.outcome)
        found += _differs(f"{where}: reasons", stage.reasons, output.reasons)
        keyed = [line for line in output.lines if line.key]
        if len(keyed) != len(stage.lines):
            found += _differs(f"{where}: keys", [line.key for line in stage.lines],
                              [line.key for line in keyed])
            continue
        for line, expected in zip(keyed, stage.lines):
            found += _line_faults(where, line, expected)
        for line in output.lines:
            is_one_line = line.text != b"" and line.text.find(b"\n") + 1 == len(line.text)
            if not line.key and (line.reasons != FIXED or not is_one_line):
                found.append(f"{where}: not one line of fixed text: {line}")
    return found


def left_faults(said: Explanation, after: Tree) -> list[str]:
    """Where the explanation differs from what the run has left behind.

    The content of an output may be a later one's, since links may lead two outputs to one place:
    the last one that wrote there must have written everything there.
    """
    found = []
    last: dict[str, Output] = {}
    for output in said.outputs:
        place = after.resolve(output.path)
        left, content = "nothing", None
        if place is not None and place.kind == FOLDER_PLACE:
            left = "folder"
        elif place is not None and place.kind == FILE:
            left, content = "file", after.read(place)
            if output.outcome in WRITTEN:
                last[place.path] = output
        found += _differs(f"{output.path}: left", left, output.left)
        found += _differs(f"{output.path}: content", content, output.content)
        if output.outcome in WRITTEN and left != "file":
            found.append(f"{output.path}: {output.outcome}, and not there")
        if output.outcome not in WRITTEN and output.lines:
            found.append(f"{output.path}: {output.outcome}, and has lines")
    for path, output in last.items():
        place = after.resolve(path)
        if place is not None:
            found += _differs(f"{output.path}: lines", after.read(place), output.text())
    return found
