// SPDX-License-Identifier: Apache-2.0
#include "kit/description/unit_layout.h"
#include "kit/enter/entered_root.h"
#include "kit/enter/run_inside.h"
#include "kit/unit/marker.h"
#include "orvane_unit/explain/explain.h"
#include "orvane_unit/explain/planned_merge.h"
#include "orvane_unit/report/place_text.h"
#include "tests/kit/unit/described_unit.h"
#include "tests/orvane_unit/tree_state.h"
#include "tests/support/unit_test.h"
#include "writers/airplay_writer.h"
#include "writers/iap_writer.h"

#include <sys/stat.h>
#include <sys/sysmacros.h>

#include <algorithm>

namespace orvane::test {

namespace {

namespace fs = std::filesystem;
using desk::Explanation;
using desk::Line;
using desk::Output;
using kit::UnitDescription;

const Output& outputOf(const Explanation& explanation, const std::string& path) {
    const auto found = std::find_if(explanation.begin(), explanation.end(),
                                    [&path](const Output& other) { return other.path == path; });
    if (found == explanation.end()) {
        throw std::runtime_error("no output " + path);
    }
    return *found;
}

const Line& lineOf(const Output& output, const std::string& key) {
    const auto found =
        std::find_if(output.lines.begin(), output.lines.end(),
                     [&key](const Line& line) { return keyText(line.origin.key) == key; });
    if (found == output.lines.end()) {
        throw std::runtime_error("no line of " + key);
    }
    return *found;
}

std::string placeOf(const Output& output, const std::string& key) {
    return desk::placeText(lineOf(output, key).origin);
}

/// The content that the real binary leaves at the outputs of the explanation.
void expectRunLeaves(const DescribedUnit& described, const Explanation& explanation,
                     const std::vector<std::string>& arguments) {
    ASSERT_EQ(kit::runInside(described.root(), {ORVANE_BINARY, arguments}).exitStatus, 0);
    const kit::EnteredRoot entered(described.root());
    for (const Output& output : explanation) {
        if (output.kindAfter == desk::PathKind::file) {
            EXPECT_EQ(readFile(output.path), output.contentAfter) << output.path;
        } else {
            std::error_code ignored; // for a link to itself
            EXPECT_FALSE(fs::is_regular_file(output.path, ignored)) << output.path;
        }
    }
}

TEST(ExplainTest, OutputWithoutAnyLineIsEmpty) {
    const DescribedUnit described;
    const kit::EnteredRoot entered(described.root());
    desk::PlannedFiles files;
    desk::PlannedMerge merge(files, AIRPLAY_FILE);
    const std::vector<desk::MergedValue<int>> values = {
        {[](int& value) { ++value; }, {{desk::Reason::fromImage}, kit::paramKey(1), {}}}};
    const Output output = merge.finish(
        0, values, [](std::istream&, std::ostream&, int) { return MergeDecision::generate; });
    EXPECT_EQ(output.outcome, desk::Outcome::empty);
    EXPECT_TRUE(output.lines.empty());
}

TEST(ExplainTest, ValuesNameTheirKeysAndPlaces) {
    const DescribedUnit described;
    const Explanation explanation = desk::explainUnit(described.root(), {"-ai"});
    const Output& airplay = outputOf(explanation, AIRPLAY_FILE.output);
    EXPECT_EQ(lineOf(airplay, "param.139").text, "model = Quarion Velmira\n");
    EXPECT_EQ(placeOf(airplay, "param.139"), "parameter 139, image byte 139: 1a");
    EXPECT_EQ(lineOf(airplay, "param.36").text, "oemIconPath = /fs/mp/etc/QUARION/oemIcon.png\n");
    EXPECT_EQ(lineOf(airplay, "param.134").text, "audioProfile = 3\n");
    EXPECT_EQ(placeOf(airplay, "param.134"), "parameter 134, image bytes from 133: 03 00");
    EXPECT_EQ(lineOf(airplay, "param.22").text, "rightHandDrive = 1\n");
    EXPECT_EQ(lineOf(airplay, "file./fs/mp/etc/airplay_static.conf").text, "airplay template\n");

    const Output& iap1 = outputOf(explanation, IAP1_FILE.output);
    EXPECT_EQ(lineOf(iap1, "slot.9").text, "serial=SN004217\n");
    // 2 MiB minus 1 MiB, plus 129 for slot 9.
    EXPECT_EQ(placeOf(iap1, "slot.9"),
              "record slot 9, disk bytes from 1048705: 53 4e 30 30 34 32 31 37");
    EXPECT_EQ(lineOf(iap1, "file./fs/rwdata/.Version/app.inf").text, "firmware_version=030a02\n");
    EXPECT_EQ(placeOf(iap1, "file./fs/rwdata/.Version/app.inf"),
              "/fs/rwdata/.Version/app.inf:2: Version Number is \"ABC_3.10.2_rc\"");
    EXPECT_TRUE(isIntended(explanation));
}

TEST(ExplainTest, VersionLineIsTheLastOneOfItsKey) {
    const DescribedUnit described([](UnitDescription& unit) {
        unit.files["/fs/rwdata/.Version/app.inf"] =
            "Version Number=1.1.1\nno line\nType=Application\nVersion Number = 2.2.2\n";
    });
    const Explanation explanation = desk::explainUnit(described.root(), {"-i"});
    EXPECT_EQ(placeOf(outputOf(explanation, IAP2_FILE.output), "file./fs/rwdata/.Version/app.inf"),
              "/fs/rwdata/.Version/app.inf:4: Version Number is \"2.2.2\"");
}

TEST(ExplainTest, ReadsArgumentsAsTheRealBinaryDoes) {
    using Arguments = std::vector<std::string>;
    const DescribedUnit described;
    const Arguments airplay = {TELEPHONY_TUNING_FILE, SPEECHREC_TUNING_FILE, AIRPLAY_FILE.output};
    const Arguments iap = {IAP2_DEVICE_FILE.output, IAP2_FILE.output, IAP1_FILE.output};
    struct Row {
        Arguments arguments;
        std::string expected; ///< a letter for each writer
    };
    const Row rows[] = {
        {{}, ""},
        {{"-a", "-i"}, "ai"},
        {{"-xia", "-a"}, "iaa"},
        {{"-a", "--", "-i"}, "a"},
        {{"word", "-a"}, ""},
        {{"-i", "-", "-a"}, "i"},
        {{"", "-a"}, ""},
        {{"--a", "-i"}, "ai"},
        {{"-a-i"}, "ai"},
        {{"-x", "-i"}, "i"},
    };
    for (const Row& row : rows) {
        SCOPED_TRACE(testing::PrintToString(row.arguments));
        Arguments expected;
        for (const char letter : row.expected) {
            const Arguments& paths = letter == 'a' ? airplay : iap;
            expected.insert(expected.end(), paths.begin(), paths.end());
        }
        Arguments found;
        for (const Output& output : desk::explainUnit(described.root(), row.arguments)) {
            found.push_back(output.path);
        }
        EXPECT_EQ(found, expected);

        const DescribedUnit fresh;
        ASSERT_EQ(kit::runInside(fresh.root(), {ORVANE_BINARY, row.arguments}).exitStatus, 0);
        for (const char* path : {AIRPLAY_FILE.output, IAP1_FILE.output}) {
            const bool isExplained = std::find(found.begin(), found.end(), path) != found.end();
            EXPECT_EQ(fs::exists(fresh.root() / (path + 1)), isExplained) << path;
        }
    }
}

TEST(ExplainTest, IgnoresUnknownOptions) {
    const DescribedUnit described;
    testing::internal::CaptureStderr();
    EXPECT_EQ(desk::explainUnit(described.root(), {"-xi", "-a"}).size(), 6U);
    EXPECT_EQ(testing::internal::GetCapturedStderr(), "");
}

TEST(ExplainTest, SerialWithLineEndsAndZeroBytesIsOnePiece) {
    for (const std::string& serial : {std::string("A\nB\n\nC"), std::string("\n"),
                                      std::string("AB\0CD", 5), std::string("\xff\nserial")}) {
        const DescribedUnit described(
            [&serial](UnitDescription& unit) { unit.disk.slots[9] = serial; });
        const Explanation explanation = desk::explainUnit(described.root(), {"-i"});
        const std::string text = serial.substr(0, serial.find('\0'));
        EXPECT_EQ(lineOf(outputOf(explanation, IAP2_FILE.output), "slot.9").text,
                  "serial=" + text + "\n");
        expectRunLeaves(described, explanation, {"-i"});
    }
}

TEST(ExplainTest, OutputsThatAreLinksAgreeWithARun) {
    struct Link {
        const char* from;
        const char* to;
    };
    const Link links[] = {
        {IAP2_DEVICE_FILE.output, IAP1_FILE.output},       // an output that is written later
        {IAP1_FILE.output, IAP2_FILE.output},              // one that is written before
        {IAP2_DEVICE_FILE.output, IAP2_FILE.templateFile}, // another file's template
        {IAP2_FILE.output, IAP1_FILE.stockFile},
        {AIRPLAY_FILE.output, "fresh"}, // a file that does not exist yet
        {AIRPLAY_FILE.output, "/none/at/all"},
        {AIRPLAY_FILE.output, AIRPLAY_FILE.output},
    };
    for (const Link& link : links) {
        const DescribedUnit described(
            [&link](UnitDescription& unit) { unit.links[link.from] = link.to; });
        const Explanation explanation = desk::explainUnit(described.root(), {"-ai"});
        SCOPED_TRACE(std::string(link.from) + " -> " + link.to);
        expectRunLeaves(described, explanation, {"-a", "-i"});
    }
}

TEST(ExplainTest, OutputThatIsNotWrittenKeepsItsContent) {
    const DescribedUnit described(
        [](UnitDescription& unit) { unit.files[TELEPHONY_TUNING_FILE] = "of an earlier run\n"; });
    const Explanation explanation = desk::explainUnit(described.root(), {"-a"});
    const Output& output = outputOf(explanation, TELEPHONY_TUNING_FILE);
    EXPECT_EQ(output.outcome, desk::Outcome::notAsked);
    EXPECT_EQ(output.kindAfter, desk::PathKind::file);
    EXPECT_EQ(output.contentAfter, "of an earlier run\n");
    EXPECT_TRUE(output.lines.empty());
}

TEST(ExplainTest, MissingTmpKeepsAllOutputs) {
    const DescribedUnit described([](UnitDescription& unit) { unit.absent.push_back("/tmp"); });
    for (const Output& output : desk::explainUnit(described.root(), {"-i"})) {
        EXPECT_EQ(output.outcome, desk::Outcome::kept) << output.path;
        EXPECT_EQ(output.kindAfter, desk::PathKind::nothing) << output.path;
    }
}

TEST(ExplainTest, UnitIsOnlyReadAndNeedsNoMark) {
    const DescribedUnit described([](UnitDescription& unit) { unit.image.params[134] = 0xFFFF; });
    fs::remove(described.root() / kit::MARKER_NAME);
    const auto before = treeStates(described.root());
    letTimePass();
    EXPECT_EQ(desk::explainUnit(described.root(), {"-aia"}).size(), 9U);
    EXPECT_EQ(treeStates(described.root()), before);
}

} // namespace

} // namespace orvane::test
