# SPDX-License-Identifier: Apache-2.0
"""The trial of explain, with programs made for it."""

from __future__ import annotations

import contextlib
import io
import json
import os
import tempfile
import unittest
from collections.abc import Sequence
from pathlib import Path

from drivers.explain import same_tree
from model import parts, snapshot
from mutate import agreement, explain
from mutate.agreement import (BROKEN, COMPILER, DIFFERS, EXPLAINED, UNCHANGED, Case, Finding,
                              Recipe)
from mutate.listed import parse_entries, read_entries
from mutate.mutants import Mutant

OUTPUT = "/tmp/airplay.conf"
OTHER = "/tmp/iap1.cfg"
ENDED = (EXPLAINED, DIFFERS, UNCHANGED, BROKEN, COMPILER)


def program(path: Path, script: str) -> Path:
    path.write_text(f"#!/bin/sh\n{script}\n", encoding="ascii")
    path.chmod(0o700)
    return path


def said(path: str, text: str) -> str:
    """What explain prints for one generated output."""
    line = {"text": text, "reasons": ["fixed-text"], "key": None, "detail": ""}
    return json.dumps({
        "format": 1, "command": "explain", "root": "/", "letters": "a", "isIntended": True,
        "outputs": [{"path": path, "outcome": "generated", "isIntended": True,
                     "reasons": ["generated"], "lines": [line], "left": "file",
                     "content": text}]})


class Programs(unittest.TestCase):
    """Scripts in place of the tools: the tool's script gets the unit's folder as $ROOT."""

    def setUp(self) -> None:
        folder = tempfile.TemporaryDirectory()
        self.addCleanup(folder.cleanup)
        self.folder = Path(folder.name)
        self.enter = program(self.folder / "enter", 'ROOT=$1; export ROOT; shift; exec "$@"')
        self.original = self.orvane('printf "old\\n" > "$ROOT/tmp/airplay.conf"')
        self.made: list[Path] = []

    def orvane(self, script: str) -> Path:
        return program(Path(tempfile.mkdtemp(dir=self.folder)) / "orvane", script)

    def writing(self, text: str) -> Path:
        return self.orvane(f'printf "{text}\\n" > "$ROOT{OUTPUT}"')

    def unit_tool(self, script: str) -> Path:
        return program(self.folder / "orvane-unit", script)

    def saying(self, path: str, text: str) -> Path:
        answer = self.folder / "answer"
        answer.write_text(said(path, text), encoding="ascii")
        return self.unit_tool(f'cat "{answer}"')

    def case(self, *arguments: str) -> Case:
        def make(root: Path) -> list[str]:
            parts.put_base(root)
            parts.put(root, "/fs/stock", b"stock")
            self.made.append(root)
            return list(arguments)

        return Case(Recipe("bench", make), self.folder / f"unit{len(self.made)}", self.enter,
                    self.original)

    def finding(self, orvane: Path, unit_tool: Path, *cases: Case) -> Finding:
        """The finding of a job once both programs are built."""
        tried = cases or (self.case("-a"),)
        first = agreement.first_change(tried, orvane)
        if isinstance(first, str):
            return Finding(first)
        return agreement.compare(tried, first, orvane, unit_tool)


