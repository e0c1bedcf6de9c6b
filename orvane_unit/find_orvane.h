// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <filesystem>
#include <string>

namespace orvane::desk {

/// The binary to run: `wanted`; if that is empty, the orvane next to this program, else the
/// first on PATH. Throws kit::KitError when there is none.
std::filesystem::path findOrvane(const std::string& wanted);

} // namespace orvane::desk
