# SPDX-License-Identifier: Apache-2.0
"""Runs orvane with less and less memory and fewer and fewer descriptors.

Whatever it lacks, it prints nothing, exits with 0, and each output is a whole file made of true values and
defaults, or what a fallback leaves.

Exit status: 0 all runs are like this, 1 some are not, 2 the tool could not be run.
"""

from __future__ import annotations

import argparse
import shutil
import tempfile
from collections.abc import Sequence
from pathlib import Path

from drivers import runner
from model import parts
from model.prediction import predict

OUTPUTS = ("airplay.conf", "iap2_device.cfg", "iap2.cfg", "iap1.cfg",
           "telephony_FFFF.txt", "speechrec_FFFF.txt")
STOCK = {"airplay.conf": "fs/mp/etc/airplay.conf",
         "iap2_device.cfg": "fs/mp/etc/iap2_device.cfg",
         "iap2.cfg": "fs/mp/etc/mm/iap2.cfg",
         "iap1.cfg": "fs/mp/etc/mm/iap1.cfg"}
ARGUMENTS = ["-ai"]

PAGE = 4096
MEBIBYTE = 1 << 20

# One line of a version file, too long to be read under any limit of memory.
LONG_LINE = 64 * MEBIBYTE

# Characters of a file that is not as it must be.
SHOWN = 1000


def make_unit(root: Path) -> None:
    """A whole unit with values that are too long for a string's own buffer."""
    parts.put_base(root)
    parts.put_product_files(root)
    parts.put_image(root, {22: 1, 36: 2, 50: 1, 134: 0xFFFF, 139: 41})
    parts.put_disk(root, serial=b"SER12345", area=bytes(range(1, 189)) * 10)
    parts.put_version(root, b"ABC_3.10.2.a-rather-long-version-text", b"Application",
                      "application.inf")


def texts_after(root: Path, names: tuple[str, ...], command: list[str]) -> dict[str, bytes | None]:
    tmp = predict(root, command, names).alternatives[0].tmp
    assert tmp is not None
    return {name: tmp[name].content if name in tmp else None for name in OUTPUTS}


def accepted(tools: runner.Tools) -> dict[str, set[bytes | None]]:
    """Every text that a run may leave: each value is true or the default."""
    result: dict[str, set[bytes | None]] = {name: set() for name in OUTPUTS}
    for names in (tools.names, tuple("VOXA" for _ in tools.names)):
        for gone in ((), ("fs/rwdata/.Version",), ("dev/hd0",), ("fs/mp/etc/mm/iap1_static.cfg",),
                     ("fs/rwdata/.Version", "dev/hd0"),
                     ("fs/tmpfs/VS_DIAG_SERVICE_CONFIG_SHARED_MEM",)):
            with tempfile.TemporaryDirectory(prefix="orvane limit-") as folder:
                root = Path(folder)
                make_unit(root)
                for path in gone:
                    shutil.rmtree(root / path) if (root / path).is_dir() else (root / path).unlink()
                for name, text in texts_after(root, names, ARGUMENTS).items():
                    result[name].add(text)
    with tempfile.TemporaryDirectory(prefix="orvane limit-") as folder:
        root = Path(folder)
        make_unit(root)
        for name, path in STOCK.items():
            result[name] |= {(root / path).read_bytes(), b"", None}
    for name in set(OUTPUTS) - set(STOCK):
        result[name].add(None)
    return result


def run(tools: runner.Tools, root: Path, limit: str, arguments: list[str]) -> runner.Run:
    return runner.run(tools.command(root, arguments, limit), root)


def least_memory(tools: runner.Tools) -> int:
    """The smallest address space, in whole pages, in which the tool starts at all: with less, the kernel or
    the C library end the process before `main`."""
    low, high = 0, 64 * MEBIBYTE
    with tempfile.TemporaryDirectory(prefix="orvane limit-") as folder:
        root = Path(folder)
        make_unit(root)
        while high - low > PAGE:
            middle = (low + high) // 2 // PAGE * PAGE
            if run(tools, root, f"--memory={middle}", []).status == 0:
                high = middle
            else:
                low = middle
    return high


