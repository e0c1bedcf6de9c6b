// SPDX-License-Identifier: Apache-2.0
#include "tests/product/tuning/tuning_test.h"
#include "tests/support/disturbed_reads.h"
#include "tests/support/file_event_log.h"
#include "tests/support/permissions.h"
#include "tests/support/resource_limit.h"
#include "tuning/tuning_file.h"

#include <sys/stat.h>

#include <climits>

namespace orvane::test {

constexpr char OLD_CONTENT[] = "what an earlier run wrote\n";

/// A whole file except for the number in its header: the lines of a block of zeros.
constexpr char LINES_OF_ZEROS[] = "qwaAECSwitch \n"
                                  "qwaAGCSwitch \n"
                                  "qwaDiagSwitch \n"
                                  "qwaHFESwitch \n"
                                  "qwaMixFiltSwitch \n"
                                  "qwaMixSwitch \n"
                                  "qwaNRSwitch \n"
                                  "qwaRECSwitch \n"
                                  "qwaRecvAGCSwitch \n"
                                  "qwaRecvBWESwitch \n"
                                  "qwaRecvDLCSwitch \n"
                                  "qwaRecvDTFSwitch \n"
                                  "qwaRecvENSSwitch \n"
                                  "qwaRecvEQSwitch \n"
                                  "qwaSendDynEQSwitch \n"
                                  "qwaSendEQSwitch \n"
                                  "qwaWNDBMode \n"
                                  "qwaWNDBSwitch \n"
                                  "qwaAECFiltLen 0\n"
                                  "qwaLFRSwitch \n"
                                  "qwaHFEExtent 0\n"
                                  "qwaNCParams 0 0 0 0 0 \n"
                                  "qwaNRAtten 0\n"
                                  "qwaRECSuppress 0\n"
                                  "qwaRecvAGCAmpTgts 0 0 \n"
                                  "qwaRecvAGCGainVals 0 0 0 \n"
                                  "qwaRecvAGCMaxRates 0 0 \n"
                                  "qwaRecvGain 0\n"
                                  "qwaRecvLimitThresh 0\n"
                                  "qwaRecvParamEQNodes 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 \n"
                                  "qwaRefDelay 0\n"
                                  "qwaRefMaxDelay 0\n"
                                  "qwaSendAGCMaxRates 0 0 \n"
                                  "qwaSendAGCAmpTgts 0 0 \n"
                                  "qwaSendAGCGainVals 0 0 0 \n"
                                  "qwaSendDynEQMinMaxSNR 0 0 \n"
                                  "qwaSendGain 0\n"
                                  "qwaSendLimitThresh 0\n"
                                  "qwaSendParamEQ2Nodes 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 \n"
                                  "qwaSendParamEQNodes 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 \n"
                                  "qwaWNDBSuppress 0\n"
                                  "qwaDNSEnable 0\n"
                                  "qwaIVOSwitch \n"
                                  "qwaMEQEnable 0 0 0 0 \n";

class TuningFileTest : public TuningTest {
protected:
    static std::string fileOfZeros(int blockId) {
        return "; Genereated config from DPS (blockId " + std::to_string(blockId) + ")\n" +
               LINES_OF_ZEROS;
    }
    /// Permission bits of a file that is created under `mask`.
    static mode_t modeUnder(mode_t mask) {
        remove(ANY_TUNING_FILE);
        const mode_t former = umask(mask);
        generateTuningFile(2, ANY_TUNING_FILE);
        umask(former);
        struct stat status {};
        EXPECT_EQ(stat(ANY_TUNING_FILE, &status), 0);
        return status.st_mode & 07777;
    }
};

// Rules: TUN-08 to TUN-11, TUN-14
TEST_F(TuningFileTest, BlockOfZerosIsWholeAndExact) {
    EXPECT_EQ(rendered(2), fileOfZeros(2));
}

// Rules: TUN-08
// Rules: GEN-01
TEST_F(TuningFileTest, HeaderNamesTheBlock) {
    for (int blockId = 0; blockId <= 9; ++blockId) {
        EXPECT_EQ(splitLines(rendered(blockId)).at(0),
                  "; Genereated config from DPS (blockId " + std::to_string(blockId) + ")");
    }
}

// Rules: TUN-01, TUN-02
// Rules: GEN-01
TEST_F(TuningFileTest, EachBlockIdHasItsOwn188Bytes) {
    for (unsigned blockId = 0; blockId <= 9; ++blockId) {
        setBlock(blockId, 0, std::string(BLOCK_SIZE, static_cast<char>(blockId + 1)));
    }
    for (int blockId = 0; blockId <= 9; ++blockId) {
        SCOPED_TRACE(blockId);
        const std::string text = rendered(blockId);
        const int byte = blockId + 1;
        EXPECT_EQ(lineOf(text, "qwaHFEExtent"), "qwaHFEExtent " + std::to_string(byte));
        EXPECT_EQ(lineOf(text, "qwaDNSEnable"), "qwaDNSEnable " + std::to_string(257 * byte));
    }
}

// Rules: TUN-02, TUN-03
TEST_F(TuningFileTest, PatternInOneBlockShowsInNoOther) {
    setBlock(3, 0, std::string(BLOCK_SIZE, '\x55'));
    for (int blockId = 0; blockId <= 9; ++blockId) {
        SCOPED_TRACE(blockId);
        EXPECT_EQ(rendered(blockId) == fileOfZeros(blockId), blockId != 3);
    }
}

// Rules: TUN-01, TUN-03
TEST_F(TuningFileTest, BytesAroundTheBlocksDoNotShow) {
    setDiskFromEnd(TUNING_AREA_BEFORE_END + 1024, std::string(1024, '\x55'));
    setDiskFromEnd(TUNING_AREA_BEFORE_END - 1880, std::string(4096 - 1880, '\x55'));
    EXPECT_EQ(rendered(0), fileOfZeros(0));
    EXPECT_EQ(rendered(9), fileOfZeros(9));
}

// Rules: GEN-02
TEST_F(TuningFileTest, OtherBlockIdsWriteNothing) {
    writeFile("/tmp/old.txt", OLD_CONTENT);
    for (const std::int32_t blockId : {-1, 10, 11, -10, 256, INT_MAX, INT_MIN}) {
        SCOPED_TRACE(blockId);
        generateTuningFile(blockId, ANY_TUNING_FILE);
        EXPECT_FALSE(exists(ANY_TUNING_FILE));
        generateTuningFile(blockId, "/tmp/old.txt");
        EXPECT_EQ(readFile("/tmp/old.txt"), OLD_CONTENT);
    }
}

// Rules: TUN-05
TEST_F(TuningFileTest, MissingDeviceIsRenderedAsZeros) {
    setBlock(2, 0, std::string(BLOCK_SIZE, '\x55'));
    remove(DISK_PATH);
    EXPECT_EQ(rendered(2), fileOfZeros(2));
}

// Rules: TUN-05
TEST_F(TuningFileTest, DeviceTooShortForTheSeekIsRenderedAsZeros) {
    resetDisk(TUNING_AREA_BEFORE_END);
    setBlock(2, 0, std::string(BLOCK_SIZE, '\x55'));
    EXPECT_NE(rendered(2), fileOfZeros(2));
    std::filesystem::resize_file(DISK_PATH, TUNING_AREA_BEFORE_END - 1);
    EXPECT_EQ(rendered(2), fileOfZeros(2));
}

// Rules: TUN-05
TEST_F(TuningFileTest, DeviceThatCannotBeReadIsRenderedAsZeros) {
    putFolder(DISK_PATH);
    EXPECT_EQ(rendered(2), fileOfZeros(2));
}

// Rules: TUN-05
TEST_F(TuningFileTest, RefusedReadAfterAGoodSeekIsRenderedAsZeros) {
    setBlock(2, 0, std::string(BLOCK_SIZE, '\x55'));
    {
        const DisturbedReads reads = DisturbedReads::failing();
        generateTuningFile(2, ANY_TUNING_FILE);
        EXPECT_EQ(reads.count(), 1) << "the read must come, so the seek must succeed";
    }
    EXPECT_EQ(readFile(ANY_TUNING_FILE), fileOfZeros(2));
}

// Rules: TUN-06
TEST_F(TuningFileTest, BytesThatAShortReadLacksAreRenderedAsZeros) {
    setBlock(2, 0, std::string(BLOCK_SIZE, '\x55'));
    {
        const DisturbedReads reads = DisturbedReads::ofAtMost(2 * BLOCK_SIZE + 24);
        generateTuningFile(2, ANY_TUNING_FILE);
    }
    const std::string text = readFile(ANY_TUNING_FILE);
    EXPECT_EQ(lineOf(text, "qwaHFEExtent"), "qwaHFEExtent 85");
    EXPECT_EQ(lineOf(text, "qwaNRAtten"), "qwaNRAtten 85"); // its second byte is lacking
    EXPECT_EQ(lineOf(text, "qwaRECSuppress"), "qwaRECSuppress 0");
}

// Rules: TUN-07
TEST_F(TuningFileTest, EachCallReadsTheDeviceAgain) {
    setBlock(2, 0, std::string(BLOCK_SIZE, '\x55'));
    EXPECT_EQ(lineOf(rendered(2), "qwaHFEExtent"), "qwaHFEExtent 85");
    setBlock(2, 10, "\x07");
    EXPECT_EQ(lineOf(rendered(2), "qwaHFEExtent"), "qwaHFEExtent 7");
    remove(DISK_PATH);
    EXPECT_EQ(rendered(2), fileOfZeros(2));
}

// Rules: TUN-07
TEST_F(TuningFileTest, DeviceIsReadBeforeTheFileIsOpened) {
    setBlock(3, 10, "\x07");
    generateTuningFile(3, DISK_PATH);
    EXPECT_EQ(lineOf(readFile(DISK_PATH), "qwaHFEExtent"), "qwaHFEExtent 7");
}

// Rules: RUN-05
TEST_F(TuningFileTest, DeviceIsOnlyRead) {
    const std::string pattern(BLOCK_SIZE, '\x55');
    setBlock(3, 0, pattern);
    rendered(3);
    EXPECT_EQ(diskFromEnd(TUNING_AREA_BEFORE_END - 3 * BLOCK_SIZE, BLOCK_SIZE), pattern);
    remove(DISK_PATH);
    rendered(3);
    EXPECT_FALSE(exists(DISK_PATH));
}

// Rules: RUN-09
TEST_F(TuningFileTest, LongerOlderFileIsTruncated) {
    writeFile(ANY_TUNING_FILE, std::string(10000, 'x'));
    EXPECT_EQ(rendered(2), fileOfZeros(2));
}

TEST_F(TuningFileTest, RepeatedCallGivesTheSameFile) {
    setBlock(2, 0, std::string(BLOCK_SIZE, '\x55'));
    const std::string first = rendered(2);
    EXPECT_EQ(rendered(2), first);
}

// Rules: RUN-07
TEST_F(TuningFileTest, NewFileHasMode666LessTheMask) {
    EXPECT_EQ(modeUnder(0), 0666U);
    EXPECT_EQ(modeUnder(022), 0644U);
    EXPECT_EQ(modeUnder(077), 0600U);
}

// Rules: RUN-10
TEST_F(TuningFileTest, LinkIsWrittenThrough) {
    std::filesystem::create_symlink("/tmp/target.txt", ANY_TUNING_FILE);
    EXPECT_EQ(rendered(2), fileOfZeros(2));
    EXPECT_EQ(readFile("/tmp/target.txt"), fileOfZeros(2));
}

// Rules: RUN-11
TEST_F(TuningFileTest, FileThatCannotBeOpenedIsSkipped) {
    putFolder("/tmp/folder.txt");
    std::filesystem::create_symlink("/tmp/loop.txt", "/tmp/loop.txt");
    std::filesystem::create_symlink("/nowhere/target.txt", "/tmp/dangling.txt");
    for (const char* path : {"/tmp/folder.txt", "/tmp/loop.txt", "/tmp/dangling.txt",
                             "/nowhere/tuning.txt", "/dev/hd0/tuning.txt", ""}) {
        SCOPED_TRACE(path);
        generateTuningFile(2, path);
        EXPECT_EQ(rendered(2), fileOfZeros(2));
    }
    EXPECT_TRUE(std::filesystem::is_directory("/tmp/folder.txt"));
    EXPECT_TRUE(std::filesystem::is_empty("/tmp/folder.txt"));
    EXPECT_FALSE(exists("/nowhere"));
}

// Rules: TUN-07
TEST_F(TuningFileTest, DeviceIsReadEvenWhenTheFileCannotBeOpened) {
    putFolder(ANY_TUNING_FILE);
    FileEventLog reads(IN_ACCESS, {DISK_PATH});
    generateTuningFile(3, ANY_TUNING_FILE);
    EXPECT_EQ(reads.take(), std::vector<std::string>{DISK_PATH});
}

// Rules: RUN-13
TEST_F(TuningFileTest, OlderFileStaysWhenItCannotBeOpened) {
    writeFile(ANY_TUNING_FILE, OLD_CONTENT);
    {
        const ResourceLimit limit(RLIMIT_NOFILE, 0);
        generateTuningFile(2, ANY_TUNING_FILE);
    }
    EXPECT_EQ(readFile(ANY_TUNING_FILE), OLD_CONTENT);
}

TEST_F(TuningFileTest, ReadOnlyFolderGetsNoFile) {
    writeFile("/tmp/old.txt", OLD_CONTENT);
    std::filesystem::permissions("/tmp/old.txt", std::filesystem::perms::owner_read);
    std::filesystem::permissions("/tmp", std::filesystem::perms::owner_read |
                                             std::filesystem::perms::owner_exec);
    {
        const EnforcedPermissions permissionsHold;
        generateTuningFile(2, ANY_TUNING_FILE);
        generateTuningFile(2, "/tmp/old.txt");
    }
    std::filesystem::permissions("/tmp", std::filesystem::perms::owner_all);
    EXPECT_FALSE(exists(ANY_TUNING_FILE));
    EXPECT_EQ(readFile("/tmp/old.txt"), OLD_CONTENT);
}

TEST_F(TuningFileTest, WriteErrorsAreIgnored) {
    for (const std::size_t room : {0U, 1U, 39U, 40U, 100U, 800U}) {
        SCOPED_TRACE(room);
        const int before = openDescriptors();
        {
            const ResourceLimit limit(RLIMIT_FSIZE, room);
            generateTuningFile(2, ANY_TUNING_FILE);
        }
        EXPECT_EQ(readFile(ANY_TUNING_FILE), fileOfZeros(2).substr(0, room));
        EXPECT_EQ(openDescriptors(), before);
    }
}

TEST_F(TuningFileTest, OnlyOneFileIsOpenAtATime) {
    setBlock(2, 10, "\x07");
    {
        const ResourceLimit limit(RLIMIT_NOFILE, roomForDescriptors(1));
        generateTuningFile(2, ANY_TUNING_FILE);
    }
    EXPECT_EQ(lineOf(readFile(ANY_TUNING_FILE), "qwaHFEExtent"), "qwaHFEExtent 7");
}

TEST_F(TuningFileTest, LeavesNoDescriptorOpen) {
    const int before = openDescriptors();
    EXPECT_EQ(rendered(2), fileOfZeros(2));
    generateTuningFile(2, "/nowhere/tuning.txt");
    generateTuningFile(10, ANY_TUNING_FILE);
    resetDisk(100);
    EXPECT_EQ(rendered(2), fileOfZeros(2));
    remove(DISK_PATH);
    EXPECT_EQ(rendered(2), fileOfZeros(2));
    EXPECT_EQ(openDescriptors(), before);
}

} // namespace orvane::test
