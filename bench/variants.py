# SPDX-License-Identifier: Apache-2.0
"""Other ways to build the product: what each costs compared with the shipped one."""

from __future__ import annotations

import re
import shutil
import subprocess
from collections.abc import Callable
from dataclasses import dataclass
from pathlib import Path

from measure import instructions, interleave, size
from place import PROJECT, call
from growth import TEMPLATE, with_template
from report import Table, grouped

SECTIONS = ("-ffunction-sections", "-fdata-sections", "-Wl,--gc-sections")
HARDENED = ("-fstack-protector-strong", "-D_FORTIFY_SOURCE=2", "-Wl,-z,relro,-z,now",
            "-Wl,-z,noexecstack")
# The options of cmake/Size.cmake and cmake/Hardening.cmake.
SHIPPED = ("-Os", "-flto", *SECTIONS, *HARDENED, "-static")


@dataclass(frozen=True)
class Variant:
    name: str
    options: tuple[str, ...]
    change: Callable[[Path], None] = lambda tree: None


def buffers(output: int, template: int) -> Callable[[Path], None]:
    """A change of the two buffers' sizes; both sizes must be found in the sources. A stream reads one
    byte less than the template's buffer holds."""
    def change(tree: Path) -> None:
        for path, name, size in (("writers/template_merge.h", "OUTPUT_BUFFER_SIZE", output),
                                 ("writers/template_merge.cpp", "INPUT_BUFFER_SIZE", template + 1)):
            text = (tree / path).read_text()
            text, count = re.subn(rf"({name} = )\d+", rf"\g<1>{size}", text)
            if count != 1:
                raise SystemExit(f"bench: {path} sets no {name}")
            (tree / path).write_text(text)
    return change


VARIANTS = (
    Variant("as shipped: -Os, optimised at the link, unused sections dropped, hardened, static, "
            "buffers of 1 KiB and 128 KiB", SHIPPED),
    Variant("-O2", tuple("-O2" if option == "-Os" else option for option in SHIPPED)),
    Variant("-O3", tuple("-O3" if option == "-Os" else option for option in SHIPPED)),
    Variant("not optimised at the link", tuple(option for option in SHIPPED if option != "-flto")),
    Variant("unused sections kept", tuple(option for option in SHIPPED if option not in SECTIONS)),
    Variant("without hardening", tuple(option for option in SHIPPED if option not in HARDENED)),
    Variant("static-pie", (*(option for option in SHIPPED if option != "-static"), "-fPIE",
                           "-static-pie")),
    Variant("dynamic", tuple(option for option in SHIPPED if option != "-static")),
    Variant("buffers of 512 B and 512 B", SHIPPED, buffers(512, 512)),
    Variant("buffers of 8 KiB and 8 KiB", SHIPPED, buffers(8 << 10, 8 << 10)),
    Variant("buffers of 1 KiB and 32 KiB", SHIPPED, buffers(1 << 10, 32 << 10)),
    Variant("buffers of 1 KiB and 1 MiB", SHIPPED, buffers(1 << 10, 1 << 20)),
)


def build(variant: Variant, folder: Path, number: int) -> Path:
    tree = folder / f"variant{number}"
    shutil.copytree(PROJECT / "src", tree)
    variant.change(tree)
    sources = sorted(str(path) for path in tree.rglob("*.cpp") if "qnx" not in path.parts)
    program = folder / f"program{number}"
    call("g++", "-std=c++17", "-D_FILE_OFFSET_BITS=64", "-D_LARGEFILE64_SOURCE", f"-I{tree}",
         *variant.options, "-s", *sources, "-o", program, stderr=subprocess.STDOUT)
    return program


def compare(root: Path, folder: Path, runs: int) -> Table:
    table = Table("variant", "wall, to the shipped one", "instructions", "page faults",
                  "stripped bytes", "64 MiB template, to `cat`")
    commands = []
    for number, variant in enumerate(VARIANTS):
        shutil.copy(build(variant, folder, number), root / f"bin/variant{number}")
        commands.append(f"/bin/variant{number} -a -i")
    if size(root, commands[0]) != size(root, "/bin/static"):
        raise SystemExit("bench: the first variant is not built as the product is")
    timings = interleave(root, commands, runs, warm_up=20)
    with with_template(root, 1 << 26):
        cat, *copies = interleave(root, (f"/bin/cat /{TEMPLATE} > /tmp/copy",
                                         *(command.replace(" -i", "") for command in commands)), 15)
    for variant, command, timing, copy in zip(VARIANTS, commands, timings, copies):
        table.add(variant.name, f"{timing.ratio(timings[0]):.3f}",
                  grouped(instructions(root, command)), grouped(timing.faults),
                  grouped(size(root, command)),
                  f"{cat.ratio(copy):.2f}")
    return table
