#!/usr/bin/env python3
# SPDX-License-Identifier: Apache-2.0
"""repeatable.py PACKAGE...: packs a .deb or .tar.gz again, so that its bytes depend on its files alone. What
cpack leaves also depends on the file system that it worked on (the order of files in a folder, the size of a
folder), on its user, and on the user's mask."""

from __future__ import annotations

import gzip
import re
import shutil
import subprocess
import sys
import tarfile
import tempfile
from pathlib import Path

BLOCK = 1024


def pack_tarball_again(tarball: Path) -> None:
    with tarfile.open(tarball) as archive:
        content = {member.name: (member, archive.extractfile(member)) for member in archive}
        with tarball.with_suffix(".again").open("wb") as again, \
                gzip.GzipFile("", "wb", 9, again, mtime=0) as packed, \
                tarfile.open(fileobj=packed, mode="w", format=tarfile.USTAR_FORMAT) as ordered:
            for _, (member, data) in sorted(content.items()):
                member.uid = member.gid = 0
                member.uname = member.gname = "root"
                ordered.addfile(member, data)
    tarball.with_suffix(".again").replace(tarball)


def pack_debian_package_again(package: Path) -> None:
    with tempfile.TemporaryDirectory(prefix="orvane package-") as name:
        root = Path(name) / "root"
        subprocess.run(["dpkg-deb", "--raw-extract", package, root], check=True)
        control = root / "DEBIAN/control"
        control.write_text(re.sub(r"(?m)^Installed-Size: \d+$", f"Installed-Size: {installed_size(root)}",
                                  control.read_text()))
        # Other compressors may use the number of processors.
        subprocess.run(["dpkg-deb", "--root-owner-group", "-Zgzip", "-z9", "--build", root, package],
                       check=True, stdout=subprocess.DEVNULL)


def installed_size(root: Path) -> int:
    """As Debian counts it: whole blocks, and one for each folder."""
    paths = [path for path in root.rglob("*") if "DEBIAN" not in path.relative_to(root).parts]
    return sum(-(-path.stat().st_size // BLOCK) if path.is_file() else 1 for path in paths)


def main() -> int:
    for package in map(Path, sys.argv[1:]):
        if package.suffix != ".deb":
            pack_tarball_again(package)
        elif shutil.which("dpkg-deb"):
            pack_debian_package_again(package)
        else:
            print(f"{package.name} depends on where it was packed: there is no dpkg-deb", file=sys.stderr)
    return 0


if __name__ == "__main__":
    sys.exit(main())
