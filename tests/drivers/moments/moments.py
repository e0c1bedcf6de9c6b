# SPDX-License-Identifier: Apache-2.0
"""Disturbs runs of orvane between two of their system calls, and from beside.

A run is killed before each of its calls: each output is then as it was, or a beginning of what a whole run leaves;
nothing else has changed, and the next run leaves what a first one does. Before each call the image is replaced,
rewritten, grown or cut: each line of an output is then one that the image before or after calls for. A publisher that
changes the image freely beside runs, and two runs at once, make no other difference either. A message that nobody
reads ends a run.

Exit status: 0 all is so, 1 something is not, 2 the tool could not be run.
"""

from __future__ import annotations

import argparse
import os
import signal
import subprocess
import tempfile
from collections.abc import Sequence
from pathlib import Path

from drivers import runner
from drivers.faults.scenarios import SCENARIOS
from drivers.moments import kills, pairs, publisher
from drivers.moments.call_stops import MASK, Tools, whole_run
from drivers.moments.publisher import CHANGES, FIRST, SCENARIO, Allowed
from model import parts


def tell(what: object, lines: list[str]) -> bool:
    """Prints what was wrong, and says whether nothing was."""
    if lines:
        print(f"moments: {what}:\n" + "\n".join(f"  {line}" for line in lines))
    return not lines


def check_kills(tools: Tools, jobs: int, every: int) -> bool:
    all_of_them = [kills.Kill(index, number, whole, tools)
                   for index, scenario in enumerate(SCENARIOS)
                   for whole in [whole_run(tools, scenario)]
                   for number in range(1, whole.calls + 1)]
    some = all_of_them[::every]
    with runner.workers(jobs) as pool:
        good = [tell(kill, lines) for kill, lines in pool.map(kills.check, some, chunksize=8)]
    print(f"moments: {len(good)} runs killed, {good.count(True)} as they may be")
    return all(good) and len(good) > 0


def check_changes(tools: Tools, jobs: int, every: int) -> bool:
    calls = whole_run(tools, SCENARIO).calls
    allowed = {change.name: Allowed.between(tools, parts.image(FIRST), change.image) for change in CHANGES}
    all_of_them = [publisher.Moment(change, number, allowed[change.name], tools)
                   for change in CHANGES for number in range(1, calls + 1)]
    # Those that may end a run do so before few calls, so all of them are tried.
    some = [moment for i, moment in enumerate(all_of_them) if i % every == 0 or moment.change.may_end]
    good, ended = [], 0
    with runner.workers(jobs) as pool:
        for moment, lines, is_ended in pool.map(publisher.check, some, chunksize=8):
            good.append(tell(moment, lines))
            ended += is_ended
    print(f"moments: {len(good)} runs with a changed image, {good.count(True)} as they may be, of which {ended} "
          "ended by a cut image")
    return all(good) and ended > 0


def check_publisher(tools: Tools, seconds: float) -> bool:
    runs, published, lines = publisher.run_beside(tools, seconds)
    print(f"moments: {runs} runs beside {published} published images")
    return tell("a publisher beside the run", lines) and published > 1


def check_pairs(tools: Tools, jobs: int, count: int) -> bool:
    some = [pairs.Pair(number % len(SCENARIOS), number, tools) for number in range(count)]
    with runner.workers(jobs) as pool:
        good = [tell(pair, lines) for pair, lines in pool.map(pairs.check, some, chunksize=8)]
    print(f"moments: {len(good)} pairs of runs at once, {good.count(True)} as one run")
    return all(good) and len(good) > 0


def run_unheard(tools: Tools, root: Path, arguments: Sequence[str]) -> int:
    """The status of a run whose standard error is a pipe that nobody reads any more."""
    reading, writing = os.pipe()
    os.close(reading)
    try:
        return subprocess.run(tools.command(root, arguments), stdin=subprocess.DEVNULL, stderr=writing,
                              timeout=runner.TIME_LIMIT, check=False).returncode
    finally:
        os.close(writing)


def check_unheard(tools: Tools) -> bool:
    """The C library's line for an unknown option ends such a run, by the signal that is every program's default."""
    lines = []
    for arguments, writes_before in ((["-x", "-a"], False), (["-a", "-x"], True)):
        with tempfile.TemporaryDirectory(prefix="orvane moment-") as folder:
            root = Path(folder)
            SCENARIO.make(root)
            status = run_unheard(tools, root, arguments)
            if status != -signal.SIGPIPE or (root / "tmp/airplay.conf").exists() != writes_before:
                lines.append(f"{arguments}: status {status}, wrote {sorted(os.listdir(root / 'tmp'))}")
    print("moments: 2 runs with an unknown option, whose message nobody reads")
    return tell("a message that nobody reads", lines)


def main(arguments: Sequence[str]) -> int:
    parser = argparse.ArgumentParser("moments", description=__doc__,
                                     formatter_class=argparse.RawDescriptionHelpFormatter)
    runner.add_arguments(parser)
    parser.add_argument("--at-call", required=True, help="the program of at_call.cpp")
    parser.add_argument("--every", type=int, default=1, help="only every N-th moment, such as 5")
    parser.add_argument("--seconds", type=float, default=60, help="of runs beside a publisher")
    parser.add_argument("--pairs", type=int, default=1000, help="of runs at once")
    parser.add_argument("--jobs", type=int, default=2)
    options = parser.parse_args(arguments)
    os.umask(MASK)
    common = runner.tools(options)
    tools = Tools(common.orvane, common.enter, common.names, options.at_call)
    try:
        results = [check_kills(tools, options.jobs, options.every),
                   check_changes(tools, options.jobs, options.every),
                   check_publisher(tools, options.seconds),
                   check_pairs(tools, options.jobs, options.pairs),
                   check_unheard(tools)]
    except runner.BrokenRun as error:
        print(f"moments: the tool was not run: {error}")
        return 2
    return 0 if all(results) else 1
