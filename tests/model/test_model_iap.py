# SPDX-License-Identifier: Apache-2.0
"""The model compared with outcomes worked out by hand: the iAP files and their content."""

from __future__ import annotations

import os
import unittest

from model import parts
from model.unit_case import NAMES, STATIC, STOCK, UnitCase


def accessory(serial: bytes = b"ABCD1234abc", model: bytes = b"VOXA",
              firmware: bytes = b"") -> bytes:
    return (b"# This section is mandatory.  Populate all fields with accessory-specific info.\n"
            b"[accessory]\nname=VOXA 3\nmodel=" + model + b"\nmanufacturer=Marl Motor Company\n"
            b"serial=" + serial + b"\nfirmware_version=" + firmware + b"\n")


HARDWARE2 = b"hardware_version=1.0.0\n\n"
HARDWARE1 = b"hardware_version=010000\nrfcert=00000000 \n\n"
VEHICLE = b"\n[vehicle]\nenable=no\n\n"


class IapFiles(UnitCase):
    def check(self, name: str, expected: bytes) -> None:
        self.assertEqual(self.output("-i", name), expected)

    def test_all_generated(self) -> None:
        parts.put_image(self.root, {139: 1})
        parts.put_disk(self.root, serial=b"12345678")
        parts.put_version(self.root, b"ABC_3.10.2_rc")
        full = accessory(b"12345678", NAMES[0].encode(), b"3.10.2_rc") + HARDWARE2
        self.check("iap2_device.cfg", full + self.content(STATIC[1]) + VEHICLE)
        self.check("iap2.cfg", full + self.content(STATIC[2]))
        self.check("iap1.cfg", accessory(b"12345678", NAMES[0].encode(), b"030a02") + HARDWARE1
                   + self.content(STATIC[3]))

    def test_templates_without_a_last_line_end(self) -> None:
        for path in STATIC:
            parts.put(self.root, path, b"[end]")
        self.check("iap2_device.cfg", accessory() + HARDWARE2 + b"[end]" + VEHICLE)
        self.check("iap2.cfg", accessory() + HARDWARE2 + b"[end]")
        self.check("iap1.cfg", accessory(firmware=b"000000") + HARDWARE1 + b"[end]")

    def test_empty_device_template_drops_the_rest(self) -> None:
        parts.put(self.root, STATIC[1], b"")
        self.check("iap2_device.cfg", accessory() + HARDWARE2)

    def test_device_template_missing(self) -> None:
        self.remove(STATIC[1])
        self.check("iap2_device.cfg", self.content(STOCK[1]))
        self.remove(STOCK[1])
        self.check("iap2_device.cfg", b"")

    def test_empty_iap2_template_makes_iap1_fall_back(self) -> None:
        parts.put(self.root, STATIC[2], b"")
        self.check("iap2.cfg", accessory() + HARDWARE2)
        self.check("iap1.cfg", self.content(STOCK[3]))

    def test_iap2_not_creatable_makes_iap1_fall_back(self) -> None:
        parts.put_folder(self.root, "/tmp/iap2.cfg")
        self.assertEqual(set(self.outcome("-i").written), {"/tmp/iap2_device.cfg", "/tmp/iap1.cfg"})
        self.check("iap1.cfg", self.content(STOCK[3]))

    def test_iap2_falling_back_lets_iap1_be_generated(self) -> None:
        self.remove(STATIC[2])
        self.check("iap2.cfg", self.content(STOCK[2]))
        self.check("iap1.cfg", accessory(firmware=b"000000") + HARDWARE1 + self.content(STATIC[3]))

    def test_iap2_without_stock_file_is_empty(self) -> None:
        self.remove(STATIC[2], STOCK[2])
        self.check("iap2.cfg", b"")
        self.assertEqual(self.outcome("-i").ways["/tmp/iap1.cfg"], "generated")

    def test_iap1_template_missing(self) -> None:
        self.remove(STATIC[3])
        self.check("iap1.cfg", accessory(firmware=b"000000") + HARDWARE1)

    def test_iap1_not_creatable(self) -> None:
        parts.put_folder(self.root, "/tmp/iap1.cfg")
        self.assertEqual(set(self.outcome("-i").written), {"/tmp/iap2_device.cfg", "/tmp/iap2.cfg"})

    def test_links_are_followed(self) -> None:
        parts.put(self.root, "/fs/rwdata/kept", b"longer than nothing")
        parts.put_link(self.root, "/tmp/iap2.cfg", "../fs/rwdata/kept")
        parts.put_link(self.root, "/tmp/iap1.cfg", "iap1.cfg")
        parts.put_link(self.root, "/tmp/iap2_device.cfg", "/fs/rwdata/fresh")
        self.assertEqual(set(self.outcome("-i").written), {"/fs/rwdata/kept", "/fs/rwdata/fresh"})


