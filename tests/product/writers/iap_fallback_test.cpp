// SPDX-License-Identifier: Apache-2.0
//
// When stock files replace the transport files. The third file depends on the state of the second
// one's output, not on its own template.
#include "tests/product/writers/iap_unit.h"
#include "tests/support/file_event_log.h"
#include "tests/support/input_lengths.h"
#include "tests/support/permissions.h"
#include "tests/support/resource_limit.h"
#include "writers/iap_writer.h"

#include <sys/stat.h>

#include <filesystem>
#include <string>
#include <vector>

namespace orvane::test {

namespace {

using IapFallbackTest = IapUnitTest;

/// Runs the writer with room for `count` more descriptors.
int updateIapWithDescriptors(int count) {
    const rlim_t room = roomForDescriptors(count);
    const ResourceLimit limit(RLIMIT_NOFILE, room);
    return updateIapConfigFiles();
}

/// Runs the writer with a limit of `bytes` for every file.
int updateWithFileSize(rlim_t bytes) {
    const ResourceLimit limit(RLIMIT_FSIZE, bytes);
    return updateIapConfigFiles();
}

} // namespace

// Rules: MRG-08, TWO-02, ONE-10
TEST_F(IapFallbackTest, MissingIap2TemplateInstallsTheIap2StockFileAlone) {
    remove(IAP2_TEMPLATE);
    const std::string stock("stock\r\n\0\xff no line end", 21);
    writeFile(IAP2_STOCK, stock);
    EXPECT_EQ(updateIapConfigFiles(), 0);
    EXPECT_EQ(readFile(DEVICE_OUTPUT), plainDevice());
    EXPECT_EQ(readFile(IAP2_OUTPUT), stock);
    EXPECT_EQ(readFile(IAP2_STOCK), stock);
    EXPECT_EQ(readFile(IAP1_OUTPUT), plainIap1());
}

TEST_F(IapFallbackTest, Iap2TemplateWithoutReadPermissionInstallsTheIap2StockFileAlone) {
    ASSERT_EQ(chmod(IAP2_TEMPLATE, 0), 0);
    {
        const EnforcedPermissions permissions;
        updateIapConfigFiles();
    }
    EXPECT_EQ(readFile(IAP2_OUTPUT), "iap2 stock\n");
    EXPECT_EQ(readFile(IAP1_OUTPUT), plainIap1());
}

TEST_F(IapFallbackTest, StockFilesLongerThanAnyBufferAreCopiedWhole) {
    const std::string stock = markedText(LONGER_THAN_ANY_BUFFER);
    writeFile(IAP2_STOCK, stock);
    writeFile(IAP1_STOCK, stock);
    remove(IAP2_TEMPLATE);
    updateIapConfigFiles();
    EXPECT_TRUE(readFile(IAP2_OUTPUT) == stock);
    writeFile(IAP2_TEMPLATE, "");
    updateIapConfigFiles();
    EXPECT_TRUE(readFile(IAP1_OUTPUT) == stock);
}

// Rules: MRG-09, ONE-10
TEST_F(IapFallbackTest, MissingIap2StockFileLeavesIap2EmptyAndIap1Generated) {
    remove(IAP2_TEMPLATE);
    remove(IAP2_STOCK);
    writeFile(IAP2_OUTPUT, "older");
    EXPECT_EQ(updateIapConfigFiles(), 0);
    EXPECT_EQ(readFile(IAP2_OUTPUT), "");
    EXPECT_EQ(readFile(IAP1_OUTPUT), plainIap1());
}

TEST_F(IapFallbackTest, FolderAsTheIap2StockFileLeavesIap2EmptyAndIap1Generated) {
    remove(IAP2_TEMPLATE);
    putFolder(IAP2_STOCK);
    updateIapConfigFiles();
    EXPECT_EQ(readFile(IAP2_OUTPUT), "");
    EXPECT_EQ(readFile(IAP1_OUTPUT), plainIap1());
}

TEST_F(IapFallbackTest, MissingIap2AndIap1TemplatesLeaveIap1Generated) {
    remove(IAP2_TEMPLATE);
    remove(IAP1_TEMPLATE);
    updateIapConfigFiles();
    EXPECT_EQ(readFile(IAP2_OUTPUT), "iap2 stock\n");
    EXPECT_EQ(readFile(IAP1_OUTPUT), iap1Head());
}

// Rules: MRG-05, ONE-02, ONE-08
TEST_F(IapFallbackTest, EmptyIap2TemplateEndsIap2AndInstallsTheIap1StockFile) {
    writeFile(IAP2_TEMPLATE, "");
    EXPECT_EQ(updateIapConfigFiles(), 0);
    EXPECT_EQ(readFile(DEVICE_OUTPUT), plainDevice());
    EXPECT_EQ(readFile(IAP2_OUTPUT),
              "# This section is mandatory.  Populate all fields with accessory-specific info.\n"
              "[accessory]\n"
              "name=VOXA 3\n"
              "model=VOXA\n"
              "manufacturer=Marl Motor Company\n"
              "serial=SN004217\n"
              "firmware_version=3.10.2\n"
              "hardware_version=1.0.0\n"
              "\n");
    EXPECT_EQ(readFile(IAP1_OUTPUT), "iap1 stock\n");
}

// Rules: MRG-06, ONE-08
TEST_F(IapFallbackTest, FolderAsTheIap2TemplateEndsIap2AndInstallsTheIap1StockFile) {
    putFolder(IAP2_TEMPLATE);
    updateIapConfigFiles();
    EXPECT_EQ(readFile(IAP2_OUTPUT), iap2Head());
    EXPECT_EQ(readFile(IAP1_OUTPUT), "iap1 stock\n");
}

// Rules: RUN-11, ONE-07
TEST_F(IapFallbackTest, Iap2OutputThatIsAFolderInstallsTheIap1StockFile) {
    putFolder(IAP2_OUTPUT);
    EXPECT_EQ(updateIapConfigFiles(), 0);
    EXPECT_TRUE(std::filesystem::is_empty(IAP2_OUTPUT));
    EXPECT_EQ(readFile(DEVICE_OUTPUT), plainDevice());
    EXPECT_EQ(readFile(IAP1_OUTPUT), "iap1 stock\n");
}

TEST_F(IapFallbackTest, Iap2OutputThatIsAFolderInstallsTheIap1StockFileEvenWithoutATemplate) {
    remove(IAP2_TEMPLATE);
    putFolder(IAP2_OUTPUT);
    updateIapConfigFiles();
    EXPECT_TRUE(std::filesystem::is_empty(IAP2_OUTPUT));
    EXPECT_EQ(readFile(IAP1_OUTPUT), "iap1 stock\n");
}

// Rules: RUN-13, ONE-07
TEST_F(IapFallbackTest, ReadOnlyIap2OutputStaysAndInstallsTheIap1StockFile) {
    writeFile(IAP2_OUTPUT, "older");
    ASSERT_EQ(chmod(IAP2_OUTPUT, 0444), 0);
    {
        const EnforcedPermissions permissions;
        updateIapConfigFiles();
    }
    EXPECT_EQ(readFile(IAP2_OUTPUT), "older");
    EXPECT_EQ(readFile(IAP1_OUTPUT), "iap1 stock\n");
}

// Rules: MRG-08, ONE-02
TEST_F(IapFallbackTest, Iap1StockFileIsInstalledByteForByte) {
    writeFile(IAP2_TEMPLATE, "");
    const std::string stock("stock\r\n\0\xff no line end", 21);
    writeFile(IAP1_STOCK, stock);
    updateIapConfigFiles();
    EXPECT_EQ(readFile(IAP1_OUTPUT), stock);
    EXPECT_EQ(readFile(IAP1_STOCK), stock);
}

TEST_F(IapFallbackTest, MissingIap1StockFileLeavesIap1Empty) {
    writeFile(IAP2_TEMPLATE, "");
    remove(IAP1_STOCK);
    writeFile(IAP1_OUTPUT, "older");
    EXPECT_EQ(updateIapConfigFiles(), 0);
    EXPECT_EQ(readFile(IAP1_OUTPUT), "");
}

// Rules: RUN-11
TEST_F(IapFallbackTest, Iap1OutputThatIsAFolderStaysEmpty) {
    putFolder(IAP1_OUTPUT);
    EXPECT_EQ(updateIapConfigFiles(), 0);
    EXPECT_TRUE(std::filesystem::is_empty(IAP1_OUTPUT));
    EXPECT_EQ(readFile(DEVICE_OUTPUT), plainDevice());
    EXPECT_EQ(readFile(IAP2_OUTPUT), plainIap2());
}

TEST_F(IapFallbackTest, OutputsThatAreFoldersStillTakeTheStockFiles) {
    for (const char* output : {DEVICE_OUTPUT, IAP2_OUTPUT, IAP1_OUTPUT}) {
        putFolder(output);
    }
    FileEventLog opens(IN_OPEN, {DEVICE_STOCK, IAP2_STOCK, IAP1_STOCK});
    updateIapConfigFiles();
    EXPECT_EQ(opens.take(), (std::vector<std::string>{DEVICE_STOCK, IAP2_STOCK, IAP1_STOCK}));
}

TEST_F(IapFallbackTest, Iap1OutputAloneThatIsAFolderStillTakesItsStockFile) {
    putFolder(IAP1_OUTPUT);
    FileEventLog opens(IN_OPEN, {DEVICE_STOCK, IAP2_STOCK, IAP1_STOCK});
    updateIapConfigFiles();
    EXPECT_EQ(opens.take(), std::vector<std::string>{IAP1_STOCK});
}

// Rules: ONE-09
TEST_F(IapFallbackTest, Iap2OutputWhoseCloseFailsInstallsTheIap1StockFile) {
    // Short enough for the buffer, so that nothing is written before the close.
    writeFile(IAP2_TEMPLATE, std::string(1000, '2'));
    EXPECT_EQ(updateWithFileSize(500), 0);
    EXPECT_EQ(readFile(DEVICE_OUTPUT), plainDevice());
    EXPECT_EQ(readFile(IAP2_OUTPUT), (iap2Head() + std::string(1000, '2')).substr(0, 500));
    EXPECT_EQ(readFile(IAP1_OUTPUT), "iap1 stock\n");
}

// Rules: ONE-09
TEST_F(IapFallbackTest, Iap2OutputThatFailsWhileItIsWrittenInstallsTheIap1StockFile) {
    writeFile(IAP2_TEMPLATE, std::string(LONGER_THAN_ANY_BUFFER, '2'));
    EXPECT_EQ(updateWithFileSize(500), 0);
    EXPECT_EQ(readFile(IAP2_OUTPUT), (iap2Head() + std::string(1000, '2')).substr(0, 500));
    EXPECT_EQ(readFile(IAP1_OUTPUT), "iap1 stock\n");
}

TEST_F(IapFallbackTest, Iap2OutputThatFailsBehindTheFirstReadStopsNoLaterStage) {
    const std::string content = markedText(INPUT_LENGTHS[7]);
    writeFile(IAP2_TEMPLATE, content);
    EXPECT_EQ(updateWithFileSize(200000), 0);
    EXPECT_TRUE(readFile(IAP2_OUTPUT) == (iap2Head() + content).substr(0, 200000));
    // Whether the output counts as failed depends on the library: on what it still has to write.
    const std::string iap1 = readFile(IAP1_OUTPUT);
    EXPECT_TRUE(iap1 == plainIap1() || iap1 == "iap1 stock\n") << iap1;
}

TEST_F(IapFallbackTest, Iap2OutputThatJustFitsLeavesIap1Generated) {
    writeFile(IAP2_TEMPLATE, std::string(1000, '2'));
    const std::string whole = iap2Head() + std::string(1000, '2');
    updateWithFileSize(whole.size());
    EXPECT_EQ(readFile(IAP2_OUTPUT), whole);
    EXPECT_EQ(readFile(IAP1_OUTPUT), plainIap1());
}

// Rules: ONE-10
TEST_F(IapFallbackTest, Iap2StockFileThatCannotBeWrittenWholeLeavesIap1Generated) {
    remove(IAP2_TEMPLATE);
    writeFile(IAP2_STOCK, std::string(1000, 's'));
    updateWithFileSize(500);
    EXPECT_EQ(readFile(IAP2_OUTPUT), std::string(500, 's'));
    EXPECT_EQ(readFile(IAP1_OUTPUT), plainIap1());
}

TEST_F(IapFallbackTest, Iap2OutputStaysOpenUntilTheEnd) {
    remove(IAP2_TEMPLATE);
    EXPECT_EQ(updateIapWithDescriptors(3), 0);
    EXPECT_EQ(readFile(IAP2_OUTPUT), "iap2 stock\n");
    EXPECT_EQ(readFile(IAP1_OUTPUT), plainIap1());
    // With one fewer, the stock file gets no output, the version no file, iap1.cfg no template.
    EXPECT_EQ(updateIapWithDescriptors(2), 0);
    EXPECT_EQ(readFile(IAP2_OUTPUT), "");
    EXPECT_EQ(readFile(IAP1_OUTPUT), iap1Head({"VOXA", "SN004217", "000000"}));
}

// Rules: IAP-02, ONE-06, ONE-10
TEST_F(IapFallbackTest, AllTemplatesMissingGeneratesIap1Alone) {
    remove(DEVICE_TEMPLATE);
    remove(IAP2_TEMPLATE);
    remove(IAP1_TEMPLATE);
    EXPECT_EQ(updateIapConfigFiles(), 0);
    EXPECT_EQ(readFile(DEVICE_OUTPUT), "device stock\n");
    EXPECT_EQ(readFile(IAP2_OUTPUT), "iap2 stock\n");
    EXPECT_EQ(readFile(IAP1_OUTPUT), iap1Head());
}

// Rules: RUN-12
TEST_F(IapFallbackTest, MissingTmpIsNotCreated) {
    remove("/tmp");
    EXPECT_EQ(updateIapConfigFiles(), 0);
    EXPECT_FALSE(exists("/tmp"));
}

TEST_F(IapFallbackTest, ReadOnlyTmpStaysEmpty) {
    ASSERT_EQ(chmod("/tmp", 0555), 0);
    int result = -1;
    {
        const EnforcedPermissions permissions;
        result = updateIapConfigFiles();
    }
    EXPECT_EQ(result, 0);
    EXPECT_TRUE(std::filesystem::is_empty("/tmp"));
}

TEST_F(IapFallbackTest, EmptyUnitIsNotAFailure) {
    for (const char* path : {"/fs", "/dev", "/tmp"}) {
        remove(path);
    }
    EXPECT_EQ(updateIapConfigFiles(), 0);
    EXPECT_TRUE(std::filesystem::is_empty("/"));
}

TEST_F(IapFallbackTest, ClosesWhatItOpened) {
    const int before = openDescriptors();
    remove(IAP2_TEMPLATE);
    updateIapConfigFiles();
    EXPECT_EQ(openDescriptors(), before);
    writeFile(IAP2_TEMPLATE, "");
    updateIapConfigFiles();
    EXPECT_EQ(openDescriptors(), before);
    putFolder(IAP2_OUTPUT);
    putFolder(IAP1_OUTPUT);
    updateIapConfigFiles();
    EXPECT_EQ(openDescriptors(), before);
}

} // namespace orvane::test
