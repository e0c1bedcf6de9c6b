# SPDX-License-Identifier: Apache-2.0
"""Pages about units of every kind, in a real browser."""

from __future__ import annotations

import tempfile
import time
from pathlib import Path
from typing import Any

import units
from browser import CUTS, NARROW, PAPER, PATIENCE, BrowserTestCase
from selenium.webdriver.common.by import By
from selenium.webdriver.remote.webelement import WebElement

# For each unit its outputs: the lines that the page says the output has, and those that it says are
# left there all the same. A line is its text, as shown, and whether it has an end.
OUTPUTS = """
return [...document.querySelectorAll(".unit")].map(unit => [...unit.querySelectorAll(".output")].map(output => ({
    path: output.dataset.path,
    state: output.querySelector(".state").textContent,
    left: output.querySelector("p.left")?.textContent ?? "",
    tables: [...output.querySelectorAll("table.lines")].map(table =>
        [...table.querySelectorAll("tbody tr")].map(row => ({
            code: row.querySelector("code")?.textContent,
            sign: row.querySelector(".sign")?.textContent ?? ""})))})))
"""


def bytes_of(table: list[dict[str, Any]]) -> bytes:
    shown = [row for row in table if row["sign"] != "(left out)"]
    return b"".join(units.shown_bytes(row["code"]) + (b"" if row["sign"] == "(no line end)" else b"\n")
                    for row in shown)


def left_by(output: dict[str, Any]) -> bytes | None:
    """What the page says is at the output's path after a run; None if it is no file."""
    if output["left"] == "After the run, an empty file is there.":
        return b""
    if output["left"].endswith(" is there."):
        return None
    return bytes_of(output["tables"][-1])


class PagesTestCase(BrowserTestCase):
    folder: Path

    @classmethod
    def setUpClass(cls) -> None:
        super().setUpClass()
        holder = tempfile.TemporaryDirectory(prefix="orvane pages-")
        cls.addClassCleanup(holder.cleanup)
        cls.folder = Path(holder.name)

    def check_outputs(self, roots: list[Path]) -> None:
        """Each unit of the page shows what a run leaves there."""
        shown = self.browser.run(OUTPUTS)
        self.assertEqual(len(shown), len(roots))
        for root, outputs in zip(roots, shown, strict=True):
            self.assertEqual(len(outputs), 6)
            left = units.left_by_a_run(root)
            for output in outputs:
                with self.subTest(root.name, path=output["path"]):
                    self.assertEqual(left_by(output), left.get(output["path"]))

    def check_looks(self) -> None:
        for scheme in ("light", "dark"):
            self.browser.prefer(scheme)
            self.assertEqual(self.browser.poor_contrasts(), [], scheme)
        self.browser.resize(*NARROW)
        self.assertEqual(self.browser.run("return document.documentElement.scrollWidth"), NARROW[0])


class OddUnitsTest(PagesTestCase):
    def test_a_hostile_unit_stays_text(self) -> None:
        root = units.hostile(self.folder / "<script>alert(1)<")
        self.browser.open(units.report(self.folder / "hostile.html", root))
        self.assertIn("<script>alert(1)<", self.browser.run("return document.title"))
        self.assertEqual(len(self.browser.all("script")), 1)
        self.assertEqual(len(self.browser.all("style")), 1)
        self.assertEqual(self.browser.all("img, iframe, base, form, object, [onerror], [onclick], [onload]"), [])
        self.assertEqual(self.browser.all("a:not([href^='#'])"), [])
        for control in ("\u202e", "\u200b", "\x1b", "\x00", "\ufffd"):
            self.assertNotIn(control, self.browser.run("return document.documentElement.textContent"))
        self.check_outputs([root])
        for tab in self.browser.all("[role=tab]"):
            tab.click()
        for row in self.browser.all("[data-key='slot.9'], .version [data-key]"):
            self.browser.point_at(row)
        self.check_looks()
        self.check_no_trouble()

    def test_an_empty_unit(self) -> None:
        root = units.make_from_text(self.folder / "empty", "")
        self.browser.open(units.report(self.folder / "empty.html", root))
        self.check_outputs([root])
        self.check_looks()
        self.check_no_trouble()


