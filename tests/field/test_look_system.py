# SPDX-License-Identifier: Apache-2.0
"""`orvane-field look` notices every behaviour that another system might lack."""

from __future__ import annotations

import unittest

from car import SHELLS, Done
from look_case import LookTest


class OtherOrvaneTest(LookTest):
    """Programs that behave as orvane would on a system that lacks something it relies on."""

    def check(self, text: str, question: str, seen: str = "", **given: object) -> Done:
        self.put_older_outputs()
        self.car.program("home/orvane", text)
        done = self.look("/home/orvane", **given)
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

    def test_it_prints_something(self) -> None:
        self.check('[ $# = 0 ] || echo hello\nexec /bin/orvane "$@"\n', "silence and", 'says "hello"')

    def test_it_fails(self) -> None:
        self.check('/bin/orvane "$@"\n[ $# = 0 ]\n', "silence and exit status", "exit status 1")

    def test_a_plain_word_does_not_end_the_options(self) -> None:
        self.check('[ "${1-}" != x ] || shift\nexec /bin/orvane "$@"\n', "a plain word", "makes airplay")

    def test_an_unknown_option_is_not_named(self) -> None:
        self.check('[ "${1-}" != -z ] || shift\nexec /bin/orvane "$@"\n', "differs  an unknown option:")

    def test_an_unknown_option_ends_the_options(self) -> None:
        self.check('[ "${1-}" != -z ] || { echo z >&2; exit 0; }\nexec /bin/orvane "$@"\n',
                   "options after an unknown", "makes nothing")

    def test_files_are_not_made_anew(self) -> None:
        done = self.check(
            "[ $# != 0 ] || exit 0\nfor n in airplay.conf iap2.cfg; do\n"
            "  /bin/mv /tmp/$n /home/old 2>/dev/null && /bin/mv /home/old /home/old.$n\ndone\n"
            '/bin/orvane "$@"\nfor n in airplay.conf iap2.cfg; do\n'
            "  [ ! -e /home/old.$n ] || {\n    skip=0\n    while IFS= read -r l; do skip=$((skip + 1)); done"
            " </tmp/$n\n    i=0\n    while IFS= read -r l; do i=$((i + 1)); [ $i -le $skip ] ||"
            ' echo "$l"; done </home/old.$n >>/tmp/$n\n  }\n  /bin/rm -f /home/old.$n\ndone\n',
            "/tmp/airplay.conf replaces a longer one", "its content is not the same")
        self.assertTrue(done.line("/tmp/iap2.cfg replaces a longer one").startswith("differs"))
        self.assertTrue(done.line("/tmp/iap1.cfg replaces a longer one").startswith("ok"))

    def test_a_file_is_cut_short(self) -> None:
        self.check('/bin/orvane "$@"\n[ ! -e /tmp/iap1.cfg ] || echo name >/tmp/iap1.cfg\n',
                   "/tmp/iap1.cfg comes whole", "its end is different")

    def test_a_template_that_ends_with_an_empty_line_is_left_out(self) -> None:
        """The generated lines end with one, too."""
        (self.car / "fs/mp/etc/mm/iap2_static.cfg").write_text("a\n\n")
        self.check('/bin/orvane "$@"\n[ -e /tmp/iap2.cfg ] || exit 0\nwhile IFS= read -r l; do echo "$l"\n'
                   '[ -n "$l" ] || break; done </tmp/iap2.cfg >/home/cut\n/bin/mv /home/cut /tmp/iap2.cfg\n',
                   "/tmp/iap2.cfg comes whole", "9 lines, but its end is different")

    def test_it_writes_before_it_is_asked_to(self) -> None:
        self.check("echo >/tmp/airplay.conf\nexit 1\n", "it starts:", "exit status 1")

    def test_a_file_is_not_made(self) -> None:
        self.check('/bin/orvane "$@"\n[ $# = 0 ] || /bin/rm -f /tmp/iap1.cfg\n', "/tmp/iap1.cfg comes whole",
                   "it is not made")

    def test_the_mask_is_ignored(self) -> None:
        self.check('umask 0\nexec /bin/orvane "$@"\n', "the modes are", "airplay.conf -rw-rw-rw-")

    def test_the_version_is_another(self) -> None:
        self.check('/bin/orvane "$@"\n[ $# = 0 ] || [ ! -e /tmp/iap2_device.cfg ] || '
                   "echo firmware_version=0 >/tmp/iap2_device.cfg\n", "the version arrives",
                   "no application")

    def test_the_version_is_another_and_the_last_line_has_no_end(self) -> None:
        (self.car / "fs/rwdata/.Version/b.inf").write_bytes(b"\xff \\n\n\nType=Application\nVersion Number=8")
        for shell in SHELLS:
            self.check('/bin/orvane "$@"\n[ $# = 0 ] || [ ! -e /tmp/iap2_device.cfg ] || '
                       "echo firmware_version=0 >/tmp/iap2_device.cfg\n", "the version arrives",
                       "no application", shell=shell)

    def test_a_tuning_file_is_missing(self) -> None:
        self.check('/bin/orvane "$@"\n[ $# = 0 ] || /bin/rm -f /tmp/speechrec_FFFF.txt\n',
                   "speechrec_FFFF.txt arrives", "not there")


if __name__ == "__main__":
    unittest.main()
