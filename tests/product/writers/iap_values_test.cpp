// SPDX-License-Identifier: Apache-2.0
//
// The values in the three iAP files.
#include "tests/product/image_offsets.h"
#include "tests/product/writers/iap_unit.h"
#include "tests/support/file_event_log.h"
#include "tests/support/folder_names.h"
#include "tests/support/model_list.h"
#include "writers/iap_writer.h"

#include <filesystem>
#include <set>
#include <string>
#include <utility>
#include <vector>

namespace orvane::test {

namespace {

using namespace std::string_literals;

class IapValuesTest : public IapUnitTest {
protected:
    /// Expects these values in the files of a run; `firmware` is the full version.
    static void expectValues(const IapValues& values, const std::string& compactFirmware) {
        EXPECT_EQ(updateIapConfigFiles(), 0);
        EXPECT_EQ(readFile(DEVICE_OUTPUT), iap2Head(values) + "device=1\n" + DEVICE_TAIL);
        EXPECT_EQ(readFile(IAP2_OUTPUT), iap2Head(values) + "iap2=1\n");
        EXPECT_EQ(readFile(IAP1_OUTPUT),
                  iap1Head({values.model, values.serial, compactFirmware}) + "iap1=1\n");
    }

    static void expectVersion(const std::string& inFile, const std::string& full,
                              const std::string& compact) {
        SCOPED_TRACE(inFile);
        setVersion(inFile);
        expectValues({"VOXA", "SN004217", full}, compact);
    }

