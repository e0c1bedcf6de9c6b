// SPDX-License-Identifier: Apache-2.0
#include "config/crc32.h"

namespace orvane {

namespace {

constexpr std::uint32_t POLYNOMIAL = 0xEDB88320U; // reflected

constexpr std::array<std::uint32_t, 256> makeTable() {
    std::array<std::uint32_t, 256> table{};
    for (std::uint32_t byte = 0; byte < table.size(); ++byte) {
        std::uint32_t word = byte;
        for (int bit = 0; bit < 8; ++bit) {
            word = (word & 1U) != 0 ? POLYNOMIAL ^ (word >> 1) : word >> 1;
        }
        table[byte] = word;
    }
    return table;
}

} // namespace

constexpr std::array<std::uint32_t, 256> CRC32_TABLE = makeTable();

static_assert(CRC32_TABLE[1] == 0x77073096U && CRC32_TABLE[128] == POLYNOMIAL &&
              CRC32_TABLE[255] == 0x2D02EF8DU);

std::uint32_t crc32Step(std::uint32_t crc, std::uint8_t byte) {
    return CRC32_TABLE[(crc ^ byte) & 0xFFU] ^ (crc >> 8);
}

} // namespace orvane
