# SPDX-License-Identifier: Apache-2.0
"""Reads pages of random units back, and compares them with explain --json, show --json and runs of orvane.

Exit status: 0 all agree, 1 a difference or a state that never came up, 2 a tool could
not be run.
"""

from __future__ import annotations

import json
from collections.abc import Sequence
from typing import Any

from drivers import random_units, runner
from drivers.explain import explanation
from drivers.explain.explain import ask, ask_explain, letters_of, make_marked_unit
from drivers.page import markup, reading
from drivers.random_units import Finding, Question, RandomUnit, UnitTools
from model.tree import Tree


def page_faults(unit: markup.Element, written: Sequence[explanation.Output], explained: explanation.Explanation,
                held: dict[str, Any]) -> list[str]:
    """Where the page, with `written` outputs, says something else than explain and show."""
    outputs = [{"path": output.path, "outcome": output.outcome, "isIntended": output.is_intended,
                "reasons": output.reasons, "lines": reading.merged(output.lines), "left": output.left,
                "content": output.content} for output in explained.outputs]
    shown = [{"path": output.path, "outcome": output.outcome, "isIntended": output.is_intended,
              "reasons": output.reasons, "lines": output.lines, "left": output.left,
              "content": output.content} for output in written]
    slots = [slot for slot in held["records"]["slots"] if slot["number"] != 15]
    records = {"slots": slots, **{name: held["records"][name] for name in ("aux", "crc", "crcVerdict")}}
    params = [{name: value for name, value in row.items() if name != "code"} for row in held["params"]["rows"]]
    tuning = ([held["tuning"]["blocks"][block] for block in reading.BLOCKS]
              if held["tuning"]["disk"] == "from-tuning-block" else None)
    versions = reading.expected_versions(held["versions"], explanation.to_bytes)
    return [*reading.differences("outputs", shown, outputs),
            *reading.differences("params", reading.params(unit), params),
            *reading.differences("records", reading.records(unit), records),
            *reading.differences("tuning", reading.tuning(unit), tuning),
            *reading.differences("versions", reading.versions(unit, versions), versions),
            *reading.differences("files", reading.files(unit), held["files"])]


def check(unit: RandomUnit, tools: UnitTools) -> Finding:
    root, options = unit.root, unit.arguments
    explained, status, lines = ask_explain(tools.unit_tool, root, options)
    held = ask([tools.unit_tool, "show", str(root), "--json"])
    file = root.parent / "page.html"
    said = ask([tools.unit_tool, "report", str(root), "-o", str(file), *options])
    if explained is None or held.status != 0:
        return Finding([*lines, f"show: {held.stderr!r}"], frozenset())
    if (said.status, said.stdout, said.stderr) != (status, b"", b""):
        return Finding([f"report: status {said.status}, said {said.stdout!r} {said.stderr!r}"], frozenset())
    try:
        article = markup.parse(file.read_bytes()).one("article", "unit")
        outputs = tuple(reading.completed(shown, whole)
                        for shown, whole in zip(reading.outputs(article), explained.outputs, strict=True))
        lines = page_faults(article, outputs, explained, json.loads(held.stdout))
    except (ValueError, KeyError) as error:
        return Finding([f"report: {error!r}"], frozenset())
    result = runner.run(tools.command(root, options), root)
    if (result.status, result.stdout, result.stderr) != (0, b"", b""):
        lines.append(f"orvane: status {result.status}, said {result.stdout!r} {result.stderr!r}")
    left = explanation.Explanation(explained.root, letters_of(options), explained.is_intended, outputs)
    lines += [f"after the run: {line}" for line in explanation.left_faults(left, Tree(root))]
    return Finding(lines, frozenset(output.outcome for output in outputs))


QUESTION = Question("page", make_marked_unit, check, reading.STATES, enough_units=200)


def main(arguments: Sequence[str]) -> int:
    return random_units.ask_with_unit_tool(QUESTION, __doc__ or "", arguments)
