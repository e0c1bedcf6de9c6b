# SPDX-License-Identifier: Apache-2.0
"""The model compared with tuning files worked out by hand."""

from __future__ import annotations

import unittest

from model import parts
from model.unit_case import UnitCase
from model.tuning import tuning_text

ZERO_BLOCK = b"""\
; Genereated config from DPS (blockId 2)
qwaAECSwitch 
qwaAGCSwitch 
qwaDiagSwitch 
qwaHFESwitch 
qwaMixFiltSwitch 
qwaMixSwitch 
qwaNRSwitch 
qwaRECSwitch 
qwaRecvAGCSwitch 
qwaRecvBWESwitch 
qwaRecvDLCSwitch 
qwaRecvDTFSwitch 
qwaRecvENSSwitch 
qwaRecvEQSwitch 
qwaSendDynEQSwitch 
qwaSendEQSwitch 
qwaWNDBMode 
qwaWNDBSwitch 
qwaAECFiltLen 0
qwaLFRSwitch 
qwaHFEExtent 0
qwaNCParams 0 0 0 0 0 
qwaNRAtten 0
qwaRECSuppress 0
qwaRecvAGCAmpTgts 0 0 
qwaRecvAGCGainVals 0 0 0 
qwaRecvAGCMaxRates 0 0 
qwaRecvGain 0
qwaRecvLimitThresh 0
qwaRecvParamEQNodes 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 
qwaRefDelay 0
qwaRefMaxDelay 0
qwaSendAGCMaxRates 0 0 
qwaSendAGCAmpTgts 0 0 
qwaSendAGCGainVals 0 0 0 
qwaSendDynEQMinMaxSNR 0 0 
qwaSendGain 0
qwaSendLimitThresh 0
qwaSendParamEQ2Nodes 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 
qwaSendParamEQNodes 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 
qwaWNDBSuppress 0
qwaDNSEnable 0
qwaIVOSwitch 
qwaMEQEnable 0 0 0 0 
"""

# What the program never reads.
UNREAD_BYTES = (11, 12, 74, 75, 80, 81, 82, 83, *range(179, 188))
UNREAD_BITS = ((1, 0xC0), (3, 0xC0), (4, 0x30))

TELEPHONY = "telephony_FFFF.txt"
SPEECHREC = "speechrec_FFFF.txt"


def block(changes: dict[int, int]) -> bytes:
    content = bytearray(188)
    for offset, value in changes.items():
        content[offset] = value
    return bytes(content)


