// SPDX-License-Identifier: Apache-2.0
//
// Display names of the vehicle models, product data of the vehicle line.
#pragma once

#include <array>
#include <cstddef>
#include <cstdint>

namespace orvane {

/// Model codes 1 to MODEL_CODE_COUNT have a name.
constexpr std::size_t MODEL_CODE_COUNT = 47;

/// By model code - 1: the brand word, a blank, the model; 7 to 20 characters of ASCII.
extern const std::array<const char*, MODEL_CODE_COUNT> ModelNameTable;

/// Whether `code` is one of the codes that have a name.
bool hasModelName(std::uint8_t code);

} // namespace orvane
