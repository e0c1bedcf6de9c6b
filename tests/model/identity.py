# SPDX-License-Identifier: Apache-2.0
"""Display values of the vehicle and of the unit. Every lookup has a default."""

from __future__ import annotations

from collections.abc import Sequence
from pathlib import Path

from model import configuration, records
from model.system import System

# The display names of all model codes, one a line.
MODEL_NAMES = Path(__file__).with_name("model_names.txt")

MODEL_COUNT = 47
ALIAS = 32
UNKNOWN_MODEL = b"VOXA"
DEFAULT_SERIAL = b"ABCD1234abc"


# Rules: VEH-02, VEH-03
def load_names(path: Path = MODEL_NAMES) -> list[str]:
    """The model display names, code 1 first.

    Code 32 has the name of code 1; all others differ.
    """
    names = path.read_text(encoding="ascii").splitlines()
    if len(names) != MODEL_COUNT:
        raise ValueError(f"{path}: {len(names)} names instead of {MODEL_COUNT}")
    if names[ALIAS - 1] != names[0] or len(set(names)) != MODEL_COUNT - 1:
        raise ValueError(f"{path}: only the names of codes 1 and {ALIAS} may and must be the same")
    return names


# Rules: VEH-01, VEH-02, VEH-04, VEH-05, VEH-13
def model_name(system: System, names: Sequence[str]) -> bytes:
    code = configuration.parameter(system, configuration.MODEL) or 0
    return names[code - 1].encode("ascii") if 1 <= code <= MODEL_COUNT else UNKNOWN_MODEL


# Rules: VEH-06 to VEH-09, VEH-13
def brand_name(system: System) -> bytes:
    code = configuration.parameter(system, configuration.BRAND)
    return b"QUARION" if code == 2 else b"MARL"


# Rules: VEH-10 to VEH-12
def right_hand_drive(system: System) -> int:
    return configuration.parameter(system, configuration.RIGHT_HAND_DRIVE) or 0


# Rules: IAP-04
def fuel_type(system: System) -> None:
    """Unused, but its source is read on every run."""
    configuration.parameter(system, configuration.FUEL_TYPE)


# Rules: SER-02 to SER-05
def unit_serial(system: System) -> bytes:
    record = records.serial_record(system)
    if record is None:
        return DEFAULT_SERIAL
    return record.split(b"\0", 1)[0]
