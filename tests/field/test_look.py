# SPDX-License-Identifier: Apache-2.0
"""`orvane-field look` sees what a unit has, and what it lacks."""

from __future__ import annotations

import shutil
import sys
import unittest
from pathlib import Path

from car import DISK, IMAGE, SHELLS, VERSIONS, Done, is_root, snapshot
from look_case import LookTest

PROJECT = Path(__file__).resolve().parents[2]
sys.path.append(str(PROJECT / "tests/documents"))
from run_documents import blocks, matches  # noqa: E402

DOCUMENT = PROJECT / "docs/deploy.md"


class WholeUnitTest(LookTest):
    def test_nothing_differs_in_any_shell(self) -> None:
        outputs: dict[str, str] = {}
        for shell in SHELLS:
            with self.subTest(shell):
                done = self.look(shell=shell)
                self.assertEqual((done.status, done.err), (0, ""))
                self.assertEqual(done.lines("differs"), [])
                self.assertEqual([line.split(":")[0] for line in done.lines("unknown")],
                                 ["the usage record", "the libraries that it finds"])
                outputs[shell] = done.out
        self.assertEqual(len(set(outputs.values())), 1, outputs)

    def test_it_says_what_is_there(self) -> None:
        done = self.look()
        for line in ("the image arrives: audio profile 65535",
                     "the brand and the drive side arrive: brand QUARION, drive side 1",
                     "the model arrives: Quarion Velmira", "the serial arrives: SN004217",
                     "the version arrives: 3.10.2_rc, from application.inf; applications: 1",
                     "the digits of the version arrive: 030a02",
                     "/tmp/telephony_FFFF.txt arrives: 45 lines",
                     "the modes are 0666 less the mask: with the mask 027 all -rw-r-----",
                     "where /tmp is: /tmp", "where the image is: /fs/tmpfs; a file"):
            self.assertEqual(done.line(line), f"ok       {line}")

    def test_the_document_shows_what_it_says(self) -> None:
        shown = [block for block in blocks(DOCUMENT.read_text(encoding="utf-8"))
                 if block.lines[:1] and block.lines[0].startswith("$ orvane-field look ")]
        self.assertEqual(len(shown), 1)
        done = self.look()
        self.assertTrue(matches(shown[0].lines[1:], [*done.out.splitlines(), str(done.status)]), done.out)

    def test_older_outputs_are_put_back_whole(self) -> None:
        for shell in SHELLS:
            with self.subTest(shell):
                self.put_older_outputs()
                done = self.look(shell=shell)
                self.assertEqual((done.status, done.err), (0, ""))

    def test_modes_that_everybody_may_write_are_shown(self) -> None:
        self.put_older_outputs()
        self.assertIn("ok ", self.look().line("the modes found"))
        (self.car / "tmp/iap2.cfg").chmod(0o666)
        line = self.look().line("the modes found")
        self.assertRegex(line, "^unknown .* iap2.cfg -rw-rw-rw-; everybody")

    @unittest.skipUnless(is_root(), "only root can become another user")
    def test_an_ordinary_user(self) -> None:
        (self.car / "tmp").chmod(0o777)
        done = self.look(is_ordinary=True)
        self.assertEqual((done.status, done.lines("differs"), done.err), (0, [], ""))

    @unittest.skipUnless(is_root(), "only root can become another user")
    def test_an_ordinary_user_where_root_made_the_outputs(self) -> None:
        self.put_older_outputs()
        done = self.look(is_ordinary=True)
        self.assertIn("-i, since /tmp/iap2_device.cfg cannot be put aside", done.line("not all is tried"))
        self.assertEqual(done.lines("differs"), [])

    def test_orvane_by_its_path(self) -> None:
        shutil.copy(self.car / "bin/orvane", self.car / "home/another")
        for word in ("/home/another", "./another", "../home/another"):
            self.assertEqual(self.look(word, path="/bin").status, 0, word)


