// SPDX-License-Identifier: Apache-2.0
//
// The auxiliary and the tuning area of record_area.h.
#include "config/record_area.h"
#include "config/record_slots.h"
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

#include <array>
#include <cstdint>
#include <string>
#include <vector>

namespace orvane::test {

namespace {

struct FixedArea {
    const char* name;
    std::int32_t (*read)(void*, std::uint32_t);
    std::int32_t (*write)(const void*, std::uint32_t);
    std::size_t fromEnd; ///< bytes before the end of the disk
    std::size_t offset;  ///< from the area's base
    std::uint32_t size;  ///< longest transfer
};

constexpr FixedArea AUX = {"auxiliary", readAuxArea, writeAuxArea, AUX_FROM_END, 3072, 1024};
constexpr FixedArea TUNING = {"tuning",        readTuningArea, writeTuningArea,
                              TUNING_FROM_END, 4096,           4096};

std::string nameOf(const ::testing::TestParamInfo<FixedArea>& info) {
    return info.param.name;
}

std::string lettersOfLength(std::size_t length) {
    std::string bytes;
    for (std::size_t i = 0; i < length; ++i) {
        bytes += static_cast<char>('A' + i % 23);
    }
    return bytes;
}

} // namespace

class FixedAreaTest : public AreaDiskTest, public ::testing::WithParamInterface<FixedArea> {
protected:
    std::int32_t write(const std::string& bytes) const {
        return fixed.write(bytes.data(), lengthOf(bytes));
    }

    /// Neither direction works; the buffer of the read is unchanged, no descriptor stays open.
    void expectFailure(std::uint32_t length) const {
        SCOPED_TRACE(length);
        const int before = openDescriptors();
        std::string buffer(length + 4U, '#');
        EXPECT_EQ(-1, fixed.read(buffer.data(), length));
        EXPECT_EQ(-1, fixed.write(buffer.data(), length));
        EXPECT_EQ(std::string(length + 4U, '#'), buffer);
        EXPECT_EQ(before, openDescriptors());
    }

