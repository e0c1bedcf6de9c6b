// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "orvane_unit/compare/impact.h"
#include "orvane_unit/explain/explanation.h"
#include "orvane_unit/page/markup.h"

#include <string>
#include <vector>

namespace orvane::desk {

/// Adds a matrix: a row for each input that changes anything, a column for each output, and in
/// their cell the lines that change. `id` is the unit's.
void addImpacts(Markup& page, const std::vector<Impact>& impacts, const Explanation& explanation,
                const std::string& id);

} // namespace orvane::desk