class FindingTest(Programs):
    def test_explain_that_follows_the_change_agrees(self) -> None:
        found = self.finding(self.writing("new"), self.saying(OUTPUT, "new\n"))
        self.assertEqual(found, Finding(EXPLAINED))
        self.assertTrue(found.changes_an_output())

    def test_explain_that_gives_the_old_content_differs_and_the_bytes_are_shown(self) -> None:
        found = self.finding(self.writing("new"), self.saying(OUTPUT, "old\n"))
        self.assertEqual((found.word, found.lines[0]), (DIFFERS, "bench: -a"))
        self.assertIn("'new\\n'", "".join(found.lines[1:]))
        self.assertIn("'old\\n'", "".join(found.lines[1:]))

    def test_lines_that_are_not_the_content_differ(self) -> None:
        answer = json.loads(said(OUTPUT, "new\n"))
        answer["outputs"][0]["lines"][0]["text"] = "ne\n"
        (self.folder / "answer").write_text(json.dumps(answer), encoding="ascii")
        found = self.finding(self.writing("new"),
                             self.unit_tool(f'cat "{self.folder / "answer"}"'))
        self.assertEqual(found.word, DIFFERS)

    def test_explain_that_fails_differs(self) -> None:
        for script in ("exit 2", "echo 'bad program' >&2; exit 1", "kill -9 $$", "echo '{}'"):
            with self.subTest(script):
                found = self.finding(self.writing("new"), self.unit_tool(script))
                self.assertEqual(found.word, DIFFERS)
                self.assertIn("explain: ", found.lines[1])

    def test_output_that_explain_does_not_name_differs(self) -> None:
        orvane = self.orvane(f'printf "old\\n" > "$ROOT{OUTPUT}"; echo > "$ROOT{OTHER}"')
        found = self.finding(orvane, self.saying(OUTPUT, "old\n"))
        self.assertEqual(found, Finding(DIFFERS, (
            "bench: -a", f"{OTHER}: the run changes it, and explain does not name it")))

    def test_unit_without_a_change_must_agree_too(self) -> None:
        orvane = self.orvane(
            f'[ "$1" = -a ] && text=new || text=old; printf "$text\\n" > "$ROOT{OUTPUT}"')
        found = self.finding(orvane, self.saying(OUTPUT, "new\n"), self.case("-a"),
                             self.case("-i"))
        self.assertEqual((found.word, found.lines[0]), (DIFFERS, "bench: -i"))

    def test_without_an_option_explain_is_not_asked_and_nothing_may_change(self) -> None:
        found = self.finding(self.writing("new"), self.unit_tool("exit 2"), self.case("word"))
        self.assertEqual(found, Finding(DIFFERS, (
            "bench: ", f"{OUTPUT}: the run changes it, and explain does not name it")))

    def test_explain_is_not_asked_when_no_output_changes(self) -> None:
        found = self.finding(self.orvane(f'printf "old\\n" > "$ROOT{OUTPUT}"; echo more; exit 3'),
                             self.unit_tool("exit 2"))
        self.assertEqual(found, Finding(UNCHANGED))
        self.assertFalse(found.changes_an_output())

    def test_run_that_crashes_proves_nothing(self) -> None:
        self.assertEqual(self.finding(self.orvane("kill -6 $$"), self.unit_tool("exit 2")),
                         Finding(BROKEN))
        orvane = self.orvane(
            f'[ "$1" = -a ] || kill -6 $$; printf "new\\n" > "$ROOT{OUTPUT}"')
        found = self.finding(orvane, self.saying(OUTPUT, "new\n"), self.case("-i"),
                             self.case("-a"))
        self.assertEqual(found, Finding(EXPLAINED))


class UndoTest(Programs):
    def undone(self, script: str, times_made: int) -> None:
        """Requires that the unit is as before, and how many times it was made."""
        case = self.case("-a")
        case.run_and_undo(self.orvane(script))
        self.assertEqual(snapshot.take(case.root), case.before)
        self.assertEqual(len(self.made), times_made)
        self.made.clear()

    def test_writes_are_undone_in_place(self) -> None:
        self.undone('echo new > "$ROOT/tmp/a"; echo new > "$ROOT/fs/stock"', 1)

    def test_anything_else_needs_a_new_unit(self) -> None:
        for script in ('rm "$ROOT/fs/stock"', 'mkdir "$ROOT/tmp/a"', 'chmod 600 "$ROOT/fs/stock"',
                       'rm "$ROOT/fs/stock"; ln -s a "$ROOT/fs/stock"'):
            with self.subTest(script):
                self.undone(script, 2)

    def test_golden_and_random_units_are_made_as_described(self) -> None:
        golden = self.folder / "golden"
        golden.mkdir()
        (golden / "arguments").write_text("-a\n-i\n", encoding="ascii")
        tool = self.unit_tool('[ "$1 $3" = "new --from" ] && mkdir "$2" && cp "$4" "$2"')
        (golden / "unit.toml").write_text("", encoding="ascii")
        made = agreement.golden_recipe(golden, tool)
        self.assertEqual(made.make(self.folder / "1"), ["-a", "-i"])
        self.assertEqual(os.listdir(self.folder / "1"), ["unit.toml"])
        for index in range(5):
            first, again = (self.folder / f"{name}{index}" for name in ("first", "again"))
            arguments = agreement.random_recipe(index).make(first)
            self.assertLessEqual(set(arguments), {"-a", "-i"})
            self.assertEqual(agreement.random_recipe(index).make(again), arguments)
            self.assertEqual(same_tree.differences(first, again), [])


