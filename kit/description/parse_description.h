// SPDX-License-Identifier: Apache-2.0
//
// A description is a TOML file; its keys are listed in docs/unit-description.md.
#pragma once

#include "kit/description/unit_description.h"

#include <filesystem>
#include <string>

namespace orvane::kit {

/// Reads a description. `name` is the path of its file: errors show it, and host files are relative
/// to its folder. Throws KitError with "name:line:column:" in front for anything that is not a
/// description: bad TOML, an unknown key, a value that does not fit.
UnitDescription parseDescription(const std::string& text, const std::string& name);
UnitDescription readDescription(const std::filesystem::path& file);

} // namespace orvane::kit
