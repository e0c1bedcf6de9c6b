# SPDX-License-Identifier: Apache-2.0
"""Calls the library's functions on random units and compares what they give with what the model says.

A run of orvane uses few of them, so no run shows what the others do. The usage record of orvane, which no
run shows either, is compared, too.

Exit status: 0 all agree, 1 a difference or an outcome that never came up, 2 the calls could not be made.
"""

from __future__ import annotations

import argparse
import random
import shutil
import subprocess
import tempfile
from collections.abc import Sequence
from dataclasses import dataclass
from pathlib import Path

from elftools.elf.elffile import ELFFile

from drivers import random_units, runner
from drivers.random_units import Finding, Question, RandomUnit
from model import catalogue, configuration, parts, record_area, tuning
from model.catalogue import Store
from model.record_area import Disk
from model.records import RECORD_AREA, TUNING_AREA
from model.system import DISK
from model.usage import SECTION, usage_record

# As calls.cpp has them: the bytes of an output before a call, and how many follow those that it may write.
BEFORE = b"#"
BEHIND = 4
VALUE_SIZE = 2

CALLS_OF_A_UNIT = 120

IMAGE_SIZES = (1, 50, 100, 134, 135, 178, 179, 179, 179, 180, 4096, 5000)
NUMBERS = (0, 1, 22, 36, 50, 133, 134, 135, 139, 142, 154, 158, 171, 172, 200, 255, 256, 32768, 65535)
SLOTS = (*range(18), 18, 19, 255, 2**32 - 1)

# The distances from the end of the disk at which something begins.
BEGINNINGS = (RECORD_AREA, RECORD_AREA - 1, RECORD_AREA - 129, RECORD_AREA - 2185, RECORD_AREA - 2214,
              record_area.AUX_AREA, TUNING_AREA)


@dataclass(frozen=True)
class Tools(runner.Tools):
    calls: str


def make_unit(root: Path, rng: random.Random) -> list[str]:
    """Fills `root` and returns the calls."""
    parts.put_base(root)
    kind = rng.random()
    if kind < 0.8:
        size = rng.choice(IMAGE_SIZES)
        image = bytearray(rng.randbytes(size).replace(b"\0", b"\1"))
        if size > 49:
            image[49] = rng.randrange(5)
        parts.put(root, configuration.IMAGE, bytes(image))
    elif kind < 0.9:
        parts.put(root, configuration.IMAGE, b"")
    kind = rng.random()
    if kind < 0.85:
        size = rng.choice((2 * RECORD_AREA, *(each + more for each in BEGINNINGS for more in (-1, 0, 1))))
        _put_disk(root, size, rng)
    elif kind < 0.92:
        parts.put_folder(root, DISK)
    return [_call(rng) for _ in range(CALLS_OF_A_UNIT)]


def _put_disk(root: Path, size: int, rng: random.Random) -> None:
    """Any bytes in the parts of the record area that have a name, and around them."""
    start = max(0, size - RECORD_AREA - 16)
    content = rng.randbytes(min(16 + 2 * record_area.TUNING_SIZE + 16, size - start))
    parts.put(root, DISK, b"")
    with open(parts.real(root, DISK), "r+b") as file:
        file.truncate(size)
        file.seek(start)
        file.write(content)


def _call(rng: random.Random) -> str:
    number = rng.choice((*NUMBERS, rng.randrange(1, 172), rng.randrange(1, 172)))
    slot = rng.choice(SLOTS)
    length = rng.choice((0, 1, 8, 12, rng.randrange(200)))
    long = rng.choice((1, rng.randrange(4200), 1023, 1024, 1025, 4095, 4096, 4097))
    return rng.choice((
        f"type-size {rng.choice((*range(12), 256, 2**31, 2**32 - 1))}", f"lookup {number}",
        f"group {number}", f"describe {number}", "open", "close", "init", f"get-u8 {number}",
        f"get-u16 {number}", f"get {number}", f"get-all {rng.choice((0, 1, 134, 170, 171, 172, 70000))}",
        "fuel-type", f"slot-place {slot}", f"read-slot {slot} {length}",
        f"write-slot {slot} {rng.randbytes(length).hex()}", f"read-aux {long}", f"read-tuning {long}",
        f"write-aux {rng.randbytes(long).hex()}", f"write-tuning {rng.randbytes(long).hex()}",
        "write-aux", "read-tuning 0", f"without-buffer {slot} {length}", "crc",
        f"tuning-file {rng.choice((*range(10), -1, 10, 256, -2**31, 2**31 - 1))}",
        f"crc-step {rng.randrange(2**32)} {rng.randrange(256)}",
    ))


