// SPDX-License-Identifier: Apache-2.0
//
// Reading single entries of a folder tree. Every function throws KitError, the path in its text.
#pragma once

#include "kit/description/unit_description.h"
#include "kit/host/descriptor.h"

#include <cstdint>
#include <filesystem>
#include <string>
#include <vector>

namespace orvane::kit {

/// A longer image is described as a file, whose zeros take no room. In bytes.
constexpr std::uint64_t LONGEST_IMAGE = std::uint64_t{1} << 20U;

/// The entries of a folder, by name.
std::vector<std::filesystem::directory_entry> listFolder(const std::filesystem::path& folder);

/// What `entry` is, links not followed.
std::filesystem::file_type kindOf(const std::filesystem::path& entry);

/// The target of a link.
std::string targetOf(const std::filesystem::path& link);

/// Enters the open file as `path` of `unit`: among the sparse files when it is long and mostly
/// zeros, else among the others.
void describeFile(const Descriptor& descriptor, const std::filesystem::path& file,
                  const std::string& path, UnitDescription& unit);

} // namespace orvane::kit