class TuningText(unittest.TestCase):
    def check(self, changes: dict[int, int], *lines: str) -> None:
        text = tuning_text(block(changes), 2).decode("ascii").split("\n")
        for line in lines:
            self.assertIn(line, text)
        keys = [line.split(" ")[0] for line in lines]
        zero = ZERO_BLOCK.decode("ascii").split("\n")
        for found, expected in zip(text, zero, strict=True):
            if found.split(" ")[0] not in keys:
                self.assertEqual(found, expected)

    def test_zero_block(self) -> None:
        self.assertEqual(tuning_text(bytes(188), 2), ZERO_BLOCK)

    def test_switches_of_one_byte(self) -> None:
        self.check({0: 0xE4}, "qwaAECSwitch ", "qwaAGCSwitch qwaOff", "qwaDiagSwitch qwaOn",
                   "qwaHFESwitch qwaIdle")

    def test_every_switch_has_its_own_bits(self) -> None:
        for byte, keys in ((1, ("MixFilt", "Mix", "NR")),
                           (2, ("REC", "RecvAGC", "RecvBWE", "RecvDLC")),
                           (3, ("RecvDTF", "RecvENS", "RecvEQ")),
                           (4, ("SendDynEQ", "SendEQ"))):
            for place, key in enumerate(keys):
                for code, word in ((1, "qwaOff"), (2, "qwaOn"), (3, "qwaIdle")):
                    self.check({byte: code << 2 * place}, f"qwa{key}Switch {word}")

    def test_mode(self) -> None:
        for byte, word in ((0x40, "qwaSingleChannel"), (0x80, "qwaMultiChannel"),
                           (0xC0, "qwaCombined"), (0, "")):
            self.check({4: byte}, f"qwaWNDBMode {word}")

    def test_wide_switches(self) -> None:
        for byte, word in ((2, "qwaOn"), (3, "qwaIdle"), (4, ""), (6, ""), (255, "")):
            self.check({5: byte}, f"qwaWNDBSwitch {word}")
        for low, high, word in ((1, 0, "qwaOff"), (2, 0, "qwaOn"), (2, 1, ""), (255, 255, "")):
            self.check({8: low, 9: high}, f"qwaLFRSwitch {word}")
            self.check({169: low, 170: high}, f"qwaIVOSwitch {word}")

    def test_numbers(self) -> None:
        for low, high, number in ((255, 255, -1), (0, 0x80, -32768), (255, 0x7F, 32767),
                                  (0x34, 0x12, 4660)):
            for offset, key in ((6, "AECFiltLen"), (23, "NRAtten"), (40, "RecvGain"),
                                (42, "RecvLimitThresh"), (76, "RefDelay"), (78, "RefMaxDelay"),
                                (102, "SendGain"), (104, "SendLimitThresh"), (167, "DNSEnable")):
                self.check({offset: low, offset + 1: high}, f"qwa{key} {number}")

    def test_bytes_have_no_sign(self) -> None:
        for offset, key in ((10, "HFEExtent"), (25, "RECSuppress"), (166, "WNDBSuppress")):
            self.check({offset: 0xFF}, f"qwa{key} 255")

    def test_lists(self) -> None:
        for offset, count, key in (
                (13, 5, "NCParams"), (26, 2, "RecvAGCAmpTgts"), (30, 3, "RecvAGCGainVals"),
                (36, 2, "RecvAGCMaxRates"), (44, 15, "RecvParamEQNodes"),
                (84, 2, "SendAGCMaxRates"), (88, 2, "SendAGCAmpTgts"),
                (92, 3, "SendAGCGainVals"), (98, 2, "SendDynEQMinMaxSNR"),
                (106, 15, "SendParamEQ2Nodes"), (136, 15, "SendParamEQNodes"),
                (171, 4, "MEQEnable")):
            changes: dict[int, int] = {}
            for element in range(count):
                changes |= {offset + 2 * element: 0xFF - element, offset + 2 * element + 1: 0xFF}
            elements = "".join(f"{-1 - element} " for element in range(count))
            self.check(changes, f"qwa{key} {elements}")

    def test_a_list(self) -> None:
        self.check({13: 1, 15: 0xFE, 16: 0xFF, 17: 3, 21: 5}, "qwaNCParams 1 -2 3 0 5 ")
        self.check({14: 0x80}, "qwaNCParams -32768 0 0 0 0 ")

    def test_what_is_not_read_changes_nothing(self) -> None:
        for offset in UNREAD_BYTES:
            self.check({offset: 0xFF})
        for offset, bits in UNREAD_BITS:
            self.check({offset: bits})


class TuningFiles(UnitCase):
    def setUp(self) -> None:
        super().setUp()
        parts.put_image(self.root, {134: 0xFFFF})

    def check(self, telephony: bytes, speechrec: bytes) -> None:
        self.assertEqual(self.output("-a", TELEPHONY), tuning_text(telephony, 3))
        self.assertEqual(self.output("-a", SPEECHREC), tuning_text(speechrec, 2))

    def test_no_disk_gives_zero_blocks(self) -> None:
        self.assertEqual(self.output("-a", SPEECHREC), ZERO_BLOCK)
        self.assertEqual(self.output("-a", TELEPHONY),
                         ZERO_BLOCK.replace(b"blockId 2", b"blockId 3"))

    def test_blocks_lie_by_their_number(self) -> None:
        area = bytes(376) + block({0: 1}) + block({0: 2}) + b"\xff" * 1128
        parts.put_disk(self.root, area=area)
        self.check(block({0: 2}), block({0: 1}))

    def test_disk_must_reach_back_to_the_area(self) -> None:
        area = b"\x55" * 1880
        for size, blocks in ((0, bytes(188)), (1044479, bytes(188)), (1044480, b"\x55" * 188)):
            parts.put_disk(self.root, size, area=area)
            self.check(blocks, blocks)

    def test_old_file_is_replaced(self) -> None:
        parts.put(self.root, f"/tmp/{SPEECHREC}", b"old" * 10000)
        self.check(bytes(188), bytes(188))

    def test_old_files_stay_with_another_profile(self) -> None:
        parts.put_image(self.root, {134: 0xFFFE})
        parts.put(self.root, f"/tmp/{SPEECHREC}", b"old")
        self.assertEqual(self.output("-a", SPEECHREC), b"old")
