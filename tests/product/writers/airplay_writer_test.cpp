// SPDX-License-Identifier: Apache-2.0
//
// The generated AirPlay file as a whole.
#include "tests/product/writers/airplay_unit.h"
#include "tests/support/file_event_log.h"
#include "tests/support/folder_names.h"
#include "tests/support/input_lengths.h"
#include "tests/support/resource_limit.h"
#include "writers/airplay_writer.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include <chrono>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <set>
#include <string>
#include <thread>

namespace orvane::test {

namespace {

using AirplayWriterTest = AirplayUnitTest;

} // namespace

// Rules: MRG-02, AIR-01, AIR-04 to AIR-17, AIR-19 to AIR-21
TEST_F(AirplayWriterTest, PutsTheHeadBeforeTheTemplate) {
    setImage(PROFILE_OFFSET, bytes({3, 0}));
    writeFile(AIRPLAY_TEMPLATE, "# Static part\nname = Second\n");
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
              "# audio profile for QWA\n"
              "audioProfile = 3\n"
              "\n"
              "# rightHandDrive mode setting right\n"
              "rightHandDrive = 0\n"
              "\n"
              "# Static part\n"
              "name = Second\n");
}

// Rules: RUN-04, RUN-05
TEST_F(AirplayWriterTest, WritesTheAirplayFileAlone) {
    const std::set<std::string> productData = folderNames("/fs/mp/etc");
    updateAirplayConfigFile();
    EXPECT_EQ(folderNames("/tmp"), std::set<std::string>{"airplay.conf"});
    EXPECT_EQ(folderNames("/fs/mp/etc"), productData);
    EXPECT_EQ(readFile(AIRPLAY_TEMPLATE), "static = 1\n");
    EXPECT_EQ(readFile(AIRPLAY_STOCK), "stock = 1\n");
}

// Rules: MRG-04, AIR-21
TEST_F(AirplayWriterTest, TemplateWithoutAFinalLineEndGetsNone) {
    writeFile(AIRPLAY_TEMPLATE, "a = 1\nb = 2");
    updateAirplayConfigFile();
    EXPECT_EQ(readFile(AIRPLAY_OUTPUT), plainAirplayHead() + "a = 1\nb = 2");
}

// Rules: MRG-03
TEST_F(AirplayWriterTest, TemplateIsNotParsed) {
    const std::string content("# rightHandDrive mode setting right\r\nname = B\n\n\0\xff\n", 50);
    writeFile(AIRPLAY_TEMPLATE, content);
    updateAirplayConfigFile();
    EXPECT_EQ(readFile(AIRPLAY_OUTPUT), plainAirplayHead() + content);
}

TEST_F(AirplayWriterTest, TemplateLongerThanAnyBufferIsCopiedWhole) {
    const std::string content = markedText(LONGER_THAN_ANY_BUFFER);
    writeFile(AIRPLAY_TEMPLATE, content);
    updateAirplayConfigFile();
    EXPECT_TRUE(readFile(AIRPLAY_OUTPUT) == plainAirplayHead() + content);
}

// Rules: MRG-05
TEST_F(AirplayWriterTest, EmptyTemplateLeavesTheHeadAlone) {
    writeFile(AIRPLAY_TEMPLATE, "");
    EXPECT_EQ(updateAirplayConfigFile(), 0);
    EXPECT_EQ(readFile(AIRPLAY_OUTPUT), plainAirplayHead());
}

// Rules: MRG-06
TEST_F(AirplayWriterTest, FolderAsATemplateLeavesTheHeadAlone) {
    putFolder(AIRPLAY_TEMPLATE);
    EXPECT_EQ(updateAirplayConfigFile(), 0);
    EXPECT_EQ(readFile(AIRPLAY_OUTPUT), plainAirplayHead());
}

// Rules: RUN-09
TEST_F(AirplayWriterTest, OlderLongerOutputIsReplacedWhole) {
    writeFile(AIRPLAY_OUTPUT, std::string(20000, 'o'));
    updateAirplayConfigFile();
    EXPECT_EQ(readFile(AIRPLAY_OUTPUT), plainAirplayHead() + "static = 1\n");
}

