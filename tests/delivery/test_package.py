# SPDX-License-Identifier: Apache-2.0
"""The packages hold what they should, install into a bare root, and their programs run there."""

from __future__ import annotations

import gzip
import json
import os
import subprocess
import tarfile
import tempfile
import unittest
from pathlib import Path

import bill_rules
from shipped import BILL, EVERYWHERE, IN_TARBALL, PROJECT, VERSION

DOCUMENTS = {str(path.relative_to(PROJECT)) for path in (PROJECT / "docs").rglob("*") if path.is_file()}
GZIP_TIME = slice(4, 8)  # bytes of a gzip header
# Changing the root and the owners of files needs the privilege, or a user namespace.
AS_ROOT = [] if os.geteuid() == 0 else ["unshare", "--map-root-user"]

# A user's PATH may lack the folders of the superuser's programs, such as chroot and ldconfig.
PATH = f"{os.environ['PATH']}:/usr/local/sbin:/usr/sbin:/sbin"

IN_PACKAGE = {f"usr/{name}" for name in EVERYWHERE | {
    "share/man/man1/orvane.1.gz", "share/man/man1/orvane-unit.1.gz",
    "share/bash-completion/completions/orvane-unit", "share/fish/vendor_completions.d/orvane-unit.fish",
    "share/zsh/site-functions/_orvane-unit", "share/zsh/vendor-completions/_orvane-unit",
    "share/doc/orvane/changelog.gz", "share/lintian/overrides/orvane",
    "share/doc/orvane/README.md", "share/doc/orvane/SECURITY.md"} | {f"share/doc/orvane/{name}" for name in DOCUMENTS}}


def call(*words: str | Path) -> str:
    done = subprocess.run(words, text=True, stdout=subprocess.PIPE, stderr=subprocess.STDOUT,
                          env={**os.environ, "PATH": PATH}, check=False)
    if done.returncode != 0:
        raise AssertionError(f"{words}: {done.returncode}\n{done.stdout}")
    return done.stdout


def inside(root: Path, *words: str) -> str:
    """Runs an installed program in the root where it was installed."""
    return call(*AS_ROOT, "chroot", root, *words)


def files(root: Path) -> set[str]:
    names = {str(path.relative_to(root)) for path in root.rglob("*")
             if not path.is_dir() or path.is_symlink()}
    return names - {"dev/null"}


def pack(folder: Path, generator: str, mask: int = 0o022, zone: str = "UTC") -> Path:
    environment = {**os.environ, "SOURCE_DATE_EPOCH": "1000000000", "TZ": zone}
    folder.mkdir()
    subprocess.run(["cpack", "-G", generator, "-B", folder], cwd=os.environ["ORVANE_BUILD"],
                   env=environment, check=True, stdout=subprocess.DEVNULL, umask=mask)
    found = [path for path in folder.iterdir() if path.is_file()]
    assert len(found) == 1, found
    return found[0]


