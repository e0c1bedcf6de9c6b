// SPDX-License-Identifier: Apache-2.0
//
// Reads a tuning file back into the bytes of its block, with a separate table, so that a fault in
// the product's layout is not repeated here.
#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <string_view>

namespace orvane::fuzz {

constexpr std::size_t BLOCK_SIZE = 188; ///< bytes
using Block = std::array<std::uint8_t, BLOCK_SIZE>;

/// Fails unless `text` is, to the byte, a tuning file of block `id` with the content `block`. Bits
/// that the file doesn't show can hold anything.
void requireTuningOf(const Block& block, int id, std::string_view text);

} // namespace orvane::fuzz