// Rules: RUN-10
TEST_F(AirplayWriterTest, OutputThroughASymlinkReachesItsTarget) {
    std::filesystem::create_symlink("/fs/rwdata/airplay", AIRPLAY_OUTPUT);
    updateAirplayConfigFile();
    EXPECT_TRUE(std::filesystem::is_symlink(AIRPLAY_OUTPUT));
    EXPECT_EQ(readFile("/fs/rwdata/airplay"), plainAirplayHead() + "static = 1\n");
}

// Rules: RUN-07
TEST_F(AirplayWriterTest, NewOutputHasMode666LessTheMask) {
    const mode_t former = umask(022);
    updateAirplayConfigFile();
    umask(former);
    struct stat status {};
    ASSERT_EQ(stat(AIRPLAY_OUTPUT, &status), 0);
    EXPECT_EQ(status.st_mode & 07777U, 0644U);
}

TEST_F(AirplayWriterTest, HeadIsFlushedBeforeTheTemplateIsRead) {
    remove(AIRPLAY_TEMPLATE);
    ASSERT_EQ(mkfifo(AIRPLAY_TEMPLATE, 0600), 0);
    const std::string head = plainAirplayHead();
    // The other end of the pipe writes, as the template, what the output holds at that moment.
    const pid_t feeder = fork();
    ASSERT_NE(feeder, -1);
    if (feeder == 0) {
        const int fifo = open(AIRPLAY_TEMPLATE, O_RDWR);
        std::string seen;
        for (int tries = 0; tries < 500 && seen.size() < head.size(); ++tries) {
            std::this_thread::sleep_for(std::chrono::milliseconds(10));
            std::ifstream output(AIRPLAY_OUTPUT, std::ios::binary);
            seen.assign(std::istreambuf_iterator<char>(output), {});
        }
        const ssize_t fed = write(fifo, seen.data(), seen.size());
        _exit(fed == static_cast<ssize_t>(seen.size()) ? 0 : 1);
    }
    updateAirplayConfigFile();
    int status = -1;
    ASSERT_EQ(waitpid(feeder, &status, 0), feeder);
    EXPECT_EQ(status, 0);
    EXPECT_EQ(readFile(AIRPLAY_OUTPUT), head + head);
}

TEST_F(AirplayWriterTest, LineEndsOfTheLastTwoValuesAreFlushed) {
    writeFile(AIRPLAY_OUTPUT, "older");
    FileEventLog changes(IN_MODIFY, {AIRPLAY_OUTPUT});
    updateAirplayConfigFile();
    // The truncation, three line ends of the profile, three of the drive side, the template.
    EXPECT_EQ(changes.take().size(), 8U);
    remove(IMAGE_PATH);
    updateAirplayConfigFile();
    EXPECT_EQ(changes.take().size(), 5U);
}

// Rules: MRG-11
TEST_F(AirplayWriterTest, PartlyWrittenOutputIsLeftAsItIs) {
    for (const rlim_t size : {rlim_t{100}, rlim_t{plainAirplayHead().size() + 3}}) {
        SCOPED_TRACE(size);
        int result = -1;
        {
            const ResourceLimit limit(RLIMIT_FSIZE, size);
            result = updateAirplayConfigFile();
        }
        EXPECT_EQ(result, 0);
        EXPECT_EQ(readFile(AIRPLAY_OUTPUT),
                  (plainAirplayHead() + "static = 1\n").substr(0, static_cast<std::size_t>(size)));
    }
}

TEST_F(AirplayWriterTest, ClosesWhatItOpened) {
    setImage(PROFILE_OFFSET, bytes({0xFF, 0xFF}));
    const int before = openDescriptors();
    updateAirplayConfigFile();
    EXPECT_EQ(openDescriptors(), before);
}

} // namespace orvane::test
