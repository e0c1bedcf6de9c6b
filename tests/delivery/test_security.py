# SPDX-License-Identifier: Apache-2.0
"""What SECURITY.md says about the program orvane: what it opens, and what others can do in /tmp."""

from __future__ import annotations

import os
import re
import subprocess
import tempfile
import unittest
from pathlib import Path

from shipped import PROJECT

# Changing the root needs the privilege, or a user namespace; orvane-enter makes one.
ENTER = os.environ.get("ORVANE_ENTER", "")
OUTPUTS = {"airplay.conf", "telephony_FFFF.txt", "speechrec_FFFF.txt", "iap2_device.cfg", "iap2.cfg", "iap1.cfg"}
TEMPLATES = ("airplay_static.conf", "iap2_device_static.cfg", "mm/iap2_static.cfg", "mm/iap1_static.cfg")
INPUTS = {"/fs/tmpfs/VS_DIAG_SERVICE_CONFIG_SHARED_MEM", "/dev/hd0", "/fs/rwdata/.Version/",
          *(f"/fs/mp/etc/{name}" for name in TEMPLATES),
          *(f"/fs/mp/etc/{name.replace('_static', '')}" for name in TEMPLATES)}
VERSION_FILE = re.compile(r"/fs/rwdata/\.Version/[^/]*\.inf[^/]*")

CALL = re.compile(r"(?:\d+ +)?(?P<name>\w+)\((?P<words>.*)\) += ")
OPENED = re.compile(r'AT_FDCWD, "(?P<path>[^"]+)", (?P<how>[A-Z_|]+(?:, 0\d+)?)')
# Of a folder; the C library adds them.
HARMLESS = re.compile(r"\|O_(NONBLOCK|CLOEXEC|DIRECTORY|LARGEFILE)")

# What a static C library looks at by itself: its own name, and whether a descriptor is a folder.
OF_THE_LIBRARY = re.compile(r'readlink(at)?\((AT_FDCWD, )?"/proc/self/exe"|(newfstatat|statx)\(\d+, ""|fstat')


