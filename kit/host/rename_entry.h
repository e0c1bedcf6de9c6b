// SPDX-License-Identifier: Apache-2.0
//
// Renaming in one step, so that whoever looks sees the state before or after it. Each function
// returns the error; both paths are then as they were.
#pragma once

#include <filesystem>
#include <system_error>

namespace orvane::kit {

/// Renames `from` to `to`, where nothing may be. A file system that can't promise that replaces an
/// empty folder or a file that has just appeared there.
std::error_code renameToFree(const std::filesystem::path& from, const std::filesystem::path& to);

/// Gives each of two entries the other's name. Not every file system can.
std::error_code exchangeNames(const std::filesystem::path& one, const std::filesystem::path& other);

} // namespace orvane::kit
