# SPDX-License-Identifier: Apache-2.0
"""The model compared with outcomes worked out by hand: command line, identity, fallbacks."""

from __future__ import annotations

import unittest
from pathlib import Path

from model import parts
from model.unit_case import NAMES, STATIC, STOCK, UnitCase
from model.version import format_version


class CommandLine(UnitCase):
    def test_no_arguments(self) -> None:
        self.assertEqual(self.outcome().written, {})
        self.assertEqual(self.predict().stderr, b"")

    def test_unknown_letters(self) -> None:
        prediction = self.predict("-x", "-y")
        self.assertEqual(prediction.alternatives[0].written, {})
        self.assertEqual(prediction.stderr, b"orvane: invalid option -- 'x'\n"
                                            b"orvane: invalid option -- 'y'\n")

    def test_unknown_letter_does_not_stop_the_next(self) -> None:
        for arguments in (("-x", "-a"), ("-xa",), ("-ax",), ("--a",), ("-:a",)):
            self.assertEqual(set(self.outcome(*arguments).written), {"/tmp/airplay.conf"})

    def test_options_end(self) -> None:
        for first in ("word", "--", "-", ""):
            self.assertEqual(self.outcome(first, "-a").written, {})
        self.assertEqual(set(self.outcome("-a", "word", "-i").written), {"/tmp/airplay.conf"})

    def test_both_letters_in_the_order_given(self) -> None:
        # The first output is the other's template, so the order shows.
        self.remove(STATIC[0])
        parts.put_link(self.root, "/tmp/iap2_device.cfg", "/fs/mp/etc/airplay_static.conf")
        for together, apart in ((("-ai",), ("-a", "-i")), (("-ia",), ("-i", "-a"))):
            self.assertEqual(self.outcome(*together).written, self.outcome(*apart).written)
        first = self.outcome("-ai").ways["/tmp/airplay.conf"]
        last = self.outcome("-ia").ways["/tmp/airplay.conf"]
        self.assertEqual((first, last), ("fallback", "generated"))

    def test_a_letter_twice(self) -> None:
        self.assertEqual(self.outcome("-aa").written, self.outcome("-a").written)
        self.assertEqual(self.outcome("-a", "-a").written, self.outcome("-a").written)


