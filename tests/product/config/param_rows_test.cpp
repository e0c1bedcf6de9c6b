// SPDX-License-Identifier: Apache-2.0
//
// All rows of the catalogue against the rules by which the vehicle line issued them: number ranges
// for group, type, mask and default, a running sum for the offset, and a list for the code.
#include "config/param_catalogue.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <array>
#include <cstdint>
#include <initializer_list>
#include <map>
#include <set>
#include <utility>

namespace orvane::test {

namespace {

struct NumberRange {
    std::uint32_t first;
    std::uint32_t last;
};

bool holds(std::initializer_list<NumberRange> ranges, std::uint32_t number) {
    return std::any_of(ranges.begin(), ranges.end(), [&](const NumberRange& range) {
        return range.first <= number && number <= range.last;
    });
}

using Code = std::pair<std::uint32_t, std::uint32_t>;

// clang-format off
/// Parameter number, code.
constexpr std::array<Code, 171> CODES = {{
    {1, 4}, {2, 5}, {3, 11}, {4, 3}, {5, 12}, {6, 13}, {7, 14}, {8, 15}, {9, 16},
    {10, 17}, {11, 18}, {12, 1}, {13, 6}, {14, 20}, {15, 19}, {16, 54}, {17, 21}, {18, 22},
    {19, 47}, {20, 69}, {21, 55}, {22, 25}, {23, 26}, {24, 24}, {25, 28}, {26, 29}, {27, 30},
    {28, 31}, {29, 32}, {30, 33}, {31, 34}, {32, 35}, {33, 36}, {34, 37}, {35, 38}, {36, 2},
    {37, 39}, {38, 40}, {39, 9}, {40, 53}, {41, 0}, {42, 41}, {43, 23}, {44, 63}, {45, 64},
    {46, 65}, {47, 66}, {48, 70}, {49, 71}, {50, 56}, {51, 57}, {52, 58}, {53, 27}, {54, 74},
    {55, 76}, {56, 77}, {57, 78}, {58, 79}, {59, 80}, {60, 81}, {61, 82}, {62, 83}, {63, 84},
    {64, 85}, {65, 86}, {66, 87}, {67, 88}, {68, 90}, {69, 42}, {70, 43}, {71, 44}, {72, 52},
    {73, 91}, {74, 92}, {75, 93}, {76, 94}, {77, 95}, {78, 96}, {79, 97}, {80, 98}, {81, 99},
    {82, 100}, {83, 101}, {84, 102}, {85, 89}, {86, 103}, {87, 104}, {88, 106}, {89, 107}, {90, 108},
    {91, 109}, {92, 110}, {93, 111}, {94, 112}, {95, 113}, {96, 115}, {97, 116}, {98, 117}, {99, 118},
    {100, 119}, {101, 120}, {102, 121}, {103, 122}, {104, 151}, {105, 152}, {106, 153}, {107, 154}, {108, 155},
    {109, 156}, {110, 157}, {111, 158}, {112, 160}, {113, 164}, {114, 165}, {115, 166}, {116, 167}, {117, 168},
    {118, 180}, {119, 161}, {120, 86}, {121, 182}, {122, 183}, {123, 205}, {124, 186}, {125, 187}, {126, 149},
    {127, 60}, {128, 59}, {129, 61}, {130, 75}, {131, 73}, {132, 206}, {133, 45}, {134, 46}, {135, 172},
    {136, 173}, {137, 174}, {138, 48}, {139, 49}, {140, 50}, {141, 51}, {142, 62}, {143, 105}, {144, 148},
    {145, 124}, {146, 162}, {147, 136}, {148, 137}, {149, 138}, {150, 139}, {151, 140}, {152, 141}, {153, 142},
    {154, 143}, {155, 144}, {156, 145}, {157, 146}, {158, 147}, {159, 189}, {160, 190}, {161, 191}, {162, 192},
    {163, 193}, {164, 194}, {165, 195}, {166, 196}, {167, 197}, {168, 198}, {169, 199}, {170, 200}, {171, 201},
}};
// clang-format on

bool isTwoBytes(std::uint32_t number) {
    return holds({{134, 134}, {142, 144}, {152, 154}, {158, 158}}, number);
}

std::uint32_t issuedGroup(std::uint32_t number) {
    constexpr std::array<std::uint32_t, 8> LAST_OF_GROUP = {68, 126, 132, 141, 144, 146, 158, 171};
    std::uint32_t group = 0;
    while (LAST_OF_GROUP.at(group) < number) {
        ++group;
    }
    return group;
}

std::int32_t issuedDefault(std::uint32_t number) {
    const std::map<std::uint32_t, std::int32_t> defaults = {{9, 1}, {126, 5}, {133, 1}, {147, 10}};
    const auto found = defaults.find(number);
    return found == defaults.end() ? 0 : found->second;
}

std::uint32_t issuedMask(std::uint32_t number) {
    if (holds({{23, 23},
               {30, 30},
               {41, 41},
               {52, 52},
               {57, 57},
               {88, 88},
               {100, 107},
               {126, 126},
               {139, 139}},
              number)) {
        return 0x7FFFFFFE;
    }
    if (holds({{38, 38}}, number)) {
        return 0x00000003;
    }
    if (holds({{108, 110}, {113, 115}, {135, 137}}, number)) {
        return 0x7FFFFFF0;
    }
    if (holds({{111, 111}}, number)) {
        return 0x7FFFFFFC;
    }
    if (holds({{112, 112}}, number)) {
        return 0x7FFFFFEC;
    }
    if (holds({{116, 118}}, number)) {
        return 0x7FFFFFE0;
    }
    if (holds({{119, 119}}, number)) {
        return 0x00000004;
    }
    if (holds({{120, 121}, {159, 169}}, number)) {
        return 0x7FFFFFC0;
    }
    if (holds({{122, 125}, {132, 132}, {170, 171}}, number)) {
        return 0x7FFFFF80;
    }
    if (holds({{131, 131}}, number)) {
        return 0x0000001F;
    }
    if (holds({{146, 146}}, number)) {
        return 0x7FFFFFF8;
    }
    return 0xFFFFFFFF;
}

const ParamDescriptor& rowOf(std::uint32_t number) {
    return ParamCatalogue.rows.at(number - 1);
}

} // namespace

// Rules: CAT-01
TEST(ParamRowsTest, NumberIsThePositionPlusOne) {
    ASSERT_EQ(171U, ParamCatalogue.rows.size());
    for (std::uint32_t number = 1; number <= 171; ++number) {
        EXPECT_EQ(number, rowOf(number).number);
    }
}

// Rules: CAT-02
TEST(ParamRowsTest, EightParametersHaveTwoBytesAndAllOthersOne) {
    for (std::uint32_t number = 1; number <= 171; ++number) {
        EXPECT_EQ(isTwoBytes(number) ? 1U : 0U, rowOf(number).type) << "parameter " << number;
    }
}

// Rules: CAT-04
TEST(ParamRowsTest, OffsetsRunWithoutGapsToTheEndOfTheImage) {
    std::uint32_t offset = 0;
    for (std::uint32_t number = 1; number <= 171; ++number) {
        EXPECT_EQ(offset, rowOf(number).offset) << "parameter " << number;
        offset += isTwoBytes(number) ? 2U : 1U;
    }
    EXPECT_EQ(179U, offset);
    EXPECT_EQ(179U, CONFIG_IMAGE_SIZE);
}

TEST(ParamRowsTest, OffsetsOfKnownParameters) {
    const std::map<std::uint32_t, std::uint32_t> offsets = {
        {1, 0},     {22, 21},   {36, 35},   {50, 49},   {133, 132}, {134, 133},
        {135, 135}, {139, 139}, {142, 142}, {143, 144}, {171, 178}};
    for (const auto& [number, offset] : offsets) {
        EXPECT_EQ(offset, rowOf(number).offset) << "parameter " << number;
    }
}

// Rules: CAT-05
TEST(ParamRowsTest, GroupsAreRangesOfNumbers) {
    for (std::uint32_t number = 1; number <= 171; ++number) {
        EXPECT_EQ(issuedGroup(number), rowOf(number).group) << "parameter " << number;
    }
}

// Rules: CAT-06
TEST(ParamRowsTest, IdIsTheIssuedCodeAboveTheCommonLowHalf) {
    std::uint32_t number = 0;
    for (const auto& [listedNumber, code] : CODES) {
        ASSERT_EQ(++number, listedNumber);
        EXPECT_EQ((code << 16) | 0x00A0U, rowOf(number).id) << "parameter " << number;
    }
}

// Rules: CAT-07
TEST(ParamRowsTest, OnlyCode86OccursTwice) {
    std::multiset<std::uint32_t> codes;
    for (const ParamDescriptor& row : ParamCatalogue.rows) {
        codes.insert(row.id >> 16);
    }
    for (const std::uint32_t code : codes) {
        EXPECT_EQ(code == 86 ? 2U : 1U, codes.count(code)) << "code " << code;
    }
    EXPECT_EQ(86U, rowOf(65).id >> 16);
    EXPECT_EQ(86U, rowOf(120).id >> 16);
    EXPECT_EQ(0U, *codes.begin());
    EXPECT_EQ(206U, *codes.rbegin());
}

// Rules: CAT-08
TEST(ParamRowsTest, FourParametersHaveADefault) {
    for (std::uint32_t number = 1; number <= 171; ++number) {
        EXPECT_EQ(issuedDefault(number), rowOf(number).defaultValue) << "parameter " << number;
    }
}

// Rules: CAT-09
TEST(ParamRowsTest, MasksAreAsIssued) {
    std::uint32_t allOnes = 0;
    for (std::uint32_t number = 1; number <= 171; ++number) {
        EXPECT_EQ(issuedMask(number), rowOf(number).mask) << "parameter " << number;
        allOnes += rowOf(number).mask == 0xFFFFFFFFU ? 1U : 0U;
    }
    EXPECT_EQ(117U, allOnes);
}

} // namespace orvane::test
