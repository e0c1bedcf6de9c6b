// SPDX-License-Identifier: Apache-2.0
//
// writeRecordSlot of record_area.h.
#include "config/record_area.h"
#include "kit/host/descriptor.h"
#include "tests/product/config/area_disk.h"
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

class WriteRecordSlotTest : public AreaDiskTest {
protected:
    static std::int32_t write(std::uint32_t slot, const std::string& bytes) {
        // Its own block, so that a memory checker sees every byte read beyond it.
        const std::vector<char> block(bytes.begin(), bytes.end());
        return writeRecordSlot(slot, block.data(), lengthOf(block));
    }

    static void expectFailure(std::uint32_t slot, const std::string& bytes) {
        const int before = openDescriptors();
        EXPECT_EQ(-1, write(slot, bytes));
        EXPECT_EQ(before, openDescriptors());
    }

    /// Bytes that all differ from those on the disk at that place.
    static std::string newBytes(std::size_t offset, std::size_t length) {
        std::string bytes;
        for (std::size_t i = 0; i < length; ++i) {
            bytes += static_cast<char>(markedAreaByte(offset + i) ^ 0x55);
        }
        return bytes;
    }
};

// Rules: SLT-01 to SLT-18, SLT-25
TEST_F(WriteRecordSlotTest, EverySlotIsWrittenWholeAndNothingElse) {
    for (const SlotPlace& place : SLOT_PLACES) {
        SCOPED_TRACE(place.slot);
        setDiskFromEnd(BASE_FROM_END, area());
        const std::string bytes = newBytes(place.offset, place.size);
        EXPECT_EQ(0, write(place.slot, bytes));
        expectArea(areaWith(place.offset, bytes));
    }
}

// Rules: SLT-26
TEST_F(WriteRecordSlotTest, ShorterBufferIsPaddedWithZeros) {
    for (const SlotPlace& place : SLOT_PLACES) {
        if (place.size == 1) {
            continue; // cannot have a shorter buffer
        }
        SCOPED_TRACE(place.slot);
        for (const std::uint32_t length : {1U, place.size - 1}) {
            setDiskFromEnd(BASE_FROM_END, area());
            const std::string bytes = newBytes(place.offset, length);
            EXPECT_EQ(0, write(place.slot, bytes));
            expectArea(areaWith(place.offset, bytes + std::string(place.size - length, '\0')));
        }
    }
}

// Rules: SLT-27
TEST_F(WriteRecordSlotTest, ExcessOfALongerBufferIsIgnored) {
    for (const SlotPlace& place : SLOT_PLACES) {
        SCOPED_TRACE(place.slot);
        setDiskFromEnd(BASE_FROM_END, area());
        const std::string bytes = newBytes(place.offset, place.size + 1);
        EXPECT_EQ(0, write(place.slot, bytes));
        expectArea(areaWith(place.offset, bytes.substr(0, place.size)));
    }
}

// Rules: SLT-26
TEST_F(WriteRecordSlotTest, TwoBytesIntoSlot1AreFollowedBy14Zeros) {
    EXPECT_EQ(0, write(1, "\x41\x42"));
    expectArea(areaWith(1, "\x41\x42" + std::string(14, '\0')));
}

// Rules: SLT-27
TEST_F(WriteRecordSlotTest, TwentyBytesIntoSlot0WriteOne) {
    EXPECT_EQ(0, write(0, "abcdefghijklmnopqrst"));
    expectArea(areaWith(0, "a"));
}

TEST_F(WriteRecordSlotTest, PaddingIsNotPutIntoTheCallersBuffer) {
    std::string buffer = "AB, and room for a slot of 16 bytes";
    EXPECT_EQ(0, writeRecordSlot(1, buffer.data(), 2));
    EXPECT_EQ("AB, and room for a slot of 16 bytes", buffer);
}

TEST_F(WriteRecordSlotTest, WrittenSlotIsReadBack) {
    EXPECT_EQ(0, write(9, "SER-42"));
    std::string buffer(12, '#');
    EXPECT_EQ(0, readRecordSlot(9, buffer.data(), 12));
    EXPECT_EQ("SER-42" + std::string(6, '\0'), buffer);
}

// Rules: SLT-29
TEST_F(WriteRecordSlotTest, NullBufferFails) {
    const int before = openDescriptors();
    EXPECT_EQ(-1, writeRecordSlot(9, nullptr, 8));
    EXPECT_EQ(-1, writeRecordSlot(9, nullptr, 0));
    EXPECT_EQ(before, openDescriptors());
    expectUntouchedDisk();
}

// Rules: SLT-29
TEST_F(WriteRecordSlotTest, LengthZeroFailsAndWritesNoPadding) {
    EXPECT_EQ(-1, writeRecordSlot(9, "ABCDEFGH", 0));
    expectUntouchedDisk();
}

// Rules: SLT-28
TEST_F(WriteRecordSlotTest, UnknownSlotFailsAndWritesNothing) {
    for (const std::uint32_t slot : UNKNOWN_SLOTS) {
        SCOPED_TRACE(slot);
        expectFailure(slot, "ABCDEFGH");
    }
    expectUntouchedDisk();
}

TEST_F(WriteRecordSlotTest, DiskIsOpenedBeforeTheSlotIsLookedUp) {
    FileEventLog opens(IN_OPEN, {DISK_PATH});
    expectFailure(18, "ABCDEFGH");
    EXPECT_EQ(opens.take(), std::vector<std::string>{DISK_PATH});
}

