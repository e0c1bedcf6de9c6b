# SPDX-License-Identifier: Apache-2.0
"""The schema of `orvane-unit explain --json` describes what the program prints, and nothing else."""

from __future__ import annotations

import copy
import json
import os
import re
import subprocess
import tempfile
import unittest
from collections.abc import Iterator
from pathlib import Path
from typing import Any

from jsonschema import Draft202012Validator

PROJECT = Path(__file__).resolve().parents[2]
GOLDEN = PROJECT / "tests/whole_runs/golden"
SCHEMA = json.loads((PROJECT / "docs/explain.schema.json").read_text(encoding="utf-8"))
REASONS = [*SCHEMA["$defs"]["outputReason"]["enum"], *SCHEMA["$defs"]["lineReason"]["enum"]]
UNIT_TOOL = os.environ["ORVANE_UNIT"]

Place = tuple[str | int, ...]


def strict(schema: Any) -> Any:
    """The schema, refusing properties that it does not name."""
    if isinstance(schema, list):
        return [strict(each) for each in schema]
    if not isinstance(schema, dict):
        return schema
    closed = {key: strict(value) for key, value in schema.items()}
    if schema.get("type") == "object":
        closed["additionalProperties"] = False
    return closed


def explanation(root: Path, *options: str) -> Any:
    said = subprocess.run([UNIT_TOOL, "explain", root, "--json", *options], check=False,
                          stdout=subprocess.PIPE)
    if said.returncode not in (0, 1):
        raise AssertionError(f"{root.name}: explain ends with {said.returncode}")
    return json.loads(said.stdout)


def properties(document: Any, place: Place = ()) -> Iterator[Place]:
    """The places of all properties, those of nested objects included."""
    entries = (document.items() if isinstance(document, dict)
               else enumerate(document) if isinstance(document, list) else ())
    for name, value in entries:
        if isinstance(document, dict):
            yield (*place, name)
        yield from properties(value, (*place, name))


def holder_of(document: Any, place: Place) -> Any:
    for name in place[:-1]:
        document = document[name]
    return document


def without(document: Any, place: Place) -> Any:
    damaged = copy.deepcopy(document)
    del holder_of(damaged, place)[place[-1]]
    return damaged


def changed(document: Any, place: Place, value: Any) -> Any:
    damaged = copy.deepcopy(document)
    holder_of(damaged, place)[place[-1]] = value
    return damaged


class SchemaTest(unittest.TestCase):
    def setUp(self) -> None:
        self.validator = Draft202012Validator(SCHEMA)

    def test_it_is_a_schema(self) -> None:
        Draft202012Validator.check_schema(SCHEMA)

    def test_its_codes_are_those_of_the_document_in_their_order(self) -> None:
        text = (PROJECT / "docs/orvane-unit.md").read_text(encoding="utf-8")
        rows = re.findall(r"^\| `([\w-]+)` \| (an output|a line) \|", text, re.MULTILINE)
        self.assertEqual([code for code, _ in rows], REASONS)
        self.assertEqual([code for code, of in rows if of == "an output"],
                         SCHEMA["$defs"]["outputReason"]["enum"])

    def test_its_codes_are_those_of_the_program(self) -> None:
        """Without a case, check names all codes that it knows."""
        with tempfile.TemporaryDirectory(prefix="orvane schema-") as folder:
            (Path(folder) / "fault").mkdir()
            (Path(folder) / "fault/unit.toml").write_text("no description", encoding="utf-8")
            said = subprocess.run([UNIT_TOOL, "check", folder, "--json"], check=False,
                                  stdout=subprocess.PIPE, stderr=subprocess.DEVNULL)
        self.assertEqual(json.loads(said.stdout)["unreached"], REASONS)


