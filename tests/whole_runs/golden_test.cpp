// SPDX-License-Identifier: Apache-2.0
//
// A unit in, its /tmp out: golden/CASE holds the unit, the arguments and the expected /tmp.
#include "config/param_catalogue.h"
#include "config/record_slots.h"
#include "identity/vehicle_identity.h"
#include "kit/description/parse_description.h"
#include "kit/enter/entered_root.h"
#include "kit/enter/run_inside.h"
#include "kit/unit/make_unit.h"
#include "main/options.h"
#include "tests/support/input_lengths.h"
#include "tests/support/standard_streams.h"
#include "tests/support/temporary_folder.h"
#include "tests/support/unit_test.h"
#include "tuning/audio_profile.h"
#include "tuning/dps_block.h"

#include <gtest/gtest.h>
#include <unistd.h>

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <filesystem>
#include <map>
#include <set>
#include <sstream>
#include <string>
#include <vector>

namespace orvane::test {

namespace {

namespace fs = std::filesystem;

std::vector<std::string> goldenCases() {
    std::vector<std::string> names;
    for (const fs::directory_entry& entry : fs::directory_iterator(ORVANE_GOLDEN_DIR)) {
        names.push_back(entry.path().filename().string());
    }
    std::sort(names.begin(), names.end());
    return names;
}

std::vector<std::string> readLines(const fs::path& file) {
    std::istringstream text(readFile(file));
    std::vector<std::string> lines;
    for (std::string line; std::getline(text, line);) {
        lines.push_back(line);
    }
    return lines;
}

/// Every entry of a unit's /tmp, folders with a trailing slash, or "(absent)".
std::set<std::string> listTmp(const fs::path& tmp) {
    if (!fs::exists(tmp)) {
        return {"(absent)"};
    }
    std::set<std::string> names;
    for (const fs::directory_entry& entry : fs::recursive_directory_iterator(tmp)) {
        names.insert(entry.path().lexically_relative(tmp).string() +
                     (entry.is_directory() ? "/" : ""));
    }
    return names;
}

/// The expected files that are described instead of being in expected/tmp, by their paths.
std::map<std::string, kit::Bytes> describedFiles(const fs::path& caseFolder) {
    const fs::path description = caseFolder / "expected/tmp.toml";
    return fs::exists(description) ? kit::readDescription(description).files
                                   : std::map<std::string, kit::Bytes>();
}

class GoldenTest : public ::testing::TestWithParam<std::string> {
protected:
    GoldenTest() : root_(folder_.path() / "unit") {
        kit::makeUnit(kit::readDescription(caseFolder() / "unit.toml"), root_);
    }

    static fs::path caseFolder() { return fs::path(ORVANE_GOLDEN_DIR) / GetParam(); }

    static std::string expectedError() {
        const fs::path file = caseFolder() / "expected/stderr";
        return fs::exists(file) ? readFile(file) : "";
    }

    const fs::path& root() const { return root_; }

