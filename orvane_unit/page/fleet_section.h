// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "orvane_unit/page/markup.h"
#include "orvane_unit/page/page.h"

#include <vector>

namespace orvane::desk {

/// Adds a table with a row for each unit. A value is marked where more than half of the units have
/// another one in common.
void addFleet(Markup& page, const std::vector<PageUnit>& units);

} // namespace orvane::desk
