// SPDX-License-Identifier: Apache-2.0
//
// Reading whole files by their paths. Every function throws KitError with the file's path for what
// is there and can't be read, or has more bytes than it may have.
#pragma once

#include "kit/host/bytes.h"

#include <cstdint>
#include <filesystem>
#include <optional>

namespace orvane::kit {

/// The most bytes of a file that is read whole, so that none can take all memory.
constexpr std::uint64_t LONGEST_READ = std::uint64_t{256} << 20U;

/// All bytes up to the end of `file`, which may be a pipe or a device, of at most `limit` bytes.
Bytes readWholeFile(const std::filesystem::path& file, std::uint64_t limit = LONGEST_READ);

/// Throws KitError when `file` is a regular one of more than `limit` bytes.
void requireShort(const std::filesystem::path& file, std::uint64_t limit);

/// All bytes of the regular file `file`, a link to one included, of at most `limit` bytes. Never
/// waits at a pipe.
Bytes readRegularFile(const std::filesystem::path& file, std::uint64_t limit);

/// The same with the usual limit; nothing where there is no such file.
std::optional<Bytes> readRegularFileIfThere(const std::filesystem::path& file);

} // namespace orvane::kit