@unittest.skipIf(os.environ.get("ORVANE_PROCESSOR") == "arm", "orvane-unit is not built in its tests")
class SecurityTest(unittest.TestCase):
    def setUp(self) -> None:
        holder = tempfile.TemporaryDirectory(prefix="orvane security-")
        self.addCleanup(holder.cleanup)
        self.unit = Path(holder.name) / "unit"
        self.report = Path(holder.name) / "report"
        subprocess.run([Path(os.environ["ORVANE_BUILD"]) / "orvane-unit", "new", self.unit], check=True)
        self.tmp = self.unit / "tmp"

    def run_orvane(self, *before: str | Path, environment: dict[str, str] | None = None) -> None:
        done = subprocess.run([*before, ENTER, self.unit, os.environ["ORVANE"], "-a", "-i"], capture_output=True,
                              env=environment, umask=0o027, check=False)
        self.assertEqual((done.returncode, done.stdout, done.stderr), (0, b"", b""))

    def outputs(self) -> dict[str, bytes]:
        return {name: (self.tmp / name).read_bytes() for name in OUTPUTS}

    def calls(self) -> list[tuple[str, str]]:
        """Of the program alone, with names of files, of processes and of networks."""
        self.run_orvane("strace", "-f", "-o", self.report, "-e", "trace=%file,%process,%network")
        _, _, own = self.report.read_text().partition("execveat(")
        lines = own.splitlines()[1:]
        self.assertIn("exited with 0", lines[-1])
        found = [CALL.match(line) for line in lines if not OF_THE_LIBRARY.search(line)]
        return [(call["name"], call["words"]) for call in found if call and call["name"] != "exit_group"]

    def check_calls(self) -> set[str]:
        """Returns what was opened."""
        paths = set()
        for name, words in self.calls():
            opened = OPENED.match(words)
            assert name in ("openat", "open") and opened, f"{name}({words})"
            path, how = opened["path"], HARMLESS.sub("", opened["how"])
            if path.startswith("/tmp/"):
                self.assertIn(path.removeprefix("/tmp/"), OUTPUTS)
                self.assertEqual(how, "O_WRONLY|O_CREAT|O_TRUNC, 0666", path)
            else:
                self.assertTrue(path in INPUTS or VERSION_FILE.fullmatch(path), path)
                self.assertEqual(how, "O_RDONLY", path)
            paths.add(path)
        return paths

    def test_a_run_opens_its_inputs_and_outputs_and_does_nothing_else(self) -> None:
        self.assertLessEqual({f"/tmp/{name}" for name in OUTPUTS} | {"/dev/hd0"}, self.check_calls())

    def test_nor_does_one_that_installs_stock_files(self) -> None:
        for name in TEMPLATES:
            (self.unit / "fs/mp/etc" / name).unlink()
        self.assertLessEqual({"/fs/mp/etc/airplay.conf", "/fs/mp/etc/iap2_device.cfg", "/fs/mp/etc/mm/iap2.cfg"},
                             self.check_calls())

    def test_no_environment_changes_an_output(self) -> None:
        self.run_orvane(environment={})
        expected = self.outputs()
        trap = str(self.report)
        for name in ("LD_PRELOAD", "LD_LIBRARY_PATH", "LD_AUDIT", "TMPDIR", "PATH", "HOME", "IFS", "ENV"):
            with self.subTest(name=name):
                self.run_orvane(environment={name: trap})
                self.assertEqual(self.outputs(), expected)
        self.run_orvane(environment={"LC_ALL": "tr_TR.UTF-8", "LANGUAGE": "de", "POSIXLY_CORRECT": "1",
                                     "MALLOC_PERTURB_": "85", "GLIBC_TUNABLES": "glibc.malloc.perturb=85",
                                     "GETCONF_DIR": trap, "NLSPATH": trap, "LOCPATH": trap})
        self.assertEqual(self.outputs(), expected)
        self.assertFalse(self.report.exists())

    def test_nothing_that_lies_in_tmp_gets_into_an_output(self) -> None:
        self.run_orvane()
        expected = self.outputs()
        for path in OUTPUTS | {"airplay_static.conf", "application.inf", "core", "orvane.conf"}:
            (self.tmp / path).write_bytes(b"planted = 1\n" * 10000)
        self.run_orvane()
        self.assertEqual(self.outputs(), expected)

    def test_a_planted_link_leads_the_output_to_its_target(self) -> None:
        self.run_orvane()
        expected = self.outputs()
        for name in OUTPUTS:
            (self.tmp / name).unlink()
            target = self.unit / f"{name}.target"
            target.write_text("precious\n")
            target.chmod(0o600)
            (self.tmp / name).symlink_to(f"/{target.name}")
        self.run_orvane()
        for name in OUTPUTS:
            target = self.unit / f"{name}.target"
            self.assertEqual(target.read_bytes(), expected[name], name)
            self.assertEqual(target.stat().st_mode & 0o777, 0o600, name)
            self.assertTrue((self.tmp / name).is_symlink())

    def test_a_planted_link_to_nothing_makes_its_target(self) -> None:
        (self.tmp / "airplay.conf").symlink_to("/made")
        self.run_orvane()
        self.assertEqual((self.unit / "made").stat().st_mode & 0o777, 0o640)

    def test_a_file_that_is_there_keeps_its_mode_and_its_other_names(self) -> None:
        own = self.tmp / "iap2.cfg"
        own.write_text("mine\n")
        own.chmod(0o666)
        other = self.unit / "other"
        other.hardlink_to(own)
        self.run_orvane()
        self.assertEqual(own.stat().st_mode & 0o777, 0o666)
        self.assertTrue(own.samefile(other))
        self.assertIn("[accessory]", other.read_text())

    def test_a_folder_in_the_place_of_iap2_makes_iap1_its_stock_file(self) -> None:
        stock = (self.unit / "fs/mp/etc/mm/iap1.cfg").read_bytes()
        self.run_orvane()
        self.assertNotEqual((self.tmp / "iap1.cfg").read_bytes(), stock)
        (self.tmp / "iap2.cfg").unlink()
        (self.tmp / "iap2.cfg").mkdir()
        self.run_orvane()
        self.assertEqual((self.tmp / "iap1.cfg").read_bytes(), stock)

    def test_a_pipe_at_an_output_holds_the_run_up(self) -> None:
        os.mkfifo(self.tmp / "airplay.conf")
        with subprocess.Popen([ENTER, self.unit, os.environ["ORVANE"], "-a", "-i"]) as run, \
                (self.tmp / "airplay.conf").open("rb") as pipe:
            self.assertIn(b"name = CarPlay\n", pipe.read())
            self.assertEqual(run.wait(), 0)

    def test_every_test_that_the_document_names_exists(self) -> None:
        text = (PROJECT / "SECURITY.md").read_text(encoding="utf-8")
        named = set(re.findall(r"`(test_\w+|\w+Test(?:\.\w+)?|test_\w+\.py|[a-z_]+_test\.cpp)`", text))
        self.assertGreater(len(named), 15)
        paths = [path for path in (PROJECT / "tests").rglob("*") if path.suffix in (".py", ".cpp")]
        tests = "\n".join(path.read_text(encoding="utf-8") for path in paths)
        for name in sorted(named):
            with self.subTest(name=name):
                suite, _, test = name.partition(".")
                if test in ("py", "cpp"):
                    self.assertIn(name, {path.name for path in paths})
                elif suite.startswith("test_"):
                    self.assertIn(f"    def {name}(self) -> None:", tests)
                else:
                    self.assertRegex(tests, rf"TEST(_F|_P)?\({suite}, {test}")


if __name__ == "__main__":
    unittest.main()
