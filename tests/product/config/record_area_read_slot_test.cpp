// SPDX-License-Identifier: Apache-2.0
//
// readRecordSlot of record_area.h.
#include "config/record_area.h"
#include "kit/host/descriptor.h"
#include "tests/product/config/area_disk.h"
#include "tests/support/disturbed_reads.h"
#include "tests/support/file_event_log.h"
#include "tests/support/permissions.h"
#include "tests/support/resource_limit.h"

#include <fcntl.h>
#include <gtest/gtest.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cstdint>
#include <string>
#include <vector>

namespace orvane::test {

class ReadRecordSlotTest : public AreaDiskTest {
protected:
    /// Reads `length` bytes into the start of `buffer`.
    static std::int32_t read(std::uint32_t slot, std::string& buffer, std::uint32_t length) {
        return readRecordSlot(slot, buffer.data(), length);
    }

    /// The read fails, zeroes its `length` bytes, and leaves no descriptor open.
    static void expectFailure(std::uint32_t slot, std::uint32_t length) {
        const int before = openDescriptors();
        std::string buffer(length + 4, '#');
        EXPECT_EQ(-1, read(slot, buffer, length));
        EXPECT_EQ(std::string(length, '\0') + "####", buffer);
        EXPECT_EQ(before, openDescriptors());
    }
};

// Rules: SLT-01 to SLT-18, SLT-20
TEST_F(ReadRecordSlotTest, EverySlotIsReadWhole) {
    for (const SlotPlace& place : SLOT_PLACES) {
        SCOPED_TRACE(place.slot);
        std::string buffer(place.size + 4, '#');
        EXPECT_EQ(0, read(place.slot, buffer, place.size));
        EXPECT_EQ(area().substr(place.offset, place.size) + "####", buffer);
    }
    expectUntouchedDisk();
}

// Rules: SLT-21
TEST_F(ReadRecordSlotTest, LongerBufferIsPaddedWithZeros) {
    for (const SlotPlace& place : SLOT_PLACES) {
        SCOPED_TRACE(place.slot);
        std::string buffer(place.size + 9, '#');
        EXPECT_EQ(0, read(place.slot, buffer, place.size + 5));
        EXPECT_EQ(area().substr(place.offset, place.size) + std::string(5, '\0') + "####", buffer);
    }
}

// Rules: SLT-20
TEST_F(ReadRecordSlotTest, ShorterBufferGetsTheFirstBytes) {
    for (const SlotPlace& place : SLOT_PLACES) {
        for (std::uint32_t length = 1; length < place.size; ++length) {
            SCOPED_TRACE(place.slot);
            std::string buffer(length + 4, '#');
            EXPECT_EQ(0, read(place.slot, buffer, length));
            EXPECT_EQ(area().substr(place.offset, length) + "####", buffer);
        }
    }
}

TEST_F(ReadRecordSlotTest, SerialSlotInto12BytesIsATerminatedString) {
    setDiskFromEnd(BASE_FROM_END - 129, "SERIAL08next");
    std::string buffer(12, '#');
    EXPECT_EQ(0, read(9, buffer, 12));
    EXPECT_EQ(std::string("SERIAL08\0\0\0\0", 12), buffer);
}

TEST_F(ReadRecordSlotTest, SerialSlotInto4BytesIsItsFirstFour) {
    setDiskFromEnd(BASE_FROM_END - 129, "SERIAL08next");
    std::string buffer = "#######";
    EXPECT_EQ(0, read(9, buffer, 4));
    EXPECT_EQ("SERI###", buffer);
}

TEST_F(ReadRecordSlotTest, SlotOfZerosIsSuccess) {
    resetDisk(2 * MEBIBYTE);
    std::string buffer = "########";
    EXPECT_EQ(0, read(9, buffer, 8));
    EXPECT_EQ(std::string(8, '\0'), buffer);
}

TEST_F(ReadRecordSlotTest, LengthLimitsWhatIsZeroed) {
    std::string buffer(100000, '#');
    EXPECT_EQ(0, read(0, buffer, 99999));
    EXPECT_EQ(area().substr(0, 1) + std::string(99998, '\0') + "#", buffer);
}

// Rules: SLT-29
TEST_F(ReadRecordSlotTest, NullBufferFails) {
    const int before = openDescriptors();
    EXPECT_EQ(-1, readRecordSlot(9, nullptr, 8));
    EXPECT_EQ(-1, readRecordSlot(9, nullptr, 0));
    EXPECT_EQ(before, openDescriptors());
}

// Rules: SLT-29
TEST_F(ReadRecordSlotTest, LengthZeroFailsAndKeepsTheBuffer) {
    std::string buffer = "####";
    EXPECT_EQ(-1, read(9, buffer, 0));
    EXPECT_EQ("####", buffer);
}

// Rules: SLT-22, SLT-23
TEST_F(ReadRecordSlotTest, UnknownSlotFailsAndLeavesZeros) {
    for (const std::uint32_t slot : UNKNOWN_SLOTS) {
        SCOPED_TRACE(slot);
        expectFailure(slot, 8);
    }
}

TEST_F(ReadRecordSlotTest, DiskIsOpenedBeforeTheSlotIsLookedUp) {
    FileEventLog opens(IN_OPEN, {DISK_PATH});
    expectFailure(18, 8);
    EXPECT_EQ(opens.take(), std::vector<std::string>{DISK_PATH});
}

// Rules: SLT-29
TEST_F(ReadRecordSlotTest, RefusedArgumentsLeaveTheDiskUnopened) {
    FileEventLog opens(IN_OPEN, {DISK_PATH});
    char byte = '#';
    EXPECT_EQ(-1, readRecordSlot(9, nullptr, 8));
    EXPECT_EQ(-1, readRecordSlot(9, &byte, 0));
    EXPECT_EQ(opens.take(), std::vector<std::string>());
}

// Rules: SLT-22, SLT-23
TEST_F(ReadRecordSlotTest, RefusedReadAfterAGoodSeekFailsAndLeavesZeros) {
    const DisturbedReads reads = DisturbedReads::failing();
    expectFailure(9, 8);
    EXPECT_EQ(1, reads.count()) << "the read must come, so the seek must succeed";
}

// Rules: SLT-24
TEST_F(ReadRecordSlotTest, ShortReadIsSuccessAndLeavesZerosAfterIt) {
    std::string buffer = "############";
    {
        const DisturbedReads reads = DisturbedReads::ofAtMost(3);
        EXPECT_EQ(0, read(9, buffer, 10));
        EXPECT_EQ(1, reads.count());
    }
    EXPECT_EQ(area().substr(129, 3) + std::string(7, '\0') + "##", buffer);
}

// Rules: SLT-22, SLT-23
TEST_F(ReadRecordSlotTest, AbsentDiskFailsAndLeavesZeros) {
    remove(DISK_PATH);
    expectFailure(9, 8);
    expectFailure(18, 8);
    EXPECT_FALSE(exists(DISK_PATH));
}

// Rules: SLT-22, SLT-23
TEST_F(ReadRecordSlotTest, FolderInPlaceOfTheDiskFailsAndLeavesZeros) {
    putFolder(DISK_PATH);
    expectFailure(9, 8);
}

TEST_F(ReadRecordSlotTest, LinkLoopInPlaceOfTheDiskFailsAndLeavesZeros) {
    remove(DISK_PATH);
    ASSERT_EQ(0, symlink(DISK_PATH, DISK_PATH));
    expectFailure(9, 8);
}

TEST_F(ReadRecordSlotTest, PipeInPlaceOfTheDiskFailsAtTheSeekAndLeavesZeros) {
    remove(DISK_PATH);
    ASSERT_EQ(0, mkfifo(DISK_PATH, 0600));
    const kit::Descriptor otherEnd(open(DISK_PATH, O_RDWR | O_CLOEXEC));
    ASSERT_EQ(8, ::write(otherEnd.number(), "ABCDEFGH", 8));
    expectFailure(9, 8);
}

TEST_F(ReadRecordSlotTest, NoFreeDescriptorFailsAndLeavesZeros) {
    std::string buffer = "########";
    std::int32_t result = 0;
    {
        const ResourceLimit none(RLIMIT_NOFILE, 0);
        result = read(9, buffer, 8);
    }
    EXPECT_EQ(-1, result);
    EXPECT_EQ(std::string(8, '\0'), buffer);
}

// Rules: SLT-22, SLT-23
TEST_F(ReadRecordSlotTest, DiskTooShortForTheSlotFailsAndLeavesZeros) {
    for (const SlotPlace& place : SLOT_PLACES) {
        SCOPED_TRACE(place.slot);
        resetDisk(BASE_FROM_END - place.offset - 1);
        expectFailure(place.slot, place.size);
    }
}

TEST_F(ReadRecordSlotTest, DiskThatStartsAtTheSlotIsEnough) {
    for (const SlotPlace& place : SLOT_PLACES) {
        SCOPED_TRACE(place.slot);
        resetDisk(BASE_FROM_END - place.offset);
        const std::string content = area().substr(place.offset, place.size);
        setDiskFromEnd(BASE_FROM_END - place.offset, content);
        std::string buffer(place.size, '#');
        EXPECT_EQ(0, read(place.slot, buffer, place.size));
        EXPECT_EQ(content, buffer);
    }
}

TEST_F(ReadRecordSlotTest, BaseOfAOneMebibyteDiskIsItsFirstByte) {
    writeFile(DISK_PATH, area());
    std::string buffer = "##";
    EXPECT_EQ(0, read(0, buffer, 2));
    EXPECT_EQ(area().substr(0, 1) + std::string(1, '\0'), buffer);
}

TEST_F(ReadRecordSlotTest, DiskLongerThan4GiBIsReadFromItsEnd) {
    resetDisk(5ULL << 30);
    setDiskFromEnd(BASE_FROM_END, area());
    std::string buffer(8, '#');
    EXPECT_EQ(0, read(9, buffer, 8));
    EXPECT_EQ(area().substr(129, 8), buffer);
}

TEST_F(ReadRecordSlotTest, DiskNeedsNoWritePermission) {
    const EnforcedPermissions hold;
    ASSERT_EQ(0, chmod(DISK_PATH, 0444));
    std::string buffer(8, '#');
    EXPECT_EQ(0, read(9, buffer, 8));
    EXPECT_EQ(area().substr(129, 8), buffer);
    ASSERT_EQ(0, chmod(DISK_PATH, 0222));
    expectFailure(9, 8);
}

TEST_F(ReadRecordSlotTest, LeavesNoDescriptorOpen) {
    const int before = openDescriptors();
    std::string buffer(8, '#');
    EXPECT_EQ(0, read(9, buffer, 8));
    EXPECT_EQ(before, openDescriptors());
}

} // namespace orvane::test
