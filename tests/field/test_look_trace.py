# SPDX-License-Identifier: Apache-2.0
"""`orvane-field look` leaves no trace, whatever is in its way and whatever stops it."""

from __future__ import annotations

import os
import resource
import signal
import subprocess
import unittest

from car import LOOK_UTILITIES, SHELLS, SIGNALLER, Done, snapshot
from look_case import OLD, LookTest

# Leaves iap1.cfg empty where a longer one was.
CUTTER = """
longer=
[ ! -e /tmp/iap1.cfg ] || while read -r line; do
    case $line in longer*) longer=yes ;; esac
done </tmp/iap1.cfg
/bin/orvane "$@"
[ -z "$longer" ] || {
    true >/tmp/iap1.cfg
    FULL
}
exit 0
"""


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
                self.assertIn("a folder is there", done.line("/tmp/iap2.cfg comes whole"))

    def test_a_file_that_would_be_overwritten_by_what_is_put_aside(self) -> None:
        self.put_older_outputs()
        # The name contains the number of the process, which a program of that process can read.
        path = self.car.wrap('read -r pid </pid\necho kept >/tmp/orvane-field-$pid-kept.airplay.conf\n',
                             "uname")
        done = self.car.run("look", path=path)
        self.assertIn("-kept.airplay.conf or", done.line("not all is tried"))
        left = [name.name for name in (self.car / "tmp").glob("orvane-field-*")]
        self.assertEqual(len(left), 1)
        self.assertEqual((self.car / "tmp" / left[0]).read_text(), "kept\n")
        self.assertEqual((self.car / "tmp/airplay.conf").read_bytes(), OLD)


class TwoAtOnceTest(LookTest):
    def test_the_second_touches_nothing(self) -> None:
        self.put_older_outputs()
        for shell in SHELLS:
            (self.car / "tmp/orvane-field-lock").touch()
            done = self.look(shell=shell)
            self.assertEqual((done.status, done.lines("differs")), (0, []))
            self.assertIn("another look runs, or one was killed", done.line("what it does to /tmp"))
            (self.car / "tmp/orvane-field-lock").unlink()
            # The first one's orvane starts the second.
            self.car.program("home/orvane", "/bin/dash /bin/orvane-field look /bin/orvane >/home/second\n"
                             'exec /bin/orvane "$@"\n')
            self.look("/home/orvane", shell=shell)
            self.assertIn("another look runs", (self.car / "home/second").read_text())


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

    def test_a_missing_utility_is_reported_before_anything_else(self) -> None:
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
                                  ("mount", "where /tmp is"), ("dd", "silence and")):
            done = self.look(path=self.car.without(utility))
            self.assertEqual((done.status, done.err), (0, ""), utility)
            self.assertIn("unknown" if utility in ("ls", "uname") else "ok", done.line(question))

    def test_nothing_can_be_put_aside(self) -> None:
        self.put_older_outputs()
        done = self.look(path=self.car.wrap("exit 1\n", "mv"))
        self.assertIn("-a, since /tmp/airplay.conf cannot be put aside", done.line("not all is tried"))
        self.assertEqual(done.err, "")

    def test_putting_aside_copies_and_stops(self) -> None:
        """As when a file can't be renamed and there is no room for a copy."""
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

    def test_a_file_to_compare_with_cannot_be_renamed(self) -> None:
        path = self.car.wrap('case $2 in\n*-first.iap2.cfg) exit 1 ;;\nesac\nexec /bin/mv "$@"\n', "mv")
        done = self.look(path=path)
        self.assertEqual(done.line("/tmp/iap2.cfg replaces a longer one"),
                         "unknown  /tmp/iap2.cfg replaces a longer one: "
                         "the file to compare with cannot be renamed")
        self.assertEqual((done.status, done.lines("differs"), done.err), (0, [], ""))

    def test_there_is_little_room(self) -> None:
        """Room for less than one run at first, finally for the files of two."""
        shells = list(SHELLS)
        for size in range(1, 13):
            shell = shells[size % len(shells)]
            with self.subTest(shell=shell, pages=size):
                try:
                    done = self.look(shell=shell, room=("tmp", size * resource.getpagesize()))
                except subprocess.SubprocessError:
                    self.skipTest("nothing can be mounted here")
                self.assertEqual([line for line in done.lines("differs")
                                  if "replaces a longer one" in line], [])
                self.assertEqual("replaces a longer one" in "".join(done.lines("unknown")), size < 12)
                self.assertEqual((done.status, done.err), (int(size < 6), ""))

    def test_an_output_that_the_last_run_cuts_short(self) -> None:
        """The room is the cause only if nothing more can be written."""
        for full, word, seen in (("true", "differs", "its content is not the same"),
                                 ("/bin/dd if=/bin/orvane of=/tmp/other 2>/dev/null", "unknown",
                                  "it is cut short, since /tmp has no room for it")):
            self.car.program("home/orvane", CUTTER.replace("FULL", full))
            for shell in SHELLS:
                with self.subTest(shell=shell, full=full):
                    try:
                        done = self.look("/home/orvane", shell=shell, room=("tmp", 1 << 17))
                    except subprocess.SubprocessError:
                        self.skipTest("nothing can be mounted here")
                    self.assertEqual(done.line("/tmp/iap1.cfg replaces a longer one"),
                                     f"{word:9}/tmp/iap1.cfg replaces a longer one: {seen}")

    def test_a_folder_is_made_in_the_place_of_an_output(self) -> None:
        self.put_older_outputs()
        self.car.program("home/orvane", "[ $# != 0 ] || exit 0\n/bin/mkdir /tmp/iap2.cfg 2>/dev/null\nexit 0\n")
        done = self.car.run("look", "/home/orvane")
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

    def test_nobody_reads_the_output(self) -> None:
        self.put_older_outputs()
        for shell in SHELLS:
            reading, writing = os.pipe()
            os.close(reading)
            done = self.look(shell=shell, output=writing)
            os.close(writing)
            self.assertNotEqual(done.status, 0)


class InterruptedTest(LookTest):
    """A signal at every call of a utility or of orvane: only the script gets it, or both do."""

    SIGNALS = ("INT", "TERM", "HUP", "QUIT", "PIPE")

    def test_signals_that_nobody_sends_by_hand(self) -> None:
        self.put_older_outputs()
        self.car.wrap(SIGNALLER, "mv", "rm", "ls", "uname", "mount", "orvane")
        for shell in SHELLS:
            for name in ("ALRM", "USR1", "USR2", "VTALRM", "XCPU"):
                with self.subTest(shell=shell, signal=name):
                    done = self.interrupted(18, "script", name, shell)
                    self.assertTrue(done.err.endswith(f"stopped by SIG{name}; /tmp is as it was\n"), done)
                    self.assertEqual(done.status, 1)

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
                # Early it has changed nothing yet and simply ends; while it puts files back, it continues.
                self.assertIn(done.status, (0, -number, 128 + number))
                # Some shells also report the utility that the signal ended.
                if done.err.endswith(f"orvane-field: stopped by SIG{name}; /tmp is as it was\n"):
                    self.assertEqual(done.status, 128 + number)
                    stopped += 1
                else:
                    self.assertNotIn("orvane-field", done.err)
        self.assertGreater(stopped, steps // 2)


if __name__ == "__main__":
    unittest.main()
