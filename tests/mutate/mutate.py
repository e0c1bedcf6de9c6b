# SPDX-License-Identifier: Apache-2.0
"""Changes one thing of the product at a time and looks whether the suite notices.

Exit status: 0 enough is noticed and the rest is explained, 1 not so, 2 the
project could not be built or its suite fails as it is.
"""

from __future__ import annotations

import argparse
import itertools
import queue
import random
import sys
from collections import Counter
from collections.abc import Callable, Container, Sequence
from concurrent.futures import ThreadPoolExecutor
from pathlib import Path

from mutate.listed import Entry, EntryError, read_entries
from mutate.mutants import Key, Mutant, make_mutants
from mutate.scratch import Broken, copy_tree
from mutate.source import read_sources
from mutate.workshop import Base, Job, Outcome

PROJECT = Path(__file__).resolve().parents[2]
EQUIVALENT = PROJECT / "tests/mutate/equivalent.txt"

# Of the rows of a catalogue, so many mutants for each file; of everything else all.
CATALOGUE_SAMPLE = 80
# In percent.
ENOUGH = 97.0

COLUMNS = ("mutants", "tests", "compiler", "equivalent", "survived")


def sample(mutants: Sequence[Mutant], seed: str) -> list[Mutant]:
    """All mutants, but of each catalogue's rows only some."""
    chosen: set[Key] = set()
    for path in sorted({mutant.path for mutant in mutants}):
        keys = [mutant.key() for mutant in mutants if mutant.path == path and mutant.is_row]
        rng = random.Random(f"{seed}:{path}")
        chosen.update(rng.sample(keys, min(len(keys), CATALOGUE_SAMPLE)))
    return [mutant for mutant in mutants if not mutant.is_row or mutant.key() in chosen]


def limited(mutants: Sequence[Mutant], limit: int, seed: str) -> list[Mutant]:
    """So many, drawn from every file in turn."""
    piles: list[list[Mutant]] = []
    for path in sorted({mutant.path for mutant in mutants}):
        pile = [mutant for mutant in mutants if mutant.path == path]
        random.Random(f"{seed}:{path}").shuffle(pile)
        piles.append(pile)
    drawn: set[Key] = set()
    while len(drawn) < limit and any(piles):
        for pile in piles:
            if pile and len(drawn) < limit:
                drawn.add(pile.pop().key())
    return [mutant for mutant in mutants if mutant.key() in drawn]


def verdict(outcome: Outcome, is_listed: bool) -> str:
    """The column that a mutant counts in."""
    if outcome.by == "":
        return "equivalent" if is_listed else "survived"
    return "compiler" if outcome.by == "compiler" else "tests"


def in_jobs(jobs: Sequence[Job], mutants: Sequence[Mutant], listed: Container[Key],
            attempt: Callable[[Job, Mutant], Outcome]) -> list[Outcome]:
    """Tries each mutant in a job that is free, and says what came of it."""
    free: queue.Queue[Job] = queue.Queue()
    for job in jobs:
        free.put(job)
    done = itertools.count(1)

    def once(mutant: Mutant) -> Outcome:
        job = free.get()
        try:
            outcome = attempt(job, mutant)
        finally:
            free.put(job)
        by = outcome.by or ("equivalent" if mutant.key() in listed else "SURVIVED")
        print(f"[{next(done)}/{len(mutants)}] {mutant.path}:{mutant.line}: {by}: "
              f"{mutant.after[:90]}", flush=True)
        return outcome

    with ThreadPoolExecutor(len(jobs)) as pool:
        return list(pool.map(once, mutants))


def try_all(mutants: Sequence[Mutant], listed: Container[Key], base: Base,
            number: int) -> list[Outcome]:
    """The slowest tests see only what all others let pass and what is not explained."""
    jobs = [Job(base, index) for index in range(number)]
    try:
        for job in jobs:
            job.check_original()
        outcomes = in_jobs(jobs, mutants, listed, Job.attempt)
        left = [index for index, outcome in enumerate(outcomes)
                if not outcome.by and mutants[index].key() not in listed]
        if left:
            print(f"{len(left)} more to try with failing system calls")
            jobs[0].check_original_faults()
            again = in_jobs(jobs, [mutants[index] for index in left], listed, Job.attempt_faults)
            for index, outcome in zip(left, again):
                outcomes[index] = outcome
        return outcomes
    finally:
        for job in jobs:
            job.close()


