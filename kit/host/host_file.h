// SPDX-License-Identifier: Apache-2.0
//
// Reading and writing a unit's files through the host's file system. Every function throws KitError
// with the file's path.
#pragma once

#include "kit/host/bytes.h"
#include "kit/host/descriptor.h"

#include <cstdint>
#include <filesystem>

namespace orvane::kit {

/// Makes `file` with `size` zero bytes, which take no room on the host's disk.
Descriptor makeSparseFile(const std::filesystem::path& file, std::uint64_t size);

/// Puts `bytes` at `offset`.
void writeAt(const Descriptor& descriptor, const std::filesystem::path& file, std::uint64_t offset,
             const Bytes& bytes);

/// Opens without waiting for the other end of a pipe.
Descriptor openForReading(const std::filesystem::path& file);

/// The offset of the end, by a seek: devices tell their size in no other way.
std::uint64_t sizeOf(const Descriptor& descriptor, const std::filesystem::path& file);

/// `length` bytes from `offset` on; fewer only where the file ends.
Bytes readAt(const Descriptor& descriptor, const std::filesystem::path& file, std::uint64_t offset,
             std::uint64_t length);

/// All bytes, up to the size that sizeOf tells.
Bytes readWhole(const Descriptor& descriptor, const std::filesystem::path& file);

/// Throws when `folder` is not a folder or can't be looked at.
void requireFolder(const std::filesystem::path& folder);

/// The folder for temporary files: that of the environment variable TMPDIR, else /tmp. Throws when
/// it is not a folder.
std::filesystem::path temporaryFolder();

/// Whether `folder` is this process's "/", under any name. Throws nothing.
bool isRootDirectory(const std::filesystem::path& folder);

} // namespace orvane::kit
