# SPDX-License-Identifier: Apache-2.0
"""The page's driver: what it reads in a page written by hand, and every difference is found."""

from __future__ import annotations

import unittest
from dataclasses import replace

from drivers.explain.explanation import Output
from drivers.explain.value_reasons import Line
from drivers.page import markup, reading
from drivers.page.markup import BadMarkup, parse, shown

TILE = ('<li class="tile state-generated fallback"><a href="#o1">/tmp/a</a><strong>generated</strong>'
        '<ul><li class="reason">why <code>template-empty</code></li></ul></li>')
SECTION = ('<section class="output state-generated" id="o1" data-path="/tmp/a">{}</section>')
LINES = ('<table><tbody data-reasons="fixed-text"><tr><th>1</th><td><code>a\\\\b\\x09\\xff</code></td><td></td></tr></tbody>'
         '<tbody data-reasons="from-record"><tr data-key="slot.9"><th></th><td><small class="sign">(left out)</small></td></tr></tbody>'
         '<tbody data-reasons="from-template"><tr data-key="file./t"><th>2</th><td><code>&lt;b&gt;</code></td></tr>'
         '<tr data-key="file./t"><th>3</th><td><code>c</code>'
         '<small class="sign">(no line end)</small></td></tr></tbody></table>')
UNIT = ('<article><section class="verdict"><ul>{}</ul></section>'
        '<section class="outputs">{}</section></article>')


def unit(lines: str = LINES, more: str = "", tile: str = TILE) -> markup.Element:
    return parse(UNIT.format(tile, SECTION.format(lines + more)).encode())


class Markup(unittest.TestCase):
    def test_escapes_are_undone(self) -> None:
        self.assertEqual(shown("a\\\\x41\\n\\x00\\xff\u20ac"), b"a\\x41\n\0\xff\xe2\x82\xac")

    def test_careless_markup_is_refused(self) -> None:
        for page in ("<p>", "<p></b></p>", "</p>", "<p onclick=x></p>", '<p style="color:red"></p>',
                     '<p class="a" class="b"></p>', "<!-- x -->"):
            with self.subTest(page), self.assertRaises(BadMarkup):
                parse(page.encode())

    def test_elements_are_found_by_name_and_class(self) -> None:
        page = parse(b'<p class="a b"><b>x</b>y</p><p class="b"></p>')
        self.assertEqual(len(list(page.all("p", "b"))), 2)
        self.assertEqual(page.one("p", "a").text(), "xy")
        self.assertIsNone(page.first("i"))
        with self.assertRaises(BadMarkup):
            page.one("p")


