# SPDX-License-Identifier: Apache-2.0
"""Random units in which anything may stand at any path that a run opens."""

from __future__ import annotations

import os
import random
import stat
from collections.abc import Callable
from pathlib import Path

from drivers import odd_text
from drivers.hostile import namespace
from drivers.unit_tool import MARKER, MARKER_TEXT
from model import configuration, parts, records

VERSIONS = "/fs/rwdata/.Version"

# Beside the unit: the working directory of all commands, which none of them may change.
OUTSIDE = "outside"
CANARIES = ("canary", *(os.path.basename(path) for path in parts.OUTPUTS))

FOLDERS = ("/fs", "/fs/tmpfs", "/fs/mp", "/fs/mp/etc", "/fs/mp/etc/mm", "/fs/rwdata", VERSIONS, "/dev", "/tmp")
FILES = (configuration.IMAGE, "/dev/hd0", *parts.TEMPLATES, *parts.STOCK_FILES, *parts.OUTPUTS)
DEVICES = ("/dev/null", "/dev/zero", "/dev/full")

NAMES = (
    b"a.inf", b"app.info", b"\x1b[31mred.inf", b"line\nline.inf", b"\xc2\x9b31m.inf", b"\xe2\x80\xae.inf",
    b"\xff\xfe.inf", b"\x7f.inf", b"'\"\\.inf", b"\tx.inf", b"x" * 250 + b".inf", b"-a.inf", b" .inf",
    "\u540d.inf".encode(), b"hex:.inf", b"%s%n.inf", b"README", b".inf", b"\xed\xa0\x80.inf",
)
SIZES = (0, 1, 7, 133, 134, 139, 140, 178, 179, 180, 4095, 4096, 8192, 70_000, records.RECORD_AREA - 1,
         records.RECORD_AREA, 2 * records.RECORD_AREA, 2**31, 2**32, 2**32 + 1, 2**40)
SERIALS = (b"SN004217", b"HU-2104\0", b"AB\0CDEFG", b"  SN42  ", b"AAAA\0\0\0\0", b"ABABABAB", b"XXXXXXXX",
           b"\0SECRET!", b"app.inf\0", b"Applicat", b"\x1b]0;x\x07\xff", b"........", b"XXAXXAXX")


def outside_of(root: Path) -> Path:
    return root.parent / OUTSIDE


def _ways_out(root: Path) -> tuple[str, ...]:
    """Targets of links that lead to a canary for a process that is not confined to the unit."""
    outside = os.fspath(outside_of(root))
    canaries = [f"{outside}/{name}" for name in CANARIES[:2]]
    return (*canaries, *("/.." * 30 + path for path in canaries), *("../" * 30 + path[1:] for path in canaries),
            "/proc/self/cwd/canary", "/proc/self/cwd/airplay.conf", f"/proc/1/root{canaries[0]}",
            f"/proc/self/root{canaries[1]}", "/proc/self/fd/3/canary", outside, "/proc/self/cwd")


def _targets(root: Path) -> tuple[str, ...]:
    return (*_ways_out(root), *FILES, *FOLDERS, "nowhere", "/none/at/all", "..", "/", ".", "../.." + "/.." * 50,
            "/tmp/fresh", "fresh", "x" * 300, "/tmp/\x1b[2J\n")


def _content(rng: random.Random, serial: bytes) -> bytes:
    kind = rng.random()
    if kind < 0.3:
        return rng.randbytes(rng.choice((1, 40, 200, 5000)))
    if kind < 0.6:
        return b"key = \xe2\x80\xae\xc2\x9b\x1b[1m\x07 " + serial + b"\r\nlast\x7f"
    return odd_text.description(rng, False)


def _put_chain(root: Path, place: Path, rng: random.Random) -> None:
    """Links one after the other, about as many as a path may have."""
    count = rng.choice((39, 40, 41, 60))
    folder = root / "chain"
    folder.mkdir(exist_ok=True)
    start = len(os.listdir(folder))
    for number in range(start, start + count):
        os.symlink(f"/chain/{number + 1}", folder / str(number))
    (folder / str(start + count)).write_bytes(b"end of a chain\n")
    os.symlink(f"/chain/{start}", place)


