// SPDX-License-Identifier: Apache-2.0
#include "kit/host/text.h"

#include <gtest/gtest.h>

#include <string>

namespace orvane::test {

namespace {

TEST(TextTest, PrintableEscapesAnythingThatIsNotText) {
    struct Row {
        std::string bytes;
        std::string text;
    };
    const Row rows[] = {
        {"", ""},
        {"plain = text", "plain = text"},
        {"a\nb\tc\r", "a\\nb\\x09c\\x0d"},
        {"back\\slash", "back\\\\slash"},
        {std::string("\0", 1), "\\x00"},
        {"\x7f", "\\x7f"},
        {"M\xc3\xbcller", "M\xc3\xbcller"},
        {"\xc3", "\\xc3"},                   // truncated
        {"\xc0\xaf", "\\xc0\\xaf"},          // longer than needed
        {"\xed\xa0\x80", "\\xed\\xa0\\x80"}, // a surrogate
        {"\xc2\x85", "\\xc2\\x85"},          // a control character
        {"\xf0\x9f\x9a\x97", "\xf0\x9f\x9a\x97"},
        {"ok\xff"
         "ok",
         "ok\\xffok"},
    };
    for (const Row& row : rows) {
        EXPECT_EQ(kit::printable(row.bytes), row.text);
    }
}

TEST(TextTest, CountedUsesSingularAndPlural) {
    EXPECT_EQ(kit::counted(0, "line"), "0 lines");
    EXPECT_EQ(kit::counted(1, "line"), "1 line");
    EXPECT_EQ(kit::counted(2, "byte"), "2 bytes");
}

TEST(TextTest, HexTextHasBlanksBetweenBytes) {
    EXPECT_EQ(kit::hexText(""), "");
    EXPECT_EQ(kit::hexText(std::string("\0\xff\x5A", 3)), "00 ff 5a");
}

} // namespace

} // namespace orvane::test
