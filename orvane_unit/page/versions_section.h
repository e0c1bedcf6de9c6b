// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "orvane_unit/page/markup.h"
#include "orvane_unit/show/decoded_unit.h"

#include <string>

namespace orvane::desk {

/// Adds the version description files in the order of the listing, and how one of them becomes the
/// six digits. `id` is the unit's.
void addVersions(Markup& page, const DecodedVersions& versions, const std::string& id);

} // namespace orvane::desk