class GoldenUnitsTest(unittest.TestCase):
    def test_every_golden_unit_is_explained_as_the_schema_says(self) -> None:
        validator = Draft202012Validator(strict(SCHEMA))
        used = set()
        with tempfile.TemporaryDirectory(prefix="orvane schema-") as folder:
            for case in sorted(GOLDEN.iterdir()):
                root = Path(folder) / case.name
                subprocess.run([UNIT_TOOL, "new", root, "--from", case / "unit.toml"], check=True)
                for options in ((), ("--content", "-i", "-a", "-a")):
                    with self.subTest(case.name, options=options):
                        document = explanation(root, *options)
                        self.assertEqual([error.message for error in validator.iter_errors(document)], [])
                        for output in document["outputs"]:
                            self.assertEqual("content" in output, "--content" in options)
                            used.update(output["reasons"], *(line["reasons"] for line in output["lines"]))
        self.assertEqual(used, set(REASONS))


class DamagedDocumentTest(unittest.TestCase):
    document: Any

    @classmethod
    def setUpClass(cls) -> None:
        cls.validator = Draft202012Validator(SCHEMA)
        with tempfile.TemporaryDirectory(prefix="orvane schema-") as folder:
            root = Path(folder) / "unit"
            subprocess.run([UNIT_TOOL, "new", root], check=True)
            subprocess.run([UNIT_TOOL, "set", root, "serial=hex:ff", "param.134=300"], check=True)
            document = explanation(root, "--content")
        # One of each kind is enough.
        outputs = {output["outcome"]: output for output in document["outputs"]}
        for output in outputs.values():
            output["lines"] = list({tuple(line["reasons"]): line for line in output["lines"]}.values())
        cls.document = {**document, "outputs": list(outputs.values())}

    def refuses(self, document: Any, what: str) -> None:
        self.assertFalse(self.validator.is_valid(document), what)

    def test_whole_document_is_accepted(self) -> None:
        self.assertEqual(list(self.validator.iter_errors(self.document)), [])
        self.assertEqual({output["outcome"] for output in self.document["outputs"]},
                         {"generated", "not-asked"})
        self.assertTrue(any(place[-1] == "hex" for place in properties(self.document)))

    def test_each_property_is_required_but_the_content(self) -> None:
        for place in properties(self.document):
            if place[-1] == "content":
                self.assertTrue(self.validator.is_valid(without(self.document, place)))
            else:
                self.refuses(without(self.document, place), f"without {place}")

    def test_each_property_has_its_type(self) -> None:
        for place in properties(self.document):
            for wrong in (7, [7]):
                self.refuses(changed(self.document, place, wrong), f"{place} is {wrong}")

    def test_missing_is_null_only_where_a_value_may_be_missing(self) -> None:
        for place in properties(self.document):
            if place[-1] != "key":
                is_none = holder_of(self.document, place)[place[-1]] is None
                self.assertEqual(self.validator.is_valid(changed(self.document, place, None)), is_none,
                                 f"{place} is null")

    def test_unknown_code_is_refused(self) -> None:
        for place in properties(self.document):
            if place[-1] == "reasons":
                of_the_other = "generated" if "lines" in place else "fixed-text"
                for codes in ([], ["unheard-of"], [of_the_other]):
                    self.refuses(changed(self.document, place, codes), f"{place} is {codes}")

    def test_unknown_words_are_refused(self) -> None:
        for name, word in (("outcome", "made"), ("left", "pipe"), ("path", "tmp/airplay.conf"),
                           ("hex", "f"), ("hex", "FF"), ("letters", "x"), ("letters", ""),
                           ("command", "show"), ("format", 2), ("outputs", [])):
            places = [place for place in properties(self.document) if place[-1] == name]
            self.assertTrue(places, name)
            for place in places:
                self.refuses(changed(self.document, place, word), f"{place} is {word!r}")

    def test_output_that_is_not_written_has_no_lines(self) -> None:
        line = self.document["outputs"][-1]["lines"][0]
        for number, output in enumerate(self.document["outputs"]):
            if output["outcome"] == "not-asked":
                self.refuses(changed(self.document, ("outputs", number, "lines"), [line]), "a line")

    def test_unknown_property_is_ignored(self) -> None:
        self.assertTrue(self.validator.is_valid({**self.document, "newer": 1}))


if __name__ == "__main__":
    unittest.main()
