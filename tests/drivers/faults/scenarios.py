# SPDX-License-Identifier: Apache-2.0
"""The runs in which every system call is made to fail once."""

from __future__ import annotations

from collections.abc import Callable
from dataclasses import dataclass
from pathlib import Path

from drivers import buffers
from model import parts


@dataclass(frozen=True)
class Scenario:
    name: str
    arguments: tuple[str, ...]
    make: Callable[[Path], None]


def _whole_unit(root: Path) -> None:
    """Nothing is missing, and outputs of an earlier run are there."""
    parts.put_base(root)
    parts.put_product_files(root)
    parts.put_image(root, {22: 1, 36: 2, 50: 1, 134: 3, 139: 5})
    parts.put_disk(root, serial=b"SER12345", area=bytes(range(1, 189)) * 10)
    parts.put_version(root, b"ABC_1.2.3", b"Service", "service.inf")
    # The last line has no end, so that it matters how reading it ended.
    parts.put(root, "/fs/rwdata/.Version/application.inf",
              b"Type=Application\nVersion Number=9.9.9\nVersion Number=ABC_3.10.2")
    for path in parts.OUTPUTS:
        parts.put(root, path, b"of an earlier run\n" * 900)


def _generated_profile(root: Path) -> None:
    _whole_unit(root)
    parts.put_image(root, {134: 0xFFFF, 139: 47})


def _without(root: Path, *paths: str) -> None:
    for path in paths:
        (root / path[1:]).unlink()


def _airplay_fallback(root: Path) -> None:
    _generated_profile(root)
    _without(root, "/fs/mp/etc/airplay_static.conf")
    parts.put(root, "/fs/mp/etc/airplay.conf", b"stock = 1\n" * 2000)


def _large_templates(root: Path) -> None:
    """Each takes three reads, so that reads and writes also fail behind the first."""
    _whole_unit(root)
    text = b"key = value without a last line end;" * (buffers.AROUND[-1] // 36)
    for path in parts.TEMPLATES:
        parts.put(root, path, text)


def _templates_missing(root: Path) -> None:
    _whole_unit(root)
    _without(root, "/fs/mp/etc/iap2_device_static.cfg", "/fs/mp/etc/mm/iap2_static.cfg")


def _empty_templates(root: Path) -> None:
    _whole_unit(root)
    for path in parts.TEMPLATES:
        parts.put(root, path, b"")


def _bare_unit(root: Path) -> None:
    """Outputs have to be created; nearly everything else falls back."""
    parts.put_base(root)
    parts.put(root, "/fs/mp/etc/mm/iap2.cfg", b"stock = 1\n")
    parts.put(root, "/fs/mp/etc/mm/iap1_static.cfg", b"key = 1\n")
    parts.put_folder(root, "/fs/rwdata/.Version/a.inf")


SCENARIOS = (
    Scenario("-a, plain profile", ("-a",), _whole_unit),
    Scenario("-a, generated profile", ("-a",), _generated_profile),
    Scenario("-a, falling back", ("-a",), _airplay_fallback),
    Scenario("-i, all generated", ("-i",), _whole_unit),
    Scenario("-i, templates missing", ("-i",), _templates_missing),
    Scenario("-i, empty templates", ("-i",), _empty_templates),
    Scenario("-ai, large templates", ("-ai",), _large_templates),
    Scenario("-xai, bare unit", ("-xai",), _bare_unit),
)

# Nothing fails here: what is read again must be opened again.
REPEATED = Scenario("-aiai, all again", ("-aiai",), _generated_profile)
