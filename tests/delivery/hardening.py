# SPDX-License-Identifier: Apache-2.0
"""Reads from ELF files whether they were hardened.

Headers show most protections. A dynamic program's canaries show in what it asks the C library for. A static
program contains the C library's own, and a checked call remains only where the compiler can't prove a size,
so the objects show how the code was compiled.
"""

from __future__ import annotations

from collections.abc import Iterable
from pathlib import Path

from elftools.elf.constants import P_FLAGS
from elftools.elf.dynamic import DynamicSection
from elftools.elf.elffile import ELFFile
from elftools.elf.sections import SymbolTableSection

NO_EXECUTABLE_STACK = "no executable stack"
READ_ONLY_RELOCATIONS = "read-only relocations"
NO_LAZY_BINDING = "no lazy binding"
STACK_PROTECTOR = "stack protector"
CHECKED_CALLS = "checked library calls"


def _is_bound_at_start(dynamic: DynamicSection) -> bool:
    """Either spelling of "now"; a static program, which binds nothing, has no dynamic section."""
    tags = {tag.entry.d_tag: tag.entry.d_val for tag in dynamic.iter_tags()}
    return "DT_BIND_NOW" in tags or bool(tags.get("DT_FLAGS", 0) & 0x8) or \
        bool(tags.get("DT_FLAGS_1", 0) & 0x1)


def missing_in_program(program: Path) -> set[str]:
    with program.open("rb") as file:
        elf = ELFFile(file)
        segments = {segment.header.p_type: segment.header for segment in elf.iter_segments()}
        missing = set()
        stack = segments.get("PT_GNU_STACK")
        if stack is None or stack.p_flags & P_FLAGS.PF_X:
            missing.add(NO_EXECUTABLE_STACK)
        if "PT_GNU_RELRO" not in segments:
            missing.add(READ_ONLY_RELOCATIONS)
        for section in elf.iter_sections():
            if isinstance(section, DynamicSection) and not _is_bound_at_start(section):
                missing.add(NO_LAZY_BINDING)
        return missing


def _undefined_names(file: Path) -> set[str]:
    with file.open("rb") as stream:
        return {symbol.name for section in ELFFile(stream).iter_sections()
                if isinstance(section, SymbolTableSection)
                for symbol in section.iter_symbols() if symbol.entry.st_shndx == "SHN_UNDEF"}


def missing_in_dynamic(program: Path) -> set[str]:
    """For a dynamic program."""
    return set() if "__stack_chk_fail" in _undefined_names(program) else {STACK_PROTECTOR}


def missing_in_objects(objects: Iterable[Path]) -> set[str]:
    """What no object asks the C library for. Not every function needs a canary or a checked call, and not
    every object has one, but some of them do."""
    names = set().union(*map(_undefined_names, objects))
    missing = set()
    if "__stack_chk_fail" not in names:
        missing.add(STACK_PROTECTOR)
    if not any(name.startswith("__") and name.endswith("_chk") for name in names):
        missing.add(CHECKED_CALLS)
    return missing
