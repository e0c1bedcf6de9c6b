# SPDX-License-Identifier: Apache-2.0
"""Changes the configuration image between two system calls of a run, and freely beside runs."""

from __future__ import annotations

import difflib
import itertools
import re
import signal
import tempfile
import threading
import time
from collections.abc import Callable
from dataclasses import dataclass
from pathlib import Path

from drivers import runner
from drivers.faults.scenarios import Scenario
from drivers.moments.call_stops import Tools, made_unit, run_with
from model import parts
from model.configuration import IMAGE
from model.prediction import predict

# Every value that is read differs. Of the profile's two bytes only one does, so that a profile that is read while the
# bytes change is one or the other.
FIRST = {22: 1, 36: 2, 50: 1, 134: 3, 139: 5}
SECOND = {22: 0, 36: 1, 50: 2, 134: 5, 139: 47}
# As SECOND, but asks for tuning.
TUNED = {**SECOND, 134: 0xFFFF}


def make_unit(root: Path, image: bytes) -> None:
    parts.put_base(root)
    parts.put_product_files(root)
    parts.put(root, IMAGE, image)
    parts.put_disk(root, serial=b"SER12345", area=bytes(range(1, 189)) * 10)
    parts.put_version(root, b"ABC_3.10.2", b"Application", "application.inf")


SCENARIO = Scenario("-ai, image changing", ("-ai",), lambda root: make_unit(root, parts.image(FIRST)))


@dataclass(frozen=True)
class Change:
    """A way to change the image into `image`: `action` is for a shell in which $image is its path, and $next that of
    another file with the new content. `may_end`: it ends a run that has mapped the image.
    """

    name: str
    action: str
    image: bytes
    may_end: bool = False


CHANGES = (
    Change("replaced", 'mv "$next" "$image"', parts.image(SECOND)),
    Change("replaced, asking for tuning", 'mv "$next" "$image"', parts.image(TUNED)),
    Change("rewritten", 'dd if="$next" of="$image" conv=notrunc status=none', parts.image(SECOND)),
    Change("emptied and rewritten", 'cat "$next" >"$image"', parts.image(SECOND)),
    Change("grown", 'truncate -s +8192 "$image"', parts.image(FIRST) + bytes(8192)),
    Change("removed", 'rm "$image"', b""),
    # What is cut off within a page is zero there.
    Change("cut within its page", 'truncate -s 30 "$image"', parts.image(FIRST)[:30]),
    Change("cut to nothing", 'truncate -s 0 "$image"', b"", may_end=True),
)


def texts_with(tools: runner.Tools, image: bytes) -> dict[str, bytes]:
    """What a run leaves in a unit with this image."""
    with tempfile.TemporaryDirectory(prefix="orvane moment-") as folder:
        root = Path(folder)
        make_unit(root, image)
        return dict(predict(root, list(SCENARIO.arguments), tools.names).alternatives[0].written)


def label(line: bytes) -> bytes:
    """What stays of a line when its value changes."""
    return line.split(b"= ")[0]


def either(first: bytes, second: bytes) -> re.Pattern[bytes]:
    """Matches a text each of whose lines is one of either text, at its place."""
    one, other = (text.splitlines(keepends=True) for text in (first, second))
    labels = [list(map(label, lines)) for lines in (one, other)]
    pattern = b""
    for kind, a, b, c, d in difflib.SequenceMatcher(None, *labels, autojunk=False).get_opcodes():
        if kind == "equal":
            pattern += b"".join(b"(?:%s|%s)" % (re.escape(x), re.escape(y)) for x, y in zip(one[a:b], other[c:d]))
        else:
            pattern += b"(?:%s|%s)" % tuple(re.escape(b"".join(lines)) for lines in (one[a:b], other[c:d]))
    return re.compile(pattern)


