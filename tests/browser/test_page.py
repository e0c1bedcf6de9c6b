# SPDX-License-Identifier: Apache-2.0
"""A page about one unit, in a real browser."""

from __future__ import annotations

import collections
import http.server
import tempfile
import threading
from pathlib import Path

import units
from browser import CUTS, NARROW, BrowserTestCase
from selenium.webdriver.common.keys import Keys
from selenium.webdriver.remote.webelement import WebElement

MODEL = "param.139"
LIT = "return [...document.querySelectorAll('.unit .lit[data-key]')].map(each => each.dataset.key)"
ALL_OF = "return document.querySelectorAll(`[data-key=\"${CSS.escape(arguments[0])}\"]`).length"
# The title and content of each part of the drawing. From then on, shownAtFocus gets the details at each focus.
PARTS = """
window.shownAtFocus = [];
const details = document.querySelector(".records .details");
addEventListener("focusin", event => { // of the window, which is the last to hear of it
    if (event.target.matches(".part")) {
        shownAtFocus.push(details.textContent);
    }
});
return [...document.querySelectorAll(".part")].map(part =>
    `${part.querySelector("title").textContent}: ${part.querySelector("desc").textContent}`);
"""


class OneUnitTest(BrowserTestCase):
    """The sample unit."""

    page: Path

    @classmethod
    def setUpClass(cls) -> None:
        super().setUpClass()
        folder = tempfile.TemporaryDirectory(prefix="orvane page-")
        cls.addClassCleanup(folder.cleanup)
        root = units.make(Path(folder.name) / "sample")
        cls.page = units.report(Path(folder.name) / "a page.html", root, options=("--impact",))

    def setUp(self) -> None:
        super().setUp()
        self.browser.open(self.page)

    def tearDown(self) -> None:
        self.check_no_trouble()

    def line(self, key: str) -> WebElement:
        return self.browser.one(f".output:not([hidden]) .lines [data-key='{key}']")

    def check_lit(self, key: str) -> None:
        """Everything with the key is lit, and nothing with another one."""
        lit = self.browser.run(LIT)
        self.assertEqual(set(lit), {key})
        self.assertEqual(len(lit), self.browser.run(ALL_OF, key))

    def open_output(self, name: str) -> None:
        next(tab for tab in self.browser.all("[role=tab]") if tab.text.startswith(name)).click()

    def shown_outputs(self) -> list[str]:
        return [panel.get_attribute("data-path") for panel in self.browser.all(".output")
                if panel.is_displayed()]

    # --- Tabs

    def test_one_output_is_shown_at_a_time(self) -> None:
        self.assertEqual(len(self.browser.all("[role=tab]")), 6)
        self.assertEqual(self.shown_outputs(), ["/tmp/telephony_FFFF.txt"])
        self.open_output("iap2.cfg")
        self.assertEqual(self.shown_outputs(), ["/tmp/iap2.cfg"])

    def test_arrow_keys_move_among_tabs(self) -> None:
        self.browser.one("[role=tab][aria-selected=true]").click()
        for keys, shown in (((Keys.ARROW_RIGHT, Keys.ARROW_RIGHT), "/tmp/airplay.conf"),
                            ((Keys.END,), "/tmp/iap1.cfg"), ((Keys.ARROW_RIGHT,), "/tmp/iap1.cfg"),
                            ((Keys.ARROW_LEFT,), "/tmp/iap2.cfg"), ((Keys.HOME,), "/tmp/telephony_FFFF.txt")):
            self.browser.press(*keys)
            self.assertEqual(self.shown_outputs(), [shown])
            self.assertEqual(self.browser.focused().get_attribute("aria-selected"), "true")

    def test_a_tile_leads_to_its_output(self) -> None:
        self.browser.one(".tile a[href='#unit-1-output-5']").click()
        self.assertEqual(self.shown_outputs(), ["/tmp/iap2.cfg"])

    def test_the_address_may_name_an_output(self) -> None:
        self.browser.open(self.page, "#unit-1-output-4")
        self.assertEqual(self.shown_outputs(), ["/tmp/iap2_device.cfg"])

    # --- Lighting up

    def test_a_line_at_the_pointer_lights_up_its_source(self) -> None:
        self.open_output("airplay.conf")
        self.browser.point_at(self.line(MODEL))
        self.check_lit(MODEL)
        self.assertIn("lit", self.browser.one(f".cell[data-key='{MODEL}']").get_attribute("class"))

    def test_a_byte_at_the_pointer_lights_up_its_lines(self) -> None:
        self.browser.point_at(self.browser.one(f".cell[data-key='{MODEL}']"))
        self.check_lit(MODEL)
        tabs = [tab.text.split()[0] for tab in self.browser.all("[role=tab].lit")]
        self.assertEqual(tabs, ["airplay.conf", "iap2_device.cfg", "iap2.cfg", "iap1.cfg"])

    def test_each_kind_of_source_lights_up_with_its_lines(self) -> None:
        for selector in (".slots [data-key='slot.9']",
                         ".fields [data-key='tuning.2.qwaAECSwitch']",
                         ".files [data-key='file./fs/mp/etc/airplay_static.conf']"):
            with self.subTest(selector):
                element = self.browser.one(selector)
                self.browser.point_at(element)
                self.assertIn(element.get_attribute("data-key"), self.browser.run(LIT))
                self.assertTrue(self.browser.all(".lines tr.lit"))
                self.assertTrue(self.browser.all("[role=tab].lit"))

    def test_a_line_of_a_version_lights_up_its_file(self) -> None:
        self.open_output("iap1.cfg")
        key = "file./fs/rwdata/.Version/application.inf"
        self.browser.point_at(self.line(key))
        self.assertTrue(self.browser.all(".versions .chosen .lit"))

    def test_a_field_lights_up_its_block_in_the_drawing(self) -> None:
        self.browser.point_at(self.line("tuning.3.qwaAECSwitch"))
        self.assertEqual(set(self.browser.run(LIT)), {"tuning.3.qwaAECSwitch", "tuning.3"})

    def test_a_byte_lights_up_with_its_slot_both_ways(self) -> None:
        row = ".matrix [data-key='slot.9.0']"
        self.browser.point_at(self.browser.one(row))
        self.assertEqual(set(self.browser.run(LIT)), {"slot.9.0", "slot.9"})
        self.assertTrue(self.browser.all(".lines tr.lit"))
        self.assertTrue(self.browser.all(".part.lit"))
        self.browser.point_at(self.browser.one(".slots [data-key='slot.9']"))
        self.assertTrue(self.browser.all(f"{row}.lit"))
        self.assertLessEqual(set(self.browser.run(LIT)), {"slot.9", *(f"slot.9.{byte}" for byte in range(8))})

    def test_nothing_stays_lit_when_the_pointer_leaves(self) -> None:
        self.browser.point_at(self.browser.one(f".cell[data-key='{MODEL}']"))
        self.assertTrue(self.browser.run(LIT))
        self.browser.point_at(self.browser.one("h1"))
        self.assertEqual(self.browser.run(LIT), [])

    def tab_to(self, selector: str) -> WebElement:
        for _ in range(60):
            self.browser.press(Keys.TAB)
            element = self.browser.focused()
            if self.browser.run("return arguments[0].matches(arguments[1])", element, selector):
                return element
        raise AssertionError(f"60 stops of the Tab key, and none is {selector}")

    def test_keys_lead_from_a_line_to_its_source(self) -> None:
        self.open_output("airplay.conf")
        line = self.tab_to(".lines [data-key]")
        self.assertEqual(line.get_attribute("data-key"), MODEL)
        self.check_lit(MODEL)
        self.browser.press(Keys.ARROW_DOWN)
        self.check_lit("param.36")
        self.browser.press(Keys.ARROW_UP)
        self.check_lit(MODEL)
        self.browser.press(Keys.ENTER)
        box = self.browser.one(f".cell[data-key='{MODEL}']")
        self.assertTrue(self.browser.run(
            "const box = arguments[0].getBoundingClientRect(); return box.top >= 0 && box.bottom <= innerHeight",
            box))

    def test_keys_lead_from_a_byte_to_its_lines(self) -> None:
        self.tab_to(".cell")
        self.browser.press(Keys.END, *[Keys.ARROW_LEFT] * 38)
        self.check_lit("param.140")
        self.browser.press(Keys.ARROW_LEFT)
        self.check_lit(MODEL)
        self.assertEqual(self.shown_outputs(), ["/tmp/telephony_FFFF.txt"])
        self.browser.press(Keys.ENTER)
        self.assertEqual(self.shown_outputs(), ["/tmp/airplay.conf"])
        self.browser.press(Keys.ESCAPE)
        self.assertEqual(self.browser.run(LIT), [])

    def test_arrows_move_up_and_down_in_the_image(self) -> None:
        first = self.tab_to(".cell")
        self.browser.press(Keys.ARROW_DOWN)
        below = self.browser.focused()
        self.assertEqual(below.rect["x"], first.rect["x"])
        self.assertGreater(below.rect["y"], first.rect["y"])
        self.browser.press(Keys.ARROW_UP)
        self.assertEqual(self.browser.focused(), first)
        self.browser.press(Keys.END)
        self.assertEqual(self.browser.focused().get_attribute("data-key"), "param.171")

    def test_a_table_is_one_stop_of_the_tab_key(self) -> None:
        self.tab_to(".cell")
        stops = []
        for _ in range(3):
            self.browser.press(Keys.TAB)
            stops.append(self.browser.run(
                "return document.activeElement.closest('.drawing, section').classList[0]"))
        self.assertEqual(stops, ["drawing", "records", "tuning"])

    # --- Details

    def test_details_follow_the_pointer_and_the_focus(self) -> None:
        place = self.browser.one(".image .details")
        self.browser.point_at(self.browser.one(f".cell[data-key='{MODEL}']"))
        for part in ("Parameter 139", "byte 139", "raw 26", "0x7ffffffe", "Quarion Velmira"):
            self.assertIn(part, place.text)
        self.tab_to(".cell")
        self.assertIn("Parameter 1,", place.text)

    def test_a_part_of_the_drawing_shows_its_content(self) -> None:
        self.browser.point_at(self.browser.all(".part[data-key='slot.9']")[-1])
        self.assertTrue(self.browser.all(".lines tr.lit"))
        details = self.browser.one(".records .details").text
        for part in ("slot 9", "8 bytes at 129", "53 4e 30", "SN004217"):
            self.assertIn(part, details)

    def test_each_part_of_the_drawing_shows_its_details_at_the_focus(self) -> None:
        parts = self.browser.run(PARTS)
        self.assertGreater(len(parts), 20)
        self.assertTrue(self.browser.all(".part:not([data-key])"))
        self.tab_to(".part")
        self.browser.press(*[Keys.ARROW_RIGHT] * len(parts))
        shown = self.browser.run("return shownAtFocus")
        self.assertEqual([each.partition(", as text ")[0] for each in shown], parts)
        self.browser.press(Keys.HOME)
        self.assertEqual(self.browser.focused(), self.browser.one(".part"))

    def test_a_part_that_belongs_to_nothing_replaces_the_details(self) -> None:
        details = self.browser.one(".records .details")
        for part in (".part[data-key='slot.9']", ".part.nothing", ".part.spare"):
            before = details.text
            self.browser.point_at(self.browser.all(part)[-1])
            self.assertNotEqual(details.text, before)
        self.assertIn("which nothing reads", details.text)

    def test_each_part_of_the_drawing_is_an_option_with_a_name(self) -> None:
        titles = self.browser.run("return [...document.querySelectorAll('.part title')].map(each => each.textContent)")
        options = [name for role, name in self.browser.usable() if role == "option"]
        self.assertEqual(options[-len(titles):], titles)

    # --- For everybody

    def test_everything_that_can_be_used_has_a_role_and_a_name(self) -> None:
        found = self.browser.usable()
        roles = {role for role, _ in found}
        self.assertLessEqual({"tab", "row", "option", "link", "gridcell"}, roles)
        for role, name in found:
            self.assertNotIn(role, ("", "none", "generic"), name)
            self.assertNotEqual(name, "", role)

    def test_texts_have_contrast_in_both_schemes_and_when_lit(self) -> None:
        for scheme in ("light", "dark"):
            self.browser.prefer(scheme)
            self.browser.open(self.page)
            self.assertEqual(self.browser.poor_contrasts(), [], scheme)
            for selector in (f".cell[data-key='{MODEL}']", ".fields [data-key='tuning.3.qwaAECSwitch']",
                             ".slots [data-key='slot.9']"):
                self.browser.point_at(self.browser.one(selector))
                self.assertEqual(self.browser.poor_contrasts(), [], f"{scheme}, lit by {selector}")

    def test_a_narrow_page_does_not_scroll_sideways(self) -> None:
        self.browser.resize(*NARROW)
        self.browser.open(self.page)
        for number in range(6):
            self.browser.all("[role=tab]")[number].click()
            self.assertEqual(self.browser.run("return document.documentElement.scrollWidth"), NARROW[0])

    def test_paper_has_every_output(self) -> None:
        self.browser.prefer("light", media="print")
        self.assertEqual(len(self.shown_outputs()), 6)
        self.assertFalse(any(tab.is_displayed() for tab in self.browser.all("[role=tab]")))


