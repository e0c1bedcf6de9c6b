// SPDX-License-Identifier: Apache-2.0
#include "config/boot_disk.h"
#include "config/config_store.h"
#include "kit/unit/describe_inputs.h"
#include "orvane_unit/compare/output_differences.h"
#include "orvane_unit/explain/explain.h"
#include "tests/kit/unit/described_unit.h"
#include "writers/airplay_writer.h"
#include "writers/iap_writer.h"

#include <gtest/gtest.h>

#include <functional>
#include <map>
#include <set>

namespace orvane::test {

namespace {

using desk::Consequence;
using kit::UnitDescription;

using Change = std::function<void(UnitDescription&)>;

/// The consequences of `change`, by the key of each value that differs. Both units have `common`.
std::map<std::string, Consequence> consequencesOf(
    const Change& change, const Change& common = [](UnitDescription&) {}) {
    const DescribedUnit first(common);
    const DescribedUnit second([&](UnitDescription& unit) {
        common(unit);
        change(unit);
    });
    std::map<std::string, Consequence> found;
    for (const Consequence& consequence : desk::consequences(
             kit::differingValues(kit::unitValues(kit::describeInputs(first.root())),
                                  kit::unitValues(kit::describeInputs(second.root()))),
             desk::outputDifferences(desk::explainUnit(first.root(), {"-ai"}),
                                     desk::explainUnit(second.root(), {"-ai"})))) {
        found[keyText(consequence.change.key)] = consequence;
    }
    return found;
}

std::set<std::string> pathsOf(const Consequence& consequence) {
    std::set<std::string> paths;
    for (const desk::OutputDifference& output : consequence.outputs) {
        paths.insert(output.path);
    }
    return paths;
}

std::vector<std::string> linesOf(const Consequence& consequence, const std::string& path) {
    std::vector<std::string> lines;
    for (const desk::OutputDifference& output : consequence.outputs) {
        for (const desk::DifferingLine& line : output.lines) {
            if (output.path == path) {
                const bool isRemoved = line.line.kind == desk::DiffLine::Kind::removed;
                lines.push_back((isRemoved ? "-" : "+") + line.line.text);
            }
        }
    }
    return lines;
}

using Lines = std::vector<std::string>;
using Paths = std::set<std::string>;

const Paths IAP_OUTPUTS = {IAP2_DEVICE_FILE.output, IAP2_FILE.output, IAP1_FILE.output};

TEST(OutputDifferencesTest, EqualUnitsHaveNoDifferences) {
    EXPECT_TRUE(consequencesOf([](UnitDescription&) {}).empty());
}

TEST(OutputDifferencesTest, ParameterChangesItsLines) {
    const auto found = consequencesOf([](UnitDescription& unit) { unit.image.params[139] = 1; });
    ASSERT_EQ(found.size(), 1U);
    const Consequence& consequence = found.at("param.139");
    EXPECT_EQ(consequence.change.before, "26");
    EXPECT_EQ(consequence.change.after, "1");
    EXPECT_EQ(linesOf(consequence, AIRPLAY_FILE.output),
              (Lines{"-model = Quarion Velmira\n", "+model = Marl Tulvari\n"}));
    EXPECT_EQ(consequence.outputs.size(), 4U);
}

TEST(OutputDifferencesTest, UnreadParameterChangesNothing) {
    const auto found = consequencesOf([](UnitDescription& unit) { unit.image.params[50] = 3; });
    ASSERT_EQ(found.size(), 1U);
    EXPECT_TRUE(found.at("param.50").outputs.empty());
}

TEST(OutputDifferencesTest, SlotsAndAuxiliaryAreaAreReported) {
    const auto found = consequencesOf([](UnitDescription& unit) {
        unit.disk.slots[9] = "SN9";
        unit.disk.slots[1] = std::string("\x01\x02", 2);
        unit.disk.aux = "bench";
    });
    EXPECT_EQ(pathsOf(found.at("slot.9")), IAP_OUTPUTS);
    EXPECT_EQ(linesOf(found.at("slot.9"), IAP1_FILE.output),
              (Lines{"-serial=SN004217\n", "+serial=SN9\n"}));
    EXPECT_EQ(found.at("slot.1").change.after, "hex:0102");
    EXPECT_TRUE(found.at("slot.1").outputs.empty());
    EXPECT_EQ(found.at("aux").change.after, "bench");
    EXPECT_EQ(found.size(), 3U);
}

TEST(OutputDifferencesTest, GeneratedProfileAddsTheTuningFiles) {
    const auto found = consequencesOf([](UnitDescription& unit) {
        unit.image.params[134] = 0xFFFF;
        unit.disk.tuning[3].fields["qwaNRAtten"] = std::int64_t{-40};
    });
    const Consequence& profile = found.at("param.134");
    EXPECT_EQ(linesOf(profile, AIRPLAY_FILE.output),
              (Lines{"-audioProfile = 3\n", "+audioProfile = 65535\n"}));
    EXPECT_EQ(linesOf(profile, SPEECHREC_TUNING_FILE).size(), 45U);
    // A field that differs has its own line.
    EXPECT_EQ(linesOf(profile, TELEPHONY_TUNING_FILE).size(), 44U);
    EXPECT_EQ(linesOf(found.at("tuning.3.qwaNRAtten"), TELEPHONY_TUNING_FILE),
              Lines{"+qwaNRAtten -40\n"});
}

TEST(OutputDifferencesTest, VersionFileChangesTheFirmwareVersions) {
    const std::string path = "/fs/rwdata/.Version/app.inf";
    const auto found = consequencesOf([&path](UnitDescription& unit) {
        unit.files[path] = "Type=Application\nVersion Number=4.5.6\n";
    });
    ASSERT_EQ(found.size(), 1U);
    EXPECT_EQ(linesOf(found.at("file." + path), IAP1_FILE.output),
              (Lines{"-firmware_version=030a02\n", "+firmware_version=040506\n"}));
}

TEST(OutputDifferencesTest, MissingVersionFileIsTheCause) {
    const std::string path = "/fs/rwdata/.Version/app.inf";
    const auto found = consequencesOf([&path](UnitDescription& unit) { unit.files.erase(path); });
    EXPECT_EQ(pathsOf(found.at("file." + path)), IAP_OUTPUTS);
    EXPECT_EQ(found.at("file." + path).change.after, "(missing)");
    EXPECT_EQ(found.size(), 1U);
}

TEST(OutputDifferencesTest, TemplateChangesItsOwnLines) {
    const std::string path = AIRPLAY_FILE.templateFile;
    const auto found =
        consequencesOf([&path](UnitDescription& unit) { unit.files[path] = "another template\n"; });
    ASSERT_EQ(found.size(), 1U);
    EXPECT_EQ(linesOf(found.at("file." + path), AIRPLAY_FILE.output),
              (Lines{"-airplay template\n", "+another template\n"}));
}

TEST(OutputDifferencesTest, MissingTemplateIsTheCauseOfTheStockFile) {
    const std::string path = IAP2_FILE.templateFile;
    const auto found = consequencesOf([&path](UnitDescription& unit) { unit.files.erase(path); });
    ASSERT_EQ(found.size(), 1U);
    const Consequence& consequence = found.at("file." + path);
    ASSERT_EQ(consequence.outputs.size(), 1U);
    EXPECT_EQ(consequence.outputs[0].before, desk::Outcome::generated);
    EXPECT_EQ(consequence.outputs[0].after, desk::Outcome::stock);
}

TEST(OutputDifferencesTest, EmptyTemplateOfIap2IsTheCauseOfTheStockFileOfIap1) {
    const std::string path = IAP2_FILE.templateFile;
    const auto found = consequencesOf([&path](UnitDescription& unit) { unit.files[path] = ""; });
    ASSERT_EQ(found.size(), 1U);
    EXPECT_EQ(pathsOf(found.at("file." + path)), (Paths{IAP2_FILE.output, IAP1_FILE.output}));
}

TEST(OutputDifferencesTest, BytesOfASparseTemplateChangeItsLine) {
    const std::string path = AIRPLAY_FILE.templateFile;
    const auto found = consequencesOf(
        [&path](UnitDescription& unit) { unit.sparseFiles[path].bytes[4998] = "B\n"; },
        [&path](UnitDescription& unit) {
            unit.files.erase(path);
            unit.sparseFiles[path] = {5000, {{4998, "A\n"}}};
        });
    ASSERT_EQ(found.size(), 1U);
    const Consequence& consequence = found.at("file.bytes.4998." + path);
    EXPECT_EQ(pathsOf(consequence), Paths{AIRPLAY_FILE.output});
    EXPECT_EQ(linesOf(consequence, AIRPLAY_FILE.output).size(), 2U);
}

TEST(OutputDifferencesTest, UnusedStockFileChangesNothing) {
    const std::string path = AIRPLAY_FILE.stockFile;
    const auto found = consequencesOf([&path](UnitDescription& unit) { unit.files.erase(path); });
    ASSERT_EQ(found.size(), 1U);
    EXPECT_TRUE(found.at("file." + path).outputs.empty());
}

TEST(OutputDifferencesTest, MissingImageChangesEveryValueUnderItsOwnKey) {
    const auto found =
        consequencesOf([](UnitDescription& unit) { unit.absent.push_back(CONFIG_SHM_NAME); });
    EXPECT_EQ(found.at("param.139").change.after, "(missing)");
    EXPECT_EQ(found.at("param.139").outputs.size(), 4U);
    EXPECT_EQ(pathsOf(found.at("param.22")), Paths{AIRPLAY_FILE.output});
    // The two lines of the value itself, its comment and the empty line after it.
    EXPECT_EQ(linesOf(found.at("param.134"), AIRPLAY_FILE.output).size(), 3U);
    EXPECT_EQ(found.count(""), 0U);
}

TEST(OutputDifferencesTest, MissingDiskChangesTheSerial) {
    const auto found =
        consequencesOf([](UnitDescription& unit) { unit.absent.push_back(BOOT_DISK); });
    EXPECT_EQ(linesOf(found.at("slot.9"), IAP2_FILE.output),
              (Lines{"-serial=SN004217\n", "+serial=ABCD1234abc\n"}));
    EXPECT_EQ(found.count(""), 0U);
}

TEST(OutputDifferencesTest, FolderInPlaceOfAnOutputIsTheCause) {
    const std::string path = IAP2_FILE.output;
    const auto found =
        consequencesOf([&path](UnitDescription& unit) { unit.folders.push_back(path); });
    ASSERT_EQ(found.size(), 1U);
    EXPECT_EQ(pathsOf(found.at("folder." + path)), (Paths{IAP2_FILE.output, IAP1_FILE.output}));
}

/// An output is a link to the template of a later one: no line has its value from a link.
TEST(OutputDifferencesTest, LinesWithoutAValueComeLast) {
    const DescribedUnit first;
    const DescribedUnit second([](UnitDescription& unit) {
        unit.links[IAP2_FILE.output] = IAP1_FILE.templateFile;
        unit.image.params[50] = 1;
    });
    const std::vector<desk::Consequence> found = desk::consequences(
        kit::differingValues(kit::unitValues(kit::describeInputs(first.root())),
                             kit::unitValues(kit::describeInputs(second.root()))),
        desk::outputDifferences(desk::explainUnit(first.root(), {"-i"}),
                                desk::explainUnit(second.root(), {"-i"})));
    ASSERT_EQ(found.size(), 3U);
    EXPECT_EQ(keyText(found[0].change.key), "param.50");
    EXPECT_TRUE(found[0].outputs.empty());
    EXPECT_EQ(keyText(found[1].change.key), std::string("link.") + IAP2_FILE.output);
    EXPECT_TRUE(found[1].outputs.empty());
    EXPECT_TRUE(found[2].change.key.isEmpty());
    ASSERT_EQ(found[2].outputs.size(), 1U);
    EXPECT_EQ(found[2].outputs[0].path, IAP1_FILE.output);
}

} // namespace

} // namespace orvane::test