@dataclass(frozen=True)
class Allowed:
    """What a run may leave while the image changes from one to another."""

    patterns: dict[str, re.Pattern[bytes]]
    sometimes: frozenset[str]  # outputs that only one of the images asks for

    @staticmethod
    def between(tools: runner.Tools, first: bytes, second: bytes) -> Allowed:
        texts = [texts_with(tools, image) for image in (first, second)]
        paths = texts[0].keys() | texts[1].keys()
        alone = texts[0].keys() ^ texts[1].keys()
        patterns = {path: either(*(text.get(path, texts[i - 1].get(path, b"")) for i, text in enumerate(texts)))
                    for path in paths}
        return Allowed(patterns, frozenset(alone))

    def faults(self, root: Path, is_whole: bool = True) -> list[str]:
        """`is_whole`: whether the run came to its end. If not, outputs may be missing: a run reads all values before it
        opens the output that they are for.
        """
        lines = []
        for path, pattern in sorted(self.patterns.items()):
            file = root / path[1:]
            if not file.exists():
                if is_whole and path not in self.sometimes:
                    lines.append(f"{path}: missing")
            elif not pattern.fullmatch(file.read_bytes()):
                lines.append(f"{path}: {file.read_bytes()[:400]!r}")
        return lines + [f"{path}: not expected" for path in parts.OUTPUTS
                        if path not in self.patterns and (root / path[1:]).exists()]


@dataclass(frozen=True)
class Moment:
    """A change of the image right before a call."""

    change: Change
    number: int
    allowed: Allowed
    tools: Tools

    def __str__(self) -> str:
        return f"image {self.change.name} before call {self.number}"


def check(moment: Moment) -> tuple[Moment, list[str], bool]:
    """No lines when the run leaves what it may; and whether the change ended it."""
    with made_unit(SCENARIO) as root:
        image, other = parts.real(root, IMAGE), root.with_name("next image")
        other.write_bytes(moment.change.image)
        action = f"image='{image}' next='{other}'; {moment.change.action}"
        result, calls = run_with(moment.tools, SCENARIO, root, moment.number, action)
        is_ended = moment.change.may_end and result.status == 128 + signal.SIGBUS
        lines = moment.allowed.faults(root, not is_ended)
    if calls < moment.number:
        lines.append(f"only {calls} calls")
    if not is_ended and (result.status, result.stdout, result.stderr) != (0, b"", b""):
        lines.append(f"status {result.status}, {result.stdout!r}, {result.stderr!r}")
    return moment, lines, is_ended


class FreePublisher:
    """Publishes two images in turn, in every way that takes nothing away, as fast as it can."""

    def __init__(self, root: Path) -> None:
        self._image = Path(parts.real(root, IMAGE))
        self._next = root.with_name("next image")
        self._is_done = threading.Event()
        self._thread = threading.Thread(target=self._publish)
        self.published = 0

    def __enter__(self) -> FreePublisher:
        self._thread.start()
        return self

    def __exit__(self, *unused: object) -> None:
        self._is_done.set()
        self._thread.join()

    def _replace(self, image: bytes) -> None:
        beside = self._next
        beside.write_bytes(image)
        beside.rename(self._image)

    def _rewrite(self, image: bytes) -> None:
        with self._image.open("r+b") as file:
            file.write(image)

    def _grow(self, image: bytes) -> None:
        with self._image.open("r+b") as file:
            file.write(image + bytes(8192))

    def _shrink(self, image: bytes) -> None:
        """To its own size: no byte that is read goes."""
        with self._image.open("r+b") as file:
            file.truncate(len(image))
            file.write(image)

    def _publish(self) -> None:
        ways: tuple[Callable[[bytes], None], ...] = (self._replace, self._rewrite, self._grow, self._shrink)
        images = itertools.cycle([parts.image(FIRST), parts.image(SECOND)])
        for way, image in zip(itertools.cycle((*ways, self._replace)), images):
            if self._is_done.is_set():
                return
            way(image)
            self.published += 1


def run_beside(tools: runner.Tools, seconds: float) -> tuple[int, int, list[str]]:
    """Runs for so long beside a publisher, and until two runs left different files: how many runs, how many images,
    and what was wrong.
    """
    allowed = Allowed.between(tools, parts.image(FIRST), parts.image(SECOND))
    runs, lines, seen = 0, [], set()
    with made_unit(SCENARIO) as root:
        with FreePublisher(root) as publisher:
            begin = time.monotonic()
            while not lines and (len(seen) < 2 or time.monotonic() < begin + seconds):
                result = runner.run(tools.command(root, SCENARIO.arguments), root)
                runs += 1
                seen.add((root / "tmp/airplay.conf").read_bytes())
                if (result.status, result.stdout, result.stderr) != (0, b"", b""):
                    lines.append(f"status {result.status}, {result.stdout!r}, {result.stderr!r}")
                lines += allowed.faults(root)
                if len(seen) < 2 and time.monotonic() > begin + seconds + runner.TIME_LIMIT:
                    lines.append("no run saw that the image changed")
    return runs, publisher.published, lines
