// SPDX-License-Identifier: Apache-2.0
//
// The iAP2 device file, first of the three.
#include "tests/product/writers/iap_unit.h"
#include "tests/support/input_lengths.h"
#include "tests/support/permissions.h"
#include "tests/support/resource_limit.h"
#include "writers/iap_writer.h"

#include <sys/stat.h>

#include <filesystem>
#include <string>

namespace orvane::test {

namespace {

class IapDeviceTest : public IapUnitTest {
protected:
    /// The other two files are generated, whatever happens to the device file.
    static void expectTransportFilesGenerated() {
        EXPECT_EQ(readFile(IAP2_OUTPUT), plainIap2());
        EXPECT_EQ(readFile(IAP1_OUTPUT), plainIap1());
    }
};

} // namespace

// Rules: IAP-05 to IAP-12, DEV-01, DEV-03 to DEV-05
TEST_F(IapDeviceTest, HoldsTheBlockTheTemplateAndTheVehicleSection) {
    writeFile(DEVICE_TEMPLATE, "[features]\nusb=yes\n");
    EXPECT_EQ(updateIapConfigFiles(), 0);
    EXPECT_EQ(readFile(DEVICE_OUTPUT),
              "# This section is mandatory.  Populate all fields with accessory-specific info.\n"
              "[accessory]\n"
              "name=VOXA 3\n"
              "model=VOXA\n"
              "manufacturer=Marl Motor Company\n"
              "serial=SN004217\n"
              "firmware_version=3.10.2\n"
              "hardware_version=1.0.0\n"
              "\n"
              "[features]\n"
              "usb=yes\n"
              "\n"
              "[vehicle]\n"
              "enable=no\n"
              "\n");
    expectTransportFilesGenerated();
}

// Rules: DEV-04
TEST_F(IapDeviceTest, TemplateWithoutAFinalLineEndIsEndedByTheNextPart) {
    writeFile(DEVICE_TEMPLATE, "[features]\nusb=yes");
    updateIapConfigFiles();
    EXPECT_EQ(readFile(DEVICE_OUTPUT), iap2Head() + "[features]\n"
                                                    "usb=yes\n"
                                                    "[vehicle]\n"
                                                    "enable=no\n"
                                                    "\n");
}

// Rules: MRG-03
TEST_F(IapDeviceTest, TemplateIsNotParsed) {
    const std::string content("[vehicle]\r\nserial=B\n\n\0\xff\n", 24);
    writeFile(DEVICE_TEMPLATE, content);
    updateIapConfigFiles();
    EXPECT_EQ(readFile(DEVICE_OUTPUT), iap2Head() + content + DEVICE_TAIL);
}

TEST_F(IapDeviceTest, TemplateLongerThanAnyBufferIsCopiedWhole) {
    const std::string content = markedText(LONGER_THAN_ANY_BUFFER);
    writeFile(DEVICE_TEMPLATE, content);
    updateIapConfigFiles();
    EXPECT_TRUE(readFile(DEVICE_OUTPUT) == iap2Head() + content + DEVICE_TAIL);
}

// Rules: MRG-05, DEV-06
TEST_F(IapDeviceTest, EmptyTemplateDropsTheVehicleSection) {
    writeFile(DEVICE_TEMPLATE, "");
    EXPECT_EQ(updateIapConfigFiles(), 0);
    EXPECT_EQ(readFile(DEVICE_OUTPUT),
              "# This section is mandatory.  Populate all fields with accessory-specific info.\n"
              "[accessory]\n"
              "name=VOXA 3\n"
              "model=VOXA\n"
              "manufacturer=Marl Motor Company\n"
              "serial=SN004217\n"
              "firmware_version=3.10.2\n"
              "hardware_version=1.0.0\n"
              "\n");
    expectTransportFilesGenerated();
}

// Rules: MRG-06
TEST_F(IapDeviceTest, FolderAsATemplateDropsTheVehicleSection) {
    putFolder(DEVICE_TEMPLATE);
    EXPECT_EQ(updateIapConfigFiles(), 0);
    EXPECT_EQ(readFile(DEVICE_OUTPUT), iap2Head());
    expectTransportFilesGenerated();
}

// Rules: MRG-08, DEV-02, ONE-11
TEST_F(IapDeviceTest, MissingTemplateInstallsTheStockFile) {
    remove(DEVICE_TEMPLATE);
    const std::string stock("stock\r\n\0\xff no line end", 21);
    writeFile(DEVICE_STOCK, stock);
    EXPECT_EQ(updateIapConfigFiles(), 0);
    EXPECT_EQ(readFile(DEVICE_OUTPUT), stock);
    EXPECT_EQ(readFile(DEVICE_STOCK), stock);
    expectTransportFilesGenerated();
}

TEST_F(IapDeviceTest, TemplateWithoutReadPermissionInstallsTheStockFile) {
    ASSERT_EQ(chmod(DEVICE_TEMPLATE, 0), 0);
    {
        const EnforcedPermissions permissions;
        updateIapConfigFiles();
    }
    EXPECT_EQ(readFile(DEVICE_OUTPUT), "device stock\n");
    expectTransportFilesGenerated();
}

TEST_F(IapDeviceTest, StockFileLongerThanAnyBufferIsCopiedWhole) {
    remove(DEVICE_TEMPLATE);
    const std::string stock = markedText(LONGER_THAN_ANY_BUFFER);
    writeFile(DEVICE_STOCK, stock);
    updateIapConfigFiles();
    EXPECT_TRUE(readFile(DEVICE_OUTPUT) == stock);
}

// Rules: RUN-09
TEST_F(IapDeviceTest, OlderLongerOutputIsReplacedWhole) {
    writeFile(DEVICE_OUTPUT, std::string(20000, 'o'));
    updateIapConfigFiles();
    EXPECT_EQ(readFile(DEVICE_OUTPUT), plainDevice());
}

// Rules: RUN-09
TEST_F(IapDeviceTest, OlderLongerOutputIsReplacedWholeByTheStockFile) {
    remove(DEVICE_TEMPLATE);
    writeFile(DEVICE_OUTPUT, std::string(20000, 'o'));
    updateIapConfigFiles();
    EXPECT_EQ(readFile(DEVICE_OUTPUT), "device stock\n");
}

TEST_F(IapDeviceTest, MissingTemplateAndStockFileLeaveAnEmptyOutput) {
    remove(DEVICE_TEMPLATE);
    remove(DEVICE_STOCK);
    EXPECT_EQ(updateIapConfigFiles(), 0);
    EXPECT_EQ(readFile(DEVICE_OUTPUT), "");
    expectTransportFilesGenerated();
}

// Rules: MRG-09
TEST_F(IapDeviceTest, MissingTemplateAndStockFileEmptyAnOlderOutput) {
    remove(DEVICE_TEMPLATE);
    remove(DEVICE_STOCK);
    writeFile(DEVICE_OUTPUT, "older");
    updateIapConfigFiles();
    EXPECT_EQ(readFile(DEVICE_OUTPUT), "");
}

TEST_F(IapDeviceTest, FolderAsAStockFileLeavesAnEmptyOutput) {
    remove(DEVICE_TEMPLATE);
    putFolder(DEVICE_STOCK);
    updateIapConfigFiles();
    EXPECT_EQ(readFile(DEVICE_OUTPUT), "");
    expectTransportFilesGenerated();
}

// Rules: RUN-11
TEST_F(IapDeviceTest, OutputThatIsAFolderStaysEmpty) {
    putFolder(DEVICE_OUTPUT);
    EXPECT_EQ(updateIapConfigFiles(), 0);
    EXPECT_TRUE(std::filesystem::is_empty(DEVICE_OUTPUT));
    expectTransportFilesGenerated();
    remove(DEVICE_TEMPLATE);
    updateIapConfigFiles();
    EXPECT_TRUE(std::filesystem::is_empty(DEVICE_OUTPUT));
    expectTransportFilesGenerated();
}

// Rules: RUN-10
TEST_F(IapDeviceTest, OutputThroughASymlinkReachesItsTarget) {
    std::filesystem::create_symlink("/fs/rwdata/device", DEVICE_OUTPUT);
    updateIapConfigFiles();
    EXPECT_EQ(readFile("/fs/rwdata/device"), plainDevice());
    remove(DEVICE_TEMPLATE);
    updateIapConfigFiles();
    EXPECT_EQ(readFile("/fs/rwdata/device"), "device stock\n");
    EXPECT_TRUE(std::filesystem::is_symlink(DEVICE_OUTPUT));
}

// Rules: RUN-13
TEST_F(IapDeviceTest, ReadOnlyOlderOutputStaysAsItIs) {
    writeFile(DEVICE_OUTPUT, "older");
    ASSERT_EQ(chmod(DEVICE_OUTPUT, 0444), 0);
    {
        const EnforcedPermissions permissions;
        updateIapConfigFiles();
    }
    EXPECT_EQ(readFile(DEVICE_OUTPUT), "older");
    expectTransportFilesGenerated();
}

// Rules: RUN-07
TEST_F(IapDeviceTest, NewOutputHasMode666LessTheMask) {
    const mode_t former = umask(022);
    updateIapConfigFiles();
    umask(former);
    struct stat status {};
    ASSERT_EQ(stat(DEVICE_OUTPUT, &status), 0);
    EXPECT_EQ(status.st_mode & 07777U, 0644U);
}

// Rules: MRG-11, IAP-02, ONE-11
TEST_F(IapDeviceTest, PartlyWrittenOutputDoesNotStopLaterFiles) {
    writeFile(DEVICE_TEMPLATE, std::string(2000, 'd'));
    int result = -1;
    {
        const ResourceLimit limit(RLIMIT_FSIZE, 1000);
        result = updateIapConfigFiles();
    }
    EXPECT_EQ(result, 0);
    EXPECT_EQ(readFile(DEVICE_OUTPUT), (iap2Head() + std::string(2000, 'd')).substr(0, 1000));
    expectTransportFilesGenerated();
}

TEST_F(IapDeviceTest, OutputStaysOpenAfterItsFallback) {
    remove(DEVICE_TEMPLATE);
    {
        const rlim_t roomForThree = roomForDescriptors(3);
        const ResourceLimit limit(RLIMIT_NOFILE, roomForThree);
        updateIapConfigFiles();
    }
    EXPECT_EQ(readFile(DEVICE_OUTPUT), "device stock\n");
    expectTransportFilesGenerated();
    remove(IAP1_OUTPUT);
    {
        const rlim_t roomForTwo = roomForDescriptors(2);
        const ResourceLimit limit(RLIMIT_NOFILE, roomForTwo);
        updateIapConfigFiles();
    }
    // The device output takes one, the second output the other; nothing else can be opened.
    EXPECT_EQ(readFile(DEVICE_OUTPUT), "");
    EXPECT_EQ(readFile(IAP2_OUTPUT), "");
    EXPECT_FALSE(exists(IAP1_OUTPUT));
}

TEST_F(IapDeviceTest, ClosesWhatItOpened) {
    const int before = openDescriptors();
    updateIapConfigFiles();
    EXPECT_EQ(openDescriptors(), before);
    remove(DEVICE_TEMPLATE);
    updateIapConfigFiles();
    EXPECT_EQ(openDescriptors(), before);
    putFolder(DEVICE_OUTPUT);
    updateIapConfigFiles();
    EXPECT_EQ(openDescriptors(), before);
}

} // namespace orvane::test
