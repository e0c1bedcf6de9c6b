# SPDX-License-Identifier: Apache-2.0
"""Random units: half of them ordinary, the others odd in most places."""

from __future__ import annotations

import random
from pathlib import Path

from drivers import buffers, odd_text
from model import configuration, parts, records
from model.tree import Tree

IMAGE_SIZES = (0, 1, 21, 22, 35, 36, 100, 133, 134, 135, 138, 139, 140, 178, 179, 180, 4096, 5000)

# The disk sizes from which the serial, and then the tuning area, fit.
SERIAL_FITS = records.RECORD_AREA - records.SERIAL_OFFSET
DISK_SIZES = (
    0, 1, records.TUNING_AREA - 1, records.TUNING_AREA, records.TUNING_AREA + 1,
    SERIAL_FITS - 1, SERIAL_FITS, SERIAL_FITS + 1, records.RECORD_AREA - 1, records.RECORD_AREA,
    records.RECORD_AREA + 1, 2 * records.RECORD_AREA, 5 * 2**30,
)

TEXT_SIZES = (1, 40, 700, 4_095, 4_096, 8_000, 8_191, 8_192, 16_384, 70_000)

# How many of the product files take several reads, and how many of those are of the longest.
LONG_SHARE = 0.01
LONGEST_SHARE = 0.05

# After the tenth block are only bytes that the tool doesn't read.
AREA_SIZE = records.DPS_AREA_SIZE + 20


def _image(root: Path, rng: random.Random, ordinary: bool) -> None:
    if not ordinary:
        kind = rng.random()
        if kind < 0.1:
            return
        if kind < 0.2:
            parts.put_folder(root, configuration.IMAGE)
            return
    image = bytearray(parts.image({
        22: rng.choice((0, 1, 2, 255, rng.randrange(256))),
        36: rng.choice((0, 1, 2, 2, 3, 255)),
        50: rng.randrange(5),
        134: rng.choice((0, 1, 3, 255, 256, 0x1234, 0xFF00, 0xFFFE, *[0xFFFF] * 7)),
        139: rng.choice((0, 1, 32, 46, 47, 48, 255, rng.randrange(1, 48), rng.randrange(256))),
    }))
    if rng.random() < 0.3:
        image = bytearray(0xA5 if byte == 0 else byte for byte in image)
    if not ordinary and rng.random() < 0.6:
        size = rng.choice(IMAGE_SIZES)
        image = image[:size].ljust(size, b"\x5a")
    parts.put(root, configuration.IMAGE, bytes(image))


def _serial(rng: random.Random) -> bytes:
    kind = rng.randrange(6)
    if kind == 0:
        return rng.randbytes(8)
    if kind == 1:
        return b"".join(rng.choice((b"A", b"\0", b"\n", b"=", b" ", b"\xff")) for _ in range(8))
    text = b"%08d" % rng.randrange(10**8)
    return text[:rng.randrange(9)] if kind == 2 else text