class Answers:
    """What the model says to each call."""

    def __init__(self, image: bytes | None, disk: Disk) -> None:
        self._image = image
        self._store = Store(image)
        self.disk = disk
        self._tuning = b""

    def answer(self, call: str) -> str:
        name, *words = call.split(" ")
        answer: str = getattr(self, "_" + name.replace("-", "_"))(*words)
        return answer

    def _type_size(self, kind: str) -> str:
        return str(catalogue.type_size(int(kind)))

    def _lookup(self, number: str) -> str:
        status, index, row = catalogue.lookup(int(number))
        values = [BEFORE[0]] * 7 if row is None else [
            row.number, row.kind, row.group, row.offset, row.id, row.default, row.mask]
        return _line(status, index, *values)

    def _group(self, number: str) -> str:
        return str(catalogue.group(int(number)))

    def _describe(self, number: str) -> str:
        status, values = catalogue.describe(int(number))
        return _line(status, *(values or [BEFORE[0]] * 4))

    def _catalogue(self) -> str:
        return "".join(f"{word} " for word in catalogue.words())

    def _init(self) -> str:
        self._store.init()
        return self._state()

    def _open(self) -> str:
        """A handle that is open must not be opened, so the drivers' calls close it first."""
        return f"{self._store.open()} {self._state()}"

    def _close(self) -> str:
        self._store.close()
        return self._state()

    def _state(self) -> str:
        return _line(int(self._store.is_open), int(self._store.is_open), self._store.length)

    def _get_u8(self, number: str) -> str:
        return self._value(number, 1)

    def _get_u16(self, number: str) -> str:
        return self._value(number, 2)

    def _get(self, number: str) -> str:
        return self._value(number, None)

    def _value(self, number: str, wanted: int | None) -> str:
        status, value = self._store.get(int(number), wanted)
        return f"{status} {_filled(value or b'', VALUE_SIZE)}"

    def _get_all(self, count: str) -> str:
        status, values = self._store.get_all(int(count))
        room = configuration.PARAMETER_COUNT + 1 + BEHIND
        return _line(status, *values, *[BEFORE[0]] * (room - len(values)))

    def _fuel_type(self) -> str:
        return catalogue.fuel_type(Store(self._image))

    def _slot_place(self, slot: str) -> str:
        return _line(*(record_area.slot_place(int(slot)) or (BEFORE[0], BEFORE[0])))

    def _read_slot(self, slot: str, length: str) -> str:
        status, content = self.disk.read_slot(int(slot), int(length))
        return f"{status} {_filled(content, int(length))}"

    def _write_slot(self, slot: str, content: str) -> str:
        return str(self.disk.write_slot(int(slot), bytes.fromhex(content)))

    def _read_aux(self, length: str) -> str:
        return self._read_area("aux", int(length))

    def _read_tuning(self, length: str) -> str:
        return self._read_area("tuning", int(length))

    def _read_area(self, name: str, length: int) -> str:
        status, content = self.disk.read_area(name, length)
        return f"{status} {_filled(content, length)}"

    def _write_aux(self, content: str = "") -> str:
        return str(self.disk.write_area("aux", bytes.fromhex(content)))

    def _write_tuning(self, content: str) -> str:
        return str(self.disk.write_area("tuning", bytes.fromhex(content)))

    def _tuning_file(self, block: str) -> str:
        self._tuning = tuning.file_of_block(self.disk.tuning_blocks(), int(block), self._tuning)
        return f"file {self._tuning.hex()}"

    def _without_buffer(self, _slot: str, _length: str) -> str:
        return _line(*[record_area.without_buffer()] * 6)

    def _crc(self) -> str:
        return str(self.disk.crc())

    def _crc_step(self, crc: str, byte: str) -> str:
        return str(record_area.crc_step(int(crc), int(byte)))


def _line(*values: int) -> str:
    return " ".join(map(str, values))


def _filled(content: bytes, size: int) -> str:
    return content.ljust(size + BEHIND, BEFORE).hex()


def _content(root: Path, path: str) -> bytes | None:
    """None if there is no such file."""
    place = Path(parts.real(root, path))
    return place.read_bytes() if place.is_file() else None


def ask_library(tools: Tools, root: Path, calls: Sequence[str], tracer: Sequence[str] = ()) -> list[str]:
    """The answers of the library's functions, called in a unit."""
    done = subprocess.run([*tracer, *tools.enter, str(root), tools.calls], input="\n".join(calls) + "\n",
                          capture_output=True, text=True, timeout=runner.TIME_LIMIT, check=False)
    if done.returncode == runner.LAUNCHER_FAILED:
        raise runner.BrokenRun(done.stderr.strip())
    if done.returncode != 0 or done.stderr:
        return [f"status {done.returncode}: {done.stderr}"]
    return done.stdout.split("\n")[:-1]


def differences(calls: Sequence[str], want: Sequence[str], have: Sequence[str]) -> list[str]:
    if len(have) != len(calls):
        return [f"{len(have)} answers to {len(calls)} calls, the last {have[-1:]!r}"]
    return [f"{call[:60]}: {answer[:200]} instead of {right[:200]}"
            for call, right, answer in zip(calls, want, have) if right != answer]