def _put_odd(root: Path, place: Path, rng: random.Random, serial: bytes) -> None:
    """Puts anything at `place`, which is free."""
    def sparse() -> None:
        place.write_bytes(_content(rng, serial))
        os.truncate(place, rng.choice(SIZES))

    def hard_link() -> None:
        places = [root / path[1:] for path in FILES]
        others = [other for other in places if is_own_folder(root, other.parent) and _is_file(other)]
        if others:
            os.link(rng.choice(others), place)

    choices: tuple[Callable[[], object], ...] = (
        lambda: None,
        place.mkdir,
        lambda: place.write_bytes(b""),
        lambda: place.write_bytes(_content(rng, serial)),
        sparse,
        lambda: os.mkfifo(place),
        lambda: os.mknod(place, stat.S_IFSOCK | 0o600),
        lambda: namespace.put_device(rng.choice(DEVICES), place),
        lambda: os.symlink(rng.choice(_targets(root)), place),
        lambda: os.symlink(rng.choice(_ways_out(root)), place),
        lambda: os.symlink(place.name, place),
        lambda: _put_chain(root, place, rng),
        hard_link,
    )
    rng.choice(choices)()
    if rng.random() < 0.2 and not place.is_symlink() and place.exists() and not _is_device(place):
        os.chmod(place, rng.choice((0, 0o111, 0o222, 0o444, 0o4755, 0o777)))


def _is_file(place: Path) -> bool:
    return not place.is_symlink() and place.is_file()


def is_own_folder(root: Path, place: Path) -> bool:
    """Whether it is a folder in the unit, and no link leads there: what is put in it stays in the unit."""
    own = Path(os.path.realpath(root)) / place.relative_to(root)
    try:
        return Path(os.path.realpath(place)) == own and place.is_dir()
    except OSError:  # nobody gets past a folder above it
        return False


def _is_device(place: Path) -> bool:
    return place.is_char_device()


def _serial(rng: random.Random) -> bytes:
    return rng.choice(SERIALS) if rng.random() < 0.7 else rng.randbytes(8)


def _put_ordinary(root: Path, path: str, rng: random.Random, serial: bytes) -> None:
    if path == configuration.IMAGE:
        parts.put_image(root, {22: 1, 36: 2, 134: rng.choice((3, 0xFFFF)), 139: rng.randrange(50)})
    elif path == "/dev/hd0":
        parts.put_disk(root, 2 * records.RECORD_AREA, serial, rng.randbytes(records.DPS_AREA_SIZE))
    elif path in parts.TEMPLATES or path in parts.STOCK_FILES:
        parts.put(root, path, b"# " + path.encode() + b"\n")


def _put_version_files(root: Path, rng: random.Random, serial: bytes) -> None:
    folder = root / VERSIONS[1:]
    if not is_own_folder(root, folder):
        return
    parts.put_version(root, odd_text.version_text(rng), name="0.inf")
    for name in rng.sample([*NAMES, serial.replace(b"\0", b"").replace(b"/", b"") + b".inf"], rng.randrange(5)):
        place = Path(os.fsdecode(os.fsencode(folder) + b"/" + name))
        if not os.path.lexists(place):
            _put_odd(root, place, rng, serial)


def make_hostile_unit(root: Path, rng: random.Random) -> list[str]:
    """Returns the options of the run. What stands at a path is ordinary in most places of most units."""
    outside = outside_of(root)
    outside.mkdir(exist_ok=True)
    for name in CANARIES:
        (outside / name).write_bytes(b"nobody may write here\n")
    oddness = rng.choice((0.02, 0.1, 0.1, 0.3))
    serial = _serial(rng)
    for path in FOLDERS:
        place = root / path[1:]
        if not is_own_folder(root, place.parent) or os.path.lexists(place):
            continue
        if rng.random() < oddness / 8:
            _put_odd(root, place, rng, serial)
        else:
            place.mkdir()
    for path in FILES:
        place = root / path[1:]
        if not is_own_folder(root, place.parent) or os.path.lexists(place):
            continue
        if rng.random() < oddness:
            _put_odd(root, place, rng, serial)
        else:
            _put_ordinary(root, path, rng, serial)
    _put_version_files(root, rng, serial)
    if rng.random() < oddness:
        name = rng.choice(NAMES)
        place = Path(os.fsdecode(os.fsencode(root / rng.choice(("", "tmp"))) + b"/" + name))
        if is_own_folder(root, place.parent) and not os.path.lexists(place):
            _put_odd(root, place, rng, serial)
    if rng.random() < 0.05:
        _put_odd(root, root / MARKER, rng, serial)
    else:
        (root / MARKER).write_bytes(MARKER_TEXT)
    return ["-a", "-i"]
