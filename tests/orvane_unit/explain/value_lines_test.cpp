// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/explain/value_lines.h"

#include <gtest/gtest.h>

#include <stdexcept>

namespace orvane::test {

namespace {

using desk::changedBytes;
using desk::changedLines;
using desk::cutIntoLines;
using desk::Line;
using desk::Origin;
using desk::Reason;
using desk::ValueRegion;

Origin originOf(std::uint64_t param) {
    return {{Reason::fromImage}, kit::paramKey(param), desk::NoPlace()};
}

/// The pieces as "KEY|TEXT".
std::vector<std::string> pieces(const std::string& text, const std::vector<ValueRegion>& regions) {
    std::vector<std::string> found;
    for (const Line& line : cutIntoLines(text, regions)) {
        found.push_back(keyText(line.origin.key) + "|" + line.text);
    }
    return found;
}

using Pieces = std::vector<std::string>;

TEST(ValueLinesTest, ValueHasTheLineThatChangesWithIt) {
    const std::string text = "head\na = 1\nend\n";
    EXPECT_EQ(pieces(text, {changedLines(text, "head\na = x\nend\n", originOf(1))}),
              (Pieces{"|head\n", "param.1|a = 1\n", "|end\n"}));
}

TEST(ValueLinesTest, EmptyValueHasItsLine) {
    const std::string text = "a = \nb\n";
    EXPECT_EQ(pieces(text, {changedLines(text, "a = x\nb\n", originOf(1))}),
              (Pieces{"param.1|a = \n", "|b\n"}));
}

TEST(ValueLinesTest, ValueWithLineEndsHasAllItsLines) {
    for (const std::string value : {"A\nB", "\n", "A\n", "\nA", "\n\n"}) {
        const std::string text = "head\na=" + value + "\nend\n";
        EXPECT_EQ(pieces(text, {changedLines(text, "head\na=x\nend\n", originOf(1))}),
                  (Pieces{"|head\n", "param.1|a=" + value + "\n", "|end\n"}));
    }
}

TEST(ValueLinesTest, ValueThatLeavesItsLinesOutStandsBetweenTheOthers) {
    // The lines that are left out begin like the one after them.
    const std::string text = "one\n# two\n";
    EXPECT_EQ(pieces(text, {changedLines(text, "one\n# more\nx\n\n# two\n", originOf(1))}),
              (Pieces{"|one\n", "param.1|", "|# two\n"}));
    EXPECT_EQ(pieces("", {changedLines("", "x\n", originOf(1))}), (Pieces{"param.1|"}));
}

TEST(ValueLinesTest, TextWithoutALastLineEndIsWhole) {
    const std::string text = "a=1\nb=2";
    EXPECT_EQ(pieces(text, {changedLines(text, "a=1\nb=x", originOf(2))}),
              (Pieces{"|a=1\n", "param.2|b=2"}));
}

TEST(ValueLinesTest, OnlyTheBytesThatChangeBelongToAValue) {
    const std::string text = "head\ntemplate\nend\n";
    EXPECT_EQ(pieces(text, {changedBytes(text, "head\nxend\n", originOf(1))}),
              (Pieces{"|head\n", "param.1|template\n", "|end\n"}));
    const std::string open = "head\n800\n[end]\n";
    EXPECT_EQ(pieces(open, {changedBytes(open, "head\nx\n[end]\n", originOf(1))}),
              (Pieces{"|head\n", "param.1|800", "|\n", "|[end]\n"}));
}

TEST(ValueLinesTest, ValuesMayComeInAnyOrderAndShareALine) {
    const std::string text = "a=1 b=2\nc=3\n";
    EXPECT_EQ(pieces(text, {changedLines(text, "a=1 b=2\nc=x\n", originOf(3)),
                            changedLines(text, "a=x b=2\nc=3\n", originOf(1)),
                            changedLines(text, "a=1 b=x\nc=3\n", originOf(2))}),
              (Pieces{"param.1|", "param.2|a=1 b=2\n", "param.3|c=3\n"}));
}

TEST(ValueLinesTest, ValueOnNoLineIsAProgramError) {
    EXPECT_THROW(changedLines("a\n", "a\n", originOf(139)), std::logic_error);
    EXPECT_THROW(changedBytes("a\n", "a\n", originOf(139)), std::logic_error);
}

TEST(ValueLinesTest, OtherTextStartsAndEndsDifferently) {
    std::string allBytes;
    for (int byte = 0; byte < 256; ++byte) {
        allBytes += static_cast<char>(byte);
    }
    for (const std::string& text :
         {std::string(), std::string("a"), std::string("ab"), std::string("ba"),
          std::string("a\0b", 3), "b" + allBytes + "a", "a" + allBytes + "b", allBytes}) {
        const std::string other = desk::otherText(text);
        ASSERT_EQ(other.size(), 1U) << text;
        EXPECT_NE(other, "\n") << text;
        EXPECT_TRUE(text.empty() || (other[0] != text.front() && other[0] != text.back())) << text;
    }
    EXPECT_EQ(desk::otherText("abcd"), "e");
}

} // namespace

} // namespace orvane::test
