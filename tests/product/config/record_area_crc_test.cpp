// SPDX-License-Identifier: Apache-2.0
//
// recordAreaCrc of record_area.h.
#include "config/record_area.h"
#include "kit/host/descriptor.h"
#include "tests/product/config/area_disk.h"
#include "tests/support/disturbed_reads.h"
#include "tests/support/permissions.h"
#include "tests/support/resource_limit.h"

#include <fcntl.h>
#include <gtest/gtest.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cstdint>
#include <string>

namespace orvane::test {

namespace {

constexpr std::uint32_t FAILED = 0xFFFFFFFF;

/// The usual CRC-32, by the polynomial, a bit at a time and with the final complement.
std::uint32_t referenceCrc(const std::string& bytes) {
    std::uint32_t crc = 0xFFFFFFFFU;
    for (const char byte : bytes) {
        crc ^= static_cast<std::uint8_t>(byte);
        for (int bit = 0; bit < 8; ++bit) {
            crc = (crc & 1U) != 0 ? (crc >> 1) ^ 0xEDB88320U : crc >> 1;
        }
    }
    return ~crc;
}

} // namespace

class RecordAreaCrcTest : public AreaDiskTest {
protected:
    static void expectFailure() {
        const int before = openDescriptors();
        EXPECT_EQ(FAILED, recordAreaCrc());
        EXPECT_EQ(before, openDescriptors());
    }
};

TEST_F(RecordAreaCrcTest, ReferenceGivesThePublishedCheckValue) {
    EXPECT_EQ(0xCBF43926U, referenceCrc("123456789"));
}

TEST_F(RecordAreaCrcTest, IsTheComplementOfTheUsualCrcForZeros) {
    resetDisk(2 * MEBIBYTE);
    EXPECT_EQ(~referenceCrc(std::string(136, '\0')), recordAreaCrc());
}

// Rules: CRC-01, CRC-03
TEST_F(RecordAreaCrcTest, IsTheComplementOfTheUsualCrcForSlot15) {
    EXPECT_EQ(~referenceCrc(area().substr(1, 136)), recordAreaCrc());
    expectUntouchedDisk();
}

// Rules: CRC-03
TEST_F(RecordAreaCrcTest, IsAKnownRegisterForAKnownRecord) {
    // Both figures are the complement of zlib's crc32 of the 136 bytes.
    resetDisk(2 * MEBIBYTE);
    EXPECT_EQ(0x88CCCC19U, recordAreaCrc());
    setDiskFromEnd(BASE_FROM_END - 1, "123456789");
    EXPECT_EQ(0xC89E2DF9U, recordAreaCrc());
}

// Rules: CRC-01
TEST_F(RecordAreaCrcTest, EveryByteOfSlot15Counts) {
    const std::uint32_t before = recordAreaCrc();
    for (std::size_t offset = 1; offset <= 136; ++offset) {
        setDiskFromEnd(BASE_FROM_END - offset, std::string(1, '\0'));
        EXPECT_NE(before, recordAreaCrc()) << offset;
        setDiskFromEnd(BASE_FROM_END - offset, area().substr(offset, 1));
    }
    EXPECT_EQ(before, recordAreaCrc());
}

// Rules: CRC-01
TEST_F(RecordAreaCrcTest, BytesOutsideSlot15DoNotCount) {
    const std::uint32_t before = recordAreaCrc();
    setDiskFromEnd(BASE_FROM_END, std::string(1, '\0'));
    setDiskFromEnd(BASE_FROM_END - 137, std::string(1, '\0'));
    EXPECT_EQ(before, recordAreaCrc());
}

// Rules: CRC-04
TEST_F(RecordAreaCrcTest, AbsentDiskIsAllOnes) {
    remove(DISK_PATH);
    expectFailure();
    EXPECT_FALSE(exists(DISK_PATH));
}

// Rules: CRC-04
TEST_F(RecordAreaCrcTest, FolderInPlaceOfTheDiskIsAllOnes) {
    putFolder(DISK_PATH);
    expectFailure();
}

TEST_F(RecordAreaCrcTest, PipeInPlaceOfTheDiskIsAllOnes) {
    remove(DISK_PATH);
    ASSERT_EQ(0, mkfifo(DISK_PATH, 0600));
    const kit::Descriptor otherEnd(open(DISK_PATH, O_RDWR | O_CLOEXEC));
    ASSERT_EQ(136, ::write(otherEnd.number(), area().data(), 136));
    expectFailure();
}

TEST_F(RecordAreaCrcTest, NoFreeDescriptorIsAllOnes) {
    const ResourceLimit none(RLIMIT_NOFILE, 0);
    EXPECT_EQ(FAILED, recordAreaCrc());
}

// Rules: CRC-04
TEST_F(RecordAreaCrcTest, RefusedReadAfterAGoodSeekIsAllOnes) {
    const DisturbedReads reads = DisturbedReads::failing();
    expectFailure();
    EXPECT_EQ(1, reads.count()) << "the read must come, so the seek must succeed";
}

// Rules: CRC-05
TEST_F(RecordAreaCrcTest, BytesThatAShortReadLacksCountAsZeros) {
    std::uint32_t crc = 0;
    {
        const DisturbedReads reads = DisturbedReads::ofAtMost(100);
        crc = recordAreaCrc();
        EXPECT_EQ(1, reads.count());
    }
    EXPECT_EQ(~referenceCrc(area().substr(1, 100) + std::string(36, '\0')), crc);
}

// Rules: CRC-04
TEST_F(RecordAreaCrcTest, DiskTooShortForSlot15IsAllOnes) {
    writeFile(DISK_PATH, area().substr(2));
    expectFailure();
}

TEST_F(RecordAreaCrcTest, DiskThatStartsAtSlot15HasACrc) {
    writeFile(DISK_PATH, area().substr(1));
    EXPECT_EQ(~referenceCrc(area().substr(1, 136)), recordAreaCrc());
}

TEST_F(RecordAreaCrcTest, DiskLongerThan4GiBIsReadFromItsEnd) {
    resetDisk(5ULL << 30);
    setDiskFromEnd(BASE_FROM_END, area());
    EXPECT_EQ(~referenceCrc(area().substr(1, 136)), recordAreaCrc());
}

TEST_F(RecordAreaCrcTest, DiskNeedsNoWritePermission) {
    const EnforcedPermissions hold;
    ASSERT_EQ(0, chmod(DISK_PATH, 0444));
    EXPECT_EQ(~referenceCrc(area().substr(1, 136)), recordAreaCrc());
    ASSERT_EQ(0, chmod(DISK_PATH, 0222));
    expectFailure();
}

TEST_F(RecordAreaCrcTest, LeavesNoDescriptorOpen) {
    const int before = openDescriptors();
    EXPECT_NE(FAILED, recordAreaCrc());
    EXPECT_EQ(before, openDescriptors());
}

} // namespace orvane::test
