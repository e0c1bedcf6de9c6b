// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "orvane_unit/explain/explanation.h"
#include "orvane_unit/page/markup.h"

#include <string>

namespace orvane::desk {

/// Adds a tile for each output: what became of it and why, and where to look if that was not
/// intended. `id` is the unit's.
void addVerdict(Markup& page, const Explanation& explanation, const std::string& id);

} // namespace orvane::desk
