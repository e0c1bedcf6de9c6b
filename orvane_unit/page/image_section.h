// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "orvane_unit/page/markup.h"
#include "orvane_unit/show/decoded_unit.h"

#include <string>

namespace orvane::desk {

/// Adds the configuration image: a cell for each byte of the catalogue. `id` is the unit's.
void addImage(Markup& page, const DecodedImage& image, const std::string& id);

} // namespace orvane::desk
