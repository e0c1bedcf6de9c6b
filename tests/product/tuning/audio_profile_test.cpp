// SPDX-License-Identifier: Apache-2.0
#include "tests/product/tuning/tuning_test.h"
#include "tests/support/resource_limit.h"
#include "tuning/audio_profile.h"

namespace orvane::test {

constexpr char TELEPHONY_FILE[] = "/tmp/telephony_FFFF.txt";
constexpr char SPEECHREC_FILE[] = "/tmp/speechrec_FFFF.txt";
constexpr char TELEPHONY_HEADER[] = "; Genereated config from DPS (blockId 3)";
constexpr char SPEECHREC_HEADER[] = "; Genereated config from DPS (blockId 2)";

class AudioProfileTest : public TuningTest {
protected:
    /// Sets the two bytes of the profile in the image.
    static void setProfile(unsigned value) {
        setImage(133, {static_cast<char>(value & 0xFF), static_cast<char>(value >> 8)});
    }
    static std::string headerOf(const std::string& path) {
        return splitLines(readFile(path)).at(0);
    }
    static std::string extentOf(const std::string& path) {
        return lineOf(readFile(path), "qwaHFEExtent");
    }
    static void expectNoTuningFiles() {
        EXPECT_FALSE(exists(TELEPHONY_FILE));
        EXPECT_FALSE(exists(SPEECHREC_FILE));
        EXPECT_TRUE(std::filesystem::is_empty("/tmp"));
    }
    static void expectUnknownProfile() {
        EXPECT_EQ(getAudioProfile(), -1);
        expectNoTuningFiles();
    }
};

// Rules: PRO-04, PRO-05
TEST_F(AudioProfileTest, ConstantsNameParameterValuesAndFiles) {
    EXPECT_EQ(AUDIO_PROFILE_PARAM, 134);
    EXPECT_EQ(AUDIO_PROFILE_GENERATED, 65535);
    EXPECT_EQ(NO_AUDIO_PROFILE, -1);
    EXPECT_STREQ(TELEPHONY_TUNING_FILE, TELEPHONY_FILE);
    EXPECT_STREQ(SPEECHREC_TUNING_FILE, SPEECHREC_FILE);
}

// Rules: PRO-03, PRO-07
TEST_F(AudioProfileTest, ZeroIsAProfileLikeAnyOther) {
    setProfile(0);
    EXPECT_EQ(getAudioProfile(), 0);
    expectNoTuningFiles();
}

// Rules: PRO-03, PRO-07
TEST_F(AudioProfileTest, ValuesBelowTheGeneratedOnePassThrough) {
    for (const unsigned value : {1U, 2U, 255U, 256U, 0x1234U, 0x7FFFU, 0x8000U, 0x00FFU, 0xFF00U,
                                 0xFFFDU, 0xFEFFU, 65534U}) {
        setProfile(value);
        EXPECT_EQ(getAudioProfile(), static_cast<std::int32_t>(value));
        expectNoTuningFiles();
    }
}

// Rules: IMG-09, PRO-01
TEST_F(AudioProfileTest, ValueIsReadFromItsOwnBytesLowByteFirst) {
    writeImage(std::string(179, '\xFF'));
    setImage(133, "\x34\x12");
    EXPECT_EQ(getAudioProfile(), 0x1234);
    writeImage(std::string(179, '\0'));
    setImage(133, "\xCD\xAB");
    EXPECT_EQ(getAudioProfile(), 0xABCD);
    expectNoTuningFiles();
}

// Rules: PRO-04, PRO-05
TEST_F(AudioProfileTest, GeneratedProfileWritesBothFiles) {
    setBlock(3, 10, "\x33");
    setBlock(2, 10, "\x22");
    setProfile(0xFFFF);
    EXPECT_EQ(getAudioProfile(), 65535);
    EXPECT_EQ(headerOf(TELEPHONY_FILE), TELEPHONY_HEADER);
    EXPECT_EQ(extentOf(TELEPHONY_FILE), "qwaHFEExtent 51");
    EXPECT_EQ(headerOf(SPEECHREC_FILE), SPEECHREC_HEADER);
    EXPECT_EQ(extentOf(SPEECHREC_FILE), "qwaHFEExtent 34");
}

// Rules: PRO-04, TUN-03
TEST_F(AudioProfileTest, PatternInBlockThreeShowsInTheTelephonyFileOnly) {
    setDiskFromEnd(TUNING_AREA_BEFORE_END - 564, std::string(188, '\x01'));
    setProfile(0xFFFF);
    EXPECT_EQ(getAudioProfile(), 65535);
    EXPECT_EQ(extentOf(TELEPHONY_FILE), "qwaHFEExtent 1");
    EXPECT_EQ(extentOf(SPEECHREC_FILE), "qwaHFEExtent 0");
}

// Rules: PRO-05, TUN-03
TEST_F(AudioProfileTest, PatternInBlockTwoShowsInTheSpeechFileOnly) {
    setDiskFromEnd(TUNING_AREA_BEFORE_END - 376, std::string(188, '\x01'));
    setProfile(0xFFFF);
    EXPECT_EQ(getAudioProfile(), 65535);
    EXPECT_EQ(extentOf(TELEPHONY_FILE), "qwaHFEExtent 0");
    EXPECT_EQ(extentOf(SPEECHREC_FILE), "qwaHFEExtent 1");
}

// Rules: PRO-06
TEST_F(AudioProfileTest, TelephonyFileIsWrittenFirst) {
    // Both names lead to one file: the later writer's content remains.
    std::filesystem::create_symlink("/tmp/both", TELEPHONY_FILE);
    std::filesystem::create_symlink("/tmp/both", SPEECHREC_FILE);
    setProfile(0xFFFF);
    EXPECT_EQ(getAudioProfile(), 65535);
    EXPECT_EQ(headerOf("/tmp/both"), SPEECHREC_HEADER);
}

TEST_F(AudioProfileTest, TelephonyFileIsCompleteBeforeTheDiskIsReadAgain) {
    // The first file replaces the disk, which is then too short for any block.
    setBlock(3, 10, "\x33");
    setBlock(2, 10, "\x22");
    std::filesystem::create_symlink(DISK_PATH, TELEPHONY_FILE);
    setProfile(0xFFFF);
    EXPECT_EQ(getAudioProfile(), 65535);
    EXPECT_EQ(extentOf(DISK_PATH), "qwaHFEExtent 51");
    EXPECT_EQ(extentOf(SPEECHREC_FILE), "qwaHFEExtent 0");
}

// Rules: IMG-02, PRO-02
TEST_F(AudioProfileTest, MissingImageIsAnUnknownProfile) {
    remove(IMAGE_PATH);
    expectUnknownProfile();
}

// Rules: IMG-03
TEST_F(AudioProfileTest, EmptyImageIsAnUnknownProfile) {
    writeImage("");
    expectUnknownProfile();
}

// Rules: IMG-02, IMG-04
TEST_F(AudioProfileTest, ImageThatCannotBeMappedIsAnUnknownProfile) {
    putFolder(IMAGE_PATH);
    expectUnknownProfile();
}

// Rules: IMG-07
TEST_F(AudioProfileTest, ShortImageIsReadToTheEndOfItsPage) {
    writeImage(std::string(134, '\xFF'));
    EXPECT_EQ(getAudioProfile(), 255);
    expectNoTuningFiles();
}

// Rules: PRO-08
TEST_F(AudioProfileTest, ProfileIsKnownEvenWhenNeitherFileCanBeWritten) {
    putFolder(TELEPHONY_FILE);
    putFolder(SPEECHREC_FILE);
    setProfile(0xFFFF);
    EXPECT_EQ(getAudioProfile(), 65535);
    remove("/tmp");
    EXPECT_EQ(getAudioProfile(), 65535);
    EXPECT_FALSE(exists("/tmp"));
}

// Rules: PRO-09
TEST_F(AudioProfileTest, FileThatCannotBeWrittenDoesNotStopTheOther) {
    setProfile(0xFFFF);
    putFolder(TELEPHONY_FILE);
    EXPECT_EQ(getAudioProfile(), 65535);
    EXPECT_EQ(headerOf(SPEECHREC_FILE), SPEECHREC_HEADER);
    remove(TELEPHONY_FILE);
    putFolder(SPEECHREC_FILE);
    EXPECT_EQ(getAudioProfile(), 65535);
    EXPECT_EQ(headerOf(TELEPHONY_FILE), TELEPHONY_HEADER);
}

TEST_F(AudioProfileTest, UnreadableDiskGivesFilesOfZeros) {
    remove(DISK_PATH);
    setProfile(0xFFFF);
    EXPECT_EQ(getAudioProfile(), 65535);
    EXPECT_EQ(extentOf(TELEPHONY_FILE), "qwaHFEExtent 0");
    EXPECT_EQ(extentOf(SPEECHREC_FILE), "qwaHFEExtent 0");
}

TEST_F(AudioProfileTest, FilesOfAnEarlierRunAreReplaced) {
    writeFile(TELEPHONY_FILE, std::string(10000, 'x'));
    writeFile(SPEECHREC_FILE, std::string(10000, 'x'));
    setProfile(0xFFFF);
    EXPECT_EQ(getAudioProfile(), 65535);
    EXPECT_EQ(splitLines(readFile(TELEPHONY_FILE)).size(), 45U);
    EXPECT_EQ(splitLines(readFile(SPEECHREC_FILE)).size(), 45U);
}

// Rules: PRO-07
TEST_F(AudioProfileTest, FilesOfAnEarlierRunStayWithAnyOtherProfile) {
    writeFile(TELEPHONY_FILE, "telephony");
    writeFile(SPEECHREC_FILE, "speech");
    for (const unsigned value : {0U, 1U, 65534U}) {
        setProfile(value);
        EXPECT_EQ(getAudioProfile(), static_cast<std::int32_t>(value));
    }
    remove(IMAGE_PATH);
    EXPECT_EQ(getAudioProfile(), -1);
    EXPECT_EQ(readFile(TELEPHONY_FILE), "telephony");
    EXPECT_EQ(readFile(SPEECHREC_FILE), "speech");
}

TEST_F(AudioProfileTest, EachCallReadsTheImageAgain) {
    setProfile(5);
    EXPECT_EQ(getAudioProfile(), 5);
    remove(IMAGE_PATH);
    EXPECT_EQ(getAudioProfile(), -1);
    writeImage(std::string(179, '\x01'));
    EXPECT_EQ(getAudioProfile(), 0x0101);
}

TEST_F(AudioProfileTest, ImageIsClosedBeforeTheDiskAndTheFilesAreOpened) {
    setBlock(3, 10, "\x33");
    setBlock(2, 10, "\x22");
    setProfile(0xFFFF);
    {
        const ResourceLimit limit(RLIMIT_NOFILE, roomForDescriptors(1));
        EXPECT_EQ(getAudioProfile(), 65535);
    }
    EXPECT_EQ(extentOf(TELEPHONY_FILE), "qwaHFEExtent 51");
    EXPECT_EQ(extentOf(SPEECHREC_FILE), "qwaHFEExtent 34");
}

TEST_F(AudioProfileTest, LeavesNoDescriptorOpen) {
    const int before = openDescriptors();
    setProfile(0xFFFF);
    EXPECT_EQ(getAudioProfile(), 65535);
    EXPECT_EQ(openDescriptors(), before);
    putFolder(TELEPHONY_FILE);
    EXPECT_EQ(getAudioProfile(), 65535);
    EXPECT_EQ(openDescriptors(), before);
    writeImage("");
    EXPECT_EQ(getAudioProfile(), -1);
    EXPECT_EQ(openDescriptors(), before);
    remove(IMAGE_PATH);
    EXPECT_EQ(getAudioProfile(), -1);
    EXPECT_EQ(openDescriptors(), before);
}

} // namespace orvane::test
