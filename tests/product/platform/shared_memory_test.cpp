// SPDX-License-Identifier: Apache-2.0
#include "kit/host/descriptor.h"
#include "platform/shared_memory.h"
#include "tests/support/resource_limit.h"
#include "tests/support/unit_test.h"

#include <fcntl.h>
#include <gtest/gtest.h>
#include <sys/mman.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <string>

namespace orvane::test {

namespace {

constexpr char OBJECT[] = "/fs/tmpfs/an/object";

kit::Descriptor openObject(const char* name, int flags, mode_t mode = 0640) {
    errno = 0;
    return kit::Descriptor(platform::openSharedMemory(name, flags, mode));
}

} // namespace

class SharedMemoryTest : public UnitTest {
protected:
    SharedMemoryTest() {
        std::filesystem::create_directories("/fs/tmpfs/an");
        writeFile(OBJECT, "0123456789");
    }
    ~SharedMemoryTest() override { umask(formerMask); }

    mode_t formerMask = umask(0);
};

TEST_F(SharedMemoryTest, NameWithInnerSlashesIsOpenedAsThatPath) {
    const kit::Descriptor object = openObject(OBJECT, O_RDONLY);
    ASSERT_TRUE(object.isOpen());
    struct stat opened {};
    struct stat wanted {};
    ASSERT_EQ(0, fstat(object.number(), &opened));
    ASSERT_EQ(0, stat(OBJECT, &wanted));
    EXPECT_EQ(wanted.st_ino, opened.st_ino);
    EXPECT_EQ(wanted.st_dev, opened.st_dev);
    std::string content(10, '.');
    EXPECT_EQ(10, read(object.number(), content.data(), content.size()));
    EXPECT_EQ("0123456789", content);
}

TEST_F(SharedMemoryTest, AbsentObjectFailsAndIsNotCreated) {
    remove(OBJECT);
    EXPECT_EQ(-1, platform::openSharedMemory(OBJECT, O_RDONLY, 0640));
    EXPECT_EQ(ENOENT, errno);
    EXPECT_FALSE(exists(OBJECT));
}

TEST_F(SharedMemoryTest, AbsentFolderFails) {
    EXPECT_EQ(-1, platform::openSharedMemory("/fs/missing/object", O_RDONLY, 0640));
    EXPECT_EQ(ENOENT, errno);
}

TEST_F(SharedMemoryTest, FileInPlaceOfAFolderFails) {
    EXPECT_EQ(-1, platform::openSharedMemory("/fs/tmpfs/an/object/inner", O_RDONLY, 0640));
    EXPECT_EQ(ENOTDIR, errno);
}

// A name without inner slashes is where the C library keeps such objects.

TEST_F(SharedMemoryTest, ObjectMadeByTheCLibraryIsFound) {
    std::filesystem::create_directories("/dev/shm");
    const kit::Descriptor made(shm_open("/flat", O_RDWR | O_CREAT | O_EXCL, 0640));
    ASSERT_TRUE(made.isOpen());
    ASSERT_EQ(3, write(made.number(), "abc", 3));
    errno = EINVAL; // from an earlier failure, which must not matter
    const kit::Descriptor object(platform::openSharedMemory("/flat", O_RDONLY, 0640));
    std::string content = "....";
    EXPECT_EQ(3, read(object.number(), content.data(), content.size()));
    EXPECT_EQ("abc.", content);
}

TEST_F(SharedMemoryTest, ObjectUnknownToTheCLibraryFails) {
    std::filesystem::create_directories("/dev/shm");
    writeFile("/flat", "a file of the same name");
    EXPECT_EQ(-1, platform::openSharedMemory("/flat", O_RDONLY, 0640));
    EXPECT_EQ(ENOENT, errno);
}

TEST_F(SharedMemoryTest, NoFreeDescriptorFails) {
    int descriptor = 0;
    int error = 0;
    {
        const ResourceLimit none(RLIMIT_NOFILE, 0);
        descriptor = platform::openSharedMemory(OBJECT, O_RDONLY, 0640);
        error = errno;
    }
    EXPECT_EQ(-1, descriptor);
    EXPECT_EQ(EMFILE, error);
}

TEST_F(SharedMemoryTest, FlagsChooseTheDirection) {
    const kit::Descriptor forReading = openObject(OBJECT, O_RDONLY);
    EXPECT_EQ(O_RDONLY, fcntl(forReading.number(), F_GETFL) & O_ACCMODE);
    EXPECT_EQ(-1, write(forReading.number(), "x", 1));
    const kit::Descriptor forBoth = openObject(OBJECT, O_RDWR);
    EXPECT_EQ(O_RDWR, fcntl(forBoth.number(), F_GETFL) & O_ACCMODE);
    EXPECT_EQ(1, write(forBoth.number(), "x", 1));
    EXPECT_EQ("x123456789", readFile(OBJECT));
}

TEST_F(SharedMemoryTest, NewObjectHasTheGivenMode) {
    remove(OBJECT);
    ASSERT_TRUE(openObject(OBJECT, O_RDWR | O_CREAT, 0640).isOpen());
    struct stat made {};
    ASSERT_EQ(0, stat(OBJECT, &made));
    EXPECT_EQ(0640U, made.st_mode & 07777U);
    remove(OBJECT);
    ASSERT_TRUE(openObject(OBJECT, O_RDWR | O_CREAT, 0604).isOpen());
    ASSERT_EQ(0, stat(OBJECT, &made));
    EXPECT_EQ(0604U, made.st_mode & 07777U);
}

TEST_F(SharedMemoryTest, ExclusiveCreationOfAnExistingObjectFails) {
    EXPECT_EQ(-1, platform::openSharedMemory(OBJECT, O_RDWR | O_CREAT | O_EXCL, 0640));
    EXPECT_EQ(EEXIST, errno);
    EXPECT_EQ("0123456789", readFile(OBJECT));
}

TEST_F(SharedMemoryTest, ObjectIsTruncatedOnRequest) {
    EXPECT_TRUE(openObject(OBJECT, O_RDWR | O_TRUNC).isOpen());
    EXPECT_EQ("", readFile(OBJECT));
}

TEST_F(SharedMemoryTest, EveryOpenHasItsOwnDescriptor) {
    const int before = openDescriptors();
    const kit::Descriptor first = openObject(OBJECT, O_RDONLY);
    const kit::Descriptor second = openObject(OBJECT, O_RDONLY);
    EXPECT_NE(first.number(), second.number());
    EXPECT_EQ(before + 2, openDescriptors());
}

} // namespace orvane::test
