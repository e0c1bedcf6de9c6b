// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/report/explanation_text.h"

#include <gtest/gtest.h>

#include <sstream>

namespace orvane::test {

namespace {

using desk::Left;
using desk::Line;
using desk::Outcome;
using desk::Output;
using desk::Reason;

std::string printed(const desk::Explanation& explanation, bool showsAll = false) {
    std::ostringstream out;
    desk::printExplanation(out, explanation, showsAll);
    return out.str();
}

Output output(Outcome outcome, const std::vector<Reason>& reasons, const std::vector<Line>& lines) {
    return {"/tmp/x", outcome, reasons, {}, lines, Left::file, ""};
}

TEST(ExplanationTextTest, ValuesStandBesideTheirPlaces) {
    const desk::Explanation explanation = {
        output(Outcome::generated, {Reason::generated},
               {{"# comment\n", {Reason::fixedText}, "", ""},
                {"model=Quarion\n", {Reason::fromImage}, "param.139", "parameter 139"},
                {"serial=A\nB\n", {Reason::fromRecord}, "slot.9", "record slot 9"},
                {"one\ntwo", {Reason::fromTemplate}, "file./t", "/t"}})};
    EXPECT_EQ(printed(explanation), "/tmp/x: generated\n"
                                    "  model=Quarion         parameter 139\n"
                                    "  serial=A\\nB           record slot 9\n"
                                    "  ... 2 lines, 7 bytes  /t\n");
    EXPECT_EQ(printed(explanation, true), "/tmp/x: generated\n"
                                          "  # comment\n"
                                          "  model=Quarion         parameter 139\n"
                                          "  serial=A\\nB           record slot 9\n"
                                          "  ... 2 lines, 7 bytes  /t\n");
}

TEST(ExplanationTextTest, WhatIsNotIntendedIsSaidOnceForEachOutput) {
    const Line line = {
        "v=1\n", {Reason::versionIncomplete, Reason::versionOutOfRange}, "file./v", "/v:1"};
    const Line other = {"w=0\n", {Reason::versionIncomplete}, "file./v", "/v:2"};
    EXPECT_EQ(
        printed({output(Outcome::generated, {Reason::generated}, {line, line, other})}),
        "/tmp/x: generated\n"
        "  v=1  /v:1; version-incomplete: the version has fewer than three components, and the "
        "last one is repeated; version-out-of-range: a component of the version is not from 0 to "
        "255, and its remainder by 256 stands in\n"
        "  v=1  \"\n"
        "  w=0  /v:2; version-incomplete\n");
}

TEST(ExplanationTextTest, OutcomeTellsItsReasons) {
    EXPECT_EQ(printed({output(Outcome::empty, {Reason::templateMissing, Reason::stockMissing}, {}),
                       output(Outcome::kept, {Reason::outputNotOpenable}, {})}),
              "/tmp/x: empty\n"
              "  template-missing: the template can't be opened\n"
              "  stock-missing: the stock file can't be opened, so the output is left empty\n"
              "/tmp/x: kept\n"
              "  output-not-openable: the output can't be opened for writing; what stands there "
              "stays\n");
}

TEST(ExplanationTextTest, LineThatIsLeftOutIsTold) {
    EXPECT_EQ(printed({output(Outcome::generated, {Reason::generated},
                              {{"", {Reason::imageMissing}, "param.134", "parameter 134"}})}),
              "/tmp/x: generated\n"
              "  (left out)  parameter 134; image-missing: the configuration image can't be "
              "opened\n");
}

TEST(ExplanationTextTest, FieldsAsTheyShouldBeAreCountedUnlessAllAreWanted) {
    const desk::Explanation explanation = {output(
        Outcome::generated, {Reason::generated},
        {{"; head\n", {Reason::fixedText}, "", ""},
         {"qwaA 1\n", {Reason::fromTuningBlock}, "tuning.3.qwaA", "block 3, disk byte 7: 01"},
         {"qwaB \n", {Reason::wordUnknown}, "tuning.3.qwaB", "block 3, disk byte 8: 00"},
         {"qwaC 2\n", {Reason::fromTuningBlock}, "tuning.3.qwaC", "block 3, disk byte 9: 02"}})};
    EXPECT_EQ(
        printed(explanation),
        "/tmp/x: generated\n"
        "  ... 2 values  block 3 of the boot disk\n"
        "  qwaB          block 3, disk byte 8: 00; word-unknown: the code has no word, so the "
        "value is empty\n");
    EXPECT_EQ(printed(explanation, true),
              "/tmp/x: generated\n"
              "  ; head\n"
              "  qwaA 1  block 3, disk byte 7: 01\n"
              "  qwaB    block 3, disk byte 8: 00; word-unknown: the code has no word, so the "
              "value is empty\n"
              "  qwaC 2  block 3, disk byte 9: 02\n");
}

} // namespace

} // namespace orvane::test
