# SPDX-License-Identifier: Apache-2.0
"""The reason codes of units with faults made by hand."""

from __future__ import annotations

import unittest

from drivers.explain.reasons import CODES, Stage, is_intended, stages
from drivers.explain.value_reasons import Codes, version_digits_reasons
from model import parts
from model.configuration import IMAGE
from model.unit_case import NAMES, STATIC, STOCK, UnitCase
from model.tuning import SPEECHREC, TELEPHONY

AIRPLAY, DEVICE, IAP2, IAP1 = parts.OUTPUTS[:4]
VERSIONS = "/fs/rwdata/.Version/"


class ReasonCase(UnitCase):
    def stages(self, letters: str) -> dict[str, Stage]:
        return {stage.path: stage for stage in stages(self.root, letters, NAMES)}

    def outcomes(self, letters: str) -> dict[str, tuple[str, Codes]]:
        return {path: (stage.outcome, stage.reasons)
                for path, stage in self.stages(letters).items()}

    def codes(self, path: str, key: str) -> Codes:
        """The codes of the only line with this key."""
        stage = self.stages("a" if path in (AIRPLAY, TELEPHONY, SPEECHREC) else "i")[path]
        (line,) = (line for line in stage.lines if line.key == key.encode())
        return line.reasons


class Outputs(ReasonCase):
    def test_order(self) -> None:
        self.assertEqual([stage.path for stage in stages(self.root, "aia", NAMES)],
                         [TELEPHONY, SPEECHREC, AIRPLAY, DEVICE, IAP2, IAP1,
                          TELEPHONY, SPEECHREC, AIRPLAY])
        self.assertEqual(stages(self.root, "", NAMES), [])

    def test_generated(self) -> None:
        parts.put_image(self.root, {134: 0xFFFF})
        self.assertEqual(set(self.outcomes("ai").values()), {("generated", ("generated",))})
        self.assertEqual([line.key for line in self.stages("ai")[AIRPLAY].lines],
                         [b"param.139", b"param.36", b"param.134", b"param.22",
                          b"file./fs/mp/etc/airplay_static.conf"])
        self.assertEqual([line.key for line in self.stages("i")[IAP1].lines],
                         [b"param.139", b"slot.9", b"file." + VERSIONS.encode(),
                          b"file./fs/mp/etc/mm/iap1_static.cfg"])

    def test_tuning_not_asked(self) -> None:
        for values, code in ((None, "profile-unknown"), ({134: 3}, "profile-not-generated"),
                             ({134: 0xFFFE}, "profile-not-generated")):
            if values is not None:
                parts.put_image(self.root, values)
            for path in (TELEPHONY, SPEECHREC):
                self.assertEqual(self.outcomes("a")[path], ("not-asked", (code,)))

    def test_fallback(self) -> None:
        for index in range(3):
            path = parts.OUTPUTS[index]
            self.remove(STATIC[index])
            self.assertEqual(self.outcomes("ai")[path], ("stock", ("template-missing",)))
            parts.put(self.root, STOCK[index], b"")
            self.assertEqual(self.outcomes("ai")[path],
                             ("empty", ("template-missing", "stock-empty")))
            self.remove(STOCK[index])
            self.assertEqual(self.outcomes("ai")[path],
                             ("empty", ("template-missing", "stock-missing")))
            parts.put_folder(self.root, path)
            self.assertEqual(self.outcomes("ai")[path], ("kept", ("output-not-openable",)))

    def test_empty_template(self) -> None:
        for index in (0, 1, 3):
            parts.put(self.root, STATIC[index], b"")
            self.assertEqual(self.outcomes("ai")[parts.OUTPUTS[index]],
                             ("generated", ("template-empty",)))

    def test_iap1_depends_on_iap2(self) -> None:
        self.remove(STATIC[3])
        self.assertEqual(self.outcomes("i")[IAP1], ("generated", ("template-missing",)))
        self.remove(STATIC[2])  # the stock file of iap2 doesn't matter to iap1
        self.assertEqual(self.outcomes("i")[IAP1], ("generated", ("template-missing",)))
        parts.put(self.root, STATIC[2], b"")
        self.assertEqual(self.outcomes("i")[IAP1], ("stock", ("iap2-template-empty",)))
        parts.put_folder(self.root, IAP2)
        self.assertEqual(self.outcomes("i")[IAP1], ("stock", ("iap2-not-opened",)))
        self.remove(STOCK[3])
        self.assertEqual(self.outcomes("i")[IAP1],
                         ("empty", ("iap2-not-opened", "stock-missing")))

    def test_an_output_that_is_a_stock_file_or_template(self) -> None:
        self.remove(STATIC[0])
        parts.put_link(self.root, AIRPLAY, STOCK[0])
        parts.put_link(self.root, DEVICE, STATIC[2])
        found = self.stages("ai")
        self.assertEqual((found[AIRPLAY].outcome, found[AIRPLAY].reasons),
                         ("empty", ("template-missing", "stock-empty")))
        self.assertIn(b"[vehicle]\nenable=no\n", found[IAP2].lines[-1].text)