class AttachedPage(http.server.BaseHTTPRequestHandler):
    """A build server, which lets an attached page use neither its style nor its script."""

    content: bytes

    def do_GET(self) -> None:
        self.send_response(200)
        self.send_header("Content-Type", "text/html")
        self.send_header("Content-Security-Policy", "default-src 'none'")
        self.end_headers()
        self.wfile.write(self.content)

    def log_message(self, *_: object) -> None:
        pass


class WithoutStyleAndScriptTest(BrowserTestCase):
    """What a build server shows of an attached page."""

    said: list[tuple[str, str]]

    @classmethod
    def setUpClass(cls) -> None:
        super().setUpClass()
        with tempfile.TemporaryDirectory(prefix="orvane page-") as folder:
            root = units.make(Path(folder) / "sample")
            AttachedPage.content = units.report(Path(folder) / "page.html", root).read_bytes()
        server = http.server.ThreadingHTTPServer(("127.0.0.1", 0), AttachedPage)
        cls.addClassCleanup(server.server_close)
        threading.Thread(target=server.serve_forever, daemon=True).start()
        cls.addClassCleanup(server.shutdown)
        cls.browser.open_address(f"http://127.0.0.1:{server.server_port}/")
        cls.said = cls.browser.everything()

    def test_neither_style_nor_script_are_used(self) -> None:
        self.assertEqual(self.browser.run("return document.styleSheets.length"), 0)
        self.assertEqual(self.browser.all(".scripted, [role=tab]"), [])

    def test_headings_lead_to_everything(self) -> None:
        headings = [name for role, name in self.said if role == "heading"]
        for name in ("Verdict", "Outputs", "Configuration image", "Record area of the boot disk", "Tuning blocks",
                     "Software version", "Files", "/tmp/telephony_FFFF.txt",
                     "/tmp/speechrec_FFFF.txt", "/tmp/airplay.conf", "/tmp/iap2_device.cfg", "/tmp/iap2.cfg",
                     "/tmp/iap1.cfg"):
            self.assertTrue(any(each.startswith(name) for each in headings), name)

    def test_each_cell_of_a_table_is_one_and_shows_its_content(self) -> None:
        roles = collections.Counter(role for role, _ in self.said)
        self.assertNotIn("LayoutTable", roles)
        self.assertEqual(roles["table"], len(self.browser.all("table")))
        self.assertEqual(roles["cell"] + roles["rowheader"] + roles["columnheader"],
                         len(self.browser.all("td, th")))
        lost = self.browser.run(
            "const words = text => text.trim().split(/\\s+/).join(' ');"
            "return [...document.querySelectorAll('td, th')].filter(cell => "
            "words(cell.innerText) !== words(cell.textContent)).map(cell => cell.outerHTML)")
        self.assertEqual(lost, [])

    def test_nothing_is_hidden(self) -> None:
        self.assertEqual(self.browser.run(CUTS), [])
        text = self.browser.one("body").text
        for part in ("All outputs are as intended.", "as intended", "model = Quarion Velmira",
                     "parameter 139, image byte 139: 1a", "SN004217", "qwaAECSwitch"):
            self.assertIn(part, text)


