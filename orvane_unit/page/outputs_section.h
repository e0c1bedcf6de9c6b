// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "orvane_unit/explain/explanation.h"
#include "orvane_unit/page/markup.h"

#include <string>

namespace orvane::desk {

/// Adds each output whole, each line with its origin, and what is there after the run if that is
/// something else. `id` is the unit's.
void addOutputs(Markup& page, const Explanation& explanation, const std::string& id);

} // namespace orvane::desk