def least_files(tools: runner.Tools) -> int:
    """The smallest number of descriptors with which the tool starts at all: an emulator needs some itself."""
    with tempfile.TemporaryDirectory(prefix="orvane limit-") as folder:
        root = Path(folder)
        make_unit(root)
        return next(count for count in range(3, 64)
                    if run(tools, root, f"--files={count}", []).status == 0)


def check_run(tools: runner.Tools, limit: str, texts: dict[str, set[bytes | None]]) -> tuple[bool, bool]:
    """Whether the run was as it must be, and whether it lacked nothing."""
    with tempfile.TemporaryDirectory(prefix="orvane limit-") as folder:
        root = Path(folder)
        make_unit(root)
        whole = texts_after(root, tools.names, ARGUMENTS)
        result = run(tools, root, limit, ARGUMENTS)
        left = {name: (root / "tmp" / name).read_bytes() if (root / "tmp" / name).exists() else None
                for name in OUTPUTS}
    faults = [f"{name}: {text!r}" for name, text in left.items() if text not in texts[name]]
    if (result.status, result.stdout, result.stderr) != (0, b"", b""):
        faults.append(f"status {result.status}, said {result.stdout!r} {result.stderr!r}")
    if faults:
        print(f"limits: with {limit}:\n  " + "\n  ".join(fault[:SHOWN] for fault in faults))
    return not faults, left == whole


def sweep(tools: runner.Tools, what: str, limits: list[str],
          texts: dict[str, set[bytes | None]]) -> bool:
    """The last limit is generous, so the last run must be whole, and the first must not."""
    outcomes = [check_run(tools, limit, texts) for limit in limits]
    whole = [is_whole for _, is_whole in outcomes]
    print(f"limits: {what}: {len(limits)} runs, {whole.count(False)} with a shortage")
    if whole[-1] and False in whole:
        return all(good for good, _ in outcomes)
    print(f"limits: {what}: the limits must allow the last run to be whole, and not the first")
    return False


def check_long_line(tools: runner.Tools) -> bool:
    """A line of 64 MiB is read if there is memory for it; otherwise the file counts as missing."""
    good = True
    for limit, is_read in (("--memory=1073741824", True), ("--memory=33554432", False)):
        with tempfile.TemporaryDirectory(prefix="orvane limit-") as folder:
            root = Path(folder)
            make_unit(root)
            file = root / "fs/rwdata/.Version/application.inf"
            file.write_bytes(b"x" * LONG_LINE + b"=1\n" + file.read_bytes())
            result = run(tools, root, limit, ["-i"])
            text = (root / "tmp/iap1.cfg").read_bytes()
        if (result.status, result.stdout, result.stderr) != (0, b"", b"") or \
                (b"=030a02\n" in text) != is_read or (b"=000000\n" in text) == is_read:
            print(f"limits: a long line with {limit}: {result} {text!r}")
            good = False
    print("limits: a line of 64 MiB, with memory and without")
    return good


def main(arguments: Sequence[str]) -> int:
    parser = argparse.ArgumentParser("limits", description=__doc__)
    runner.add_arguments(parser)
    parser.add_argument("--every", type=int, default=1, help="only every N-th limit of memory")
    options = parser.parse_args(arguments)
    tools = runner.tools(options)
    texts = accepted(tools)
    try:
        files = least_files(tools)
        results = [sweep(tools, "descriptors", [f"--files={files + more}" for more in range(14)], texts)]
        if not options.emulator:  # it does not limit the memory of what it emulates
            least = least_memory(tools)
            memory = [f"--memory={least + step * PAGE}" for step in range(0, 64, options.every)]
            results += [sweep(tools, "memory", [*memory, f"--memory={64 * MEBIBYTE}"], texts),
                        check_long_line(tools)]
    except runner.BrokenRun as error:
        print(f"limits: the tool was not run: {error}")
        return 2
    return 0 if all(results) else 1
