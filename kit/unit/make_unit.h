// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "kit/description/unit_description.h"

#include <filesystem>
#include <functional>

namespace orvane::kit {

/// Makes the unit at `root`, which must be absent or an empty folder. Image and files are written
/// through the host's file system, disk records with the product's own operations inside the unit.
/// The unit is made in a folder next to `root` whose name begins with "." and root's name, and
/// which replaces `root` when it is complete. Throws KitError; `root` is then as it was. If the
/// process is ended half-way, that folder stays, and `root` is as it was.
void makeUnit(const UnitDescription& unit, const std::filesystem::path& root);

/// The same, but lets `inspect` look at the complete folder before it replaces `root`. What it
/// throws is thrown on as by makeFinishedFolder.
void makeUnit(const UnitDescription& unit, const std::filesystem::path& root,
              const std::function<void(const std::filesystem::path&)>& inspect);

} // namespace orvane::kit
