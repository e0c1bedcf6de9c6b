// SPDX-License-Identifier: Apache-2.0
//
// The built-in sample unit: it shows every input of the tool at work.
#include "config/config_store.h"
#include "config/param_access.h"
#include "config/record_area.h"
#include "kit/description/parse_description.h"
#include "kit/description/sample.h"
#include "kit/enter/entered_root.h"
#include "kit/enter/run_inside.h"
#include "kit/unit/make_unit.h"
#include "tests/support/folder_names.h"
#include "tests/support/temporary_folder.h"
#include "tests/support/unit_test.h"
#include "tuning/dps_block.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <filesystem>
#include <set>
#include <string>

namespace orvane::test {

namespace {

namespace fs = std::filesystem;

class SampleUnitTest : public ::testing::Test {
protected:
    SampleUnitTest() {
        kit::makeUnit(kit::parseDescription(kit::sampleDescriptionText(), "sample"), root());
    }

    fs::path root() const { return folder_.path() / "unit"; }

    static DpsArea tuningArea() {
        DpsArea area{};
        EXPECT_EQ(readTuningArea(area.data(), DPS_AREA_SIZE), 0);
        return area;
    }

private:
    TemporaryFolder folder_;
};

bool isZero(const DpsBlock& block) {
    return block.bytes == DpsBlock{}.bytes;
}

TEST_F(SampleUnitTest, IsTheSampleFile) {
    EXPECT_EQ(kit::sampleDescriptionText(),
              readFile(ORVANE_DOCS_DIR "/../kit/description/sample_unit.toml"));
}

TEST_F(SampleUnitTest, IsOfTheSecondBrandWithAGeneratedAudioProfile) {
    const kit::EnteredRoot entered(root());
    ConfigStore store;
    ASSERT_EQ(store.open(), 0);
    EXPECT_EQ(store.length, 179U);
    std::uint8_t brand = 0;
    std::uint16_t profile = 0;
    EXPECT_EQ(getParamU8(store, 36, &brand), PARAM_OK);
    EXPECT_EQ(getParamU16(store, 134, &profile), PARAM_OK);
    EXPECT_EQ(brand, 2);
    EXPECT_EQ(profile, 0xFFFF);
}

TEST_F(SampleUnitTest, HasASerialOfLettersAndDigits) {
    const kit::EnteredRoot entered(root());
    std::string serial(8, '\0');
    ASSERT_EQ(readRecordSlot(9, serial.data(), 8), 0);
    EXPECT_TRUE(std::all_of(serial.begin(), serial.end(), [](char c) {
        return (c >= 'A' && c <= 'Z') || (c >= '0' && c <= '9');
    })) << serial;
}

TEST_F(SampleUnitTest, HasTwoDifferentTuningBlocksAndNoOthers) {
    const kit::EnteredRoot entered(root());
    const DpsArea area = tuningArea();
    for (std::size_t block = 0; block < area.size(); ++block) {
        EXPECT_EQ(isZero(area.at(block)), block != 2 && block != 3) << block;
    }
    EXPECT_NE(area[2].bytes, area[3].bytes);
}

TEST_F(SampleUnitTest, EverySwitchAndModeOfItsTuningHasAWord) {
    const kit::EnteredRoot entered(root());
    const DpsArea area = tuningArea();
    for (const DpsField& field : DPS_LAYOUT) {
        if (field.kind == DpsKind::switchWord || field.kind == DpsKind::modeWord) {
            for (const std::size_t block : {2U, 3U}) {
                const std::int32_t code = decodeField(area.at(block), field, 0);
                EXPECT_TRUE(code >= 1 && code <= 3) << field.key << " of block " << block;
            }
        }
    }
}

TEST_F(SampleUnitTest, HasThreeVersionFilesOneForTheApplication) {
    int applications = 0;
    const std::set<std::string> names = folderNames(root() / "fs/rwdata/.Version");
    EXPECT_EQ(names.size(), 3U);
    for (const std::string& name : names) {
        EXPECT_NE(name.find(".inf"), std::string::npos) << name;
        const std::string text = readFile(root() / "fs/rwdata/.Version" / name);
        EXPECT_NE(text.find("\nVersion Number = "), std::string::npos) << name;
        applications += text.find("\nType = Application\n") == std::string::npos ? 0 : 1;
    }
    EXPECT_EQ(applications, 1);
}

TEST_F(SampleUnitTest, HasTemplatesAndStockFilesOfSomeDozenLines) {
    for (const char* name :
         {"airplay_static.conf", "airplay.conf", "iap2_device_static.cfg", "iap2_device.cfg",
          "mm/iap2_static.cfg", "mm/iap2.cfg", "mm/iap1_static.cfg", "mm/iap1.cfg"}) {
        const std::string text = readFile(root() / "fs/mp/etc" / name);
        const auto lines = std::count(text.begin(), text.end(), '\n');
        EXPECT_TRUE(lines >= 10 && lines <= 40) << name << ": " << lines;
    }
}

TEST_F(SampleUnitTest, ItsSixFilesHoldItsOwnValues) {
    const kit::RunResult result = kit::runInside(root(), {ORVANE_BINARY, {"-a", "-i"}});
    EXPECT_EQ(result.exitStatus, 0);
    EXPECT_EQ(result.standardOutput + result.standardError, "");
    EXPECT_EQ(folderNames(root() / "tmp"),
              (std::set<std::string>{"airplay.conf", "iap1.cfg", "iap2.cfg", "iap2_device.cfg",
                                     "speechrec_FFFF.txt", "telephony_FFFF.txt"}));
    const auto has = [this](const char* name, const std::string& line) {
        return readFile(root() / "tmp" / name).find(line + "\n") != std::string::npos;
    };
    EXPECT_TRUE(has("airplay.conf", "model = Quarion Velmira"));
    EXPECT_TRUE(has("airplay.conf", "audioProfile = 65535"));
    EXPECT_TRUE(has("airplay.conf", "rightHandDrive = 1"));
    EXPECT_TRUE(has("airplay.conf", "displayWidth = 1280"));
    for (const char* name : {"iap1.cfg", "iap2.cfg", "iap2_device.cfg"}) {
        EXPECT_TRUE(has(name, "model=Quarion Velmira")) << name;
        EXPECT_TRUE(has(name, "serial=SN004217")) << name;
    }
    EXPECT_TRUE(has("iap1.cfg", "firmware_version=030a02"));
    EXPECT_TRUE(has("iap2.cfg", "firmware_version=3.10.2_rc"));
    EXPECT_TRUE(has("iap1.cfg", "kind=serial"));
    EXPECT_TRUE(has("iap2.cfg", "role=host"));
    EXPECT_TRUE(has("iap2_device.cfg", "role=device"));
}

} // namespace

} // namespace orvane::test