class MeasuresTest(BrowserTestCase):
    """What the other tests rely on."""

    def open_text(self, text: str) -> None:
        with tempfile.TemporaryDirectory(prefix="orvane page-") as folder:
            page = Path(folder) / "page.html"
            page.write_text(f"<!DOCTYPE html><title>x</title>{text}", encoding="utf-8")
            self.browser.open(page)

    def test_contrasts_that_are_too_low_are_found(self) -> None:
        self.open_text(
            "<body style='background: #fff; color: #000'>"
            "<p>good</p><p style='color: #777'>grey</p><p style='color: #767676'>enough</p>"
            "<div style='background: rgba(0, 0, 0, 0.6)'><p>behind</p></div>"
            "<p style='background: repeating-linear-gradient(#fff 0 1px, #555 1px 2px)'>pattern</p>"
            "<p hidden style='color: #fff'>not shown</p><p style='color: #0008'>glass</p>")
        poor = [each.split("'")[1] for each in self.browser.poor_contrasts()]
        self.assertEqual(poor, ["grey", "behind", "pattern", "glass"])

    def test_texts_that_are_cut_are_found(self) -> None:
        self.open_text(
            "<style>body { margin: 0 }</style><p class=good>good</p><p class=a hidden>hidden</p>"
            "<div style='width: 5em; overflow: auto'><p class=b><nobr>too wide for its box</nobr></p></div>"
            "<div style='height: 1em; overflow: hidden'><br><br><p class=c>too far below</p></div>"
            "<div style='clip-path: inset(50%)'><p class=d>clipped</p></div><p class=e style='margin-left: 1590px'>"
            "<nobr>behind the side of the page</nobr></p><p class=tabs hidden>only on screens</p>")
        self.assertEqual([each[-1] for each in self.browser.run(CUTS)], ["a", "b", "c", "d", "e"])

    def test_messages_requests_and_violations_are_found(self) -> None:
        policy = "<meta http-equiv='Content-Security-Policy' content=\"{}\">"
        for text in ("<script>console.log('message')</script>", "<script>throw new Error('thrown')</script>",
                     "<img src='absent.png'>", "<link rel='stylesheet' href='absent.css'>",
                     policy.format("style-src 'none'") + "<p style='color: red'>",
                     policy.format("script-src 'none'") + "<p onclick='x()'>"):
            with self.subTest(text):
                self.open_text(text)
                self.assertNotEqual(self.browser.troubles(), [])
        self.open_text("<p>nothing wrong</p>")
        self.check_no_trouble()

    def test_what_has_no_name_is_found(self) -> None:
        self.open_text("<button>good</button><button></button><input><p tabindex='0'>text</p>")
        self.assertEqual(self.browser.usable(), [
            ("button", "good"), ("button", ""), ("textbox", ""), ("paragraph", "")])