def mutant(line: int) -> Mutant:
    return Mutant("src/a/b.cpp", line, f"old {line}", f"new {line}", 1, False, "")


def tried(*words: str) -> list[explain.Tried]:
    return [(mutant(line), Finding(word, ("bench: -a",))) for line, word in enumerate(words, 1)]


def entry(line: int, reason: str = "no one can know") -> str:
    return f"@ src/a/b.cpp\n- old {line}\n+ new {line}\n= {reason}\n\n"


class TryUntilTest(unittest.TestCase):
    def test_mutants_are_tried_in_their_order_until_enough_change_an_output(self) -> None:
        mutants = [mutant(line) for line in range(1, 20)]
        asked: list[int] = []

        def try_some(some: Sequence[Mutant]) -> list[Finding]:
            asked.append(len(some))
            return [Finding(EXPLAINED if each.line % 2 else UNCHANGED) for each in some]

        found = explain.try_until(mutants, 4, try_some)
        self.assertEqual([each.line for each, _ in found], [1, 2, 3, 4, 5, 6, 7])
        self.assertEqual(asked, [4, 2, 1])
        self.assertEqual(len(explain.try_until(mutants, 11, try_some)), len(mutants))


class VerdictTest(unittest.TestCase):
    def is_good(self, found: list[explain.Tried], listed: str = "", fewest: int = 0) -> bool:
        self.printed = io.StringIO()
        keys = {each.key() for each in parse_entries(listed, "list.txt")}
        with contextlib.redirect_stdout(self.printed), contextlib.redirect_stderr(io.StringIO()):
            return explain.report(found, keys, fewest)

    def test_a_difference_counts_as_listed_only_when_it_is(self) -> None:
        for word in ENDED:
            self.assertEqual(explain.verdict(Finding(word), False), word)
            self.assertEqual(explain.verdict(Finding(word), True),
                             "listed" if word == DIFFERS else word)

    def test_enough_explained_and_the_rest_listed_is_good(self) -> None:
        found = tried(DIFFERS, *[EXPLAINED] * 19, UNCHANGED, COMPILER, BROKEN)
        self.assertTrue(self.is_good(found, entry(1)))
        self.assertIn("\nexplain: 20 mutants change an output, 19 explained (95.0 %)\n",
                      self.printed.getvalue())

    def test_what_is_not_listed_is_not_good(self) -> None:
        self.assertFalse(self.is_good(tried(DIFFERS, *[EXPLAINED] * 19), entry(2)))

    def test_too_little_explained_is_not_good_even_when_listed(self) -> None:
        self.assertFalse(self.is_good(tried(DIFFERS, *[EXPLAINED] * 18), entry(1)))

    def test_too_few_that_change_an_output_are_not_good(self) -> None:
        found = tried(*[EXPLAINED] * 99, UNCHANGED)
        self.assertFalse(self.is_good(found, fewest=100))
        self.assertTrue(self.is_good([*found, *tried(EXPLAINED)], fewest=100))
        self.assertFalse(self.is_good(tried(UNCHANGED)))


class ListTest(unittest.TestCase):
    def test_entries_without_a_difference_are_untrue(self) -> None:
        untrue = explain.untrue_entries(tried(DIFFERS, EXPLAINED, UNCHANGED, BROKEN, COMPILER))
        self.assertEqual([untrue.get(mutant(line).key()) for line in range(1, 6)],
                         [None, "explain agrees with the run", "changes no output: unchanged",
                          "changes no output: broken", "changes no output: compiler"])

    def test_reasons_that_the_document_does_not_give_are_named(self) -> None:
        entries = parse_entries(entry(1) + entry(2, "the disk is gone"), "list.txt")
        self.assertEqual(explain.untold_reasons("list.txt", entries, "As no one\n  can know, so."),
                         ["list.txt:6: promises.md does not give this reason"])

    def test_own_list_is_well_formed_and_explained(self) -> None:
        entries = read_entries(explain.UNEXPLAINED)
        promises = explain.PROMISES.read_text(encoding="utf-8")
        self.assertEqual(explain.untold_reasons(explain.UNEXPLAINED.name, entries, promises), [])
        for each in entries:
            self.assertTrue(each.path.startswith(explain.FOLDERS), each.path)
