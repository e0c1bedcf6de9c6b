# SPDX-License-Identifier: Apache-2.0
"""Predicts what a run of orvane leaves behind, independently of its program.

The prediction uses the unit's files as they are before the run, and changes nothing.
"""

from __future__ import annotations

import itertools
import os
from collections.abc import Mapping, Sequence
from dataclasses import dataclass
from pathlib import Path

from model import snapshot, writers
from model.snapshot import Entry
from model.system import CHOICES, Fault, Library, Streams, System
from model.tree import Tree

OPTION_LETTERS = b"ia"


@dataclass(frozen=True)
class Outcome:
    """`written` maps absolute paths, free of links, to content.

    `tmp` is all of /tmp by paths relative to it, old entries included, or None if there is no such
    folder. `ways` says how each output came about. `calls` are every open of a file, and every seek and map
    of the image and the disk, in order: what is done, and its path.
    """

    written: Mapping[str, bytes]
    tmp: Mapping[str, Entry] | None
    ways: Mapping[str, str]
    calls: Sequence[tuple[str, str]]


# Rules: RUN-01, RUN-02
@dataclass(frozen=True)
class Prediction:
    """Any one of `alternatives` is right; without faults there is exactly one.

    `unmet` are the faults whose operation the run never reaches.
    """

    alternatives: tuple[Outcome, ...]
    stderr: bytes
    unmet: tuple[Fault, ...]
    stdout: bytes = b""
    status: int = 0


# Rules: OPT-03 to OPT-14
def parse_options(arguments: Sequence[str]) -> tuple[list[str], bytes]:
    """The letters of writers to run, and what the C library says about the others.

    Options end at the first operand, such as a lone "-", and at "--".
    """
    letters: list[str] = []
    complaints = b""
    for argument in map(os.fsencode, arguments):
        if not argument.startswith(b"-") or argument in (b"-", b"--"):
            break
        for letter in argument[1:]:
            if letter in OPTION_LETTERS:
                letters.append(chr(letter))
            else:
                complaints += b"orvane: invalid option -- '%c'\n" % letter
    return letters, complaints


# Rules: RUN-04, RUN-14, OPT-01, OPT-02, OPT-03, OPT-05
def _run(system: System, letters: Sequence[str], names: Sequence[str]) -> Outcome:
    ways: dict[str, str] = {}
    for letter in letters:
        if letter == "a":
            writers.write_airplay(system, names, ways)
        else:
            writers.write_iap(system, names, ways)
    written = system.tree.written
    after = snapshot.changed(snapshot.take(system.tree.root, "/tmp"), written)
    tmp = {path[len("/tmp/"):]: entry for path, entry in after.items()
           if path.startswith("/tmp/")}
    return Outcome(written, tmp if "/tmp" in after else None, ways, system.calls)


# Rules: RUN-03, RUN-06
def predict(root: Path, arguments: Sequence[str], names: Sequence[str],
            faults: Sequence[Fault] = (), streams: Streams = Streams()) -> Prediction:
    """`names` are the model display names, code 1 first."""
    letters, complaints = parse_options(arguments)
    outcomes: list[Outcome] = []
    met: set[Fault] = set()
    open_choices = [name for operation in {fault.operation for fault in faults}
                        for name in CHOICES.get(operation, ())]
    for choices in itertools.product((False, True), repeat=len(open_choices)):
        library = Library(**dict(zip(open_choices, choices)))
        system = System(Tree(root), faults, library, streams)
        outcome = _run(system, letters, names)
        met |= system.met
        if all(outcome.written != other.written for other in outcomes):
            outcomes.append(outcome)
    unmet = tuple(fault for fault in faults if fault not in met)
    return Prediction(tuple(outcomes), complaints, unmet)
