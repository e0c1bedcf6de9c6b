// SPDX-License-Identifier: Apache-2.0
#include "config/param_access.h"
#include "config/param_catalogue.h"
#include "tests/product/config/param_numbers.h"
#include "tests/support/unit_test.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <array>
#include <cstdint>
#include <cstring>
#include <string>
#include <vector>

namespace orvane::test {

namespace {

bool isTwoBytes(std::uint16_t number) {
    return std::find(TWO_BYTE_PARAMS.begin(), TWO_BYTE_PARAMS.end(), number) !=
           TWO_BYTE_PARAMS.end();
}

/// The byte at `offset` of a published image in which no two of the 179 bytes are alike.
std::uint8_t markedByte(std::uint32_t offset) {
    return static_cast<std::uint8_t>(offset * 7 + 3);
}

std::string markedImage() {
    std::string image;
    for (std::uint32_t offset = 0; offset < 179; ++offset) {
        image += static_cast<char>(markedByte(offset));
    }
    return image;
}

/// The value of a parameter in the marked image; its place follows from the widths of those before
/// it.
std::uint16_t markedValue(std::uint16_t number) {
    std::uint32_t offset = 0;
    for (std::uint16_t lower = 1; lower < number; ++lower) {
        offset += isTwoBytes(lower) ? 2U : 1U;
    }
    const unsigned high = isTwoBytes(number) ? markedByte(offset + 1) : 0U;
    return static_cast<std::uint16_t>(markedByte(offset) | high << 8);
}

/// A handle on the test's own memory: it looks open to a getter, and nothing is released.
class LentStore : public ConfigStore {
public:
    LentStore(std::int32_t lentDescriptor, const std::uint8_t* lentData, std::uint32_t lentLength) {
        descriptor = lentDescriptor;
        data = lentData;
        length = lentLength;
    }
    ~LentStore() { init(); }
    LentStore(const LentStore&) = delete;
    LentStore& operator=(const LentStore&) = delete;
};

} // namespace

class ParamAccessTest : public UnitTest {
protected:
    ParamAccessTest() {
        writeImage(markedImage());
        store.init();
    }
    void openStore() { ASSERT_EQ(0, store.open()); }

