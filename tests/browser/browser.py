# SPDX-License-Identifier: Apache-2.0
"""A real browser without a window, and what can be learned from it about a page."""

from __future__ import annotations

import atexit
import functools
import json
import tempfile
import time
import unittest
from pathlib import Path
from typing import Any

from selenium import webdriver
from selenium.webdriver.chrome.service import Service
from selenium.webdriver.common.action_chains import ActionChains
from selenium.webdriver.remote.webelement import WebElement

ARGUMENTS = (
    "--headless=new",
    "--no-sandbox",  # the superuser has none; what it opens here is only our own pages
    "--disable-dev-shm-usage",
    "--disable-gpu",
    "--disable-background-networking",
    "--force-device-scale-factor=1",
    "--hide-scrollbars",
)
WIDE = (1600, 1000)
NARROW = (360, 800)
PAPER = (717, 1046)  # A4 without the margins that the browser leaves
PATIENCE = 120  # seconds: only a browser that hangs takes so long

# The texts of a page that are shown, with the least contrast that each has with what is behind it.
CONTRASTS = Path(__file__).with_name("contrasts.js").read_text(encoding="utf-8")
# The texts of a page that can't be read whole.
CUTS = Path(__file__).with_name("cuts.js").read_text(encoding="utf-8")


def role_and_name(node: dict[str, Any]) -> tuple[str, str]:
    return node.get("role", {}).get("value", ""), node.get("name", {}).get("value", "")


class Browser:
    """Chromium. `troubles` is what a page that is beyond reproach does not cause."""

    def __init__(self) -> None:
        self.home = tempfile.TemporaryDirectory(prefix="orvane browser-")
        options = webdriver.ChromeOptions()
        options.binary_location = "/usr/bin/chromium"
        for argument in ARGUMENTS:
            options.add_argument(argument)
        options.set_capability("goog:loggingPrefs", {"browser": "ALL", "performance": "ALL"})
        self.driver = webdriver.Chrome(options=options, service=Service(
            "/usr/bin/chromedriver",
            env={"HOME": self.home.name, "PATH": "/usr/bin:/bin", "TMPDIR": self.home.name}))
        self.driver.set_page_load_timeout(PATIENCE)
        self.driver.set_script_timeout(PATIENCE)
        self.resize(*WIDE)
        self.page = ""

    def close(self) -> None:
        self.driver.quit()
        self.home.cleanup()

    def resize(self, width: int, height: int) -> None:
        self.command("Emulation.setDeviceMetricsOverride", width=width, height=height,
                     deviceScaleFactor=1, mobile=False)

    def prefer(self, scheme: str, media: str = "") -> None:
        """Light or dark, on a screen or as for a printer."""
        self.command("Emulation.setEmulatedMedia", media=media,
                     features=[{"name": "prefers-color-scheme", "value": scheme},
                               {"name": "prefers-reduced-motion", "value": "reduce"}])

    def command(self, name: str, **arguments: Any) -> Any:
        return self.driver.execute_cdp_cmd(name, arguments)

    def open(self, path: Path, fragment: str = "") -> None:
        """Loads the page anew, at the top and without a pointer over it."""
        self.open_address(path.resolve().as_uri(), fragment)

    def open_address(self, address: str, fragment: str = "") -> None:
        self.driver.get("about:blank")
        for kind in ("browser", "performance"):
            self.driver.get_log(kind)
        self.page = address
        self.driver.get(self.page + fragment)

    def see_all_units(self) -> None:
        """Scrolls through the page: its script completes a unit when it is about to be seen."""
        for unit in self.all(".unit"):
            self.run("arguments[0].scrollIntoView()", unit)
            limit = time.monotonic() + PATIENCE
            while not unit.find_elements("css selector", "[role=tablist]"):
                if time.monotonic() > limit:
                    raise AssertionError(f"{unit.get_attribute('id')} is not completed")
        self.run("scrollTo(0, 0)")

    def run(self, script: str, *arguments: Any) -> Any:
        return self.driver.execute_script(script, *arguments)

    def all(self, selector: str) -> list[WebElement]:
        return self.driver.find_elements("css selector", selector)

    def one(self, selector: str) -> WebElement:
        return self.driver.find_element("css selector", selector)

    def press(self, *keys: str) -> None:
        ActionChains(self.driver, duration=0).send_keys(*keys).perform()

    def point_at(self, element: WebElement) -> None:
        self.run("arguments[0].scrollIntoView({block: 'center'})", element)
        ActionChains(self.driver, duration=0).move_to_element(element).perform()

    def focused(self) -> WebElement:
        return self.driver.switch_to.active_element

    def troubles(self) -> list[str]:
        """Console messages, refusals by the page's policy among them, and requests but for the page."""
        found = [entry["message"] for entry in self.driver.get_log("browser")]
        for entry in self.driver.get_log("performance"):
            message = json.loads(entry["message"])["message"]
            if message["method"] in ("Network.requestWillBeSent", "Network.webSocketCreated"):
                url = message["params"].get("request", message["params"])["url"]
                if url.partition("#")[0] not in (self.page, "about:blank"):
                    found.append(f"request for {url}")
        return found

    def nodes(self) -> list[dict[str, Any]]:
        """Those of the browser's accessibility tree that a screen reader is told of."""
        return [node for node in self.command("Accessibility.getFullAXTree")["nodes"] if not node["ignored"]]

    def usable(self) -> list[tuple[str, str]]:
        """Role and name of everything that takes the focus, in the browser's accessibility tree."""
        def is_focusable(node: dict[str, Any]) -> bool:
            return any(each["name"] == "focusable" and each["value"].get("value")
                       for each in node.get("properties", ()))
        return [each for each in map(role_and_name, filter(is_focusable, self.nodes()))
                if each[0] != "RootWebArea"]

    def cells(self, selector: str) -> list[list[str]]:
        """The roles of the cells of a table in the browser's accessibility tree, row by row."""
        nodes = {node["nodeId"]: node for node in self.command("Accessibility.getFullAXTree")["nodes"]}
        table = self.command("Runtime.evaluate", expression=f"document.querySelector({json.dumps(selector)})")
        whole = self.command("Accessibility.getPartialAXTree", objectId=table["result"]["objectId"],
                             fetchRelatives=False)["nodes"][0]
        rows = []
        waiting = [whole["nodeId"]]
        while waiting:
            node = nodes[waiting.pop()]
            if node["role"]["value"] == "row":
                rows.append([nodes[child]["role"]["value"] for child in node["childIds"]])
            else:
                waiting += reversed(node["childIds"])
        return rows

    def everything(self) -> list[tuple[str, str]]:
        """Role and name of everything in the browser's accessibility tree."""
        return list(map(role_and_name, self.nodes()))

    def poor_contrasts(self) -> list[str]:
        """The shown texts whose contrast with what is behind them is less than 4.5."""
        texts = self.run(CONTRASTS)
        if len(texts) < 5:
            raise AssertionError(f"only {len(texts)} texts are shown")
        return [f"{each['text']!r} in {each['where']}: {each['contrast']:.2f}"
                for each in texts if each["contrast"] < 4.5]


@functools.cache
def shared() -> Browser:
    """The browser of all tests: to start one takes seconds."""
    browser = Browser()
    atexit.register(browser.close)
    return browser


class BrowserTestCase(unittest.TestCase):
    browser: Browser

    @classmethod
    def setUpClass(cls) -> None:
        cls.browser = shared()

    def setUp(self) -> None:
        self.browser.resize(*WIDE)
        self.browser.prefer("light")

    def check_no_trouble(self) -> None:
        self.assertEqual(self.browser.troubles(), [])
