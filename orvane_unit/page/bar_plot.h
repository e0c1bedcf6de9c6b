// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "orvane_unit/page/markup.h"

#include <cstddef>
#include <cstdint>
#include <vector>

namespace orvane::desk {

/// Draws the list `lists[index]` as bars, on a scale that all `lists` have in common; they have the
/// same length. Bars that are not the same in all lists are marked.
void drawBars(Markup& page, const std::vector<std::vector<std::int32_t>>& lists, std::size_t index);

} // namespace orvane::desk