    const FixedArea fixed = GetParam();
};

INSTANTIATE_TEST_SUITE_P(Areas, FixedAreaTest, ::testing::Values(AUX, TUNING), nameOf);

// Rules: ARE-01 to ARE-03
TEST_P(FixedAreaTest, ReadsFromItsStart) {
    for (const std::uint32_t length : {1U, 2U, 188U, 1023U, fixed.size - 1, fixed.size}) {
        SCOPED_TRACE(length);
        std::string buffer(length + 4, '#');
        EXPECT_EQ(0, fixed.read(buffer.data(), length));
        EXPECT_EQ(area().substr(fixed.offset, length) + "####", buffer);
    }
    expectUntouchedDisk();
}

// Rules: ARE-01, ARE-02, ARE-04
TEST_P(FixedAreaTest, WritesFromItsStartAndNothingElse) {
    for (const std::uint32_t length : {1U, 2U, 188U, 1023U, fixed.size - 1, fixed.size}) {
        SCOPED_TRACE(length);
        setDiskFromEnd(BASE_FROM_END, area());
        const std::string bytes = lettersOfLength(length);
        EXPECT_EQ(0, write(bytes));
        expectArea(areaWith(fixed.offset, bytes));
    }
}

// Rules: ARE-05
TEST_P(FixedAreaTest, NullBufferFails) {
    const int before = openDescriptors();
    for (const std::uint32_t length : {0U, 1U, fixed.size}) {
        EXPECT_EQ(-1, fixed.read(nullptr, length));
        EXPECT_EQ(-1, fixed.write(nullptr, length));
    }
    EXPECT_EQ(before, openDescriptors());
    expectUntouchedDisk();
}

// Rules: ARE-05
TEST_P(FixedAreaTest, LengthZeroFails) {
    expectFailure(0);
    expectUntouchedDisk();
}

// Rules: ARE-05
TEST_P(FixedAreaTest, LengthAboveTheAreaFailsAndTouchesNothing) {
    expectFailure(fixed.size + 1);
    expectFailure(fixed.size + 0x10000);
    expectUntouchedDisk();
    char byte = '#';
    EXPECT_EQ(-1, fixed.read(&byte, 0xFFFFFFFF));
    EXPECT_EQ(-1, fixed.write(&byte, 0xFFFFFFFF));
    EXPECT_EQ('#', byte);
    expectUntouchedDisk();
}

// Rules: ARE-05
TEST_P(FixedAreaTest, RefusedArgumentsLeaveTheDiskUnopened) {
    FileEventLog opens(IN_OPEN, {DISK_PATH});
    char byte = '#';
    for (const std::uint32_t length : {0U, fixed.size + 1, 0xFFFFFFFFU}) {
        EXPECT_EQ(-1, fixed.read(&byte, length));
        EXPECT_EQ(-1, fixed.write(&byte, length));
    }
    EXPECT_EQ(-1, fixed.read(nullptr, 1));
    EXPECT_EQ(-1, fixed.write(nullptr, 1));
    EXPECT_EQ(opens.take(), std::vector<std::string>());
    EXPECT_EQ(0, fixed.read(&byte, 1));
    EXPECT_EQ(opens.take(), std::vector<std::string>{DISK_PATH});
}

// Rules: ARE-06
TEST_P(FixedAreaTest, AbsentDiskFailsAndIsNotCreated) {
    remove(DISK_PATH);
    expectFailure(8);
    EXPECT_FALSE(exists(DISK_PATH));
}

TEST_P(FixedAreaTest, FolderInPlaceOfTheDiskFails) {
    putFolder(DISK_PATH);
    expectFailure(8);
}

TEST_P(FixedAreaTest, LinkToAMissingFolderInPlaceOfTheDiskFails) {
    remove(DISK_PATH);
    ASSERT_EQ(0, symlink("/missing/disk", DISK_PATH));
    expectFailure(8);
}

TEST_P(FixedAreaTest, PipeInPlaceOfTheDiskFailsAtTheSeek) {
    remove(DISK_PATH);
    ASSERT_EQ(0, mkfifo(DISK_PATH, 0600));
    const kit::Descriptor otherEnd(open(DISK_PATH, O_RDWR | O_CLOEXEC | O_NONBLOCK));
    ASSERT_EQ(2, ::write(otherEnd.number(), "xy", 2));
    expectFailure(2);
    std::string inPipe = "####";
    EXPECT_EQ(2, ::read(otherEnd.number(), inPipe.data(), 4));
    EXPECT_EQ("xy##", inPipe) << "something was transferred without a seek";
}

TEST_P(FixedAreaTest, NoFreeDescriptorFails) {
    const FixedArea target = fixed; // a sanitizer needs a descriptor to look at the fixture
    std::string buffer = "####";
    std::int32_t readResult = 0;
    std::int32_t writeResult = 0;
    {
        const ResourceLimit none(RLIMIT_NOFILE, 0);
        readResult = target.read(buffer.data(), 4);
        writeResult = target.write(buffer.data(), 4);
    }
    EXPECT_EQ(-1, readResult);
    EXPECT_EQ(-1, writeResult);
    EXPECT_EQ("####", buffer);
}

// Rules: ARE-06
TEST_P(FixedAreaTest, DiskTooShortForTheAreaFails) {
    const std::size_t size = fixed.fromEnd - 1;
    resetDisk(size);
    expectFailure(8);
    EXPECT_EQ(std::string(size, '\0'), diskFromEnd(size, size));
}

TEST_P(FixedAreaTest, DiskThatStartsAtTheAreaIsEnough) {
    resetDisk(fixed.fromEnd);
    const std::string bytes = lettersOfLength(fixed.size);
    EXPECT_EQ(0, write(bytes));
    EXPECT_EQ(fixed.fromEnd, std::filesystem::file_size(DISK_PATH));
    EXPECT_EQ(bytes + std::string(1, '\0'), diskFromEnd(fixed.fromEnd, fixed.size + 1U));
    std::string buffer(fixed.size, '#');
    EXPECT_EQ(0, fixed.read(buffer.data(), fixed.size));
    EXPECT_EQ(bytes, buffer);
}

TEST_P(FixedAreaTest, DiskLongerThan4GiBIsReachedFromItsEnd) {
    resetDisk(5ULL << 30);
    EXPECT_EQ(0, write("ABCD"));
    EXPECT_EQ(std::string("\0ABCD\0", 6), diskFromEnd(fixed.fromEnd + 1, 6));
    std::string buffer = "....";
    EXPECT_EQ(0, fixed.read(buffer.data(), 4));
    EXPECT_EQ("ABCD", buffer);
}

TEST_P(FixedAreaTest, ShortWriteIsSuccess) {
    std::int32_t result = -1;
    {
        const ResourceLimit limit(RLIMIT_FSIZE, MEBIBYTE + fixed.offset + 3);
        result = write("ABCDEFGH");
    }
    EXPECT_EQ(0, result);
    expectArea(areaWith(fixed.offset, "ABC"));
}

TEST_P(FixedAreaTest, RefusedWriteFails) {
    const int before = openDescriptors();
    std::int32_t result = 0;
    {
        const ResourceLimit limit(RLIMIT_FSIZE, MEBIBYTE + fixed.offset);
        result = write("ABCDEFGH");
    }
    EXPECT_EQ(-1, result);
    EXPECT_EQ(before, openDescriptors());
    expectUntouchedDisk();
}

TEST_P(FixedAreaTest, RefusedReadFails) {
    const EdgeOfMemory edge(0);
    ASSERT_TRUE(edge.isMade());
    const int before = openDescriptors();
    EXPECT_EQ(-1, fixed.read(edge.begin(), 4));
    EXPECT_EQ(before, openDescriptors());
}

// Rules: ARE-07
TEST_P(FixedAreaTest, ShortReadIsSuccess) {
    std::string buffer(1000, '#');
    {
        const DisturbedReads reads = DisturbedReads::ofAtMost(100);
        EXPECT_EQ(0, fixed.read(buffer.data(), 1000));
        EXPECT_EQ(1, reads.count());
    }
    EXPECT_EQ(area().substr(fixed.offset, 100) + std::string(900, '#'), buffer);
}

TEST_P(FixedAreaTest, DiskNeedsOnlyThePermissionOfTheDirection) {
    const EnforcedPermissions hold;
    ASSERT_EQ(0, chmod(DISK_PATH, 0444));
    std::string buffer = "....";
    EXPECT_EQ(0, fixed.read(buffer.data(), 4));
    EXPECT_EQ(-1, write("ABCD"));
    ASSERT_EQ(0, chmod(DISK_PATH, 0222));
    EXPECT_EQ(0, write("ABCD"));
    EXPECT_EQ(-1, fixed.read(buffer.data(), 4));
}

TEST_P(FixedAreaTest, LeavesNoDescriptorOpen) {
    const int before = openDescriptors();
    std::string buffer = "....";
    EXPECT_EQ(0, fixed.read(buffer.data(), 4));
    EXPECT_EQ(0, write("ABCD"));
    EXPECT_EQ(before, openDescriptors());
}

// Rules: ARE-01, ARE-02
TEST(FixedAreaSizeTest, SizesAreAsPublished) {
    EXPECT_EQ(1024U, AUX_AREA_SIZE);
    EXPECT_EQ(4096U, TUNING_AREA_SIZE);
}

} // namespace orvane::test
