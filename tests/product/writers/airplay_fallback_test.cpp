// SPDX-License-Identifier: Apache-2.0
//
// The AirPlay file when it can't be generated.
#include "tests/product/writers/airplay_unit.h"
#include "tests/support/folder_names.h"
#include "tests/support/input_lengths.h"
#include "tests/support/permissions.h"
#include "tests/support/resource_limit.h"
#include "writers/airplay_writer.h"

#include <sys/stat.h>

#include <filesystem>
#include <set>
#include <string>

namespace orvane::test {

namespace {

using AirplayFallbackTest = AirplayUnitTest;

/// Runs the writer with room for `count` more descriptors.
int updateAirplayWithDescriptors(int count) {
    const rlim_t room = roomForDescriptors(count);
    const ResourceLimit limit(RLIMIT_NOFILE, room);
    return updateAirplayConfigFile();
}

} // namespace

// Rules: MRG-07, MRG-08, AIR-02
TEST_F(AirplayFallbackTest, MissingTemplateInstallsTheStockFile) {
    remove(AIRPLAY_TEMPLATE);
    const std::string stock("stock\r\n\0\xff no line end", 21);
    writeFile(AIRPLAY_STOCK, stock);
    EXPECT_EQ(updateAirplayConfigFile(), 0);
    EXPECT_EQ(readFile(AIRPLAY_OUTPUT), stock);
    EXPECT_EQ(readFile(AIRPLAY_STOCK), stock);
}

TEST_F(AirplayFallbackTest, StockFileLongerThanAnyBufferIsCopiedWhole) {
    remove(AIRPLAY_TEMPLATE);
    const std::string stock = markedText(LONGER_THAN_ANY_BUFFER);
    writeFile(AIRPLAY_STOCK, stock);
    updateAirplayConfigFile();
    EXPECT_TRUE(readFile(AIRPLAY_OUTPUT) == stock);
}

// Rules: RUN-09
TEST_F(AirplayFallbackTest, StockFileReplacesAnOlderLongerOutput) {
    remove(AIRPLAY_TEMPLATE);
    writeFile(AIRPLAY_OUTPUT, std::string(20000, 'o'));
    updateAirplayConfigFile();
    EXPECT_EQ(readFile(AIRPLAY_OUTPUT), "stock = 1\n");
}

// Rules: RUN-10
TEST_F(AirplayFallbackTest, StockFileGoesThroughASymlink) {
    remove(AIRPLAY_TEMPLATE);
    std::filesystem::create_symlink("/fs/rwdata/airplay", AIRPLAY_OUTPUT);
    updateAirplayConfigFile();
    EXPECT_TRUE(std::filesystem::is_symlink(AIRPLAY_OUTPUT));
    EXPECT_EQ(readFile("/fs/rwdata/airplay"), "stock = 1\n");
}

// Rules: MRG-07
TEST_F(AirplayFallbackTest, DanglingLinkAsATemplateInstallsTheStockFile) {
    for (const char* target : {"/fs/mp/etc/airplay_static.conf", "/fs/missing/template"}) {
        SCOPED_TRACE(target);
        remove(AIRPLAY_TEMPLATE);
        std::filesystem::create_symlink(target, AIRPLAY_TEMPLATE);
        updateAirplayConfigFile();
        EXPECT_EQ(readFile(AIRPLAY_OUTPUT), "stock = 1\n");
    }
}

// Rules: MRG-07
TEST_F(AirplayFallbackTest, TemplateWithoutReadPermissionInstallsTheStockFile) {
    ASSERT_EQ(chmod(AIRPLAY_TEMPLATE, 0), 0);
    {
        const EnforcedPermissions permissions;
        updateAirplayConfigFile();
    }
    EXPECT_EQ(readFile(AIRPLAY_OUTPUT), "stock = 1\n");
}

TEST_F(AirplayFallbackTest, MissingTemplateAndStockFileLeaveAnEmptyOutput) {
    remove(AIRPLAY_TEMPLATE);
    remove(AIRPLAY_STOCK);
    EXPECT_EQ(updateAirplayConfigFile(), 0);
    EXPECT_EQ(readFile(AIRPLAY_OUTPUT), "");
}

// Rules: MRG-09
TEST_F(AirplayFallbackTest, MissingTemplateAndStockFileEmptyAnOlderOutput) {
    remove(AIRPLAY_TEMPLATE);
    remove(AIRPLAY_STOCK);
    writeFile(AIRPLAY_OUTPUT, "older");
    updateAirplayConfigFile();
    EXPECT_EQ(readFile(AIRPLAY_OUTPUT), "");
}

TEST_F(AirplayFallbackTest, StockFileWithoutContentLeavesAnEmptyOutput) {
    remove(AIRPLAY_TEMPLATE);
    writeFile(AIRPLAY_STOCK, "");
    updateAirplayConfigFile();
    EXPECT_EQ(readFile(AIRPLAY_OUTPUT), "");
    putFolder(AIRPLAY_STOCK);
    updateAirplayConfigFile();
    EXPECT_EQ(readFile(AIRPLAY_OUTPUT), "");
}

// Rules: PRO-10
TEST_F(AirplayFallbackTest, TuningFilesAreWrittenBesideTheStockFile) {
    remove(AIRPLAY_TEMPLATE);
    setImage(PROFILE_OFFSET, bytes({0xFF, 0xFF}));
    updateAirplayConfigFile();
    EXPECT_EQ(readFile(AIRPLAY_OUTPUT), "stock = 1\n");
    EXPECT_EQ(folderNames("/tmp"),
              (std::set<std::string>{"airplay.conf", "speechrec_FFFF.txt", "telephony_FFFF.txt"}));
}

// Rules: RUN-12
TEST_F(AirplayFallbackTest, MissingTmpIsNotCreated) {
    remove("/tmp");
    setImage(PROFILE_OFFSET, bytes({0xFF, 0xFF}));
    EXPECT_EQ(updateAirplayConfigFile(), 0);
    EXPECT_FALSE(exists("/tmp"));
}

TEST_F(AirplayFallbackTest, ReadOnlyTmpStaysEmpty) {
    ASSERT_EQ(chmod("/tmp", 0555), 0);
    int result = -1;
    {
        const EnforcedPermissions permissions;
        result = updateAirplayConfigFile();
    }
    EXPECT_EQ(result, 0);
    EXPECT_TRUE(std::filesystem::is_empty("/tmp"));
}

// Rules: RUN-13
TEST_F(AirplayFallbackTest, ReadOnlyOlderOutputStaysAsItIs) {
    writeFile(AIRPLAY_OUTPUT, "older");
    ASSERT_EQ(chmod(AIRPLAY_OUTPUT, 0444), 0);
    {
        const EnforcedPermissions permissions;
        updateAirplayConfigFile();
    }
    EXPECT_EQ(readFile(AIRPLAY_OUTPUT), "older");
}

// Rules: RUN-11
TEST_F(AirplayFallbackTest, OutputThatIsAFolderStaysEmpty) {
    putFolder(AIRPLAY_OUTPUT);
    EXPECT_EQ(updateAirplayConfigFile(), 0);
    EXPECT_TRUE(std::filesystem::is_empty(AIRPLAY_OUTPUT));
    EXPECT_EQ(readFile(AIRPLAY_TEMPLATE), "static = 1\n");
    EXPECT_EQ(readFile(AIRPLAY_STOCK), "stock = 1\n");
}

// Rules: MRG-10
TEST_F(AirplayFallbackTest, NothingIsWrittenThroughADanglingLink) {
    std::filesystem::create_symlink("/fs/missing/airplay", AIRPLAY_OUTPUT);
    EXPECT_EQ(updateAirplayConfigFile(), 0);
    EXPECT_FALSE(exists("/fs/missing"));
    EXPECT_TRUE(std::filesystem::is_symlink(AIRPLAY_OUTPUT));
}

TEST_F(AirplayFallbackTest, NeedsTwoDescriptorsToGenerate) {
    EXPECT_EQ(updateAirplayWithDescriptors(2), 0);
    EXPECT_EQ(readFile(AIRPLAY_OUTPUT), plainAirplayHead() + "static = 1\n");
    EXPECT_EQ(updateAirplayWithDescriptors(1), 0);
    EXPECT_EQ(readFile(AIRPLAY_OUTPUT), "");
}

TEST_F(AirplayFallbackTest, FirstOutputStaysOpenBesideTheCopy) {
    remove(AIRPLAY_TEMPLATE);
    EXPECT_EQ(updateAirplayWithDescriptors(3), 0);
    EXPECT_EQ(readFile(AIRPLAY_OUTPUT), "stock = 1\n");
    EXPECT_EQ(updateAirplayWithDescriptors(2), 0);
    EXPECT_EQ(readFile(AIRPLAY_OUTPUT), "");
}

TEST_F(AirplayFallbackTest, EmptyUnitIsNotAFailure) {
    for (const char* path : {"/fs", "/dev", "/tmp"}) {
        remove(path);
    }
    EXPECT_EQ(updateAirplayConfigFile(), 0);
    EXPECT_TRUE(std::filesystem::is_empty("/"));
}

TEST_F(AirplayFallbackTest, ClosesWhatItOpened) {
    const int before = openDescriptors();
    remove(AIRPLAY_TEMPLATE);
    updateAirplayConfigFile();
    remove(AIRPLAY_STOCK);
    updateAirplayConfigFile();
    putFolder(AIRPLAY_OUTPUT);
    updateAirplayConfigFile();
    EXPECT_EQ(openDescriptors(), before);
}

} // namespace orvane::test