def check(unit: RandomUnit, tools: Tools) -> Finding:
    answers = Answers(_content(unit.root, configuration.IMAGE), Disk(_content(unit.root, DISK)))
    # An open handle must not be opened again.
    calls = [each for call in unit.arguments for each in (["close", call] if call == "open" else [call])]
    want = [answers.answer(call) for call in calls]
    faults = differences(calls, want, ask_library(tools, unit.root, calls))
    if _content(unit.root, DISK) != answers.disk.content:
        faults.append("the disk is not as it must be")
    return Finding(faults, frozenset(f"{call.split(' ')[0]} {right.split(' ')[0]}"
                                     for call, right in zip(calls, want)))


QUESTION = Question("library", make_unit, check, [
    "lookup 0", "lookup 1", "group 8", "describe 0", "describe 1", "open 0", "open -1", "open -2",
    *(f"{name} {status}" for name in ("get-u8", "get-u16", "get") for status in (0, 1, 3)),
    "get-u8 2", "get-u16 2", "get-all 0", "get-all 1", "get-all -1", "get-all -2",
    "fuel-type diesel", "fuel-type cng", "fuel-type electric", "fuel-type gasoline",
    *(f"{way}-{what} {status}" for way in ("read", "write") for what in ("slot", "aux", "tuning")
      for status in (0, -1)),
    f"crc {record_area.FAILED_CRC}",
], enough_units=40)


def check_tables(tools: Tools) -> list[str]:
    """Every parameter, type and slot, on a unit that has them all."""
    numbers = (*range(configuration.PARAMETER_COUNT + 2), 65535)
    calls = [f"{name} {number}" for name in ("lookup", "group", "describe") for number in numbers]
    calls += ["open", *(f"{name} {number}" for name in ("get", "get-u8", "get-u16") for number in numbers),
              "close", "get-all 171"]
    calls += ["catalogue", *(f"type-size {kind}" for kind in range(11))]
    calls += [f"tuning-file {block}" for block in range(-1, 11)]
    calls += [f"crc-step 4294967295 {byte}" for byte in range(256)]
    for slot in range(20):
        calls += [f"slot-place {slot}", f"read-slot {slot} 140", f"write-slot {slot} {'5a' * 140}",
                  f"read-slot {slot} 140", "crc"]
    with tempfile.TemporaryDirectory(prefix="orvane tables-") as folder:
        root = Path(folder)
        rng = random.Random("tables")
        parts.put_base(root)
        parts.put(root, configuration.IMAGE, rng.randbytes(parts.IMAGE_SIZE))
        _put_disk(root, 2 * RECORD_AREA, rng)
        finding = check(RandomUnit(root, calls, rng), tools)
    return [f"tables: {line}" for line in finding.lines]


def check_short_reads(tools: Tools) -> list[str]:
    """Every read of a disk full of one byte gives only so many of them."""
    calls = ["read-slot 9 12", "read-slot 15 136", "read-aux 1024", "read-tuning 1880", "crc"]
    faults = []
    for given in (0, 1, 5, 8):
        with tempfile.TemporaryDirectory(prefix="orvane short-") as folder:
            root = Path(folder).resolve()
            parts.put_base(root)
            parts.put(root, DISK, b"Z" * 2 * RECORD_AREA)
            answers = Answers(None, Disk(_content(root, DISK)))
            answers.disk.readable = given
            poke = f":poke_exit=@arg2={'5a' * given}" if given else ""
            tracer = ["strace", "-o", "/dev/null", "-P", parts.real(root, DISK),
                      "-e", f"inject=read:retval={given}{poke}"]
            want = [answers.answer(call) for call in calls]
            have = ask_library(tools, root, calls, tracer)
            faults += [f"reads of {given} bytes: {line}" for line in differences(calls, want, have)]
    return faults


def check_usage(tools: Tools) -> list[str]:
    with open(tools.orvane, "rb") as file:
        section = ELFFile(file).get_section_by_name(SECTION)
        have = None if section is None else section.data()
    return [] if have == usage_record() else [f"usage record: {have!r} instead of {usage_record()!r}"]


def main(arguments: Sequence[str]) -> int:
    parser = argparse.ArgumentParser(QUESTION.name, description=__doc__)
    random_units.add_arguments(parser, units=500)
    parser.add_argument("--calls", required=True, help="the program that makes the calls")
    options = parser.parse_args(arguments)
    if shutil.which("strace") is None:
        print("library: strace is not installed")
        return 2
    common = runner.tools(options)
    tools = Tools(common.orvane, common.enter, common.names, options.calls)
    faults = check_tables(tools) + check_short_reads(tools) + check_usage(tools)
    print("\n".join(f"library: {fault}" for fault in faults), end="\n" if faults else "")
    return random_units.ask(QUESTION, tools, options, "--calls", options.calls) or (1 if faults else 0)
