// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <filesystem>
#include <string>
#include <vector>

namespace orvane::test {

/// The words before a command of the host that is to run while the image of the unit at `root` is a
/// hole in a memory file system that is full.
std::vector<std::string> holeInFullMemory(const std::filesystem::path& root);

} // namespace orvane::test
