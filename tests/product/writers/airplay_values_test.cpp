// SPDX-License-Identifier: Apache-2.0
//
// The values in the head of the generated AirPlay file.
#include "tests/product/writers/airplay_unit.h"
#include "tests/support/file_event_log.h"
#include "tests/support/model_list.h"
#include "writers/airplay_writer.h"

#include <filesystem>
#include <string>
#include <utility>
#include <vector>

namespace orvane::test {

namespace {

using AirplayValuesTest = AirplayUnitTest;

/// The head that a run in this unit generates.
std::string generatedHead() {
    writeFile(AIRPLAY_TEMPLATE, "@");
    EXPECT_EQ(updateAirplayConfigFile(), 0);
    std::string content = readFile(AIRPLAY_OUTPUT);
    EXPECT_EQ(content.substr(content.size() - 1), "@");
    content.pop_back();
    return content;
}

} // namespace

// Rules: AIR-18, PRO-02
TEST_F(AirplayValuesTest, WithoutAnImageLeavesTheAudioProfileOut) {
    remove(IMAGE_PATH);
    EXPECT_EQ(updateAirplayConfigFile(), 0);
    EXPECT_EQ(readFile(AIRPLAY_OUTPUT),
              "# Default name of the accessory if a name is not specified in the user prefs.\n"
              "name = CarPlay\n"
              "\n"
              "# Model of the accessory.\n"
              "model = VOXA\n"
              "\n"
              "# Manufacturer of the accessory.\n"
              "manufacturer = Marl Motor Company\n"
              "\n"
              "# OEM Icon Label\n"
              "oemIconLabel = VOXA\n"
              "\n"
              "# OEM Icon Visibility Setting\n"
              "oemIconVisible = 1\n"
              "\n"
              "# 104x104 OEM Icon png path\n"
              "oemIconPath = /fs/mp/etc/MARL/oemIcon.png\n"
              "\n"
              "# rightHandDrive mode setting right\n"
              "rightHandDrive = 0\n"
              "\n"
              "static = 1\n");
}

// Rules: IMG-03
TEST_F(AirplayValuesTest, EmptyImageCountsAsMissing) {
    writeImage("");
    EXPECT_EQ(generatedHead(), airplayHeadWithoutImage());
}

// Rules: AIR-17, PRO-03
TEST_F(AirplayValuesTest, WritesEveryProfileAsAPlainNumber) {
    const std::vector<std::pair<std::string, std::string>> rows{
        {bytes({0, 0}), "0"},           {bytes({1, 0}), "1"},           {bytes({0, 1}), "256"},
        {bytes({0x34, 0x12}), "4660"},  {bytes({0xFF, 0x7F}), "32767"}, {bytes({0, 0x80}), "32768"},
        {bytes({0xFE, 0xFF}), "65534"}, {bytes({0xFF, 0xFF}), "65535"}};
    for (const auto& [inImage, number] : rows) {
        setImage(PROFILE_OFFSET, inImage);
        AirplayValues values;
        values.profile = profileLines(number);
        EXPECT_EQ(generatedHead(), airplayHead(values));
    }
}

// Rules: AIR-20
TEST_F(AirplayValuesTest, WritesTheDriveSideAsItIs) {
    const std::vector<std::pair<int, std::string>> rows{
        {0, "0"}, {1, "1"}, {2, "2"}, {10, "10"}, {127, "127"}, {128, "128"}, {255, "255"}};
    for (const auto& [value, number] : rows) {
        setImage(DRIVE_SIDE_OFFSET, bytes({value}));
        AirplayValues values;
        values.driveSide = number;
        EXPECT_EQ(generatedHead(), airplayHead(values));
    }
}

// Rules: AIR-15, AIR-22
TEST_F(AirplayValuesTest, BrandChangesTheIconPathOnly) {
    setImage(BRAND_OFFSET, bytes({2}));
    AirplayValues values;
    values.brand = "QUARION";
    EXPECT_EQ(generatedHead(), airplayHead(values));
    for (const int other : {0, 1, 3, 255}) {
        SCOPED_TRACE(other);
        setImage(BRAND_OFFSET, bytes({other}));
        EXPECT_EQ(generatedHead(), plainAirplayHead());
    }
}

// Rules: AIR-07, AIR-22
TEST_F(AirplayValuesTest, WritesTheNameOfTheModel) {
    for (const int code : {1, 25, 32, 47}) {
        setImage(MODEL_OFFSET, bytes({code}));
        AirplayValues values;
        values.model = listedModel(code);
        EXPECT_EQ(generatedHead(), airplayHead(values));
    }
}

TEST_F(AirplayValuesTest, ModelOutsideTheTableGetsTheWordOfTheIconLabel) {
    for (const int code : {0, 48, 255}) {
        SCOPED_TRACE(code);
        setImage(MODEL_OFFSET, bytes({code}));
        EXPECT_EQ(generatedHead(), plainAirplayHead());
    }
}

// Rules: AIR-07, AIR-15, AIR-17, AIR-20
TEST_F(AirplayValuesTest, EveryValueIsInItsOwnPlace) {
    setImage(DRIVE_SIDE_OFFSET, bytes({7}));
    setImage(BRAND_OFFSET, bytes({2}));
    setImage(FUEL_TYPE_OFFSET, bytes({1}));
    setImage(PROFILE_OFFSET, bytes({5, 0}));
    setImage(MODEL_OFFSET, bytes({26}));
    EXPECT_EQ(generatedHead(), airplayHead({listedModel(26), "QUARION", profileLines("5"), "7"}));
}

// Rules: RUN-14
TEST_F(AirplayValuesTest, SecondRunGathersEverythingAgain) {
    updateAirplayConfigFile();
    setImage(DRIVE_SIDE_OFFSET, bytes({1}));
    setImage(BRAND_OFFSET, bytes({2}));
    setImage(PROFILE_OFFSET, bytes({9, 0}));
    setImage(MODEL_OFFSET, bytes({30}));
    writeFile(AIRPLAY_TEMPLATE, "s\n");
    EXPECT_EQ(updateAirplayConfigFile(), 0);
    EXPECT_EQ(readFile(AIRPLAY_OUTPUT),
              airplayHead({listedModel(30), "QUARION", profileLines("9"), "1"}) + "s\n");
}

// Rules: AIR-03
TEST_F(AirplayValuesTest, GathersItsValuesBeforeItOpensTheOutput) {
    setImage(DRIVE_SIDE_OFFSET, bytes({1}));
    setImage(BRAND_OFFSET, bytes({2}));
    setImage(PROFILE_OFFSET, bytes({9, 0}));
    setImage(MODEL_OFFSET, bytes({30}));
    std::filesystem::create_symlink(IMAGE_PATH, AIRPLAY_OUTPUT);
    EXPECT_EQ(updateAirplayConfigFile(), 0);
    EXPECT_EQ(readFile(AIRPLAY_OUTPUT),
              airplayHead({listedModel(30), "QUARION", profileLines("9"), "1"}) + "static = 1\n");
}

// Rules: IMG-10, PRO-06
TEST_F(AirplayValuesTest, EachValueHasItsOwnLookupBeforeTheFilesAreOpened) {
    writeFile(AIRPLAY_OUTPUT, "older");
    writeFile("/tmp/telephony_FFFF.txt", "older");
    writeFile("/tmp/speechrec_FFFF.txt", "older");
    FileEventLog opens(IN_OPEN, {IMAGE_PATH, DISK_PATH, AIRPLAY_OUTPUT, AIRPLAY_TEMPLATE,
                                 "/tmp/telephony_FFFF.txt", "/tmp/speechrec_FFFF.txt"});
    updateAirplayConfigFile();
    EXPECT_EQ(opens.take(),
              (std::vector<std::string>{IMAGE_PATH, IMAGE_PATH, IMAGE_PATH, IMAGE_PATH,
                                        AIRPLAY_OUTPUT, AIRPLAY_TEMPLATE}));
    setImage(PROFILE_OFFSET, bytes({0xFF, 0xFF}));
    opens.take();
    updateAirplayConfigFile();
    EXPECT_EQ(opens.take(), (std::vector<std::string>{
                                IMAGE_PATH, IMAGE_PATH, IMAGE_PATH, IMAGE_PATH, DISK_PATH,
                                "/tmp/telephony_FFFF.txt", DISK_PATH, "/tmp/speechrec_FFFF.txt",
                                AIRPLAY_OUTPUT, AIRPLAY_TEMPLATE}));
}

TEST_F(AirplayValuesTest, GeneratedProfileWritesTheTuningFilesToo) {
    setImage(PROFILE_OFFSET, bytes({0xFF, 0xFF}));
    EXPECT_EQ(updateAirplayConfigFile(), 0);
    AirplayValues values;
    values.profile = profileLines("65535");
    EXPECT_EQ(readFile(AIRPLAY_OUTPUT), airplayHead(values) + "static = 1\n");
    EXPECT_EQ(readFile("/tmp/telephony_FFFF.txt").substr(0, 41),
              "; Genereated config from DPS (blockId 3)\n");
    EXPECT_EQ(readFile("/tmp/speechrec_FFFF.txt").substr(0, 41),
              "; Genereated config from DPS (blockId 2)\n");
}

// Rules: PRO-06
TEST_F(AirplayValuesTest, TuningFilesAreCompleteBeforeTheOutputIsOpened) {
    setImage(PROFILE_OFFSET, bytes({0xFF, 0xFF}));
    for (const char* tuningFile : {"/tmp/telephony_FFFF.txt", "/tmp/speechrec_FFFF.txt"}) {
        remove(AIRPLAY_OUTPUT);
        std::filesystem::create_symlink(tuningFile, AIRPLAY_OUTPUT);
        updateAirplayConfigFile();
        AirplayValues values;
        values.profile = profileLines("65535");
        EXPECT_EQ(readFile(tuningFile), airplayHead(values) + "static = 1\n");
    }
}

// Rules: PRO-08
TEST_F(AirplayValuesTest, GeneratedProfileIsWrittenEvenWithoutItsTuningFiles) {
    setImage(PROFILE_OFFSET, bytes({0xFF, 0xFF}));
    putFolder("/tmp/telephony_FFFF.txt");
    putFolder("/tmp/speechrec_FFFF.txt");
    AirplayValues values;
    values.profile = profileLines("65535");
    EXPECT_EQ(generatedHead(), airplayHead(values));
}

} // namespace orvane::test
