// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "kit/description/unit_description.h"

#include <filesystem>

namespace orvane::kit {

/// Makes the unit at `root`, which must be absent or an empty folder. Image and files are written
/// through the host's file system, disk records with the product's own operations inside the unit.
/// All of it happens in a folder beside `root` whose name begins with "." and root's name, and
/// which takes the place of `root` when it is whole. Throws KitError; `root` is then as it was
/// before. What ends the process half-way leaves the folder beside, and `root` as it was.
void makeUnit(const UnitDescription& unit, const std::filesystem::path& root);

} // namespace orvane::kit
