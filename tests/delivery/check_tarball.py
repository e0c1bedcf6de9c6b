#!/usr/bin/env python3
# SPDX-License-Identifier: Apache-2.0
"""check_tarball.py TARBALL EMULATOR: whether a tarball for another processor holds what it should, and
its programs start. Exit status: 0 yes, 1 no, with the reason."""

from __future__ import annotations

import json
import subprocess
import sys
import tarfile
import tempfile
from pathlib import Path

import bill_rules
import hardening
from shipped import BILL, IN_TARBALL, PROGRAMS, VERSION


def complaints(tarball: Path, emulator: str) -> list[str]:
    with tempfile.TemporaryDirectory(prefix="orvane tarball-") as name:
        folder = Path(name)
        with tarfile.open(tarball) as archive:
            archive.extractall(folder)
            owners = {f"{member.uname} ({member.uid}:{member.gid})" for member in archive}
        found = {str(path.relative_to(folder)) for path in folder.rglob("*") if path.is_file()}
        if found != IN_TARBALL:
            return [f"it holds {sorted(found)}"]
        if owners != {"root (0:0)"}:
            return [f"its files belong to {', '.join(sorted(owners))} instead of root"]
        missing = [f"{program}: {reason}" for program in sorted(PROGRAMS)
                   for reason in hardening.missing_in_program(folder / program)]
        said = subprocess.run([emulator, folder / "bin/orvane-unit", "--version"], text=True,
                              stdout=subprocess.PIPE, check=False).stdout
        if said != f"{VERSION}\n":
            missing.append(f"orvane-unit says {said!r} for its version")
        silent = subprocess.run([emulator, folder / "bin/orvane"], capture_output=True, check=False)
        if (silent.returncode, silent.stdout, silent.stderr) != (0, b"", b""):
            missing.append(f"orvane: {silent}")
        bill = json.loads((folder / BILL).read_text(encoding="utf-8"))
        content = {name: (folder / name).read_bytes() for name in found - {BILL}}
        return missing + bill_rules.broken_rules(bill, content)


def main() -> int:
    found = complaints(Path(sys.argv[1]), sys.argv[2])
    for complaint in found:
        print(f"{sys.argv[1]}: {complaint}", file=sys.stderr)
    return 1 if found else 0


if __name__ == "__main__":
    sys.exit(main())
