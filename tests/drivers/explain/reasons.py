# SPDX-License-Identifier: Apache-2.0
"""What orvane-unit must say about a run: how each output comes about, and from what.

Derived from the unit's files before the run, independently of the program. Changes nothing.
"""

from __future__ import annotations

from collections.abc import Sequence
from dataclasses import dataclass
from pathlib import Path

from drivers.explain.value_reasons import Codes, Line, Values, tuning_lines, values
from model import parts, tuning, writers
from model.streams import InputStream, OutputStream
from model.system import Library, System
from model.tree import Tree

# Every code, and whether it is intended: no fallback and no default is used.
CODES = {
    "generated": True, "profile-not-generated": True, "profile-unknown": False,
    "output-not-openable": False, "template-missing": False, "template-empty": False,
    "iap2-not-opened": False, "iap2-template-empty": False, "stock-missing": False,
    "stock-empty": False,
    "fixed-text": True, "from-template": True, "from-stock": True,
    "from-image": True, "image-missing": False, "image-not-mappable": False,
    "image-too-short": False, "model-unknown": False,
    "from-record": True, "serial-blank": False, "disk-missing": False, "disk-too-short": False,
    "disk-unreadable": False,
    "from-version-file": True, "version-folder-missing": False, "version-no-application": False,
    "version-number-missing": False, "version-not-available": False, "version-incomplete": False,
    "version-not-numeric": False, "version-out-of-range": False,
    "from-tuning-block": True, "word-unknown": False,
}


@dataclass(frozen=True)
class Stage:
    """One write of one output. `lines` are those with a value of the unit."""

    path: str
    outcome: str
    reasons: Codes
    lines: tuple[Line, ...] = ()


def _around(before: bytes, value: Line, after: bytes = b"\n") -> Line:
    return Line(before + value.text + after, value.reasons, value.key)


def _to_nul(value: Line) -> Line:
    return Line(value.text.split(b"\0", 1)[0], value.reasons, value.key)


def _copied(path: str, content: bytes, reason: str) -> Line:
    return Line(content, (reason,), b"file." + path.encode())


class Run:
    """The stages in the order of the run; a later one may read what an earlier one wrote."""

    def __init__(self, root: Path, names: Sequence[str]) -> None:
        self._system = System(Tree(root), (), Library())
        self._names = names
        self.stages: list[Stage] = []

    def _add(self, path: str, outcome: str, reasons: Codes, lines: tuple[Line, ...] = ()) -> None:
        self.stages.append(Stage(path, outcome, reasons, lines))

    def _tuning(self, path: str, block_id: int, asking: str) -> None:
        if asking:
            self._add(path, "not-asked", (asking,))
            return
        lines = tuning_lines(self._system, block_id)
        output = OutputStream(self._system, path)
        if output.failed:
            self._add(path, "kept", ("output-not-openable",))
            return
        output.write(b"; Genereated config from DPS (blockId %d)\n" % block_id)
        output.write(b"".join(line.text for line in lines))
        output.close()
        self._add(path, "generated", ("generated",), lines)

    def _stock(self, index: int, cause: str) -> None:
        """`cause` is why there is no generated file. It doesn't matter if nothing is written."""
        path, stock_path = parts.OUTPUTS[index], parts.STOCK_FILES[index]
        stock = InputStream(self._system, stock_path)
        output = OutputStream(self._system, path)
        content = stock.rest()[0]
        if output.failed:
            self._add(path, "kept", ("output-not-openable",))
        elif not content:
            self._add(path, "empty", (cause, "stock-missing" if stock.failed else "stock-empty"))
        else:
            output.write(content)
            self._add(path, "stock", (cause,), (_copied(stock_path, content, "from-stock"),))
        output.close()

    def _generated(self, index: int, output: OutputStream, template: InputStream, head: bytes,
                   tail: bytes, lines: tuple[Line, ...]) -> None:
        content = template.rest()[0]
        output.write(head)
        output.copy(template)
        output.write(tail)
        output.close()
        if content:
            reason = "generated"
            lines += (_copied(parts.TEMPLATES[index], content, "from-template"),)
        else:
            reason = "template-missing" if template.failed else "template-empty"
        self._add(parts.OUTPUTS[index], "generated", (reason,), lines)

    def airplay(self) -> None:
        found = values(self._system, self._names)
        asking = ""
        if not found.profile.text:
            asking = "profile-unknown"
        elif int(found.profile.text) != tuning.GENERATED_PROFILE:
            asking = "profile-not-generated"
        self._tuning(tuning.TELEPHONY, 3, asking)
        self._tuning(tuning.SPEECHREC, 2, asking)

        output = OutputStream(self._system, parts.OUTPUTS[0])
        template = InputStream(self._system, parts.TEMPLATES[0])
        if template.failed or output.failed:
            self._stock(0, "template-missing")
            return
        profile = found.profile
        head = writers.airplay_head(found.model.text, found.brand.text,
                                    int(profile.text) if profile.text else None,
                                    int(found.drive.text))
        self._generated(0, output, template, head, b"", (
            _around(b"model = ", found.model),
            _around(b"oemIconPath = /fs/mp/etc/", found.brand, b"/oemIcon.png\n"),
            _around(b"audioProfile = ", profile) if profile.text else profile,
            _around(b"rightHandDrive = ", found.drive)))

    def _iap_stage(self, index: int, cause: str, found: Values, firmware: Line, middle: bytes,
                   tail: bytes = b"") -> str:
        """Returns why the next stage must not be generated, for a stage that needs it. With a
        `cause` this stage is not generated; without one, that depends on its template."""
        asks_template = index != 3
        output = OutputStream(self._system, parts.OUTPUTS[index])
        template = InputStream(self._system, parts.TEMPLATES[index])
        if asks_template and template.failed:
            cause = "template-missing"
        if cause or output.failed:
            self._stock(index, cause)
        else:
            block = writers.Accessory(found.serial.text, found.model.text).block(firmware.text)
            self._generated(index, output, template, block + middle, tail, (
                _around(b"model=", _to_nul(found.model)),
                _around(b"serial=", _to_nul(found.serial)),
                _around(b"firmware_version=", _to_nul(firmware))))
            return "iap2-template-empty" if output.failed else ""
        return "iap2-not-opened" if output.failed else ""

    def iap(self) -> None:
        found = values(self._system, self._names)
        hardware = b"hardware_version=1.0.0\n\n"
        self._iap_stage(1, "", found, found.version_text, hardware, b"\n[vehicle]\nenable=no\n\n")
        cause = self._iap_stage(2, "", found, found.version_text, hardware)
        self._iap_stage(3, cause, found, found.version_digits,
                        b"hardware_version=010000\nrfcert=00000000 \n\n")


def stages(root: Path, letters: Sequence[str], names: Sequence[str]) -> list[Stage]:
    run = Run(root, names)
    for letter in letters:
        if letter == "a":
            run.airplay()
        else:
            run.iap()
    return run.stages


def is_intended(reasons: Sequence[str]) -> bool:
    return all(CODES[code] for code in reasons)
