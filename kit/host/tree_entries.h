// SPDX-License-Identifier: Apache-2.0
//
// Reading single entries of a folder tree. Every function throws KitError with the path.
#pragma once

#include <filesystem>
#include <string>
#include <vector>

namespace orvane::kit {

/// The entries of a folder, by name.
std::vector<std::filesystem::directory_entry> listFolder(const std::filesystem::path& folder);

/// What `entry` is, links not followed.
std::filesystem::file_type kindOf(const std::filesystem::path& entry);

/// What `entry` leads to, links followed; `not_found` for a link that leads nowhere.
std::filesystem::file_type kindBehind(const std::filesystem::path& entry);

/// "a file", "a pipe", ...
std::string nounOf(std::filesystem::file_type kind);

/// The target of a link.
std::string targetOf(const std::filesystem::path& link);

} // namespace orvane::kit
