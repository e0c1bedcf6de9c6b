// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/report/comparison_text.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <sstream>

namespace orvane::test {

namespace {

using desk::Consequence;
using desk::DiffLine;
using desk::Impact;
using desk::Outcome;

std::string printed(const std::vector<Consequence>& consequences) {
    std::ostringstream out;
    desk::printConsequences(out, consequences);
    return out.str();
}

std::string printed(const std::vector<Impact>& impacts) {
    std::ostringstream out;
    desk::printImpacts(out, impacts);
    return out.str();
}

TEST(ComparisonTextTest, ConsequencesFollowTheirValues) {
    const desk::DifferingLine removed = {{DiffLine::Kind::removed, "a\n", 1, 0}, kit::slotKey(9)};
    const desk::DifferingLine added = {{DiffLine::Kind::added, "\xff", 0, 1}, kit::slotKey(9)};
    EXPECT_EQ(printed(std::vector<Consequence>{
                  {{kit::slotKey(9), "", "B"},
                   {{"/tmp/x", Outcome::generated, Outcome::generated, {}, {removed, added}},
                    {"/tmp/y", Outcome::generated, Outcome::stock, {}, {}}}},
                  {{kit::paramKey(1), "0", "1"}, {}},
                  {{{}, "", ""}, {{"/tmp/z", Outcome::kept, Outcome::empty, {}, {}}}}}),
              "slot.9: (empty) -> B\n"
              "  /tmp/x\n    -a\n    +\\xff\n"
              "  /tmp/y: generated -> stock\n"
              "param.1: 0 -> 1\n  changes no output\n"
              "explained by no value:\n  /tmp/z: kept -> empty\n");
}

TEST(ComparisonTextTest, InputsThatChangeNothingAreGroupedInRanges) {
    EXPECT_EQ(
        printed(std::vector<Impact>{{kit::paramKey(1), 3, 0, {}},
                                    {kit::paramKey(2), 3, 0, {}},
                                    {kit::paramKey(3), 13, 12, {{"/tmp/x", 1}, {"/tmp/y", 0}}},
                                    {kit::paramKey(4), 1, 1, {{"/tmp/x", 2}}},
                                    {kit::paramKey(5), 3, 0, {}},
                                    {kit::slotByteKey(0, 0), 3, 0, {}},
                                    {kit::slotByteKey(1, 0), 3, 0, {}},
                                    {kit::slotByteKey(1, 1), 3, 0, {}},
                                    {kit::tuningFieldKey(1, "qwaA"), 3, 0, {}}}),
        "param.3: 12 of 13 values change the output\n  /tmp/x:1\n  /tmp/y\n"
        "param.4: 1 of 1 value changes the output\n  /tmp/x:2\n"
        "7 inputs change nothing:\n"
        "  param.1-2\n  param.5\n  slot.0.0\n  slot.1.0-1\n  tuning.1.qwaA\n");
}

TEST(ComparisonTextTest, WholeTuningBlocksAreOneWord) {
    std::vector<Impact> impacts;
    for (const std::uint64_t block : {4U, 5U, 7U}) {
        for (int field = 0; field < 44; ++field) {
            impacts.push_back(
                {kit::tuningFieldKey(block, "qwa" + std::to_string(field)), 3, 0, {}});
        }
    }
    impacts.push_back({kit::tuningFieldKey(8, "qwa0"), 3, 0, {}});
    EXPECT_EQ(printed(impacts), "133 inputs change nothing:\n"
                                "  tuning.4-5\n  tuning.7\n  tuning.8.qwa0\n");
}

TEST(ComparisonTextTest, ProgressIsDrawnWhenItGrowsAndErasedAtTheEnd) {
    std::ostringstream terminal;
    for (std::size_t done = 1; done <= 80; ++done) {
        desk::printProgress(terminal, done, 80);
    }
    const std::string text = terminal.str();
    EXPECT_EQ(text.substr(0, 53), "\r[#" + std::string(39, ' ') + "] 2 of 80" + "\r[");
    EXPECT_EQ(std::count(text.begin(), text.end(), '['), 39 + 1); // the last one erases
    EXPECT_EQ(text.substr(text.size() - 4), "\r\033[K");
}

} // namespace

} // namespace orvane::test
