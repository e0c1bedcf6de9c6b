// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/report/explanation_text.h"

#include <gtest/gtest.h>

#include <sstream>

namespace orvane::test {

namespace {

using desk::Line;
using desk::Outcome;
using desk::Output;
using desk::PathKind;
using desk::Reason;

std::string printed(const desk::Explanation& explanation, bool showsAll = false) {
    std::ostringstream out;
    desk::printExplanation(out, explanation, showsAll);
    return out.str();
}

Output output(Outcome outcome, const std::vector<Reason>& reasons, const std::vector<Line>& lines) {
    return {"/tmp/x", outcome, reasons, {}, lines, PathKind::file, ""};
}

Line fieldLine(const std::string& text, const std::string& field, Reason reason,
               const desk::DiskPlace& place) {
    return {text, {{reason}, kit::tuningFieldKey(3, field), place}};
}

TEST(ExplanationTextTest, ValuesHaveTheirPlacesBesideThem) {
    const desk::Explanation explanation = {output(
        Outcome::generated, {Reason::generated},
        {{"# comment\n", desk::fixedText()},
         {"model=Quarion\n", {{Reason::fromImage}, kit::paramKey(139), desk::NoPlace()}},
         {"serial=A\nB\n", {{Reason::fromRecord}, kit::slotKey(9), desk::NoPlace()}},
         {"one\ntwo", {{Reason::fromTemplate}, kit::fileKey("/t"), desk::FilePlace{"/t"}}}})};
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

TEST(ExplanationTextTest, FaultIsExplainedOncePerOutput) {
    const Line line = {"v=1\n",
                       {{Reason::versionIncomplete, Reason::versionOutOfRange},
                        kit::fileKey("/v"),
                        desk::VersionPlace{"/v", 1, "N", "1.999"}}};
    const Line other = {
        "w=0\n",
        {{Reason::versionIncomplete}, kit::fileKey("/v"), desk::VersionPlace{"/v", 0, "N", ""}}};
    EXPECT_EQ(
        printed({output(Outcome::generated, {Reason::generated}, {line, line, other})}),
        "/tmp/x: generated\n"
        "  v=1  /v:1: N is \"1.999\"; version-incomplete: the version has fewer than three "
        "components, so the "
        "last one is repeated; version-out-of-range: a component of the version is not from 0 to "
        "255, so its remainder modulo 256 is used\n"
        "  v=1  \"\n"
        "  w=0  /v; version-incomplete\n");
}

TEST(ExplanationTextTest, OutcomeShowsItsReasons) {
    EXPECT_EQ(printed({output(Outcome::empty, {Reason::templateMissing, Reason::stockMissing}, {}),
                       output(Outcome::kept, {Reason::outputNotOpenable}, {})}),
              "/tmp/x: empty\n"
              "  template-missing: the template can't be opened\n"
              "  stock-missing: the stock file can't be opened, so the output is left empty\n"
              "/tmp/x: kept\n"
              "  output-not-openable: the output can't be opened for writing; what is there "
              "stays\n");
}

TEST(ExplanationTextTest, OmittedLineIsReported) {
    EXPECT_EQ(printed({output(
                  Outcome::generated, {Reason::generated},
                  {{"", {{Reason::imageMissing}, kit::paramKey(134), desk::DefaultStandsIn()}}})}),
              "/tmp/x: generated\n"
              "  (left out)  parameter 134 counts as missing; image-missing: the configuration "
              "image can't be "
              "opened\n");
}

TEST(ExplanationTextTest, IntendedFieldsAreCountedUnlessAllAreShown) {
    const desk::Explanation explanation = {
        output(Outcome::generated, {Reason::generated},
               {{"; head\n", desk::fixedText()},
                fieldLine("qwaA 1\n", "qwaA", Reason::fromTuningBlock, {7, "\x01", {}}),
                fieldLine("qwaB \n", "qwaB", Reason::wordUnknown, {8, std::string(1, '\0'), {}}),
                fieldLine("qwaC 2\n", "qwaC", Reason::fromTuningBlock, {9, "\x02", {}})})};
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
