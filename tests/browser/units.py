# SPDX-License-Identifier: Apache-2.0
"""Units for pages, made by orvane-unit."""

from __future__ import annotations

import os
import re
import subprocess
from pathlib import Path

PROJECT = Path(__file__).resolve().parents[2]
GOLDEN = PROJECT / "tests/whole_runs/golden"
UNIT_TOOL = os.environ.get("ORVANE_UNIT", str(PROJECT / "build/release/orvane-unit"))

# For each reason code a golden unit that gives it with -a -i.
REACHED_BY = {
    "generated": "iap-plain",
    "profile-not-generated": "airplay-plain",
    "profile-unknown": "airplay-image-empty",
    "output-not-openable": "airplay-output-folder",
    "template-missing": "airplay-template-missing",
    "template-empty": "airplay-template-empty",
    "iap2-not-opened": "iap-iap2-output-folder",
    "iap2-template-empty": "iap-iap2-template-empty",
    "stock-missing": "airplay-template-and-stock-missing",
    "stock-empty": "airplay-stock-folder",
    "fixed-text": "airplay-plain",
    "from-template": "airplay-plain",
    "from-stock": "airplay-template-missing",
    "from-image": "airplay-plain",
    "image-missing": "airplay-image-absent",
    "image-not-mappable": "airplay-image-empty",
    "image-too-short": "airplay-image-100-bytes",
    "model-unknown": "airplay-model-past-table",
    "from-record": "iap-plain",
    "serial-blank": "iap-serial-all-zero",
    "disk-missing": "tuning-disk-absent",
    "disk-too-short": "iap-disk-too-short-for-serial",
    "disk-unreadable": "iap-disk-folder",
    "from-version-file": "iap-plain",
    "version-folder-missing": "iap-everything-missing",
    "version-no-application": "version-type-lower-case",
    "version-number-missing": "version-number-missing",
    "version-not-available": "version-not-available",
    "version-incomplete": "version-one-part",
    "version-not-numeric": "version-not-numbers",
    "version-out-of-range": "version-part-256",
    "from-tuning-block": "tuning-all-ones",
    "word-unknown": "tuning-all-ones",
}

HOSTILE = r'''
[image.params]
22 = 1
139 = 26
[image]
size = 140
[disk]
aux = "</td></table><script>document.title='owned'</script>"
[disk.slots]
1 = "<script>x()//"
2 = "hex: 22 3e 3c 69 6d 67 20 73 72 63 3d 78 3e"
3 = "hex: 1b 5b 33 31 6d ff fe 80 00 e2 80 ae"
4 = "<b onclick=x()>"
9 = "hex: 27 22 3c 26 e2 80 ae 0a"
[files]
"/fs/mp/etc/airplay_static.conf" = """
</code></td></tr></table></section></article><script>throw new Error("run")</script>
<img src="http://127.0.0.1:9/pixel" onerror="document.title='owned'">
<style>* { display: none }</style><a href="javascript:alert(1)">go</a> &lt;amp;&amp;
\u202egnp.exe \u0000 \u200b \\ back\\slash \\x41 \ttab
]]>--><!-- <title>owned</title> <base href="http://127.0.0.1:9/">
no line end"""
"/fs/mp/etc/mm/iap1_static.cfg" = { hex = "c3 28 ff 0d 0a 7f 80 3c 73 76 67 2f 6f 6e 6c 6f 61 64 3d 61 3e 0a" }
"/fs/rwdata/.Version/<img src=x onerror=alert(1)>.inf" = """
Type = Application <script>
Version Number = <i>_1"><script>1</script>.2.'3
"""
"/fs/rwdata/.Version/\u202e\"'.inf" = "Type = Service\n\u001b]0;owned\u0007 = </style>\n"
'''


LONG_LINE = "key = " + "a-value-without-a-blank-" * 40 + "end"
LONG = f"""
[image.params]
139 = 26
[disk]
aux = "{'x' * 96}"
[files]
"/fs/mp/etc/airplay_static.conf" = "{LONG_LINE}\\n"
"/fs/mp/etc/mm/iap2_static.cfg" = "{'words ' * 200}\\n"
"/fs/rwdata/.Version/{'long-name-' * 20}.inf" = "Type = Application\\nVersion Number = {'1' * 300}\\n{'k' * 200} = 1\\n"
"""


def call(*words: str | Path, statuses: tuple[int, ...] = (0,), folder: Path | None = None) -> bytes:
    said = subprocess.run([UNIT_TOOL, *words], check=False, capture_output=True, cwd=folder)
    if said.returncode not in statuses:
        raise AssertionError(f"{words}: {said.returncode}\n{said.stderr.decode(errors='replace')}")
    return said.stdout


def make(root: Path, description: Path | None = None) -> Path:
    call("new", root, *(("--from", description) if description else ()))
    return root


def make_from_text(root: Path, text: str) -> Path:
    description = root.with_name(f"{root.name}.description")
    description.write_text(text, encoding="utf-8")
    return make(root, description)


def long_lines(root: Path) -> Path:
    return make_from_text(root, LONG)


def hostile(root: Path) -> Path:
    return make_from_text(root, HOSTILE)


def one_for_each_reason(folder: Path) -> dict[str, Path]:
    """For each reason code a unit that reaches it, with the code as its name."""
    return {code: make(folder / code, GOLDEN / case / "unit.toml") for code, case in REACHED_BY.items()}


def many(folder: Path, count: int) -> list[Path]:
    """Ordinary units that differ in model, brand, drive side and serial."""
    sample = make(folder / "sample")
    description = call("describe", sample).decode()
    roots = []
    for number in range(count):
        text = re.sub(r'^9 = ".*"$', f'9 = "SN{number:06}"', description, flags=re.MULTILINE)
        for parameter, value in ((139, 1 + number % 47), (36, number % 3), (22, number % 2)):
            text = re.sub(rf"^{parameter} = .*$", f"{parameter} = {value}", text, flags=re.MULTILINE)
        roots.append(make_from_text(folder / f"car-{number:03}", text))
    return roots


def report(page: Path, *roots: Path, options: tuple[str, ...] = ()) -> Path:
    call("report", *roots, "-o", page, *options, statuses=(0, 1))
    return page


def left_by_a_run(root: Path) -> dict[str, bytes]:
    """The files that orvane leaves in /tmp."""
    call("run", root, "--brief", "--", "-a", "-i", statuses=(0, 1))
    folder = root / "tmp"
    return {f"/tmp/{path.name}": path.read_bytes() for path in sorted(folder.iterdir())
            if path.is_file()} if folder.is_dir() else {}


def shown_bytes(text: str) -> bytes:
    """The bytes that a page shows as this text: the inverse of its escapes."""
    own = {b"\\n": b"\n", b"\\\\": b"\\"}
    return re.sub(rb"\\(?:n|\\|x[0-9a-f]{2})",
                  lambda escape: own.get(escape[0]) or bytes.fromhex(escape[0][2:].decode()), text.encode())
