# SPDX-License-Identifier: Apache-2.0
"""How a run grows with its inputs: templates, version files, one long version file."""

from __future__ import annotations

import contextlib
import shutil
from collections.abc import Iterator
from pathlib import Path

from measure import Timing, interleave
from report import Table, bytes_text, time_text

TEMPLATE = "fs/mp/etc/airplay_static.conf"
VERSIONS = "fs/rwdata/.Version"

TEMPLATE_SIZES = tuple(4096 << (4 * step) for step in range(5))
VERSION_COUNTS = (3, 30, 300, 3000, 10000)
LONG_FILE_SIZES = (1 << 20, 1 << 23, 1 << 26)

# The content of large templates: bytes that no program may treat as text.
PATTERN = bytes(range(256)) * 16

NANOSECONDS = 1e9


# The speed of copying a large file varies by 20 % and more with the place of its pages in memory, so
# the file is rewritten this many times.
PLACES = 7


def runs_for(size: int) -> int:
    """More runs if they are short."""
    return max(5, min(40, (1 << 27) // size))


@contextlib.contextmanager
def with_template(root: Path, size: int) -> Iterator[None]:
    kept = (root / TEMPLATE).read_bytes()
    with (root / TEMPLATE).open("wb") as file:
        for _ in range(size // len(PATTERN)):
            file.write(PATTERN)
    yield
    (root / TEMPLATE).write_bytes(kept)
    (root / "tmp/copy").unlink(missing_ok=True)


def beside_cat(root: Path, size: int, own_tmp: bool) -> tuple[Timing, Timing]:
    tool, cat = Timing((), 0), Timing((), 0)
    for _ in range(PLACES):
        with with_template(root, size):
            timings = interleave(root, ("/bin/static -a", f"/bin/cat /{TEMPLATE} > /tmp/copy"),
                                 runs_for(size), warm_up=2, own_tmp=own_tmp)
        tool, cat = tool.followed_by(timings[0]), cat.followed_by(timings[1])
    return tool, cat


def templates(root: Path) -> Table:
    """`orvane -a` with a template, compared with `cat` of the same bytes."""
    table = Table("template", "`orvane -a`", "`cat`", "throughput, orvane to cat", "MiB/s",
                  "the same in one file system")
    for size in TEMPLATE_SIZES:
        tool, cat = beside_cat(root, size, own_tmp=True)
        tool_in_one, cat_in_one = beside_cat(root, size, own_tmp=False)
        table.add(bytes_text(size), time_text(tool.median), time_text(cat.median),
                  f"{cat.ratio(tool):.2f}", f"{size / 2**20 / tool.median * NANOSECONDS:.0f}",
                  f"{cat_in_one.ratio(tool_in_one):.2f}")
    return table


def version_files(root: Path) -> Table:
    """`orvane -i` reads every version file twice, as the floor does."""
    table = Table("version files", "`orvane -i`", "floor", "to the floor", "each further file")
    folder = root / VERSIONS
    away = root / "versions-away"
    folder.rename(away)
    before: tuple[int, float] | None = None
    for count in VERSION_COUNTS:
        folder.mkdir()
        for number in range(count - 1):
            (folder / f"package{number}.inf").write_text(
                f"Name = package {number}\nType = Maps\nVersion Number = P_{number}.2.3\n")
        (folder / "application.inf").write_text(
            "Name = head unit application\nType = Application\nVersion Number = A_3.10.2\n")
        tool, floor = interleave(root, ("/bin/static -i", "/bin/floor -i"), 31)
        time = tool.median
        further = "" if before is None else time_text((time - before[1]) / (count - before[0]))
        table.add(f"{count:,}", time_text(time), time_text(floor.median),
                  f"{tool.ratio(floor):.2f}", further)
        before = (count, time)
        shutil.rmtree(folder)
    away.rename(folder)
    return table


def long_version_file(root: Path) -> Table:
    """One long version file, in short lines and in a single line."""
    table = Table("one version file", "in short lines", "each byte", "in one line", "each byte")
    line = b"Release Notes = the same key, again and again, so that each line replaces the last\n"
    file = root / VERSIONS / "notes.inf"
    for size in LONG_FILE_SIZES:
        cells = [bytes_text(size)]
        for content in (line * (size // len(line)), line[:16] + b"x" * (size - 17) + b"\n"):
            file.write_bytes(content)
            time = interleave(root, ("/bin/static -i",), 7, warm_up=1)[0].median
            cells += [time_text(time), f"{time / len(content):.2f} ns"]
        table.add(*cells)
    file.unlink()
    return table
