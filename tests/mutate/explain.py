# SPDX-License-Identifier: Apache-2.0
"""Changes one thing in the product at a time and checks whether orvane-unit's explain follows.

Both programs are built from the mutated sources. In every golden unit and in some random ones,
explain must say to the byte what the run then leaves behind. Only mutants that change an output
count.

Exit status: 0 explain follows enough of them and the others have a reason, 1 it does not, 2 the
project could not be built, or explain fails without any change.
"""

from __future__ import annotations

import argparse
import sys
from collections import Counter
from collections.abc import Callable, Container, Sequence
from dataclasses import replace

from drivers.runner import BrokenRun
from mutate.agreement import DIFFERS, EXPLAINED, AgreementJob, Finding, build_base
from mutate.campaign import (PROJECT, Choice, argument_parser, choose, in_jobs, in_turn, print_list,
                             print_table, stale_entries)
from mutate.listed import Entry, EntryError, read_entries
from mutate.mutants import Key, Mutant
from mutate.scratch import Broken, limit_resources

UNEXPLAINED = PROJECT / "tests/mutate/unexplained.txt"
PROMISES = PROJECT / "docs/promises.md"

FOLDERS = ("src/config/", "src/identity/", "src/main/", "src/tuning/", "src/writers/")

# In percent.
ENOUGH = 95.0
# With fewer mutants that change an output, the result says too little.
FEWEST = 100

LISTED = "listed"
COLUMNS = ("compiler", "broken", "unchanged", EXPLAINED, LISTED, DIFFERS)

Tried = tuple[Mutant, Finding]


def try_until(mutants: Sequence[Mutant], limit: int,
              try_some: Callable[[Sequence[Mutant]], Sequence[Finding]]) -> list[Tried]:
    """Tries mutants in their order until `limit` of them change an output.

    Each round tries as many as are still missing: so the same ones are tried, whatever the number of jobs.
    """
    tried: list[Tried] = []
    while len(tried) < len(mutants):
        missing = limit - sum(finding.changes_an_output() for _, finding in tried)
        if missing <= 0:
            break
        some = mutants[len(tried):len(tried) + missing]
        tried += zip(some, try_some(some))
    return tried


def say(mutant: Mutant, finding: Finding) -> None:
    print(f"{mutant.path}:{mutant.line}: {finding.word}: {mutant.after[:90]}", flush=True)


def try_all(choice: Choice, limit: int, number: int) -> list[Tried]:
    base = build_base(choice.scratch, number)
    jobs: list[AgreementJob] = []
    try:
        for index in range(number):
            jobs.append(AgreementJob(base, index))
        jobs[0].check_original()
        return try_until(choice.chosen, limit,
                         lambda some: in_jobs(jobs, some, AgreementJob.attempt, say))
    finally:
        for job in jobs:
            job.close()


def verdict(finding: Finding, is_listed: bool) -> str:
    """The column in which a mutant counts."""
    return LISTED if finding.word == DIFFERS and is_listed else finding.word


def untrue_entries(tried: Sequence[Tried]) -> dict[Key, str]:
    """The mutants that must not be in the list of those that explain does not follow, and why."""
    untrue = {}
    for mutant, finding in tried:
        if finding.word == EXPLAINED:
            untrue[mutant.key()] = "explain agrees with the run"
        elif not finding.changes_an_output():
            untrue[mutant.key()] = f"changes no output: {finding.word}"
    return untrue


def untold_reasons(name: str, entries: Sequence[Entry], document: str) -> list[str]:
    """The entries of the list `name` whose reason the document does not give."""
    text = " ".join(document.split())
    return [f"{name}:{entry.line}: {PROMISES.name} does not give this reason" for entry in entries
            if entry.reason not in text]


def print_differences(choice: Choice, tried: Sequence[Tried], listed: Container[Key]) -> None:
    for mutant, finding in tried:
        if finding.word == DIFFERS:
            word = "differs, as listed" if mutant.key() in listed else "differs"
            print(f"\n{word}, {mutant.path}:{mutant.line}, occurrence {mutant.occurrence}")
            print(mutant.diff(choice.originals[mutant.path]), end="")
            print(f"explain's (found) and the run's (expected) in {finding.lines[0]}")
            print("\n".join(finding.lines[1:]))


def report(tried: Sequence[Tried], listed: Container[Key], fewest: int) -> bool:
    """Prints the numbers. Returns whether explain follows enough, and every other mutant is listed."""
    verdicts = [verdict(finding, mutant.key() in listed) for mutant, finding in tried]
    print_table([mutant for mutant, _ in tried], verdicts, COLUMNS)
    counts = Counter(verdicts)
    explained = counts[EXPLAINED]
    changing = explained + counts[LISTED] + counts[DIFFERS]
    share = 100 * explained / changing if changing else 0.0
    print(f"\nexplain: {changing} mutants change an output, {explained} explained ({share:.1f} %)")
    if changing < fewest:
        print(f"explain: at least {fewest} must change an output", file=sys.stderr)
    return share >= ENOUGH and counts[DIFFERS] == 0 and changing >= fewest


def parse_arguments(arguments: Sequence[str]) -> argparse.Namespace:
    parser = argument_parser("mutate --explain", __doc__)
    parser.add_argument("--limit", type=int, default=150,
                        help="how many mutants that change an output, from every file in turn (150)")
    return parser.parse_args(arguments)


def main(arguments: Sequence[str]) -> int:
    options = parse_arguments(arguments)
    choice = choose(options, *FOLDERS)
    choice = replace(choice, chosen=in_turn(choice.chosen, options.seed))
    if not choice.chosen:
        print("explain: nothing to change", file=sys.stderr)
        return 2
    if options.list:
        print_list(choice.chosen)
        return 0
    # An endless loop must not exhaust the host; child processes inherit the limits.
    limit_resources()
    try:
        entries = read_entries(UNEXPLAINED)
        tried = try_all(choice, options.limit, options.jobs)
    except (Broken, BrokenRun, EntryError) as error:
        print(f"explain: {error}", file=sys.stderr)
        return 2
    listed = {entry.key() for entry in entries}
    print_differences(choice, tried, listed)
    # A single file may not have that many.
    fewest = min(FEWEST, options.limit) if not options.only else 0
    is_good = report(tried, listed, fewest)
    problems = [
        *stale_entries(UNEXPLAINED.name, entries, choice.made, untrue_entries(tried), options.only),
        *untold_reasons(UNEXPLAINED.name, entries, PROMISES.read_text(encoding="utf-8"))]
    for problem in problems:
        print(problem, file=sys.stderr)
    return 0 if is_good and not problems else 1
