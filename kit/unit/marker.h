// SPDX-License-Identifier: Apache-2.0
//
// The mark of a folder that the kit has made: a file at its top. Whatever changes or removes a unit
// requires it, so that no other folder, such as the host's own root, is taken for a unit.
#pragma once

#include <filesystem>

namespace orvane::kit {

/// The whole content: who made it, and the version of the layout.
constexpr char MARKER_TEXT[] = "made by orvane-unit, layout 1\n";

/// Marks the folder `root`. Throws KitError.
void markUnit(const std::filesystem::path& root);

/// Whether `root` is a folder with the mark: a regular file, not a link, with exactly that text.
/// Throws KitError when the file can't be read.
bool isKitUnit(const std::filesystem::path& root);

/// Throws KitError when `root` is not a folder, has no mark, or is "/" itself by whatever name,
/// marked or not.
void requireKitUnit(const std::filesystem::path& root);

} // namespace orvane::kit