    static void expectSerial(const std::string& serial) {
        SCOPED_TRACE(serial);
        expectValues({"VOXA", serial, "3.10.2"}, "030a02");
    }
};

} // namespace

// Rules: IAP-08
TEST_F(IapValuesTest, ModelIsTheNameOfItsCode) {
    for (const int code : {1, 25, 32, 47}) {
        setImage(MODEL_OFFSET, std::string(1, static_cast<char>(code)));
        expectValues({listedModel(code), "SN004217", "3.10.2"}, "030a02");
    }
}

TEST_F(IapValuesTest, ModelWithoutAnImageIsTheFallbackName) {
    remove(IMAGE_PATH);
    expectValues({"VOXA", "SN004217", "3.10.2"}, "030a02");
}

// Rules: IAP-09, VEH-13
TEST_F(IapValuesTest, BrandChangesNothing) {
    setImage(BRAND_OFFSET, "\2");
    expectValues({"VOXA", "SN004217", "3.10.2"}, "030a02");
}

// Rules: IAP-04
TEST_F(IapValuesTest, FuelTypeIsWrittenNowhere) {
    for (const char fuelType : {'\0', '\1', '\2', '\3', '\4'}) {
        setImage(FUEL_TYPE_OFFSET, std::string(1, fuelType));
        expectValues({"VOXA", "SN004217", "3.10.2"}, "030a02");
    }
}

// Rules: IMG-10, IAP-01, IAP-03, IAP-04, IAP-16
TEST_F(IapValuesTest, SourcesAndFilesAreOpenedInAFixedOrder) {
    for (const char* output : {DEVICE_OUTPUT, IAP2_OUTPUT, IAP1_OUTPUT}) {
        writeFile(output, "older");
    }
    FileEventLog opens(IN_OPEN,
                       {DISK_PATH, IMAGE_PATH, VERSION_FILE, DEVICE_OUTPUT, DEVICE_TEMPLATE,
                        IAP2_OUTPUT, IAP2_TEMPLATE, IAP1_OUTPUT, IAP1_TEMPLATE});
    updateIapConfigFiles();
    EXPECT_EQ(opens.take(),
              (std::vector<std::string>{DISK_PATH,    // the serial
                                        IMAGE_PATH,   // the model
                                        VERSION_FILE, // the version in full
                                        IMAGE_PATH,   // the fuel type, which nothing uses
                                        DEVICE_OUTPUT, DEVICE_TEMPLATE, IAP2_OUTPUT, IAP2_TEMPLATE,
                                        VERSION_FILE, // the version in six digits
                                        IAP1_OUTPUT, IAP1_TEMPLATE}));
}

// Rules: SER-02, SER-03, IAP-14
TEST_F(IapValuesTest, SerialFillsItsSlotOrEndsAtItsFirstNul) {
    for (const auto& [inSlot, serial] : std::vector<std::pair<std::string, std::string>>{
             {"ABCDEFGH", "ABCDEFGH"},
             {"AB\0\0\0\0\0\0"s, "AB"},
             {"AB\0DEFGH"s, "AB"},
             {"\0BCDEFGH"s, ""},
             {"\0\0\0\0\0\0\0\0"s, ""},
             {" \xff\n=\t\"\r#"s, " \xff\n=\t\"\r#"}}) {
        setDiskFromEnd(SERIAL_FROM_END, inSlot);
        expectSerial(serial);
    }
}

// Rules: SER-05, IAP-10
TEST_F(IapValuesTest, SerialWithoutADiskIsTheDefault) {
    remove(DISK_PATH);
    expectSerial("ABCD1234abc");
}

TEST_F(IapValuesTest, SerialOnADiskWithoutRoomForTheRecordsIsTheDefault) {
    resetDisk(1000);
    expectSerial("ABCD1234abc");
}

// Rules: IAP-11 to IAP-13
TEST_F(IapValuesTest, VersionIsWrittenInFullAndInSixDigits) {
    expectVersion("3.10.2", "3.10.2", "030a02");
    expectVersion("ABC_3.10.2_rc", "3.10.2_rc", "030a02");
    expectVersion("V_2.0.1", "2.0.1", "020001");
    expectVersion("1.2", "1.2", "010202");
    expectVersion("7", "7", "070707");
    expectVersion("256.15.x", "256.15.x", "000f00");
    expectVersion("1.2.3\r", "1.2.3\r", "010203");
}

// Rules: VER-33
TEST_F(IapValuesTest, VersionFormOfMoreThanSixDigitsIsWrittenWhole) {
    expectVersion("-1.2.3", "-1.2.3", "ffffffff0203");
}

// Rules: VER-24, IAP-12, IAP-13
TEST_F(IapValuesTest, VersionNotAvailableIsWrittenOnlyInFull) {
    expectVersion("N/A", "N/A", "000000");
}

// Rules: VER-21, VER-23, IAP-14
TEST_F(IapValuesTest, EmptyVersionLeavesTheLineWithoutAValue) {
    expectVersion("", "", "000000");
    remove(VERSION_FILE);
    expectValues({"VOXA", "SN004217", ""}, "000000");
    remove("/fs/rwdata/.Version");
    expectValues({"VOXA", "SN004217", ""}, "000000");
}

// Rules: IAP-15
TEST_F(IapValuesTest, VersionEndsAtItsFirstNulButCountsWholeForTheSixDigits) {
    expectVersion("1.2\0.3"s, "1.2", "010203");
    expectVersion("\0001.2.3"s, "", "000203");
    expectVersion("N/A\0"s, "N/A", "000000");
    expectVersion("A\0B_4.5.6"s, "4.5.6", "040506");
}

TEST_F(IapValuesTest, AllSourcesMissingGivesAllDefaults) {
    remove(IMAGE_PATH);
    remove(DISK_PATH);
    remove("/fs/rwdata");
    expectValues({"VOXA", "ABCD1234abc", ""}, "000000");
}

// Rules: RUN-14
TEST_F(IapValuesTest, SecondRunGathersEverythingAgain) {
    updateIapConfigFiles();
    setImage(MODEL_OFFSET, "\x1e");
    setDiskFromEnd(SERIAL_FROM_END, "OTHER\0\0\0"s);
    setVersion("4.5.6");
    expectValues({listedModel(30), "OTHER", "4.5.6"}, "040506");
}

// Rules: IAP-03
TEST_F(IapValuesTest, ModelIsGatheredBeforeTheFirstFileIsOpened) {
    setImage(MODEL_OFFSET, "\x1e");
    std::filesystem::create_symlink(IMAGE_PATH, DEVICE_OUTPUT);
    expectValues({listedModel(30), "SN004217", "3.10.2"}, "030a02");
}

// Rules: IAP-03
TEST_F(IapValuesTest, SerialIsGatheredBeforeTheFirstFileIsOpened) {
    std::filesystem::create_symlink(DISK_PATH, DEVICE_OUTPUT);
    expectSerial("SN004217");
}

// Rules: IAP-03
TEST_F(IapValuesTest, VersionIsGatheredBeforeTheFirstFileAndAgainAfterTheSecond) {
    std::filesystem::create_symlink(VERSION_FILE, DEVICE_OUTPUT);
    expectValues({"VOXA", "SN004217", "3.10.2"}, "000000");
}

// Rules: IAP-16
TEST_F(IapValuesTest, SixDigitsAreFoundAfterTheSecondFileIsClosed) {
    std::filesystem::create_symlink(VERSION_FILE, IAP2_OUTPUT);
    const std::string newer = "Type=Application\nVersion Number=9.10.11\n";
    writeFile(IAP2_TEMPLATE, newer);
    EXPECT_EQ(updateIapConfigFiles(), 0);
    EXPECT_EQ(readFile(DEVICE_OUTPUT), plainDevice());
    EXPECT_EQ(readFile(IAP2_OUTPUT), iap2Head() + newer);
    EXPECT_EQ(readFile(IAP1_OUTPUT), iap1Head({"VOXA", "SN004217", "090a0b"}) + "iap1=1\n");
}

// Rules: IAP-16
TEST_F(IapValuesTest, SixDigitsAreFoundAfterTheSecondStockFileIsInstalled) {
    std::filesystem::create_symlink(VERSION_FILE, IAP2_OUTPUT);
    remove(IAP2_TEMPLATE);
    const std::string newer = "Type=Application\nVersion Number=9.10.11\n";
    writeFile(IAP2_STOCK, newer);
    updateIapConfigFiles();
    EXPECT_EQ(readFile(IAP2_OUTPUT), newer);
    EXPECT_EQ(readFile(IAP1_OUTPUT), iap1Head({"VOXA", "SN004217", "090a0b"}) + "iap1=1\n");
}

// Rules: IAP-16
TEST_F(IapValuesTest, SixDigitsAreFoundBeforeTheThirdFileIsOpened) {
    std::filesystem::create_symlink(VERSION_FILE, IAP1_OUTPUT);
    expectValues({"VOXA", "SN004217", "3.10.2"}, "030a02");
}

// Rules: RUN-04
TEST_F(IapValuesTest, WritesTheThreeFilesAlone) {
    const std::set<std::string> deviceData = folderNames("/fs/mp/etc");
    const std::set<std::string> transportData = folderNames("/fs/mp/etc/mm");
    updateIapConfigFiles();
    EXPECT_EQ(folderNames("/tmp"),
              (std::set<std::string>{"iap1.cfg", "iap2.cfg", "iap2_device.cfg"}));
    EXPECT_EQ(folderNames("/fs/mp/etc"), deviceData);
    EXPECT_EQ(folderNames("/fs/mp/etc/mm"), transportData);
}

} // namespace orvane::test
