// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <filesystem>
#include <string>

namespace orvane::desk {

/// The binary to run: `wanted`, or when that is empty the orvane beside this program, else the
/// first on PATH. Throws kit::KitError when there is none.
std::filesystem::path findOrvane(const std::string& wanted);

} // namespace orvane::desk
