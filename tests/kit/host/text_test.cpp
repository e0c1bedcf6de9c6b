// SPDX-License-Identifier: Apache-2.0
#include "kit/host/text.h"
#include "tests/support/unicode.h"

#include <gtest/gtest.h>

#include <string>
#include <string_view>

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
        {"\xc3", "\\xc3"},                                    // truncated
        {"\xc0\xaf", "\\xc0\\xaf"},                           // longer than needed
        {"\xed\xa0\x80", "\\xed\\xa0\\x80"},                  // a surrogate
        {"\xc2\x85", "\\xc2\\x85"},                           // a control character
        {"\xc2\x9b", "\\xc2\\x9b"},                           // one that begins an escape sequence
        {"\u202ea\u202c", "\\xe2\\x80\\xaea\\xe2\\x80\\xac"}, // would be reversed
        {"\xf3\xa0\x80\x81", "\\xf3\\xa0\\x80\\x81"},         // invisible
        {"\xf0\x9f\x9a\x97", "\xf0\x9f\x9a\x97"},
        {"ok\xff"
         "ok",
         "ok\\xffok"},
    };
    for (const Row& row : rows) {
        EXPECT_EQ(kit::printable(row.bytes), row.text);
    }
}

TEST(TextTest, ControlAndFormatCharactersAreNotPrintable) {
    for (char32_t character = 0; character <= 0x10FFFF; ++character) {
        ASSERT_NE(kit::isPrintable(character), isControlOrFormat(character))
            << kit::hexDigits(character, 6);
    }
}

TEST(TextTest, CharactersComeWithTheirBytes) {
    std::string seen;
    kit::forEachCharacter("a\xc3\xbc\xf0\x9f\x9a\x97",
                          [&seen](char32_t character, std::string_view bytes) {
                              seen += std::to_string(static_cast<unsigned long>(character)) + "=" +
                                      std::string(bytes) + ";";
                          });
    EXPECT_EQ(seen, "97=a;252=\xc3\xbc;128663=\xf0\x9f\x9a\x97;");
}

TEST(TextTest, PrintableLinesKeepTheirEndsAndTabs) {
    EXPECT_EQ(kit::printableLines(""), "");
    EXPECT_EQ(kit::printableLines("one\n\n\ttwo\x1b[2J\n"), "one\n\n\ttwo\\x1b[2J\n");
    EXPECT_EQ(kit::printableLines("\r\xff"), "\\x0d\\xff");
}

TEST(TextTest, CountedUsesSingularAndPlural) {
    EXPECT_EQ(kit::counted(0, "line"), "0 lines");
    EXPECT_EQ(kit::counted(1, "line"), "1 line");
    EXPECT_EQ(kit::counted(2, "byte"), "2 bytes");
}

TEST(TextTest, HexTextHasBlanksBetweenBytes) {
    EXPECT_EQ(kit::hexDigits(0, 2), "00");
    EXPECT_EQ(kit::hexDigits(0xFEDCBA98U, 8), "fedcba98");
    EXPECT_EQ(kit::hexDigits(0x76543210U, 4), "3210");
    EXPECT_EQ(kit::unicodeEscape(U'\x1b'), "\\u001b");
    EXPECT_EQ(kit::hexText(""), "");
    EXPECT_EQ(kit::hexText(std::string("\0\xff\x5A", 3)), "00 ff 5a");
}

} // namespace

} // namespace orvane::test