class Reading(unittest.TestCase):
    def test_outputs(self) -> None:
        output, = reading.outputs(unit())
        self.assertEqual((output.path, output.outcome, output.is_intended, output.reasons),
                         ("/tmp/a", "generated", False, ("template-empty",)))
        self.assertEqual(output.lines, (Line(b"a\\b\t\xff\n", ("fixed-text",), b""),
                                        Line(b"", ("from-record",), b"slot.9"),
                                        Line(b"<b>\nc", ("from-template",), b"file./t")))
        self.assertEqual((output.left, output.content), ("file", b"a\\b\t\xff\n<b>\nc"))

    def test_what_is_left(self) -> None:
        for said, left, content in (
                ("After the run, nothing is there.", "nothing", None),
                ("After the run, folder is there.", None, None),
                ("After the run, a folder is there.", "folder", None),
                ("After the run, a device is there.", "other", None),
                ("After the run, an empty file is there.", "file", b"")):
            with self.subTest(said):
                more = f'<p class="left">{said}</p>'
                if left is None:
                    with self.assertRaises(KeyError):
                        reading.outputs(unit("", more))
                    continue
                output, = reading.outputs(unit("", more))
                self.assertEqual((output.left, output.content), (left, content))

    def test_content_of_another_output(self) -> None:
        more = ('<p class="left">After the run, a file is there that this output did not write:</p><table class="left"><tbody>'
                '<tr><td><code>old</code></td></tr></tbody></table>')
        output, = reading.outputs(unit(LINES, more))
        self.assertEqual(output.content, b"old\n")
        self.assertEqual(len(output.lines), 3)

    def test_what_is_cut_is_completed(self) -> None:
        cut = LINES.replace('c</code><small class="sign">(no line end)</small>',
                            'c</code><small class="sign">(2 more bytes)</small>')
        output, = reading.outputs(unit(cut, '<p class="more">2 more lines (5 bytes): see that</p>'))
        self.assertEqual((output.lines_cut, output.content_cut), (8, 8))
        rest = b"<b>\ncde\nfg\nhi"
        whole = Output("/tmp/a", "generated", False, ("template-empty",),
                       (*output.lines[:2], Line(rest, ("from-template",), b"file./t")), "file",
                       b"a\\b\t\xff\n" + rest)
        self.assertEqual(reading.completed(output, whole), whole)
        other = replace(whole, content=b"A" + whole.content[1:])
        self.assertNotEqual(reading.completed(output, other), other)
        for wrong in (replace(whole, lines=whole.lines[:2]), replace(whole, content=b"a")):
            with self.assertRaises(BadMarkup):
                reading.completed(output, wrong)

    def test_cut_content_of_another_output(self) -> None:
        more = ('<p class="left">After the run, a file is there that this output did not write:</p><table class="left"><tbody>'
                '<tr><td><code>old</code></td></tr></tbody></table>'
                '<p class="more">1 more line (1 byte): see that</p>')
        output, = reading.outputs(unit(LINES, more))
        self.assertEqual((output.lines_cut, output.content_cut), (0, 1))

    def test_tile_that_says_something_else_is_refused(self) -> None:
        for old, new in (("#o1", "#o2"), (">/tmp/a<", ">/tmp/b<"), ("<strong>generated", "<strong>stock"),
                         ("state-generated", "state-kept")):
            with self.subTest(new), self.assertRaises(BadMarkup):
                reading.outputs(unit(tile=TILE.replace(old, new)))

    def test_cell(self) -> None:
        cells = ('<section class="image"><ol>{}<li class="cell group-3" data-key="param.134"><b>134</b>'
                 '<small>byte 134, the upper one of parameter 134</small></li></ol></section>')
        first = ('<li class="cell group-3" data-key="param.134"><b>134</b><small>byte 133, 2 bytes, group 3, raw 7, '
                 'default -1, mask 0xffffffff: audio profile 7</small></li>')
        self.assertEqual(reading.params(parse(cells.format(first).encode())),
                         [{"number": 134, "group": 3, "offset": 133, "size": 2, "raw": 7, "default": -1,
                           "mask": 0xffffffff, "meaning": "audio profile 7"}])
        for wrong in ("", first.replace("group-3", "group-2"), first.replace("param.134", "param.13")):
            with self.subTest(wrong), self.assertRaises(BadMarkup):
                reading.params(parse(cells.format(wrong).encode()))

    def test_versions(self) -> None:
        page = ('<section class="versions"><p>{}<code class="version-digits">010203</code></p><ol>'
                '<li class="version"><h4>/a</h4><table><tbody><tr><th>k</th><td><code>v</code></td></tr>'
                '<tr><th>key<small class="sign">(1 more byte)</small></th><td><code>ab</code>'
                '<small class="sign">(3 more bytes)</small></td></tr></tbody></table><p class="more">2 more keys</p></li>'
                '<li class="version chosen"><h4>/c</h4><table><tbody></tbody></table></li></ol>'
                '<p class="more">1 more file</p></section>')
        entries = [(b"k", b"v"), (b"keys", b"abcde"), (b"x", b"y"), (b"z", b"")]
        said = {"hasFolder": True, "version": b"1.2.3", "digits": b"010203",
                "files": [{"path": b"/a", "isChosen": False, "record": entries},
                          {"path": b"/b", "isChosen": False, "record": []},
                          {"path": b"/c", "isChosen": True, "record": []}]}
        text = '<code class="version-text">1.2.3</code>'
        self.assertEqual(reading.versions(parse(page.format(text).encode()), said), said)
        self.assertEqual(reading.versions(parse(page.format("").encode()), said), {**said, "version": b""})
        for old, new in (("1 more byte", "2 more bytes"), ("3 more", "4 more"), ("2 more keys", "1 more key"),
                         ("1 more file", "2 more files"), ("/a<", "/d<")):
            with self.subTest(new), self.assertRaises(BadMarkup):
                reading.versions(parse(page.format(text).replace(old, new).encode()), said)

    def test_differences_are_named(self) -> None:
        self.assertEqual(reading.differences("x", {"a": [1, {"b": 2}]}, {"a": [1, {"b": 2}]}), [])
        self.assertEqual(reading.differences("x", {"a": [1, {"b": 2}]}, {"a": [1, {"b": 3}]}),
                         ["x.a.1.b: the page has 2, not 3"])
        for one, other in (({"a": 1}, {"b": 1}), ([1], [1, 2]), (None, [1]), ({"a": 1}, [1])):
            self.assertEqual(len(reading.differences("x", one, other)), 1)


if __name__ == "__main__":
    unittest.main()