def print_table(mutants: Sequence[Mutant], verdicts: Sequence[str]) -> None:
    counts = Counter(zip((mutant.path for mutant in mutants), verdicts))
    paths = sorted({mutant.path for mutant in mutants})
    width = max(len(path) for path in paths)
    print(f"\n{'':{width}}" + "".join(f"  {column:>10}" for column in COLUMNS))
    for path in [*paths, ""]:
        chosen = [path] if path else paths
        numbers = [sum(counts[each, column] for each in chosen) for column in COLUMNS[1:]]
        print(f"{path or 'all':{width}}" +
              "".join(f"  {number:10}" for number in [sum(numbers), *numbers]))


def stale_entries(entries: Sequence[Entry], made: Sequence[Mutant],
                  results: Sequence[tuple[Mutant, Outcome]], only: str | None) -> list[str]:
    """What is listed as equivalent and is no mutant at all, or one that something noticed."""
    known = {mutant.key() for mutant in made}
    noticed = {mutant.key(): outcome.by for mutant, outcome in results if outcome.by}
    problems = []
    for entry in entries:
        if only in (None, entry.path) and entry.key() not in known:
            problems.append(f"equivalent.txt:{entry.line}: there is no such mutant")
        elif entry.key() in noticed:
            problems.append(f"equivalent.txt:{entry.line}: noticed by {noticed[entry.key()]}")
    return problems


def parse_arguments(arguments: Sequence[str]) -> argparse.Namespace:
    parser = argparse.ArgumentParser(prog="mutate", description=__doc__)
    parser.add_argument("--only", metavar="FILE", help="one source, such as src/main/options.cpp")
    parser.add_argument("--line", type=int, help="of that file, one line")
    parser.add_argument("--limit", type=int, help="so many mutants, from every file in turn")
    parser.add_argument("--jobs", type=int, default=2)
    parser.add_argument("--seed", default="1", help="of what is drawn")
    parser.add_argument("--list", action="store_true", help="only show the mutants")
    parser.add_argument("--build", type=Path, default=PROJECT / "build/mutate")
    return parser.parse_args(arguments)


def report(chosen: Sequence[Mutant], outcomes: Sequence[Outcome], entries: Sequence[Entry],
           originals: dict[str, str]) -> bool:
    """Prints all; whether enough is noticed and nothing unexplained survives."""
    listed = {entry.key() for entry in entries}
    verdicts = [verdict(outcome, mutant.key() in listed)
                for mutant, outcome in zip(chosen, outcomes)]
    for mutant, word in zip(chosen, verdicts):
        if word == "survived":
            print(f"\nsurvived, {mutant.path}:{mutant.line}, occurrence {mutant.occurrence}")
            print(mutant.diff(originals[mutant.path]), end="")
    print_table(chosen, verdicts)
    counts = Counter(verdicts)
    killed, survived = counts["tests"], counts["survived"]
    slow = sum(outcome.by == "time limit" for outcome in outcomes)
    print(f"\n{counts['compiler']} more refused by the compiler, {counts['equivalent']} equivalent; "
          f"{slow} of the killed ran into the time limit")
    share = 100 * killed / (killed + survived) if killed + survived else 100.0
    print(f"mutate: {killed + survived} mutants, {killed} killed ({share:.1f} %), "
          f"{survived} survived")
    return share >= ENOUGH and survived == 0


def main(arguments: Sequence[str]) -> int:
    options = parse_arguments(arguments)
    scratch = options.build.resolve()
    # From here on nothing looks at the project itself, which may change meanwhile.
    copy_tree(PROJECT, scratch / "tree")
    sources = read_sources(scratch / "tree")
    made = make_mutants(sources)
    chosen = [mutant for mutant in sample(made, options.seed)
              if options.only in (None, mutant.path) and options.line in (None, mutant.line)]
    if options.limit is not None:
        chosen = limited(chosen, options.limit, options.seed)
    if not chosen:
        print("mutate: nothing to change", file=sys.stderr)
        return 2
    if options.list:
        for mutant in chosen:
            print(f"{mutant.path}:{mutant.line} ({mutant.occurrence})\n"
                  f"- {mutant.before}\n+ {mutant.after}")
        return 0
    try:
        entries = read_entries(EQUIVALENT)
        outcomes = try_all(chosen, {entry.key() for entry in entries},
                           Base(scratch, options.jobs), options.jobs)
    except (Broken, EntryError) as error:
        print(f"mutate: {error}", file=sys.stderr)
        return 2
    problems = stale_entries(entries, made, list(zip(chosen, outcomes)), options.only)
    is_good = report(chosen, outcomes, entries, {each.path: each.text for each in sources})
    for problem in problems:
        print(problem, file=sys.stderr)
    return 0 if is_good and not problems else 1
