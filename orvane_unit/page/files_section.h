// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "orvane_unit/page/markup.h"
#include "orvane_unit/show/decoded_unit.h"

#include <string>
#include <vector>

namespace orvane::desk {

/// Adds the paths that a run opens, and what is there. `id` is the unit's.
void addFiles(Markup& page, const std::vector<UnitFile>& files, const std::string& id);

} // namespace orvane::desk