def _tuning_area(rng: random.Random) -> bytes:
    kind = rng.randrange(6)
    if kind == 0:
        return b""
    if kind == 1:
        return b"\xff" * AREA_SIZE
    if kind == 2:  # codes that have words, in the wide switches too
        return b"".join(rng.choice((b"\x01", b"\x02", b"\x03", b"\x00", b"\x1b", b"\xe4"))
                        for _ in range(AREA_SIZE))
    if kind == 3:
        return b"".join(rng.choice((b"\x00\x80", b"\xff\x7f", b"\xff\xff", b"\x01\x00"))
                        for _ in range(AREA_SIZE // 2))
    return rng.randbytes(AREA_SIZE)


def _disk(root: Path, rng: random.Random, ordinary: bool) -> None:
    size = 2 * records.RECORD_AREA
    if not ordinary:
        kind = rng.random()
        if kind < 0.1:
            return
        if kind < 0.15:
            parts.put_folder(root, "/dev/hd0")
            return
        if kind < 0.75:
            size = rng.choice(DISK_SIZES)
    if rng.random() < 0.05:
        parts.put_disk(root, size, _serial(rng), _tuning_area(rng), "/dev/disk0")
        parts.put_link(root, "/dev/hd0", rng.choice(("disk0", "/dev/disk0")))
    else:
        parts.put_disk(root, size, _serial(rng), _tuning_area(rng))


def _version_files(root: Path, rng: random.Random, ordinary: bool) -> None:
    folder = "/fs/rwdata/.Version"
    if rng.random() < 0.1:
        if rng.random() < 0.3:
            parts.put(root, folder, b"no folder")
        return
    parts.put_folder(root, folder)
    if rng.random() < 0.005:  # too many for one call to list
        for number in range(300):
            kind = rng.choice((b"Map", b"Map", b"Application"))
            parts.put_version(root, b"1.2.%d" % number, kind, f"{number}{'x' * 120}.inf")
    for name in dict.fromkeys(odd_text.entry_name(rng) for _ in range(rng.randrange(7))):
        path = f"{folder}/{name}"
        kind = rng.random()
        if ordinary or kind < 0.8:
            parts.put(root, path, odd_text.description(rng, ordinary or rng.random() < 0.3))
        elif kind < 0.85:
            parts.put_folder(root, path)
        elif kind < 0.9:
            parts.put_link(root, path, rng.choice(("nowhere", "/fs/none/at/all", name)))
        elif kind < 0.95:
            parts.put(root, "/fs/rwdata/elsewhere", odd_text.description(rng, True))
            parts.put_link(root, path, rng.choice(("../elsewhere", "/fs/rwdata/elsewhere")))
        else:
            parts.put(root, path, b"")


def _text(rng: random.Random, size: int) -> bytes:
    kind = rng.random()
    if kind < 0.2:
        return rng.randbytes(size)
    line = b"%d = value of a key\n" % rng.randrange(1000)
    text = (line * (size // len(line) + 1))[:size]
    return text if kind < 0.6 else text[:-1] + b"\n"


def _product_size(rng: random.Random) -> int:
    if rng.random() < LONG_SHARE:
        longest = rng.random() < LONGEST_SHARE
        return buffers.LONGEST if longest else rng.choice(buffers.AROUND)
    return rng.choice(TEXT_SIZES[:3] if rng.random() < 0.6 else TEXT_SIZES)


def _product_file(root: Path, rng: random.Random, path: str, ordinary: bool) -> None:
    text = _text(rng, _product_size(rng))
    kind = 1.0 if ordinary and rng.random() < 0.97 else rng.random()
    if kind < 0.2:
        return
    if kind < 0.3:
        parts.put(root, path, b"")
    elif kind < 0.35:
        parts.put_folder(root, path)
    elif kind < 0.4:
        parts.put_link(root, path, rng.choice((path, "nowhere", "/fs/none/at/all")))
    elif kind < 0.45:
        parts.put(root, path + ".real", text)
        name = path.rsplit("/", 1)[1] + ".real"
        parts.put_link(root, path, rng.choice((name, path + ".real", f"./../etc/../{name}")))
    else:
        parts.put(root, path, text)


def _output(root: Path, rng: random.Random, path: str, ordinary: bool) -> None:
    """What is at an output's path: mostly nothing, or an earlier run's file."""
    kind = rng.random() * (0.5 if ordinary else 1.0)
    if kind < 0.3:
        return
    if kind < 0.45:
        parts.put(root, path, _text(rng, rng.choice((0, 1, 300, 100_000))))
    elif kind < 0.5:
        parts.put(root, "/fs/rwdata/kept" + path[4:], _text(rng, rng.choice((0, 9000))))
        parts.put_link(root, path, rng.choice(("..", "")) + "/fs/rwdata/kept" + path[4:])
    elif kind < 0.65:
        return
    elif kind < 0.75:
        parts.put_folder(root, path)
    elif kind < 0.8:
        parts.put_link(root, path, rng.choice(("/none/at/all", path, "none/file", path + "/x")))
    elif kind < 0.9:
        parts.put_link(root, path, rng.choice(("fresh", "/fs/rwdata/fresh", "../fresh")))
    else:
        parts.put_link(root, path, _other_place(root, rng, path))


def _other_place(root: Path, rng: random.Random, path: str) -> str:
    """Another output, a stock file, or the template of another output.

    Not the output's own template: whether a stream reads bytes that another still buffers depends
    on the size of buffers.
    """
    own = parts.OUTPUTS.index(path)
    templates = [other for index, other in enumerate(parts.TEMPLATES) if index != own]
    return rng.choice([*parts.OUTPUTS, *parts.STOCK_FILES, *templates])


def _part_outputs_from_their_templates(root: Path) -> None:
    """Links may lead an output to its own template through other links."""
    tree = Tree(root)
    for output, template in zip(parts.OUTPUTS, parts.TEMPLATES):
        place = tree.resolve(output)
        if place is not None and place == tree.resolve(template):
            (root / output[1:]).unlink()


def make_unit(root: Path, rng: random.Random) -> list[str]:
    """Fills `root` and returns the arguments of the run."""
    ordinary = rng.random() < 0.5
    parts.put_base(root)
    _image(root, rng, ordinary)
    _disk(root, rng, ordinary and rng.random() < 0.8)
    _version_files(root, rng, ordinary)
    for path in (*parts.TEMPLATES, *parts.STOCK_FILES):
        _product_file(root, rng, path, ordinary)
    if not ordinary and rng.random() < 0.06:
        (root / "tmp").rmdir()
        if rng.random() < 0.4:
            parts.put(root, "/tmp", b"no folder")
        elif rng.random() < 0.5:
            parts.put_folder(root, "/fs/tmpfs/tmp")
            parts.put_link(root, "/tmp", "fs/tmpfs/tmp")
    else:
        for path in parts.OUTPUTS:
            _output(root, rng, path, ordinary)
        _part_outputs_from_their_templates(root)
    return odd_text.arguments(rng, ordinary)
