# SPDX-License-Identifier: Apache-2.0
"""Changes one thing in the product at a time and checks whether the suite notices.

Exit status: 0 enough is noticed and the rest is explained, 1 it is not, 2 the project could not be built, or
its suite fails without any change.
"""

from __future__ import annotations

import argparse
import itertools
import sys
from collections import Counter
from collections.abc import Callable, Container, Sequence
from dataclasses import replace

from mutate.campaign import (PROJECT, Choice, argument_parser, choose, in_jobs, limited,
                             print_list, print_table, stale_entries)
from mutate.listed import Entry, EntryError, read_entries
from mutate.mutants import Key, Mutant
from mutate.scratch import Broken
from mutate.suite import Outcome, SuiteJob, build_base, read_suites

EQUIVALENT = PROJECT / "tests/mutate/equivalent.txt"

# In percent.
ENOUGH = 97.0

COLUMNS = ("tests", "compiler", "equivalent", "survived")


def verdict(outcome: Outcome, is_listed: bool) -> str:
    """The column in which a mutant counts."""
    if outcome.by == "":
        return "equivalent" if is_listed else "survived"
    return "compiler" if outcome.by == "compiler" else "tests"


def progress(total: int, listed: Container[Key]) -> Callable[[Mutant, Outcome], None]:
    done = itertools.count(1)

    def say(mutant: Mutant, outcome: Outcome) -> None:
        by = outcome.by or ("equivalent" if mutant.key() in listed else "SURVIVED")
        print(f"[{next(done)}/{total}] {mutant.path}:{mutant.line}: {by}: {mutant.after[:90]}",
              flush=True)

    return say


def try_all(choice: Choice, listed: Container[Key], number: int) -> list[Outcome]:
    """The slowest tests run only for unexplained mutants that all other tests let pass."""
    mutants = choice.chosen
    base = build_base(choice.scratch, number)
    suites = read_suites(base)
    jobs = [SuiteJob(base, suites, index) for index in range(number)]
    try:
        for job in jobs:
            job.check_original()
        outcomes = in_jobs(jobs, mutants, SuiteJob.attempt, progress(len(mutants), listed))
        left = [index for index, outcome in enumerate(outcomes)
                if not outcome.by and mutants[index].key() not in listed]
        if left:
            print(f"{len(left)} more to try with failing system calls")
            jobs[0].check_original_faults()
            again = in_jobs(jobs, [mutants[index] for index in left], SuiteJob.attempt_faults,
                            progress(len(left), listed))
            for index, outcome in zip(left, again):
                outcomes[index] = outcome
        return outcomes
    finally:
        for job in jobs:
            job.close()


def report(choice: Choice, outcomes: Sequence[Outcome], entries: Sequence[Entry]) -> bool:
    """Prints everything. Returns whether enough is noticed and nothing unexplained survives."""
    listed = {entry.key() for entry in entries}
    verdicts = [verdict(outcome, mutant.key() in listed)
                for mutant, outcome in zip(choice.chosen, outcomes)]
    for mutant, word in zip(choice.chosen, verdicts):
        if word == "survived":
            print(f"\nsurvived, {mutant.path}:{mutant.line}, occurrence {mutant.occurrence}")
            print(mutant.diff(choice.originals[mutant.path]), end="")
    print_table(choice.chosen, verdicts, COLUMNS)
    counts = Counter(verdicts)
    killed, survived = counts["tests"], counts["survived"]
    slow = sum(outcome.by == "time limit" for outcome in outcomes)
    print(f"\n{counts['compiler']} more refused by the compiler, {counts['equivalent']} equivalent; "
          f"{slow} of the killed ran into the time limit")
    share = 100 * killed / (killed + survived) if killed + survived else 100.0
    print(f"mutate: {killed + survived} mutants, {killed} killed ({share:.1f} %), "
          f"{survived} survived")
    return share >= ENOUGH and survived == 0


def parse_arguments(arguments: Sequence[str]) -> argparse.Namespace:
    parser = argument_parser("mutate", __doc__)
    parser.add_argument("--limit", type=int, help="how many mutants, from every file in turn")
    return parser.parse_args(arguments)


def main(arguments: Sequence[str]) -> int:
    options = parse_arguments(arguments)
    choice = choose(options)
    if options.limit is not None:
        choice = replace(choice, chosen=limited(choice.chosen, options.limit, options.seed))
    if not choice.chosen:
        print("mutate: nothing to change", file=sys.stderr)
        return 2
    if options.list:
        print_list(choice.chosen)
        return 0
    try:
        entries = read_entries(EQUIVALENT)
        outcomes = try_all(choice, {entry.key() for entry in entries}, options.jobs)
    except (Broken, EntryError) as error:
        print(f"mutate: {error}", file=sys.stderr)
        return 2
    noticed = {mutant.key(): f"noticed by {outcome.by}"
               for mutant, outcome in zip(choice.chosen, outcomes) if outcome.by}
    problems = stale_entries(EQUIVALENT.name, entries, choice.made, noticed, options.only)
    is_good = report(choice, outcomes, entries)
    for problem in problems:
        print(problem, file=sys.stderr)
    return 0 if is_good and not problems else 1