@unittest.skipIf(os.environ.get("ORVANE_PROCESSOR") == "arm", "orvane-unit is not built in its tests")
class PackageTest(unittest.TestCase):
    folder: Path
    package: Path
    tarball: Path

    @classmethod
    def setUpClass(cls) -> None:
        holder = tempfile.TemporaryDirectory(prefix="orvane package-")
        cls.addClassCleanup(holder.cleanup)
        cls.folder = Path(holder.name)
        cls.package = pack(cls.folder / "deb", "DEB")
        cls.tarball = pack(cls.folder / "tgz", "TGZ")

    def bare_root(self) -> Path:
        """A root with only what every system has."""
        root = Path(tempfile.mkdtemp(dir=self.folder))
        (root / "dev").mkdir()
        (root / "dev/null").touch()
        return root

    def check_that_it_runs(self, root: Path, programs: str) -> None:
        self.assertEqual(inside(root, f"{programs}/orvane-unit", "--version"), f"{VERSION}\n")
        inside(root, f"{programs}/orvane-unit", "new", "/car")
        left = inside(root, f"{programs}/orvane-unit", "run", "/car", "--", "-a", "-i")
        self.assertIn("model = Quarion Velmira\n", left)
        # And alone: a root without templates is a unit of defaults.
        (root / "tmp").mkdir()
        self.assertEqual(inside(root, f"{programs}/orvane", "-a", "-i"), "")
        self.assertEqual(files(root / "tmp"),
                         {"airplay.conf", "iap1.cfg", "iap2.cfg", "iap2_device.cfg"})

    def test_names(self) -> None:
        processor = call("dpkg", "--print-architecture").strip()
        self.assertEqual(self.package.name, f"orvane_{VERSION}_{processor}.deb")
        self.assertEqual(self.tarball.name, f"orvane-{VERSION}-linux-{os.uname().machine}.tar.gz")

    def test_the_debian_package_installs_runs_and_is_removed(self) -> None:
        root = self.bare_root()
        database = root / "var/lib/dpkg"
        (database / "updates").mkdir(parents=True)
        (database / "info").mkdir()
        (database / "status").touch()
        dpkg = [*AS_ROOT, "dpkg", f"--root={root}", "--force-not-root", "--force-script-chrootless",
                "--log=/dev/null"]
        call(*dpkg, "--install", self.package)
        installed = {name for name in files(root) if not name.startswith("var/lib/dpkg")}
        self.assertEqual(installed, IN_PACKAGE)
        self.check_that_it_runs(root, "/usr/bin")
        call(*dpkg, "--purge", "orvane")
        self.assertFalse((root / "usr").exists())

    def test_the_debian_package_describes_itself(self) -> None:
        fields = call("dpkg-deb", "--field", self.package)
        for line in ("Package: orvane", f"Version: {VERSION}", "Section: devel",
                     "Maintainer: orvane developers <orvane@example.org>",
                     "Description: accessory configuration files for a vehicle head unit"):
            self.assertIn(line + "\n", fields)
        self.assertNotIn("Depends:", fields)  # static programs need nothing

    def test_the_tarball_unpacks_and_runs(self) -> None:
        root = self.bare_root()
        with tarfile.open(self.tarball) as archive:
            archive.extractall(root)
        self.assertEqual(files(root), IN_TARBALL)
        script = root / "bin/orvane-field"
        self.assertEqual(script.read_bytes(), (PROJECT / "field/orvane-field").read_bytes())
        self.assertEqual(script.stat().st_mode & 0o777, 0o755)
        self.check_that_it_runs(root, "/bin")

    def test_pages_are_compressed_without_a_date(self) -> None:
        root = self.bare_root()
        call("dpkg-deb", "--extract", self.package, root)
        for name, source in (("share/man/man1/orvane.1.gz", "man/orvane.1"),
                             ("share/man/man1/orvane-unit.1.gz", "man/orvane-unit.1")):
            packed = (root / "usr" / name).read_bytes()
            self.assertEqual(gzip.decompress(packed), (PROJECT / source).read_bytes())
            self.assertEqual(packed[GZIP_TIME], bytes(4), name)

    def test_the_bills_of_materials_name_all_files_and_libraries(self) -> None:
        for package, prefix, unpack in ((self.package, "usr/", ("dpkg-deb", "--extract", self.package)),
                                        (self.tarball, "", ("tar", "-xzf", self.tarball, "-C"))):
            root = self.bare_root()
            call(*unpack, root)
            bill = json.loads((root / prefix / BILL).read_text(encoding="utf-8"))
            content = {name: (root / name).read_bytes() for name in files(root) - {prefix + BILL}}
            with self.subTest(package=package.name):
                self.assertEqual(bill_rules.broken_rules(bill, content), [])

    def test_packing_again_with_another_mask_and_time_zone_gives_the_same_bytes(self) -> None:
        self.assertEqual(pack(self.folder / "deb again", "DEB", 0o077, "UTC-9").read_bytes(),
                         self.package.read_bytes())
        self.assertEqual(pack(self.folder / "tgz again", "TGZ", 0o077, "UTC-9").read_bytes(),
                         self.tarball.read_bytes())

    def test_cmake_installs_the_same_files(self) -> None:
        root = self.bare_root()
        call("cmake", "--install", os.environ["ORVANE_BUILD"], "--prefix", root / "usr")
        self.assertEqual(files(root), IN_PACKAGE - {f"usr/{BILL}"})


if __name__ == "__main__":
    unittest.main()
