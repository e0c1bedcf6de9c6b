// SPDX-License-Identifier: Apache-2.0
//
// Every parameter number through each operation that takes one.
#include "config/param_access.h"
#include "config/param_catalogue.h"
#include "tests/product/config/param_numbers.h"
#include "tests/support/unit_test.h"

#include <algorithm>
#include <array>
#include <cstdint>
#include <cstring>
#include <string>
#include <vector>

namespace orvane::test {
namespace {

constexpr std::uint32_t NUMBER_COUNT = 65536;
constexpr std::uint32_t IMAGE_SIZE = 179;
constexpr std::array<std::uint32_t, 8> LAST_OF_GROUP = {68, 126, 132, 141, 144, 146, 158, 171};

struct Param {
    std::uint32_t size = 0; ///< in bytes; 0 for a number that stands for nothing
    std::uint32_t group = 8;
    std::uint32_t offset = 0; ///< in the image
};

bool hasTwoBytes(std::uint32_t number) {
    return std::find(TWO_BYTE_PARAMS.begin(), TWO_BYTE_PARAMS.end(), number) !=
           TWO_BYTE_PARAMS.end();
}

/// What is right for each number: parameters lie back to back.
std::vector<Param> everyParam() {
    std::vector<Param> params(NUMBER_COUNT);
    std::uint32_t offset = 0;
    std::uint32_t group = 0;
    for (std::uint32_t number = 1; number <= LAST_OF_GROUP.back(); ++number) {
        group += number > LAST_OF_GROUP.at(group) ? 1U : 0U;
        params[number] = {hasTwoBytes(number) ? 2U : 1U, group, offset};
        offset += params[number].size;
    }
    EXPECT_EQ(offset, IMAGE_SIZE);
    return params;
}

/// The byte of the image at `offset`: none is zero, and no two are the same.
std::uint8_t imageByte(std::uint32_t offset) {
    return static_cast<std::uint8_t>(offset + 1);
}

/// Room for a value, filled with what no getter may leave where it reads nothing.
constexpr std::uint32_t UNTOUCHED = 0xEEEEEEEE;

/// That room after a getter has read a parameter at `offset`.
template <class Value>
Value readAt(std::uint32_t offset, std::uint32_t size) {
    Value value{};
    std::memset(&value, 0xEE, sizeof value);
    std::array<std::uint8_t, 2> bytes = {imageByte(offset), imageByte(offset + 1)};
    if (size == 2) {
        const auto word = static_cast<std::uint16_t>(bytes[0] + bytes[1] * 256);
        std::memcpy(bytes.data(), &word, sizeof word);
    }
    std::memcpy(&value, bytes.data(), size);
    return value;
}

class EveryParameterNumberTest : public UnitTest {
protected:
    EveryParameterNumberTest() {
        std::string image;
        while (image.size() < IMAGE_SIZE) {
            image.push_back(static_cast<char>(imageByte(static_cast<std::uint32_t>(image.size()))));
        }
        writeImage(image);
    }

    /// Calls `check` for each number.
    template <class Check>
    static void forEveryNumber(const Check& check) {
        const std::vector<Param> params = everyParam();
        for (std::uint32_t number = 0; number < NUMBER_COUNT && !HasFailure(); ++number) {
            SCOPED_TRACE(number);
            check(static_cast<std::uint16_t>(number), params[number]);
        }
    }

    /// Compares `getter` with what is right, for each number: it reads parameters of `wantedSize`,
    /// of any size when that is 0.
    template <class Value, class Getter>
    static void expectEveryNumber(const ConfigStore& store, const Getter& getter,
                                  std::uint32_t wantedSize) {
        const bool isOpen = store.data != nullptr;
        forEveryNumber([&](std::uint16_t number, const Param& param) {
            std::uint32_t right = isOpen ? 0 : 3;
            if (param.size == 0) {
                right = 1;
            } else if (wantedSize != 0 && param.size != wantedSize) {
                right = 2;
            }
            auto value = static_cast<Value>(UNTOUCHED);
            EXPECT_EQ(getter(store, number, &value), right);
            EXPECT_EQ(value, right == 0 ? readAt<Value>(param.offset, param.size)
                                        : static_cast<Value>(UNTOUCHED));
        });
    }

    static void expectEveryGetter(const ConfigStore& store) {
        expectEveryNumber<std::uint32_t>(store, getParam, 0);
        expectEveryNumber<std::uint8_t>(store, getParamU8, 1);
        expectEveryNumber<std::uint16_t>(store, getParamU16, 2);
    }
};

TEST_F(EveryParameterNumberTest, IsLookedUp) {
    forEveryNumber([](std::uint16_t number, const Param& param) {
        std::int32_t index = 4711;
        ParamDescriptor untouched{};
        std::memset(&untouched, 0xEE, sizeof untouched);
        ParamDescriptor row = untouched;
        const bool isKnown = param.size != 0;
        EXPECT_EQ(lookupParam(number, index, row), isKnown ? 0U : 1U);
        EXPECT_EQ(index, isKnown ? number - 1 : -1);
        if (isKnown) {
            EXPECT_EQ(row.number, number);
            EXPECT_EQ(row.type, param.size - 1);
            EXPECT_EQ(row.group, param.group);
            EXPECT_EQ(row.offset, param.offset);
        } else {
            EXPECT_EQ(std::memcmp(&row, &untouched, sizeof row), 0);
        }
    });
}

TEST_F(EveryParameterNumberTest, HasItsGroup) {
    forEveryNumber([](std::uint16_t number, const Param& param) {
        EXPECT_EQ(paramGroup(number), param.group);
    });
}

TEST_F(EveryParameterNumberTest, IsDescribed) {
    forEveryNumber([](std::uint16_t number, const Param& param) {
        ParamInfo info{4711, 4712, 4713, 4714};
        const bool isKnown = param.size != 0;
        EXPECT_EQ(describeParam(number, info), isKnown ? 0U : 1U);
        EXPECT_EQ(info.number, isKnown ? number : 4711);
        EXPECT_EQ(info.type, isKnown ? param.size - 1 : 4712);
        EXPECT_EQ(info.size, isKnown ? param.size : 4713);
        EXPECT_EQ(info.group, isKnown ? param.group : 4714);
    });
}

TEST_F(EveryParameterNumberTest, IsReadFromAnOpenStore) {
    ConfigStore store;
    ASSERT_EQ(store.open(), 0);
    expectEveryGetter(store);
}

TEST_F(EveryParameterNumberTest, IsNotReadFromAClosedStore) {
    const ConfigStore store;
    expectEveryGetter(store);
}

} // namespace
} // namespace orvane::test
