# SPDX-License-Identifier: Apache-2.0
"""What every trial of mutants does: chooses them, hands them to jobs, and counts by file."""

from __future__ import annotations

import argparse
import queue
import random
from collections import Counter
from collections.abc import Callable, Mapping, Sequence
from concurrent.futures import ThreadPoolExecutor
from dataclasses import dataclass
from pathlib import Path
from typing import TypeVar

from mutate.listed import Entry
from mutate.mutants import Key, Mutant, make_mutants
from mutate.scratch import copy_tree
from mutate.source import read_sources
from mutate.workshop import Job

PROJECT = Path(__file__).resolve().parents[2]

# How many mutants of a catalogue's rows are tried for each file; everything else is tried completely.
CATALOGUE_SAMPLE = 80

AnyJob = TypeVar("AnyJob", bound=Job)
Result = TypeVar("Result")


def sample(mutants: Sequence[Mutant], seed: str) -> list[Mutant]:
    """All mutants, but only a sample of each catalogue's rows."""
    chosen: set[Key] = set()
    for path in sorted({mutant.path for mutant in mutants}):
        keys = [mutant.key() for mutant in mutants if mutant.path == path and mutant.is_row]
        rng = random.Random(f"{seed}:{path}")
        chosen.update(rng.sample(keys, min(len(keys), CATALOGUE_SAMPLE)))
    return [mutant for mutant in mutants if not mutant.is_row or mutant.key() in chosen]


def in_turn(mutants: Sequence[Mutant], seed: str) -> list[Mutant]:
    """All mutants, shuffled, from every file in turn: the first ones, however few, are spread evenly."""
    piles: list[list[Mutant]] = []
    for path in sorted({mutant.path for mutant in mutants}):
        pile = [mutant for mutant in mutants if mutant.path == path]
        random.Random(f"{seed}:{path}").shuffle(pile)
        piles.append(pile)
    drawn: list[Mutant] = []
    while any(piles):
        drawn += [pile.pop() for pile in piles if pile]
    return drawn


def limited(mutants: Sequence[Mutant], limit: int, seed: str) -> list[Mutant]:
    """`limit` mutants, drawn from every file in turn."""
    drawn = {mutant.key() for mutant in in_turn(mutants, seed)[:limit]}
    return [mutant for mutant in mutants if mutant.key() in drawn]


def argument_parser(name: str, description: str | None) -> argparse.ArgumentParser:
    parser = argparse.ArgumentParser(prog=name, description=description)
    parser.add_argument("--only", metavar="FILE", action="append", default=[],
                        help="a source, such as src/main/options.cpp; more than once for several")
    parser.add_argument("--line", type=int, help="of those, one line")
    parser.add_argument("--jobs", type=int, default=2)
    parser.add_argument("--seed", default="1", help="of the random choices")
    parser.add_argument("--list", action="store_true", help="only show the mutants")
    parser.add_argument("--build", type=Path, default=PROJECT / "build/mutate")
    return parser


@dataclass(frozen=True)
class Choice:
    """`made` are all mutants of the product, `originals` its texts by path."""

    scratch: Path
    made: Sequence[Mutant]
    chosen: Sequence[Mutant]
    originals: Mapping[str, str]


def choose(options: argparse.Namespace, *folders: str) -> Choice:
    """The mutants of these folders of the product, or of all.

    They come from a copy of the project: from here on nothing reads the project itself.
    """
    scratch = options.build.resolve()
    copy_tree(PROJECT, scratch / "tree")
    sources = read_sources(scratch / "tree")
    made = make_mutants(sources)
    chosen = [mutant for mutant in sample(made, options.seed)
              if mutant.path.startswith(folders or ("",)) and
              (not options.only or mutant.path in options.only) and
              options.line in (None, mutant.line)]
    return Choice(scratch, made, chosen, {source.path: source.text for source in sources})


def print_list(mutants: Sequence[Mutant]) -> None:
    for mutant in mutants:
        print(f"{mutant.path}:{mutant.line} ({mutant.occurrence})\n"
              f"- {mutant.before}\n+ {mutant.after}")


def in_jobs(jobs: Sequence[AnyJob], mutants: Sequence[Mutant],
            attempt: Callable[[AnyJob, Mutant], Result],
            say: Callable[[Mutant, Result], None]) -> list[Result]:
    """Tries each mutant in a free job, and reports its result."""
    free: queue.Queue[AnyJob] = queue.Queue()
    for job in jobs:
        free.put(job)

    def once(mutant: Mutant) -> Result:
        job = free.get()
        try:
            result = attempt(job, mutant)
        finally:
            free.put(job)
        say(mutant, result)
        return result

    with ThreadPoolExecutor(len(jobs)) as pool:
        return list(pool.map(once, mutants))


def print_table(mutants: Sequence[Mutant], verdicts: Sequence[str],
                columns: Sequence[str]) -> None:
    """How many mutants each file and each verdict have."""
    counts = Counter(zip((mutant.path for mutant in mutants), verdicts))
    paths = sorted({mutant.path for mutant in mutants})
    width = max(len(path) for path in paths)
    print(f"\n{'':{width}}" + "".join(f"  {column:>10}" for column in ("mutants", *columns)))
    for path in [*paths, ""]:
        chosen = [path] if path else paths
        numbers = [sum(counts[each, column] for each in chosen) for column in columns]
        print(f"{path or 'all':{width}}" +
              "".join(f"  {number:10}" for number in [sum(numbers), *numbers]))


def stale_entries(name: str, entries: Sequence[Entry], made: Sequence[Mutant],
                  untrue: Mapping[Key, str], only: Sequence[str]) -> list[str]:
    """The entries of the list `name` that match no mutant or are untrue, and why."""
    known = {mutant.key() for mutant in made}
    problems = []
    for entry in entries:
        if (not only or entry.path in only) and entry.key() not in known:
            problems.append(f"{name}:{entry.line}: there is no such mutant")
        elif entry.key() in untrue:
            problems.append(f"{name}:{entry.line}: {untrue[entry.key()]}")
    return problems
