// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <filesystem>
#include <optional>
#include <string>

namespace orvane::kit {

/// All bytes of a file; nothing when it can't be opened.
std::optional<std::string> readWholeFile(const std::filesystem::path& path);

} // namespace orvane::kit
