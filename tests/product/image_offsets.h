// SPDX-License-Identifier: Apache-2.0
//
// Where the values that a run reads lie in the configuration image, in bytes.
#pragma once

#include <cstdint>

namespace orvane::test {

constexpr std::uint32_t DRIVE_SIDE_OFFSET = 21;
constexpr std::uint32_t BRAND_OFFSET = 35;
constexpr std::uint32_t FUEL_TYPE_OFFSET = 49;
constexpr std::uint32_t PROFILE_OFFSET = 133; ///< two bytes, the low one first
constexpr std::uint32_t MODEL_OFFSET = 139;

} // namespace orvane::test
