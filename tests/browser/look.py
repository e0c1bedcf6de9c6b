#!/usr/bin/env python3
# SPDX-License-Identifier: Apache-2.0
"""Pictures of pages for people to look at, and what the accessibility engine axe finds in them.

Exit status: 0 axe finds nothing, 1 it does.
"""

from __future__ import annotations

import argparse
import base64
import sys
import tempfile
from pathlib import Path

import units
from browser import NARROW, WIDE, Browser

AXE = """
const done = arguments[arguments.length - 1];
axe.run(document, {resultTypes: ["violations"]}).then(
    result => done(result.violations.flatMap(rule =>
        rule.nodes.map(node => `${rule.id}: ${rule.help}: ${node.target} ${node.failureSummary}`))),
    error => done([String(error)]));
"""
# Milliseconds from a click or a key to the layout of what it changes.
TIMES = """
const time = action => {
    const begin = performance.now();
    action();
    document.body.getBoundingClientRect();
    return performance.now() - begin;
};
const box = document.querySelector("#filter");
const type = text => () => { box.value = text; box.dispatchEvent(new Event("input")); };
return {
    sorting: Math.max(...[...document.querySelectorAll("#fleet thead button")].map(each => time(() => each.click()))),
    typing: Math.max(...["S", "SN", "SN0000", "", "x", ""].map(text => time(type(text))))};
"""


def save(path: Path, picture: str) -> None:
    path.write_bytes(base64.b64decode(picture))


def take(browser: Browser, path: Path) -> None:
    """The page from its top to its end, with at most as many pixels as can be looked at."""
    height = min(browser.run("return document.documentElement.scrollHeight"), 12000)
    width = browser.run("return innerWidth")
    save(path, browser.command("Page.captureScreenshot", format="png", captureBeyondViewport=True, clip={
        "x": 0, "y": 0, "width": width, "height": height, "scale": 1})["data"])


def look(browser: Browser, page: Path, folder: Path, axe: str) -> list[str]:
    """Takes the pictures of a page; returns what axe finds."""
    found = []
    for scheme, size, name in (("light", WIDE, "light"), ("dark", WIDE, "dark"), ("light", NARROW, "narrow")):
        browser.prefer(scheme)
        browser.resize(*size)
        browser.open(page)
        take(browser, folder / f"{page.stem}-{name}.png")
        browser.see_all_units()
        browser.run(axe)
        found += [f"{page.stem}, {name}: {each}" for each in browser.driver.execute_async_script(AXE)]
    browser.prefer("light", media="print")
    browser.resize(794, 1123)  # A4
    browser.open(page)
    take(browser, folder / f"{page.stem}-print.png")
    save(folder / f"{page.stem}.pdf", browser.command("Page.printToPDF", paperWidth=8.27, paperHeight=11.69,
                                                      printBackground=False)["data"])
    return found


def take_for_documents(browser: Browser, made: Path, folder: Path) -> None:
    """The two pictures in docs/pictures: a unit with a line that has the focus, and a fleet."""
    browser.prefer("light")
    browser.resize(1240, 740)
    bench = units.make_from_text(made / "bench", units.call("describe", made / "sample").decode().replace(
        "139 = 26", "139 = 60"))
    (bench / "fs/mp/etc/mm/iap2_static.cfg").unlink()
    page = folder / "document-unit.html"
    units.call("report", "bench", "-o", page.resolve(), statuses=(0, 1), folder=made)
    browser.open(page)
    browser.run("document.querySelector('#unit-1-output-3-tab').click();"
                "document.querySelector('#unit-1-output-3 [data-key=\"param.139\"]').focus();"
                "document.querySelector('.cells').scrollIntoView()")
    save(folder / "document-unit.png", browser.command("Page.captureScreenshot", format="png")["data"])
    page = folder / "document-fleet.html"
    cars = [f"car-{number:03}" for number in range(9)]
    for number in (2, 5):
        (made / cars[number] / "fs/mp/etc/mm/iap2_static.cfg").unlink()
    units.call("report", *cars, "bench", "-o", page.resolve(), statuses=(0, 1), folder=made)
    browser.resize(1776, 620)
    browser.open(page)
    save(folder / "document-fleet.png", browser.command("Page.captureScreenshot", format="png", clip={
        "x": 0, "y": 0, "width": 1776, "height": 620, "scale": 0.7})["data"])


def main() -> int:
    parser = argparse.ArgumentParser(description=__doc__.splitlines()[0])
    parser.add_argument("--axe", required=True, type=Path, help="axe.js")
    parser.add_argument("folder", type=Path, help="for the pictures and the pages")
    options = parser.parse_args()
    axe = options.axe.read_text(encoding="utf-8")
    with tempfile.TemporaryDirectory(prefix="orvane look-") as name:
        made = Path(name)
        (made / "reasons").mkdir()
        units.many(made, 200)
        pages = [units.report(options.folder / f"{title}.html", *roots, options=more) for title, roots, more in (
            ("sample", [made / "sample"], ("--impact",)),
            ("hostile", [units.hostile(made / "hostile")], ()),
            ("empty", [units.make_from_text(made / "empty", "")], ()),
            ("fleet", units.one_for_each_reason(made / "reasons").values(), ()))]
        many = units.report(options.folder / "many.html", *sorted(made.glob("car-???")))
        browser = Browser()
        try:
            found = [each for page in pages for each in look(browser, page, options.folder, axe)]
            browser.resize(*WIDE)
            browser.prefer("light")
            browser.open(many)
            times = browser.run(TIMES)
            take_for_documents(browser, made, options.folder)
        finally:
            browser.close()
    print("\n".join([*found, f"axe: {len(found)} findings in {len(pages)} pages"]))
    print(f"200 units: {many.stat().st_size / 2**20:.1f} MiB; sorting takes at most {times['sorting']:.0f} ms, "
          f"typing {times['typing']:.0f} ms")
    print(f"pictures and pages: {options.folder}")
    return 1 if found else 0


if __name__ == "__main__":
    sys.exit(main())
