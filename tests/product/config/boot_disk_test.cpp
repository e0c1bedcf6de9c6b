// SPDX-License-Identifier: Apache-2.0
#include "config/boot_disk.h"
#include "tests/product/config/freed_standard_input.h"
#include "tests/support/permissions.h"
#include "tests/support/resource_limit.h"
#include "tests/support/unit_test.h"

#include <fcntl.h>
#include <gtest/gtest.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cstdint>
#include <string>
#include <type_traits>

namespace orvane::test {

class BootDiskTest : public UnitTest {
protected:
    BootDiskTest() { writeFile(DISK_PATH, "0123456789"); }
};

TEST_F(BootDiskTest, CannotBeCopied) {
    EXPECT_FALSE(std::is_copy_constructible_v<BootDisk>);
    EXPECT_FALSE(std::is_copy_assignable_v<BootDisk>);
}

TEST_F(BootDiskTest, ReadsAtTheOffsetFromTheEnd) {
    BootDisk disk(O_RDONLY);
    ASSERT_TRUE(disk.isOpen());
    std::string buffer = "....";
    ASSERT_TRUE(disk.seekFromEnd(4));
    EXPECT_TRUE(disk.read(buffer.data(), 3));
    EXPECT_EQ("678.", buffer);
    ASSERT_TRUE(disk.seekFromEnd(10));
    EXPECT_TRUE(disk.read(buffer.data(), 1));
    EXPECT_EQ("078.", buffer);
}

TEST_F(BootDiskTest, WritesAtTheOffsetFromTheEndAndKeepsTheRest) {
    BootDisk disk(O_WRONLY);
    ASSERT_TRUE(disk.isOpen());
    ASSERT_TRUE(disk.seekFromEnd(4));
    EXPECT_TRUE(disk.write("abcd", 2));
    EXPECT_EQ("012345ab89", readFile(DISK_PATH));
}

TEST_F(BootDiskTest, SeekBeforeTheStartFails) {
    BootDisk disk(O_RDONLY);
    EXPECT_TRUE(disk.seekFromEnd(10));
    EXPECT_FALSE(disk.seekFromEnd(11));
    EXPECT_FALSE(disk.seekFromEnd(0x7FFFFFFF));
}

TEST_F(BootDiskTest, ShortReadSucceeds) {
    BootDisk disk(O_RDONLY);
    std::string buffer = "......";
    ASSERT_TRUE(disk.seekFromEnd(4));
    EXPECT_TRUE(disk.read(buffer.data(), 6));
    EXPECT_EQ("6789..", buffer);
    EXPECT_TRUE(disk.read(buffer.data(), 6)) << "nothing is left to read";
    EXPECT_EQ("6789..", buffer);
}

TEST_F(BootDiskTest, ShortWriteSucceedsAndRefusedWriteFails) {
    BootDisk disk(O_WRONLY);
    ASSERT_TRUE(disk.seekFromEnd(4));
    bool isShortWritten = false;
    bool isRefusedWritten = true;
    {
        const ResourceLimit limit(RLIMIT_FSIZE, 8);
        isShortWritten = disk.write("abcd", 4);
        isRefusedWritten = disk.write("efgh", 4);
    }
    EXPECT_TRUE(isShortWritten);
    EXPECT_FALSE(isRefusedWritten);
    EXPECT_EQ("012345ab89", readFile(DISK_PATH));
}

TEST_F(BootDiskTest, FlagsChooseTheDirection) {
    std::string buffer = "....";
    BootDisk forReading(O_RDONLY);
    ASSERT_TRUE(forReading.seekFromEnd(4));
    EXPECT_FALSE(forReading.write("abcd", 4));
    BootDisk forWriting(O_WRONLY);
    ASSERT_TRUE(forWriting.seekFromEnd(4));
    EXPECT_FALSE(forWriting.read(buffer.data(), 4));
    EXPECT_EQ("....", buffer);
    EXPECT_EQ("0123456789", readFile(DISK_PATH));
}

TEST_F(BootDiskTest, NeedsOnlyThePermissionsOfItsFlags) {
    const EnforcedPermissions hold;
    ASSERT_EQ(0, chmod(DISK_PATH, 0444));
    EXPECT_TRUE(BootDisk(O_RDONLY).isOpen());
    EXPECT_FALSE(BootDisk(O_WRONLY).isOpen());
    ASSERT_EQ(0, chmod(DISK_PATH, 0222));
    EXPECT_FALSE(BootDisk(O_RDONLY).isOpen());
    EXPECT_TRUE(BootDisk(O_WRONLY).isOpen());
}

TEST_F(BootDiskTest, AbsentDiskIsNeitherOpenNorCreated) {
    remove(DISK_PATH);
    for (const int flags : {O_RDONLY, O_WRONLY}) {
        SCOPED_TRACE(flags);
        std::string buffer = "....";
        BootDisk disk(flags);
        EXPECT_FALSE(disk.isOpen());
        EXPECT_FALSE(disk.seekFromEnd(0));
        EXPECT_FALSE(disk.read(buffer.data(), 4));
        EXPECT_FALSE(disk.write(buffer.data(), 4));
        EXPECT_EQ("....", buffer);
    }
    EXPECT_FALSE(exists(DISK_PATH));
}

TEST_F(BootDiskTest, DanglingLinkIsNotOpen) {
    remove(DISK_PATH);
    ASSERT_EQ(0, symlink(DISK_PATH, DISK_PATH));
    EXPECT_FALSE(BootDisk(O_RDONLY).isOpen());
    remove(DISK_PATH);
    ASSERT_EQ(0, symlink("/missing/disk", DISK_PATH));
    EXPECT_FALSE(BootDisk(O_RDONLY).isOpen());
}

TEST_F(BootDiskTest, IsNotOpenWithoutAFreeDescriptor) {
    const ResourceLimit none(RLIMIT_NOFILE, 0);
    EXPECT_FALSE(BootDisk(O_RDONLY).isOpen());
}

TEST_F(BootDiskTest, DestructionReleasesTheDescriptor) {
    const int before = openDescriptors();
    {
        const BootDisk disk(O_RDONLY);
        EXPECT_EQ(before + 1, openDescriptors());
    }
    EXPECT_EQ(before, openDescriptors());
}

TEST_F(BootDiskTest, DescriptorZeroIsHeldAndReleasedLikeAnyOther) {
    const FreedStandardInput freed;
    std::string buffer = "....";
    {
        BootDisk disk(O_RDONLY);
        EXPECT_NE(-1, fcntl(0, F_GETFD));
        EXPECT_TRUE(disk.isOpen());
        EXPECT_TRUE(disk.seekFromEnd(4));
        EXPECT_TRUE(disk.read(buffer.data(), 4));
    }
    EXPECT_EQ("6789", buffer);
    EXPECT_EQ(-1, fcntl(0, F_GETFD));
}

TEST_F(BootDiskTest, ClosedDiskReleasesNothing) {
    // An owner that mistook its failure for descriptor 0 would close that.
    const int before = openDescriptors();
    remove(DISK_PATH);
    { const BootDisk disk(O_RDONLY); }
    EXPECT_EQ(before, openDescriptors());
}

TEST_F(BootDiskTest, DiskLongerThan4GiBIsReachedAtBothEnds) {
    constexpr std::int64_t LENGTH = 5LL << 30;
    resetDisk(LENGTH);
    {
        BootDisk disk(O_WRONLY);
        ASSERT_TRUE(disk.seekFromEnd(LENGTH));
        EXPECT_TRUE(disk.write("abcd", 4));
        ASSERT_TRUE(disk.seekFromEnd(4));
        EXPECT_TRUE(disk.write("wxyz", 4));
        EXPECT_FALSE(disk.seekFromEnd(LENGTH + 1));
    }
    EXPECT_EQ("abcd", diskFromEnd(LENGTH, 4));
    EXPECT_EQ("wxyz", diskFromEnd(4, 4));
    std::string buffer = "....";
    BootDisk disk(O_RDONLY);
    ASSERT_TRUE(disk.seekFromEnd(LENGTH));
    EXPECT_TRUE(disk.read(buffer.data(), 4));
    EXPECT_EQ("abcd", buffer);
}

} // namespace orvane::test
