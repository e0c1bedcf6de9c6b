// SPDX-License-Identifier: Apache-2.0
//
// Reading whole files by their paths. Every function throws KitError with the file's path for what
// is there and can't be read.
#pragma once

#include "kit/host/bytes.h"

#include <cstdint>
#include <filesystem>
#include <optional>

namespace orvane::kit {

/// All bytes up to the end of `file`, which may be a pipe.
Bytes readWholeFile(const std::filesystem::path& file);

/// The same; nothing where there is no such file.
std::optional<Bytes> readWholeFileIfThere(const std::filesystem::path& file);

/// All bytes of the regular file `file`, a link to one included, of at most `limit` bytes.
Bytes readRegularFile(const std::filesystem::path& file, std::uint64_t limit);

} // namespace orvane::kit