class Serial(UnitCase):
    def check(self, expected: bytes) -> None:
        self.assertIn(b"\nserial=" + expected + b"\n", self.output("-i", "iap2.cfg"))

    def test_records(self) -> None:
        for serial in (b"12345678", b"AB", b"", b"\xff\n = \t"):
            parts.put_disk(self.root, serial=serial)
            self.check(serial)

    def test_ends_at_the_first_nul(self) -> None:
        parts.put_disk(self.root, serial=b"AB\0CD")
        self.check(b"AB")

    def test_default(self) -> None:
        self.check(b"ABCD1234abc")
        parts.put_folder(self.root, "/dev/hd0")
        self.check(b"ABCD1234abc")

    def test_disk_must_reach_back_to_the_record(self) -> None:
        fits = 0x100000 - 129
        for size in (0, 1, fits - 1):
            parts.put_disk(self.root, size, b"12345678")
            self.check(b"ABCD1234abc")
        for size in (fits, 0x100000):
            parts.put_disk(self.root, size, b"12345678")
            self.check(b"12345678")


class SoftwareVersion(UnitCase):
    def check(self, full: bytes, compact: bytes) -> None:
        for name, text in (("iap2_device.cfg", full), ("iap2.cfg", full), ("iap1.cfg", compact)):
            self.assertIn(b"\nfirmware_version=" + text + b"\n", self.output("-i", name))

    def file(self, content: bytes, name: str = "a.inf") -> None:
        parts.put(self.root, f"/fs/rwdata/.Version/{name}", content)

    def test_nothing_usable(self) -> None:
        self.check(b"", b"000000")
        parts.put_folder(self.root, "/fs/rwdata/.Version")
        self.check(b"", b"000000")
        self.file(b"Type=application\nVersion Number=1.2.3\n")
        self.file(b"Type=Application\nVersion Number=1.2.3\n", "a.in")
        self.check(b"", b"000000")

    def test_not_available(self) -> None:
        self.file(b"Type=Application\nVersion Number=N/A\n")
        self.check(b"N/A", b"000000")

    def test_empty_value_is_skipped(self) -> None:
        self.file(b"Type=Application\nVersion Number=\n")
        self.check(b"", b"000000")
        self.file(b"Type=Application\nVersion Number=1.2.3\nVersion Number=\n")
        self.check(b"1.2.3", b"010203")

    def test_blank_value_is_kept_and_empty(self) -> None:
        self.file(b"Type=Application\nVersion Number=1.2.3\nVersion Number=  \n")
        self.check(b"", b"000000")

    def test_trimming_takes_spaces_only(self) -> None:
        self.file(b"  Type  =  MainApplication  \n Version Number =  V_2.0.1 ")
        self.check(b"2.0.1", b"020001")
        self.file(b"Type=Application\r\nVersion Number=1.2.3\r\n")
        self.check(b"1.2.3\r", b"010203")
        self.file(b"\tType=Application\nVersion Number=1.2.3\n")
        self.check(b"", b"000000")

    def test_value_keeps_further_separators(self) -> None:
        self.file(b"=x\nType=Application\nVersion Number=1=2_3=4.5\n")
        self.check(b"3=4.5", b"030505")

    def test_text_ends_at_a_nul_in_the_files_only(self) -> None:
        self.file(b"Type=Application\nVersion Number=1.2\0_3.4\0.5\n")
        self.check(b"3.4", b"030405")

    def test_name_may_hold_the_marker_anywhere(self) -> None:
        for name in ("a.info", "b.inf.old", ".inf"):
            with self.subTest(name):
                self.file(b"Type=Application\nVersion Number=1.2.3\n", name)
                self.check(b"1.2.3", b"010203")
                self.remove(f"/fs/rwdata/.Version/{name}")

    def test_first_in_listing_order_wins(self) -> None:
        for name in "dbca":
            self.file(b"Type=Application\nVersion Number=" + name.encode() + b"\n", f"{name}.inf")
        folder = parts.real(self.root, "/fs/rwdata/.Version")
        with os.scandir(folder) as entries:
            first = next(entries).name
        self.check(first[:1].encode(), b"000000")

    def test_first_match_wins_without_a_version_too(self) -> None:
        self.file(b"Type=Application\n")
        self.check(b"", b"000000")

    def test_entries_that_give_no_record(self) -> None:
        parts.put_folder(self.root, "/fs/rwdata/.Version/a.inf")
        parts.put_link(self.root, "/fs/rwdata/.Version/b.inf", "/nowhere")
        self.file(b"Type=Application\nVersion Number=1.2.3\n", "c.inf")
        self.check(b"1.2.3", b"010203")
