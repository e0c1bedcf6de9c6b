# SPDX-License-Identifier: Apache-2.0
"""`orvane-field look` sees what a unit has, notices what it lacks, and leaves no trace."""

from __future__ import annotations

import os
import shutil
import signal
import subprocess
import sys
import unittest
from pathlib import Path

from car import (DISK, IMAGE, LOOK_UTILITIES, ORVANE_UNIT, OUTPUTS, SHELLS, SIGNALLER, VERSIONS, Car,
                 Done, is_root, snapshot)

PROJECT = Path(__file__).resolve().parents[2]
sys.path.append(str(PROJECT / "tests/documents"))
from run_documents import blocks, matches  # noqa: E402

DOCUMENT = PROJECT / "docs/deploy.md"
OLD = b"of an earlier boot\n" * 200


class LookTest(unittest.TestCase):
    car: Car

    @classmethod
    def setUpClass(cls) -> None:
        cls.car = Car()
        cls.addClassCleanup(cls.car.close)

    def setUp(self) -> None:
        self.car.reset()

    def set(self, *assignments: str) -> None:
        marker = self.car / ".orvane-unit"
        marker.write_text("made by orvane-unit, layout 1\n")
        subprocess.run([ORVANE_UNIT, "set", self.car.root, *assignments], check=True)
        marker.unlink()

    def look(self, *words: str, **given: object) -> Done:
        """Looks, and requires that no run changes anything in /tmp."""
        before = snapshot(self.car / "tmp")
        done = self.car.run("look", *words, **given)
        self.assertEqual(snapshot(self.car / "tmp"), before, done)
        return done

    def put_older_outputs(self) -> None:
        for name, mode in zip(OUTPUTS, (0o600, 0o640, 0o644, 0o444, 0o755)):  # all but the last
            (self.car / "tmp" / name).unlink(missing_ok=True)
            (self.car / "tmp" / name).write_bytes(OLD)
            (self.car / "tmp" / name).chmod(mode)
        (self.car / "tmp/other").write_bytes(b"somebody else's")


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

    def test_what_it_says_is_what_is_there(self) -> None:
        done = self.look()
        for line in ("the image arrives: audio profile 65535",
                     "the brand and the drive side arrive: brand QUARION, drive side 1",
                     "the model arrives: Quarion Velmira", "the serial arrives: SN004217",
                     "the version arrives: 3.10.2_rc, from application.inf; applications: 1",
                     "the digits of the version arrive: 030a02",
                     "/tmp/telephony_FFFF.txt arrives: 45 lines",
                     "the modes are 0666 less the mask: with the mask 027 all -rw-r-----",
                     "where /tmp lies: /tmp", "where the image lies: /fs/tmpfs; a file"):
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
        self.assertIn("ok ", self.look().line("the modes that stand"))
        (self.car / "tmp/iap2.cfg").chmod(0o666)
        line = self.look().line("the modes that stand")
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
        self.assertEqual(done.line("where the image lies"),
                         "differs  where the image lies: /fs/tmpfs; missing")

    def test_an_image_that_is_not_filled(self) -> None:
        (self.car / IMAGE).write_bytes(b"")
        self.check("differs", "where the image lies", "it is empty")

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
        self.check("differs", "/tmp/iap2_device.cfg comes whole", "nothing to be read")

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
        self.assertIn("there is no folder /tmp", done.line("where /tmp lies"))
        self.assertFalse((self.car / "tmp").exists())

    def test_tmp_is_a_link(self) -> None:
        (self.car / "tmp").rename(self.car / "home/tmp")
        (self.car / "tmp").symlink_to("home/tmp")
        self.put_older_outputs()
        before = snapshot(self.car / "home/tmp")
        done = self.car.run("look")
        self.assertEqual(snapshot(self.car / "home/tmp"), before)
        self.assertEqual((done.status, done.lines("differs")), (0, []))
        self.assertEqual(done.line("where /tmp lies"),
                         "ok       where /tmp lies: /tmp is a link to /home/tmp")

    def test_tmp_is_shared_memory(self) -> None:
        (self.car / "dev/shmem").mkdir()
        shutil.rmtree(self.car / "tmp")
        (self.car / "tmp").symlink_to("/dev/shmem")
        self.assertIn("shared memory", self.car.run("look").line("unknown  where /tmp lies"))

    def test_where_tmp_is_mounted(self) -> None:
        path = self.car.wrap("echo 'a on / type qnx6'\necho 'b on /tmp type shmem (rw)'\n"
                             "echo nonsense\necho 'c on /tmp/x type y'\n", "mount")
        done = self.look(path=path)
        self.assertIn("/tmp, mounted at /tmp as shmem", done.line("where /tmp lies"))
        self.assertIn("/fs/tmpfs, mounted at / as qnx6;", done.line("where the image lies"))

    def test_another_system(self) -> None:
        self.check("differs", "a system that orvane", "Plan9", path=self.car.wrap("echo Plan9\n", "uname"))

    def test_libraries(self) -> None:
        for said, line in (
                ("libc.so.3 => /lib/libc.so.3 (0x1)\nlibm.so.2 => /lib/libm.so.2 (0x2)",
                 "ok       the libraries that it finds: /lib/libc.so.3 /lib/libm.so.2"),
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


class OtherOrvaneTest(LookTest):
    """Every reliance that a system may lack, shown by a program that behaves as there."""

    def check(self, text: str, question: str, seen: str = "") -> Done:
        self.put_older_outputs()
        self.car.program("home/orvane", text)
        done = self.look("/home/orvane")
        self.assertEqual(done.status, 1)
        line = done.line(question)
        self.assertTrue(line.startswith("differs "), line)
        self.assertIn(seen, line)
        return done

    def test_it_does_not_start(self) -> None:
        done = self.check("echo 'cannot load libx' >&2\nexit 1\n", "it starts:", 'says "cannot load libx"')
        self.assertIn("not tried", done.line("what it does"))

    def test_it_ends_with_another_status(self) -> None:
        self.check("exit 3\n", "it starts:", "exit status 3")

    def test_it_speaks(self) -> None:
        self.check('[ $# = 0 ] || echo hello\nexec /bin/orvane "$@"\n', "silence and", 'says "hello"')

    def test_it_fails(self) -> None:
        self.check('/bin/orvane "$@"\n[ $# = 0 ]\n', "silence and exit status", "exit status 1")

    def test_a_plain_word_does_not_end_the_options(self) -> None:
        self.check('[ "${1-}" != x ] || shift\nexec /bin/orvane "$@"\n', "a plain word", "makes airplay")

    def test_an_unknown_option_is_not_named(self) -> None:
        self.check('[ "${1-}" != -z ] || shift\nexec /bin/orvane "$@"\n', "differs  an unknown option:")

    def test_an_unknown_option_ends_all(self) -> None:
        self.check('[ "${1-}" != -z ] || { echo z >&2; exit 0; }\nexec /bin/orvane "$@"\n',
                   "what stands behind an", "makes nothing")

    def test_files_are_not_made_anew(self) -> None:
        done = self.check(
            "[ $# != 0 ] || exit 0\nfor n in airplay.conf iap2.cfg; do\n"
            "  /bin/mv /tmp/$n /home/old 2>/dev/null && /bin/mv /home/old /home/old.$n\ndone\n"
            '/bin/orvane "$@"\nfor n in airplay.conf iap2.cfg; do\n'
            "  [ ! -e /home/old.$n ] || {\n    skip=0\n    while IFS= read -r l; do skip=$((skip + 1)); done"
            " </tmp/$n\n    i=0\n    while IFS= read -r l; do i=$((i + 1)); [ $i -le $skip ] ||"
            ' echo "$l"; done </home/old.$n >>/tmp/$n\n  }\n  /bin/rm -f /home/old.$n\ndone\n',
            "/tmp/airplay.conf is made anew", "its content is not the same")
        self.assertTrue(done.line("/tmp/iap2.cfg is made anew").startswith("differs"))
        self.assertTrue(done.line("/tmp/iap1.cfg is made anew").startswith("ok"))

    def test_a_file_is_cut_short(self) -> None:
        self.check('/bin/orvane "$@"\n[ ! -e /tmp/iap1.cfg ] || echo name >/tmp/iap1.cfg\n',
                   "/tmp/iap1.cfg comes whole", "its end is another")

    def test_a_file_is_not_made(self) -> None:
        self.check('/bin/orvane "$@"\n[ $# = 0 ] || /bin/rm -f /tmp/iap1.cfg\n', "/tmp/iap1.cfg comes whole",
                   "it is not made")

    def test_the_mask_is_ignored(self) -> None:
        self.check('umask 0\nexec /bin/orvane "$@"\n', "the modes are", "airplay.conf -rw-rw-rw-")

    def test_the_version_is_another(self) -> None:
        self.check('/bin/orvane "$@"\n[ $# = 0 ] || [ ! -e /tmp/iap2_device.cfg ] || '
                   "echo firmware_version=0 >/tmp/iap2_device.cfg\n", "the version arrives",
                   "no application")

    def test_a_tuning_file_is_missing(self) -> None:
        self.check('/bin/orvane "$@"\n[ $# = 0 ] || /bin/rm -f /tmp/speechrec_FFFF.txt\n', "speechrec_FFFF.txt arrives",
                   "not there")


class SomethingInThePlaceOfAnOutputTest(LookTest):
    def test_a_link_is_left_alone_and_so_is_its_target(self) -> None:
        for target in ("/home/target", "/home/nothing"):
            for shell in SHELLS:
                with self.subTest(target=target, shell=shell):
                    self.car.reset()
                    (self.car / "home/target").write_bytes(OLD)
                    (self.car / "tmp/airplay.conf").symlink_to(target)
                    before = snapshot(self.car / "home")
                    done = self.look(shell=shell)
                    self.assertEqual(snapshot(self.car / "home"), before)
                    self.assertIn("-a, since /tmp/airplay.conf is a link", done.line("not all is tried"))
                    self.assertNotIn("audio profile", done.out)
                    self.assertTrue(done.line("the serial arrives").startswith("ok"))
                    self.assertEqual(done.status, 0)

    def test_a_pipe_and_a_device_are_not_opened(self) -> None:
        os.mkfifo(self.car / "tmp/speechrec_FFFF.txt")
        os.mkfifo(self.car / "tmp/iap1.cfg")
        done = self.look()
        self.assertIn("-a, since /tmp/speechrec_FFFF.txt is a pipe; -i, since /tmp/iap1.cfg is a pipe",
                      done.line("not all is tried"))

    def test_a_folder_is_seen_and_left_alone(self) -> None:
        (self.car / "tmp/iap2.cfg").mkdir()
        (self.car / "tmp/iap2.cfg/inner").write_text("x")
        for shell in SHELLS:
            with self.subTest(shell):
                done = self.look(shell=shell)
                self.assertEqual(done.status, 1)
                self.assertIn("a folder stands there", done.line("/tmp/iap2.cfg comes whole"))

    def test_a_file_that_would_be_overwritten_by_what_is_put_aside(self) -> None:
        self.put_older_outputs()
        # The name has the number of the process, which a program of that process can tell.
        path = self.car.wrap('read -r pid </pid\necho kept >/tmp/orvane-field-$pid-kept.airplay.conf\n',
                             "uname")
        done = self.car.run("look", path=path)
        self.assertIn("-kept.airplay.conf or", done.line("not all is tried"))
        left = [name.name for name in (self.car / "tmp").glob("orvane-field-*")]
        self.assertEqual(len(left), 1)
        self.assertEqual((self.car / "tmp" / left[0]).read_text(), "kept\n")
        self.assertEqual((self.car / "tmp/airplay.conf").read_bytes(), OLD)


class TroubleTest(LookTest):
    def test_wrong_use(self) -> None:
        for shell in SHELLS:
            for words in ((), ("look", "a", "b"), ("capture",), ("see",), ("",), ("--look",)):
                with self.subTest(shell=shell, words=words):
                    done = self.car.run(*words, shell=shell)
                    self.assertEqual((done.status, done.out), (2, ""))
                    self.assertTrue(done.err.startswith("usage: orvane-field look [ORVANE]\n"))
            done = self.car.run("look", "/nothing", shell=shell)
            self.assertEqual((done.status, done.out), (2, ""))
            self.assertEqual(done.err, "orvane-field: /nothing is not a program here\n")

    def test_help(self) -> None:
        done = self.car.run("--help")
        self.assertEqual((done.status, done.err), (0, ""))
        self.assertTrue(done.out.startswith("usage: orvane-field look [ORVANE]\n"))

    def test_a_missing_utility_is_told_before_anything_else(self) -> None:
        for shell in SHELLS:
            for utility in LOOK_UTILITIES:
                with self.subTest(shell=shell, utility=utility):
                    self.car.reset()
                    self.put_older_outputs()
                    done = self.look(shell=shell, path=self.car.without(utility))
                    self.assertEqual((done.status, done.out, done.err),
                                     (2, "", f"orvane-field: missing here: {utility}\n"))

    def test_other_utilities_may_be_missing(self) -> None:
        for utility, question in (("ls", "the modes are"), ("uname", "a system that"),
                                  ("mount", "where /tmp lies"), ("dd", "silence and")):
            done = self.look(path=self.car.without(utility))
            self.assertEqual((done.status, done.err), (0, ""), utility)
            self.assertIn("unknown" if utility in ("ls", "uname") else "ok", done.line(question))

    def test_nothing_can_be_put_aside(self) -> None:
        self.put_older_outputs()
        done = self.look(path=self.car.wrap("exit 1\n", "mv"))
        self.assertIn("-a, since /tmp/airplay.conf cannot be put aside", done.line("not all is tried"))
        self.assertEqual(done.err, "")

    def test_putting_aside_copies_and_breaks_off(self) -> None:
        """As where a file can't be renamed and there is no room for another."""
        self.put_older_outputs()
        path = self.car.wrap('case $1 in\n*/iap2.cfg) echo part >"$2"; exit 1 ;;\nesac\nexec /bin/mv "$@"\n',
                             "mv")
        done = self.look(path=path)
        self.assertIn("-i, since /tmp/iap2.cfg cannot be put aside", done.line("not all is tried"))
        self.assertIn("ok", done.line("the image arrives"))

    def test_what_cannot_be_put_back_is_named(self) -> None:
        self.put_older_outputs()
        path = self.car.wrap('case $*:$# in\n*/iap2.cfg:3) exit 1 ;;\nesac\nexec /bin/mv "$@"\n', "mv")
        done = self.car.run("look", path=path)
        self.assertEqual(done.status, 1)
        self.assertRegex(done.err, r"cannot put back /tmp/iap2.cfg: it is /tmp/orvane-field-\d+-kept")
        kept = list((self.car / "tmp").glob("orvane-field-*"))
        self.assertEqual([path.read_bytes() for path in kept], [OLD])

    def test_a_full_disk(self) -> None:
        for shell in SHELLS:
            for size in (0, 100, 800):
                with self.subTest(shell=shell, size=size):
                    self.car.reset()
                    self.put_older_outputs()
                    done = self.look(shell=shell, largest_file=size)
                    self.assertEqual(done.status, 1)
                    self.assertEqual(done.err, "")

    def test_nobody_reads_what_it_says(self) -> None:
        self.put_older_outputs()
        for shell in SHELLS:
            reading, writing = os.pipe()
            os.close(reading)
            done = self.look(shell=shell, output=writing)
            os.close(writing)
            self.assertNotEqual(done.status, 0)


class InterruptedTest(LookTest):
    """A signal at every call of a utility or of orvane: the script alone gets it, or both do."""

    SIGNALS = ("INT", "TERM", "HUP", "QUIT", "PIPE")

    def interrupted(self, step: int, reaches: str, name: str, shell: str) -> Done:
        (self.car / "home/count").unlink(missing_ok=True)
        return self.look(shell=shell, path="/wrap:/bin",
                         environment={"AT": str(step), "REACHES": reaches, "SIGNAL": name})

    def test_every_step(self) -> None:
        self.put_older_outputs()
        self.car.wrap(SIGNALLER, "mv", "rm", "ls", "uname", "mount", "orvane")
        self.assertEqual(self.interrupted(0, "script", "INT", "dash").status, 0)
        steps = int((self.car / "home/count").read_text())
        self.assertGreater(steps, 30)
        shells = list(SHELLS)
        stopped = 0
        for step in range(1, steps + 1):
            reaches = ("script", "both")[step % 2]
            shell = shells[step % len(shells)]
            name = self.SIGNALS[step % len(self.SIGNALS)]
            number = signal.Signals[f"SIG{name}"]
            with self.subTest(step=step, reaches=reaches, shell=shell, signal=name):
                done = self.interrupted(step, reaches, name, shell)
                # Early it touches nothing yet and simply ends; while it puts back it goes on.
                self.assertIn(done.status, (0, -number, 128 + number))
                # Some shells say more, of the utility that ended by the signal.
                if done.err.endswith(f"orvane-field: stopped by SIG{name}; /tmp is as it was\n"):
                    self.assertEqual(done.status, 128 + number)
                    stopped += 1
                else:
                    self.assertNotIn("orvane-field", done.err)
        self.assertGreater(stopped, steps // 2)


if __name__ == "__main__":
    unittest.main()
