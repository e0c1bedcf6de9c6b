// SPDX-License-Identifier: Apache-2.0
//
// What a mostly empty file or device holds, found without reading zero after zero.
#pragma once

#include "kit/host/bytes.h"
#include "kit/host/descriptor.h"

#include <cstdint>
#include <filesystem>
#include <map>
#include <string_view>

namespace orvane::kit {

/// At least this many zero bytes between two others end a run; fewer are part of it.
constexpr std::uint64_t RUN_GAP = 16;

/// The most bytes that a file's content may take in memory, so that no file can take all of it.
constexpr std::uint64_t MOST_CONTENT = std::uint64_t{1} << 30U;

/// Mostly zeros: the runs of other bytes, by offset. Each begins and ends with a byte that is not
/// zero.
using SparseContent = std::map<std::uint64_t, Bytes>;

/// The content of `bytes`, which stand at `offset`.
SparseContent sparseContent(std::string_view bytes, std::uint64_t offset = 0);

/// The content of the first `size` bytes of a file or device; known holes are skipped. Throws
/// KitError with the path `file`, also for one whose runs take more than MOST_CONTENT.
SparseContent sparseContent(const Descriptor& descriptor, const std::filesystem::path& file,
                            std::uint64_t size);

/// Whether all of `bytes` are zero.
bool isAllZero(std::string_view bytes);

/// `bytes` without the zeros at their end.
Bytes withoutTrailingZeros(const Bytes& bytes);

} // namespace orvane::kit
