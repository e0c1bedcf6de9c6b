// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/compare/text_diff.h"
#include "orvane_unit/report/unified_diff.h"

#include <gtest/gtest.h>

#include <numeric>
#include <random>
#include <sstream>

namespace orvane::test {

namespace {

using Text = std::optional<std::string>;

/// Without colours: the tests' standard output is not a terminal, or NO_COLOR is set for them.
std::string diffOf(const Text& before, const Text& after) {
    std::ostringstream out;
    desk::printUnifiedDiff(out, "/tmp/x", before, after);
    return out.str();
}

TEST(TextDiffTest, SameTextsHaveNoDiff) {
    EXPECT_EQ(diffOf("a\n", "a\n"), "");
    EXPECT_EQ(diffOf("", ""), "");
    EXPECT_EQ(diffOf(std::nullopt, std::nullopt), "");
}

TEST(TextDiffTest, ChangedLineHasThreeLinesOfContextOnEachSide) {
    EXPECT_EQ(diffOf("1\n2\n3\n4\n5\n6\n7\n8\n9\n", "1\n2\n3\n4\nfive\n6\n7\n8\n9\n"),
              "--- /tmp/x\n+++ /tmp/x\n@@ -2,7 +2,7 @@\n"
              " 2\n 3\n 4\n-5\n+five\n 6\n 7\n 8\n");
}

TEST(TextDiffTest, DistantChangesAreSeparateHunks) {
    std::string before;
    for (int i = 1; i <= 20; ++i) {
        before += std::to_string(i) + "\n";
    }
    std::string after = before;
    after.replace(after.find("2\n"), 2, "");
    after += "21\n";
    EXPECT_EQ(diffOf(before, after), "--- /tmp/x\n+++ /tmp/x\n"
                                     "@@ -1,5 +1,4 @@\n 1\n-2\n 3\n 4\n 5\n"
                                     "@@ -18,3 +17,4 @@\n 18\n 19\n 20\n+21\n");
}

TEST(TextDiffTest, SixCommonLinesJoinTwoChangesAndSevenSeparateThem) {
    EXPECT_EQ(diffOf("x\n1\n2\n3\n4\n5\n6\ny\n", "X\n1\n2\n3\n4\n5\n6\nY\n"),
              "--- /tmp/x\n+++ /tmp/x\n@@ -1,8 +1,8 @@\n"
              "-x\n+X\n 1\n 2\n 3\n 4\n 5\n 6\n-y\n+Y\n");
    EXPECT_EQ(diffOf("x\n1\n2\n3\n4\n5\n6\n7\ny\n", "X\n1\n2\n3\n4\n5\n6\n7\nY\n"),
              "--- /tmp/x\n+++ /tmp/x\n@@ -1,4 +1,4 @@\n-x\n+X\n 1\n 2\n 3\n"
              "@@ -6,4 +6,4 @@\n 5\n 6\n 7\n-y\n+Y\n");
}

/// Applies the hunks to `before` by their line numbers alone, like a patch.
std::string patched(const std::vector<std::string>& before, const std::vector<desk::Hunk>& hunks) {
    std::string text;
    std::size_t next = 1; // the next line of `before`
    for (const desk::Hunk& hunk : hunks) {
        const std::size_t first = hunk.beforeCount == 0 ? hunk.before + 1 : hunk.before;
        while (next < first) {
            text += before.at(next++ - 1);
        }
        for (const desk::DiffLine& line : hunk.lines) {
            if (line.kind != desk::DiffLine::Kind::added) {
                EXPECT_EQ(line.before, next);
                EXPECT_EQ(line.text, before.at(next++ - 1));
            }
            text += line.kind == desk::DiffLine::Kind::removed ? "" : line.text;
        }
        EXPECT_EQ(next, first + hunk.beforeCount);
    }
    while (next <= before.size()) {
        text += before[next++ - 1];
    }
    return text;
}

/// The same numbers in every run.
std::mt19937 numbersFrom(std::mt19937::result_type seed) {
    return std::mt19937(seed);
}

TEST(TextDiffTest, HunksTurnTheFirstTextIntoTheSecond) {
    std::mt19937 random = numbersFrom(20090213);
    const auto textOf = [&random] {
        std::vector<std::string> lines(random() % 40);
        for (std::string& line : lines) {
            line = std::string(1, static_cast<char>('a' + random() % 5)) + "\n";
        }
        return lines;
    };
    const auto joined = [](const std::vector<std::string>& lines) {
        return std::accumulate(lines.begin(), lines.end(), std::string());
    };
    for (int i = 0; i < 300; ++i) {
        const std::vector<std::string> before = textOf();
        const std::string after = joined(textOf());
        EXPECT_EQ(patched(before, desk::differingHunks(joined(before), after)), after);
    }
}

TEST(TextDiffTest, NewAndRemovedFilesAreDiffedAgainstNothing) {
    EXPECT_EQ(diffOf(std::nullopt, "a\nb\n"),
              "--- /dev/null\n+++ /tmp/x\n@@ -0,0 +1,2 @@\n+a\n+b\n");
    EXPECT_EQ(diffOf("a\n", std::nullopt), "--- /tmp/x\n+++ /dev/null\n@@ -1,1 +0,0 @@\n-a\n");
    EXPECT_EQ(diffOf(std::nullopt, ""), "--- /dev/null\n+++ /tmp/x\n");
}

TEST(TextDiffTest, MissingLineEndIsReported) {
    EXPECT_EQ(
        diffOf("a\nb", "a\nb\n"),
        "--- /tmp/x\n+++ /tmp/x\n@@ -1,2 +1,2 @@\n a\n-b\n\\ No newline at end of file\n+b\n");
}

TEST(TextDiffTest, BytesThatAreNotTextAreEscaped) {
    EXPECT_EQ(diffOf("", "\x1b[2J\xff\n"),
              "--- /tmp/x\n+++ /tmp/x\n@@ -0,0 +1,1 @@\n+\\x1b[2J\\xff\n");
}

TEST(TextDiffTest, LinesKnowTheirNumbers) {
    const std::vector<desk::Hunk> hunks = desk::differingHunks("a\nb\nc\n", "a\nc\nd\n");
    ASSERT_EQ(hunks.size(), 1U);
    std::vector<std::tuple<desk::DiffLine::Kind, std::size_t, std::size_t>> found;
    for (const desk::DiffLine& line : hunks[0].lines) {
        found.emplace_back(line.kind, line.before, line.after);
    }
    using Kind = desk::DiffLine::Kind;
    EXPECT_EQ(found, (decltype(found){{Kind::common, 1, 1},
                                      {Kind::removed, 2, 0},
                                      {Kind::common, 3, 2},
                                      {Kind::added, 0, 3}}));
}

TEST(TextDiffTest, LinesKnowTheirNumbersWhenTheSecondTextIsShorter) {
    const std::vector<desk::Hunk> hunks = desk::differingHunks("a\nb\nc\nd\n", "x\nd\n");
    ASSERT_EQ(hunks.size(), 1U);
    for (const desk::DiffLine& line : hunks[0].lines) {
        const std::string texts[] = {"", "a\n", "b\n", "c\n", "d\n"};
        const std::string later[] = {"", "x\n", "d\n"};
        EXPECT_TRUE(line.before == 0 || line.text == texts[line.before]);
        EXPECT_TRUE(line.after == 0 || line.text == later[line.after]);
    }
}

TEST(TextDiffTest, LargeTextsWithNothingInCommonCostAlmostNothing) {
    std::string before;
    std::string after;
    for (int i = 0; i < 3000; ++i) {
        before += "before " + std::to_string(i) + "\n";
        after += "after " + std::to_string(i) + "\n";
    }
    std::size_t removed = 0;
    std::size_t added = 0;
    for (const desk::Hunk& hunk : desk::differingHunks(before, after)) {
        removed += hunk.beforeCount;
        added += hunk.afterCount;
    }
    EXPECT_EQ(removed, 3000U);
    EXPECT_EQ(added, 3000U);
}

} // namespace

} // namespace orvane::test
