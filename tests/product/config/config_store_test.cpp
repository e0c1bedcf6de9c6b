// SPDX-License-Identifier: Apache-2.0
#include "config/config_store.h"
#include "config/param_access.h"
#include "kit/host/descriptor.h"
#include "tests/product/config/memory_map.h"
#include "tests/support/permissions.h"
#include "tests/support/resource_limit.h"
#include "tests/support/unit_test.h"

#include <fcntl.h>
#include <gtest/gtest.h>
#include <sys/mman.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cstddef>
#include <cstdint>
#include <filesystem>
#include <string>
#include <type_traits>

namespace orvane::test {

class ConfigStoreTest : public UnitTest {
protected:
    static bool isOpenDescriptor(int descriptor) { return fcntl(descriptor, F_GETFD) != -1; }

    static void expectClosed(const ConfigStore& store) {
        EXPECT_EQ(-1, store.descriptor);
        EXPECT_EQ(nullptr, store.data);
    }
};

TEST_F(ConfigStoreTest, HasThreeFieldsInOrder) {
    EXPECT_EQ(0U, offsetof(ConfigStore, descriptor));
    EXPECT_LT(offsetof(ConfigStore, descriptor), offsetof(ConfigStore, data));
    EXPECT_LT(offsetof(ConfigStore, data), offsetof(ConfigStore, length));
    EXPECT_TRUE((std::is_same_v<std::int32_t, decltype(ConfigStore::descriptor)>));
    EXPECT_TRUE((std::is_same_v<const std::uint8_t*, decltype(ConfigStore::data)>));
    EXPECT_TRUE((std::is_same_v<std::uint32_t, decltype(ConfigStore::length)>));
}

TEST_F(ConfigStoreTest, CannotBeCopied) {
    EXPECT_FALSE(std::is_copy_constructible_v<ConfigStore>);
    EXPECT_FALSE(std::is_copy_assignable_v<ConfigStore>);
}

// Rules: IMG-01
TEST_F(ConfigStoreTest, NamesAreFixed) {
    EXPECT_STREQ("/fs/tmpfs/VS_DIAG_SERVICE_CONFIG_SHARED_MEM", CONFIG_SHM_NAME);
    EXPECT_STREQ("/fs/rwdata/CALS", CAL_FILE_DIR);
    EXPECT_STREQ("cal_active.bin", CAL_FILE_NAME);
}

TEST_F(ConfigStoreTest, CalibrationPathIsFolderSlashName) {
    const CalibrationPath path = composeCalibrationPath();
    ASSERT_EQ(sizeof "/fs/rwdata/CALS/cal_active.bin", path.size());
    EXPECT_STREQ("/fs/rwdata/CALS/cal_active.bin", path.data());
}

TEST_F(ConfigStoreTest, NewHandleIsClosed) {
    const ConfigStore store;
    expectClosed(store);
    EXPECT_EQ(0U, store.length);
}

// Rules: PAR-15
TEST_F(ConfigStoreTest, InitClosesWithoutReleasing) {
    ConfigStore store;
    ASSERT_EQ(0, store.open());
    const std::int32_t descriptor = store.descriptor;
    const std::uint8_t* data = store.data;
    store.init();
    expectClosed(store);
    EXPECT_EQ(0U, store.length);
    EXPECT_TRUE(isOpenDescriptor(descriptor));

    store.descriptor = descriptor;
    store.data = data;
    store.length = 179;
}

// Rules: PAR-01
TEST_F(ConfigStoreTest, OpenMapsTheWholeImage) {
    setImage(0, "\x11");
    setImage(178, "\x22");
    ConfigStore store;
    store.init();
    ASSERT_EQ(0, store.open());
    EXPECT_TRUE(isOpenDescriptor(store.descriptor));
    ASSERT_NE(nullptr, store.data);
    EXPECT_EQ(179U, store.length);
    EXPECT_EQ(0x11, store.data[0]);
    EXPECT_EQ(0x22, store.data[178]);
}

// Rules: IMG-06
TEST_F(ConfigStoreTest, ContentIsNotValidated) {
    // Longer than the catalogue, several pages, all 0xFF.
    writeImage(std::string(20000, '\xFF') + "\x5A");
    ConfigStore store;
    ASSERT_EQ(0, store.open());
    EXPECT_EQ(20001U, store.length);
    EXPECT_EQ(0xFF, store.data[0]);
    EXPECT_EQ(0x5A, store.data[20000]);
}

TEST_F(ConfigStoreTest, MappingIsPrivateReadOnlyAndGoneAfterClose) {
    writeImage(std::string(20000, '\x01'));
    ConfigStore store;
    ASSERT_EQ(0, store.open());
    const std::uint8_t* first = store.data;
    const std::uint8_t* last = store.data + store.length - 1;
    leave();
    EXPECT_EQ("r--p", mappingRights(first));
    EXPECT_EQ("r--p", mappingRights(last));
    store.close();
    EXPECT_EQ("none", mappingRights(first));
    EXPECT_EQ("none", mappingRights(last));
}

TEST_F(ConfigStoreTest, ObjectIsOpenedForReadingOnlyAndRewound) {
    ConfigStore store;
    ASSERT_EQ(0, store.open());
    EXPECT_EQ(O_RDONLY, fcntl(store.descriptor, F_GETFL) & O_ACCMODE);
    EXPECT_EQ(0, lseek(store.descriptor, 0, SEEK_CUR));
}

TEST_F(ConfigStoreTest, ObjectNeedsNoWritePermission) {
    const EnforcedPermissions hold;
    ASSERT_EQ(0, chmod(IMAGE_PATH, 0444));
    ConfigStore store;
    EXPECT_EQ(0, store.open());
}

TEST_F(ConfigStoreTest, UnreadableObjectIsMinus2) {
    const EnforcedPermissions hold;
    ASSERT_EQ(0, chmod(IMAGE_PATH, 0222));
    ConfigStore store;
    EXPECT_EQ(-2, store.open());
    expectClosed(store);
}

// Rules: PAR-02
TEST_F(ConfigStoreTest, AbsentObjectIsMinus2AndKeepsTheHandle) {
    remove(IMAGE_PATH);
    const int before = openDescriptors();
    ConfigStore store;
    store.init();
    store.length = 77;
    EXPECT_EQ(-2, store.open());
    expectClosed(store);
    EXPECT_EQ(77U, store.length);
    EXPECT_EQ(before, openDescriptors());
    EXPECT_FALSE(exists(IMAGE_PATH));

    std::uint8_t value = 0xA5;
    EXPECT_EQ(PARAM_STORE_NOT_OPEN, getParamU8(store, 22, &value));
    EXPECT_EQ(0xA5, value);
}

// Rules: IMG-05
TEST_F(ConfigStoreTest, CalibrationFileIsNotAFallback) {
    remove(IMAGE_PATH);
    std::filesystem::create_directories("/fs/rwdata/CALS");
    writeFile("/fs/rwdata/CALS/cal_active.bin", std::string(179, '\x01'));
    ConfigStore store;
    EXPECT_EQ(-2, store.open());
    expectClosed(store);
}

TEST_F(ConfigStoreTest, CalibrationFileDoesNotReplaceAnEmptyObject) {
    writeImage("");
    std::filesystem::create_directories("/fs/rwdata/CALS");
    writeFile("/fs/rwdata/CALS/cal_active.bin", std::string(179, '\x01'));
    ConfigStore store;
    EXPECT_EQ(-1, store.open());
    expectClosed(store);
}

TEST_F(ConfigStoreTest, NoFreeDescriptorIsMinus2) {
    ConfigStore store;
    std::int32_t result = 0;
    {
        const ResourceLimit none(RLIMIT_NOFILE, 0);
        result = store.open();
    }
    EXPECT_EQ(-2, result);
    expectClosed(store);
}

TEST_F(ConfigStoreTest, ObjectWithoutASizeIsMinus2AndItsDescriptorStaysUntilClose) {
    remove(IMAGE_PATH);
    ASSERT_EQ(0, mkfifo(IMAGE_PATH, 0600));
    const kit::Descriptor otherEnd(open(IMAGE_PATH, O_RDWR | O_CLOEXEC));
    ASSERT_TRUE(otherEnd.isOpen());
    ConfigStore store;
    store.init();
    EXPECT_EQ(-2, store.open());
    const std::int32_t descriptor = store.descriptor;
    EXPECT_TRUE(isOpenDescriptor(descriptor));
    EXPECT_EQ(nullptr, store.data);
    EXPECT_EQ(0U, store.length);

    std::uint8_t value = 0xA5;
    EXPECT_EQ(PARAM_STORE_NOT_OPEN, getParamU8(store, 22, &value));
    EXPECT_EQ(0xA5, value);

    store.close();
    expectClosed(store);
    EXPECT_FALSE(isOpenDescriptor(descriptor));
}

// Rules: PAR-03
TEST_F(ConfigStoreTest, EmptyObjectIsMinus1AndClosesTheHandle) {
    writeImage("");
    const int before = openDescriptors();
    ConfigStore store;
    store.init();
    EXPECT_EQ(-1, store.open());
    expectClosed(store);
    EXPECT_EQ(0U, store.length);
    EXPECT_EQ(before, openDescriptors());
}

// Rules: PAR-03
TEST_F(ConfigStoreTest, ObjectTooLargeToMapIsMinus1AndClosesTheHandle) {
    // More than a 32-bit process has, and more than the limit leaves a 64-bit one. The files are
    // sparse. In 32 bits the second has length 0.
    for (const std::uint64_t size : {std::uint64_t{0xFFFFF000U}, std::uint64_t{1} << 32}) {
        SCOPED_TRACE(size);
        std::filesystem::resize_file(IMAGE_PATH, size);
        const int before = openDescriptors();
        ConfigStore store;
        store.init();
        std::int32_t result = 0;
        {
            const ResourceLimit limit(RLIMIT_AS, 1024 * MEBIBYTE);
            result = store.open();
        }
        EXPECT_EQ(-1, result);
        expectClosed(store);
        EXPECT_EQ(0U, store.length);
        EXPECT_EQ(before, openDescriptors());
    }
}

// Rules: PAR-03
TEST_F(ConfigStoreTest, WholeImageThatCannotBeMappedIsMinus1AndClosesTheHandle) {
    if (sizeof ORVANE_EMULATOR != 1) {
        GTEST_SKIP() << "an emulator does not pass this limit on";
    }
    const int before = openDescriptors();
    ConfigStore store;
    std::int32_t result = 0;
    {
        const ResourceLimit noMoreMemory(RLIMIT_AS, 0);
        result = store.open();
    }
    EXPECT_EQ(-1, result);
    expectClosed(store);
    EXPECT_EQ(0U, store.length);
    EXPECT_EQ(before, openDescriptors());
}

TEST_F(ConfigStoreTest, ObjectOfOneByteIsMapped) {
    writeImage("\x5A");
    ConfigStore store;
    EXPECT_EQ(0, store.open());
    EXPECT_EQ(1U, store.length);
    EXPECT_EQ(0x5A, store.data[0]);
}

TEST_F(ConfigStoreTest, ShortObjectIsReadToTheEndOfItsPage) {
    writeImage(std::string(134, '\x5A'));
    ConfigStore store;
    ASSERT_EQ(0, store.open());
    EXPECT_EQ(134U, store.length);
    std::uint16_t word = 0xA5A5;
    EXPECT_EQ(PARAM_OK, getParamU16(store, 134, &word));
    EXPECT_EQ(0x005A, word);
    std::uint8_t byte = 0xA5;
    EXPECT_EQ(PARAM_OK, getParamU8(store, 171, &byte));
    EXPECT_EQ(0, byte);
}

// Rules: PAR-04
TEST_F(ConfigStoreTest, CloseReleasesAndKeepsTheLength) {
    const int before = openDescriptors();
    ConfigStore store;
    ASSERT_EQ(0, store.open());
    EXPECT_EQ(before + 1, openDescriptors());
    store.close();
    expectClosed(store);
    EXPECT_EQ(179U, store.length);
    EXPECT_EQ(before, openDescriptors());
}

TEST_F(ConfigStoreTest, FailedOpenKeepsTheLengthOfAnEarlierImage) {
    ConfigStore store;
    ASSERT_EQ(0, store.open());
    store.close();
    writeImage("");
    EXPECT_EQ(-1, store.open());
    expectClosed(store);
    EXPECT_EQ(179U, store.length);
}

} // namespace orvane::test
