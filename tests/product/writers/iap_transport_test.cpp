// SPDX-License-Identifier: Apache-2.0
//
// The iAP2 and iAP1 transport files, second and third of the three.
#include "tests/product/writers/iap_unit.h"
#include "tests/support/input_lengths.h"
#include "tests/support/resource_limit.h"
#include "writers/iap_writer.h"

#include <sys/stat.h>

#include <filesystem>
#include <string>

namespace orvane::test {

namespace {

using IapTransportTest = IapUnitTest;

} // namespace

// Rules: IAP-05 to IAP-12, TWO-01, TWO-03
TEST_F(IapTransportTest, Iap2HoldsTheBlockAndTheTemplate) {
    writeFile(IAP2_TEMPLATE, "[iap2]\nlink=usb\n");
    EXPECT_EQ(updateIapConfigFiles(), 0);
    EXPECT_EQ(readFile(IAP2_OUTPUT),
              "# This section is mandatory.  Populate all fields with accessory-specific info.\n"
              "[accessory]\n"
              "name=VOXA 3\n"
              "model=VOXA\n"
              "manufacturer=Marl Motor Company\n"
              "serial=SN004217\n"
              "firmware_version=3.10.2\n"
              "hardware_version=1.0.0\n"
              "\n"
              "[iap2]\n"
              "link=usb\n");
}

// Rules: IAP-05 to IAP-11, IAP-13
// Rules: ONE-01, ONE-03 to ONE-05
TEST_F(IapTransportTest, Iap1HoldsTheBlockTheCertificateLineAndTheTemplate) {
    writeFile(IAP1_TEMPLATE, "[iap1]\nlingo=0\n");
    EXPECT_EQ(updateIapConfigFiles(), 0);
    EXPECT_EQ(readFile(IAP1_OUTPUT),
              "# This section is mandatory.  Populate all fields with accessory-specific info.\n"
              "[accessory]\n"
              "name=VOXA 3\n"
              "model=VOXA\n"
              "manufacturer=Marl Motor Company\n"
              "serial=SN004217\n"
              "firmware_version=030a02\n"
              "hardware_version=010000\n"
              "rfcert=00000000 \n"
              "\n"
              "[iap1]\n"
              "lingo=0\n");
}

// Rules: MRG-04, TWO-04, ONE-05
TEST_F(IapTransportTest, NothingFollowsTheTemplates) {
    writeFile(IAP2_TEMPLATE, "two");
    writeFile(IAP1_TEMPLATE, "one");
    updateIapConfigFiles();
    EXPECT_EQ(readFile(IAP2_OUTPUT), iap2Head() + "two");
    EXPECT_EQ(readFile(IAP1_OUTPUT), iap1Head() + "one");
}

// Rules: MRG-03
TEST_F(IapTransportTest, TemplatesAreNotParsed) {
    const std::string content("[accessory]\r\nserial=B\n\n\0\xff\n", 26);
    writeFile(IAP2_TEMPLATE, content);
    writeFile(IAP1_TEMPLATE, content);
    updateIapConfigFiles();
    EXPECT_EQ(readFile(IAP2_OUTPUT), iap2Head() + content);
    EXPECT_EQ(readFile(IAP1_OUTPUT), iap1Head() + content);
}

TEST_F(IapTransportTest, TemplatesLongerThanAnyBufferAreCopiedWhole) {
    const std::string content = markedText(LONGER_THAN_ANY_BUFFER);
    writeFile(IAP2_TEMPLATE, content);
    writeFile(IAP1_TEMPLATE, content);
    updateIapConfigFiles();
    EXPECT_TRUE(readFile(IAP2_OUTPUT) == iap2Head() + content);
    EXPECT_TRUE(readFile(IAP1_OUTPUT) == iap1Head() + content);
}

// Rules: RUN-09
TEST_F(IapTransportTest, OlderLongerOutputsAreReplacedWhole) {
    writeFile(IAP2_OUTPUT, std::string(20000, 'o'));
    writeFile(IAP1_OUTPUT, std::string(20000, 'o'));
    updateIapConfigFiles();
    EXPECT_EQ(readFile(IAP2_OUTPUT), plainIap2());
    EXPECT_EQ(readFile(IAP1_OUTPUT), plainIap1());
}

// Rules: RUN-09
TEST_F(IapTransportTest, OlderLongerOutputsAreReplacedWholeByTheStockFiles) {
    writeFile(IAP2_OUTPUT, std::string(20000, 'o'));
    writeFile(IAP1_OUTPUT, std::string(20000, 'o'));
    // An empty template fails the output of stage 2; stage 3 then installs its stock file.
    writeFile(IAP2_TEMPLATE, "");
    updateIapConfigFiles();
    EXPECT_EQ(readFile(IAP1_OUTPUT), "iap1 stock\n");
    remove(IAP2_TEMPLATE);
    updateIapConfigFiles();
    EXPECT_EQ(readFile(IAP2_OUTPUT), "iap2 stock\n");
}

// Rules: RUN-10
TEST_F(IapTransportTest, OutputsThroughSymlinksReachTheirTargets) {
    std::filesystem::create_symlink("/fs/rwdata/two", IAP2_OUTPUT);
    std::filesystem::create_symlink("/fs/rwdata/one", IAP1_OUTPUT);
    updateIapConfigFiles();
    EXPECT_EQ(readFile("/fs/rwdata/two"), plainIap2());
    EXPECT_EQ(readFile("/fs/rwdata/one"), plainIap1());
    EXPECT_TRUE(std::filesystem::is_symlink(IAP2_OUTPUT));
    EXPECT_TRUE(std::filesystem::is_symlink(IAP1_OUTPUT));
}

// Rules: IAP-01
TEST_F(IapTransportTest, FilesAreMadeInAFixedOrder) {
    // All three outputs are one file, so that the last one made stays.
    std::filesystem::create_symlink(IAP1_OUTPUT, DEVICE_OUTPUT);
    std::filesystem::create_symlink(IAP1_OUTPUT, IAP2_OUTPUT);
    updateIapConfigFiles();
    EXPECT_EQ(readFile(IAP1_OUTPUT), plainIap1());
    // Without the third, the second is the last.
    remove(DEVICE_OUTPUT);
    remove(IAP2_OUTPUT);
    putFolder(IAP1_OUTPUT);
    std::filesystem::create_symlink(IAP2_OUTPUT, DEVICE_OUTPUT);
    updateIapConfigFiles();
    EXPECT_EQ(readFile(IAP2_OUTPUT), plainIap2());
}

// Rules: ONE-06
TEST_F(IapTransportTest, MissingIap1TemplateEndsIap1AfterTheCertificateLine) {
    remove(IAP1_TEMPLATE);
    EXPECT_EQ(updateIapConfigFiles(), 0);
    EXPECT_EQ(readFile(IAP1_OUTPUT),
              "# This section is mandatory.  Populate all fields with accessory-specific info.\n"
              "[accessory]\n"
              "name=VOXA 3\n"
              "model=VOXA\n"
              "manufacturer=Marl Motor Company\n"
              "serial=SN004217\n"
              "firmware_version=030a02\n"
              "hardware_version=010000\n"
              "rfcert=00000000 \n"
              "\n");
    EXPECT_EQ(readFile(DEVICE_OUTPUT), plainDevice());
    EXPECT_EQ(readFile(IAP2_OUTPUT), plainIap2());
}

TEST_F(IapTransportTest, EmptyIap1TemplateEndsIap1AfterTheCertificateLine) {
    writeFile(IAP1_TEMPLATE, "");
    updateIapConfigFiles();
    EXPECT_EQ(readFile(IAP1_OUTPUT), iap1Head());
}

TEST_F(IapTransportTest, FolderAsTheIap1TemplateEndsIap1AfterTheCertificateLine) {
    putFolder(IAP1_TEMPLATE);
    updateIapConfigFiles();
    EXPECT_EQ(readFile(IAP1_OUTPUT), iap1Head());
}

// Rules: RUN-07
TEST_F(IapTransportTest, NewOutputsHaveMode666LessTheMask) {
    const mode_t former = umask(022);
    updateIapConfigFiles();
    umask(former);
    for (const char* path : {IAP2_OUTPUT, IAP1_OUTPUT}) {
        struct stat status {};
        ASSERT_EQ(stat(path, &status), 0);
        EXPECT_EQ(status.st_mode & 07777U, 0644U);
    }
}

TEST_F(IapTransportTest, NeedTwoDescriptors) {
    {
        const rlim_t roomForTwo = roomForDescriptors(2);
        const ResourceLimit limit(RLIMIT_NOFILE, roomForTwo);
        EXPECT_EQ(updateIapConfigFiles(), 0);
    }
    EXPECT_EQ(readFile(DEVICE_OUTPUT), plainDevice());
    EXPECT_EQ(readFile(IAP2_OUTPUT), plainIap2());
    EXPECT_EQ(readFile(IAP1_OUTPUT), plainIap1());
}

} // namespace orvane::test
