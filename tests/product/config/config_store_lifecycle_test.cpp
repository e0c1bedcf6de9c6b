// SPDX-License-Identifier: Apache-2.0
//
// What ConfigStore holds over its life: close, close again, destruction, and a second open.
#include "config/config_store.h"
#include "config/param_access.h"
#include "kit/host/descriptor.h"
#include "tests/product/config/freed_standard_input.h"
#include "tests/product/config/memory_map.h"
#include "tests/support/unit_test.h"

#include <fcntl.h>
#include <gtest/gtest.h>
#include <sys/mman.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cstdint>
#include <cstdio>
#include <optional>
#include <string>

namespace orvane::test {

class ConfigStoreLifecycleTest : public UnitTest {
protected:
    static bool isOpenDescriptor(int descriptor) { return fcntl(descriptor, F_GETFD) != -1; }

    static void expectClosed(const ConfigStore& store) {
        EXPECT_EQ(-1, store.descriptor);
        EXPECT_EQ(nullptr, store.data);
    }
};

// Rules: PAR-04
TEST_F(ConfigStoreLifecycleTest, CloseOnANeverOpenedHandleDoesNothing) {
    const int before = openDescriptors();
    ConfigStore store;
    store.init();
    store.close();
    expectClosed(store);
    EXPECT_EQ(0U, store.length);
    EXPECT_EQ(before, openDescriptors());
}

// Rules: PAR-04
TEST_F(ConfigStoreLifecycleTest, SecondCloseDoesNothing) {
    ConfigStore store;
    ASSERT_EQ(0, store.open());
    const std::int32_t formerNumber = store.descriptor;
    store.close();
    // This gets the same number, so a second release of it would close this.
    const int bystander = open(IMAGE_PATH, O_RDONLY | O_CLOEXEC);
    EXPECT_EQ(formerNumber, bystander);
    store.close();
    expectClosed(store);
    EXPECT_EQ(179U, store.length);
    EXPECT_TRUE(isOpenDescriptor(bystander));
    close(bystander);
}

TEST_F(ConfigStoreLifecycleTest, CloseAfterAFailedOpenIsHarmless) {
    const int before = openDescriptors();
    ConfigStore store;
    writeImage("");
    EXPECT_EQ(-1, store.open());
    store.close();
    expectClosed(store);
    remove(IMAGE_PATH);
    EXPECT_EQ(-2, store.open());
    store.close();
    expectClosed(store);
    EXPECT_EQ(before, openDescriptors());
}

TEST_F(ConfigStoreLifecycleTest, CloseReleasesADescriptorWithoutMapping) {
    ConfigStore store;
    store.descriptor = open(IMAGE_PATH, O_RDONLY | O_CLOEXEC);
    const std::int32_t descriptor = store.descriptor;
    ASSERT_NE(-1, descriptor);
    store.close();
    expectClosed(store);
    EXPECT_FALSE(isOpenDescriptor(descriptor));
}

TEST_F(ConfigStoreLifecycleTest, CloseReleasesAMappingWithoutDescriptor) {
    ConfigStore store;
    ASSERT_EQ(0, store.open());
    const std::int32_t descriptor = store.descriptor;
    const std::uint8_t* data = store.data;
    store.descriptor = -1;
    store.close();
    expectClosed(store);
    EXPECT_TRUE(isOpenDescriptor(descriptor));
    close(descriptor);
    leave();
    EXPECT_EQ("none", mappingRights(data));
}

TEST_F(ConfigStoreLifecycleTest, DestructionReleasesDescriptorAndMapping) {
    const int before = openDescriptors();
    std::optional<ConfigStore> store;
    store.emplace();
    ASSERT_EQ(0, store->open());
    const std::uint8_t* data = store->data;
    EXPECT_EQ(before + 1, openDescriptors());
    store.reset();
    EXPECT_EQ(before, openDescriptors());
    leave();
    EXPECT_EQ("none", mappingRights(data));
}

TEST_F(ConfigStoreLifecycleTest, DestructionReleasesTheDescriptorOfAnUnmeasuredObject) {
    remove(IMAGE_PATH);
    ASSERT_EQ(0, mkfifo(IMAGE_PATH, 0600));
    const kit::Descriptor otherEnd(open(IMAGE_PATH, O_RDWR | O_CLOEXEC));
    ASSERT_TRUE(otherEnd.isOpen());
    const int before = openDescriptors();
    {
        ConfigStore store;
        EXPECT_EQ(-2, store.open());
        EXPECT_EQ(before + 1, openDescriptors());
    }
    EXPECT_EQ(before, openDescriptors());
}

TEST_F(ConfigStoreLifecycleTest, DescriptorZeroIsHeldAndReleasedLikeAnyOther) {
    const FreedStandardInput freed;
    setImage(21, "\x5A");
    ConfigStore store;
    EXPECT_EQ(0, store.open());
    EXPECT_EQ(0, store.descriptor);
    std::uint8_t value = 0;
    EXPECT_EQ(PARAM_OK, getParamU8(store, 22, &value));
    EXPECT_EQ(0x5A, value);
    store.close();
    expectClosed(store);
    EXPECT_FALSE(isOpenDescriptor(0));
}

TEST_F(ConfigStoreLifecycleTest, DescriptorOneIsHeldAndReleasedLikeAnyOther) {
    ASSERT_TRUE(isOpenDescriptor(STDIN_FILENO));
    static_cast<void>(std::fflush(stdout));
    const int formerOutput = fcntl(STDOUT_FILENO, F_DUPFD_CLOEXEC, 3);
    close(STDOUT_FILENO);
    // Nothing may be printed, not even by an expectation, until the standard output is back.
    ConfigStore store;
    const std::int32_t opened = store.open();
    const std::int32_t descriptor = store.descriptor;
    store.close();
    const bool isReleased = !isOpenDescriptor(STDOUT_FILENO);
    dup2(formerOutput, STDOUT_FILENO);
    close(formerOutput);
    EXPECT_EQ(0, opened);
    EXPECT_EQ(STDOUT_FILENO, descriptor);
    EXPECT_TRUE(isReleased);
    expectClosed(store);
}

TEST_F(ConfigStoreLifecycleTest, CloseLeavesMinusOneWhateverTheDescriptorWas) {
    ConfigStore store;
    store.descriptor = -2;
    store.close();
    expectClosed(store);
}

TEST_F(ConfigStoreLifecycleTest, ClosedHandleOpensAgain) {
    ConfigStore store;
    ASSERT_EQ(0, store.open());
    store.close();
    writeImage("\x5A\x5B");
    ASSERT_EQ(0, store.open());
    EXPECT_EQ(2U, store.length);
    EXPECT_EQ(0x5B, store.data[1]);
}

TEST_F(ConfigStoreLifecycleTest, SecondOpenOfAnAbsentObjectTouchesNothing) {
    ConfigStore store;
    ASSERT_EQ(0, store.open());
    const std::int32_t descriptor = store.descriptor;
    const std::uint8_t* data = store.data;
    remove(IMAGE_PATH);
    EXPECT_EQ(-2, store.open());
    EXPECT_EQ(descriptor, store.descriptor);
    EXPECT_EQ(data, store.data);
    EXPECT_EQ(179U, store.length);
    EXPECT_TRUE(isOpenDescriptor(descriptor));
}

TEST_F(ConfigStoreLifecycleTest, SecondOpenForgetsWhatTheFirstHeld) {
    setImage(0, "\x5A");
    ConfigStore store;
    ASSERT_EQ(0, store.open());
    const std::int32_t firstDescriptor = store.descriptor;
    const std::uint8_t* firstData = store.data;
    ASSERT_EQ(0, store.open());
    EXPECT_NE(firstDescriptor, store.descriptor);
    EXPECT_NE(firstData, store.data);
    EXPECT_TRUE(isOpenDescriptor(firstDescriptor));
    EXPECT_EQ(0x5A, firstData[0]);

    store.close();
    EXPECT_TRUE(isOpenDescriptor(firstDescriptor));
    store.descriptor = firstDescriptor;
    store.data = firstData;
}

} // namespace orvane::test
