// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "orvane_unit/explain/value_origins.h"
#include "orvane_unit/page/markup.h"

#include <string>

namespace orvane::desk {

/// Adds the tuning blocks that the tool reads, side by side. `id` is the unit's.
void addTuning(Markup& page, const TuningArea& tuning, const std::string& id);

} // namespace orvane::desk