class UnitThatLacksSomethingTest(LookTest):
    def check(self, kind: str, question: str, seen: str, **given: object) -> Done:
        done = self.look(**given)
        line = done.line(question)
        self.assertTrue(line.startswith(kind + " "), line)
        self.assertIn(seen, line)
        self.assertEqual(done.status, 1 if done.lines("differs") else 0)
        self.assertEqual(done.err, "")
        return done

    def test_no_image(self) -> None:
        (self.car / IMAGE).unlink()
        done = self.check("differs", "the image arrives", "no audio profile")
        self.assertIn("VOXA", done.line("the model arrives"))
        self.assertEqual(done.line("where the image is"),
                         "differs  where the image is: /fs/tmpfs; missing")

    def test_an_image_that_is_not_filled(self) -> None:
        (self.car / IMAGE).write_bytes(b"")
        self.check("differs", "where the image is", "it is empty")

    def test_an_image_that_is_not_whole(self) -> None:
        image = (self.car / IMAGE).read_bytes()
        for size in (1, 140, 178):
            (self.car / IMAGE).write_bytes(image[:size])
            self.check("differs", "where the image is", f"{size} bytes instead of 179")

    def test_a_stock_file_says_nothing_about_the_inputs(self) -> None:
        for name in ("airplay", "iap2_device", "mm/iap2"):
            (self.car / f"fs/mp/etc/{name}_static.{'conf' if name == 'airplay' else 'cfg'}").unlink()
        (self.car / "fs/mp/etc/airplay.conf").write_text(
            "model = Stock\noemIconPath = /fs/mp/etc/MARL/oemIcon.png\naudioProfile = 3\n")
        for path in ("iap2_device.cfg", "mm/iap2.cfg"):
            (self.car / "fs/mp/etc" / path).write_text("model=Stock\nserial=1\nfirmware_version=1\n")
        done = self.check("unknown", "the image arrives", "no generated lines")
        self.assertIn("unknown", done.line("telephony_FFFF.txt arrives"))
        self.assertIn("ok", done.line("the model arrives: Quarion Velmira"))
        self.assertIn("ok", done.line("the serial arrives: SN004217"))
        self.assertIn("unknown", done.line("the version arrives"))

    def test_a_stock_file_that_was_copied_from_an_output(self) -> None:
        self.car.program("home/orvane", '/bin/orvane "$@"\n[ ! -e /tmp/airplay.conf ] ||'
                         " /bin/dd if=/tmp/airplay.conf of=/fs/mp/etc/airplay.conf 2>/dev/null\nexit 0\n")
        self.look("/home/orvane")
        self.assertEqual(self.look().lines("differs"), [])

    def test_a_model_without_a_name(self) -> None:
        self.set("param.139=200")
        done = self.check("differs", "the model arrives", "VOXA")
        self.assertEqual(len(done.lines("differs")), 1)

    def test_no_disk(self) -> None:
        (self.car / DISK).unlink()
        done = self.check("differs", "the serial arrives", "ABCD1234abc, the default")
        self.assertIn("unknown", done.line("telephony_FFFF.txt arrives"))

    def test_a_serial_that_was_never_written(self) -> None:
        self.set("serial=hex:00")
        self.check("unknown", "the serial arrives", "it is empty")

    def test_a_serial_that_a_terminal_would_obey(self) -> None:
        self.set("serial=hex:1b5b324a5c6e")
        self.check("ok", "the serial arrives", "(not printable)")

    def test_tuning_that_is_not_asked_for(self) -> None:
        self.set("param.134=300")
        self.check("ok", "telephony_FFFF.txt arrives", "not asked for")

    def test_no_version(self) -> None:
        shutil.rmtree(self.car / VERSIONS)
        done = self.check("unknown", "the version arrives", "no readable file")
        self.assertEqual(done.line("the digits"), "ok       the digits of the version arrive: 000000")

    def test_digits_of_no_number(self) -> None:
        (self.car / VERSIONS / "application.inf").write_text("Type=Application\nVersion Number=V3\n")
        self.check("unknown", "the digits of the version", '000000, of "V3"')

    def test_one_of_several_versions(self) -> None:
        (self.car / VERSIONS / "b.inf").write_text("Type = Application\nVersion Number=Z_9.8.7\n")
        self.check("ok", "the version arrives", "applications: 2")

    def test_a_version_file_with_a_zero_byte(self) -> None:
        """No shell can hold that byte, so the script cannot predict what orvane makes of it."""
        (self.car / VERSIONS / "application.inf").write_bytes(b"Type=Application\nVersion Number=3.1\x009\n")
        for shell in SHELLS:
            self.check("unknown", "the version arrives", "a zero byte may hide another in application.inf",
                       shell=shell)

    def test_a_version_file_whose_name_begins_with_a_line_end(self) -> None:
        (self.car / VERSIONS / "application.inf").rename(self.car / VERSIONS / "\na.inf")
        for shell in SHELLS:
            self.check("ok", "the version arrives", "3.10.2_rc, from (not printable); applications: 1",
                       shell=shell)

    def test_no_template(self) -> None:
        (self.car / "fs/mp/etc/mm/iap2_static.cfg").unlink()
        self.check("differs", "/tmp/iap2.cfg comes whole", "it is the stock file /fs/mp/etc/mm/iap2.cfg")

    def test_neither_template_nor_stock_file(self) -> None:
        (self.car / "fs/mp/etc/airplay_static.conf").unlink()
        (self.car / "fs/mp/etc/airplay.conf").unlink()
        done = self.check("differs", "/tmp/airplay.conf comes whole", "it is empty")
        self.assertIn("unknown", done.line("the image arrives"))

    def test_an_empty_template(self) -> None:
        (self.car / "fs/mp/etc/iap2_device_static.cfg").write_bytes(b"")
        self.check("differs", "/tmp/iap2_device.cfg comes whole", "nothing can be read")

    def test_templates_of_any_bytes(self) -> None:
        for content in (bytes(range(256)) * 3, b"a\\nb\\\n  c\t \n\x00", b"\n\n", b"no end of line"):
            for name in ("airplay_static.conf", "iap2_device_static.cfg", "mm/iap1_static.cfg"):
                (self.car / "fs/mp/etc" / name).write_bytes(content)
            for shell in SHELLS:
                with self.subTest(content=content[:9], shell=shell):
                    self.assertEqual(self.look(shell=shell).lines("differs"), [])

    def test_no_tmp(self) -> None:
        shutil.rmtree(self.car / "tmp")
        done = self.car.run("look")
        self.assertEqual(done.status, 1)
        self.assertIn("there is no folder /tmp", done.line("where /tmp is"))
        self.assertFalse((self.car / "tmp").exists())

    @unittest.skipUnless(is_root(), "only root can become another user")
    def test_tmp_cannot_be_written(self) -> None:
        (self.car / "tmp").chmod(0o755)
        for put in (lambda: None, self.put_older_outputs):
            put()
            for shell in SHELLS:
                self.check("differs", "what it does to /tmp", "cannot be written", is_ordinary=True,
                           shell=shell)

    def test_tmp_is_a_link(self) -> None:
        (self.car / "tmp").rename(self.car / "home/tmp")
        (self.car / "tmp").symlink_to("home/tmp")
        self.put_older_outputs()
        before = snapshot(self.car / "home/tmp")
        done = self.car.run("look")
        self.assertEqual(snapshot(self.car / "home/tmp"), before)
        self.assertEqual((done.status, done.lines("differs")), (0, []))
        self.assertEqual(done.line("where /tmp is"),
                         "ok       where /tmp is: /tmp is a link to /home/tmp")

    def test_a_place_that_a_terminal_would_obey(self) -> None:
        (self.car / "tmp").rename(self.car / "home/t\x1b[2J")
        (self.car / "tmp").symlink_to("home/t\x1b[2J")
        path = self.car.wrap("echo 'a on /fs type qn\033[2Jx6'\n", "mount")
        for shell in SHELLS:
            done = self.car.run("look", path=path, shell=shell)
            self.assertEqual(done.line("where /tmp is"),
                             "ok       where /tmp is: /tmp is a link to (not printable)")
            self.assertEqual(done.line("where the image is"),
                             "ok       where the image is: /fs/tmpfs, mounted at (not printable); a file")
            done = self.car.run("look", "/home/a\\033[2J", shell=shell)
            self.assertEqual(done.err, "orvane-field: (not printable) is not a program here\n")

    def test_tmp_is_shared_memory(self) -> None:
        (self.car / "dev/shmem").mkdir()
        shutil.rmtree(self.car / "tmp")
        (self.car / "tmp").symlink_to("/dev/shmem")
        self.assertIn("shared memory", self.car.run("look").line("unknown  where /tmp is"))

    def test_where_tmp_is_mounted(self) -> None:
        path = self.car.wrap("echo 'a on / type qnx6'\necho 'b on /tmp type shmem (rw)'\n"
                             "echo nonsense\necho 'c on /tmp/x type y'\n", "mount")
        done = self.look(path=path)
        self.assertIn("/tmp, mounted at /tmp as shmem", done.line("where /tmp is"))
        self.assertIn("/fs/tmpfs, mounted at / as qnx6;", done.line("where the image is"))

    def test_another_system(self) -> None:
        self.check("differs", "a system that orvane", "Plan9", path=self.car.wrap("echo Plan9\n", "uname"))

    def test_libraries(self) -> None:
        for said, line in (
                ("libc.so.3 => /lib/libc.so.3 (0x1)\nlibm.so.2 => /lib/libm.so.2 (0x2)",
                 "ok       the libraries that it finds: /lib/libc.so.3 /lib/libm.so.2"),
                ("libx.so => /bin/* (0x1)\nliby.so => /lib/\033y", "ok       the libraries that it finds: "
                 "/bin/* (not printable)"),
                ("libc.so.3 => /lib/libc.so.3 (0x1)\nlibgone.so => not found",
                 "differs  the libraries that it finds: libgone.so => not found"),
                ("not a dynamic executable", "ok       the libraries that it finds: it needs none"),
                ("what?", "unknown  the libraries that it finds: ldd ends with 0: what?")):
            path = self.car.wrap(f"echo '{said}'\n", "ldd")
            self.assertEqual(self.look(path=path).line("the libraries"), line)

    def test_the_usage_record(self) -> None:
        for said, kind in (("Usage: orvane <options>\n\nOptions:\n  -i -- x\n  -a -- y", "ok "),
                           ("No use message", "differs "),
                           ("Usage: orvane <options>\n\nOptions:\n  -a -- x\n  -i -- y", "differs ")):
            path = self.car.wrap(f"echo '{said}'\n", "use")
            self.assertTrue(self.look(path=path).line("the usage record").startswith(kind), said)


if __name__ == "__main__":
    unittest.main()