// Rules: SLT-29
TEST_F(WriteRecordSlotTest, RefusedArgumentsLeaveTheDiskUnopened) {
    FileEventLog opens(IN_OPEN, {DISK_PATH});
    EXPECT_EQ(-1, writeRecordSlot(9, nullptr, 8));
    EXPECT_EQ(-1, writeRecordSlot(9, "ABCDEFGH", 0));
    EXPECT_EQ(opens.take(), std::vector<std::string>());
}

// Rules: SLT-28
TEST_F(WriteRecordSlotTest, AbsentDiskFailsAndIsNotCreated) {
    remove(DISK_PATH);
    expectFailure(9, "ABCDEFGH");
    EXPECT_FALSE(exists(DISK_PATH));
}

TEST_F(WriteRecordSlotTest, FolderInPlaceOfTheDiskFails) {
    putFolder(DISK_PATH);
    expectFailure(9, "ABCDEFGH");
}

TEST_F(WriteRecordSlotTest, PipeInPlaceOfTheDiskFailsAtTheSeek) {
    remove(DISK_PATH);
    ASSERT_EQ(0, mkfifo(DISK_PATH, 0600));
    const kit::Descriptor otherEnd(open(DISK_PATH, O_RDWR | O_CLOEXEC | O_NONBLOCK));
    expectFailure(9, "ABCDEFGH");
    expectFailure(9, "AB");
    char byte = '#';
    EXPECT_EQ(-1, ::read(otherEnd.number(), &byte, 1)) << "something was written without a seek";
}

TEST_F(WriteRecordSlotTest, NoFreeDescriptorFails) {
    std::int32_t result = 0;
    {
        const ResourceLimit none(RLIMIT_NOFILE, 0);
        result = write(9, "ABCDEFGH");
    }
    EXPECT_EQ(-1, result);
    expectUntouchedDisk();
}

// Rules: SLT-28
TEST_F(WriteRecordSlotTest, DiskTooShortForTheSlotFails) {
    for (const SlotPlace& place : SLOT_PLACES) {
        SCOPED_TRACE(place.slot);
        const std::size_t size = BASE_FROM_END - place.offset - 1;
        resetDisk(size);
        expectFailure(place.slot, newBytes(place.offset, place.size));
        EXPECT_EQ(std::string(size, '\0'), diskFromEnd(size, size));
    }
}

TEST_F(WriteRecordSlotTest, DiskThatStartsAtTheSlotIsEnough) {
    for (const SlotPlace& place : SLOT_PLACES) {
        SCOPED_TRACE(place.slot);
        const std::size_t size = BASE_FROM_END - place.offset;
        resetDisk(size);
        const std::string bytes = newBytes(place.offset, place.size);
        EXPECT_EQ(0, write(place.slot, bytes));
        EXPECT_EQ(size, std::filesystem::file_size(DISK_PATH));
        EXPECT_EQ(bytes + std::string(4, '\0'), diskFromEnd(size, place.size + 4));
    }
}

TEST_F(WriteRecordSlotTest, DiskLongerThan4GiBIsWrittenAtItsEnd) {
    resetDisk(5ULL << 30);
    EXPECT_EQ(0, write(9, "ABCDEFGH"));
    EXPECT_EQ(5ULL << 30, std::filesystem::file_size(DISK_PATH));
    EXPECT_EQ(std::string("\0ABCDEFGH\0", 10), diskFromEnd(BASE_FROM_END - 128, 10));
}

TEST_F(WriteRecordSlotTest, ShortWriteIsSuccess) {
    // The limit lies three bytes after the start of slot 2.
    std::int32_t whole = -1;
    {
        const ResourceLimit limit(RLIMIT_FSIZE, MEBIBYTE + 20);
        whole = write(2, "ABCDEFGHIJKLMNOP");
    }
    EXPECT_EQ(0, whole);
    expectArea(areaWith(17, "ABC"));
}

TEST_F(WriteRecordSlotTest, ShortWriteOfAPaddedBlockIsSuccess) {
    std::int32_t padded = -1;
    {
        const ResourceLimit limit(RLIMIT_FSIZE, MEBIBYTE + 20);
        padded = write(2, "AB");
    }
    EXPECT_EQ(0, padded);
    expectArea(areaWith(17, std::string("AB\0", 3)));
}

TEST_F(WriteRecordSlotTest, RefusedWriteFails) {
    const int before = openDescriptors();
    std::int32_t whole = 0;
    std::int32_t padded = 0;
    {
        const ResourceLimit limit(RLIMIT_FSIZE, MEBIBYTE + 17);
        whole = write(2, "ABCDEFGHIJKLMNOP");
        padded = write(2, "AB");
    }
    EXPECT_EQ(-1, whole);
    EXPECT_EQ(-1, padded);
    EXPECT_EQ(before, openDescriptors());
    expectUntouchedDisk();
}

TEST_F(WriteRecordSlotTest, DiskNeedsNoReadPermission) {
    const EnforcedPermissions hold;
    ASSERT_EQ(0, chmod(DISK_PATH, 0444));
    expectFailure(9, "hgfedcba");
    ASSERT_EQ(0, chmod(DISK_PATH, 0222));
    EXPECT_EQ(0, write(9, "ABCDEFGH"));
    ASSERT_EQ(0, chmod(DISK_PATH, 0644));
    expectArea(areaWith(129, "ABCDEFGH"));
}

TEST_F(WriteRecordSlotTest, LeavesNoDescriptorOpen) {
    const int before = openDescriptors();
    EXPECT_EQ(0, write(9, "ABCDEFGH"));
    EXPECT_EQ(0, write(9, "AB"));
    EXPECT_EQ(before, openDescriptors());
}

} // namespace orvane::test
