// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "kit/description/unit_description.h"

#include <string>

namespace orvane::kit {

/// `unit`, which must be one that makeUnit takes, as a description: parseDescription gives the same
/// unit again. Numbers ascend, tuning fields stand in the block's order, texts are texts where they
/// can be read, all other bytes are hex.
std::string descriptionText(const UnitDescription& unit);

} // namespace orvane::kit