class ReasonsTest(PagesTestCase):
    def test_a_unit_for_each_reason(self) -> None:
        roots = units.one_for_each_reason(self.folder)
        self.assertEqual(len(roots), 33)
        self.browser.open(units.report(self.folder / "reasons.html", *roots.values()))
        for number, code in enumerate(roots, 1):
            with self.subTest(code):
                found = self.browser.run(
                    "const unit = document.getElementById(arguments[0]);"
                    "return [...unit.querySelectorAll('.verdict .code')].some(each => each.textContent === "
                    "arguments[1]) || unit.querySelector(`[data-reasons~=${arguments[1]}]`) !== null",
                    f"unit-{number}", code)
                self.assertTrue(found)
        self.check_outputs(list(roots.values()))
        self.browser.see_all_units()
        self.check_looks()
        self.check_no_trouble()


class PaperTest(PagesTestCase):
    """A table of a fleet, and units, of which one has long lines everywhere."""

    def test_nothing_is_cut_and_nothing_is_for_the_pointer(self) -> None:
        page = units.report(self.folder / "page.html", units.long_lines(self.folder / "long"),
                            *units.many(self.folder, 40))
        self.browser.open(page)
        self.browser.one("#filter").send_keys("no such unit")
        self.browser.prefer("light", media="print")
        self.browser.resize(*PAPER)
        self.assertEqual(self.browser.run(CUTS, "#fleet, #unit-1, #unit-2"), [])
        self.assertEqual(self.browser.run("return document.documentElement.scrollWidth"), PAPER[0])
        text = self.browser.one("#unit-1").text
        for part in (units.LONG_LINE, "/tmp/telephony_FFFF.txt", "parameter 139", "mask 0x7ffffffe"):
            self.assertIn(part, text)
        self.assertEqual(len(self.browser.all("#fleet tbody tr")), 41)
        for each in self.browser.all("#fleet :is(input, button), #unit-1 :is(button, .details)"):
            self.assertTrue(not each.is_displayed() or each.value_of_css_property("border-style") == "none")


class DefaultsTest(PagesTestCase):
    def test_a_default_does_not_look_like_what_was_read(self) -> None:
        """A serial on a disk that is the tool's default for one without a disk."""
        without = units.make(self.folder / "without", units.GOLDEN / "tuning-disk-absent/unit.toml")
        self.browser.open(units.report(self.folder / "page.html", units.make(self.folder / "sample"), without))
        good, bad = (row.find_elements(By.CSS_SELECTOR, "td")[4] for row in self.browser.all("#fleet tbody tr"))
        self.assertEqual(good.text, "SN004217")
        self.assertTrue(bad.text.endswith("\ndefault, not read"), bad.text)
        sign = self.browser.run("return getComputedStyle(arguments[0], '::before').content",
                                bad.find_element(By.CSS_SELECTOR, ".sign"))
        self.assertIn("\u26a0", sign)
        self.check_no_trouble()