class Values(ReasonCase):
    def test_image(self) -> None:
        self.assertEqual(self.codes(AIRPLAY, "param.134"), ("image-missing",))
        parts.put_folder(self.root, IMAGE)
        self.assertEqual(self.codes(AIRPLAY, "param.134"), ("image-not-mappable",))
        (self.root / IMAGE[1:]).rmdir()
        parts.put(self.root, IMAGE, b"")
        self.assertEqual(self.codes(AIRPLAY, "param.22"), ("image-not-mappable",))
        for number, needed in ((22, 22), (36, 36), (134, 135), (139, 140)):
            parts.put(self.root, IMAGE, b"\1" * (needed - 1))
            self.assertEqual(self.codes(AIRPLAY, f"param.{number}"), ("image-too-short",))
            parts.put(self.root, IMAGE, b"\1" * needed)
            self.assertEqual(self.codes(AIRPLAY, f"param.{number}"), ("from-image",))

    def test_model(self) -> None:
        for code, reason in ((0, "model-unknown"), (1, "from-image"), (32, "from-image"),
                             (47, "from-image"), (48, "model-unknown"), (255, "model-unknown")):
            parts.put_image(self.root, {139: code})
            for path in (AIRPLAY, DEVICE, IAP1):
                self.assertEqual(self.codes(path, "param.139"), (reason,))

    def test_serial(self) -> None:
        self.assertEqual(self.codes(DEVICE, "slot.9"), ("disk-missing",))
        parts.put_folder(self.root, "/dev/hd0")
        self.assertEqual(self.codes(DEVICE, "slot.9"), ("disk-unreadable",))
        (self.root / "dev/hd0").rmdir()
        for size, serial, reason in ((0x100000 - 130, b"", "disk-too-short"),
                                     (0x100000 - 129, b"", "serial-blank"),
                                     (0x100000 - 129, b"A", "from-record"),
                                     (2 * 0x100000, b"\0A", "serial-blank")):
            parts.put_disk(self.root, size, serial)
            self.assertEqual(self.codes(IAP2, "slot.9"), (reason,))

    def test_tuning(self) -> None:
        parts.put_image(self.root, {134: 0xFFFF})
        switch, number = "tuning.2.qwaIVOSwitch", "tuning.2.qwaDNSEnable"
        self.assertEqual(self.codes(SPEECHREC, switch), ("disk-missing",))
        for size, reasons in ((0xFF000 - 1, ("disk-too-short",) * 2),
                              (0xFF000, ("word-unknown", "from-tuning-block"))):
            parts.put_disk(self.root, size)
            self.assertEqual((*self.codes(SPEECHREC, switch), *self.codes(SPEECHREC, number)),
                             reasons)
        parts.put_disk(self.root, area=b"\1\0" * 940)
        self.assertEqual(self.codes(TELEPHONY, "tuning.3.qwaLFRSwitch"), ("from-tuning-block",))
        self.assertEqual(len(self.stages("a")[TELEPHONY].lines), 44)

    def test_version_file(self) -> None:
        for text, full, digits in (
                (b"1.2.3", "from-version-file", "from-version-file"),
                (b"ABC_1.2", "from-version-file", "version-incomplete"),
                (b"_N/A", "version-not-available", "version-not-available"),
                (b"ABC_", "version-number-missing", "version-number-missing"),
                (b"", "version-number-missing", "version-number-missing")):
            parts.put_version(self.root, text)
            for path, reason in ((DEVICE, full), (IAP2, full), (IAP1, digits)):
                self.assertEqual(self.codes(path, f"file.{VERSIONS}application.inf"), (reason,))

    def test_no_version_file(self) -> None:
        self.assertEqual(self.codes(IAP2, f"file.{VERSIONS}"), ("version-folder-missing",))
        parts.put_version(self.root, b"1.2.3", b"Map")
        parts.put(self.root, VERSIONS + "app.txt", b"Type=Application\n")
        self.assertEqual(self.codes(IAP1, f"file.{VERSIONS}"), ("version-no-application",))

    def test_digits(self) -> None:
        short, words, wide = ("version-incomplete", "version-not-numeric", "version-out-of-range")
        for text, reasons in (
                (b"1.2.3", ("from-version-file",)), (b"1. +2.255_x", ("from-version-file",)),
                (b"1.2.3.x", ("from-version-file",)), (b"7", (short,)), (b"1.2", (short,)),
                (b"1.2_x", (short,)), (b"rc", (short, words)), (b"1.2.", (words,)),
                (b"1..3", (words,)), (b"1.2._3", (words,)), (b"256.1.1", (wide,)),
                (b"1.2.-1", (wide,)), (b"1.99999999999999999999.1", (wide,)),
                (b"x.300.1", (words, wide)), (b"-1.", (short, words, wide))):
            with self.subTest(text=text):
                self.assertEqual(version_digits_reasons(text), reasons)


class Intended(UnitCase):
    def test_one_fault_is_enough(self) -> None:
        self.assertTrue(is_intended(("generated", "from-stock")))
        self.assertFalse(is_intended(("from-image", "word-unknown")))
        self.assertEqual(sum(CODES.values()), 9)
        self.assertEqual(len(CODES), 33)
