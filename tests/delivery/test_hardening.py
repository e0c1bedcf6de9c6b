# SPDX-License-Identifier: Apache-2.0
"""The programs are hardened, and a program that is not hardened is noticed."""

from __future__ import annotations

import os
import subprocess
import tempfile
import unittest
from pathlib import Path

import hardening

# A copy whose length the compiler can't know, into an array on the stack.
SOURCE = """
#include <cstring>
int main(int count, char** words) {
    char text[16];
    std::memcpy(text, words[0], static_cast<std::size_t>(count));
    return text[0];
}
"""
COMPILED = ("-O2", "-fstack-protector-strong", "-U_FORTIFY_SOURCE", "-D_FORTIFY_SOURCE=2")
LINKED = ("-Wl,-z,relro", "-Wl,-z,now", "-Wl,-z,noexecstack")


def paths(name: str) -> list[Path]:
    found = [Path(word) for word in os.environ[name].split(":")]
    assert all(path.is_file() for path in found), (name, found)
    return found


class ShippedTest(unittest.TestCase):
    def test_every_program_is_hardened(self) -> None:
        for program in paths("ORVANE_PROGRAMS"):
            with self.subTest(program=program.name):
                self.assertEqual(hardening.missing_in_program(program), set())

    def test_the_product_guards_its_stack(self) -> None:
        for program in paths("ORVANE_DYNAMIC"):
            self.assertEqual(hardening.missing_in_dynamic(program), set())

    def test_the_objects_of_the_product_are(self) -> None:
        self.assertEqual(hardening.missing_in_objects(paths("ORVANE_OBJECTS")), set())


class ReaderTest(unittest.TestCase):
    """Programs of a few lines, each without one protection."""

    def setUp(self) -> None:
        holder = tempfile.TemporaryDirectory(prefix="orvane hardening-")
        self.addCleanup(holder.cleanup)
        self.folder = Path(holder.name)
        (self.folder / "source.cpp").write_text(SOURCE)

    def build(self, compiled: tuple[str, ...], linked: tuple[str, ...]) -> tuple[Path, Path]:
        object_file, program = self.folder / "source.o", self.folder / "program"
        compiler = os.environ["ORVANE_COMPILER"]
        subprocess.run([compiler, *compiled, "-c", self.folder / "source.cpp", "-o", object_file],
                       check=True)
        subprocess.run([compiler, *linked, object_file, "-o", program], check=True)
        return object_file, program

    def test_nothing_is_missed_in_a_hardened_program(self) -> None:
        object_file, program = self.build(COMPILED, LINKED)
        self.assertEqual(hardening.missing_in_program(program), set())
        self.assertEqual(hardening.missing_in_objects([object_file]), set())

    def test_each_protection_of_a_program(self) -> None:
        for option, instead, missing in (
                ("-Wl,-z,relro", "-Wl,-z,norelro", hardening.READ_ONLY_RELOCATIONS),
                ("-Wl,-z,now", "-Wl,-z,lazy", hardening.NO_LAZY_BINDING),
                ("-Wl,-z,noexecstack", "-Wl,-z,execstack", hardening.NO_EXECUTABLE_STACK)):
            with self.subTest(missing=missing):
                linked = tuple(instead if word == option else word for word in LINKED)
                self.assertEqual(hardening.missing_in_program(self.build(COMPILED, linked)[1]),
                                 {missing})

    def test_a_static_program_binds_nothing_late(self) -> None:
        self.assertEqual(hardening.missing_in_program(self.build(COMPILED, (*LINKED, "-static"))[1]),
                         set())

    def test_a_program_without_canaries(self) -> None:
        for option, missing in (("-fstack-protector-strong", set()),
                                ("-fno-stack-protector", {hardening.STACK_PROTECTOR})):
            with self.subTest(option=option):
                compiled = (option, *COMPILED[:1])
                self.assertEqual(hardening.missing_in_dynamic(self.build(compiled, LINKED)[1]), missing)

    def test_each_protection_of_an_object(self) -> None:
        for option, instead, missing in (
                ("-fstack-protector-strong", "-fno-stack-protector", hardening.STACK_PROTECTOR),
                ("-D_FORTIFY_SOURCE=2", "-D_FORTIFY_SOURCE=0", hardening.CHECKED_CALLS)):
            with self.subTest(missing=missing):
                compiled = tuple(instead if word == option else word for word in COMPILED)
                self.assertEqual(hardening.missing_in_objects([self.build(compiled, LINKED)[0]]),
                                 {missing})


if __name__ == "__main__":
    unittest.main()
