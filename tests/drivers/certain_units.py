# SPDX-License-Identifier: Apache-2.0
"""Units that are not random: together they have every reason and every way in which an output comes about."""

from __future__ import annotations

from pathlib import Path

from model import configuration, parts

BOTH = ["-a", "-i"]


def _whole(root: Path) -> list[str]:
    """Nothing is missing; the wide switches of both blocks have no word."""
    parts.put_base(root)
    parts.put_product_files(root)
    parts.put_image(root, {22: 1, 36: 2, 50: 1, 134: 0xFFFF, 139: 5})
    parts.put_disk(root, serial=b"SER12345", area=bytes(range(1, 189)) * 10)
    parts.put_version(root, b"ABC_3.10.2")
    return BOTH


def _with_version(root: Path, number: bytes, kind: bytes = b"Application") -> list[str]:
    arguments = _whole(root)
    parts.put_version(root, number, kind)
    return arguments


def _without(root: Path, *paths: str) -> None:
    for path in paths:
        (root / path[1:]).unlink()


def _stock_files(root: Path) -> list[str]:
    arguments = _with_version(root, b"1.2")
    parts.put_image(root, {134: 3, 139: 60})
    parts.put_disk(root)
    _without(root, *parts.TEMPLATES[:3])
    return arguments


def _nothing(root: Path) -> list[str]:
    parts.put_base(root)
    return BOTH


def _empty_files(root: Path) -> list[str]:
    """iap2.cfg is generated, and its empty template makes iap1.cfg its stock file."""
    arguments = _with_version(root, b"1.2.3", b"Service")
    for path in (*parts.TEMPLATES, *parts.STOCK_FILES[:3], configuration.IMAGE):
        parts.put(root, path, b"")
    parts.put_disk(root, size=1)
    return arguments


def _folders_as_outputs(root: Path) -> list[str]:
    arguments = _whole(root)
    for path in parts.OUTPUTS[1:4]:
        parts.put_folder(root, path)
    parts.put(root, parts.STOCK_FILES[0], b"")
    _without(root, parts.TEMPLATES[0])
    return arguments


def _iap2_not_opened(root: Path) -> list[str]:
    arguments = _with_version(root, b"N/A")
    parts.put(root, configuration.IMAGE, bytes(100))
    parts.put_folder(root, parts.OUTPUTS[2])
    return arguments


def _disk_is_a_folder(root: Path) -> list[str]:
    arguments = _with_version(root, b"a.b.c")
    _without(root, "/dev/hd0")
    parts.put_folder(root, "/dev/hd0")
    return arguments


def _version_missing(root: Path) -> list[str]:
    return _with_version(root, b"")


def _version_out_of_range(root: Path) -> list[str]:
    return _with_version(root, b"1.2.300")


CERTAIN_UNITS = (_whole, _stock_files, _nothing, _empty_files, _folders_as_outputs, _iap2_not_opened,
                 _disk_is_a_folder, _version_missing, _version_out_of_range)
