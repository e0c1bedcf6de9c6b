// SPDX-License-Identifier: Apache-2.0
//
// Numbers as the unit stores them: low byte first.
#pragma once

#include "kit/host/bytes.h"

#include <cstddef>
#include <cstdint>
#include <string_view>

namespace orvane::kit {

/// The low `size` bytes of `value`.
inline Bytes littleEndian(std::uint64_t value, std::size_t size) {
    Bytes bytes;
    for (std::size_t i = 0; i < size; ++i) {
        bytes += static_cast<char>(value >> (8 * i) & 0xFFU);
    }
    return bytes;
}

/// The number in `bytes`, of which there are at most eight.
inline std::uint64_t fromLittleEndian(std::string_view bytes) {
    std::uint64_t value = 0;
    for (std::size_t i = bytes.size(); i > 0; --i) {
        value = value << 8U | static_cast<unsigned char>(bytes[i - 1]);
    }
    return value;
}

} // namespace orvane::kit
