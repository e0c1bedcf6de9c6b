# SPDX-License-Identifier: Apache-2.0
"""The sample unit in memory, with the programs to be measured in it."""

from __future__ import annotations

import re
import shutil
import subprocess
from dataclasses import dataclass
from pathlib import Path

PROJECT = Path(__file__).resolve().parents[1]
BUILD = PROJECT / "build"
TOOLS = BUILD / "bench-tools"

# The programs that the script calls, and cat.
HOST_PROGRAMS = ("sh", "od", "dd", "awk", "sed", "cat", "wc")

ARM = "arm-linux-gnueabihf"
EMULATOR = "qemu-arm-static"


def call(*words: str | Path, **options: object) -> str:
    return subprocess.run([str(word) for word in words], check=True, text=True,
                          stdout=subprocess.PIPE, **options).stdout  # type: ignore[call-overload]


@dataclass(frozen=True)
class Programs:
    """The binaries to be measured, stripped."""

    static: Path
    dynamic: Path
    arm_static: Path
    arm_dynamic: Path
    floor: Path


def configure(name: str, *options: str) -> Path:
    """Builds only the product, as a unit's build does, and returns a stripped copy of it."""
    folder = BUILD / f"bench-{name}"
    call("cmake", "-S", PROJECT, "-B", folder, "-G", "Ninja", "-DCMAKE_BUILD_TYPE=Release",
         "-DORVANE_KIT=OFF", "-DORVANE_TESTS=OFF", *options)
    call("cmake", "--build", folder, "--target", "orvane")
    stripped = folder / "orvane.stripped"
    cross = any("toolchain" in option for option in options)
    call(f"{ARM}-strip" if cross else "strip", "-o", stripped, folder / "orvane")
    return stripped


def build() -> Programs:
    call("cmake", "-S", PROJECT / "bench", "-B", TOOLS, "-G", "Ninja", "-DCMAKE_BUILD_TYPE=")
    call("cmake", "--build", TOOLS)
    arm = f"-DCMAKE_TOOLCHAIN_FILE={PROJECT}/cmake/toolchains/armhf.cmake"
    static = "-DORVANE_STATIC=ON"
    return Programs(static=configure("static", static), dynamic=configure("dynamic"),
                    arm_static=configure("arm-static", arm, static),
                    arm_dynamic=configure("arm-dynamic", arm), floor=TOOLS / "floor")


def copy_with_libraries(program: Path, root: Path, name: str) -> None:
    """Copies the program to /bin/NAME, and the libraries that it needs to their own places."""
    (root / "bin").mkdir(exist_ok=True)
    shutil.copy(program, root / "bin" / name)
    needed = subprocess.run(["ldd", program], text=True, capture_output=True, check=False).stdout
    for library in re.findall(r"(/\S+) \(0x", needed):
        target = root / library.lstrip("/")
        target.parent.mkdir(parents=True, exist_ok=True)
        shutil.copy(library, target)


def copy_arm_libraries(root: Path) -> None:
    for name in ("ld-linux-armhf.so.3", "libc.so.6", "libm.so.6", "libgcc_s.so.1", "libstdc++.so.6"):
        (root / "lib").mkdir(exist_ok=True)
        shutil.copy(f"/usr/{ARM}/lib/{name}", root / "lib" / name)


def furnish(root: Path, programs: Programs) -> None:
    """Makes the sample unit at `root` and puts everything that is measured into its /bin."""
    call(BUILD / "release/orvane-unit", "new", root)
    for name in HOST_PROGRAMS:
        found = shutil.which(name)
        if found is None:
            raise SystemExit(f"bench: this host has no {name}")
        copy_with_libraries(Path(found).resolve(), root, name)
    copy_with_libraries(programs.floor, root, "floor")
    copy_with_libraries(programs.static, root, "static")
    copy_with_libraries(programs.dynamic, root, "dynamic")
    shutil.copy(programs.arm_static, root / "bin/arm-static")
    shutil.copy(programs.arm_dynamic, root / "bin/arm-dynamic")
    copy_arm_libraries(root)
    emulator = shutil.which(EMULATOR)
    if emulator is None:
        raise SystemExit(f"bench: this host has no {EMULATOR}")
    shutil.copy(emulator, root / "bin/emulator")
    shutil.copy(PROJECT / "bench/accessory.sh", root / "bin/accessory.sh")
