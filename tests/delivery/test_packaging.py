# SPDX-License-Identifier: Apache-2.0
"""What makes a package's bytes independent of the place where it is packed, and Debian's changelog."""

from __future__ import annotations

import gzip
import io
import re
import subprocess
import sys
import tarfile
import tempfile
import unittest
import unittest.mock
from pathlib import Path

from shipped import PROJECT, VERSION

REPEATABLE = PROJECT / "packaging/repeatable.py"
CHANGELOG = PROJECT / "packaging/debian_changelog.py"


def pack_again(package: Path) -> bytes:
    subprocess.run([sys.executable, REPEATABLE, package], check=True)
    return package.read_bytes()


class TarballTest(unittest.TestCase):
    def tarball(self, folder: Path, names: list[str], user: int, compressed_at: int) -> Path:
        path = folder / f"{user}.tar.gz"
        with path.open("wb") as file, gzip.GzipFile("name", "wb", 1, file, compressed_at) as packed, \
                tarfile.open(fileobj=packed, mode="w") as archive:
            for name in names:
                member = tarfile.TarInfo(name)
                member.uid = member.gid = user
                member.uname = f"user{user}"
                member.mtime = 1000000000
                member.mode = 0o755 if name == "bin/program" else 0o644
                data = name.encode() * 1000
                member.size = len(data)
                archive.addfile(member, io.BytesIO(data))
        return path

    def test_order_owner_and_time_of_packing_do_not_matter(self) -> None:
        names = ["share/b", "bin/program", "share/a"]
        with tempfile.TemporaryDirectory() as holder:
            folder = Path(holder)
            one = self.tarball(folder, names, 0, 1)
            other = self.tarball(folder, names[::-1], 1000, 2)
            self.assertNotEqual(one.read_bytes(), other.read_bytes())
            self.assertEqual(pack_again(one), pack_again(other))
            with tarfile.open(one) as archive:
                members = archive.getmembers()
                self.assertEqual([member.name for member in members], sorted(names))
                self.assertEqual({(member.uid, member.uname, member.mtime) for member in members},
                                 {(0, "root", 1000000000)})
                self.assertEqual([member.mode for member in members], [0o755, 0o644, 0o644])
                found = archive.extractfile("share/a")
                assert found is not None
                self.assertEqual(found.read(), b"share/a" * 1000)
            self.assertEqual({path.name for path in folder.iterdir()}, {one.name, other.name})


class DebianPackageTest(unittest.TestCase):
    def package(self, folder: Path, size: int) -> Path:
        root = folder / str(size)
        (root / "DEBIAN").mkdir(parents=True)
        (root / "usr").mkdir()
        (root / "usr/file").write_bytes(bytes(1025))
        (root / "DEBIAN/control").write_text(
            "Package: orvane\nVersion: 1\nArchitecture: all\nMaintainer: one <one@example.org>\n"
            f"Description: a test\nInstalled-Size: {size}\n")
        for path in [root, *root.rglob("*")]:
            path.chmod(0o755 if path.is_dir() else 0o644)
        package = folder / f"{size}.deb"
        subprocess.run(["dpkg-deb", "--root-owner-group", f"-z{size % 9}", "-Zgzip", "--build", root, package],
                       check=True, stdout=subprocess.DEVNULL, env={"PATH": "/usr/bin:/bin", "SOURCE_DATE_EPOCH": "1"})
        return package

    def test_size_of_folders_and_compression_do_not_matter(self) -> None:
        with tempfile.TemporaryDirectory() as holder, \
                unittest.mock.patch.dict("os.environ", SOURCE_DATE_EPOCH="1"):
            one, other = (self.package(Path(holder), size) for size in (4, 66))
            self.assertNotEqual(one.read_bytes(), other.read_bytes())
            self.assertEqual(pack_again(one), pack_again(other))
            size = subprocess.run(["dpkg-deb", "--field", one, "Installed-Size"], check=True, text=True,
                                  stdout=subprocess.PIPE).stdout
            self.assertEqual(size, "3\n")  # two blocks of the file, and a folder


    def test_without_the_tool_the_package_stays_and_a_line_says_so(self) -> None:
        with tempfile.TemporaryDirectory() as holder:
            package = self.package(Path(holder), 5)
            before = package.read_bytes()
            done = subprocess.run([sys.executable, REPEATABLE, package], check=True, text=True,
                                  stderr=subprocess.PIPE, env={"PATH": holder})
            self.assertEqual(package.read_bytes(), before)
            self.assertIn("5.deb depends on where it was packed", done.stderr)


class ChangelogTest(unittest.TestCase):
    def as_debian(self, text: str) -> tuple[int, str]:
        with tempfile.TemporaryDirectory() as holder:
            source, packed = Path(holder) / "CHANGELOG.md", Path(holder) / "changelog.gz"
            source.write_text(text, encoding="utf-8")
            done = subprocess.run([sys.executable, CHANGELOG, source, packed], check=False, capture_output=True)
            return done.returncode, gzip.decompress(packed.read_bytes()).decode() if packed.exists() else ""

    def test_one_version(self) -> None:
        words = "long " * 20
        text = f"# Changelog\n\nAbout.\n\n## [1.0.0] - 2026-11-21\n\nThe first.\n\n### Added\n\n- One\n  more.\n- {words}\n"
        long = f"  * {('long ' * 15).strip()}\n    {('long ' * 5).strip()}\n"
        self.assertEqual(self.as_debian(text), (
            0, "orvane (1.0.0) unstable; urgency=medium\n\n  * The first.\n\n  [ Added ]\n  * One more.\n" + long +
            "\n -- orvane developers <orvane@example.org>  Sat, 21 Nov 2026 00:00:00 +0000\n"))

    def test_a_version_without_a_date_is_refused(self) -> None:
        status, _ = self.as_debian("# Changelog\n\n## Unreleased\n\n- One.\n")
        self.assertNotEqual(status, 0)

    def test_every_word_of_the_projects_own_arrives(self) -> None:
        own = (PROJECT / "CHANGELOG.md").read_text(encoding="utf-8")
        status, text = self.as_debian(own)
        self.assertEqual(status, 0)
        self.assertTrue(text.startswith(f"orvane ({VERSION}) unstable"))
        self.assertLessEqual(max(map(len, text.splitlines())), 80)
        entries = own[own.index("\n## "):]
        entries = re.sub(r"(?m)^## .*$|^### |^- ", "", entries)
        made = re.sub(r"(?m)^orvane \(.*$|^ -- .*$|^  \* |^  \[ | ]$", "", text)
        self.assertEqual(made.split(), entries.split())


if __name__ == "__main__":
    unittest.main()