class Airplay(UnitCase):
    HEAD = ("# Default name of the accessory if a name is not specified in the user prefs.\n"
            "name = CarPlay\n\n# Model of the accessory.\nmodel = {model}\n\n"
            "# Manufacturer of the accessory.\nmanufacturer = Marl Motor Company\n\n"
            "# OEM Icon Label\noemIconLabel = VOXA\n\n"
            "# OEM Icon Visibility Setting\noemIconVisible = 1\n\n"
            "# 104x104 OEM Icon png path\noemIconPath = /fs/mp/etc/{brand}/oemIcon.png\n\n"
            "{profile}# rightHandDrive mode setting right\nrightHandDrive = {drive}\n\n")

    def head(self, model: str = "VOXA", brand: str = "MARL", profile: int | None = None,
             drive: int = 0) -> bytes:
        text = "" if profile is None else f"# audio profile for QWA\naudioProfile = {profile}\n\n"
        return self.HEAD.format(model=model, brand=brand, profile=text, drive=drive).encode()

    def check(self, head: bytes) -> None:
        self.assertEqual(self.output("-a", "airplay.conf"), head + self.content(STATIC[0]))

    def test_plain_profile(self) -> None:
        parts.put_image(self.root, {134: 3})
        self.check(self.head(profile=3))

    def test_no_image_leaves_the_profile_out(self) -> None:
        self.check(self.head())

    def test_image_that_cannot_be_mapped(self) -> None:
        parts.put(self.root, "/fs/tmpfs/VS_DIAG_SERVICE_CONFIG_SHARED_MEM", b"")
        self.check(self.head())

    def test_image_that_is_a_folder(self) -> None:
        parts.put_folder(self.root, "/fs/tmpfs/VS_DIAG_SERVICE_CONFIG_SHARED_MEM")
        self.check(self.head())

    def test_calibration_file_is_not_a_replacement(self) -> None:
        parts.put(self.root, "/fs/rwdata/CALS/cal_active.bin", parts.image({134: 3}))
        self.check(self.head())

    def test_short_image_reads_zeros(self) -> None:
        whole = parts.image({22: 7, 134: 0x1234, 139: 5})
        for size, expected in ((1, {"profile": 0}), (22, {"profile": 0, "drive": 7}),
                               (134, {"profile": 0x34, "drive": 7}),
                               (139, {"profile": 0x1234, "drive": 7}),
                               (140, {"profile": 0x1234, "drive": 7, "model": NAMES[4]})):
            parts.put(self.root, "/fs/tmpfs/VS_DIAG_SERVICE_CONFIG_SHARED_MEM", whole[:size])
            self.check(self.head(**expected))

    def test_brand(self) -> None:
        for code, brand in ((0, "MARL"), (1, "MARL"), (2, "QUARION"), (3, "MARL"), (255, "MARL")):
            parts.put_image(self.root, {36: code})
            self.check(self.head(brand=brand, profile=0))

    def test_model(self) -> None:
        for code, model in ((0, "VOXA"), (1, NAMES[0]), (32, NAMES[31]), (47, NAMES[46]),
                            (48, "VOXA"), (255, "VOXA")):
            parts.put_image(self.root, {139: code})
            self.check(self.head(model=model, profile=0))

    def test_drive_side_is_not_reduced(self) -> None:
        for drive in (0, 1, 2, 255):
            parts.put_image(self.root, {22: drive})
            self.check(self.head(drive=drive, profile=0))

    def test_profiles_without_tuning_files(self) -> None:
        for profile in (0, 1, 0x1234, 65534):
            parts.put_image(self.root, {134: profile})
            self.assertEqual(set(self.outcome("-a").written), {"/tmp/airplay.conf"})
            self.check(self.head(profile=profile))

    def test_generated_profile(self) -> None:
        parts.put_image(self.root, {134: 65535})
        self.assertEqual(set(self.outcome("-a").written), {
            "/tmp/airplay.conf", "/tmp/telephony_FFFF.txt", "/tmp/speechrec_FFFF.txt"})
        self.check(self.head(profile=65535))

    def test_generated_profile_without_its_files(self) -> None:
        parts.put_image(self.root, {134: 65535})
        parts.put_folder(self.root, "/tmp/telephony_FFFF.txt")
        parts.put_link(self.root, "/tmp/speechrec_FFFF.txt", "/nowhere/at/all")
        self.assertEqual(set(self.outcome("-a").written), {"/tmp/airplay.conf"})
        self.check(self.head(profile=65535))

    def test_template_is_copied_as_it_is(self) -> None:
        for template in (b"last line without an end", b"name = Other\n", b"\0\xff\r\n" * 9000):
            parts.put(self.root, STATIC[0], template)
            self.check(self.head())

    def test_empty_template(self) -> None:
        parts.put(self.root, STATIC[0], b"")
        self.check(self.head())

    def test_template_that_is_a_folder_is_an_empty_one(self) -> None:
        self.remove(STATIC[0])
        parts.put_folder(self.root, STATIC[0])
        self.assertEqual(self.output("-a", "airplay.conf"), self.head())

    def test_template_missing(self) -> None:
        parts.put(self.root, "/tmp/airplay.conf", b"old and long" * 1000)
        self.remove(STATIC[0])
        self.assertEqual(self.output("-a", "airplay.conf"), self.content(STOCK[0]))

    def test_template_and_stock_file_missing(self) -> None:
        parts.put(self.root, "/tmp/airplay.conf", b"old")
        self.remove(STATIC[0], STOCK[0])
        self.assertEqual(self.output("-a", "airplay.conf"), b"")

    def test_fallback_keeps_the_tuning_files(self) -> None:
        parts.put_image(self.root, {134: 65535})
        self.remove(STATIC[0])
        self.assertEqual(len(self.outcome("-a").written), 3)

    def test_output_not_creatable(self) -> None:
        Path(parts.real(self.root, "/tmp")).rmdir()
        self.assertEqual(self.outcome("-ai").written, {})
        self.assertIsNone(self.outcome("-ai").tmp)


class Version(unittest.TestCase):
    def test_examples(self) -> None:
        for text, expected in ((b"3.10.2", b"030a02"), (b"1.2.3_45", b"010203"),
                               (b"N/A", b"000000"), (b"", b"000000"), (b"1.2", b"010202"),
                               (b"7", b"070707"), (b"2.0.1", b"020001"),
                               (b"256.15.x", b"000f00"), (b"300.-1.+5", b"2cffffffff05"),
                               (b" 1.\t2.0003", b"010203"), (b"N/A ", b"000000"),
                               (b"...", b"000000"), (b"-256.-300.- 1", b"00ffffffd400"),
                               (b"99999999999.-99999999999.1.2", b"ff0001"),
                               (b"0x1f.1e2.3", b"000103")):
            self.assertEqual(format_version(text), expected, text)
