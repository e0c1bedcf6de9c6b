# SPDX-License-Identifier: Apache-2.0
"""Runs orvane in random units and compares each with what the model predicts.

Exit status: 0 all agree, 1 a difference or an outcome that never came up, 2 the
tool could not be run.
"""

from __future__ import annotations

import argparse
import os
from collections.abc import Sequence
from dataclasses import dataclass

from drivers import random_units, runner
from drivers.certain_units import CERTAIN_UNITS
from drivers.random_units import Finding, Question, RandomUnit
from drivers.units import make_unit
from model import parts, snapshot
from model.prediction import predict

# Neither of these may change anything but the modes of files.
ENVIRONMENTS = ({}, {}, {"POSIXLY_CORRECT": "1"}, {"LC_ALL": "de_DE.UTF-8", "TMPDIR": "/fs"})
MASKS = (0o022, 0o022, 0o000, 0o027, 0o077, 0o002)


@dataclass(frozen=True)
class Tools(runner.Tools):
    shows_proc: bool


def check(unit: RandomUnit, tools: Tools) -> Finding:
    if tools.shows_proc:
        (unit.root / "proc").mkdir()
    mask = unit.rng.choice(MASKS)
    environment = unit.rng.choice(ENVIRONMENTS)
    prediction = predict(unit.root, unit.arguments, tools.names)
    before = snapshot.take(unit.root)
    os.umask(mask)
    try:
        result = runner.run(tools.command(unit.root, unit.arguments), unit.root, environment)
    finally:
        os.umask(0o022)
    ways = prediction.alternatives[0].ways
    return Finding(runner.differences(before, prediction, result, mask),
                   frozenset(f"{output} {way}" for output, way in ways.items()))


# A tuning file's fallback is the file of an unreadable disk.
QUESTION = Question("differential", make_unit, check,
                    [f"{output} {way}" for output in parts.OUTPUTS
                     for way in ("generated", "fallback")], certain=CERTAIN_UNITS)


def main(arguments: Sequence[str]) -> int:
    parser = argparse.ArgumentParser(QUESTION.name, description=__doc__)
    random_units.add_arguments(parser, units=500)
    parser.add_argument("--shows-proc", action="store_true",
                        help="the units have a folder for the host's /proc, for a sanitized tool")
    options = parser.parse_args(arguments)
    common = runner.tools(options)
    tools = Tools(common.orvane, common.enter, common.names, options.shows_proc)
    return random_units.ask(QUESTION, tools, options, *(["--shows-proc"] if options.shows_proc else []))
