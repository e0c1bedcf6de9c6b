# SPDX-License-Identifier: Apache-2.0
"""The model's outcomes of disturbed system calls, compared with outcomes worked out by hand."""

from __future__ import annotations

from model import parts
from model.prediction import predict
from model.system import Fault, Streams
from model.unit_case import NAMES, STATIC, STOCK, UnitCase
from model.test_model_iap import HARDWARE1, HARDWARE2, VEHICLE, accessory
from model.tuning import tuning_text

IMAGE = "/fs/tmpfs/VS_DIAG_SERVICE_CONFIG_SHARED_MEM"
APPLICATION = "/fs/rwdata/.Version/application.inf"


class Faults(UnitCase):
    def setUp(self) -> None:
        super().setUp()
        parts.put_image(self.root, {134: 0xFFFF, 139: 1})
        parts.put_disk(self.root, serial=b"12345678", area=b"\x01" * 1880)
        parts.put_version(self.root, b"1.2.3")
        self.block = accessory(b"12345678", NAMES[0].encode(), b"1.2.3")
        self.compact = accessory(b"12345678", NAMES[0].encode(), b"010203")

    def contents(self, argument: str, fault: Fault, name: str,
                 streams: Streams = Streams()) -> list[bytes | None]:
        """What the file may hold, in all outcomes."""
        prediction = predict(self.root, [argument], NAMES, [fault], streams)
        self.assertEqual(prediction.unmet, ())
        found = []
        for outcome in prediction.alternatives:
            content = outcome.written.get(f"/tmp/{name}")
            if content not in found:
                found.append(content)
        return found

    def check(self, argument: str, fault: Fault, **expected: bytes | None) -> None:
        """Each file (its dot written as two underscores) has one content only."""
        for name, content in expected.items():
            self.assertEqual(self.contents(argument, fault, name.replace("__", ".")), [content])

    def test_open_image_counts_by_lookup(self) -> None:
        for occurrence, what in ((1, b"model = VOXA\n"), (2, b"/MARL/"), (3, b"Drive = 0\n")):
            (content,) = self.contents("-a", Fault("open", IMAGE, occurrence), "airplay.conf")
            self.assertIn(what, content)
            self.assertIn(b"audioProfile = 65535\n", content)
        (content,) = self.contents("-a", Fault("open", IMAGE, 4), "airplay.conf")
        self.assertNotIn(b"audioProfile", content)

    def test_only_the_measuring_seek_matters(self) -> None:
        for occurrence, model in ((1, NAMES[0]), (2, "VOXA"), (3, NAMES[0])):
            (content,) = self.contents("-a", Fault("seek", IMAGE, occurrence), "airplay.conf")
            self.assertIn(f"model = {model}\n".encode(), content)

    def test_map(self) -> None:
        (content,) = self.contents("-a", Fault("map", IMAGE, 1), "airplay.conf")
        self.assertIn(b"model = VOXA\n", content)

    def test_disk(self) -> None:
        zeros, ones = bytes(188), b"\x01" * 188
        for operation in ("open", "seek", "read"):
            self.check("-a", Fault(operation, "/dev/hd0", 1, error="EINTR"),
                       telephony_FFFF__txt=tuning_text(zeros, 3),
                       speechrec_FFFF__txt=tuning_text(ones, 2))
        self.check("-a", Fault("read", "/dev/hd0", 2, "short", length=376 + 94),
                   telephony_FFFF__txt=tuning_text(ones, 3),
                   speechrec_FFFF__txt=tuning_text(ones[:94] + zeros[:94], 2))
        short = Fault("read", "/dev/hd0", 1, "short", length=3)
        (content,) = self.contents("-i", short, "iap2.cfg")
        self.assertIn(b"serial=123\n", content)

    def test_second_opening_of_an_output_may_succeed(self) -> None:
        self.check("-a", Fault("open", "/tmp/airplay.conf", 1),
                   airplay__conf=self.content(STOCK[0]))
        self.check("-i", Fault("open", "/tmp/iap2.cfg", 1), iap2__cfg=self.content(STOCK[2]),
                   iap1__cfg=self.content(STOCK[3]))

    def test_close_of_iap2_reaches_iap1(self) -> None:
        self.check("-i", Fault("close", "/tmp/iap2.cfg", 1),
                   iap2__cfg=self.block + HARDWARE2 + self.content(STATIC[2]),
                   iap1__cfg=self.content(STOCK[3]))

    def test_listing(self) -> None:
        path = "/fs/rwdata/.Version"
        self.check("-i", Fault("list", path, 1), iap1__cfg=self.compact + HARDWARE1
                   + self.content(STATIC[3]))
        (content,) = self.contents("-i", Fault("list", path, 1), "iap2.cfg")
        self.assertIn(b"firmware_version=\n", content)
        (content,) = self.contents("-i", Fault("list", path, 2), "iap1.cfg")
        self.assertIn(b"firmware_version=000000\n", content)
        (content,) = self.contents("-i", Fault("list", path, 1, offset=3), "iap2.cfg")
        self.assertIn(b"firmware_version=1.2.3\n", content)

    def test_read_error_within_a_description(self) -> None:
        fault = Fault("read", APPLICATION, 1, offset=len("Type=Application\nVersion Number=1"))
        found = self.contents("-i", fault, "iap2.cfg")
        lines = [[line for line in content.split(b"\n") if line.startswith(b"firm")][0]
                 for content in found]
        self.assertEqual(sorted(lines), [b"firmware_version=", b"firmware_version=1"])

    def test_read_error_before_the_first_byte_is_an_empty_template(self) -> None:
        for path, name, rest in ((STATIC[1], "iap2_device.cfg", HARDWARE2),
                                 (STATIC[2], "iap2.cfg", HARDWARE2)):
            self.assertEqual(self.contents("-i", Fault("read", path, 1), name), [self.block + rest])
        self.check("-i", Fault("read", STATIC[2], 1), iap1__cfg=self.content(STOCK[3]))

    def test_read_error_within_a_template(self) -> None:
        start = self.block + HARDWARE2 + self.content(STATIC[1])[:5]
        self.assertEqual(self.contents("-i", Fault("read", STATIC[1], 1, offset=5),
                                       "iap2_device.cfg"), [start + VEHICLE, start])

    def test_interruptions_and_short_transfers_of_streams_go_unseen(self) -> None:
        (plain,) = predict(self.root, ["-i"], NAMES).alternatives
        for operation, path in (("read", STATIC[2]), ("read", APPLICATION),
                                ("write", "/tmp/iap2.cfg")):
            for kind, error in (("error", "EINTR"), ("short", "")):
                fault = Fault(operation, path, 1, kind, error, 0, 10)
                (outcome,) = predict(self.root, ["-i"], NAMES, [fault]).alternatives
                self.assertEqual(outcome.written, plain.written)

    def test_interrupted_read_of_a_library_that_does_not_go_on(self) -> None:
        fault = Fault("read", STATIC[2], 1, error="EINTR")
        (outcome,) = predict(self.root, ["-i"], NAMES, [fault],
                              Streams(retry_interrupted=False)).alternatives
        self.assertEqual(outcome.written["/tmp/iap2.cfg"], self.block + HARDWARE2)

    def test_write_error_at_close(self) -> None:
        whole = self.block + HARDWARE2 + self.content(STATIC[2])
        fault = Fault("write", "/tmp/iap2.cfg", 1, length=len(whole))
        self.assertIn(b"", self.contents("-i", fault, "iap2.cfg"))
        self.assertIn(self.content(STOCK[3]), self.contents("-i", fault, "iap1.cfg"))

    def test_write_error_before_the_copy_drops_all_that_follows(self) -> None:
        whole = tuning_text(b"\x01" * 188, 3)
        first, second, _ = whole.split(b"\n", 2)
        fault = Fault("write", "/tmp/telephony_FFFF.txt", 1, offset=len(first) + 1,
                      length=len(second) + 1)
        self.assertEqual(self.contents("-a", fault, "telephony_FFFF.txt"),
                         [first + b"\n", first + b"\n" + second + b"\n"])

    def test_write_error_within_the_copy_lets_the_last_lines_through(self) -> None:
        parts.put(self.root, STATIC[1], b"x" * 20000)
        start = self.block + HARDWARE2
        fault = Fault("write", "/tmp/iap2_device.cfg", 1, offset=len(start) + 8191, length=8191,
                      pieces=(0, 8191))
        self.assertEqual(self.contents("-i", fault, "iap2_device.cfg"),
                         [start + b"x" * 8191 + VEHICLE])

    def test_write_error_under_a_c_stream_loses_its_buffer_and_may_keep_the_next_chunk(self) -> None:
        text = b"".join(b"%07d\n" % line for line in range(1000))
        parts.put(self.root, STATIC[2], text)
        whole = self.block + HARDWARE2 + text
        fault = Fault("write", "/tmp/iap2.cfg", 1, length=4096)
        found = self.contents("-i", fault, "iap2.cfg", Streams(chunk=1024))
        self.assertEqual(set(found), {b"", whole[4096:5120], whole[3073:4097]})

    def test_read_error_within_what_a_c_stream_was_asked_for_may_go_unseen(self) -> None:
        start = self.block + HARDWARE2
        content = self.content(STATIC[2])
        for offset, unseen in ((0, False), (5, True)):
            found = self.contents("-i", Fault("read", STATIC[2], 1, offset=offset), "iap2.cfg",
                                  Streams(chunk=1024))
            self.assertIn(start + content[:offset], found)
            self.assertEqual(start + content in found, unseen)

    def test_unmet_fault_is_reported(self) -> None:
        fault = Fault("open", "/nowhere", 1)
        self.assertEqual(predict(self.root, ["-a"], NAMES, [fault]).unmet, (fault,))
