// SPDX-License-Identifier: Apache-2.0
//
// The bulk reader of param_access.h.
#include "config/param_access.h"
#include "kit/host/descriptor.h"
#include "tests/support/unit_test.h"

#include <fcntl.h>
#include <gtest/gtest.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cstdint>
#include <string>
#include <vector>

namespace orvane::test {

namespace {

constexpr std::uint16_t UNTOUCHED = 0xA5C3;

/// Longer than the most that the reader may write, so that a write past it shows.
std::vector<std::uint16_t> untouchedValues() {
    return std::vector<std::uint16_t>(180, UNTOUCHED);
}

/// No byte is 0, so that a zeroed slot shows.
std::string imageWithoutZeros() {
    std::string image;
    for (int offset = 0; offset < 179; ++offset) {
        image += static_cast<char>(offset + 1);
    }
    return image;
}

/// The value of parameter `number` in that image: one byte, but two at 134, 142-144, 152-154 and
/// 158.
std::uint16_t valueOf(std::uint16_t number) {
    const auto word = [](unsigned offset) {
        return static_cast<std::uint16_t>((offset + 1) | (offset + 2) << 8);
    };
    switch (number) {
    case 134:
        return word(133);
    case 142:
        return word(142);
    case 143:
        return word(144);
    case 144:
        return word(146);
    case 152:
        return word(155);
    case 153:
        return word(157);
    case 154:
        return word(159);
    case 158:
        return word(164);
    default:
        break;
    }
    unsigned offset = number - 1U;
    for (const int wide : {134, 142, 143, 144, 152, 153, 154, 158}) {
        offset += wide < number ? 1U : 0U;
    }
    return static_cast<std::uint16_t>(offset + 1);
}

void expectClosed(const ConfigStore& store) {
    EXPECT_EQ(-1, store.descriptor);
    EXPECT_EQ(nullptr, store.data);
}

} // namespace

class ReadAllParamsTest : public UnitTest {
protected:
    ReadAllParamsTest() { writeImage(imageWithoutZeros()); }

    /// The first `count` slots hold their parameters, the next `zeroed` are 0, and the others are
    /// as they were.
    void expectValues(std::size_t count, std::size_t zeroed) const {
        for (std::size_t slot = 0; slot < values.size(); ++slot) {
            SCOPED_TRACE(slot);
            if (slot < count) {
                EXPECT_EQ(valueOf(static_cast<std::uint16_t>(slot + 1)), values[slot]);
            } else {
                EXPECT_EQ(slot < count + zeroed ? 0 : UNTOUCHED, values[slot]);
            }
        }
    }

    ConfigStore store;
    std::vector<std::uint16_t> values = untouchedValues();
};

// Rules: PAR-10
TEST_F(ReadAllParamsTest, EachSlotGetsOneParameter) {
    EXPECT_EQ(0, readAllParams(store, values.data(), 171));
    expectValues(171, 0);
    expectClosed(store);
}

TEST_F(ReadAllParamsTest, OneByteParameterIsZeroExtended) {
    setImage(0, "\xFF");
    EXPECT_EQ(0, readAllParams(store, values.data(), 1));
    EXPECT_EQ(0x00FF, values[0]);
}

// Rules: PAR-10
TEST_F(ReadAllParamsTest, StopsAfterCount) {
    for (const std::uint32_t count : {1U, 2U, 133U, 134U, 135U, 170U}) {
        SCOPED_TRACE(count);
        values = untouchedValues();
        EXPECT_EQ(0, readAllParams(store, values.data(), count));
        expectValues(count, 0);
        expectClosed(store);
    }
}

// Rules: PAR-10
TEST_F(ReadAllParamsTest, CountZeroOpensAndClosesAndReadsNothing) {
    EXPECT_EQ(0, readAllParams(store, values.data(), 0));
    expectValues(0, 0);
    expectClosed(store);
    EXPECT_EQ(179U, store.length) << "the store was not opened";
}

// Rules: PAR-12
TEST_F(ReadAllParamsTest, CountBeyondTheCatalogueFillsAllThenZeroesOneAndIsStatus1) {
    for (const std::uint32_t count : {172U, 173U, 200U, 65535U}) {
        SCOPED_TRACE(count);
        values = untouchedValues();
        EXPECT_EQ(1, readAllParams(store, values.data(), count));
        expectValues(171, 1);
        expectClosed(store);
    }
}

TEST_F(ReadAllParamsTest, CountIsNotTruncatedTo16Bits) {
    for (const std::uint32_t count : {0x10000U, 0x10001U, 0x100ABU, 0x80000000U, 0xFFFFFFFFU}) {
        SCOPED_TRACE(count);
        values = untouchedValues();
        EXPECT_EQ(1, readAllParams(store, values.data(), count));
        expectValues(171, 1);
        expectClosed(store);
    }
}

// Rules: PAR-11
TEST_F(ReadAllParamsTest, AbsentImageIsMinus2WhateverTheCount) {
    remove(IMAGE_PATH);
    for (const std::uint32_t count : {0U, 1U, 200U}) {
        SCOPED_TRACE(count);
        EXPECT_EQ(-2, readAllParams(store, values.data(), count));
        expectValues(0, 0);
        expectClosed(store);
    }
}

// Rules: PAR-11
TEST_F(ReadAllParamsTest, EmptyImageIsMinus1WhateverTheCount) {
    writeImage("");
    for (const std::uint32_t count : {0U, 1U, 200U}) {
        SCOPED_TRACE(count);
        EXPECT_EQ(-1, readAllParams(store, values.data(), count));
        expectValues(0, 0);
        expectClosed(store);
    }
}

TEST_F(ReadAllParamsTest, FailedOpenLeavesTheStoreAsOpenLeftIt) {
    // A pipe can be opened but not measured.
    remove(IMAGE_PATH);
    ASSERT_EQ(0, mkfifo(IMAGE_PATH, 0600));
    const kit::Descriptor otherEnd(open(IMAGE_PATH, O_RDWR | O_CLOEXEC));
    ASSERT_TRUE(otherEnd.isOpen());
    EXPECT_EQ(-2, readAllParams(store, values.data(), 3));
    expectValues(0, 0);
    EXPECT_NE(-1, store.descriptor);
    EXPECT_NE(-1, fcntl(store.descriptor, F_GETFD));
    EXPECT_EQ(nullptr, store.data);
}

TEST_F(ReadAllParamsTest, ShortImageIsReadToTheEndOfItsPage) {
    writeImage(imageWithoutZeros().substr(0, 100));
    EXPECT_EQ(0, readAllParams(store, values.data(), 171));
    EXPECT_EQ(100, values[99]);
    for (std::size_t slot = 100; slot < 171; ++slot) {
        EXPECT_EQ(0, values[slot]) << slot;
    }
}

TEST_F(ReadAllParamsTest, LeavesNoDescriptorOpen) {
    const int before = openDescriptors();
    for (const std::uint32_t count : {0U, 171U, 200U}) {
        readAllParams(store, values.data(), count);
        EXPECT_EQ(before, openDescriptors()) << count;
    }
    writeImage("");
    EXPECT_EQ(-1, readAllParams(store, values.data(), 171));
    EXPECT_EQ(before, openDescriptors());
}

} // namespace orvane::test