    ConfigStore store;
};

TEST_F(ParamAccessTest, StatusCodesAreFixed) {
    EXPECT_EQ(0U, PARAM_OK);
    EXPECT_EQ(1U, PARAM_UNKNOWN);
    EXPECT_EQ(2U, PARAM_WRONG_SIZE);
    EXPECT_EQ(3U, PARAM_STORE_NOT_OPEN);
}

// Rules: CAT-04, PAR-06, PAR-08
TEST_F(ParamAccessTest, EveryOneByteParameterComesFromItsOffset) {
    openStore();
    for (std::uint16_t number = 1; number <= 171; ++number) {
        SCOPED_TRACE(number);
        std::uint8_t value = 0;
        if (isTwoBytes(number)) {
            value = 0xA5;
            EXPECT_EQ(PARAM_WRONG_SIZE, getParamU8(store, number, &value));
            EXPECT_EQ(0xA5, value);
        } else {
            EXPECT_EQ(PARAM_OK, getParamU8(store, number, &value));
            EXPECT_EQ(markedValue(number), value);
        }
    }
}

// Rules: CAT-04, PAR-06, PAR-08
TEST_F(ParamAccessTest, EveryTwoByteParameterComesFromItsOffset) {
    openStore();
    for (std::uint16_t number = 1; number <= 171; ++number) {
        SCOPED_TRACE(number);
        std::uint16_t value = 0xA5A5;
        if (isTwoBytes(number)) {
            EXPECT_EQ(PARAM_OK, getParamU16(store, number, &value));
            EXPECT_EQ(markedValue(number), value);
        } else {
            EXPECT_EQ(PARAM_WRONG_SIZE, getParamU16(store, number, &value));
            EXPECT_EQ(0xA5A5, value);
        }
    }
}

// Rules: PAR-08
TEST_F(ParamAccessTest, GenericGetterReadsBothSizesAndNothingBeyond) {
    openStore();
    for (std::uint16_t number = 1; number <= 171; ++number) {
        SCOPED_TRACE(number);
        std::array<std::uint8_t, 4> value = {0xA5, 0xA5, 0xA5, 0xA5};
        EXPECT_EQ(PARAM_OK, getParam(store, number, value.data()));
        if (isTwoBytes(number)) {
            std::uint16_t word = 0;
            std::memcpy(&word, value.data(), sizeof(word));
            EXPECT_EQ(markedValue(number), word);
        } else {
            EXPECT_EQ(markedValue(number), value[0]);
            EXPECT_EQ(0xA5, value[1]);
        }
        EXPECT_EQ(0xA5, value[2]);
        EXPECT_EQ(0xA5, value[3]);
    }
}

// Rules: IMG-09, PAR-08
TEST_F(ParamAccessTest, LowByteOfAWordComesFirstInTheImage) {
    setImage(133, "\x34\x12");
    openStore();
    std::uint16_t value = 0;
    EXPECT_EQ(PARAM_OK, getParamU16(store, 134, &value));
    EXPECT_EQ(0x1234, value);
    value = 0;
    EXPECT_EQ(PARAM_OK, getParam(store, 134, &value));
    EXPECT_EQ(0x1234, value);
}

// Rules: IMG-09
TEST_F(ParamAccessTest, WordIsNotSignExtended) {
    setImage(133, "\xFF\xFF");
    openStore();
    std::uint16_t value = 0;
    EXPECT_EQ(PARAM_OK, getParamU16(store, 134, &value));
    EXPECT_EQ(0xFFFF, value);
    setImage(133, std::string("\x80\x00", 2));
    EXPECT_EQ(PARAM_OK, getParamU16(store, 134, &value));
    EXPECT_EQ(0x0080, value);
}

TEST_F(ParamAccessTest, LastParameterIsTheLastByteOfTheImage) {
    setImage(178, "\x5A");
    openStore();
    std::uint8_t value = 0;
    EXPECT_EQ(PARAM_OK, getParamU8(store, 171, &value));
    EXPECT_EQ(0x5A, value);
}

// Rules: PAR-05, PAR-09
TEST_F(ParamAccessTest, UnknownNumberIsStatus1AndKeepsTheOutput) {
    openStore();
    for (const std::uint16_t number : UNKNOWN_NUMBERS) {
        SCOPED_TRACE(number);
        std::uint8_t byte = 0xA5;
        std::uint16_t word = 0xA5A5;
        EXPECT_EQ(PARAM_UNKNOWN, getParamU8(store, number, &byte));
        EXPECT_EQ(PARAM_UNKNOWN, getParamU16(store, number, &word));
        EXPECT_EQ(PARAM_UNKNOWN, getParam(store, number, &word));
        EXPECT_EQ(0xA5, byte);
        EXPECT_EQ(0xA5A5, word);
    }
}

// Rules: PAR-06, PAR-09
TEST_F(ParamAccessTest, GetterOfTheWrongWidthIsStatus2AndKeepsTheOutput) {
    openStore();
    std::uint8_t byte = 0xA5;
    std::uint16_t word = 0xA5A5;
    EXPECT_EQ(PARAM_WRONG_SIZE, getParamU8(store, 134, &byte));
    EXPECT_EQ(PARAM_WRONG_SIZE, getParamU16(store, 22, &word));
    EXPECT_EQ(0xA5, byte);
    EXPECT_EQ(0xA5A5, word);
}

// Rules: PAR-07, PAR-09
TEST_F(ParamAccessTest, StoreThatWasNeverOpenedIsStatus3AndKeepsTheOutput) {
    std::uint8_t byte = 0xA5;
    std::uint16_t word = 0xA5A5;
    EXPECT_EQ(PARAM_STORE_NOT_OPEN, getParamU8(store, 22, &byte));
    EXPECT_EQ(PARAM_STORE_NOT_OPEN, getParamU16(store, 134, &word));
    EXPECT_EQ(PARAM_STORE_NOT_OPEN, getParam(store, 22, &byte));
    EXPECT_EQ(PARAM_STORE_NOT_OPEN, getParam(store, 134, &word));
    EXPECT_EQ(0xA5, byte);
    EXPECT_EQ(0xA5A5, word);
}

// Rules: PAR-05
TEST_F(ParamAccessTest, NumberIsCheckedBeforeTheStore) {
    for (const std::uint16_t number : UNKNOWN_NUMBERS) {
        SCOPED_TRACE(number);
        std::uint8_t byte = 0xA5;
        std::uint16_t word = 0xA5A5;
        EXPECT_EQ(PARAM_UNKNOWN, getParamU8(store, number, &byte));
        EXPECT_EQ(PARAM_UNKNOWN, getParamU16(store, number, &word));
        EXPECT_EQ(PARAM_UNKNOWN, getParam(store, number, &word));
        EXPECT_EQ(0xA5, byte);
        EXPECT_EQ(0xA5A5, word);
    }
}

// Rules: PAR-06
TEST_F(ParamAccessTest, WidthIsCheckedBeforeTheStore) {
    std::uint8_t byte = 0;
    std::uint16_t word = 0;
    EXPECT_EQ(PARAM_WRONG_SIZE, getParamU8(store, 134, &byte));
    EXPECT_EQ(PARAM_WRONG_SIZE, getParamU16(store, 22, &word));
}

TEST_F(ParamAccessTest, ClosedStoreIsStatus3) {
    openStore();
    store.close();
    std::uint8_t value = 0xA5;
    EXPECT_EQ(PARAM_STORE_NOT_OPEN, getParamU8(store, 22, &value));
    EXPECT_EQ(0xA5, value);
}

TEST(LentStoreTest, DescriptorWithoutMappingIsNotOpen) {
    const LentStore store(5, nullptr, 179);
    std::uint8_t byte = 0xA5;
    std::uint16_t word = 0xA5A5;
    EXPECT_EQ(PARAM_STORE_NOT_OPEN, getParamU8(store, 22, &byte));
    EXPECT_EQ(PARAM_STORE_NOT_OPEN, getParamU16(store, 134, &word));
    EXPECT_EQ(PARAM_STORE_NOT_OPEN, getParam(store, 22, &byte));
    EXPECT_EQ(0xA5, byte);
    EXPECT_EQ(0xA5A5, word);
}

TEST(LentStoreTest, MappingWithoutDescriptorIsNotOpen) {
    const std::array<std::uint8_t, 179> image{};
    const LentStore store(-1, image.data(), 179);
    std::uint8_t byte = 0xA5;
    std::uint16_t word = 0xA5A5;
    EXPECT_EQ(PARAM_STORE_NOT_OPEN, getParamU8(store, 22, &byte));
    EXPECT_EQ(PARAM_STORE_NOT_OPEN, getParamU16(store, 134, &word));
    EXPECT_EQ(PARAM_STORE_NOT_OPEN, getParam(store, 22, &byte));
    EXPECT_EQ(0xA5, byte);
    EXPECT_EQ(0xA5A5, word);
}

TEST(LentStoreTest, EveryDescriptorButMinusOneIsOpen) {
    std::array<std::uint8_t, 179> image{};
    image[21] = 0x5A;
    for (const std::int32_t descriptor : {0, 1, -2, 0x7FFFFFFF}) {
        const LentStore store(descriptor, image.data(), 179);
        std::uint8_t value = 0;
        EXPECT_EQ(PARAM_OK, getParamU8(store, 22, &value)) << descriptor;
        EXPECT_EQ(0x5A, value) << descriptor;
    }
}

// Rules: IMG-06
TEST(LentStoreTest, LengthIsNotConsulted) {
    std::array<std::uint8_t, 179> image{};
    image[133] = 0x34;
    image[134] = 0x12;
    image[178] = 0x5A;
    for (const std::uint32_t length : {0U, 1U, 134U, 178U, 0xFFFFFFFFU}) {
        SCOPED_TRACE(length);
        const LentStore store(5, image.data(), length);
        std::uint8_t byte = 0;
        std::uint16_t word = 0;
        EXPECT_EQ(PARAM_OK, getParamU8(store, 171, &byte));
        EXPECT_EQ(0x5A, byte);
        EXPECT_EQ(PARAM_OK, getParamU16(store, 134, &word));
        EXPECT_EQ(0x1234, word);
    }
}

} // namespace orvane::test
