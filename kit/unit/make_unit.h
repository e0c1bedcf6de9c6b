// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "kit/description/unit_description.h"

#include <filesystem>
#include <functional>

namespace orvane::kit {

/// Makes the unit at `root`, which must be absent or an empty folder. It becomes a unit in one
/// step, when it is complete (finished_folder.h). Throws KitError; `root` is then as it was.
void makeUnit(const UnitDescription& unit, const std::filesystem::path& root);

/// The same, but lets `inspect` look at the complete folder before it replaces `root`. What it
/// throws is thrown on as by makeFinishedFolder.
void makeUnit(const UnitDescription& unit, const std::filesystem::path& root,
              const std::function<void(const std::filesystem::path&)>& inspect);

} // namespace orvane::kit
