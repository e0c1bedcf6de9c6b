// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "kit/description/unit_description.h"

#include <string>

namespace orvane::kit {

/// The description of `unit`, which makeUnit must accept: parseDescription gives the same unit
/// again. Numbers ascend, tuning fields are in the block's order, readable bytes are text, all
/// others hex. Throws KitError when it would be longer than LONGEST_DESCRIPTION.
std::string descriptionText(const UnitDescription& unit);

} // namespace orvane::kit
