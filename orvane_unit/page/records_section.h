// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "orvane_unit/explain/value_origins.h"
#include "orvane_unit/page/markup.h"
#include "orvane_unit/show/decoded_unit.h"

#include <string>

namespace orvane::desk {

/// Adds the record area, in which the tuning blocks lie: a drawing to scale, its slots as a table,
/// and the CRC. `id` is the unit's.
void addRecords(Markup& page, const DecodedRecords& records, const TuningArea& tuning,
                const std::string& id);

} // namespace orvane::desk
