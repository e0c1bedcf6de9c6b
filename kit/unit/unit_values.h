// SPDX-License-Identifier: Apache-2.0
//
// The values of a unit by their keys: image, disk, and all else that a run can meet.
#pragma once

#include "kit/description/unit_description.h"
#include "kit/description/value_key.h"

#include <string>
#include <utility>
#include <vector>

namespace orvane::kit {

/// Key and value, in the order of a description. A value that is not there has no entry.
using UnitValues = std::vector<std::pair<ValueKey, std::string>>;

UnitValues unitValues(const UnitDescription& unit);

/// A value that differs between two units. "(missing)" stands for one that is not there.
struct ValueChange {
    ValueKey key;
    std::string before;
    std::string after;
};

std::vector<ValueChange> differingValues(const UnitValues& before, const UnitValues& after);

} // namespace orvane::kit