    void expectOutputs() const {
        const std::vector<std::string> list = readLines(caseFolder() / "expected/tmp.list");
        EXPECT_EQ(listTmp(root_ / "tmp"), std::set<std::string>(list.begin(), list.end()));
        const std::map<std::string, kit::Bytes> described = describedFiles(caseFolder());
        for (const std::string& name : list) {
            const auto found = described.find("/tmp/" + name);
            if (found != described.end()) {
                // Too long to be shown.
                EXPECT_TRUE(readFile(root_ / "tmp" / name) == found->second) << name;
            } else if (name != "(absent)" && name.back() != '/') {
                EXPECT_EQ(readFile(root_ / "tmp" / name),
                          readFile(caseFolder() / "expected/tmp" / name))
                    << name;
            }
        }
    }

private:
    TemporaryFolder folder_;
    fs::path root_;
};

TEST_P(GoldenTest, BinaryLeavesTheExpectedFiles) {
    const kit::RunResult result =
        kit::runInside(root(), {ORVANE_BINARY, readLines(caseFolder() / "arguments")});
    EXPECT_EQ(result.exitStatus, 0);
    EXPECT_EQ(result.standardOutput, "");
    EXPECT_EQ(result.standardError, expectedError());
    expectOutputs();
}

/// The same inside this process, for tools that watch it.
TEST_P(GoldenTest, OptionLoopLeavesTheExpectedFiles) {
    std::vector<std::string> words = {"orvane"};
    for (const std::string& argument : readLines(caseFolder() / "arguments")) {
        words.push_back(argument);
    }
    std::vector<char*> argv;
    for (std::string& word : words) {
        argv.push_back(word.data());
    }
    argv.push_back(nullptr);
    std::string said;
    {
        const kit::EnteredRoot entered(root());
        StandardStreams streams;
        optind = 0; // makes glibc's getopt start again
        EXPECT_EQ(runOptions(static_cast<int>(words.size()), argv.data()), 0);
        said = streams.stop();
    }
    EXPECT_EQ(said, expectedError());
    expectOutputs();
}

/// An expected file that is on no list would never be compared.
TEST(GoldenCases, CompareEveryExpectedFile) {
    for (const std::string& name : goldenCases()) {
        SCOPED_TRACE(name);
        const fs::path expected = fs::path(ORVANE_GOLDEN_DIR) / name / "expected";
        const std::vector<std::string> list = readLines(expected / "tmp.list");
        EXPECT_TRUE(std::is_sorted(list.begin(), list.end()));
        if (fs::exists(expected / "tmp")) {
            for (const std::string& file : listTmp(expected / "tmp")) {
                EXPECT_EQ(std::count(list.begin(), list.end(), file), 1) << file;
            }
        }
        for (const auto& [path, content] : describedFiles(expected.parent_path())) {
            const std::string file = fs::path(path).lexically_relative("/tmp").string();
            EXPECT_EQ(std::count(list.begin(), list.end(), file), 1) << path;
            EXPECT_FALSE(fs::exists(expected / "tmp" / file)) << path;
        }
    }
}

std::string caseName(const ::testing::TestParamInfo<std::string>& parameter) {
    std::string name = parameter.param;
    std::replace(name.begin(), name.end(), '-', '_');
    return name;
}

INSTANTIATE_TEST_SUITE_P(Golden, GoldenTest, ::testing::ValuesIn(goldenCases()), caseName);

TEST(GoldenCases, AreAllFound) {
    EXPECT_EQ(goldenCases().size(), 119U) << "a new case, or a lost one: set their number";
}

TEST(GoldenCases, CopyInputsOfEveryLength) {
    std::set<std::size_t> lengths;
    for (const std::string& name : goldenCases()) {
        for (const auto& [path, content] :
             kit::readDescription(fs::path(ORVANE_GOLDEN_DIR) / name / "unit.toml").files) {
            if (path.rfind("/fs/mp/etc/", 0) == 0) {
                lengths.insert(content.size());
            }
        }
    }
    for (const std::size_t length : INPUT_LENGTHS) {
        EXPECT_EQ(lengths.count(length), 1U) << length;
    }
    EXPECT_EQ(lengths.count(LONGER_THAN_ANY_BUFFER), 1U);
}

/// What the cases lay at an offset that a person wrote, where no table of the product has a part:
/// the offsets, from the start of the image and from the end of the disk.
struct RawPlaces {
    std::set<std::uint32_t> ofImage;
    std::set<std::uint64_t> ofDisk;
};

bool isVisible(const kit::Bytes& bytes) {
    return bytes.find_first_not_of('\0') != kit::Bytes::npos;
}

RawPlaces rawPlaces() {
    RawPlaces places;
    for (const std::string& name : goldenCases()) {
        const kit::UnitDescription unit =
            kit::readDescription(fs::path(ORVANE_GOLDEN_DIR) / name / "unit.toml");
        for (const auto& [offset, bytes] : unit.image.bytes) {
            if (isVisible(bytes)) {
                places.ofImage.insert(offset);
            }
        }
        for (const auto& [offset, bytes] : unit.disk.bytes) {
            if (isVisible(bytes)) {
                places.ofDisk.insert(unit.disk.size - offset);
            }
        }
    }
    return places;
}

TEST(GoldenCases, LayEveryParameterThatIsReadByHand) {
    const RawPlaces places = rawPlaces();
    for (const std::uint16_t number :
         {RIGHT_HAND_DRIVE_PARAM, BRAND_PARAM, FUEL_TYPE_PARAM, AUDIO_PROFILE_PARAM, MODEL_PARAM}) {
        const std::uint32_t offset = ParamCatalogue.rows.at(number - 1U).offset;
        EXPECT_EQ(places.ofImage.count(offset), 1U) << "parameter " << number;
    }
}

TEST(GoldenCases, LayEverySlotByHand) {
    const RawPlaces places = rawPlaces();
    for (std::uint32_t slot = 0; slot < RECORD_SLOT_COUNT; ++slot) {
        std::uint32_t size = 0;
        std::uint64_t offset = NO_SLOT_OFFSET;
        recordSlotLayout(slot, size, offset);
        EXPECT_EQ(places.ofDisk.count(RECORD_AREA_SIZE - offset), 1U) << "slot " << slot;
    }
}

TEST(GoldenCases, LayEveryTuningFieldByHand) {
    const RawPlaces places = rawPlaces();
    for (const std::int32_t block : {DPS_BLOCK_TELEPHONY, DPS_BLOCK_SPEECHREC}) {
        for (const DpsField& field : DPS_LAYOUT) {
            const std::size_t offset =
                static_cast<std::size_t>(block) * DPS_BLOCK_SIZE + field.offset;
            EXPECT_EQ(places.ofDisk.count(TUNING_AREA_START - offset), 1U)
                << field.key << " of block " << block;
        }
    }
}

} // namespace

} // namespace orvane::test
