// SPDX-License-Identifier: Apache-2.0
#include "config/crc32.h"
#include "tests/product/config/memory_map.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <string>

namespace orvane::test {

namespace {

/// The register after one more byte, from the polynomial itself, a bit at a time.
std::uint32_t bitwiseStep(std::uint32_t crc, std::uint8_t byte) {
    crc ^= byte;
    for (int bit = 0; bit < 8; ++bit) {
        crc = (crc & 1U) != 0 ? (crc >> 1) ^ 0xEDB88320U : crc >> 1;
    }
    return crc;
}

/// The usual CRC-32: with the final complement.
std::uint32_t complementedCrc(const std::string& text) {
    std::uint32_t crc = CRC32_INITIAL;
    for (const char character : text) {
        crc = crc32Step(crc, static_cast<std::uint8_t>(character));
    }
    return ~crc;
}

} // namespace

TEST(Crc32Test, RegisterStartsWithAllOnes) {
    EXPECT_EQ(0xFFFFFFFFU, CRC32_INITIAL);
}

// Rules: CRC-02
TEST(Crc32Test, TableFollowsFromThePolynomial) {
    ASSERT_EQ(256U, CRC32_TABLE.size());
    for (std::uint32_t byte = 0; byte < 256; ++byte) {
        EXPECT_EQ(bitwiseStep(byte, 0), CRC32_TABLE.at(byte)) << byte;
    }
}

TEST(Crc32Test, TableHasThePublishedEntries) {
    EXPECT_EQ(0x00000000U, CRC32_TABLE[0]);
    EXPECT_EQ(0x77073096U, CRC32_TABLE[1]);
    EXPECT_EQ(0xEDB88320U, CRC32_TABLE[128]);
    EXPECT_EQ(0x2D02EF8DU, CRC32_TABLE[255]);
}

TEST(Crc32Test, GivesThePublishedCheckValues) {
    EXPECT_EQ(0xCBF43926U, complementedCrc("123456789"));
    EXPECT_EQ(0xE8B7BE43U, complementedCrc("a"));
    EXPECT_EQ(0x352441C2U, complementedCrc("abc"));
    EXPECT_EQ(0x414FA339U, complementedCrc("The quick brown fox jumps over the lazy dog"));
    EXPECT_EQ(0x00000000U, complementedCrc(""));
}

// Rules: CRC-02
TEST(Crc32Test, StepFollowsThePolynomialForEveryByte) {
    std::uint32_t crc = CRC32_INITIAL;
    for (std::uint32_t round = 0; round < 64; ++round) {
        for (std::uint32_t byte = 0; byte < 256; ++byte) {
            const auto value = static_cast<std::uint8_t>(byte);
            ASSERT_EQ(bitwiseStep(crc, value), crc32Step(crc, value)) << crc << ", " << byte;
        }
        crc = bitwiseStep(crc, static_cast<std::uint8_t>(round * 29));
    }
}

TEST(Crc32Test, StepDoesNotComplement) {
    EXPECT_EQ(0U, crc32Step(0, 0));
    EXPECT_EQ(0x00FFFFFFU, crc32Step(0xFFFFFFFF, 0xFF));
}

TEST(Crc32Test, TableLiesInReadOnlyMemory) {
    for (const std::uint32_t* word : {&CRC32_TABLE.front(), &CRC32_TABLE.back()}) {
        EXPECT_EQ("r-", mappingRights(word).substr(0, 2));
    }
}

} // namespace orvane::test
