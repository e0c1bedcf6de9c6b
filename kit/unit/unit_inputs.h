// SPDX-License-Identifier: Apache-2.0
//
// All that a run of the tool reads in a unit.
#pragma once

#include "kit/description/unit_description.h"
#include "kit/host/bytes.h"

#include <filesystem>
#include <optional>
#include <string>

namespace orvane::kit {

struct UnitInputs {
    UnitDescription unit;      ///< everything but what the disk holds
    std::optional<Bytes> disk; ///< the disk's last mebibyte, or all of a shorter one
};

/// Reads the inputs of the unit at `source`, as inspectInputs says. Throws KitError.
UnitInputs readInputs(const std::filesystem::path& source);

/// The inputs as one description.
UnitDescription describeInputs(UnitInputs inputs);

} // namespace orvane::kit
