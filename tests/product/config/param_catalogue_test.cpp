// SPDX-License-Identifier: Apache-2.0
#include "config/param_catalogue.h"
#include "tests/product/config/memory_map.h"
#include "tests/product/config/param_numbers.h"

#include <gtest/gtest.h>

#include <array>
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <type_traits>
#include <vector>

namespace orvane::test {

namespace {

constexpr std::array<std::uint32_t, 9> TYPE_SIZES = {1, 2, 4, 1, 1, 2, 4, 4, 8};

constexpr ParamDescriptor MARKED_ROW = {901, 902, 903, 904, 905, 906, 907};
constexpr ParamInfo MARKED_INFO = {901, 902, 903, 904};

} // namespace

// Rules: CAT-15
TEST(ParamCatalogueTest, RowIsSevenWordsInIssuedOrder) {
    EXPECT_EQ(28U, sizeof(ParamDescriptor));
    EXPECT_EQ(0U, offsetof(ParamDescriptor, number));
    EXPECT_EQ(4U, offsetof(ParamDescriptor, type));
    EXPECT_EQ(8U, offsetof(ParamDescriptor, group));
    EXPECT_EQ(12U, offsetof(ParamDescriptor, offset));
    EXPECT_EQ(16U, offsetof(ParamDescriptor, id));
    EXPECT_EQ(20U, offsetof(ParamDescriptor, defaultValue));
    EXPECT_EQ(24U, offsetof(ParamDescriptor, mask));
    EXPECT_TRUE((std::is_same_v<std::int32_t, decltype(ParamDescriptor::defaultValue)>));
    EXPECT_TRUE((std::is_same_v<std::uint32_t, decltype(ParamDescriptor::mask)>));
}

// Rules: CAT-15
TEST(ParamCatalogueTest, IsNineSizesDirectlyFollowedByTheRows) {
    EXPECT_EQ(4824U, sizeof(ParamCatalogue));
    const auto* bytes = reinterpret_cast<const unsigned char*>(&ParamCatalogue);
    std::uint32_t word = 0;
    for (std::size_t code = 0; code < TYPE_SIZES.size(); ++code) {
        std::memcpy(&word, bytes + 4 * code, sizeof(word));
        EXPECT_EQ(TYPE_SIZES.at(code), word) << "type code " << code;
    }
    for (std::size_t number = 1; number <= 171; ++number) {
        std::memcpy(&word, bytes + 36 + 28 * (number - 1), sizeof(word));
        EXPECT_EQ(number, word);
    }
}

TEST(ParamCatalogueTest, LiesInReadOnlyMemory) {
    const auto* first = reinterpret_cast<const char*>(&ParamCatalogue);
    for (const char* address : {first, first + sizeof(ParamCatalogue) - 1}) {
        const std::string rights = mappingRights(address);
        ASSERT_EQ(4U, rights.size()) << rights;
        EXPECT_EQ('r', rights[0]) << rights;
        EXPECT_EQ('-', rights[1]) << rights;
    }
}

TEST(ParamCatalogueTest, ReadOnlyMemoryIsDistinguishedFromWritable) {
    static int writable = 1;
    EXPECT_EQ("rw", mappingRights(&writable).substr(0, 2));
}

// Rules: CAT-03
TEST(ParamTypeSizeTest, EveryTypeCodeHasItsSize) {
    for (std::uint32_t code = 0; code < TYPE_SIZES.size(); ++code) {
        EXPECT_EQ(TYPE_SIZES.at(code), paramTypeSize(code)) << "type code " << code;
    }
}

// Rules: CAT-03
TEST(ParamTypeSizeTest, CodeWithoutAnEntryHasSizeOne) {
    for (const std::uint32_t code :
         {9U, 10U, 17U, 44U, 256U, 264U, 0x7FFFFFFFU, 0x80000000U, 0x80000008U, 0xFFFFFFFFU}) {
        EXPECT_EQ(1U, paramTypeSize(code)) << "type code " << code;
    }
}

// Rules: CAT-10
TEST(LookupParamTest, KnownNumberGivesIndexAndWholeRow) {
    for (std::uint16_t number = 1; number <= 171; ++number) {
        SCOPED_TRACE(number);
        std::int32_t index = -77;
        ParamDescriptor row = MARKED_ROW;
        EXPECT_EQ(0U, lookupParam(number, index, row));
        EXPECT_EQ(number - 1, index);
        EXPECT_EQ(0, std::memcmp(&ParamCatalogue.rows.at(number - 1U), &row, sizeof(row)));
    }
}

// Rules: CAT-01, CAT-11
TEST(LookupParamTest, UnknownNumberClearsTheIndexAndKeepsTheRow) {
    for (const std::uint16_t number : UNKNOWN_NUMBERS) {
        SCOPED_TRACE(number);
        std::int32_t index = 77;
        ParamDescriptor row = MARKED_ROW;
        EXPECT_EQ(1U, lookupParam(number, index, row));
        EXPECT_EQ(-1, index);
        EXPECT_EQ(0, std::memcmp(&MARKED_ROW, &row, sizeof(row)));
    }
}

// Rules: CAT-05, CAT-12
TEST(ParamGroupTest, KnownNumberGivesItsGroup) {
    struct GroupEnds {
        std::uint16_t first;
        std::uint16_t last;
    };
    constexpr std::array<GroupEnds, 8> GROUPS = {{{1, 68},
                                                  {69, 126},
                                                  {127, 132},
                                                  {133, 141},
                                                  {142, 144},
                                                  {145, 146},
                                                  {147, 158},
                                                  {159, 171}}};
    for (std::uint32_t group = 0; group < GROUPS.size(); ++group) {
        for (std::uint16_t n = GROUPS.at(group).first; n <= GROUPS.at(group).last; ++n) {
            EXPECT_EQ(group, paramGroup(n)) << "parameter " << n;
        }
    }
}

// Rules: CAT-12
TEST(ParamGroupTest, UnknownNumberHasGroupEight) {
    for (const std::uint16_t number : UNKNOWN_NUMBERS) {
        EXPECT_EQ(8U, paramGroup(number)) << "parameter " << number;
    }
    EXPECT_EQ(8U, NO_GROUP);
}

// Rules: CAT-13
TEST(DescribeParamTest, KnownNumberGivesNumberTypeSizeAndGroup) {
    struct Case {
        std::uint16_t number, type, size, group;
    };
    constexpr std::array<Case, 8> CASES = {{{1, 0, 1, 0},
                                            {22, 0, 1, 0},
                                            {69, 0, 1, 1},
                                            {134, 1, 2, 3},
                                            {142, 1, 2, 4},
                                            {145, 0, 1, 5},
                                            {158, 1, 2, 6},
                                            {171, 0, 1, 7}}};
    for (const Case& wanted : CASES) {
        SCOPED_TRACE(wanted.number);
        ParamInfo info = MARKED_INFO;
        EXPECT_EQ(0U, describeParam(wanted.number, info));
        EXPECT_EQ(wanted.number, info.number);
        EXPECT_EQ(wanted.type, info.type);
        EXPECT_EQ(wanted.size, info.size);
        EXPECT_EQ(wanted.group, info.group);
    }
}

TEST(DescribeParamTest, InfoIsFourHalfWordsInIssuedOrder) {
    EXPECT_EQ(8U, sizeof(ParamInfo));
    EXPECT_EQ(0U, offsetof(ParamInfo, number));
    EXPECT_EQ(2U, offsetof(ParamInfo, type));
    EXPECT_EQ(4U, offsetof(ParamInfo, size));
    EXPECT_EQ(6U, offsetof(ParamInfo, group));
}

// Rules: CAT-14
TEST(DescribeParamTest, UnknownNumberKeepsTheInfo) {
    for (const std::uint16_t number : UNKNOWN_NUMBERS) {
        SCOPED_TRACE(number);
        ParamInfo info = MARKED_INFO;
        EXPECT_EQ(1U, describeParam(number, info));
        EXPECT_EQ(0, std::memcmp(&MARKED_INFO, &info, sizeof(info)));
    }
}

} // namespace orvane::test
