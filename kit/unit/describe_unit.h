// SPDX-License-Identifier: Apache-2.0
//
// The inverse of makeUnit. Of the many descriptions that make the same, each function gives one
// canonical form.
#pragma once

#include "kit/description/unit_description.h"
#include "kit/host/bytes.h"
#include "kit/host/descriptor.h"

#include <cstdint>
#include <filesystem>
#include <string>

namespace orvane::kit {

/// A longer image is described as a file, whose zeros take no room. In bytes.
constexpr std::uint64_t LONGEST_IMAGE = std::uint64_t{1} << 20U;

/// The image: its size, the parameters that lie wholly inside and are not zero, and as raw bytes
/// all else that is not zero: past the catalogue's end, or the first byte of a two-byte parameter
/// that is cut off.
ImageDescription describeImage(const Bytes& image);

/// The disk of the first `size` bytes: slots (never slot 15, which repeats slots 1 to 9), auxiliary
/// area and tuning blocks that are not all zero, without the zeros at their ends, and as raw bytes
/// all else that is not zero. A disk shorter than the record area is raw bytes only. Holes and
/// zeros cost almost nothing. `file` names the disk in the KitError of a failed read.
DiskDescription describeDisk(const Descriptor& descriptor, const std::filesystem::path& file,
                             std::uint64_t size);
DiskDescription describeDisk(const Bytes& content);

/// Adds the open file to `unit` as `path`: to the sparse files if it is long and mostly zeros, else
/// to the others.
void describeFile(const Descriptor& descriptor, const std::filesystem::path& file,
                  const std::string& path, UnitDescription& unit);

/// Everything below `root`, which must be a unit that the kit made: makeUnit makes the same
/// folders, files, contents and links from it. Modes, times and owners are not part of a
/// description, nor is the kit's own mark. Reads only. Throws KitError when something can't be
/// read, or is neither a file, a folder nor a link.
UnitDescription describeUnit(const std::filesystem::path& root);

} // namespace orvane::kit
