# SPDX-License-Identifier: Apache-2.0
"""What a unit is made of: an image, a disk, version files, product files."""

from __future__ import annotations

import os
from collections.abc import Mapping
from pathlib import Path

from model import configuration, records

IMAGE_SIZE = configuration.offset(configuration.PARAMETER_COUNT) + 1

TEMPLATES = (
    "/fs/mp/etc/airplay_static.conf",
    "/fs/mp/etc/iap2_device_static.cfg",
    "/fs/mp/etc/mm/iap2_static.cfg",
    "/fs/mp/etc/mm/iap1_static.cfg",
)
STOCK_FILES = (
    "/fs/mp/etc/airplay.conf",
    "/fs/mp/etc/iap2_device.cfg",
    "/fs/mp/etc/mm/iap2.cfg",
    "/fs/mp/etc/mm/iap1.cfg",
)
OUTPUTS = (
    "/tmp/airplay.conf",
    "/tmp/iap2_device.cfg",
    "/tmp/iap2.cfg",
    "/tmp/iap1.cfg",
    "/tmp/telephony_FFFF.txt",
    "/tmp/speechrec_FFFF.txt",
)


def real(root: Path, path: str) -> str:
    return os.fspath(root) + path


def _room(root: Path, path: str) -> str:
    place = real(root, path)
    os.makedirs(os.path.dirname(place), exist_ok=True)
    return place


def put(root: Path, path: str, content: bytes) -> None:
    with open(_room(root, path), "wb") as file:
        file.write(content)


def put_link(root: Path, path: str, target: str) -> None:
    os.symlink(target, _room(root, path))


def put_folder(root: Path, path: str) -> None:
    os.makedirs(real(root, path), exist_ok=True)


def image(values: Mapping[int, int] | None = None) -> bytes:
    """A full image: zeros except for the given parameters."""
    content = bytearray(IMAGE_SIZE)
    for number, value in (values or {}).items():
        start, size = configuration.offset(number), configuration.width(number)
        content[start:start + size] = value.to_bytes(size, "little")
    return bytes(content)


def put_image(root: Path, values: Mapping[int, int] | None = None) -> None:
    put(root, configuration.IMAGE, image(values))


def put_disk(root: Path, size: int = 2 * records.RECORD_AREA, serial: bytes = b"",
             area: bytes = b"", path: str = "/dev/hd0") -> None:
    """A disk that is a hole except for the serial and the tuning area, if they fit."""
    with open(_room(root, path), "wb") as file:
        file.truncate(size)
        serial_start = size - records.RECORD_AREA + records.SERIAL_OFFSET
        for start, content in ((serial_start, serial), (size - records.TUNING_AREA, area)):
            if start >= 0 and content:
                file.seek(start)
                file.write(content[:size - start])


def put_version(root: Path, number: bytes, kind: bytes = b"Application",
                name: str = "application.inf") -> None:
    put(root, f"/fs/rwdata/.Version/{name}",
        b"Type=" + kind + b"\nVersion Number=" + number + b"\n")


def put_product_files(root: Path) -> None:
    """Every template and stock file, each with its own text."""
    for path in (*TEMPLATES, *STOCK_FILES):
        put(root, path, b"# " + path.encode("ascii") + b"\nkey = value\n")


def put_base(root: Path) -> None:
    """The folders that every unit has, /tmp among them."""
    for path in ("/dev", "/fs/tmpfs", "/fs/rwdata", "/fs/mp/etc/mm", "/tmp"):
        put_folder(root, path)
