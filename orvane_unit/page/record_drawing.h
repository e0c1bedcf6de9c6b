// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "orvane_unit/explain/value_origins.h"
#include "orvane_unit/page/markup.h"
#include "orvane_unit/show/decoded_unit.h"

namespace orvane::desk {

/// Draws the record area to scale: all of it, its begin magnified, and the slots magnified again.
/// Each part has its name, its place and its content.
void drawRecords(Markup& page, const DecodedRecords& records, const TuningArea& tuning);

} // namespace orvane::desk
