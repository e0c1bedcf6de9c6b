// SPDX-License-Identifier: Apache-2.0
//
// The reflected CRC-32 of IEEE 802.3 (polynomial 0xEDB88320), one byte at a time.
#pragma once

#include <array>
#include <cstdint>

namespace orvane {

/// The register before the first byte.
constexpr std::uint32_t CRC32_INITIAL = 0xFFFFFFFFU;

/// The register's change for each low byte: 256 words of constant data.
extern const std::array<std::uint32_t, 256> CRC32_TABLE;

/// The register `crc` after one more byte. The final complement is left to the caller.
std::uint32_t crc32Step(std::uint32_t crc, std::uint8_t byte);

} // namespace orvane
