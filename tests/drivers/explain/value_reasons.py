# SPDX-License-Identifier: Apache-2.0
"""Why each value of an output is what it is, according to the unit's own files.

A value has the code of its source, or instead the codes of what is wrong with it.
"""

from __future__ import annotations

from collections.abc import Sequence
from dataclasses import dataclass

from model import configuration, identity, records, tuning, version
from model.system import DISK, System
from model.tree import FOLDER_PLACE, FREE

Codes = tuple[str, ...]


@dataclass(frozen=True)
class Line:
    """`key` is empty when the line has no value of the unit."""

    text: bytes
    reasons: Codes
    key: bytes = b""


@dataclass(frozen=True)
class Values:
    """The values that the writers write, as lines without the fixed text around them."""

    model: Line
    brand: Line
    profile: Line
    drive: Line
    serial: Line
    version_text: Line
    version_digits: Line


def param_reasons(system: System, number: int) -> Codes:
    """A parameter with only its first byte in the image is cut off as well."""
    place = system.tree.resolve(configuration.IMAGE)
    if place is None or place.kind == FREE:
        return ("image-missing",)
    if place.kind == FOLDER_PLACE or system.tree.size(place) == 0:
        return ("image-not-mappable",)
    if system.tree.size(place) < configuration.offset(number) + configuration.width(number):
        return ("image-too-short",)
    return ("from-image",)


def _param(system: System, number: int, text: bytes) -> Line:
    return Line(text, param_reasons(system, number), b"param.%d" % number)


def _model(system: System, names: Sequence[str]) -> Line:
    """A code outside the image is not an unknown one."""
    line = _param(system, configuration.MODEL, identity.model_name(system, names))
    code = configuration.parameter(system, configuration.MODEL) or 0
    if line.reasons == ("from-image",) and not 1 <= code <= identity.MODEL_COUNT:
        return Line(line.text, ("model-unknown",), line.key)
    return line


def _disk_trouble(system: System, distance: int) -> Codes:
    """`distance` is how far before the disk's end the reading begins."""
    place = system.tree.resolve(DISK)
    if place is None or place.kind == FREE:
        return ("disk-missing",)
    if place.kind == FOLDER_PLACE:
        return ("disk-unreadable",)
    return ("disk-too-short",) if system.tree.size(place) < distance else ()


def _serial(system: System) -> Line:
    text = identity.unit_serial(system)
    reasons = _disk_trouble(system, records.RECORD_AREA - records.SERIAL_OFFSET)
    return Line(text, reasons or (("from-record",) if text else ("serial-blank",)), b"slot.9")


def version_digits_reasons(text: bytes) -> Codes:
    """The codes of a version that is there, in the order in which its faults are found."""
    found = []
    if text.count(b".") < 2:
        found.append("version-incomplete")
    first, _, rest = text.partition(b".") if b"." in text else (text, b"", text)
    second, _, third = rest.partition(b".") if b"." in rest else (rest, b"", rest)
    components = (first, second, third.partition(b"_")[0])
    if any(version.NUMBER.match(component) is None for component in components):
        found.append("version-not-numeric")
    if any(not 0 <= version.extracted(component) <= 255 for component in components):
        found.append("version-out-of-range")
    return tuple(found) or ("from-version-file",)


def _application(system: System) -> tuple[str, dict[bytes, bytes]] | None:
    for name in system.list_folder(version.FOLDER):
        path = version.FOLDER + name
        if ".inf" in path:
            record = version.read_record(system, path)
            if b"Application" in record.get(b"Type", b""):
                return path, record
    return None


def _versions(system: System) -> tuple[Line, Line]:
    """If no file is chosen, the folder stands for them all."""
    text = version.application_version(system)
    digits = version.software_version(system)
    folder = system.tree.resolve(version.FOLDER)
    chosen = _application(system)
    trouble: Codes = ()
    if folder is None or folder.kind != FOLDER_PLACE:
        trouble = ("version-folder-missing",)
    elif chosen is None:
        trouble = ("version-no-application",)
    elif not text:
        trouble = ("version-number-missing",)
    elif text == b"N/A":
        trouble = ("version-not-available",)
    key = b"file." + (version.FOLDER if chosen is None else chosen[0]).encode()
    return (Line(text, trouble or ("from-version-file",), key),
            Line(digits, trouble or version_digits_reasons(text), key))


def values(system: System, names: Sequence[str]) -> Values:
    profile = configuration.parameter(system, configuration.AUDIO_PROFILE)
    return Values(
        _model(system, names),
        _param(system, configuration.BRAND, identity.brand_name(system)),
        _param(system, configuration.AUDIO_PROFILE, b"" if profile is None else b"%d" % profile),
        _param(system, configuration.RIGHT_HAND_DRIVE, b"%d" % identity.right_hand_drive(system)),
        _serial(system),
        *_versions(system))


def tuning_lines(system: System, block_id: int) -> tuple[Line, ...]:
    """All fields of a block. Numbers always have a text, so an empty one belongs to a code."""
    trouble = _disk_trouble(system, records.TUNING_AREA)
    blocks = records.tuning_blocks(system) or bytes(records.DPS_AREA_SIZE)
    block = blocks[block_id * tuning.BLOCK_SIZE:(block_id + 1) * tuning.BLOCK_SIZE]
    lines = []
    for text in tuning.tuning_text(block, block_id).splitlines(keepends=True)[1:]:
        field, _, value = text.partition(b" ")
        code = "from-tuning-block" if value.strip(b"\n") else "word-unknown"
        lines.append(Line(text, trouble or (code,), b"tuning.%d.%b" % (block_id, field)))
    return tuple(lines)