class FleetTest(PagesTestCase):
    """200 units: a table of them first."""

    page: Path

    @classmethod
    def setUpClass(cls) -> None:
        super().setUpClass()
        cls.page = units.report(cls.folder / "fleet.html", *units.many(cls.folder, 200))
        cls.browser.open(cls.page)

    def tearDown(self) -> None:
        self.check_no_trouble()

    def rows(self) -> list[list[str]]:
        """The texts of the rows that are shown, from top to bottom."""
        return self.browser.run(
            "return [...document.querySelectorAll('#fleet tbody tr')].filter(row => row.checkVisibility())"
            ".map(row => [...row.cells].map(cell => cell.firstElementChild?.localName === 'a' ? "
            "cell.textContent.trim() : cell.firstChild.textContent.trim()))")

    def head(self, title: str) -> WebElement:
        return self.browser.run("return [...document.querySelectorAll('#fleet thead th')]"
                                ".find(head => head.textContent.trim() === arguments[0])", title)

    def sort_by(self, title: str) -> None:
        """Upwards."""
        head = self.head(title)
        button = head.find_element(By.CSS_SELECTOR, "button")
        button.click()
        if head.get_attribute("aria-sort") != "ascending":
            button.click()

    def column(self, title: str, selector: str = "*") -> list[str]:
        """The texts of its cells that the selector matches."""
        return self.browser.run(
            "const at = [...document.querySelectorAll('#fleet thead th')]"
            ".findIndex(head => head.textContent.trim() === arguments[0]);"
            "return [...document.querySelectorAll('#fleet tbody tr:not([hidden])')].map(row => row.cells[at])"
            ".filter(cell => cell.matches(arguments[1])).map(cell => cell.firstChild.textContent.trim())",
            title, selector)

    def type_filter(self, text: str) -> None:
        box = self.browser.one("#filter")
        box.clear()
        box.send_keys(text)

    def test_sorting_by_click_and_by_key(self) -> None:
        before = sorted(self.rows())
        for press in (lambda button: button.click(), lambda button: button.send_keys("\n")):
            for title in ("model", "unit"):
                head = self.head(title)
                button = head.find_element(By.CSS_SELECTOR, "button")
                press(button)
                if head.get_attribute("aria-sort") != "ascending":
                    press(button)
                self.assertEqual(head.get_attribute("aria-sort"), "ascending")
                self.assertEqual(self.column(title), sorted(self.column(title)))
                press(button)
                self.assertEqual(head.get_attribute("aria-sort"), "descending")
                self.assertEqual(self.column(title), sorted(self.column(title), reverse=True))
                self.assertEqual(len(self.browser.all("#fleet [aria-sort]")), 1)
        self.assertEqual(sorted(self.rows()), before)

    def test_numbers_are_sorted_by_their_values(self) -> None:
        self.sort_by("CRC")
        crcs = [int(crc, 16) for crc in self.column("CRC")]
        self.assertGreater(len(set(crcs)), 100)
        self.assertEqual(crcs, sorted(crcs))

    def test_rows_that_are_equal_keep_their_order(self) -> None:
        for direction in ("ascending", "descending"):
            with self.subTest(direction):
                self.sort_by("unit")
                self.sort_by("model")
                self.sort_by("brand")
                if direction == "descending":
                    self.head("brand").find_element(By.CSS_SELECTOR, "button").click()
                found = list(zip(self.column("brand"), self.column("model"), self.column("unit")))
                self.assertEqual(self.head("brand").get_attribute("aria-sort"), direction)
                self.assertEqual(found, sorted(sorted(found), key=lambda row: row[0],
                                               reverse=direction == "descending"))

    def test_what_another_value_is_more_frequent_than_is_marked(self) -> None:
        for title in ("brand", "model", "serial", "airplay.conf"):
            with self.subTest(title):
                values = self.column(title)
                most = max(map(values.count, values))
                self.assertEqual(self.column(title, ".rare"),
                                 [value for value in values if values.count(value) < most])
        self.assertEqual(self.column("serial", ".rare"), [])
        self.assertNotEqual(self.column("brand", ".rare"), [])

    def test_filtering_keeps_rows_with_every_word(self) -> None:
        every = self.rows()
        self.assertEqual(len(every), 200)
        for typed in ("SN00001", "quarion", "QUARION velmira", "car-01 marl", "nothing like this"):
            self.type_filter(typed)
            expected = [row for row in every
                        if all(word in " ".join(row).lower() for word in typed.lower().split())]
            self.assertEqual(self.rows(), expected, typed)
            self.assertEqual(self.browser.one("#fleet output").text, f"{len(expected)} of 200 units")
        self.type_filter(" ")
        self.assertEqual(self.rows(), every)

    def test_a_row_leads_to_its_unit(self) -> None:
        self.type_filter("car-137")
        self.browser.one("#fleet tbody tr:not([hidden]) a").click()
        unit = self.browser.one("#unit-138")
        self.assertLess(abs(self.browser.run("return arguments[0].getBoundingClientRect().top", unit)), 100)
        self.assertIn("SN000137", unit.text)
        self.assertEqual(len(unit.find_elements(By.CSS_SELECTOR, "[role=tab]")), 6)
        self.browser.run("scrollTo(0, 0)")
        self.type_filter(" ")

    def test_the_page_is_small_enough(self) -> None:
        self.assertLess(self.page.stat().st_size, 20 * 2**20)

    def test_the_table_is_one_for_a_screen_reader(self) -> None:
        """Although it is laid out as boxes."""
        self.sort_by("model")
        limit = time.monotonic() + PATIENCE
        while self.browser.all("#fleet .late") and time.monotonic() < limit:
            pass
        cells = self.browser.cells("#fleet table")
        self.assertEqual(len(cells), 202)
        self.assertEqual(set(cells[0]), {"columnheader"})
        for row in cells[1:]:
            self.assertEqual(row, ["rowheader"] + ["cell"] * 13)
        names = [unit.get_attribute("aria-label") for unit in self.browser.all(".unit")[::50]]
        self.assertEqual([name[-7:] for name in names], ["car-000", "car-050", "car-100", "car-150"])

    def test_the_box_and_the_heads_have_names(self) -> None:
        self.assertEqual(self.browser.one("#filter").accessible_name, "Filter")
        self.assertEqual(self.browser.one("#filter").aria_role, "searchbox")
        for button in self.browser.all("#fleet thead button"):
            self.assertNotEqual(button.accessible_name, "")
