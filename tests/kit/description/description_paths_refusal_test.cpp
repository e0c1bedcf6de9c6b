// SPDX-License-Identifier: Apache-2.0
//
// What a description must not contain about paths and their contents, and the messages.
#include "tests/kit/description/description_refusal.h"

#include <gtest/gtest.h>

namespace orvane::test {

namespace {

const DescriptionRefusal REFUSALS[] = {
    {"folders = \"/tmp/x\"\n",
     "unit.toml:1:11: \"folders\" must be a list of paths, not \"/tmp/x\""},
    {"folders = [1]\n", "unit.toml:1:12: a path in \"folders\" must be a text in quotes, not 1"},
    {"folders = [\"tmp\"]\n", "unit.toml:1:12: a path must be absolute and have no \".\", \"..\" "
                              "or needless \"/\", and no zero byte, unlike \"tmp\""},
    {"absent = [\"/tmp/../x\"]\n",
     "unit.toml:1:11: a path must be absolute and have no \".\", "
     "\"..\" or needless \"/\", and no zero byte, unlike \"/tmp/../x\""},
    {"folders = [\"hex:2\"]\n",
     "unit.toml:1:12: hex needs two digits a byte: \"2\" has an odd number"},
    {"folders = [\"hex:74\"]\n", "unit.toml:1:12: a path must be absolute and have no \".\", "
                                 "\"..\" or needless \"/\", and no zero byte, unlike \"t\""},
    {"folders = [\"/.orvane-unit\"]\n", "unit.toml:1:12: a path must not be /.orvane-unit, which "
                                        "is the kit's own mark: \"/.orvane-unit\""},
    {"absent = [\"/.orvane-unit\"]\n", "unit.toml:1:11: a path must not be /.orvane-unit, which is "
                                       "the kit's own mark: \"/.orvane-unit\""},
    {"folders = [\"/.orvane-unit/x\"]\n", "unit.toml:1:12: a path must not be /.orvane-unit, which "
                                          "is the kit's own mark: \"/.orvane-unit/x\""},
    {"[files]\n\"relative\" = \"\"\n",
     "unit.toml:2:1: a path must be absolute and have no \".\", "
     "\"..\" or needless \"/\", and no zero byte, unlike \"relative\""},
    {"[files]\n\"/\" = \"\"\n", "unit.toml:2:1: a path must be absolute and have no \".\", \"..\" "
                                "or needless \"/\", and no zero byte, unlike \"/\""},
    {"[files]\n\"/x\" = 5\n", "unit.toml:2:8: the content of /x must be a text, or a table of hex, "
                              "or repeat and count, or path, or size and bytes, not 5"},
    {"[files]\n\"/x\" = [\"a\", []]\n",
     "unit.toml:2:14: a part of the content of /x must be a text, or a table of hex, or repeat and "
     "count, or path, or size and bytes, not a list"},
    {"[files]\n\"/x\" = [\"a\", { size = 1 }]\n",
     "unit.toml:2:14: the content of /x is given in parts: none may be of size and bytes"},
    {"[files]\n\"/x\" = {}\n", "unit.toml:2:8: the content of /x must be given in one way: hex, or "
                               "repeat and count, or path, or size and bytes"},
    {"[files]\n\"/x\" = { hex = 1 }\n",
     "unit.toml:2:16: hex in the content of /x must be a text in quotes, not 1"},
    {"[files]\n\"/x\" = { hex = \"4\" }\n", "unit.toml:2:16: hex in the content of /x: hex needs "
                                            "two digits a byte: \"4\" has an odd number"},
    {"[files]\n\"/x\" = { hex = \"41\", count = 1 }\n",
     "unit.toml:2:8: the content of /x must be given in one way: hex, or repeat and count, or "
     "path, or size and bytes"},
    {"[files]\n\"/x\" = { text = \"41\" }\n",
     "unit.toml:2:10: unknown key \"text\" in the content of /x: it takes hex, or repeat and "
     "count, or path, or size and bytes"},
    {"[files]\n\"/x\" = { \"\" = \"41\" }\n",
     "unit.toml:2:10: unknown key \"\" in the content of /x: it takes hex, or repeat and count, or "
     "path, or size and bytes"},
    {"[files]\n\"/x\" = { hex = \"41\", path = \"x\" }\n",
     "unit.toml:2:8: the content of /x must be given in one way: hex, or repeat and count, or "
     "path, or size and bytes"},
    {"[files]\n\"/x\" = { repeat = \"41\" }\n",
     "unit.toml:2:8: the content of /x must be given in one way: hex, or repeat and count, or "
     "path, or size and bytes"},
    {"[files]\n\"/x\" = { count = 41 }\n",
     "unit.toml:2:8: the content of /x must be given in one way: hex, or repeat and count, or "
     "path, or size and bytes"},
    {"[files]\n\"/x\" = { repeat = 1, count = 1 }\n",
     "unit.toml:2:19: repeat in the content of /x must be a text in quotes, not 1"},
    {"[files]\n\"/x\" = { repeat = \"xx\", count = 536870913 }\n",
     "unit.toml:2:33: count in the content of /x must be from 0 to 536870912: 536870913 does not "
     "fit"},
    {"[files]\n\"/x\" = { repeat = \"x\", count = -1 }\n",
     "unit.toml:2:32: count in the content of /x must be from 0 to 1073741824: -1 does not fit"},
    {"[files]\n\"/x\" = { repeat = \"x\", count = \"2\" }\n",
     "unit.toml:2:32: count in the content of /x must be a whole number, not \"2\""},
    {"[files]\n\"/x\" = { repeat = { hex = \"f\" }, count = 2 }\n",
     "unit.toml:2:27: repeat in the content of /x: hex needs two digits a byte: \"f\" has an odd "
     "number"},
    {"[files]\n\"/x\" = { repeat = { tex = \"f\" }, count = 2 }\n",
     "unit.toml:2:19: repeat in the content of /x must be a text or { hex = \"...\" }"},
    {"[files]\n\"/x\" = { path = \"missing\" }\n",
     "unit.toml:2:17: the content of /x: cannot read missing: No such file or directory"},
    {"[files]\n\"/x\" = { path = \"/tmp\" }\n",
     "unit.toml:2:17: the content of /x: /tmp is not a regular file"},
    {"[files]\n\"/x\" = { path = \"/dev/zero\" }\n",
     "unit.toml:2:17: the content of /x: /dev/zero is not a regular file"},
    {"[files]\n\"/x\" = { path = 1 }\n",
     "unit.toml:2:17: path in the content of /x must be a text in quotes, not 1"},
    {"[files]\n\"/x\" = { size = \"1\" }\n",
     "unit.toml:2:17: size in the content of /x must be a whole number, not \"1\""},
    {"[files]\n\"/x\" = { size = -1 }\n", "unit.toml:2:17: size in the content of /x must be from "
                                          "0 to 9223372036854775807: -1 does not fit"},
    {"[files]\n\"/x\" = { size = 1, bytes = \"x\" }\n",
     "unit.toml:2:28: bytes in the content of /x must be a table of hex by offset, not \"x\""},
    {"[files]\n\"/x\" = { size = 1, bytes = { 1 = \"41\" } }\n",
     "unit.toml:2:30: the content at 1 ends at byte 2 of a file of 1 bytes"},
    {"[files]\n\"/x\" = { size = 1, bytes = { 0 = 41 } }\n",
     "unit.toml:2:34: the content at 0 must be a text in quotes, not 41"},
    {"[files]\n\"/x\" = { bytes = { 0 = \"41\" } }\n",
     "unit.toml:2:8: the content of /x must be given in one way: hex, or repeat and count, or "
     "path, or size and bytes"},
    {"[files]\n\"/x\" = \"\"\n\"hex:2f78\" = \"\"\n", "unit.toml:3:1: /x is given twice"},
    {"folders = [\"/x\"]\n[files]\n\"/x\" = \"\"\n",
     "unit.toml:1:12: /x is both a file and a folder"},
    {"[files]\n\"/x\" = \"\"\n[links]\n\"/x\" = \"y\"\n",
     "unit.toml:4:1: /x is both a file and a link"},
    {"[files]\n\"/x\" = \"\"\n\"/x/y\" = \"\"\n",
     "unit.toml:3:1: /x/y lies below /x, which is a file, not a folder"},
    {"[files]\n\"/x/y\" = \"\"\n[links]\n\"/x\" = \"y\"\n",
     "unit.toml:2:1: /x/y lies below /x, which is a link, not a folder"},
    {"folders = [\"/x/y\"]\n[links]\n\"/x\" = \"y\"\n",
     "unit.toml:1:12: /x/y lies below /x, which is a link, not a folder"},
    {"[links]\n\"x\" = \"y\"\n", "unit.toml:2:1: a path must be absolute and have no \".\", \"..\" "
                                 "or needless \"/\", and no zero byte, unlike \"x\""},
    {"[links]\n\"/x\" = 5\n", "unit.toml:2:8: the target of /x must be a text in quotes, not 5"},
    {"[links]\n\"/x\" = \"\"\n", "unit.toml:2:8: the target of /x: a link's target must have at "
                                 "least one byte, and none that is zero"},
    {"[links]\n\"/x\" = \"hex:00\"\n", "unit.toml:2:8: the target of /x: a link's target must have "
                                       "at least one byte, and none that is zero"},
    {"[links]\n\"/x\" = \"hex:0\"\n",
     "unit.toml:2:8: the target of /x: hex needs two digits a byte: \"0\" has an odd number"},
    {"[links]\n\"/x\" = \"a\\u0000b\"\n", "unit.toml:2:8: the target of /x: a link's target must "
                                          "have at least one byte, and none that is zero"},
    {"[files]\n\"/x\" = { path = \"a\\u0000b\" }\n",
     "unit.toml:2:17: path in the content of /x must have at least one byte, and none that is "
     "zero"},
    {"[files]\n\"/x\" = { path = \"\" }\n", "unit.toml:2:17: path in the content of /x must have "
                                            "at least one byte, and none that is zero"},
    {"links = []\n", "unit.toml:1:9: \"links\" must be a table, not a list"},
    {"files = []\n", "unit.toml:1:9: \"files\" must be a table, not a list"},
    {"[files\n", "unit.toml:1:7: Error while parsing table header: expected ']', saw '\\n'"},
    {"[files]\n\"/x\" = \"a\nb\n", "unit.toml:2:10: Error while parsing string: unescaped control "
                                   "characters other than TAB (U+0009) are explicitly prohibited"},
};

TEST(DescriptionPaths, RefusalNamesPlaceKeyValueAndWhatWouldBeRight) {
    for (const DescriptionRefusal& refusal : REFUSALS) {
        expectRefused(refusal);
    }
}

} // namespace

} // namespace orvane::test
