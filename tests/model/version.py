# SPDX-License-Identifier: Apache-2.0
"""The application's software version, from the version description files."""

from __future__ import annotations

import re

from model.streams import InputStream
from model.system import System

FOLDER = "/fs/rwdata/.Version/"

# What a formatted extraction takes: the blanks of the "C" locale, a sign, digits.
NUMBER = re.compile(rb"[ \t\n\v\f\r]*([+-]?)([0-9]+)")
INT_MAX = 2**31 - 1
INT_MIN = -(2**31)


# Rules: VER-05 to VER-12, VER-22
def read_record(system: System, path: str) -> dict[bytes, bytes]:
    """Lines without "=", or with nothing after it, make no entry."""
    record: dict[bytes, bytes] = {}
    stream = InputStream(system, path)
    for line in stream.lines():
        key, _, value = line.partition(b"=")
        if value:
            record[key.strip(b" ")] = value.strip(b" ")
    stream.close()
    return record


# Rules: VER-02, VER-03, VER-14 to VER-17, VER-19 to VER-21
def application_version(system: System) -> bytes:
    """Every file is read before the first that describes an application is chosen."""
    found = [
        read_record(system, FOLDER + name) for name in system.list_folder(FOLDER)
        if ".inf" in FOLDER + name
    ]
    for record in found:
        if b"Application" in record.get(b"Type", b""):
            text = record.get(b"Version Number", b"")
            return text.split(b"_", 1)[-1]
    return b""


# Rules: VER-28 to VER-30
def extracted(component: bytes) -> int:
    """0 if there is no number; a number out of range becomes the limit."""
    match = NUMBER.match(component)
    if match is None:
        return 0
    digits = match[2].lstrip(b"0")
    magnitude = INT_MAX + 1 if len(digits) > 10 else int(digits or b"0")
    value = -magnitude if match[1] == b"-" else magnitude
    return max(INT_MIN, min(INT_MAX, value))


# Rules: VER-31 to VER-33
def format_component(component: bytes) -> bytes:
    """The remainder has the dividend's sign; a negative one takes eight digits."""
    value = extracted(component)
    remainder = value % 256 if value >= 0 else -(-value % 256)
    return b"%02x" % (remainder & 0xFFFFFFFF)


# Rules: VER-23 to VER-27, VER-34
def format_version(text: bytes) -> bytes:
    """A missing component repeats the one before it."""
    if text in (b"", b"N/A"):
        return b"000000"
    first = text.split(b".", 1)[0]
    text = text.split(b".", 1)[-1]
    second = text.split(b".", 1)[0]
    text = text.split(b".", 1)[-1]
    third = text.split(b"_", 1)[0]
    return b"".join(map(format_component, (first, second, third)))


def software_version(system: System) -> bytes:
    return format_version(application_version(system))
