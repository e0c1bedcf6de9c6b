// SPDX-License-Identifier: Apache-2.0
//
// Parameter numbers of each kind.
#pragma once

#include <array>
#include <cstdint>

namespace orvane::test {

constexpr std::array<std::uint16_t, 8> TWO_BYTE_PARAMS = {134, 142, 143, 144, 152, 153, 154, 158};

/// The catalogue has none of these.
constexpr std::array<std::uint16_t, 8> UNKNOWN_NUMBERS = {0,   172,   173,   256,
                                                          257, 32768, 32769, 65535};

} // namespace orvane::test
