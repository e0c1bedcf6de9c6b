// SPDX-License-Identifier: Apache-2.0
//
// Writing the unit's files through the host's file system.
#pragma once

#include "kit/descriptor.h"
#include "kit/unit.h"

#include <cstdint>
#include <filesystem>

namespace orvane::kit {

/// Makes `file` with `size` zero bytes, which take no room on the host's disk. Throws KitError.
Descriptor makeSparseFile(const std::filesystem::path& file, std::uint64_t size);

/// Puts `bytes` at `offset`. Throws KitError, `file` in its text.
void writeAt(const Descriptor& descriptor, const std::filesystem::path& file, std::uint64_t offset,
             const Bytes& bytes);

} // namespace orvane::kit
