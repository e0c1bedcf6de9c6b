// SPDX-License-Identifier: Apache-2.0
//
// The values of a unit by their keys: image, disk, and everything else that a run can meet.
#pragma once

#include "kit/description/unit_description.h"
#include "kit/description/value_key.h"

#include <string>
#include <utility>
#include <vector>

namespace orvane::kit {

/// Keys and values, in the order of a description. A missing value has no entry.
using UnitValues = std::vector<std::pair<ValueKey, std::string>>;

UnitValues unitValues(const UnitDescription& unit);

/// A value that differs between two units. "(missing)" stands for a missing one.
struct ValueChange {
    ValueKey key;
    std::string before;
    std::string after;
};

std::vector<ValueChange> differingValues(const UnitValues& before, const UnitValues& after);

} // namespace orvane::kit
