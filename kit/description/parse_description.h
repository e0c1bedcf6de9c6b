// SPDX-License-Identifier: Apache-2.0
//
// A description is a TOML file; its keys are listed in docs/unit-description.md.
#pragma once

#include "kit/description/unit_description.h"

#include <cstdint>
#include <filesystem>
#include <string>

namespace orvane::kit {

/// The most bytes of a description.
constexpr std::uint64_t LONGEST_DESCRIPTION = std::uint64_t{16} << 20U;

/// Reads a description. `name` is the path of its file: errors show it, and host files are relative
/// to its folder. Throws KitError with "name:line:column:" in front for anything that is not a
/// description: bad TOML, keys or values nested deeper than a description needs, an unknown key, a
/// value that does not fit. readDescription also throws for a file that can't be read or is longer
/// than LONGEST_DESCRIPTION; it may be a pipe.
UnitDescription parseDescription(const std::string& text, const std::string& name);
UnitDescription readDescription(const std::filesystem::path& file);

} // namespace orvane::kit
